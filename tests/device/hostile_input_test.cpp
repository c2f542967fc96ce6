// Every command survives hostile form values: each field any handler reads, longer
// than its largest buffer, holding bytes 0xFF and NUL, quotes, backquotes, "$(" and
// printf directives. Under the sanitizer build a write outside a buffer fails here.
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <map>
#include <regex>

#include "device.h"

TEST(HostileInput, EveryCommandAnswersWithoutCrashing)
{
    // The commands of the table, and each field read with its largest buffer, from the sources.
    std::map<std::string, int> commands, fields;
    const std::regex command(R"re(\{"(cgi_[a-z_]+)", cgi_)re"), field(R"re(form_value<(\d+)>\("([A-Za-z0-9_]+)"\))re");
    for (const auto& entry : std::filesystem::recursive_directory_iterator(NAS_SOURCE_DIR "/src")) {
        if (entry.path().extension() != ".cpp")
            continue;
        std::ifstream in(entry.path());
        const std::string source(std::istreambuf_iterator<char>(in), {});
        for (std::sregex_iterator it(source.begin(), source.end(), command), end; it != end; ++it)
            commands[(*it)[1]] = 0;
        for (std::sregex_iterator it(source.begin(), source.end(), field), end; it != end; ++it)
            fields[(*it)[2]] = std::max(fields[(*it)[2]], std::stoi((*it)[1]));
    }
    ASSERT_EQ(commands.size(), 52u);
    ASSERT_GT(fields.size(), 50u);
    std::string body;
    for (const auto& [name, size] : fields)
        body += "&" + name + "=%FF%00%27%60$(id)%25s%25n" + std::string(size, 'A');
    Device dev;
    for (const auto& [name, unused] : commands) {
        const Reply reply = dev.post("cmd=" + name + body);
        EXPECT_EQ(reply.status, 0) << name << "\n" << reply.err.substr(0, 2000);
        EXPECT_EQ(reply.err.find("AddressSanitizer"), std::string::npos) << name;
        EXPECT_EQ(reply.err.find("runtime error"), std::string::npos) << name;
    }
}

// Every command survives hostile form values: each field any handler reads, longer
// than its largest buffer, holding bytes 0xFF and NUL, quotes, backquotes, "$(" and
// printf directives. Under the sanitizer build a write outside a buffer fails here.
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <regex>
#include <map>
#include <sstream>

#include "device.h"

namespace {

const std::string kHostile = "%FF%00%27%60$(id)%25s%25n";

// Every match of `pattern` in the program's sources: its "name" group, and the largest
// number its "size" group held (0 without one).
std::map<std::string, int> found_in_sources(const std::regex& pattern, int name, int size = 0)
{
    std::map<std::string, int> found;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(std::string(NAS_SOURCE_DIR) + "/src")) {
        if (entry.path().extension() != ".cpp")
            continue;
        std::ifstream in(entry.path());
        std::stringstream text;
        text << in.rdbuf();
        const std::string source = text.str();
        for (std::sregex_iterator it(source.begin(), source.end(), pattern), end; it != end; ++it)
            found[(*it)[name]] = std::max(found[(*it)[name]], size ? std::stoi((*it)[size]) : 0);
    }
    return found;
}

} // namespace

TEST(HostileInput, EveryCommandAnswersWithoutCrashing)
{
    const auto commands = found_in_sources(std::regex(R"re(\{"(cgi_[a-z_]+)", cgi_)re"), 1);
    const auto fields = found_in_sources(std::regex(R"re(form_value<(\d+)>\("([A-Za-z0-9_]+)"\))re"), 2, 1);
    ASSERT_EQ(commands.size(), 52u);
    ASSERT_GT(fields.size(), 50u);
    std::string body;
    for (const auto& [field, size] : fields)
        body += "&" + field + "=" + kHostile + std::string(size, 'A');

    Device dev;
    for (const auto& [command, unused] : commands) {
        const Reply reply = dev.post_raw("cmd=" + command + body, "application/x-www-form-urlencoded");
        EXPECT_EQ(reply.status, 0) << command << "\n" << reply.err.substr(0, 2000);
        EXPECT_EQ(reply.err.find("AddressSanitizer"), std::string::npos) << command;
        EXPECT_EQ(reply.err.find("runtime error"), std::string::npos) << command;
    }
}

// Every command survives hostile form values: each field any handler reads, far
// longer than its buffer, holding bytes 0xFF and NUL, quotes, backquotes, "$(" and
// printf directives. Under the sanitizer build a write outside a buffer fails here.
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <regex>
#include <set>
#include <sstream>

#include "device.h"

namespace {

const std::string kHostile = "%FF%00%27%60$(id)%25s%25n" + std::string(70000, 'A');

// Every match of `pattern`'s first group in the program's sources.
std::set<std::string> found_in_sources(const std::regex& pattern)
{
    std::set<std::string> found;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(std::string(NAS_SOURCE_DIR) + "/src")) {
        if (entry.path().extension() != ".cpp")
            continue;
        std::ifstream in(entry.path());
        std::stringstream text;
        text << in.rdbuf();
        const std::string source = text.str();
        for (std::sregex_iterator it(source.begin(), source.end(), pattern), end; it != end; ++it)
            found.insert((*it)[1]);
    }
    return found;
}

} // namespace

TEST(HostileInput, EveryCommandAnswersWithoutCrashing)
{
    const auto commands = found_in_sources(std::regex(R"re(\{"(cgi_[a-z_]+)", cgi_)re"));
    const auto fields = found_in_sources(std::regex(R"re(form_value<\d+>\("([A-Za-z0-9_]+)"\))re"));
    ASSERT_EQ(commands.size(), 52u);
    ASSERT_GT(fields.size(), 50u);
    std::string body;
    for (const std::string& field : fields)
        body += "&" + field + "=" + kHostile;

    Device dev;
    for (const std::string& command : commands) {
        const Reply reply = dev.post_raw("cmd=" + command + body, "application/x-www-form-urlencoded");
        EXPECT_EQ(reply.status, 0) << command << "\n" << reply.err.substr(0, 2000);
        EXPECT_EQ(reply.err.find("AddressSanitizer"), std::string::npos) << command;
        EXPECT_EQ(reply.err.find("runtime error"), std::string::npos) << command;
    }
}

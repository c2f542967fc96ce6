// What the library writes to the response, and shell words built from form values.
#include <gtest/gtest.h>

#include <cstdio>
#include <functional>
#include <memory>
#include <utility>
#include <vector>

#include "platform/cgic.h"

namespace {

// What `write` sends to cgiOut, caught in memory.
std::string captured(const std::function<void()>& write)
{
    char* data = nullptr;
    std::size_t size = 0;
    FILE* const stream = open_memstream(&data, &size);
    FILE* const saved = std::exchange(cgiOut, stream);
    write();
    cgiOut = saved;
    std::fclose(stream);
    const std::unique_ptr<char, decltype(&std::free)> owned(data, std::free);
    return {data, size};
}

} // namespace

TEST(CgiOutput, HeaderAndHtmlEscapeOfTheFourSpecialCharactersOnly)
{
    EXPECT_EQ(captured([] { EXPECT_EQ(cgiHeaderContentType("text/xml; charset=utf-8"), cgiFormSuccess); }),
              "Content-Type: text/xml; charset=utf-8\r\n\r\n");
    const std::pair<std::string, std::string> cases[] = {
        {"", ""}, {"a&b<c>d\"e'f", "a&amp;b&lt;c&gt;d&quot;e'f"}, {"&amp;", "&amp;amp;"},
        {"caf\xc3\xa9 \t\n", "caf\xc3\xa9 \t\n"},
    };
    for (const auto& [text, escaped] : cases)
        EXPECT_EQ(captured([&] { EXPECT_EQ(cgiHtmlEscape(text.c_str()), cgiFormSuccess); }), escaped) << text;
}

// The exact word, where it matters for the command lines, and what the shell makes of
// it; every word stays valid until released.
TEST(CgiEscapeShellArg, QuotesAsOneWordThatReachesTheShellUnchanged)
{
    const std::pair<std::string, std::string> cases[] = {
        {"", "''"}, {"abc", "'abc'"}, {"a'b", "'a'\\''b'"}, {"'", "''\\'''"}, {"$x `y` \\", "'$x `y` \\'"},
        {"''", ""}, {"two  spaces", ""}, {"$(id) `id` $HOME", ""}, {"\"q\" \\n \\", ""}, {"; rm -rf x | y & z", ""},
        {"*", ""}, {"new\nline", ""}, {"-n", ""},
    };
    std::vector<std::pair<const char*, std::string>> words;
    for (const auto& [text, word] : cases) {
        words.emplace_back(cgi_escapeshellarg(text.c_str()), word);
        const std::string command = "printf %s " + std::string(words.back().first);
        const std::string line = "sh -c " + std::string(cgi_escapeshellarg(command.c_str()));
        const std::unique_ptr<FILE, int (*)(FILE*)> pipe(popen(line.c_str(), "r"), pclose);
        std::string output;
        for (int c; pipe && (c = std::fgetc(pipe.get())) != EOF;)
            output += static_cast<char>(c);
        EXPECT_EQ(output, text);
    }
    for (int i = 0; i < 1000; ++i)
        cgi_escapeshellarg(std::to_string(i).c_str());
    for (const auto& [word, expected] : words) {
        if (!expected.empty()) {
            EXPECT_EQ(word, expected);
        }
    }
    cgi_escapeshellarg_free();
    EXPECT_STREQ(cgi_escapeshellarg("after"), "'after'");
    cgi_escapeshellarg_free();
}

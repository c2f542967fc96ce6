// What the library writes to the response, and shell words built from form values.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <memory>
#include <utility>
#include <vector>

#include "platform/cgic.h"

namespace {

// Points cgiOut at memory for the life of the object.
class CapturedOutput {
public:
    CapturedOutput() : m_stream(open_memstream(&m_data, &m_size)), m_saved(std::exchange(cgiOut, m_stream)) {}
    ~CapturedOutput()
    {
        cgiOut = m_saved;
        std::fclose(m_stream);
        std::free(m_data);
    }
    CapturedOutput(const CapturedOutput&) = delete;
    CapturedOutput& operator=(const CapturedOutput&) = delete;

    std::string text()
    {
        std::fflush(m_stream);
        return {m_data, m_size};
    }

private:
    char* m_data = nullptr;
    std::size_t m_size = 0;
    FILE* m_stream;
    FILE* m_saved;
};

std::string shell_output(const std::string& command)
{
    const std::unique_ptr<FILE, int (*)(FILE*)> pipe(popen(command.c_str(), "r"), pclose);
    std::string output;
    if (!pipe)
        return "<popen failed>";
    for (int c; (c = std::fgetc(pipe.get())) != EOF;)
        output += static_cast<char>(c);
    return output;
}

} // namespace

TEST(CgiHeaderContentType, WritesOneHeaderAndTheBlankLine)
{
    CapturedOutput out;
    EXPECT_EQ(cgiHeaderContentType("text/xml; charset=utf-8"), cgiFormSuccess);
    EXPECT_EQ(out.text(), "Content-Type: text/xml; charset=utf-8\r\n\r\n");
}

TEST(CgiHtmlEscape, ReplacesTheFourSpecialCharactersOnly)
{
    const std::pair<std::string, std::string> cases[] = {
        {"", ""},
        {"plain text", "plain text"},
        {"a&b<c>d\"e'f", "a&amp;b&lt;c&gt;d&quot;e'f"},
        {"&&<<", "&amp;&amp;&lt;&lt;"},
        {"&amp;", "&amp;amp;"},
        {"caf\xc3\xa9 \t\n", "caf\xc3\xa9 \t\n"},
    };
    for (const auto& [text, escaped] : cases) {
        CapturedOutput out;
        EXPECT_EQ(cgiHtmlEscape(text.c_str()), cgiFormSuccess);
        EXPECT_EQ(out.text(), escaped);
    }
}

TEST(CgiEscapeShellArg, QuotesAsOneWord)
{
    const std::pair<std::string, std::string> cases[] = {
        {"", "''"},
        {"abc", "'abc'"},
        {"a'b", "'a'\\''b'"},
        {"'", "''\\'''"},
        {"$x `y` \\", "'$x `y` \\'"},
    };
    for (const auto& [text, word] : cases)
        EXPECT_EQ(cgi_escapeshellarg(text.c_str()), word);
    cgi_escapeshellarg_free();
}

TEST(CgiEscapeShellArg, ReachesTheShellAsOneUnchangedWord)
{
    const std::string texts[] = {
        "a'b", "'", "''", "two  spaces", "$(id) `id` $HOME", "\"q\" \\n \\", "; rm -rf x | y & z", "*", "new\nline",
        "-n",
    };
    for (const std::string& text : texts) {
        const std::string command = std::string("printf %s ") + cgi_escapeshellarg(text.c_str());
        EXPECT_EQ(shell_output("sh -c " + std::string(cgi_escapeshellarg(command.c_str()))), text);
    }
    cgi_escapeshellarg_free();
}

TEST(CgiEscapeShellArg, KeepsEveryWordUntilReleased)
{
    std::vector<std::pair<const char*, std::string>> words;
    for (int i = 0; i < 1000; ++i) {
        const std::string text = "word " + std::to_string(i);
        words.emplace_back(cgi_escapeshellarg(text.c_str()), "'" + text + "'");
    }
    for (const auto& [word, expected] : words)
        ASSERT_EQ(word, expected);
    cgi_escapeshellarg_free();
    EXPECT_STREQ(cgi_escapeshellarg("after"), "'after'");
    cgi_escapeshellarg_free();
}

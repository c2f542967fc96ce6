// Form values made into single shell words for the command lines the program runs.
#include "platform/cgic.h"

#include <deque>
#include <string>
#include <string_view>

namespace {

// Every word handed out since the last release. A deque never moves its elements,
// so the pointers given to callers stay valid while more words are added.
std::deque<std::string>& escaped_words()
{
    static std::deque<std::string> words;
    return words;
}

} // namespace

// Inside single quotes the shell takes every byte literally, so only the quote itself
// needs care: it ends the quoted run, is written as \' and a new run begins.
extern "C" char* cgi_escapeshellarg(const char* text)
{
    std::string word = "'";
    for (const char c : std::string_view(text ? text : "")) {
        if (c == '\'')
            word += "'\\''";
        else
            word += c;
    }
    word += '\'';
    return escaped_words().emplace_back(std::move(word)).data();
}

extern "C" void cgi_escapeshellarg_free(void)
{
    escaped_words().clear();
}

// Reads files over and over while others rewrite them, and counts the rounds in which
// a file was seen empty or cut short:
//   torn_reader ROUNDS PAUSE_US FILE...
// A file is whole when it is not empty, ends in a newline, and, for an XML file
// (".xml"), ends with its root element's closing tag; an exports file's every line
// begins with a double quote. Prints "TORN of ROUNDS".
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <sstream>
#include <string>
#include <string_view>
#include <thread>
#include <vector>

namespace {

std::string slurp(const char* path)
{
    std::ifstream in(path, std::ios::binary);
    std::ostringstream content;
    content << in.rdbuf();
    return content.str();
}

bool ends_with(std::string_view text, std::string_view end)
{
    return text.size() >= end.size() && text.substr(text.size() - end.size()) == end;
}

bool whole(std::string_view path, const std::string& content)
{
    if (content.empty() || content.back() != '\n')
        return false;
    if (ends_with(path, ".xml"))
        return ends_with(content, "</config>\n");
    std::size_t begin = 0;
    while (begin < content.size()) {
        if (content[begin] != '"')
            return false;
        begin = content.find('\n', begin) + 1;
    }
    return true;
}

} // namespace

int main(int argc, char** argv)
{
    if (argc < 4)
        return 2;
    const long rounds = std::atol(argv[1]);
    const long pause_us = std::atol(argv[2]);
    long torn = 0;
    for (long round = 0; round < rounds; ++round) {
        bool seen_torn = false;
        for (int i = 3; i < argc; ++i)
            seen_torn = seen_torn || !whole(argv[i], slurp(argv[i]));
        torn += seen_torn ? 1 : 0;
        std::this_thread::sleep_for(std::chrono::microseconds(pause_us));
    }
    std::printf("%ld of %ld\n", torn, rounds);
    return 0;
}

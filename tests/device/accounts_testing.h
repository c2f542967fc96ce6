// Small helpers of the account tests: the events a command line makes, base64 as the
// pages send passwords, one account file's line.
#pragma once

#include <algorithm>
#include <initializer_list>
#include <sstream>
#include <string>
#include <string_view>
#include <vector>

#include "device.h"

// A foreground command line and the tool event the shell makes of it: words split at
// blanks, quotes removed ('\'' is a quote inside a word), redirections from ">" on dropped.
inline Journal ran(const std::string& line)
{
    Event argv{""};
    bool quoted = false;    // the word so far had quotes, so it counts even when empty
    for (std::size_t i = 0; i < line.size() && line[i] != '>'; ++i) {
        if (line[i] == '\'' || line[i] == '"') {
            const std::size_t end = line.find(line[i], i + 1);
            argv.back() += line.substr(i + 1, end - i - 1);
            quoted = true;
            i = end;
        } else if (line[i] != ' ') {
            argv.back() += line[i] == '\\' ? line[++i] : line[i];
        } else {
            if (!argv.back().empty() || quoted)
                argv.push_back("");
            quoted = false;
        }
    }
    if (argv.back().empty() && !quoted)
        argv.pop_back();
    return {{"sh", "-c", line}, argv};
}

inline std::string base64(std::string_view text)
{
    static constexpr char kAlphabet[] = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
    std::string encoded;
    for (std::size_t i = 0; i < text.size(); i += 3) {
        const std::size_t n = std::min<std::size_t>(3, text.size() - i);
        unsigned value = 0;
        for (std::size_t j = 0; j < 3; ++j)
            value = value << 8 | (j < n ? static_cast<unsigned char>(text[i + j]) : 0u);
        for (std::size_t j = 0; j < 4; ++j)
            encoded += j <= n ? kAlphabet[(value >> (18 - 6 * j)) & 63] : '=';
    }
    return encoded;
}

// The line of a colon file (passwd, group, shadow) for `name`, or "(none)".
inline std::string account_line(const Device& dev, std::string_view file, std::string_view name)
{
    std::istringstream lines(dev.read_file(file));
    std::string line;
    while (std::getline(lines, line)) {
        if (line.compare(0, name.size() + 1, std::string(name) + ":") == 0)
            return line;
    }
    return "(none)";
}

// Small helpers of the user, group and quota tests: journal pieces, the events logged,
// base64 as the pages send passwords, one account file's line, the volume tables.
#pragma once

#include <algorithm>
#include <initializer_list>
#include <sstream>
#include <string>
#include <string_view>
#include <vector>

#include "device.h"

inline Journal concat(std::initializer_list<Journal> parts)
{
    Journal all;
    for (const Journal& part : parts)
        all.insert(all.end(), part.begin(), part.end());
    return all;
}

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

// The share services' reload that many account changes end with.
inline Journal reload_events()
{
    return concat({ran("smbcom >/dev/null 2>&1"), ran("afpcom >/dev/null 2>&1")});
}

// One event per internal volume HD_a2, HD_b2, ...: "{}" in the pattern's arguments
// stands for the volume ("/mnt/HD/{}" -> "/mnt/HD/HD_a2").
inline Journal per_volume(const Event& pattern, int volumes)
{
    Journal journal;
    for (int v = 0; v < volumes; ++v) {
        Event event = pattern;
        for (std::string& arg : event) {
            if (const auto at = arg.find("{}"); at != std::string::npos)
                arg.replace(at, 2, std::string("HD_") + static_cast<char>('a' + v) + "2");
        }
        journal.push_back(event);
    }
    return journal;
}

// The system log lines without their "<PRI>" prefix: "SYSTEM: Account \"x\" has been created."
inline std::vector<std::string> logged(const Device& dev)
{
    std::vector<std::string> lines;
    for (const std::string& line : dev.messages())
        lines.push_back(line.substr(line.find('>') + 1));
    return lines;
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

// The field at `index` of that line.
inline std::string account_field(const Device& dev, std::string_view file, std::string_view name, std::size_t index)
{
    std::istringstream fields(account_line(dev, file, name));
    std::string field;
    for (std::size_t i = 0; std::getline(fields, field, ':'); ++i) {
        if (i == index)
            return field;
    }
    return "";
}

// Whether /etc/shadow's hash for `user` verifies `password`, checked with the C
// library's crypt inside the device.
inline bool password_verifies(Device& dev, std::string_view user, const std::string& password)
{
    const std::string hash = account_field(dev, "/etc/shadow", user, 1);
    if (hash.empty())
        return password.empty();
    return dev.run({"/usr/bin/perl", "-e", "print crypt($ARGV[0], $ARGV[1])", password, hash}).out == hash;
}

// Volume tables: one, two and four internal volumes, a USB disk between two, none.
inline const std::string kOne = "Volume_1 = HD_a2\n";
inline const std::string kTwo = "Volume_1 = HD_a2\nVolume_2 = HD_b2\n";
inline const std::string kFour = "Volume_1 = HD_a2\nVolume_2 = HD_b2\nVolume_3 = HD_c2\nVolume_4 = HD_d2\n";
inline const std::string kUsbBetween = "Volume_1 = HD_a2\nUSB_1 = sdc1\nVolume_2 = HD_b2\n";
inline const std::string kNone = "(none)";   // no shared_name file at all

// Writes the volume table (kNone removes it) and disks of 1877538, 937795, 4096 and
// 2048 megabytes for HD_a2 to HD_d2.
inline void set_volume_table(Device& dev, const std::string& table)
{
    if (table == kNone)
        dev.remove("/etc/shared_name");
    else
        dev.write_file("/etc/shared_name", table);
    dev.write_file("/sim/disks", "/mnt/HD/HD_a2 1922599448 48211960 1874387488\n/mnt/HD/HD_b2 960302096 1048576 959253520\n"
                                 "/mnt/HD/HD_c2 4194304 0 4194304\n/mnt/HD/HD_d2 2097152 0 2097152\n");
}

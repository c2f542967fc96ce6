// Small helpers of the user and group tests: the events logged, base64 as the pages
// send passwords, and one account file's line.
#pragma once

#include <sstream>
#include <string>
#include <string_view>
#include <vector>

#include "device.h"

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

// The folder a device path resolves to inside the device ("" when it does not exist).
inline std::string resolved(Device& dev, const std::string& path)
{
    std::string out = dev.run({"/usr/bin/realpath", "-e", path}).out;
    if (!out.empty() && out.back() == '\n')
        out.pop_back();
    return out;
}

// Writes the volume table; "(none)" removes it.
inline void set_volume_table(Device& dev, const std::string& table)
{
    if (table == "(none)")
        dev.remove("/etc/shared_name");
    else
        dev.write_file("/etc/shared_name", table);
}

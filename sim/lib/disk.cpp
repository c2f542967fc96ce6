// Disk sizes of the simulated device. "/sim/disks" describes its disks, one line per
// mount path: the path, then total, used and free space in kilobytes, separated by
// blanks. A mount path the file does not list has size 0. Answers thus do not depend
// on the machine the simulation runs on.
#include "platform/quota.h"

#include <cerrno>
#include <cstdlib>
#include <optional>
#include <string>
#include <string_view>

#include "journal.h"
#include "text_file.h"

namespace {

bool is_blank(char c)
{
    return c == ' ' || (c >= '\t' && c <= '\r');
}

// The next blank-separated word of the line, or nothing at its end.
std::optional<std::string_view> next_word(std::string_view& rest)
{
    std::size_t begin = 0;
    while (begin < rest.size() && is_blank(rest[begin]))
        ++begin;
    if (begin == rest.size())
        return std::nullopt;
    std::size_t end = begin;
    while (end < rest.size() && !is_blank(rest[end]))
        ++end;
    const std::string_view word = rest.substr(begin, end - begin);
    rest.remove_prefix(end);
    return word;
}

// A number in base 10 at the start of the rest (after blanks), as a stream reads it.
std::optional<unsigned long long> next_number(std::string_view& rest)
{
    const std::string text(rest);
    char* end = nullptr;
    errno = 0;
    const unsigned long long value = std::strtoull(text.c_str(), &end, 10);
    if (end == text.c_str() || errno == ERANGE)
        return std::nullopt;
    rest.remove_prefix(static_cast<std::size_t>(end - text.c_str()));
    return value;
}

// The description of the disks, read once per process: nothing changes it while a
// request runs, and a request asks for the size of every volume in turn.
const std::string& disk_list()
{
    static const std::string disks = read_text("/sim/disks");
    return disks;
}

} // namespace

extern "C" int LIB_Get_Disk_Size(const char* mount_path, unsigned long long* total,
                                 unsigned long long* used, unsigned long long* free_space)
{
    journal_record("LIB_Get_Disk_Size", {mount_path});
    int result = -1;
    for_each_line(disk_list(), [&](std::string_view rest) {
        if (result == 0)
            return;
        const auto path = next_word(rest);
        const auto t = next_number(rest);
        const auto u = t ? next_number(rest) : std::nullopt;
        const auto f = u ? next_number(rest) : std::nullopt;
        if (!f || *path != mount_path)
            return;
        *total = *t;
        *used = *u;
        *free_space = *f;
        result = 0;
    });
    return result;
}

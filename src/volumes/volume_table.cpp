#include "volumes/volume_table.h"

#include <cinttypes>
#include <cstdio>
#include <cstring>
#include <optional>
#include <string>
#include <string_view>

#include "cgi/atomic_file.h"
#include "cgi/file.h"
#include "platform/quota.h"

namespace {

// The table as this process first read it; nothing when it could not be read.
const std::optional<std::string>& table_copy()
{
    static const std::optional<std::string> copy = []() -> std::optional<std::string> {
        std::string text;
        if (!read_whole_file(kSharedNameFile, text))
            return std::nullopt;
        return text;
    }();
    return copy;
}

// The line without its last character: its newline, or a real character when the
// table's last line has none. Both readers drop it unconditionally.
std::string_view without_last(std::string_view line)
{
    if (!line.empty())
        line.remove_suffix(1);
    return line;
}

// The device directory: the text from two characters after the "=".
std::string_view device_column(std::string_view line)
{
    const auto equals = line.find('=');
    if (equals == std::string_view::npos || equals + 2 > line.size())
        return {};
    return line.substr(equals + 2);
}

void copy_bounded(char* result, std::size_t result_size, std::string_view text)
{
    if (result_size == 0)
        return;
    const std::size_t n = std::min(text.size(), result_size - 1);
    std::memcpy(result, text.data(), n);
    result[n] = '\0';
}

} // namespace

UniqueFile open_volume_table()
{
    const std::optional<std::string>& copy = table_copy();
    if (!copy)
        return {};
    // A stream opened for reading only never writes to its buffer.
    return UniqueFile(fmemopen(const_cast<char*>(copy->data()), copy->size(), "r"));
}

void resolve_volume_path(const char* source, char* result, std::size_t result_size, int mode)
{
    FixedText<4096> name(source);
    std::string rest;
    if (char* slash = std::strchr(name.data(), '/')) {
        rest = slash;
        *slash = '\0';
    }

    const UniqueFile table = open_volume_table();
    if (!table) {
        std::fputs("open file error \n", stdout);
        return;
    }

    // The first line that holds the name anywhere is the match: "Volume_1" also
    // matches a "Volume_10" line that comes first. The callers rely on no more.
    FixedText<512> line;
    bool found = false;
    while (read_line(table.get(), line)) {
        if (std::strstr(line.c_str(), name.c_str())) {
            found = true;
            break;
        }
    }
    if (!found) {
        copy_bounded(result, result_size, "null");
        return;
    }

    std::string resolved;
    if (mode != 0) {
        resolved = "/mnt/HD/";
        resolved += device_column(without_last(line.view()));
    } else {
        const auto equals = line.view().find('=');
        if (equals != std::string_view::npos && equals > 0)
            resolved = line.view().substr(0, equals - 1);
    }
    resolved += rest;
    copy_bounded(result, result_size, resolved);
}

void list_volume_sizes(FixedText<256>& result)
{
    const UniqueFile table = open_volume_table();
    if (!table) {
        result.assign("null,null,null,null");
        return;
    }

    std::string sizes;
    FixedText<256> line;
    while (read_line(table.get(), line)) {
        const std::string_view entry = without_last(line.view());
        if (entry.find("HD_") == std::string_view::npos)
            continue;
        const std::string mount = "/mnt/HD/" + std::string(device_column(entry));
        unsigned long long total = 0, used = 0, free_space = 0;
        LIB_Get_Disk_Size(mount.c_str(), &total, &used, &free_space);
        sizes += std::to_string(total >> 10);
        sizes += ',';
    }
    if (!sizes.empty() && sizes.back() == ',')
        sizes.pop_back();
    // The list is a 256-byte buffer: more volumes than fit are cut.
    result.assign(sizes);
}

int count_volumes()
{
    const UniqueFile table = open_volume_table();
    if (!table)
        return 0;
    int count = 0;
    FixedText<256> line;
    while (read_line(table.get(), line)) {
        if (std::strstr(line.c_str(), "HD_") && std::strstr(line.c_str(), "Volume_"))
            ++count;
    }
    return count;
}

// The exports file parser on any file content. Every record it keeps is a rule the
// engine can write back: a folder and host within their buffers, a host that is
// neither missing nor holds a blank or "(", and the two flags 0 or 1.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <memory>
#include <strings.h>

#include "fuzz_check.h"
#include "nfs/exports_parser.h"

namespace {

struct FileCloser {
    void operator()(FILE* file) const { std::fclose(file); }
};

// How many pieces the parser's 512-byte line reader takes the input in.
std::size_t line_pieces(const std::uint8_t* data, std::size_t size)
{
    std::size_t pieces = 0;
    for (std::size_t at = 0; at < size; ++pieces) {
        const std::size_t piece_end = std::min(size, at + 511);
        const void* newline = std::memchr(data + at, '\n', piece_end - at);
        at = newline != nullptr ? static_cast<std::size_t>(static_cast<const std::uint8_t*>(newline) - data) + 1
                                : piece_end;
    }
    return pieces;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    // fmemopen reads exactly `size` bytes, NULs included; it wants at least one.
    const std::unique_ptr<FILE, FileCloser> file(
        size > 0 ? fmemopen(const_cast<std::uint8_t*>(data), size, "r") : std::fopen("/dev/null", "r"));
    fuzz_check(file != nullptr, "the input opens as a file");

    const ExportsList list = parse_exports_config(file.get());
    fuzz_check(list != nullptr, "a readable file always parses");
    fuzz_check(list->volume.empty() && list->ip.empty(), "the head carries no rule");

    const bool has_quote = std::memchr(data, '"', size) != nullptr;
    std::size_t records = 0;
    for (const exports_entry* record = list->next.get(); record != nullptr; record = record->next.get()) {
        ++records;
        fuzz_check(record->volume.length() < decltype(record->volume)::capacity, "folder within its buffer");
        fuzz_check(record->ip.length() < decltype(record->ip)::capacity, "host within its buffer");
        fuzz_check(record->rw == 0 || record->rw == 1, "rw is 0 or 1");
        fuzz_check(record->root_squash == 0 || record->root_squash == 1 || record->volume.empty(),
                   "root_squash is 0 or 1");
        if (record->volume.empty())
            continue;
        fuzz_check(has_quote, "a folder comes only from a quoted text");
        const char* host = record->ip.c_str();
        fuzz_check(host[0] != '\0' && strcasecmp(host, "(NULL)") != 0, "a kept rule has a host");
        fuzz_check(std::strpbrk(host, " (") == nullptr, "a host holds no blank and no \"(\"");
    }
    fuzz_check(count_records(list) == static_cast<int>(records), "the count is the records after the head");
    fuzz_check(records <= line_pieces(data, size), "at most one record per line read");
    return 0;
}

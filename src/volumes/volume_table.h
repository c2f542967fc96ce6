// The volume table: "/etc/shared_name", one line per volume such as "Volume_1 = HD_a2".
#pragma once

#include <cstddef>

#include "cgi/file.h"
#include "cgi/fixed_text.h"

inline constexpr const char* kSharedNameFile = "/etc/shared_name";

// The table for reading, as it was when this process first read it: the program never
// writes it, so a request reads the file once however many of its steps look at the
// volumes, and all of them see the same table. Nothing when the file cannot be read.
UniqueFile open_volume_table();

// Translates a volume-relative path such as "Volume_1/public" into "/mnt/HD/HD_a2/public"
// (mode not 0), or into the volume name column (mode 0). An unknown volume gives "null";
// a missing table writes "open file error " into the answer and leaves `result` as it was.
void resolve_volume_path(const char* source, char* result, std::size_t result_size, int mode);

template <std::size_t N>
void resolve_volume_path(const char* source, FixedText<N>& result, int mode)
{
    resolve_volume_path(source, result.data(), N, mode);
}

// The sizes of all volumes, comma-separated, in file order; "null,null,null,null"
// when the table cannot be read.
void list_volume_sizes(FixedText<256>& result);

// The number of table lines that hold both "HD_" and "Volume_"; 0 without a table.
int count_volumes();

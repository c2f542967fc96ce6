// The volume table: "/etc/shared_name", one line per volume such as "Volume_1 = HD_a2".
#pragma once

#include <cstddef>

#include "cgi/fixed_text.h"

inline constexpr const char* kSharedNameFile = "/etc/shared_name";

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

// The volume lines the user and group dialogs walk: "/etc/shared_name" read in
// 256-byte pieces, each split with "%63s = %15s", the USB volumes left out.
#pragma once

#include <array>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "cgi/file.h"
#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "volumes/volume_table.h"

// Calls visit(volume_name, device_dir) for each internal volume line, in file order.
// The two fields are zeroed once, not per line: a line that does not split keeps the
// fields of the line before it and is visited with them again, as the pages have
// always seen it. Returns false when the table cannot be opened (nothing visited).
template <typename Visit>
bool for_each_internal_volume(Visit visit)
{
    const UniqueFile table = open_file(kSharedNameFile, "r");
    if (!table)
        return false;
    FixedText<256> line;
    FixedText<64> volume;
    FixedText<16> device_dir;
    while (read_line(table.get(), line)) {
        std::sscanf(line.c_str(), "%63s = %15s", volume.data(), device_dir.data());
        if (std::strstr(volume.c_str(), "USB"))
            continue;
        visit(volume.c_str(), device_dir.c_str());
    }
    return true;
}

// A limit field of the pages (megabytes) in the quota library's kilobytes: the
// base-10 value shifted left by 10 bits. An empty or non-numeric field gives 0 (no
// limit), a negative one is passed on negative.
inline long long megabytes_to_kilobytes(const char* field)
{
    return static_cast<long long>(static_cast<unsigned long long>(std::strtoll(field, nullptr, 10)) << 10);
}

// Sets the limits of "available1" to "available4" on the first four internal volumes
// with set_limit(device_dir, name, kilobytes). No "null" test here: every one of those
// volumes is set, a missing field removing its limit.
using VolumeLimitFields = std::array<FixedText<64>, 4>;

// The form fields "available1" to "available4", 64 bytes each.
inline VolumeLimitFields read_volume_limit_fields()
{
    return {form_value<64>("available1"), form_value<64>("available2"), form_value<64>("available3"),
            form_value<64>("available4")};
}

template <typename SetLimit>
void set_internal_volume_limits(const char* name, const VolumeLimitFields& available, SetLimit set_limit)
{
    int k = 0;
    for_each_internal_volume([&](const char*, const char* device_dir) {
        if (k < 4)
            set_limit(device_dir, name, megabytes_to_kilobytes(available.at(k).c_str()));
        ++k;
    });
}

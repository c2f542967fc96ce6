#include "volumes/internal_volumes.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <limits>

#include "cgi/file.h"
#include "cgi/form.h"
#include "volumes/volume_table.h"

bool for_each_internal_volume(const std::function<void(const VolumeLine&)>& visit, SplitBuffers buffers)
{
    const UniqueFile table = open_volume_table();
    if (!table)
        return false;

    FixedText<256> line;
    VolumeLine volume;
    while (read_line(table.get(), line)) {
        if (buffers == SplitBuffers::ClearedPerLine) {
            volume.name.clear();
            volume.device_dir.clear();
        }
        // The widths keep each field within its buffer: 63 and 15 characters.
        std::sscanf(line.c_str(), "%63s = %15s", volume.name.data(), volume.device_dir.data());
        if (std::strstr(volume.name.c_str(), "USB"))
            continue;
        ++volume.number;
        visit(volume);
    }
    return true;
}

VolumePaths map_internal_volume_paths()
{
    VolumePaths paths;
    for_each_internal_volume([&paths](const VolumeLine& volume) {
        if (volume.number <= kQuotaVolumes)
            resolve_volume_path(volume.name.c_str(), paths[volume.number - 1], 1);
    });
    return paths;
}

long long kilobytes_from_megabytes(const char* megabytes)
{
    // A number whose kilobytes a 64-bit value cannot hold is held at the largest (or
    // smallest) whole megabyte that fits: a limit never wraps into another one.
    constexpr long long kMost = std::numeric_limits<long long>::max() >> 10;
    constexpr long long kLeast = std::numeric_limits<long long>::min() >> 10;
    const long long value = std::clamp(std::strtoll(megabytes, nullptr, 10), kLeast, kMost);
    return value * 1024;
}

VolumeLimitFields read_volume_limit_fields()
{
    return {form_value<64>("available1"), form_value<64>("available2"), form_value<64>("available3"),
            form_value<64>("available4")};
}

void set_internal_volume_limits(const char* name, const VolumeLimitFields& available, SetQuotaLimit set_limit)
{
    for_each_internal_volume(
        [&](const VolumeLine& volume) {
            if (volume.number <= kQuotaVolumes)
                set_limit(volume.device_dir.c_str(), name,
                          kilobytes_from_megabytes(available[volume.number - 1].c_str()));
        },
        SplitBuffers::ClearedOnce);
}

#include "volumes/internal_volumes.h"

#include <cstdio>
#include <cstring>

#include "cgi/file.h"
#include "volumes/volume_table.h"

bool for_each_internal_volume(const std::function<void(const VolumeLine&)>& visit, SplitBuffers buffers)
{
    const UniqueFile table = open_file(kSharedNameFile, "r");
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

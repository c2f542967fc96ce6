// Volume tables and disks of the quota tests: devices with one, two and four internal
// volumes, and with a USB disk listed between internal ones.
#pragma once

#include <string>

#include "device.h"

namespace quota_volumes {

inline const std::string kOne = "Volume_1 = HD_a2\n";
inline const std::string kTwo = "Volume_1 = HD_a2\nVolume_2 = HD_b2\n";
inline const std::string kFour = "Volume_1 = HD_a2\nVolume_2 = HD_b2\nVolume_3 = HD_c2\nVolume_4 = HD_d2\n";
inline const std::string kUsbBetween = "Volume_1 = HD_a2\nUSB1_c1 = sdc1\nVolume_2 = HD_b2\n";
inline const std::string kNone = "(none)";   // no shared_name file at all

// Gives the device this volume table; the disks file sizes all four hard-disk volumes
// (HD_a2 1877538, HD_b2 937795, HD_c2 4096, HD_d2 2048 after the division by 1024).
inline void use_table(Device& dev, const std::string& table)
{
    if (table == kNone)
        dev.remove("/etc/shared_name");
    else
        dev.write_file("/etc/shared_name", table);
    dev.write_file("/sim/disks", "/mnt/HD/HD_a2 1922599448 48211960 1874387488\n"
                                 "/mnt/HD/HD_b2 960302096 1048576 959253520\n"
                                 "/mnt/HD/HD_c2 4194304 0 4194304\n"
                                 "/mnt/HD/HD_d2 2097152 0 2097152\n");
}

} // namespace quota_volumes

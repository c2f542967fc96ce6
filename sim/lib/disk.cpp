// Disk sizes of the simulated device. "/sim/disks" describes its disks, one line per
// mount path: the path, then total, used and free space in kilobytes, separated by
// blanks. A mount path the file does not list has size 0. Answers thus do not depend
// on the machine the simulation runs on.
#include "platform/quota.h"

#include <cstdio>
#include <cstring>
#include <fstream>
#include <sstream>
#include <string>

#include "journal.h"

extern "C" int LIB_Get_Disk_Size(const char* mount_path, unsigned long long* total,
                                 unsigned long long* used, unsigned long long* free_space)
{
    journal_record("LIB_Get_Disk_Size", {mount_path});
    std::ifstream disks("/sim/disks");
    std::string line;
    while (std::getline(disks, line)) {
        std::istringstream fields(line);
        std::string path;
        unsigned long long t = 0, u = 0, f = 0;
        if (!(fields >> path >> t >> u >> f) || path != mount_path)
            continue;
        *total = t;
        *used = u;
        *free_space = f;
        return 0;
    }
    return -1;
}

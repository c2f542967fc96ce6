// The quota tool: sets a user's or a group's limit on every internal volume.
//
//   quota_set -u USER -s MEGABYTES -a
//   quota_set -g GROUP -s MEGABYTES -a
//
// The volumes are the lines of /etc/shared_name whose volume name does not hold
// "USB"; the limit is written to the quota store (sim/lib/quota_store.h) in
// kilobytes, so the quota library reads it back. 0 removes the limit.
#include <array>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

#include "sim/lib/quota_store.h"
#include "sim/lib/text_file.h"
#include "tools.h"

int tool_quota_set(int argc, char** argv)
{
    if (argc != 6 || (std::strcmp(argv[1], "-u") != 0 && std::strcmp(argv[1], "-g") != 0)
        || std::strcmp(argv[3], "-s") != 0 || std::strcmp(argv[5], "-a") != 0) {
        std::fprintf(stderr, "Usage: quota_set -u USER|-g GROUP -s MEGABYTES -a\n");
        return 2;
    }
    const char kind = argv[1][1];
    const std::string name = argv[2];
    const long long limit_kb = std::strtoll(argv[4], nullptr, 10) * 1024;
    for (const std::string& line : read_lines("/etc/shared_name")) {
        std::array<char, 64> volume{};
        std::array<char, 16> device_dir{};
        if (std::sscanf(line.c_str(), "%63s = %15s", volume.data(), device_dir.data()) != 2
            || std::strstr(volume.data(), "USB"))
            continue;
        set_quota_limit(kind, device_dir.data(), name, limit_kb);
    }
    return 0;
}

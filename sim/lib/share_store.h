// The simulated device's share store, shared by the share library and the Samba
// share list: "/var/lib/platform/shares", one share per line, TAB-separated:
//     NAME PATH READ_ONLY BROWSEABLE RECYCLE_BIN PUBLIC_ACCESS MEDIA_SERVING REMOTE_ACCESS ACCESS
// READ_ONLY and BROWSEABLE are "yes" or "no", the four numbers 0 or 1, and ACCESS the
// share's access list: comma-separated "ACCOUNT:LEVEL" items, a group written "@name",
// LEVEL 0 (deny), 1 (read) or 2 (read and write). Every share also has its link
// /shares/NAME, which resolves to its folder. A missing store reads as empty.
#pragma once

#include <string>
#include <string_view>
#include <utility>
#include <vector>

inline constexpr const char* kShareStorePath = "/var/lib/platform/shares";

struct ShareEntry {
    std::string name;
    std::string path;
    std::string read_only = "no";
    std::string browseable = "yes";
    int recycle_bin = 0;
    int public_access = 1;
    int media_serving = 0;
    int remote_access = 1;
    std::vector<std::pair<std::string, int>> access;
};

std::vector<ShareEntry> load_shares();
bool save_shares(const std::vector<ShareEntry>& shares);

// Creates the share's folder (and its parents) and points /shares/NAME at it.
void link_share(const ShareEntry& share);
// Removes /shares/NAME (never the folder).
void unlink_share(std::string_view name);

// The simulated device's share store, shared by the share library and the Samba
// share list: "/var/lib/platform/shares", one share per line, TAB-separated:
//     NAME PATH READ_ONLY BROWSEABLE RECYCLE_BIN PUBLIC_ACCESS MEDIA_SERVING REMOTE_ACCESS ACCESS
// READ_ONLY and BROWSEABLE are "yes" or "no", the four numbers 0 or 1, and ACCESS the
// share's access list: comma-separated "ACCOUNT:LEVEL" items, a group written "@name",
// LEVEL 0 (deny), 1 (read) or 2 (read and write). Every share also has its link
// /shares/NAME, which resolves to its folder. A missing store reads as empty.
#pragma once

#include <functional>
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

// What the store can hold. A share name is a single path component below /shares: not
// empty, not "." or "..", no "/" and no control character. An account of an access
// list holds neither control characters nor the list's own separators "," and ":"
// (the empty account is stored as it always was).
// A share path is absolute, without "." or ".." components or control characters.
// The library refuses anything else and changes nothing.
bool is_storable_share_name(std::string_view name);
bool is_storable_account(std::string_view account);
bool is_storable_share_path(std::string_view path);

std::vector<ShareEntry> load_shares();
// The name and path of every share load_shares() gives, in store order, without
// building whole entries, from the store's text (read_text of kShareStorePath): the
// share list of every session page reads them.
void for_each_share_location(std::string_view store,
                             const std::function<void(std::string_view name, std::string_view path)>& visit);
bool save_shares(const std::vector<ShareEntry>& shares);

// Creates the share's folder (and its parents) and points /shares/NAME at it; an entry
// /shares/NAME that is not a link is never replaced.
void link_share(const ShareEntry& share);
// Removes the link /shares/NAME (never the folder, never anything but a link).
void unlink_share(std::string_view name);

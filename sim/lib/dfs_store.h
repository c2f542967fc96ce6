// The simulated device's DFS store, kept by the Samba interface library:
//   "/var/lib/platform/dfs_links"   one link per line, TAB-separated:
//                                       HOST PATH LINK GROUP
//                                   HOST is the remote host, PATH the folder it shares,
//                                   LINK the link's own name, GROUP its DFS group. A
//                                   link is known by LINK within its GROUP.
//   "/var/lib/platform/dfs_groups"  one DFS group name per line.
// Lines keep the order in which they were added. Missing files read as empty.
//
// The remote hosts whose shared folders get_host_share_name() can list:
//   "/sim/remote_hosts"             lines HOST=FOLDER,FOLDER,... ("#" starts a comment);
//                                   "HOST=" is a host that shares nothing. A host
//                                   without a line cannot be reached.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

inline constexpr const char* kDfsLinksPath = "/var/lib/platform/dfs_links";
inline constexpr const char* kDfsGroupsPath = "/var/lib/platform/dfs_groups";
inline constexpr const char* kRemoteHostsPath = "/sim/remote_hosts";

struct DfsLink {
    std::string host;
    std::string path;
    std::string link;
    std::string group;
};

// The same four texts, as parts of the store's text.
struct DfsLinkText {
    std::string_view host;
    std::string_view path;
    std::string_view link;
    std::string_view group;
};

std::vector<DfsLink> load_dfs_links();
// The links of the store's text (read_text of kDfsLinksPath), without copies of their
// texts: the list get_dfs_info() fills reads them once.
std::vector<DfsLinkText> dfs_link_texts(std::string_view store);
bool save_dfs_links(const std::vector<DfsLink>& links);
std::vector<std::string> load_dfs_groups();
bool save_dfs_groups(const std::vector<std::string>& groups);
// Releases the lists the DFS calls filled, pdfs and pnl (Free_All_List).
void release_dfs_lists();
// The folders the host shares, or nothing when the host cannot be reached.
std::optional<std::vector<std::string>> remote_host_folders(const std::string& host);

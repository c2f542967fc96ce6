// DFS links and groups of the simulated device, kept in the DFS store (dfs_store.h).
// The read calls fill the library's lists pdfs and pnl, each one block of records
// (record_block.h); a refill releases the previous list first, and Free_All_List
// releases them too.
//
// Status numbers (none of them is 2, which the program answers for an unknown link):
//   changes (add/mod/del of links and groups)  0 done, -1 refused: the name is
//       already taken (add), the record is not there (mod, del), a text is empty or
//       holds a TAB or a line break, or the store cannot be written
//   chk_dfs_node_exist, chk_dfs_group_exist    1 the name exists (the link within
//       that group), 0 it does not
//   get_host_share_name                        1 listed into pnl, -1 the host cannot
//       be reached (no line in /sim/remote_hosts); pnl is then empty
//   get_dfs_info, get_dfs_group_info           the number of records listed
// create_dfs_link only records itself: the simulated device serves no DFS tree.
#include "platform/samba.h"

#include <algorithm>
#include <string>
#include <string_view>
#include <vector>

#include "cgi/file_lock.h"
#include "dfs_store.h"
#include "journal.h"
#include "record_block.h"
#include "text_file.h"

struct dfs_info* pdfs = nullptr;
struct name_list* pnl = nullptr;

namespace {

constexpr int kDone = 0;
constexpr int kRefused = -1;

// Made on first use, so that a process that lists nothing does not run their set-up
// and clean-up.
RecordBlock& link_records()
{
    static RecordBlock block;
    return block;
}

RecordBlock& name_records()
{
    static RecordBlock block;
    return block;
}

bool storable(std::string_view text)
{
    return !text.empty() && text.find_first_of("\t\r\n") == std::string_view::npos;
}

void fill_names(const std::vector<std::string>& names)
{
    pnl = nullptr;
    const auto records = name_records().hold<name_list>(names.size());
    for (std::size_t i = 0; i < records.size(); ++i)
        copy_text_field(records[i].name, names[i]);
    pnl = records.empty() ? nullptr : records.data();
}

auto find_link(std::vector<DfsLink>& links, std::string_view link, std::string_view group)
{
    return std::find_if(links.begin(), links.end(),
                        [&](const DfsLink& l) { return l.link == link && l.group == group; });
}

} // namespace

extern "C" int create_dfs_link(void)
{
    journal_record("create_dfs_link", {});
    return 0;
}

extern "C" int add_dfs_node(const char* host, const char* path, const char* sharename, const char* group)
{
    journal_record("add_dfs_node", {host, path, sharename, group});
    const auto lock = FileLock::acquire("dfs");
    if (!lock)
        return kRefused;
    std::vector<DfsLink> links = load_dfs_links();
    if (!storable(host) || !storable(path) || !storable(sharename) || !storable(group)
        || find_link(links, sharename, group) != links.end())
        return kRefused;
    links.push_back({host, path, sharename, group});
    return save_dfs_links(links) ? kDone : kRefused;
}

extern "C" int mod_dfs_node(const char* host, const char* path, const char* sharename, const char* group,
                            const char* old_share, const char* old_group)
{
    journal_record("mod_dfs_node", {host, path, sharename, group, old_share, old_group});
    const auto lock = FileLock::acquire("dfs");
    if (!lock)
        return kRefused;
    std::vector<DfsLink> links = load_dfs_links();
    const auto link = find_link(links, old_share, old_group);
    if (link == links.end() || !storable(host) || !storable(path) || !storable(sharename) || !storable(group))
        return kRefused;
    // A new name must not take the place of another link of the target group.
    const auto taken = find_link(links, sharename, group);
    if (taken != links.end() && taken != link)
        return kRefused;
    *link = {host, path, sharename, group};
    return save_dfs_links(links) ? kDone : kRefused;
}

extern "C" int del_dfs_node(const char* local, const char* group)
{
    journal_record("del_dfs_node", {local, group});
    const auto lock = FileLock::acquire("dfs");
    if (!lock)
        return kRefused;
    std::vector<DfsLink> links = load_dfs_links();
    const auto link = find_link(links, local, group);
    if (link == links.end())
        return kRefused;
    links.erase(link);
    return save_dfs_links(links) ? kDone : kRefused;
}

extern "C" int chk_dfs_node_exist(const char* group, const char* sharename)
{
    journal_record("chk_dfs_node_exist", {group, sharename});
    std::vector<DfsLink> links = load_dfs_links();
    return find_link(links, sharename, group) != links.end() ? 1 : 0;
}

extern "C" int get_dfs_info(void)
{
    journal_record("get_dfs_info", {});
    pdfs = nullptr;
    const std::string store = read_text(kDfsLinksPath);
    const std::vector<DfsLinkText> links = dfs_link_texts(store);
    const auto records = link_records().hold<dfs_info>(links.size());
    for (std::size_t i = 0; i < records.size(); ++i) {
        copy_text_field(records[i].host, links[i].host);
        copy_text_field(records[i].share, links[i].path);
        copy_text_field(records[i].link, links[i].link);
        copy_text_field(records[i].group, links[i].group);
    }
    pdfs = records.empty() ? nullptr : records.data();
    return static_cast<int>(records.size());
}

extern "C" int add_dfs_group_node(const char* group)
{
    journal_record("add_dfs_group_node", {group});
    const auto lock = FileLock::acquire("dfs");
    if (!lock)
        return kRefused;
    std::vector<std::string> groups = load_dfs_groups();
    if (!storable(group) || std::find(groups.begin(), groups.end(), group) != groups.end())
        return kRefused;
    groups.push_back(group);
    return save_dfs_groups(groups) ? kDone : kRefused;
}

// The group's links move with it.
extern "C" int mod_dfs_group_node(const char* old_group, const char* group)
{
    journal_record("mod_dfs_group_node", {old_group, group});
    const auto lock = FileLock::acquire("dfs");
    if (!lock)
        return kRefused;
    std::vector<std::string> groups = load_dfs_groups();
    const auto old_entry = std::find(groups.begin(), groups.end(), old_group);
    if (old_entry == groups.end() || !storable(group)
        || (std::string_view(old_group) != group && std::find(groups.begin(), groups.end(), group) != groups.end()))
        return kRefused;
    *old_entry = group;
    std::vector<DfsLink> links = load_dfs_links();
    for (DfsLink& link : links) {
        if (link.group == old_group)
            link.group = group;
    }
    return save_dfs_groups(groups) && save_dfs_links(links) ? kDone : kRefused;
}

extern "C" int chk_dfs_group_exist(const char* group)
{
    journal_record("chk_dfs_group_exist", {group});
    const std::vector<std::string> groups = load_dfs_groups();
    return std::find(groups.begin(), groups.end(), group) != groups.end() ? 1 : 0;
}

extern "C" int get_dfs_group_info(void)
{
    journal_record("get_dfs_group_info", {});
    const std::vector<std::string> groups = load_dfs_groups();
    fill_names(groups);
    return static_cast<int>(groups.size());
}

extern "C" int get_host_share_name(const char* host)
{
    journal_record("get_host_share_name", {host});
    const auto folders = remote_host_folders(host);
    fill_names(folders ? *folders : std::vector<std::string>{});
    return folders ? 1 : kRefused;
}

void release_dfs_lists()
{
    pdfs = nullptr;
    link_records().release();
    pnl = nullptr;
    name_records().release();
}

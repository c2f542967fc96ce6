// DFS links and groups of the simulated device. Not built yet: each call is only an
// event, and the lists stay empty.
#include "platform/samba.h"

#include "journal.h"

struct dfs_info* pdfs = nullptr;
struct name_list* pnl = nullptr;

extern "C" int create_dfs_link(void)
{
    journal_record("create_dfs_link", {});
    return 0;
}

extern "C" int add_dfs_node(const char* host, const char* path, const char* sharename, const char* group)
{
    journal_record("add_dfs_node", {host, path, sharename, group});
    return 0;
}

extern "C" int mod_dfs_node(const char* host, const char* path, const char* sharename, const char* group,
                            const char* old_share, const char* old_group)
{
    journal_record("mod_dfs_node", {host, path, sharename, group, old_share, old_group});
    return 0;
}

extern "C" int del_dfs_node(const char* local, const char* group)
{
    journal_record("del_dfs_node", {local, group});
    return 0;
}

extern "C" int chk_dfs_node_exist(const char* group, const char* sharename)
{
    journal_record("chk_dfs_node_exist", {group, sharename});
    return 0;
}

extern "C" int get_dfs_info(void)
{
    journal_record("get_dfs_info", {});
    return 0;
}

extern "C" int add_dfs_group_node(const char* group)
{
    journal_record("add_dfs_group_node", {group});
    return 0;
}

extern "C" int mod_dfs_group_node(const char* old_group, const char* group)
{
    journal_record("mod_dfs_group_node", {old_group, group});
    return 0;
}

extern "C" int chk_dfs_group_exist(const char* group)
{
    journal_record("chk_dfs_group_exist", {group});
    return 0;
}

extern "C" int get_dfs_group_info(void)
{
    journal_record("get_dfs_group_info", {});
    return 0;
}

extern "C" int get_host_share_name(const char* host)
{
    journal_record("get_host_share_name", {host});
    return 0;
}

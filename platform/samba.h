// The Samba interface library: the share list, DFS links and groups, the directory domain.
#pragma once

#ifdef __cplusplus
extern "C" {
#endif

// The share list that get_samba_info2() fills, in the library's stable order.
struct share_info {
    char name[80];
    char path[4096];
    struct share_info* next;
};
extern struct share_info* pss;
int get_samba_info2(void);
// Releases the lists the library filled: pss, pdfs and pnl.
void Free_All_List(void);

// DFS link records that get_dfs_info() fills.
struct dfs_info {
    char host[512];         // the remote host (second cell of the link grid)
    char share[512];        // the remote share (third cell; the sharename look-up)
    char link[512];         // the link's own name (first cell)
    char group[512];        // the DFS group the link belongs to
    struct dfs_info* next;
};
extern struct dfs_info* pdfs;

// Names that get_dfs_group_info() and get_host_share_name() fill.
struct name_list {
    char name[512];
    struct name_list* next;
};
extern struct name_list* pnl;

int create_dfs_link(void);
int add_dfs_node(const char* host, const char* path, const char* sharename, const char* group);
int mod_dfs_node(const char* host, const char* path, const char* sharename, const char* group,
                 const char* old_share, const char* old_group);
int del_dfs_node(const char* local, const char* group);
int chk_dfs_node_exist(const char* group, const char* sharename);
int get_dfs_info(void);
int add_dfs_group_node(const char* group);
int mod_dfs_group_node(const char* old_group, const char* group);
int chk_dfs_group_exist(const char* group);
int get_dfs_group_info(void);
// 1 when the host's shared folders were listed into pnl.
int get_host_share_name(const char* host);

// Directory domain membership with the settings in the config store.
// ads_start returns 1, 50 or 100 on success.
int ads_start(void);
int ads_stop(void);

#ifdef __cplusplus
}
#endif

// Every command handler, by family. Each takes its input from the form and writes
// the whole HTTP response itself.
#pragma once

// cgi/service.cpp
void cgi_get_service_info();
void cgi_restart_service();
void cgi_ftp_service();

// users/user_add.cpp
void cgi_user_add();
// users/user_del.cpp
void cgi_user_del();
// users/user_list.cpp
void cgi_get_user_list();
void cgi_get_user_info();
// users/user_edit.cpp
void cgi_get_modify_user_info();
// users/modify_account.cpp
void cgi_modify_account();
void cgi_remove_email();

// groups/group_add_del.cpp
void cgi_group_add();
void cgi_group_del();
// groups/group_info.cpp
void cgi_get_group_info();
void cgi_get_modify_group_info();
// groups/group_modify.cpp
void cgi_modify_group();

// quota/quota_set.cpp
void cgi_user_set_quota();
void cgi_group_set_quota();
// quota/quota_limits.cpp
void cgi_adduser_get_user_quota_maxsize();
void cgi_get_user_quota_maxsize();
void cgi_addgroup_get_group_quota_minsize();
void cgi_get_group_quota_minsize();
// quota/quota_info.cpp
void cgi_get_quota_info();

// nfs/nfs_commands.cpp
void cgi_set_nfs_share();
void cgi_get_nfs_info();
void cgi_nfs_enable();
void cgi_del_session();
// nfs/sessions.cpp
void cgi_get_all_session();

// dfs/dfs_links.cpp
void cgi_set_dfs();
void cgi_modify_dfs();
void cgi_del_dfs();
void cgi_get_dfs_list();
void cgi_get_dfs_sharename();
void cgi_get_host_folder();
void cgi_chk_dfs();
// dfs/dfs_groups.cpp
void cgi_set_dfs_enable();
void cgi_get_dfs_info();
void cgi_set_dfs_group();
void cgi_chk_dfs_group();
void cgi_get_dfs_gorup_list();

// bulk/batch_create.cpp
void cgi_user_batch_create();
// bulk/import.cpp
void cgi_import_uesrs();
void cgi_get_import_uesrs();
void cgi_get_import_groups();
void cgi_create_import_users();
void cgi_create_import_groups();
void cgi_get_create_status();
void cgi_download_import_sample();
void cgi_download_import_group_sample();

// domain/ads_join.cpp
void cgi_set_ads();
// domain/ads_info.cpp
void cgi_get_ads_info();

// services/afp.cpp
void cgi_set_afp();
void cgi_get_afp_info();

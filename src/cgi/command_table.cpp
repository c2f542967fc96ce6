// The command table. Names are the pages' interface, misspellings included
// ("cgi_get_dfs_gorup_list", "cgi_import_uesrs", "cgi_get_import_uesrs"): the
// pages send them so and must keep working. Rows are compared in this order.
#include "cgi/command_table.h"

#include <array>

#include "cgi/handlers.h"

namespace {

constexpr std::array<Command, 52> kCommands{{
    {"cgi_get_service_info", cgi_get_service_info},                           // cgi/service.cpp
    {"cgi_user_add", cgi_user_add},                                           // users/user_add.cpp
    {"cgi_del_session", cgi_del_session},                                     // nfs/nfs_commands.cpp
    {"cgi_get_user_info", cgi_get_user_info},                                 // users/user_list.cpp
    {"cgi_get_user_list", cgi_get_user_list},                                 // users/user_list.cpp
    {"cgi_user_del", cgi_user_del},                                           // users/user_del.cpp
    {"cgi_get_modify_user_info", cgi_get_modify_user_info},                   // users/user_edit.cpp
    {"cgi_get_group_info", cgi_get_group_info},                               // groups/group_info.cpp
    {"cgi_group_add", cgi_group_add},                                         // groups/group_add_del.cpp
    {"cgi_group_set_quota", cgi_group_set_quota},                             // quota/quota_set.cpp
    {"cgi_group_del", cgi_group_del},                                         // groups/group_add_del.cpp
    {"cgi_get_modify_group_info", cgi_get_modify_group_info},                 // groups/group_info.cpp
    {"cgi_user_set_quota", cgi_user_set_quota},                               // quota/quota_set.cpp
    {"cgi_get_quota_info", cgi_get_quota_info},                               // quota/quota_info.cpp
    {"cgi_get_user_quota_maxsize", cgi_get_user_quota_maxsize},               // quota/quota_limits.cpp
    {"cgi_set_nfs_share", cgi_set_nfs_share},                                 // nfs/nfs_commands.cpp
    {"cgi_get_nfs_info", cgi_get_nfs_info},                                   // nfs/nfs_commands.cpp
    {"cgi_set_afp", cgi_set_afp},                                             // services/afp.cpp
    {"cgi_get_afp_info", cgi_get_afp_info},                                   // services/afp.cpp
    {"cgi_get_group_quota_minsize", cgi_get_group_quota_minsize},             // quota/quota_limits.cpp
    {"cgi_nfs_enable", cgi_nfs_enable},                                       // nfs/nfs_commands.cpp
    {"cgi_adduser_get_user_quota_maxsize", cgi_adduser_get_user_quota_maxsize},     // quota/quota_limits.cpp
    {"cgi_addgroup_get_group_quota_minsize", cgi_addgroup_get_group_quota_minsize}, // quota/quota_limits.cpp
    {"cgi_get_all_session", cgi_get_all_session},                             // nfs/sessions.cpp
    {"cgi_restart_service", cgi_restart_service},                             // cgi/service.cpp
    {"cgi_ftp_service", cgi_ftp_service},                                     // cgi/service.cpp
    {"cgi_set_dfs", cgi_set_dfs},                                             // dfs/dfs_links.cpp
    {"cgi_get_dfs_list", cgi_get_dfs_list},                                   // dfs/dfs_links.cpp
    {"cgi_get_host_folder", cgi_get_host_folder},                             // dfs/dfs_links.cpp
    {"cgi_del_dfs", cgi_del_dfs},                                             // dfs/dfs_links.cpp
    {"cgi_modify_dfs", cgi_modify_dfs},                                       // dfs/dfs_links.cpp
    {"cgi_set_dfs_enable", cgi_set_dfs_enable},                               // dfs/dfs_groups.cpp
    {"cgi_get_dfs_info", cgi_get_dfs_info},                                   // dfs/dfs_groups.cpp
    {"cgi_chk_dfs", cgi_chk_dfs},                                             // dfs/dfs_links.cpp
    {"cgi_get_dfs_sharename", cgi_get_dfs_sharename},                         // dfs/dfs_links.cpp
    {"cgi_set_dfs_group", cgi_set_dfs_group},                                 // dfs/dfs_groups.cpp
    {"cgi_chk_dfs_group", cgi_chk_dfs_group},                                 // dfs/dfs_groups.cpp
    {"cgi_get_dfs_gorup_list", cgi_get_dfs_gorup_list},                       // dfs/dfs_groups.cpp
    {"cgi_user_batch_create", cgi_user_batch_create},                         // bulk/batch_create.cpp
    {"cgi_import_uesrs", cgi_import_uesrs},                                   // bulk/import.cpp
    {"cgi_get_import_uesrs", cgi_get_import_uesrs},                           // bulk/import.cpp
    {"cgi_get_import_groups", cgi_get_import_groups},                         // bulk/import.cpp
    {"cgi_create_import_users", cgi_create_import_users},                     // bulk/import.cpp
    {"cgi_create_import_groups", cgi_create_import_groups},                   // bulk/import.cpp
    {"cgi_get_create_status", cgi_get_create_status},                         // bulk/import.cpp
    {"cgi_download_import_sample", cgi_download_import_sample},               // bulk/import.cpp
    {"cgi_download_import_group_sample", cgi_download_import_group_sample},   // bulk/import.cpp
    {"cgi_set_ads", cgi_set_ads},                                             // domain/ads_join.cpp
    {"cgi_get_ads_info", cgi_get_ads_info},                                   // domain/ads_info.cpp
    {"cgi_modify_account", cgi_modify_account},                               // users/modify_account.cpp
    {"cgi_modify_group", cgi_modify_group},                                   // groups/group_modify.cpp
    {"cgi_remove_email", cgi_remove_email},                                   // users/modify_account.cpp
}};

} // namespace

std::span<const Command> command_table()
{
    return kCommands;
}

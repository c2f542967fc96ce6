// The share and account library: share records, share access, account names.
#pragma once

#ifdef __cplusplus
extern "C" {
#endif

// One share as add_share() takes it. Fill a zeroed record.
struct share_record {
    char name[80];
    char path[4096];
    char read_only[8];      // "yes" or "no"
    char browseable[8];     // "yes" or "no"
    int recycle_bin;        // 0 or 1
    int public_access;      // 0 or 1
    int media_serving;      // 0 or 1
    int remote_access;      // 0 or 1
};

// A list of accounts and their access to the share named in the list.
struct acnt_node {
    char name[128];
    int access;             // 0 none, 1 read, 2 read and write
    struct acnt_node* next;
};
struct acnt_list {
    char share[80];
    struct acnt_node* head;
};

// Gives a new account ("name") or group ("@name") default-deny rights on every share.
int set_default_deny(const char* name);
// 1 when no share of that name exists yet, 0 when one does.
int chk_share(const char* name);
int add_share(const struct share_record* share);
int public_off_share(const char* name);
int insert_acnt_node(struct acnt_list* list, const char* name, int access);
int acnt_mod_share(const struct acnt_list* list, int mode);
void free_acnt_list(struct acnt_list* list);
int del_share(const char* name);

// Clean-up and rename of an account or group name in every share's access lists.
int delete_user_group_name(const char* name);
int change_user_group_name(const char* old_name, const char* new_name);

// The groups a user belongs to, as the pages show them, into `buffer` (55296 bytes).
int LIB_Web_Get_User_Join_Group(const char* user, char* buffer);
// The name of the user's primary group into `buffer` (at least 64 bytes).
int LIB_Get_User_First_Group_Name(const char* user, char* buffer);
// Cuts the text at its first CR or LF.
void remove_0D_0A(char* text);

#ifdef __cplusplus
}
#endif

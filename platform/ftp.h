// The FTP service library.
#pragma once

#ifdef __cplusplus
extern "C" {
#endif

int LIB_WEB_STOP_FTP(void);
int LIB_WEB_START_FTP(void);
int LIB_FTP_Create_Share_Link(void);
int LIB_FTP_Del_User(const char* user);
int LIB_FTP_Del_Group(const char* group);
int LIB_FTP_Del_Share(const char* share);
// is_group: 0 for a user, 1 for a group.
int LIB_FTP_Change_User_Group(int is_group, const char* old_name, const char* new_name);

#ifdef __cplusplus
}
#endif

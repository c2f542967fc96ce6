// The FTP service library: the simulated device runs no FTP server, so each call is an event.
#include "platform/ftp.h"

#include <string>

#include "journal.h"

extern "C" int LIB_WEB_STOP_FTP(void)
{
    journal_record("LIB_WEB_STOP_FTP", {});
    return 0;
}

extern "C" int LIB_WEB_START_FTP(void)
{
    journal_record("LIB_WEB_START_FTP", {});
    return 0;
}

extern "C" int LIB_FTP_Create_Share_Link(void)
{
    journal_record("LIB_FTP_Create_Share_Link", {});
    return 0;
}

extern "C" int LIB_FTP_Del_User(const char* user)
{
    journal_record("LIB_FTP_Del_User", {user});
    return 0;
}

extern "C" int LIB_FTP_Del_Group(const char* group)
{
    journal_record("LIB_FTP_Del_Group", {group});
    return 0;
}

extern "C" int LIB_FTP_Del_Share(const char* share)
{
    journal_record("LIB_FTP_Del_Share", {share});
    return 0;
}

extern "C" int LIB_FTP_Change_User_Group(int is_group, const char* old_name, const char* new_name)
{
    journal_record("LIB_FTP_Change_User_Group", {std::to_string(is_group), old_name, new_name});
    return 0;
}

// The quota bounds of the simulated device. Not built yet: each call is only an
// event, and no bound applies (0).
#include "platform/quota.h"

#include "journal.h"

extern "C" unsigned long long Lib_Get_Max_User_Quota(const char* device_dir, const char* user)
{
    journal_record("Lib_Get_Max_User_Quota", {device_dir, user});
    return 0;
}

extern "C" unsigned long long Lib_Gen_Get_Max_User_Quota(const char* device_dir, const char* user)
{
    journal_record("Lib_Gen_Get_Max_User_Quota", {device_dir, user});
    return 0;
}

extern "C" unsigned long long Lib_Get_Min_Group_Quota(const char* device_dir, const char* group)
{
    journal_record("Lib_Get_Min_Group_Quota", {device_dir, group});
    return 0;
}

extern "C" unsigned long long LIB_Get_Add_New_Group_Min_Quota(const char* device_dir, const char* members)
{
    journal_record("LIB_Get_Add_New_Group_Min_Quota", {device_dir, members});
    return 0;
}

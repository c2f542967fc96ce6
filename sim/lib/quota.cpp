// The quota library of the simulated device. Limits live in the quota store
// (quota_store.h); the calls not built yet are only events.
#include "platform/quota.h"

#include <string>

#include "journal.h"
#include "quota_store.h"

extern "C" int LIB_Quota(int kind, const char* device_dir, const char* name,
                         unsigned long long* limit, unsigned long long* used)
{
    journal_record("LIB_Quota", {std::to_string(kind), device_dir, name});
    *limit = kind == 'u' || kind == 'g' ? quota_limit(static_cast<char>(kind), device_dir, name) : 0;
    *used = 0;
    return 0;
}

extern "C" int LIB_Set_User_Quota(const char* device_dir, const char* user, long long limit_kb)
{
    journal_record("LIB_Set_User_Quota", {device_dir, user, std::to_string(limit_kb)});
    return set_quota_limit('u', device_dir, user, limit_kb) ? 0 : -1;
}

extern "C" int LIB_Set_Group_Quota(const char* device_dir, const char* group, long long limit_kb)
{
    journal_record("LIB_Set_Group_Quota", {device_dir, group, std::to_string(limit_kb)});
    return set_quota_limit('g', device_dir, group, limit_kb) ? 0 : -1;
}

extern "C" int LIB_Compare_User_and_Group_Quota(const char* user, const char* group)
{
    journal_record("LIB_Compare_User_and_Group_Quota", {user, group});
    return 0;
}

extern "C" int LIB_Rejoin_Other_Group_Quota(void)
{
    journal_record("LIB_Rejoin_Other_Group_Quota", {});
    return 0;
}

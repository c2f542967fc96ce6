// The quota library of the simulated device, over the quota store (quota_store.h),
// which the quota_set tool writes too: a limit set one way reads back the other way.
//
//   LIB_Quota(kind, dir, name)          the limit of user ('u', 117) or group ('g', 103)
//                                       on the volume in kilobytes, 0 when none; the
//                                       space in use is always 0 (nothing is measured)
//   LIB_Set_User_Quota / _Group_        sets the limit; 0 removes it
//   LIB_Compare_User_and_Group_Quota    on each volume where the group has a limit, a
//                                       user limit that is unset or larger is lowered to it
//   LIB_Rejoin_Other_Group_Quota        drops the limits of groups that no longer exist
// Each call records itself in the journal first.
#include "platform/quota.h"

#include <string>

#include "account_files.h"
#include "cgi/file_lock.h"
#include "journal.h"
#include "quota_store.h"

extern "C" int LIB_Quota(int kind, const char* device_dir, const char* name,
                         unsigned long long* limit, unsigned long long* used)
{
    journal_record("LIB_Quota", {std::to_string(kind), device_dir, name});
    *limit = kind == 'u' || kind == 'g' ? static_cast<unsigned long long>(quota_limit(static_cast<char>(kind), device_dir, name)) : 0;
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
    const auto lock = FileLock::acquire("quota");
    if (!lock)
        return -1;
    std::vector<QuotaLimit> limits = load_quota_limits();
    for (const QuotaLimit& bound : load_quota_limits()) {
        if (bound.kind != 'g' || bound.name != group || bound.limit_kb <= 0)
            continue;
        bool found = false;
        for (QuotaLimit& limit : limits) {
            if (limit.kind == 'u' && limit.name == user && limit.device_dir == bound.device_dir) {
                found = true;
                if (limit.limit_kb > bound.limit_kb)
                    limit.limit_kb = bound.limit_kb;
            }
        }
        if (!found)
            limits.push_back({'u', bound.device_dir, user, bound.limit_kb});
    }
    return save_quota_limits(limits) ? 0 : -1;
}

extern "C" int LIB_Rejoin_Other_Group_Quota(void)
{
    journal_record("LIB_Rejoin_Other_Group_Quota", {});
    const auto lock = FileLock::acquire("quota");
    if (!lock)
        return -1;
    const ColonFile groups = ColonFile::load(kGroupFile);
    std::vector<QuotaLimit> limits = load_quota_limits();
    std::erase_if(limits, [&](const QuotaLimit& limit) { return limit.kind == 'g' && !groups.find(limit.name); });
    return save_quota_limits(limits) ? 0 : -1;
}

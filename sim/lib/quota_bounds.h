// The quota bounds of the simulated device, as pure rules over data so that they can
// be tested on a small table of users, groups and limits.
//
// Memberships come from the device's "/etc/passwd" (a user's primary group, by group
// id) and "/etc/group" (the member list, the fourth field, comma-separated); limits
// from the quota store (quota_store.h), in kilobytes. A limit of 0 or below sets no
// bound: 0 is "no limit", and a negative limit is kept as the pages sent it but never
// bounds anything.
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "quota_store.h"

// One user in one group: from the user's primary group, or from the group's member list.
struct Membership {
    std::string user;
    std::string group;
};

// The device's memberships; a user listed in its own primary group counts once.
std::vector<Membership> load_memberships();

// The member list of a group not yet created, as the group page sends it: user names
// separated by ",", blanks around a name ignored, empty names skipped.
std::vector<std::string> parse_member_list(std::string_view members);

// The largest limit the user's groups allow on the volume: the smallest limit among
// the groups the user belongs to that have one there; 0 when none has.
unsigned long long max_user_quota(const std::vector<Membership>& memberships, const std::vector<QuotaLimit>& limits,
                                  std::string_view device_dir, std::string_view user);

// The smallest limit a group may get on the volume without falling below a member's
// present limit: the largest limit among the members that have one there; 0 when none has.
unsigned long long min_group_quota(const std::vector<Membership>& memberships, const std::vector<QuotaLimit>& limits,
                                   std::string_view device_dir, std::string_view group);

// The same over the given members of a group not yet created.
unsigned long long min_new_group_quota(const std::vector<std::string>& members, const std::vector<QuotaLimit>& limits,
                                       std::string_view device_dir);

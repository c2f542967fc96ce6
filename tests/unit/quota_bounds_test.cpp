// The quota bounds of the simulated quota library on a small table of limits.
#include <gtest/gtest.h>

#include "sim/lib/quota_bounds.h"

TEST(QuotaBounds, UsersAreCappedByTheirGroupsAndGroupsByTheirMembers)
{
    // alice and bob are in "family"; carol and alice in "office"; everyone in "allaccount".
    const std::vector<Membership> memberships{
        {"alice", "allaccount"}, {"bob", "allaccount"}, {"carol", "allaccount"}, {"dave", "allaccount"},
        {"alice", "family"},     {"bob", "family"},     {"carol", "office"},     {"alice", "office"},
    };
    // Kilobytes. HD_b2: family 0 (none), office -5 (kept, but no bound), bob -1.
    const std::vector<QuotaLimit> limits{
        {'g', "HD_a2", "family", 1000}, {'g', "HD_a2", "office", 500}, {'u', "HD_a2", "alice", 300},
        {'u', "HD_a2", "bob", 800},     {'g', "HD_b2", "allaccount", 2000}, {'g', "HD_b2", "family", 0},
        {'g', "HD_b2", "office", -5},   {'u', "HD_b2", "carol", 700},   {'u', "HD_b2", "bob", -1},
    };
    struct Case {
        const char* dir;
        const char* who;
        unsigned long long bound;
    };
    // A user's maximum: the smallest limit of its groups.
    for (const Case& c : {Case{"HD_a2", "alice", 500}, {"HD_a2", "bob", 1000}, {"HD_a2", "dave", 0},
                          {"HD_b2", "alice", 2000}, {"HD_c2", "alice", 0}, {"HD_a2", "", 0}})
        EXPECT_EQ(max_user_quota(memberships, limits, c.dir, c.who), c.bound) << c.dir << " " << c.who;
    // A group's minimum: the largest limit of its members.
    for (const Case& c : {Case{"HD_a2", "family", 800}, {"HD_a2", "office", 300}, {"HD_b2", "family", 0},
                          {"HD_b2", "office", 700}, {"HD_a2", "nosuchgroup", 0}})
        EXPECT_EQ(min_group_quota(memberships, limits, c.dir, c.who), c.bound) << c.dir << " " << c.who;
    // A new group's minimum, over the member list sent: blanks around names are ignored,
    // empty names skipped, "alice bob" is one name.
    for (const Case& c : {Case{"HD_a2", "alice,bob", 800}, {"HD_a2", " alice , carol ", 300},
                          {"HD_a2", ",,carol,", 0}, {"HD_b2", "bob,carol", 700}, {"HD_a2", "alice bob", 0}})
        EXPECT_EQ(min_new_group_quota(parse_member_list(c.who), limits, c.dir), c.bound) << c.who;
}

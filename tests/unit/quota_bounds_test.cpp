// The quota bounds of the simulated quota library on a small table of limits.
#include <gtest/gtest.h>

#include "sim/lib/quota_bounds.h"

namespace {

// alice and bob are in "family"; carol in "office"; everyone in "allaccount" (their
// primary group); dave in no limited group.
const std::vector<Membership> kMemberships{
    {"alice", "allaccount"}, {"bob", "allaccount"}, {"carol", "allaccount"}, {"dave", "allaccount"},
    {"alice", "family"},     {"bob", "family"},     {"carol", "office"},     {"alice", "office"},
};

// Kilobytes. HD_a2: family 1000, office 500, alice 300, bob 800. HD_b2: allaccount
// 2000, family 0 (none), office -5 (kept, but no bound), carol 700, bob -1.
const std::vector<QuotaLimit> kLimits{
    {'g', "HD_a2", "family", 1000}, {'g', "HD_a2", "office", 500}, {'u', "HD_a2", "alice", 300},
    {'u', "HD_a2", "bob", 800},     {'g', "HD_b2", "allaccount", 2000}, {'g', "HD_b2", "family", 0},
    {'g', "HD_b2", "office", -5},   {'u', "HD_b2", "carol", 700},   {'u', "HD_b2", "bob", -1},
};

} // namespace

TEST(QuotaBounds, UserMaximumIsTheSmallestLimitOfItsGroups)
{
    const struct {
        const char* dir;
        const char* user;
        unsigned long long max;
    } cases[] = {
        {"HD_a2", "alice", 500},   // family 1000 and office 500: office caps her
        {"HD_a2", "bob", 1000},    // family only
        {"HD_a2", "carol", 500},   // office
        {"HD_a2", "dave", 0},      // no limited group: no bound
        {"HD_b2", "alice", 2000},  // allaccount; family's 0 and office's -5 do not bound
        {"HD_c2", "alice", 0},     // a volume without limits
        {"HD_a2", "", 0},          // not a member of anything
    };
    for (const auto& c : cases)
        EXPECT_EQ(max_user_quota(kMemberships, kLimits, c.dir, c.user), c.max) << c.dir << " " << c.user;
}

TEST(QuotaBounds, GroupMinimumIsTheLargestLimitOfItsMembers)
{
    const struct {
        const char* dir;
        const char* group;
        unsigned long long min;
    } cases[] = {
        {"HD_a2", "family", 800},      // alice 300, bob 800
        {"HD_a2", "office", 300},      // carol none, alice 300
        {"HD_b2", "family", 0},        // bob's -1 is no bound
        {"HD_b2", "office", 700},      // carol
        {"HD_c2", "family", 0},
        {"HD_a2", "nosuchgroup", 0},
    };
    for (const auto& c : cases)
        EXPECT_EQ(min_group_quota(kMemberships, kLimits, c.dir, c.group), c.min) << c.dir << " " << c.group;
}

TEST(QuotaBounds, NewGroupMinimumIsOverTheSentMemberList)
{
    const struct {
        const char* dir;
        const char* members;
        unsigned long long min;
    } cases[] = {
        {"HD_a2", "alice,bob", 800},
        {"HD_a2", " alice , carol ", 300},  // blanks around names are ignored
        {"HD_a2", ",,carol,", 0},           // empty names are skipped
        {"HD_b2", "bob,carol", 700},
        {"HD_a2", "", 0},          // not a member of anything
        {"HD_a2", "alice bob", 0},          // one name "alice bob", which has no limit
    };
    for (const auto& c : cases)
        EXPECT_EQ(min_new_group_quota(parse_member_list(c.members), kLimits, c.dir), c.min) << c.members;
}

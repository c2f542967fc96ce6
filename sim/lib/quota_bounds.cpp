// The quota bounds of the simulated device: how the limits of groups and of their
// members bound each other. The rules themselves are pure functions (quota_bounds.h);
// the library calls gather the device's memberships and limits and apply them.
//
// The rule, on one volume, in kilobytes, where a limit of 0 or below sets no bound:
// - a user may get at most the smallest limit of the groups it belongs to (primary
//   group or member list), since each group's limit caps each of its members; with
//   no limited group there is no maximum (0);
// - a group may get no less than the largest limit of its present members, so that
//   no member loses space it already has; with no limited member there is no minimum
//   (0). A member without a limit sets no bound either: it has nothing to lose.
// - a new group: the same over the member list the page sends.
#include "quota_bounds.h"

#include <algorithm>
#include <map>
#include <optional>

#include "journal.h"
#include "platform/quota.h"
#include "text_file.h"

namespace {

std::string_view trimmed(std::string_view text)
{
    const auto first = text.find_first_not_of(" \t");
    if (first == std::string_view::npos)
        return {};
    const auto last = text.find_last_not_of(" \t\r\n");
    return text.substr(first, last - first + 1);
}

// The limit that bounds: positive limits only.
std::optional<unsigned long long> bounding_limit(const std::vector<QuotaLimit>& limits, char kind,
                                                 std::string_view device_dir, std::string_view name)
{
    for (const QuotaLimit& limit : limits) {
        if (limit.kind == kind && limit.device_dir == device_dir && limit.name == name)
            return limit.limit_kb > 0 ? std::optional<unsigned long long>(limit.limit_kb) : std::nullopt;
    }
    return std::nullopt;
}

// The largest present limit among these users; 0 when none has one.
template <typename Users>
unsigned long long largest_user_limit(const Users& users, const std::vector<QuotaLimit>& limits,
                                      std::string_view device_dir)
{
    unsigned long long largest = 0;
    for (const std::string& user : users) {
        if (const auto limit = bounding_limit(limits, 'u', device_dir, user))
            largest = std::max(largest, *limit);
    }
    return largest;
}

} // namespace

std::vector<Membership> load_memberships()
{
    std::vector<Membership> memberships;
    std::map<std::string, std::string> group_by_id;
    std::vector<std::vector<std::string>> groups;
    for (const std::string& line : read_lines("/etc/group")) {
        auto fields = split(line, ':');
        if (fields.size() < 3)
            continue;
        group_by_id.emplace(fields[2], fields[0]);
        groups.push_back(std::move(fields));
    }
    for (const std::string& line : read_lines("/etc/passwd")) {
        const auto fields = split(line, ':');
        if (fields.size() < 4)
            continue;
        if (const auto group = group_by_id.find(fields[3]); group != group_by_id.end())
            memberships.push_back({fields[0], group->second});
    }
    for (const auto& group : groups) {
        if (group.size() < 4)
            continue;
        for (const std::string& member : parse_member_list(group[3])) {
            const bool known = std::any_of(memberships.begin(), memberships.end(), [&](const Membership& m) {
                return m.user == member && m.group == group[0];
            });
            if (!known)
                memberships.push_back({member, group[0]});
        }
    }
    return memberships;
}

std::vector<std::string> parse_member_list(std::string_view members)
{
    std::vector<std::string> names;
    for (const std::string& field : split(members, ',')) {
        const std::string_view name = trimmed(field);
        if (!name.empty())
            names.emplace_back(name);
    }
    return names;
}

unsigned long long max_user_quota(const std::vector<Membership>& memberships, const std::vector<QuotaLimit>& limits,
                                  std::string_view device_dir, std::string_view user)
{
    std::optional<unsigned long long> smallest;
    for (const Membership& membership : memberships) {
        if (membership.user != user)
            continue;
        if (const auto limit = bounding_limit(limits, 'g', device_dir, membership.group))
            smallest = std::min(smallest.value_or(*limit), *limit);
    }
    return smallest.value_or(0);
}

unsigned long long min_group_quota(const std::vector<Membership>& memberships, const std::vector<QuotaLimit>& limits,
                                   std::string_view device_dir, std::string_view group)
{
    std::vector<std::string> members;
    for (const Membership& membership : memberships) {
        if (membership.group == group)
            members.push_back(membership.user);
    }
    return largest_user_limit(members, limits, device_dir);
}

unsigned long long min_new_group_quota(const std::vector<std::string>& members, const std::vector<QuotaLimit>& limits,
                                       std::string_view device_dir)
{
    return largest_user_limit(members, limits, device_dir);
}

extern "C" unsigned long long Lib_Get_Max_User_Quota(const char* device_dir, const char* user)
{
    journal_record("Lib_Get_Max_User_Quota", {device_dir, user});
    return max_user_quota(load_memberships(), load_quota_limits(), device_dir, user);
}

// The user edit dialog's maximum follows the same rule as the other pages'.
extern "C" unsigned long long Lib_Gen_Get_Max_User_Quota(const char* device_dir, const char* user)
{
    journal_record("Lib_Gen_Get_Max_User_Quota", {device_dir, user});
    return max_user_quota(load_memberships(), load_quota_limits(), device_dir, user);
}

extern "C" unsigned long long Lib_Get_Min_Group_Quota(const char* device_dir, const char* group)
{
    journal_record("Lib_Get_Min_Group_Quota", {device_dir, group});
    return min_group_quota(load_memberships(), load_quota_limits(), device_dir, group);
}

// `members`: the group page's member list, user names separated by ",".
extern "C" unsigned long long LIB_Get_Add_New_Group_Min_Quota(const char* device_dir, const char* members)
{
    journal_record("LIB_Get_Add_New_Group_Min_Quota", {device_dir, members});
    return min_new_group_quota(parse_member_list(members), load_quota_limits(), device_dir);
}

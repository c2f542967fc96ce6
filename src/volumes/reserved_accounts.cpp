#include "volumes/reserved_accounts.h"

#include <array>
#include <cstdint>
#include <string_view>

#include "volumes/account_names.h"

namespace {

// Exact, case-sensitive names: "Admin" is an ordinary user.
constexpr std::array<std::string_view, 8> kReservedUsers{
    "root", "nobody", "ftp", "admin", "sshd", "squeezecenter", "messagebus", "netdev"};
constexpr std::array<std::string_view, 5> kReservedGroups{
    "root", "allaccount", "administrators", "share", "netdev"};

// The lengths of the names, one bit each: most names of a long list are passed over
// by their length alone.
template <std::size_t N>
constexpr std::uint64_t length_bits(const std::array<std::string_view, N>& names)
{
    std::uint64_t bits = 0;
    for (std::string_view reserved : names)
        bits |= std::uint64_t{1} << reserved.size();
    return bits;
}

template <std::size_t N>
bool is_listed_in(const std::array<std::string_view, N>& names, std::uint64_t lengths, std::string_view name)
{
    if (name.size() >= 64 || !(lengths >> name.size() & 1))
        return false;
    for (std::string_view reserved : names) {
        if (reserved == name)
            return true;
    }
    return false;
}

constexpr std::uint64_t kReservedUserLengths = length_bits(kReservedUsers);
constexpr std::uint64_t kReservedGroupLengths = length_bits(kReservedGroups);

template <std::size_t N>
bool lists_any_of(const std::array<std::string_view, N>& names, const char* list)
{
    std::string_view rest(list);
    while (!rest.empty()) {
        const std::size_t comma = rest.find(',');
        const std::string_view item = rest.substr(0, comma);
        for (std::string_view reserved : names) {
            if (reserved == item)
                return true;
        }
        if (comma == std::string_view::npos)
            break;
        rest.remove_prefix(comma + 1);
    }
    return false;
}

} // namespace

bool lists_reserved_user(const char* list)
{
    return lists_any_of(kReservedUsers, list);
}

bool is_reserved_user(std::string_view name)
{
    return is_listed_in(kReservedUsers, kReservedUserLengths, name);
}

bool is_reserved_group(std::string_view name)
{
    return is_listed_in(kReservedGroups, kReservedGroupLengths, name);
}

int count_listed_users()
{
    int count = 0;
    for_each_account_name("/etc/passwd", AccountFile::Passwd, [&](std::string_view name) {
        if (!is_reserved_user(name))
            ++count;
    });
    return count;
}

int count_listed_groups()
{
    int count = 0;
    for_each_account_name("/etc/group", AccountFile::Group, [&](std::string_view name) {
        if (!is_reserved_group(name))
            ++count;
    });
    return count;
}

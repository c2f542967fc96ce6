// System accounts that the account pages never list or count.
#pragma once

#include <array>
#include <cstdint>
#include <string_view>

// Exact, case-sensitive names: "Admin" is an ordinary user.
inline constexpr std::array<std::string_view, 8> kReservedUsers{
    "root", "nobody", "ftp", "admin", "sshd", "squeezecenter", "messagebus", "netdev"};
inline constexpr std::array<std::string_view, 5> kReservedGroups{
    "root", "allaccount", "administrators", "share", "netdev"};

namespace reserved_names {

// The lengths of the names, one bit each: most names of a long list are passed over by
// their length alone, where the list is walked for every name of a file.
template <std::size_t N>
constexpr std::uint64_t length_bits(const std::array<std::string_view, N>& names)
{
    std::uint64_t bits = 0;
    for (std::string_view reserved : names)
        bits |= std::uint64_t{1} << reserved.size();
    return bits;
}

inline constexpr std::uint64_t kUserLengths = length_bits(kReservedUsers);
inline constexpr std::uint64_t kGroupLengths = length_bits(kReservedGroups);

template <std::size_t N>
constexpr bool is_listed_in(const std::array<std::string_view, N>& names, std::uint64_t lengths, std::string_view name)
{
    if (name.size() >= 64 || !(lengths >> name.size() & 1))
        return false;
    for (std::string_view reserved : names) {
        if (reserved == name)
            return true;
    }
    return false;
}

} // namespace reserved_names

inline bool is_reserved_user(std::string_view name)
{
    return reserved_names::is_listed_in(kReservedUsers, reserved_names::kUserLengths, name);
}

inline bool is_reserved_group(std::string_view name)
{
    return reserved_names::is_listed_in(kReservedGroups, reserved_names::kGroupLengths, name);
}

// Whether a comma-separated member list names a reserved user: the pages never
// change a reserved account's groups.
bool lists_reserved_user(const char* list);

// Users of "/etc/passwd" that are not reserved.
int count_listed_users();
// Groups of "/etc/group" (the device's group database) that are not reserved.
int count_listed_groups();

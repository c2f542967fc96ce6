#include "volumes/reserved_accounts.h"

#include <string_view>

#include "volumes/account_names.h"

namespace {

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

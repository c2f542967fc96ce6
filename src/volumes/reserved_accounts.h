// System accounts that the account pages never list or count.
#pragma once

#include <string_view>

bool is_reserved_user(std::string_view name);
bool is_reserved_group(std::string_view name);
// Whether a comma-separated member list names a reserved user: the pages never
// change a reserved account's groups.
bool lists_reserved_user(const char* list);

// Users of "/etc/passwd" that are not reserved.
int count_listed_users();
// Groups of "/etc/group" (the device's group database) that are not reserved.
int count_listed_groups();

// System accounts that the account pages never list or count.
#pragma once

bool is_reserved_user(const char* name);
bool is_reserved_group(const char* name);
// Whether a comma-separated member list names a reserved user: the pages never
// change a reserved account's groups.
bool lists_reserved_user(const char* list);

// Users of "/etc/passwd" that are not reserved.
int count_listed_users();
// Groups of the group database, from its current position, that are not reserved.
int count_listed_groups();

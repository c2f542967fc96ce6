// The memberships of the group file ("/etc/group") as the share library answers them
// per user: read once per process, and again only when the file has changed (another
// inode, size or modification time). A device of 50,000 users holds an allaccount line
// of half a megabyte that the answer never needs; it is skipped, not kept.
#pragma once

#include <string>
#include <string_view>

// The groups that list `user` as a member, other than allaccount, comma-separated in
// file order: joined_groups() over the whole group file.
std::string joined_groups_of(std::string_view user);

// The simulated device's account files as the platform's tools and libraries edit
// them: "/etc/passwd", "/etc/shadow" and "/etc/group", each one entry per line with
// colon-separated fields, and the password hints.
//
//   /etc/passwd   NAME:x:UID:GID:GECOS:HOME:SHELL
//                 GECOS holds five comma-separated fields: the full name (the
//                 account's description), three unused ones, and "other" (the e-mail).
//   /etc/shadow   NAME:HASH:LASTCHANGE:MIN:MAX:WARN:INACTIVE:EXPIRE:
//                 HASH is a crypt hash ("$6$..." for new passwords) or empty for none;
//                 EXPIRE is the expiry day (days since 1970-01-01) or empty.
//   /etc/group    NAME:x:GID:MEMBER,MEMBER,...
//   /var/lib/platform/hints
//                 NAME<TAB>HINT, one line per user with a password hint.
//
// Every user is a member of "allaccount" (group id 1000), its primary group unless
// changed. Group lists given to the account tool (-l) are comma-separated names of the
// other groups; LIB_Web_Get_User_Join_Group answers in the same form. A missing file
// reads as empty.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

inline constexpr const char* kPasswdFile = "/etc/passwd";
inline constexpr const char* kShadowFile = "/etc/shadow";
inline constexpr const char* kGroupFile = "/etc/group";
inline constexpr const char* kHintFile = "/var/lib/platform/hints";
inline constexpr const char* kAllAccountGroup = "allaccount";
inline constexpr int kAllAccountGid = 1000;

// One line of a colon file, split into its fields (a line "a:b:" gives "a", "b", "").
using ColonRow = std::vector<std::string>;

struct ColonFile {
    std::string path;
    std::vector<ColonRow> rows;

    static ColonFile load(const char* path);
    bool save() const;
    // The row whose first field is `name`, or nullptr.
    ColonRow* find(std::string_view name);
    const ColonRow* find(std::string_view name) const;
    void erase(std::string_view name);
};

// The field at `index`, or the empty text when the row is shorter.
std::string field(const ColonRow& row, std::size_t index);
// Sets the field at `index`, growing the row with empty fields as needed.
void set_field(ColonRow& row, std::size_t index, std::string value);

// The five GECOS fields of a passwd row, and the text that holds them.
std::vector<std::string> gecos_fields(const ColonRow& passwd_row);
void set_gecos_field(ColonRow& passwd_row, std::size_t index, const std::string& value);
inline constexpr std::size_t kGecosFullName = 0;
inline constexpr std::size_t kGecosOther = 4;

// Members of a group row, and the row with these members.
std::vector<std::string> group_members(const ColonRow& group_row);
void set_group_members(ColonRow& group_row, const std::vector<std::string>& members);
// True when the comma-separated member text names the user.
bool member_text_lists(std::string_view members, std::string_view user);
bool is_member(const ColonRow& group_row, std::string_view user);

// The groups that list `user` as a member, other than allaccount, comma-separated in
// file order: the account tool's -l format.
std::string joined_groups(const ColonFile& groups, std::string_view user);

// A crypt hash ("$6$" with a fresh salt) of the password; empty for an empty password.
std::string hash_password(const std::string& password);
// Today as days since 1970-01-01.
long today_in_days();

// The password hints.
std::optional<std::string> load_hint(std::string_view user);
void store_hint(std::string_view user, const std::string& hint);     // empty removes
void rename_hint(std::string_view old_name, std::string_view new_name);

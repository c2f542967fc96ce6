// The account tool: creates, changes, renames and deletes the device's users and
// groups in /etc/passwd, /etc/shadow and /etc/group (formats in sim/lib/account_files.h).
//
//   account -a -u NAME -p PASSWORD -l GROUPS -f FULLNAME -h HINT -e MAIL   new user
//   account -m -u NAME [-f FULLNAME] [-e MAIL] [-p PASSWORD] [-h HINT]
//                      [-l GROUPS] [-x EXPIRES]                        change a user
//   account -u OLD -n NEW                                               rename a user
//   account -d -u NAME                                                  delete a user
//   account -a -g NAME -l MEMBERS                                       new group
//   account -m -g NAME -l MEMBERS                                       replace members
//   account -g OLD -o NEW                                               rename a group
//   account -d -g NAME                                                  delete a group
//   account                                                             re-sync (no change here)
//
// GROUPS and MEMBERS are comma-separated names ("family,office"; empty items are
// skipped). A user's GROUPS are the groups besides allaccount, which every user stays
// in: -l replaces the user's membership in all other groups. This is the same text
// that LIB_Web_Get_User_Join_Group gives and the user list shows.
// PASSWORD is the clear text, stored as a "$6$" crypt hash; an empty one removes the
// password. HINT is kept in /var/lib/platform/hints. FULLNAME is the first GECOS field
// (the description), MAIL the fifth ("other") one. EXPIRES is a day such as 2030-12-31
// (or 2030/12/31, or a day number since 1970-01-01); empty clears it.
// Renames keep the account's quota limits (the device keys them by id).
//
// Any error (unknown account, a name in use, an invalid name or text, an unknown
// group or member) changes nothing, writes "account: ..." to standard error and
// exits with 1; a wrong command line exits with 2.
#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <cstdio>
#include <cstring>
#include <ctime>
#include <optional>
#include <string>
#include <vector>

#include "account_ops.h"
#include "sim/lib/account_files.h"
#include "sim/lib/quota_store.h"
#include "sim/lib/text_file.h"
#include "tools.h"

namespace {

int fail(const std::string& message)
{
    std::fprintf(stderr, "account: %s\n", message.c_str());
    return 1;
}

// Names as the device's account tools refuse them: empty, over 32 bytes, beginning
// with "." or "-", or holding a control character, "/" or one of the characters
// \ : * ? " < > | ; , = + [ ] @ % ' $ and the backquote. So no name can
// hold a "%", a quote or a field separator of the account files.
bool valid_name(const std::string& name)
{
    if (name.empty() || name.size() > 32 || name[0] == '-' || name[0] == '.')
        return false;
    for (unsigned char c : name) {
        if (c < 0x20 || c == 0x7f || std::strchr("/\\:*?\"<>|;,=+[]@%'$`", c) != nullptr)
            return false;
    }
    return true;
}

// Texts stored in a GECOS field may not hold the field separators.
bool valid_gecos_text(const std::string& text)
{
    return text.find_first_of(":,\n") == std::string::npos;
}

std::vector<std::string> name_list(const std::string& text)
{
    std::vector<std::string> names;
    for (std::string& name : split(text, ',')) {
        if (!name.empty() && std::find(names.begin(), names.end(), name) == names.end())
            names.push_back(std::move(name));
    }
    return names;
}

// The next free id above every id from 1000 up (system ids below stay apart).
std::string next_id(const ColonFile& file)
{
    long highest = 1000;
    for (const ColonRow& row : file.rows) {
        const long id = std::atol(field(row, 2).c_str());
        if (id >= 1000 && id < 60000 && id > highest)
            highest = id;
    }
    return std::to_string(highest + 1);
}

std::optional<std::string> expiry_day(const std::string& text)
{
    if (text.empty())
        return std::string();
    if (text.find_first_not_of("0123456789") == std::string::npos)
        return text;
    int year = 0, month = 0, day = 0;
    char sep1 = 0, sep2 = 0;
    if (std::sscanf(text.c_str(), "%4d%c%2d%c%2d", &year, &sep1, &month, &sep2, &day) != 5 || sep1 != sep2
        || (sep1 != '-' && sep1 != '/') || month < 1 || month > 12 || day < 1 || day > 31)
        return std::nullopt;
    std::tm date{};
    date.tm_year = year - 1900;
    date.tm_mon = month - 1;
    date.tm_mday = day;
    return std::to_string(static_cast<long>(timegm(&date) / 86400));
}

// Makes the user a member of exactly the listed groups (besides allaccount, kept).
int set_user_groups(ColonFile& groups, const std::string& user, const std::string& list)
{
    const std::vector<std::string> wanted = name_list(list);
    for (const std::string& name : wanted) {
        if (!groups.find(name))
            return fail("group '" + name + "' does not exist");
    }
    for (ColonRow& row : groups.rows) {
        if (row[0] == kAllAccountGroup)
            continue;
        std::vector<std::string> members = group_members(row);
        std::erase(members, user);
        if (std::find(wanted.begin(), wanted.end(), row[0]) != wanted.end())
            members.push_back(user);
        set_group_members(row, members);
    }
    return 0;
}

void rename_member(ColonFile& groups, const std::string& old_name, const std::string& new_name)
{
    for (ColonRow& row : groups.rows) {
        std::vector<std::string> members = group_members(row);
        std::replace(members.begin(), members.end(), old_name, new_name);
        set_group_members(row, members);
    }
}

void set_password(ColonFile& shadow, const std::string& user, const std::string& password)
{
    ColonRow* row = shadow.find(user);
    if (!row) {
        shadow.rows.push_back({user, "", "", "0", "99999", "7", "", "", ""});
        row = &shadow.rows.back();
    }
    set_field(*row, 1, hash_password(password));
    set_field(*row, 2, std::to_string(today_in_days()));
}

struct Options {
    bool add = false, remove = false, modify = false;
    std::optional<std::string> user, group, password, groups, full_name, hint, mail, new_user, new_group, expires;
};

std::optional<Options> parse(int argc, char** argv)
{
    Options o;
    for (int i = 1; i < argc; ++i) {
        const std::string option = argv[i];
        if (option == "-a") { o.add = true; continue; }
        if (option == "-d") { o.remove = true; continue; }
        if (option == "-m") { o.modify = true; continue; }
        if (i + 1 >= argc)
            return std::nullopt;
        std::optional<std::string>* target = nullptr;
        if (option == "-u") target = &o.user;
        else if (option == "-g") target = &o.group;
        else if (option == "-p") target = &o.password;
        else if (option == "-l") target = &o.groups;
        else if (option == "-f") target = &o.full_name;
        else if (option == "-h") target = &o.hint;
        else if (option == "-e") target = &o.mail;
        else if (option == "-n") target = &o.new_user;
        else if (option == "-o") target = &o.new_group;
        else if (option == "-x") target = &o.expires;
        else return std::nullopt;
        *target = argv[++i];
    }
    return o;
}

int modify_user(const Options& o)
{
    ColonFile passwd = ColonFile::load(kPasswdFile);
    ColonFile shadow = ColonFile::load(kShadowFile);
    ColonFile groups = ColonFile::load(kGroupFile);
    ColonRow* user = passwd.find(*o.user);
    if (!user)
        return fail("user '" + *o.user + "' does not exist");
    if ((o.full_name && !valid_gecos_text(*o.full_name)) || (o.mail && !valid_gecos_text(*o.mail)))
        return fail("invalid text for the account entry");
    if (o.full_name)
        set_gecos_field(*user, kGecosFullName, *o.full_name);
    if (o.mail)
        set_gecos_field(*user, kGecosOther, *o.mail);
    if (o.password)
        set_password(shadow, *o.user, *o.password);
    if (o.groups && set_user_groups(groups, *o.user, *o.groups) != 0)
        return 1;
    if (o.expires) {
        const auto day = expiry_day(*o.expires);
        if (!day)
            return fail("invalid expiry date '" + *o.expires + "'");
        if (ColonRow* row = shadow.find(*o.user))
            set_field(*row, 7, *day);
    }
    if (!groups.save() || !shadow.save() || !passwd.save())
        return fail("cannot write the account files");
    if (o.hint)
        store_hint(*o.user, *o.hint);
    return 0;
}

// What a rename needs (`kind` is "user" or "group"): the entry OLD_NAME exists, and
// NEW_NAME is valid and not taken. Returns OLD_NAME's row, or nullptr after the
// failure message.
ColonRow* entry_to_rename(ColonFile& file, const std::string& kind, const std::string& old_name,
                          const std::string& new_name)
{
    const auto refused = [](const std::string& message) -> ColonRow* {
        fail(message);
        return nullptr;
    };
    ColonRow* entry = file.find(old_name);
    if (!entry)
        return refused(kind + " '" + old_name + "' does not exist");
    if (!valid_name(new_name))
        return refused("invalid " + kind + " name '" + new_name + "'");
    if (file.find(new_name))
        return refused(kind + " '" + new_name + "' already exists");
    return entry;
}

int rename_user(const std::string& old_name, const std::string& new_name)
{
    ColonFile passwd = ColonFile::load(kPasswdFile);
    ColonFile shadow = ColonFile::load(kShadowFile);
    ColonFile groups = ColonFile::load(kGroupFile);
    ColonRow* user = entry_to_rename(passwd, "user", old_name, new_name);
    if (!user)
        return 1;
    (*user)[0] = new_name;
    if (ColonRow* row = shadow.find(old_name))
        (*row)[0] = new_name;
    rename_member(groups, old_name, new_name);
    if (!groups.save() || !shadow.save() || !passwd.save())
        return fail("cannot write the account files");
    rename_hint(old_name, new_name);
    rename_quota_owner('u', old_name, new_name);
    return 0;
}

int delete_user(const std::string& name)
{
    ColonFile passwd = ColonFile::load(kPasswdFile);
    ColonFile shadow = ColonFile::load(kShadowFile);
    ColonFile groups = ColonFile::load(kGroupFile);
    if (!passwd.find(name))
        return fail("user '" + name + "' does not exist");
    passwd.erase(name);
    shadow.erase(name);
    for (ColonRow& row : groups.rows) {
        std::vector<std::string> members = group_members(row);
        std::erase(members, name);
        set_group_members(row, members);
    }
    if (!groups.save() || !shadow.save() || !passwd.save())
        return fail("cannot write the account files");
    store_hint(name, "");
    return 0;
}

int check_members(const std::vector<std::string>& members)
{
    const ColonFile passwd = ColonFile::load(kPasswdFile);
    for (const std::string& member : members) {
        if (!passwd.find(member))
            return fail("user '" + member + "' does not exist");
    }
    return 0;
}

int set_group_member_list(const std::string& name, const std::string& list)
{
    ColonFile groups = ColonFile::load(kGroupFile);
    ColonRow* group = groups.find(name);
    if (!group)
        return fail("group '" + name + "' does not exist");
    const std::vector<std::string> members = name_list(list);
    if (check_members(members) != 0)
        return 1;
    set_group_members(*group, members);
    return groups.save() ? 0 : fail("cannot write the account files");
}

int rename_group(const std::string& old_name, const std::string& new_name)
{
    ColonFile groups = ColonFile::load(kGroupFile);
    ColonRow* group = entry_to_rename(groups, "group", old_name, new_name);
    if (!group)
        return 1;
    (*group)[0] = new_name;
    if (!groups.save())
        return fail("cannot write the account files");
    rename_quota_owner('g', old_name, new_name);
    return 0;
}

// Users whose primary group goes with it fall back to allaccount.
int delete_group(const std::string& name)
{
    ColonFile groups = ColonFile::load(kGroupFile);
    ColonFile passwd = ColonFile::load(kPasswdFile);
    const ColonRow* group = groups.find(name);
    if (!group)
        return fail("group '" + name + "' does not exist");
    const std::string gid = field(*group, 2);
    for (ColonRow& row : passwd.rows) {
        if (field(row, 3) == gid)
            set_field(row, 3, std::to_string(kAllAccountGid));
    }
    groups.erase(name);
    if (!passwd.save() || !groups.save())
        return fail("cannot write the account files");
    return 0;
}

} // namespace

int create_user(const NewUser& user)
{
    if (!valid_name(user.name))
        return fail("invalid user name '" + user.name + "'");
    ColonFile passwd = ColonFile::load(kPasswdFile);
    ColonFile shadow = ColonFile::load(kShadowFile);
    ColonFile groups = ColonFile::load(kGroupFile);
    if (passwd.find(user.name))
        return fail("user '" + user.name + "' already exists");
    if (!valid_gecos_text(user.description) || !valid_gecos_text(user.mail))
        return fail("invalid text for the account entry");
    if (set_user_groups(groups, user.name, user.groups) != 0)
        return 1;
    if (ColonRow* all = groups.find(kAllAccountGroup); all && !is_member(*all, user.name)) {
        std::vector<std::string> members = group_members(*all);
        members.push_back(user.name);
        set_group_members(*all, members);
    }
    passwd.rows.push_back({user.name, "x", next_id(passwd), std::to_string(kAllAccountGid),
                           user.description + ",,,," + user.mail, "/shares/" + user.name, "/bin/sh"});
    shadow.erase(user.name);
    set_password(shadow, user.name, user.password);
    if (!groups.save() || !shadow.save() || !passwd.save())
        return fail("cannot write the account files");
    store_hint(user.name, user.hint);
    return 0;
}

int create_group(const std::string& name, const std::string& members)
{
    if (!valid_name(name))
        return fail("invalid group name '" + name + "'");
    ColonFile groups = ColonFile::load(kGroupFile);
    if (groups.find(name))
        return fail("group '" + name + "' already exists");
    const std::vector<std::string> list = name_list(members);
    if (check_members(list) != 0)
        return 1;
    groups.rows.push_back({name, "x", next_id(groups), join(list, ',')});
    return groups.save() ? 0 : fail("cannot write the account files");
}

int tool_account(int argc, char** argv)
{
    if (argc == 1)
        return 0;   // the re-sync of the platform's own account caches: nothing to do here
    const std::optional<Options> parsed = parse(argc, argv);
    if (!parsed)
        return 2;
    const Options& o = *parsed;
    if (o.add && o.user) {
        return create_user({*o.user, o.password.value_or(""), o.groups.value_or(""), o.full_name.value_or(""),
                            o.hint.value_or(""), o.mail.value_or("")});
    }
    if (o.add && o.group)
        return create_group(*o.group, o.groups.value_or(""));
    if (o.remove && o.user)
        return delete_user(*o.user);
    if (o.remove && o.group)
        return delete_group(*o.group);
    if (o.modify && o.user)
        return modify_user(o);
    if (o.modify && o.group && o.groups)
        return set_group_member_list(*o.group, *o.groups);
    if (o.user && o.new_user)
        return rename_user(*o.user, *o.new_user);
    if (o.group && o.new_group)
        return rename_group(*o.group, *o.new_group);
    return 2;
}

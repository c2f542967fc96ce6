// gpasswd, usermod and chfn: the forms of them the device uses, changing the account
// files (sim/lib/account_files.h) as the real tools do.
//
//   gpasswd -d USER GROUP    removes USER from GROUP's members
//   usermod -g GROUP USER    makes GROUP (a name or a number) USER's primary group
//   chfn -o OTHER USER       sets the "other" (fifth) field of USER's GECOS entry
//
// Their messages and exit codes are those of the real tools.
#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include "cgi/file_lock.h"
#include "sim/lib/account_files.h"
#include "tools.h"

namespace {

int usage(const char* tool)
{
    std::fprintf(stderr, "Usage: %s ...\n", tool);
    return 2;
}

// Each tool is used in one form only: TOOL OPTION ARGUMENT ARGUMENT.
bool has_form(int argc, char** argv, const char* option)
{
    return argc == 4 && std::strcmp(argv[1], option) == 0;
}

// USER's entry in the passwd file, or nullptr after the tool's message.
ColonRow* existing_user(ColonFile& passwd, const char* tool, const std::string& user)
{
    ColonRow* entry = passwd.find(user);
    if (!entry)
        std::fprintf(stderr, "%s: user '%s' does not exist\n", tool, user.c_str());
    return entry;
}

} // namespace

int tool_gpasswd(int argc, char** argv)
{
    if (!has_form(argc, argv, "-d"))
        return usage("gpasswd");
    const auto lock = FileLock::acquire("accounts");
    if (!lock)
        return 1;
    const std::string user = argv[2];
    const std::string name = argv[3];
    ColonFile groups = ColonFile::load(kGroupFile);
    ColonRow* group = groups.find(name);
    if (!group) {
        std::fprintf(stderr, "gpasswd: group '%s' does not exist in /etc/group\n", name.c_str());
        return 3;
    }
    std::vector<std::string> members = group_members(*group);
    if (std::erase(members, user) == 0) {
        std::fprintf(stderr, "gpasswd: user '%s' is not a member of '%s'\n", user.c_str(), name.c_str());
        return 3;
    }
    std::printf("Removing user %s from group %s\n", user.c_str(), name.c_str());
    set_group_members(*group, members);
    return groups.save() ? 0 : 1;
}

int tool_usermod(int argc, char** argv)
{
    if (!has_form(argc, argv, "-g"))
        return usage("usermod");
    const auto lock = FileLock::acquire("accounts");
    if (!lock)
        return 1;
    const std::string wanted = argv[2];
    const std::string user = argv[3];
    const ColonFile groups = ColonFile::load(kGroupFile);
    std::string gid;
    for (const ColonRow& row : groups.rows) {
        if (row[0] == wanted || field(row, 2) == wanted) {
            gid = field(row, 2);
            break;
        }
    }
    if (gid.empty()) {
        std::fprintf(stderr, "usermod: group '%s' does not exist\n", wanted.c_str());
        return 6;
    }
    ColonFile passwd = ColonFile::load(kPasswdFile);
    ColonRow* entry = existing_user(passwd, "usermod", user);
    if (!entry)
        return 6;
    set_field(*entry, 3, gid);
    return passwd.save() ? 0 : 1;
}

int tool_chfn(int argc, char** argv)
{
    if (!has_form(argc, argv, "-o"))
        return usage("chfn");
    const auto lock = FileLock::acquire("accounts");
    if (!lock)
        return 1;
    const std::string other = argv[2];
    const std::string user = argv[3];
    if (other.find_first_of(":,=\n") != std::string::npos) {
        std::fprintf(stderr, "chfn: invalid other: '%s'\n", other.c_str());
        return 1;
    }
    ColonFile passwd = ColonFile::load(kPasswdFile);
    ColonRow* entry = existing_user(passwd, "chfn", user);
    if (!entry)
        return 1;
    set_gecos_field(*entry, kGecosOther, other);
    return passwd.save() ? 0 : 1;
}

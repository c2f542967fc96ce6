// getfacl and setfacl of the simulated device.
//
// The ACL store, "/var/lib/platform/acl": one folder per line, TAB-separated:
//     PATH ENTRIES
// PATH is the folder's canonical path, ENTRIES its extended entries in the long form,
// comma-separated, in the order they were first set: "default:user::rwx",
// "user:alice:r-x". `setfacl -m SPEC PATH...` adds or replaces the entries of SPEC
// ("d:u::rwx,d:o::rwx,d:g::rwx"; "d:" and "default:", "u", "g", "o", "m" and their
// long names are understood). `getfacl [-p] PATH...` prints the folder's owner, group
// and mode bits as the three base entries, then its stored entries. A folder the store
// does not hold has only the base entries. A missing path is an error on stderr.
#include <cstdio>
#include <filesystem>
#include <grp.h>
#include <pwd.h>
#include <string>
#include <sys/stat.h>
#include <vector>

#include "cgi/file_lock.h"
#include "sim/lib/text_file.h"
#include "tools.h"

namespace fs = std::filesystem;

namespace {

constexpr const char* kAclStore = "/var/lib/platform/acl";

std::string canonical(const std::string& path)
{
    std::error_code failed;
    const fs::path resolved = fs::canonical(path, failed);
    return failed ? path : resolved.string();
}

// "d:u::rwx" -> "default:user::rwx".
std::string long_form(const std::string& entry)
{
    std::vector<std::string> fields = split(entry, ':');
    std::string prefix;
    if (!fields.empty() && (fields[0] == "d" || fields[0] == "default")) {
        prefix = "default:";
        fields.erase(fields.begin());
    }
    if (fields.empty())
        return {};
    static const std::pair<const char*, const char*> kTags[] = {{"u", "user"}, {"g", "group"}, {"o", "other"}, {"m", "mask"}};
    for (const auto& [short_tag, long_tag] : kTags) {
        if (fields[0] == short_tag)
            fields[0] = long_tag;
    }
    return prefix + join(fields, ':');
}

// The entry without its permissions: what a new entry replaces.
std::string entry_key(const std::string& entry)
{
    return entry.substr(0, entry.rfind(':'));
}

std::string permissions(mode_t mode, int shift)
{
    std::string text = "---";
    if (mode & (4 << shift))
        text[0] = 'r';
    if (mode & (2 << shift))
        text[1] = 'w';
    if (mode & (1 << shift))
        text[2] = 'x';
    return text;
}

std::vector<std::string> stored_entries(const std::string& folder)
{
    for (const std::string& line : read_lines(kAclStore)) {
        const auto fields = split(line, '\t');
        if (fields.size() == 2 && fields[0] == folder)
            return fields[1].empty() ? std::vector<std::string>{} : split(fields[1], ',');
    }
    return {};
}

void store_entries(const std::string& folder, const std::vector<std::string>& entries)
{
    const auto lock = FileLock::acquire("acl");
    if (!lock)
        return;
    std::vector<std::string> lines;
    bool replaced = false;
    for (const std::string& line : read_lines(kAclStore)) {
        if (split(line, '\t').front() == folder) {
            lines.push_back(folder + "\t" + join(entries, ','));
            replaced = true;
        } else {
            lines.push_back(line);
        }
    }
    if (!replaced)
        lines.push_back(folder + "\t" + join(entries, ','));
    write_lines(kAclStore, lines);
}

} // namespace

int tool_getfacl(int argc, char** argv)
{
    int status = 0;
    for (int i = 1; i < argc; ++i) {
        const std::string path = argv[i];
        if (path.starts_with("-"))
            continue;
        struct stat info {};
        if (stat(path.c_str(), &info) != 0) {
            std::fprintf(stderr, "getfacl: %s: No such file or directory\n", path.c_str());
            status = 1;
            continue;
        }
        const passwd* owner = getpwuid(info.st_uid);
        const group* owning_group = getgrgid(info.st_gid);
        std::printf("# file: %s\n", path.c_str());
        std::printf("# owner: %s\n", owner ? owner->pw_name : std::to_string(info.st_uid).c_str());
        std::printf("# group: %s\n", owning_group ? owning_group->gr_name : std::to_string(info.st_gid).c_str());
        std::printf("user::%s\ngroup::%s\nother::%s\n", permissions(info.st_mode, 6).c_str(),
                    permissions(info.st_mode, 3).c_str(), permissions(info.st_mode, 0).c_str());
        for (const std::string& entry : stored_entries(canonical(path)))
            std::printf("%s\n", entry.c_str());
        std::printf("\n");
    }
    return status;
}

int tool_setfacl(int argc, char** argv)
{
    std::vector<std::string> spec;
    int status = 0;
    for (int i = 1; i < argc; ++i) {
        const std::string arg = argv[i];
        if (arg == "-m" && i + 1 < argc) {
            for (const std::string& entry : split(argv[++i], ','))
                spec.push_back(long_form(entry));
            continue;
        }
        if (arg.starts_with("-"))
            continue;
        if (!fs::exists(arg)) {
            std::fprintf(stderr, "setfacl: %s: No such file or directory\n", arg.c_str());
            status = 1;
            continue;
        }
        const std::string folder = canonical(arg);
        std::vector<std::string> entries = stored_entries(folder);
        for (const std::string& entry : spec) {
            if (entry.empty())
                continue;
            bool replaced = false;
            for (std::string& existing : entries) {
                if (entry_key(existing) == entry_key(entry)) {
                    existing = entry;
                    replaced = true;
                }
            }
            if (!replaced)
                entries.push_back(entry);
        }
        store_entries(folder, entries);
    }
    return status;
}

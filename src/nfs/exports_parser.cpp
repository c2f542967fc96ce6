#include "nfs/exports_parser.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <dirent.h>
#include <mntent.h>
#include <new>
#include <string_view>
#include <strings.h>
#include <sys/stat.h>

#include "cgi/file.h"
#include "cgi/trace.h"

namespace {

struct DirCloser {
    void operator()(DIR* dir) const { closedir(dir); }
};
using UniqueDir = std::unique_ptr<DIR, DirCloser>;

// The two line templates: folder text, host, access word, squash word, anonuid, anongid.
constexpr const char* kShareLinkLine =
    "\"/nfs/%s\" %s(%s,%s,sync,no_wdelay,insecure_locks,insecure,no_subtree_check,anonuid=%d,anongid=%d)\n";
constexpr const char* kPathLine =
    "\"%s\" %s(%s,%s,sync,no_wdelay,insecure_locks,insecure,no_subtree_check,anonuid=%d,anongid=%d)\n";

// "/mnt/HD/HD_a2" and "/mnt/isoMount" alike: a per-volume copy holds the path below it.
constexpr std::size_t kVolumePrefixLength = 13;

bool starts_with(const char* text, const char* prefix)
{
    return std::strncmp(text, prefix, std::strlen(prefix)) == 0;
}

bool is_usb_folder(const char* folder)
{
    return std::strncmp(folder, "/mnt/USB/", 9) == 0;
}

// A host the pages send when they have none: empty, or "(NULL)" with or without the
// blank in front, in any case.
bool is_missing_host(const char* host)
{
    return host[0] == '\0' || strcasecmp(host, " (NULL)") == 0 || strcasecmp(host, "(NULL)") == 0;
}

// Parses one line into `record`. False when the line is skipped; the record is then
// left cleared for the next line.
bool parse_line(const char* line, exports_entry& record)
{
    const char* first_quote = std::strchr(line, '"');
    if (first_quote == nullptr) {
        printf_out("So,die....\n");
        return false;
    }
    const char* last_quote = std::strrchr(line, '"');
    const std::size_t volume_length = last_quote > first_quote ? static_cast<std::size_t>(last_quote - first_quote - 1) : 0;
    record.volume.assign({first_quote + 1, volume_length});

    // The host runs from the last blank after the closing quote to the next "(" (to the
    // end of the line when there is no option list; from the quote when there is no blank).
    const char* after_quote = last_quote + 1;
    const char* blank = std::strrchr(after_quote, ' ');
    const char* host = blank != nullptr ? blank + 1 : after_quote;
    const char* options = std::strchr(host, '(');
    const std::size_t host_length = options != nullptr ? static_cast<std::size_t>(options - host)
                                                       : std::strcspn(host, "\r\n");
    record.ip.assign({host, host_length});
    if (record.ip == " " || is_missing_host(record.ip.c_str())) {
        printf_out("Invalid IP [%s] cgi\n", record.ip.c_str());
        record.volume.clear();
        record.ip.clear();
        return false;
    }

    const char* access = options != nullptr ? options + 1 : "";
    record.rw = std::strncmp(access, "rw", 2) == 0 ? 1 : 0;
    const char* comma = std::strchr(access, ',');
    const char* squash = comma != nullptr ? comma + 1 : "";
    record.root_squash = std::strncmp(squash, "no_root_squash", 14) == 0 ? 0 : 1;
    return true;
}

} // namespace

exports_entry::~exports_entry()
{
    std::unique_ptr<exports_entry> rest = std::move(next);
    while (rest)
        rest = std::move(rest->next);
}

ExportsList new_exports_entry()
{
    try {
        return std::make_unique<exports_entry>();
    } catch (const std::bad_alloc&) {
        return nullptr;
    }
}

ExportsList load_exports_config(const char* path)
{
    const UniqueFile file = open_file(path, "r");
    if (!file) {
        printf_out("I can't find any config file.\n");
        return nullptr;
    }
    return parse_exports_config(file.get());
}

ExportsList parse_exports_config(FILE* file)
{
    ExportsList head = new_exports_entry();
    if (!head) {
        printf_out("can't malloc memory.\n");
        return nullptr;
    }

    FixedText<512> line;
    exports_entry* current = head.get();
    bool reuse_current = false;     // a skipped line leaves its cleared record for the next one
    while (read_line(file, line)) {
        if (!reuse_current) {
            current->next = new_exports_entry();
            if (!current->next) {
                printf_out("can't malloc memory.\n");
                return nullptr;
            }
            current = current->next.get();
        }
        // A last line without its newline is never parsed: its record stays cleared
        // at the end of the list, and the next rewrite of the file loses that line.
        if (std::feof(file))
            break;
        reuse_current = !parse_line(line.c_str(), *current);
    }
    return head;
}

int count_records(const ExportsList& list)
{
    int count = 0;
    for (const exports_entry* record = list->next.get(); record != nullptr; record = record->next.get())
        ++count;
    return count;
}

void make_config_string(const char* folder, const char* host, int rw, int root_squash, char* out,
                        std::size_t out_size, int hidden)
{
    std::memset(out, 0, out_size);
    const char* access = (rw & 1) != 0 ? "rw" : "ro";
    // Every rule squashes all users to the anonymous ids; the root-squash value travels
    // with the rule but never changes its line.
    static_cast<void>(root_squash);
    const char* squash = "all_squash";

    if (host == nullptr || is_missing_host(host)) {
        printf_out("invalid IP[%s]\n", host != nullptr ? host : "(null)");
        host = "*";
    }

    const int vfat = is_mount_type(folder, "vfat");
    FixedText<512> link;

    if (!is_usb_folder(folder)) {
        if (hidden != 0) {
            const std::size_t skip = std::min(std::strlen(folder), kVolumePrefixLength);
            std::snprintf(out, out_size, kPathLine, folder + skip, host, access, squash, 501, 1000);
        } else if (find_share_link_name("/shares", folder, link) == 0 && !link.empty()) {
            std::snprintf(out, out_size, kShareLinkLine, link.c_str(), host, access, squash, 501, 1000);
        }
        return;
    }

    // A USB disk: ids 500 and 1000 while a vfat file system is mounted, else 0 and 0.
    const int anonuid = vfat == 1 ? 500 : 0;
    const int anongid = vfat == 1 ? 1000 : 0;
    if (hidden == 0 && find_share_link_name("/shares", folder, link) == 0 && !link.empty())
        std::snprintf(out, out_size, kShareLinkLine, link.c_str(), host, access, squash, anonuid, anongid);
    else
        std::snprintf(out, out_size, kPathLine, folder, host, access, squash, anonuid, anongid);
}

int find_share_link_name(const char* directory, const char* folder, FixedText<512>& name)
{
    FixedText<4096> wanted(folder);
    const std::size_t length = wanted.length();
    if (length > 0 && wanted[length - 1] == '/')
        wanted[length - 1] = '\0';

    const UniqueDir dir(opendir(directory));
    if (!dir)
        return -1;
    const std::size_t dir_length = std::strlen(directory);
    const char* entry_format = dir_length > 0 && directory[dir_length - 1] == '/' ? "%s%s" : "%s/%s";

    bool copied = false;
    while (const dirent* entry = readdir(dir.get())) {
        if (std::strcmp(entry->d_name, ".") == 0 || std::strcmp(entry->d_name, "..") == 0)
            continue;
        FixedText<4096> entry_path;
        std::snprintf(entry_path.data(), entry_path.capacity, entry_format, directory, entry->d_name);
        struct stat status {};
        if (stat(entry_path.c_str(), &status) != 0 || !S_ISDIR(status.st_mode))
            continue;
        FixedText<4096> resolved;
        if (!canonical_path(entry_path.c_str(), resolved))
            continue;
        if (resolved == wanted.view()) {
            name.assign(entry->d_name);
            copied = !name.empty();
            break;
        }
    }
    return copied ? 0 : -1;
}

// The wide reading: an entry counts when its mount directory begins with the folder,
// or with its own canonical path, which nearly every mount directory does (and every
// one that cannot be resolved, against the empty text). So the answer is in effect
// whether any file system of that type is mounted at all; the ids of USB rules have
// always rested on that.
int is_mount_type(const char* folder, const char* type)
{
    const UniqueMountTable table = open_mount_table();
    if (!table)
        return -1;
    while (const mntent* mount = getmntent(table.get())) {
        FixedText<4096> resolved;
        canonical_path(mount->mnt_dir, resolved);
        const bool counts = starts_with(mount->mnt_dir, folder) || starts_with(mount->mnt_dir, resolved.c_str());
        if (counts && std::strcmp(mount->mnt_type, type) == 0)
            return 1;
    }
    return -1;
}

void MountTableCloser::operator()(FILE* table) const
{
    endmntent(table);
}

UniqueMountTable open_mount_table()
{
    return UniqueMountTable(setmntent("/etc/mtab", "r"));
}

bool canonical_path(const char* path, FixedText<4096>& out)
{
    FixedText<4096> resolved;
    if (realpath(path, resolved.data()) == nullptr)
        return false;
    out = resolved;
    return true;
}

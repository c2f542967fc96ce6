#include "group_memberships.h"

#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <memory>
#include <optional>
#include <sys/stat.h>
#include <unistd.h>
#include <vector>

#include "account_files.h"

namespace {

struct Membership {
    std::string group;
    std::string members;    // the fourth field, as written
    bool has_members_field = false;
};

struct FileStamp {
    dev_t device = 0;
    ino_t inode = 0;
    off_t size = 0;
    timespec modified{};
    timespec changed{};

    bool operator==(const FileStamp& other) const
    {
        return device == other.device && inode == other.inode && size == other.size &&
               modified.tv_sec == other.modified.tv_sec && modified.tv_nsec == other.modified.tv_nsec &&
               changed.tv_sec == other.changed.tv_sec && changed.tv_nsec == other.changed.tv_nsec;
    }
};

std::optional<FileStamp> stamp_of(int fd)
{
    struct stat status {};
    if (fstat(fd, &status) != 0)
        return std::nullopt;
    return FileStamp{status.st_dev, status.st_ino, status.st_size, status.st_mtim, status.st_ctim};
}

std::optional<FileStamp> stamp_of(const char* path)
{
    struct stat status {};
    if (stat(path, &status) != 0)
        return std::nullopt;
    return FileStamp{status.st_dev, status.st_ino, status.st_size, status.st_mtim, status.st_ctim};
}

// One line as ColonFile reads it (a final CR dropped, empty lines skipped).
void add_line(std::string& line, std::vector<Membership>& rows)
{
    if (!line.empty() && line.back() == '\r')
        line.pop_back();
    if (line.empty())
        return;
    const std::string_view text = line;
    const auto name_end = text.find(':');
    const std::string_view name = text.substr(0, name_end);
    if (name == kAllAccountGroup)
        return;
    Membership row{std::string(name), {}, false};
    // From the first colon to the third, which opens the member field.
    std::size_t begin = name_end;
    for (int colon = 2; colon <= 3 && begin != std::string_view::npos; ++colon)
        begin = text.find(':', begin + 1);
    if (begin != std::string_view::npos) {
        const auto end = text.find(':', begin + 1);
        row.members = std::string(text.substr(begin + 1, end == std::string_view::npos ? end : end - begin - 1));
        row.has_members_field = true;
    }
    rows.push_back(std::move(row));
}

// The rows of the group file but allaccount's, read in blocks; allaccount's line is
// recognised by its start and not kept.
std::vector<Membership> read_memberships(int fd)
{
    std::vector<Membership> rows;
    // Small and never cleared: each of its pages is a page fault of the request.
    constexpr std::size_t kBlockSize = 16 * 1024;
    const auto block = std::make_unique_for_overwrite<char[]>(kBlockSize);
    std::string line;
    const std::string_view skipped_start = "allaccount:";
    bool skipping = false;
    for (;;) {
        ssize_t got = 0;
        do
            got = read(fd, block.get(), kBlockSize);
        while (got < 0 && errno == EINTR);
        if (got <= 0)
            break;
        std::size_t at = 0;
        const auto end = static_cast<std::size_t>(got);
        while (at < end) {
            const void* newline = std::memchr(block.get() + at, '\n', end - at);
            const std::size_t stop = newline ? static_cast<std::size_t>(static_cast<const char*>(newline) - block.get()) : end;
            if (!skipping) {
                line.append(block.get() + at, stop - at);
                if (line.size() >= skipped_start.size() && line.compare(0, skipped_start.size(), skipped_start) == 0) {
                    skipping = true;
                    line.clear();
                }
            }
            if (!newline)
                break;
            if (!skipping)
                add_line(line, rows);
            line.clear();
            skipping = false;
            at = stop + 1;
        }
    }
    if (!skipping)
        add_line(line, rows);
    return rows;
}

bool lists_member(const Membership& row, std::string_view user)
{
    return row.has_members_field && member_text_lists(row.members, user);
}

struct CachedMemberships {
    std::optional<FileStamp> stamp;
    std::vector<Membership> rows;
};

const std::vector<Membership>& current_memberships()
{
    static CachedMemberships cache;
    const auto stamp = stamp_of(kGroupFile);
    if (cache.stamp && stamp && *cache.stamp == *stamp)
        return cache.rows;
    cache.stamp.reset();
    cache.rows.clear();
    const int fd = open(kGroupFile, O_RDONLY | O_CLOEXEC);
    if (fd < 0)
        return cache.rows;
    // The stamp of what was read, not of what was looked at before opening it.
    cache.stamp = stamp_of(fd);
    cache.rows = read_memberships(fd);
    close(fd);
    return cache.rows;
}

} // namespace

std::string joined_groups_of(std::string_view user)
{
    std::string joined;
    for (const Membership& row : current_memberships()) {
        if (lists_member(row, user)) {
            if (!joined.empty())
                joined += ',';
            joined += row.group;
        }
    }
    return joined;
}

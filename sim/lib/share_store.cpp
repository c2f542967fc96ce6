#include "share_store.h"

#include <algorithm>
#include <cstdlib>
#include <sys/stat.h>
#include <unistd.h>

#include "text_file.h"

namespace {

std::vector<std::pair<std::string, int>> parse_access(const std::string& text)
{
    std::vector<std::pair<std::string, int>> access;
    if (text.empty())
        return access;
    for (const std::string& item : split(text, ',')) {
        const auto colon = item.rfind(':');
        if (colon == std::string::npos || colon == 0)
            continue;
        access.emplace_back(item.substr(0, colon), std::atoi(item.c_str() + colon + 1));
    }
    return access;
}

std::string format_access(const std::vector<std::pair<std::string, int>>& access)
{
    std::vector<std::string> items;
    for (const auto& [account, level] : access)
        items.push_back(account + ":" + std::to_string(level));
    return join(items, ',');
}

bool has_control_character(std::string_view text)
{
    for (const char c : text) {
        const auto byte = static_cast<unsigned char>(c);
        if (byte < 0x20 || byte == 0x7f)
            return true;
    }
    return false;
}

} // namespace

bool is_storable_share_name(std::string_view name)
{
    return !name.empty() && name != "." && name != ".." && name.find('/') == std::string_view::npos
        && !has_control_character(name);
}

bool is_storable_account(std::string_view account)
{
    return account.find_first_of(",:") == std::string_view::npos && !has_control_character(account);
}

bool is_storable_share_path(std::string_view path)
{
    if (path.empty() || path.front() != '/' || has_control_character(path))
        return false;
    const auto components = split(path, '/');
    return std::none_of(components.begin(), components.end(),
                        [](const std::string& component) { return component == "." || component == ".."; });
}

std::vector<ShareEntry> load_shares()
{
    std::vector<ShareEntry> shares;
    for (const std::string& line : read_lines(kShareStorePath)) {
        const auto f = split(line, '\t');
        if (f.size() != 9 || f[0].empty())
            continue;
        shares.push_back({f[0], f[1], f[2], f[3], std::atoi(f[4].c_str()), std::atoi(f[5].c_str()),
                          std::atoi(f[6].c_str()), std::atoi(f[7].c_str()), parse_access(f[8])});
    }
    return shares;
}

void for_each_share_location(std::string_view store,
                             const std::function<void(std::string_view name, std::string_view path)>& visit)
{
    for_each_line(store, [&](std::string_view line) {
        // Nine fields, the name not empty: the lines load_shares() takes.
        if (std::count(line.begin(), line.end(), '\t') != 8)
            return;
        const auto name_end = line.find('\t');
        const auto path_end = line.find('\t', name_end + 1);
        if (name_end > 0)
            visit(line.substr(0, name_end), line.substr(name_end + 1, path_end - name_end - 1));
    });
}

bool save_shares(const std::vector<ShareEntry>& shares)
{
    std::vector<std::string> lines;
    for (const ShareEntry& s : shares) {
        lines.push_back(join({s.name, s.path, s.read_only, s.browseable, std::to_string(s.recycle_bin),
                              std::to_string(s.public_access), std::to_string(s.media_serving),
                              std::to_string(s.remote_access), format_access(s.access)}, '\t'));
    }
    return write_lines(kShareStorePath, lines);
}

void link_share(const ShareEntry& share)
{
    if (!is_storable_share_name(share.name) || !is_storable_share_path(share.path))
        return;
    make_directories(share.path);
    make_directories("/shares");
    const std::string link = "/shares/" + share.name;
    struct stat status {};
    if (::lstat(link.c_str(), &status) == 0) {
        if (!S_ISLNK(status.st_mode))
            return;
        ::unlink(link.c_str());
    }
    ::symlink(share.path.c_str(), link.c_str());
}

void unlink_share(std::string_view name)
{
    if (!is_storable_share_name(name))
        return;
    const std::string link = "/shares/" + std::string(name);
    struct stat status {};
    if (::lstat(link.c_str(), &status) == 0 && S_ISLNK(status.st_mode))
        ::unlink(link.c_str());
}

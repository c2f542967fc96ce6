#include "dfs_store.h"

#include "text_file.h"

std::vector<DfsLink> load_dfs_links()
{
    std::vector<DfsLink> links;
    for (const std::string& line : read_lines(kDfsLinksPath)) {
        const auto f = split(line, '\t');
        if (f.size() == 4)
            links.push_back({f[0], f[1], f[2], f[3]});
    }
    return links;
}

bool save_dfs_links(const std::vector<DfsLink>& links)
{
    std::vector<std::string> lines;
    for (const DfsLink& link : links)
        lines.push_back(join({link.host, link.path, link.link, link.group}, '\t'));
    return write_lines(kDfsLinksPath, lines);
}

std::vector<std::string> load_dfs_groups()
{
    std::vector<std::string> groups;
    for (const std::string& line : read_lines(kDfsGroupsPath)) {
        if (!line.empty())
            groups.push_back(line);
    }
    return groups;
}

bool save_dfs_groups(const std::vector<std::string>& groups)
{
    return write_lines(kDfsGroupsPath, groups);
}

std::optional<std::vector<std::string>> remote_host_folders(const std::string& host)
{
    for (const auto& [name, shared] : read_settings(kRemoteHostsPath)) {
        if (name != host)
            continue;
        std::vector<std::string> folders;
        for (std::string& folder : split(shared, ',')) {
            if (!folder.empty())
                folders.push_back(std::move(folder));
        }
        return folders;
    }
    return std::nullopt;
}

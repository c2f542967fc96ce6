#include "dfs_store.h"

#include <array>

#include "text_file.h"

std::vector<DfsLinkText> dfs_link_texts(std::string_view store)
{
    std::vector<DfsLinkText> links;
    for_each_line(store, [&](std::string_view line) {
        std::array<std::string_view, 4> fields;
        for (std::size_t i = 0; i < fields.size(); ++i) {
            const auto tab = line.find('\t');
            if ((tab == std::string_view::npos) != (i + 1 == fields.size()))
                return;
            fields[i] = line.substr(0, tab);
            line = tab == std::string_view::npos ? std::string_view() : line.substr(tab + 1);
        }
        links.push_back({fields[0], fields[1], fields[2], fields[3]});
    });
    return links;
}

std::vector<DfsLink> load_dfs_links()
{
    const std::string store = read_text(kDfsLinksPath);
    std::vector<DfsLink> links;
    for (const DfsLinkText& link : dfs_link_texts(store))
        links.push_back({std::string(link.host), std::string(link.path), std::string(link.link), std::string(link.group)});
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

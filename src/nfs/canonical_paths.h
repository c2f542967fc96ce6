// Canonical paths of many texts in one request, as realpath() gives them, with every
// step remembered: the rules of an exports file resolve through the same few links
// ("/nfs" to "/shares", then each share's link to its folder), and realpath() asks
// the kernel about every component of every path again.
#pragma once

#include <optional>
#include <string>
#include <unordered_map>
#include <utility>
#include <vector>

// One step of a walk: a component inside a canonical directory, with the link it may
// be followed to its end. Nothing as the path: the walk fails there.
struct CanonicalStep {
    std::optional<std::string> path;
    int links = 0;              // links followed, the component's own included
    bool undecided = false;     // left to realpath() itself
};

// The entries of a directory, read whole once two of its entries turned out to be no
// links: a folder of 200 shares is then one read of the directory, not 200 look-ups.
struct DirectoryListing {
    int plain_entries = 0;      // entries found to be no links, before the read
    bool read = false;          // `entries` holds the directory, which can be searched
    std::vector<std::pair<std::string, unsigned char>> entries;    // name and type, sorted
};

class CanonicalPaths {
public:
    // What realpath(path) gives, or nothing where it fails.
    const std::optional<std::string>& of(const std::string& path);

private:
    std::unordered_map<std::string, std::optional<std::string>> m_paths;    // whole texts
    std::unordered_map<std::string, CanonicalStep> m_steps;                 // "dir/name"
    std::unordered_map<std::string, DirectoryListing> m_listings;           // canonical directories
};

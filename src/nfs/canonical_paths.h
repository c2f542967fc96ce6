// Canonical paths of many texts in one request, as realpath() gives them, with every
// step remembered: the rules of an exports file resolve through the same few links
// ("/nfs" to "/shares", then each share's link to its folder), and realpath() asks
// the kernel about every component of every path again.
#pragma once

#include <optional>
#include <string>
#include <unordered_map>

// One step of a walk: a component inside a canonical directory, with the link it may
// be followed to its end. Nothing as the path: the walk fails there.
struct CanonicalStep {
    std::optional<std::string> path;
    int links = 0;              // links followed, the component's own included
    bool undecided = false;     // left to realpath() itself
};

class CanonicalPaths {
public:
    // What realpath(path) gives, or nothing where it fails.
    const std::optional<std::string>& of(const std::string& path);

private:
    std::unordered_map<std::string, std::optional<std::string>> m_paths;    // whole texts
    std::unordered_map<std::string, CanonicalStep> m_steps;                 // "dir/name"
};

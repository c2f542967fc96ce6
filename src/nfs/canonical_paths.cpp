#include "nfs/canonical_paths.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <climits>
#include <cstdlib>
#include <dirent.h>
#include <fcntl.h>
#include <memory>
#include <string_view>
#include <unistd.h>
#include <vector>

namespace {

// realpath() gives up after this many links in one path.
constexpr int kMostLinks = 40;
// Longer texts are left to realpath() itself, which knows its own limits.
constexpr std::size_t kLongestPath = 4000;

std::optional<std::string> system_canonical(const std::string& path)
{
    std::array<char, PATH_MAX> resolved{};
    if (realpath(path.c_str(), resolved.data()) == nullptr)
        return std::nullopt;
    return std::string(resolved.data());
}

// Whether realpath() itself must treat a text: an empty one, one too long, one ending
// in "/", or one holding a "." or ".." component.
bool is_plain(std::string_view text)
{
    if (text.empty() || text.back() == '/' || text.size() >= kLongestPath)
        return false;
    std::size_t begin = 0;
    while (begin < text.size()) {
        const auto end = std::min(text.find('/', begin), text.size());
        const std::string_view component = text.substr(begin, end - begin);
        if (component == "." || component == "..")
            return false;
        begin = end + 1;
    }
    return true;
}

struct DirectoryCloser {
    void operator()(DIR* directory) const { closedir(directory); }
};

// Reads the directory's entries, when it can be searched (else a look-up inside it
// fails in its own way, which only readlink() tells).
void read_listing(const std::string& dir, DirectoryListing& listing)
{
    if (faccessat(AT_FDCWD, dir.c_str(), X_OK, AT_EACCESS) != 0)
        return;
    const std::unique_ptr<DIR, DirectoryCloser> directory(opendir(dir.c_str()));
    if (!directory)
        return;
    while (const dirent* entry = readdir(directory.get()))
        listing.entries.emplace_back(entry->d_name, entry->d_type);
    std::sort(listing.entries.begin(), listing.entries.end());
    listing.read = true;
}

// What the listing tells of an entry without asking the kernel: that it is missing,
// or that it is there and no link. Nothing when only readlink() can tell.
std::optional<CanonicalStep> listed_step(const DirectoryListing& listing, const std::string& path,
                                         std::string_view name)
{
    if (!listing.read)
        return std::nullopt;
    const auto found = std::lower_bound(listing.entries.begin(), listing.entries.end(), name,
                                        [](const auto& entry, std::string_view wanted) { return entry.first < wanted; });
    if (found == listing.entries.end() || found->first != name)
        return CanonicalStep{};
    if (found->second == DT_LNK || found->second == DT_UNKNOWN)
        return std::nullopt;
    return CanonicalStep{path, 0, false};
}

constexpr CanonicalStep kUndecided{std::nullopt, 0, true};
constexpr CanonicalStep kLoop{std::nullopt, kMostLinks + 1, false};

struct Stepper {
    std::unordered_map<std::string, CanonicalStep>& steps;
    std::unordered_map<std::string, DirectoryListing>& listings;
    std::vector<std::string> following;     // the links being followed, innermost last
    std::string key;                        // the look-up text of a step, reused

    // The step into `name` inside the canonical directory `dir`, remembered unless it
    // depends on the links being followed. The steps stay where they are in the map,
    // so a walk goes on from the path a step holds, without a copy.
    const CanonicalStep& step(const std::string& dir, std::string_view name)
    {
        key.assign(dir);
        if (dir != "/")
            key += '/';
        key += name;
        if (const auto known = steps.find(key); known != steps.end())
            return known->second;
        std::string path = key;
        if (path.size() >= kLongestPath)
            return kUndecided;
        if (std::find(following.begin(), following.end(), path) != following.end())
            return kLoop;

        DirectoryListing& listing = listings[dir];
        if (auto listed = listed_step(listing, path, name))
            return steps.emplace(std::move(path), std::move(*listed)).first->second;

        CanonicalStep outcome;
        // Only the `length` bytes that readlink() writes are read.
        std::array<char, PATH_MAX> target;
        const ssize_t length = readlink(path.c_str(), target.data(), target.size() - 1);
        if (length < 0) {
            // Not a link, so the component is there; any other failure ends the walk.
            if (errno == EINVAL) {
                outcome.path = path;
                if (!listing.read && ++listing.plain_entries == 2)
                    read_listing(dir, listing);
            }
        } else if (length == 0 || static_cast<std::size_t>(length) >= target.size() - 2) {
            outcome.undecided = true;
        } else {
            following.push_back(path);
            const std::string_view text(target.data(), static_cast<std::size_t>(length));
            outcome = walk(text[0] == '/' ? "/" : dir, text);
            following.pop_back();
            outcome.links += 1;
            if (outcome.links > kMostLinks)
                outcome.path.reset();
        }
        return steps.emplace(std::move(path), std::move(outcome)).first->second;
    }

    CanonicalStep walk(std::string_view start, std::string_view text)
    {
        if (!is_plain(text))
            return kUndecided;
        const std::string start_dir(start);
        const std::string* dir = &start_dir;
        int links = 0;
        std::size_t begin = 0;
        while (begin < text.size()) {
            const auto end = std::min(text.find('/', begin), text.size());
            const std::string_view name = text.substr(begin, end - begin);
            begin = end + 1;
            if (name.empty())
                continue;
            const CanonicalStep& next = step(*dir, name);
            if (next.undecided)
                return next;
            links += next.links;
            if (!next.path || links > kMostLinks)
                return {std::nullopt, links, false};
            dir = &*next.path;
        }
        return {*dir, links, false};
    }
};

} // namespace

const std::optional<std::string>& CanonicalPaths::of(const std::string& path)
{
    auto [place, inserted] = m_paths.try_emplace(path);
    if (!inserted)
        return place->second;
    if (!path.empty() && path[0] == '/') {
        Stepper stepper{m_steps, m_listings, {}, {}};
        const CanonicalStep outcome = stepper.walk("/", path);
        if (!outcome.undecided) {
            place->second = outcome.path;
            return place->second;
        }
    }
    place->second = system_canonical(path);
    return place->second;
}

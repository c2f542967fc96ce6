#include "nfs/canonical_paths.h"

#include <array>
#include <cerrno>
#include <climits>
#include <cstdlib>
#include <unistd.h>
#include <unordered_set>
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

// The components of a text, or nothing when the text holds one that realpath() treats
// in its own way ("." and "..", a trailing "/"): such a text is left to realpath().
std::optional<std::vector<std::string>> plain_components(const std::string& text)
{
    if (text.empty() || text.back() == '/' || text.size() >= kLongestPath)
        return std::nullopt;
    std::vector<std::string> components;
    std::size_t begin = 0;
    while (begin < text.size()) {
        const auto end = std::min(text.find('/', begin), text.size());
        if (end > begin) {
            std::string component = text.substr(begin, end - begin);
            if (component == "." || component == "..")
                return std::nullopt;
            components.push_back(std::move(component));
        }
        begin = end + 1;
    }
    return components;
}

std::string joined(const std::string& dir, const std::string& name)
{
    return dir == "/" ? "/" + name : dir + "/" + name;
}

using StepOutcome = CanonicalStep;

struct Stepper {
    std::unordered_map<std::string, StepOutcome>& steps;
    std::unordered_set<std::string> in_progress;

    StepOutcome step(const std::string& dir, const std::string& name)
    {
        const std::string path = joined(dir, name);
        if (const auto known = steps.find(path); known != steps.end())
            return known->second;
        if (path.size() >= kLongestPath)
            return {std::nullopt, 0, true};
        if (in_progress.count(path))
            return {std::nullopt, kMostLinks + 1, false};      // a loop of links

        StepOutcome outcome;
        std::array<char, PATH_MAX> target{};
        const ssize_t length = readlink(path.c_str(), target.data(), target.size() - 1);
        if (length < 0) {
            // Not a link, so the component is there; any other failure ends the walk.
            if (errno == EINVAL)
                outcome.path = path;
        } else if (length == 0 || static_cast<std::size_t>(length) >= target.size() - 2) {
            outcome.undecided = true;
        } else {
            in_progress.insert(path);
            const std::string text(target.data(), static_cast<std::size_t>(length));
            const StepOutcome followed = walk(text[0] == '/' ? "/" : dir, text);
            in_progress.erase(path);
            outcome = followed;
            outcome.links = followed.links + 1;
            if (outcome.links > kMostLinks)
                outcome.path.reset();
        }
        steps.emplace(path, outcome);
        return outcome;
    }

    StepOutcome walk(const std::string& start, const std::string& text)
    {
        const auto components = plain_components(text);
        if (!components)
            return {std::nullopt, 0, true};
        StepOutcome outcome{start, 0, false};
        for (const std::string& name : *components) {
            const StepOutcome next = step(*outcome.path, name);
            if (next.undecided)
                return next;
            outcome.links += next.links;
            outcome.path = next.path;
            if (!outcome.path || outcome.links > kMostLinks)
                return {std::nullopt, outcome.links, false};
        }
        return outcome;
    }
};

} // namespace

const std::optional<std::string>& CanonicalPaths::of(const std::string& path)
{
    auto [place, inserted] = m_paths.try_emplace(path);
    if (!inserted)
        return place->second;
    if (!path.empty() && path[0] == '/') {
        Stepper stepper{m_steps, {}};
        const StepOutcome outcome = stepper.walk("/", path);
        if (!outcome.undecided) {
            place->second = outcome.path;
            return place->second;
        }
    }
    place->second = system_canonical(path);
    return place->second;
}

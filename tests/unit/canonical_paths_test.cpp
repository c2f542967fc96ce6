// Remembered path resolution must give what realpath() gives, for every path of a
// tree of folders, files and links (chains, loops, dangling and relative ones), asked
// in any order through one memory.
#include <gtest/gtest.h>

#include <array>
#include <climits>
#include <vector>

#include "nfs/canonical_paths.h"
#include "support.h"

namespace {

std::optional<std::string> system_realpath(const std::string& path)
{
    std::array<char, PATH_MAX> resolved{};
    return realpath(path.c_str(), resolved.data()) ? std::optional<std::string>(resolved.data()) : std::nullopt;
}

} // namespace

TEST(CanonicalPaths, ResolveEveryPathAsRealpathDoes)
{
    const Scratch dir;
    const std::string root = dir.path.string();
    for (const char* folder : {"/mnt/HD/HD_a2/Public", "/mnt/HD/HD_a2/share1/inner", "/shares"})
        fs::create_directories(root + folder);
    spit(root + "/mnt/HD/HD_a2/file.txt", "");
    // Each link: where it points, and where it is (in the tree).
    std::vector<std::pair<std::string, std::string>> links = {
        {root + "/shares", "/nfs"}, {root + "/mnt/HD/HD_a2/Public", "/shares/Public"},
        {root + "/mnt/HD/HD_a2/share1", "/shares/share1"}, {"../mnt/HD/HD_a2/share1/inner", "/shares/relative"},
        {"HD_a2", "/mnt/HD/alias"}, {root + "/mnt/HD/HD_a2/file.txt", "/shares/file"},
        {root + "/nowhere", "/shares/dangling"}, {root + "/shares/loop2", "/shares/loop1"},
        {root + "/shares/loop1", "/shares/loop2"}, {root + "/mnt/HD/HD_a2/share1/", "/shares/trailing"},
        {".", "/shares/dot"}, {root + "/mnt/HD/HD_a2/Public", "/shares/chain44"},
    };
    for (int i = 43; i >= 0; --i)   // chain0 -> chain1 -> ... -> chain44 -> Public
        links.emplace_back(root + "/shares/chain" + std::to_string(i + 1), "/shares/chain" + std::to_string(i));
    for (const auto& [target, at] : links)
        fs::create_symlink(target, root + at);

    std::vector<std::string> paths = {"", "relative/path", "/"};
    for (const char* tail : {"/nfs/Public", "/nfs/share1", "/nfs/share1/inner", "/shares/Public", "/shares/relative",
                             "/mnt/HD/alias/share1", "/mnt/HD/alias/file.txt", "/shares/file", "/shares/file/more",
                             "/shares/dangling", "/shares/loop1", "/shares/loop2/x", "/shares/trailing",
                             "/shares/trailing/inner", "/shares/dot", "/shares/dot/Public", "/nfs/../nfs/Public",
                             "/nfs/./Public", "/nfs/Public/", "/nfs//Public", "/nfs/missing", "/mnt/HD/HD_a2/file.txt/",
                             "/shares/chain5", "/shares/chain4", "/shares/chain0", "/nfs/chain5", "/nfs/chain3",
                             "/nfs/chain4/.."})
        paths.push_back(root + tail);
    // Forwards and then backwards through one memory, and each path through a fresh one.
    CanonicalPaths shared;
    for (int pass = 0; pass < 2; ++pass) {
        for (std::size_t i = 0; i < paths.size(); ++i) {
            const std::string& path = pass == 0 ? paths[i] : paths[paths.size() - 1 - i];
            EXPECT_EQ(shared.of(path), system_realpath(path)) << path;
            EXPECT_EQ(CanonicalPaths().of(path), system_realpath(path)) << path;
        }
    }
}

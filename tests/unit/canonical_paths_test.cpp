// Remembered path resolution must give what realpath() gives, for every path of a
// tree of folders, files and links (chains, loops, dangling and relative ones), asked
// in any order through one memory.
#include <gtest/gtest.h>

#include <array>
#include <climits>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <vector>

#include "nfs/canonical_paths.h"

namespace fs = std::filesystem;

namespace {

std::optional<std::string> system_realpath(const std::string& path)
{
    std::array<char, PATH_MAX> resolved{};
    if (realpath(path.c_str(), resolved.data()) == nullptr)
        return std::nullopt;
    return std::string(resolved.data());
}

class LinkTree : public ::testing::Test {
protected:
    void SetUp() override
    {
        const char* tmp = std::getenv("TMPDIR");
        std::string pattern = std::string(tmp && *tmp ? tmp : "/tmp") + "/canonical-XXXXXX";
        ASSERT_NE(mkdtemp(pattern.data()), nullptr);
        root = pattern;
        fs::create_directories(root + "/mnt/HD/HD_a2/Public");
        fs::create_directories(root + "/mnt/HD/HD_a2/share1/inner");
        fs::create_directories(root + "/shares");
        { std::FILE* file = std::fopen((root + "/mnt/HD/HD_a2/file.txt").c_str(), "w"); std::fclose(file); }
        link(root + "/shares", root + "/nfs");
        link(root + "/mnt/HD/HD_a2/Public", root + "/shares/Public");
        link(root + "/mnt/HD/HD_a2/share1", root + "/shares/share1");
        link("../mnt/HD/HD_a2/share1/inner", root + "/shares/relative");
        link("HD_a2", root + "/mnt/HD/alias");
        link(root + "/mnt/HD/HD_a2/file.txt", root + "/shares/file");
        link(root + "/nowhere", root + "/shares/dangling");
        link(root + "/shares/loop2", root + "/shares/loop1");
        link(root + "/shares/loop1", root + "/shares/loop2");
        link(root + "/mnt/HD/HD_a2/share1/", root + "/shares/trailing");
        link(".", root + "/shares/dot");
        // A chain of links: chain0 -> chain1 -> ... -> chain44 -> Public.
        link(root + "/mnt/HD/HD_a2/Public", root + "/shares/chain44");
        for (int i = 43; i >= 0; --i)
            link(root + "/shares/chain" + std::to_string(i + 1), root + "/shares/chain" + std::to_string(i));
    }
    void TearDown() override { fs::remove_all(root); }

    static void link(const std::string& target, const std::string& at) { fs::create_symlink(target, at); }

    std::string root;
};

} // namespace

TEST_F(LinkTree, ResolvesEveryPathAsRealpathDoes)
{
    const std::vector<std::string> tails = {
        "/nfs/Public", "/nfs/share1", "/nfs/share1/inner", "/shares/Public", "/shares/relative",
        "/mnt/HD/alias/share1", "/mnt/HD/alias/file.txt", "/shares/file", "/shares/file/more", "/shares/dangling",
        "/shares/loop1", "/shares/loop2/x", "/shares/trailing", "/shares/trailing/inner", "/shares/dot",
        "/shares/dot/Public", "/nfs/../nfs/Public", "/nfs/./Public", "/nfs/Public/", "/nfs//Public",
        "/nfs/missing", "/mnt/HD/HD_a2/file.txt/", "/shares/chain5", "/shares/chain4", "/shares/chain0",
        "/nfs/chain5", "/nfs/chain3", "/nfs/chain4/..", "",
    };
    std::vector<std::string> paths;
    for (const std::string& tail : tails)
        paths.push_back(tail.empty() ? std::string() : root + tail);
    paths.push_back("relative/path");
    paths.push_back("/");

    // Forwards and then backwards through one memory, and each path through a fresh one.
    CanonicalPaths shared;
    for (int pass = 0; pass < 2; ++pass) {
        for (std::size_t i = 0; i < paths.size(); ++i) {
            const std::string& path = pass == 0 ? paths[i] : paths[paths.size() - 1 - i];
            EXPECT_EQ(shared.of(path), system_realpath(path)) << path;
            CanonicalPaths fresh;
            EXPECT_EQ(fresh.of(path), system_realpath(path)) << path;
        }
    }
}

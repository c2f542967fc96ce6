// Atomic replacement of a file: the new content with the old permissions, nothing left
// beside it, and on failure the old state untouched and no temporary file.
#include <gtest/gtest.h>

#include <cstdlib>
#include <sys/stat.h>

#include "cgi/atomic_file.h"
#include "support.h"

namespace {

unsigned mode_of(const std::string& path)
{
    struct stat info {};
    return stat(path.c_str(), &info) == 0 ? info.st_mode & 07777 : 0;
}

std::size_t entries(const Scratch& dir) { return std::distance(fs::directory_iterator(dir.path), {}); }

} // namespace

TEST(AtomicFile, ReplacesKeepingThePermissionsOrLeavesTheOldState)
{
    const Scratch dir;
    spit(dir / "shadow", "old\n");
    ASSERT_EQ(chmod((dir / "shadow").c_str(), 0600), 0);
    ASSERT_TRUE(replace_file(dir / "shadow", "new\ncontent\n"));
    EXPECT_EQ(slurp(dir / "shadow"), "new\ncontent\n");
    EXPECT_EQ(mode_of(dir / "shadow"), 0600u);
    EXPECT_EQ(entries(dir), 1u);
    // A missing file is made readable by all.
    ASSERT_TRUE(replace_file(dir / "exports", ""));
    EXPECT_EQ(mode_of(dir / "exports"), 0644u);
    // Nothing can be written into a missing folder.
    EXPECT_FALSE(replace_file(dir / "missing/file", "x"));
    EXPECT_FALSE(fs::exists(dir / "missing"));
    // The rename fails (a folder stands at the path): it stays, the temporary goes.
    fs::create_directory(dir / "taken");
    spit(dir / "taken/inside", "kept");
    EXPECT_FALSE(replace_file(dir / "taken", "x"));
    EXPECT_EQ(slurp(dir / "taken/inside"), "kept");
    EXPECT_EQ(entries(dir), 3u);
}

TEST(AtomicFile, ReadsAWholeFileOrReportsItMissing)
{
    const Scratch dir;
    std::string content = "stale";
    EXPECT_FALSE(read_whole_file(dir / "none", content));
    const std::string big(200000, 'x');
    spit(dir / "big", big);
    ASSERT_TRUE(read_whole_file(dir / "big", content));
    EXPECT_EQ(content, big);
    // A file without a length (a pipe; a /proc file, as /etc/mtab may be) comes in
    // pieces: one shorter than was asked is not yet its end. (The writer is a shell:
    // under the ARM targets' emulator a test can neither fork nor start a thread.)
    ASSERT_EQ(mkfifo((dir / "pipe").c_str(), 0600), 0);
    const std::string writer = "(printf 'first\\n'; sleep 0.05; printf 'second\\n') >" + (dir / "pipe") + " &";
    ASSERT_EQ(std::system(writer.c_str()), 0);
    EXPECT_TRUE(read_whole_file(dir / "pipe", content));
    EXPECT_EQ(content, "first\nsecond\n");
}

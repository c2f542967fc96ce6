// Atomic replacement of a file: the new content with the old permissions, nothing left
// beside it, and on failure the old state untouched and no temporary file.
#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>
#include <sys/stat.h>

#include "cgi/atomic_file.h"

namespace fs = std::filesystem;

namespace {

class Folder {
public:
    Folder()
    {
        std::string pattern = (fs::temp_directory_path() / "atomic-XXXXXX").string();
        if (mkdtemp(pattern.data()) == nullptr)
            throw std::runtime_error("mkdtemp");
        m_path = pattern;
    }
    ~Folder() { fs::remove_all(m_path); }
    std::string operator/(const std::string& name) const { return (m_path / name).string(); }
    std::size_t entries() const
    {
        return static_cast<std::size_t>(std::distance(fs::directory_iterator(m_path), fs::directory_iterator()));
    }

private:
    fs::path m_path;
};

std::string slurp(const std::string& path)
{
    std::ifstream in(path, std::ios::binary);
    std::ostringstream content;
    content << in.rdbuf();
    return content.str();
}

} // namespace

TEST(AtomicFile, ReplacesTheContentAndKeepsThePermissions)
{
    Folder folder;
    const std::string path = folder / "shadow";
    std::ofstream(path) << "old\n";
    ASSERT_EQ(chmod(path.c_str(), 0600), 0);
    ASSERT_TRUE(replace_file(path, "new\ncontent\n"));
    EXPECT_EQ(slurp(path), "new\ncontent\n");
    struct stat info {};
    ASSERT_EQ(stat(path.c_str(), &info), 0);
    EXPECT_EQ(info.st_mode & 07777, 0600u);
    EXPECT_EQ(folder.entries(), 1u);
}

TEST(AtomicFile, CreatesAMissingFileReadableByAll)
{
    Folder folder;
    const std::string path = folder / "exports";
    ASSERT_TRUE(replace_file(path, ""));
    EXPECT_EQ(slurp(path), "");
    struct stat info {};
    ASSERT_EQ(stat(path.c_str(), &info), 0);
    EXPECT_EQ(info.st_mode & 07777, 0644u);
}

TEST(AtomicFile, AFailureLeavesTheOldStateAndNoTemporaryFile)
{
    Folder folder;
    // The folder is missing: nothing can be written.
    EXPECT_FALSE(replace_file(folder / "missing/file", "x"));
    EXPECT_FALSE(fs::exists(folder / "missing"));
    // The rename fails (a folder stands at the path): it stays, the temporary goes.
    fs::create_directory(folder / "taken");
    std::ofstream(folder / "taken/inside") << "kept";
    EXPECT_FALSE(replace_file(folder / "taken", "x"));
    EXPECT_EQ(slurp(folder / "taken/inside"), "kept");
    EXPECT_EQ(folder.entries(), 1u);
}

TEST(AtomicFile, ReadsAWholeFileOrReportsItMissing)
{
    Folder folder;
    std::string content = "stale";
    EXPECT_FALSE(read_whole_file(folder / "none", content));
    const std::string big(200000, 'x');
    std::ofstream(folder / "big") << big;
    ASSERT_TRUE(read_whole_file(folder / "big", content));
    EXPECT_EQ(content, big);
}

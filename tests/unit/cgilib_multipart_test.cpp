// Multipart bodies: fields, uploads written byte for byte, hostile bodies, and
// moving an upload into place.
#include <gtest/gtest.h>

#include <sys/stat.h>
#include <vector>

#include "cgilib/temp_file.h"
#include "support.h"

namespace {

const std::string kType = "multipart/form-data; boundary=XyZ", kEnd = "--XyZ--\r\n";

std::string field(const std::string& name, const std::string& value)
{
    return "--XyZ\r\nContent-Disposition: form-data; name=\"" + name + "\"\r\n\r\n" + value + "\r\n";
}

std::string file(const std::string& name, const std::string& file_name, const std::string& content)
{
    return "--XyZ\r\nContent-Disposition: form-data; name=\"" + name + "\"; filename=\"" + file_name +
           "\"\r\nContent-Type: application/octet-stream\r\n\r\n" + content + "\r\n";
}

// Uploads are stored in the library's own temporary files: this moves one out and
// reads what arrived.
std::string renamed_content(const char* name, const Scratch& dir)
{
    return cgiFormFileRename(name, (dir / name).c_str()) == cgiFormSuccess ? slurp(dir / name) : "<not renamed>";
}

} // namespace

TEST(CgiMultipart, ReadsFieldsAndUploadsByteForByte)
{
    using namespace std::string_literals;
    const std::string content = "line 1\r\nline 2\n\r\n--Xy-\r\n--XyQ\0\xff\x80 end\r\n"s;
    parse({.content_type = kType,
           .body = "preamble\r\n" + field("name", "alice") + file("upload", "C:\\dir\\users.txt", content) +
                   field("note", "two\r\nlines") + field("name", "bob") + kEnd + "epilogue"});
    EXPECT_EQ(form_string("name"), (Read{cgiFormSuccess, "alice"}));
    EXPECT_EQ(form_string("note"), (Read{cgiFormSuccess, "two\r\nlines"}));
    EXPECT_EQ(form_file_name("upload"), (Read{cgiFormSuccess, "C:\\dir\\users.txt"}));
    EXPECT_EQ(form_file_name("upload", 4), (Read{cgiFormTruncated, "C:\\"}));
    EXPECT_EQ(form_file_name("name"), (Read{cgiFormNotAFile, ""}));
    EXPECT_EQ(form_file_name("missing"), (Read{cgiFormNotFound, ""}));
    EXPECT_EQ(form_string("upload"), (Read{cgiFormEmpty, ""}));
    const Scratch dir;
    EXPECT_EQ(renamed_content("upload", dir), content);
    // The body is read in pieces; a delimiter may fall across the seam of two of them.
    for (std::size_t size = 65536 - 80; size < 65536 + 8; size += 3) {
        std::string content(size, 'x');
        for (std::size_t i = 0; i < size; i += 97)
            content[i] = static_cast<char>(i % 251);
        parse({.content_type = kType, .body = file("f", "f.bin", content) + field("after", "yes") + kEnd});
        EXPECT_EQ(renamed_content("f", dir), content) << size;
        EXPECT_EQ(form_string("after").text, "yes") << size;
    }
}

TEST(CgiMultipart, LeavesOutWhatCannotBeRead)
{
    const std::string good = field("a", "1"), two = good + field("b", "2") + kEnd;
    const auto ok = cgiFormSuccess, none = cgiFormNotFound;
    const struct {
        std::string label, content_type, body;
        cgiFormResultType a, b;
        std::optional<std::string> length = {};
    } cases[] = {
        {"no boundary", "multipart/form-data", good + kEnd, none, none},
        {"empty boundary", "multipart/form-data; boundary=", good + kEnd, none, none},
        {"wrong boundary", "multipart/form-data; boundary=Other", good + kEnd, none, none},
        {"quoted boundary", "Multipart/Form-Data; boundary=\"XyZ\"", good + kEnd, ok, none},
        {"no delimiter at all", kType, "a=1", none, none},
        {"unterminated last part", kType, good + "--XyZ\r\nContent-Disposition: form-data; name=\"b\"\r\n\r\n2", ok, none},
        {"no closing delimiter", kType, good + field("b", "2"), ok, none},
        {"padding on the boundary line", kType,
         "--XyZ \t\r\nContent-Disposition: form-data; name=a\r\n\r\n1\r\n" + field("b", "2") + kEnd, ok, ok},
        {"part without headers", kType, "--XyZ\r\n\r\nlost\r\n" + good + kEnd, ok, none},
        {"part without blank line", kType, "--XyZ\r\nContent-Disposition: form-data; name=\"b\"\r\n" + good + kEnd, ok, none},
        {"part without a name", kType, "--XyZ\r\nContent-Disposition: form-data\r\n\r\nx\r\n" + good + kEnd, ok, none},
        {"endless header", kType, "--XyZ\r\nX: " + std::string(40000, 'h') + "\r\n\r\n2\r\n" + good + kEnd, ok, none},
        {"empty file name is a field", kType, good + file("b", "", "") + kEnd, ok, cgiFormEmpty},
        {"length cuts into part b", kType, two, ok, none, std::to_string(good.size() + 20)},
        {"length beyond the body", kType, two, none, none, "500"},
        {"length beyond the limit", kType, good + kEnd, none, none, std::to_string(cgilib::kMaxMultipartBody + 1)},
        {"negative length", kType, good + kEnd, none, none, "-5"},
    };
    for (const auto& c : cases) {
        parse({.content_type = c.content_type, .body = c.body, .content_length = c.length});
        EXPECT_EQ(form_string("a").result, c.a) << c.label;
        EXPECT_EQ(form_string("b").result, c.b) << c.label;
    }
}

// The library makes its upload files with mkostemp (mkostemp64 where 32-bit targets
// build with 64-bit file offsets), which the unit tests' link points here: the tests
// watch only the files this process made, whatever other processes (the fuzzer, a
// device test's import) store beside them in /tmp meanwhile.
std::vector<std::string> g_made;
int remembered(int fd, const char* pattern)
{
    if (fd >= 0)
        g_made.emplace_back(pattern);
    return fd;
}
extern "C" int __real_mkostemp(char* pattern, int flags);
extern "C" int __wrap_mkostemp(char* pattern, int flags) { return remembered(__real_mkostemp(pattern, flags), pattern); }
extern "C" int __real_mkostemp64(char* pattern, int flags);
extern "C" int __wrap_mkostemp64(char* pattern, int flags) { return remembered(__real_mkostemp64(pattern, flags), pattern); }

TEST(CgiMultipart, DropsUnfinishedUploadsAndRemovesOldOnes)
{
    const auto left = [] {
        std::vector<std::string> found;
        std::copy_if(g_made.begin(), g_made.end(), std::back_inserter(found), [](auto& path) { return fs::exists(path); });
        return found;
    };
    g_made.clear();
    parse({.content_type = kType, .body = file("f", "a.txt", "data") + kEnd});
    ASSERT_EQ(left().size(), 1u);
    EXPECT_TRUE(left()[0].starts_with("/tmp/cgic")) << left()[0];
    // The next request replaces this one; a cut upload is not kept either.
    parse({.content_type = kType, .body = file("f", "a.txt", "data") + "--XyZ\r\n" + file("g", "b.txt", "cut")});
    EXPECT_EQ(form_file_name("f").result, cgiFormSuccess);
    EXPECT_EQ(form_file_name("g").result, cgiFormNotFound);
    EXPECT_EQ(g_made.size(), 3u);
    EXPECT_EQ(left(), std::vector<std::string>{g_made[1]});
    parse({.method = "GET"});
    EXPECT_TRUE(left().empty());
}

TEST(CgiFormFileRename, MovesTheUploadIntoAnotherDirectoryOrFileSystem)
{
    const Scratch dir;
    parse({.content_type = kType, .body = file("f", "a.txt", "first") + field("plain", "x") + kEnd});
    fs::create_directory(dir.path / "sub");
    spit(dir / "sub/target", "old content");
    EXPECT_EQ(cgiFormFileRename("plain", (dir / "p").c_str()), cgiFormNotAFile);
    EXPECT_EQ(cgiFormFileRename("missing", (dir / "m").c_str()), cgiFormNotFound);
    EXPECT_EQ(cgiFormFileRename("f", (dir / "no-such-dir/t").c_str()), cgiFormIO);
    EXPECT_EQ(cgiFormFileRename("f", (dir / "sub/target").c_str()), cgiFormSuccess);
    EXPECT_EQ(slurp(dir / "sub/target"), "first");
    EXPECT_EQ(cgiFormFileRename("f", (dir / "again").c_str()), cgiFormIO);

    // /dev/shm is a file system of its own on most machines: a rename cannot cross to
    // it, so the upload is copied there instead.
    struct stat tmp_stat {}, shm_stat {};
    if (::stat("/tmp", &tmp_stat) != 0 || ::stat("/dev/shm", &shm_stat) != 0 || tmp_stat.st_dev == shm_stat.st_dev)
        GTEST_SKIP() << "no second file system at /dev/shm";
    const Scratch shm("/dev/shm");
    const std::string content = std::string("a\0b\r\n", 5) + std::string(200000, 'z');
    auto upload = cgilib::TempFile::create();
    ASSERT_TRUE(upload && upload->write(content) && upload->finish());
    const std::string source = upload->path();
    EXPECT_TRUE(upload->move_to(shm / "moved"));
    EXPECT_EQ(slurp(shm / "moved"), content);
    EXPECT_FALSE(fs::exists(source));
    EXPECT_EQ(std::distance(fs::directory_iterator(shm.path), {}), 1);   // no staging file left
}

// Import of users and groups: the upload, the listings, the hand-off to account_mgr,
// the progress report and the sample downloads.
#include <gtest/gtest.h>

#include <string>

#include "device.h"

namespace {

const std::string kBoundary = "----nasBoundary7MA4YWxk";

// A multipart upload as a browser sends it: the command field, then the file part, if any.
Reply upload(Device& dev, const std::string& file_part)
{
    return dev.post_raw("--" + kBoundary + "\r\nContent-Disposition: form-data; name=\"cmd\"\r\n\r\n"
                        "cgi_import_uesrs\r\n" + file_part + "--" + kBoundary + "--\r\n",
                        "multipart/form-data; boundary=" + kBoundary);
}

std::string file_part(const std::string& file_name, const std::string& content)
{
    return "--" + kBoundary + "\r\nContent-Disposition: form-data; name=\"fileToUpload\"; filename=\"" + file_name +
           "\"\r\nContent-Type: text/plain\r\n\r\n" + content + "\r\n";
}

std::string download(const std::string& name, const std::string& content)
{
    return "Content-Disposition: attachment;filename=\"" + name + "\"\r\nContent-Length: " +
           std::to_string(content.size()) + "\r\nConnection: Keep-Alive\r\nContent-Type: text/html\r\n\r\n" + content;
}

std::string items(const std::vector<std::string>& lines)
{
    std::string text = "<info>\n";
    for (const std::string& line : lines)
        text += "<item>" + line + "</item>\n";
    return text + "</info>\n";
}

} // namespace

TEST(ImportUpload, TheUploadedFileBecomesTheUserImportFile)
{
    Device dev;
    dev.write_file("/tmp/import_users", "old\tfile\n");
    const std::string content = "jdoe\tpw1\tfamily\r\n# a comment\r\nmsmith\tpw2\t\r\n";
    EXPECT_EQ(upload(dev, file_part("users from 'HR'.txt", content)).out, kEmptyHtml);
    EXPECT_EQ(dev.read_file("/tmp/import_users"), content);
    EXPECT_TRUE(dev.journal().empty());   // nothing is created before the page asks
    EXPECT_EQ(dev.request("cgi_get_import_uesrs"), xml_utf8_answer(items({"jdoe\tpw1\tfamily", "msmith\tpw2\t"})));

    // Without a file the previous one stays.
    EXPECT_EQ(upload(dev, "").out, kEmptyHtml);
    EXPECT_EQ(dev.read_file("/tmp/import_users"), content);
}

TEST(ImportLists, ShowTheRecordLinesOfEitherFile)
{
    const std::string long_line(12300, 'x');
    const struct {
        const char* what;
        std::string content, body;
    } cases[] = {
        {"CR LF, comments and empty lines", "a\r\n\r\n#b\r\n\n c\r\n", items({"a", " c"})},
        {"escaped text", "R&D <lab>\t\"x\"\n", items({"R&amp;D &lt;lab&gt;\t&quot;x&quot;"})},
        {"a line longer than the reader", long_line + "\n", items({long_line.substr(0, 12287), "xxxxxxxxxxxxx"})},
        {"no line end at the end", "last", items({"last"})},
        {"an empty file", "", items({})},
    };
    Device dev;
    for (const auto& c : cases) {
        dev.write_file("/tmp/import_users", c.content);
        dev.write_file("/tmp/import_groups", c.content);
        EXPECT_EQ(dev.request("cgi_get_import_uesrs"), xml_utf8_answer(c.body)) << c.what;
        EXPECT_EQ(dev.request("cgi_get_import_groups"), xml_utf8_answer(c.body)) << c.what;
    }
    EXPECT_TRUE(dev.journal().empty());
    dev.remove("/tmp/import_users");
    dev.remove("/tmp/import_groups");
    EXPECT_EQ(dev.request("cgi_get_import_uesrs"), xml_utf8_answer("<info><status>ng</status></info>\n"));
    EXPECT_EQ(dev.request("cgi_get_import_groups"), xml_utf8_answer("<info><status>ng</status></info>\n"));
}

TEST(ImportCreate, StartsAccountMgrInTheBackground)
{
    // An "app" of 63 quotes escapes to a line longer than 255 bytes, which is cut there.
    std::string escaped = "'";
    for (int i = 0; i < 63; ++i)
        escaped += "'\\''";
    const std::string quoted_line = "(account_mgr -u -f '/tmp/import_users' -t " + escaped + "' -o '' >/dev/null 2>&1) &";
    const struct {
        const char* what;
        std::string cmd;
        Fields fields;
        std::string line;
    } cases[] = {
        {"users", "cgi_create_import_users", {{"overwrite", "1"}, {"app", "web"}},
         "(account_mgr -u -f '/tmp/import_users' -t 'web' -o '1' >/dev/null 2>&1) &"},
        {"groups", "cgi_create_import_groups", {{"overwrite", "0"}, {"app", "a b"}},
         "(account_mgr -g -f '/tmp/import_groups' -t 'a b' -o '0' >/dev/null 2>&1) &"},
        {"no fields", "cgi_create_import_users", {},
         "(account_mgr -u -f '/tmp/import_users' -t '' -o '' >/dev/null 2>&1) &"},
        {"overwrite cut to 7 bytes", "cgi_create_import_groups", {{"overwrite", "123456789"}, {"app", "x"}},
         "(account_mgr -g -f '/tmp/import_groups' -t 'x' -o '1234567' >/dev/null 2>&1) &"},
        {"the line is cut to 255 bytes", "cgi_create_import_users", {{"app", std::string(63, '\'')}},
         quoted_line.substr(0, 255)},
    };
    for (const auto& c : cases) {
        Device dev;
        EXPECT_EQ(dev.request(c.cmd, c.fields), kEmptyHtml) << c.what;
        EXPECT_EQ(shell_lines(dev.journal()), std::vector<std::string>{c.line}) << c.what;
    }
}

TEST(CreateStatus, ReadsTheMarkerOfTheKindAndThenTheResultLines)
{
    const std::string long_success = std::string(130, 'a') + ":0\n";   // its first piece lacks ":0"
    const struct {
        const char* what;
        std::string ftype;
        bool user_marker, group_marker;
        std::string status_file;   // "(none)" for no file
        int status;
    } cases[] = {
        {"batch users running", "bUser", true, false, "u1:0\n", -1},
        {"imported users running", "iUser", true, false, "u1:0\n", -1},
        {"groups running, users asked", "bUser", false, true, "u1:0\n", 0},
        {"groups running", "", false, true, "g:0\n", -1},
        {"other text asks for groups", "iuser", true, true, "g:0\n", -1},
        {"all created", "iUser", false, false, "jdoe:0\nmsmith:0\n", 0},
        {"one failed", "iUser", false, false, "jdoe:0\nalice:1\n", 1},
        {":0 anywhere counts", "group", false, false, "x:01 y\n", 0},
        {"an empty line is a failure", "group", false, false, "a:0\n\nb:0\n", 1},
        {"no status file", "bUser", false, false, "(none)", 0},
        {"an empty status file", "bUser", false, false, "", 0},
        {"a long line is read in pieces", "bUser", false, false, long_success, 1},
    };
    Device dev;
    for (const auto& c : cases) {
        for (const char* file : {"/tmp/start_create_users", "/tmp/start_create_groups", "/tmp/account_status"})
            dev.remove(file);
        if (c.user_marker)
            dev.write_file("/tmp/start_create_users", "");
        if (c.group_marker)
            dev.write_file("/tmp/start_create_groups", "");
        if (c.status_file != "(none)")
            dev.write_file("/tmp/account_status", c.status_file);
        EXPECT_EQ(dev.request("cgi_get_create_status", {{"ftype", c.ftype}}),
                  xml_utf8_answer("<info><status>" + std::to_string(c.status) + "</status></info>\n"))
            << c.what;
    }
}

TEST(ImportSamples, DownloadWithTheirOwnHeaders)
{
    Device dev;
    for (const std::string name : {"import_file.txt", "import_group.txt"}) {
        const std::string content = dev.read_file("/var/www/web/users/" + name);
        ASSERT_FALSE(content.empty()) << name;
        EXPECT_EQ(dev.request(name == "import_file.txt" ? "cgi_download_import_sample" : "cgi_download_import_group_sample"),
                  download(name, content));
    }

    // Binary content larger than one 2048-byte chunk comes through unchanged; no file, no answer.
    std::string binary;
    for (int i = 0; i < 5000; ++i)
        binary += static_cast<char>(i % 256);
    dev.write_file("/var/www/web/users/import_file.txt", binary);
    EXPECT_EQ(dev.request("cgi_download_import_sample"), download("import_file.txt", binary));
    dev.remove("/var/www/web/users/import_group.txt");
    EXPECT_EQ(dev.request("cgi_download_import_group_sample"), "");
}

TEST(ImportSamples, AreListedAndImportedAsTheyStand)
{
    Device dev;
    dev.write_file("/tmp/import_users", dev.read_file("/var/www/web/users/import_file.txt"));
    dev.write_file("/tmp/import_groups", dev.read_file("/var/www/web/users/import_group.txt"));
    EXPECT_EQ(dev.request("cgi_get_import_uesrs"),
              xml_utf8_answer(items({"jdoe\tjdoe-pass\tfamily\t\t\t\t", "msmith\tmsmith-pass\toffice,family\t\t\t\t"})));
    EXPECT_EQ(dev.request("cgi_get_import_groups"), xml_utf8_answer(items({"sales\talice,bob", "support\tcarol"})));

    EXPECT_EQ(dev.request("cgi_create_import_users", {{"overwrite", "0"}, {"app", "web"}}), kEmptyHtml);
    EXPECT_EQ(dev.read_file("/tmp/account_status"), "jdoe:0\nmsmith:0\n");
    EXPECT_EQ(dev.request("cgi_create_import_groups", {{"overwrite", "0"}, {"app", "web"}}), kEmptyHtml);
    EXPECT_EQ(dev.read_file("/tmp/account_status"), "sales:0\nsupport:0\n");
    EXPECT_EQ(dev.request("cgi_get_create_status", {{"ftype", "group"}}),
              xml_utf8_answer("<info><status>0</status></info>\n"));
    EXPECT_NE(dev.read_file("/etc/group").find("sales:x:"), std::string::npos);

    // The same file again: every account exists now.
    EXPECT_EQ(dev.request("cgi_create_import_users", {{"overwrite", "1"}, {"app", "web"}}), kEmptyHtml);
    EXPECT_EQ(dev.read_file("/tmp/account_status"), "jdoe:1\nmsmith:1\n");
    EXPECT_EQ(dev.request("cgi_get_create_status", {{"ftype", "iUser"}}),
              xml_utf8_answer("<info><status>1</status></info>\n"));
}

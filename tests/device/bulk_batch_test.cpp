// Batch creation of numbered users: the record file, the hand-off to account_mgr, the
// event, and the background run reported through cgi_get_create_status.
#include <gtest/gtest.h>

#include <string>

#include "device.h"

namespace {

const std::string kToolLine = "(account_mgr -u -f '/tmp/account_batch_info' -t 'web' -o '0' >/dev/null 2>&1) &";

Fields batch(const std::string& prefix, const std::string& start, const std::string& number)
{
    return {{"f_prefix", prefix}, {"f_start", start}, {"f_number", number}, {"f_batch_pw", "pw"},
            {"group_list", "family"}, {"f_overwrite", "0"}, {"r_list", "R"}, {"w_list", "W"}, {"d_list", "D"},
            {"quota", "Q"}, {"app", "web"}};
}

std::string records(const std::vector<std::string>& names)
{
    std::string text;
    for (const std::string& name : names)
        text += name + "\tpw\tfamily\tW\tR\tD\tQ\n";
    return text;
}

std::string created_event(const std::string& range)
{
    return "<14>SYSTEM: Account \"" + range + "\" has been created.";
}

} // namespace

TEST(BatchCreate, WritesOneRecordPerAccountAndLogsTheUnpaddedRange)
{
    const struct {
        const char* what;
        Fields fields;
        std::string records, range;
    } cases[] = {
        {"width of the typed start", batch("u", "01", "3"), records({"u01", "u02", "u03"}), "u1-u3"},
        {"numbers outgrow the width", batch("u", "8", "3"), records({"u8", "u9", "u10"}), "u8-u10"},
        {"zero accounts", batch("u", "5", "0"), "", "u5-u4"},
        {"a count that is no number", batch("u", "5", "many"), "", "u5-u4"},
        {"an empty start pads nothing", batch("s", "", "2"), records({"s0", "s1"}), "s0-s1"},
        {"the prefix is cut to 15 characters", batch("abcdefghijklmnopqrst", "1", "1"),
         records({"abcdefghijklmno1"}), "abcdefghijklmno1-abcdefghijklmno1"},
    };
    for (const auto& c : cases) {
        Device dev;
        EXPECT_EQ(dev.request("cgi_user_batch_create", c.fields), kEmptyHtml) << c.what;
        EXPECT_EQ(dev.read_file("/tmp/account_batch_info"), c.records) << c.what;
        EXPECT_EQ(dev.messages(), std::vector<std::string>{created_event(c.range)}) << c.what;
        EXPECT_EQ(dev.journal(), (Journal{{"sh", "-c", kToolLine},   // then the tool, in the background
                                          {"account_mgr", "-u", "-f", "/tmp/account_batch_info", "-t", "web", "-o", "0"}}))
            << c.what;
    }
}

TEST(BatchCreate, EmptyColumnsKeepAllSevenAndTheWriteListComesFirst)
{
    Device dev;
    EXPECT_EQ(dev.request("cgi_user_batch_create",
                          {{"f_prefix", "k"}, {"f_start", "1"}, {"f_number", "1"}, {"r_list", "read"},
                           {"w_list", "write"}, {"app", "x y"}, {"f_overwrite", "it's"}}),
              kEmptyHtml);
    EXPECT_EQ(dev.read_file("/tmp/account_batch_info"), "k1\t\t\twrite\tread\t\t\n");
    EXPECT_EQ(shell_lines(dev.journal()),
              std::vector<std::string>{
                  "(account_mgr -u -f '/tmp/account_batch_info' -t 'x y' -o 'it'\\''s' >/dev/null 2>&1) &"});
}

TEST(BatchCreate, LongListsTravelWhole)
{
    Device dev;
    const std::string list(12287, 'r');
    Fields fields = batch("u", "1", "2");
    for (auto& [name, value] : fields) {
        if (name == "r_list" || name == "w_list" || name == "d_list")
            value = list + "cut";
    }
    EXPECT_EQ(dev.post("cgi_user_batch_create", fields), kEmptyHtml);
    const std::string record = "\tpw\tfamily\t" + list + "\t" + list + "\t" + list + "\tQ\n";
    EXPECT_EQ(dev.read_file("/tmp/account_batch_info"), "u1" + record + "u2" + record);
}

TEST(BatchCreate, ARecordFileThatCannotBeWrittenStillStartsTheTool)
{
    Device dev;
    dev.write_file("/tmp/account_batch_info/blocked", "");   // a directory in its place
    EXPECT_EQ(dev.request("cgi_user_batch_create", batch("u", "1", "3")), kEmptyHtml);
    EXPECT_EQ(dev.messages(), std::vector<std::string>{created_event("u1-u-1")});
    EXPECT_EQ(shell_lines(dev.journal()), std::vector<std::string>{kToolLine});
}

// The page polls while account_mgr works: -1 as long as the user marker is there, then
// the result of the run. The tool waits at a gate the script opens, so the poll
// during the run is certain to see it running.
TEST(BatchCreate, UsersAreCreatedInTheBackgroundAndReported)
{
    Device dev;
    dev.write_file("/sim/account_mgr.conf", "gate=/tmp/go\n");
    dev.write_file("/etc/passwd", dev.read_file("/etc/passwd") + "u02:x:1500:1000::/home:/bin/sh\n");
    const std::string script = R"(
cgi=/var/www/cgi-bin/nas-accounts.cgi
export REQUEST_METHOD=GET
status() { QUERY_STRING="cmd=cgi_get_create_status&ftype=$1" $cgi | grep -o '<status>.*</status>'; }
QUERY_STRING='cmd=cgi_user_batch_create&f_prefix=u&f_start=01&f_number=3&f_batch_pw=pw&group_list=family' $cgi >/dev/null
while [ ! -e /tmp/start_create_users ]; do sleep 0.01; done
status bUser
status iUser
status group
touch /tmp/go
while [ -e /tmp/start_create_users ]; do sleep 0.01; done
status bUser
)";
    const Reply reply = dev.run({"/bin/sh", "-c", script});
    EXPECT_EQ(reply.out, "<status>-1</status>\n"    // batch users: running
                         "<status>-1</status>\n"    // imported users share the marker
                         "<status>0</status>\n"     // groups: not running, no failure yet
                         "<status>1</status>\n");   // done, u02 existed already
    EXPECT_EQ(dev.read_file("/tmp/account_status"), "u01:0\nu02:1\nu03:0\n");
    const std::string passwd = dev.read_file("/etc/passwd");
    EXPECT_TRUE(passwd.find("\nu01:") != std::string::npos && passwd.find("\nu03:") != std::string::npos);
    EXPECT_FALSE(dev.exists("/tmp/start_create_users"));
}

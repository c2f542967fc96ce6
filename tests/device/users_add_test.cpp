// Creating users: the account tool's line, the share and quota calls, the event, and
// the account files and home share that result.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "accounts_testing.h"

namespace {

const std::string kAdded = xml_answer("<adduser><status>ok</status></adduser>");

// What every creation ends with, after the user's own lines.
Journal tail_for(const std::string& name, const std::string& word = "")
{
    return {{"sh", "-c", "quota_set -u " + (word.empty() ? "'" + name + "'" : word) + " -s 0 -a >/dev/null 2>&1"},
            {"quota_set", "-u", name, "-s", "0", "-a"},
            {"sh", "-c", "smbcom >/dev/null 2>&1"}, {"smbcom"},
            {"sh", "-c", "afpcom >/dev/null 2>&1"}, {"afpcom"},
            {"LIB_CP_Config_To_MTD", "4390950"}};
}

Journal concat(Journal head, const Journal& tail)
{
    head.insert(head.end(), tail.begin(), tail.end());
    return head;
}

} // namespace

TEST(UserAdd, CreatesTheUserWithAPrivateHomeShare)
{
    Device dev;
    EXPECT_EQ(dev.request("cgi_user_add", {{"name", "dave"}, {"pw", base64("s3cret")}, {"pw_onoff", "1"},
                                           {"group", "family,office"}, {"description", "Dave Doe"},
                                           {"mail", "dave@example.com"}, {"pw_hit", "usual"}}),
              kAdded);
    EXPECT_EQ(dev.journal(),
              concat({{"sh", "-c",
                       "account -a -u 'dave' -p 's3cret' -l 'family,office' -f 'Dave Doe' -h 'usual' -e 'dave@example.com'"},
                      {"account", "-a", "-u", "dave", "-p", "s3cret", "-l", "family,office", "-f", "Dave Doe", "-h",
                       "usual", "-e", "dave@example.com"},
                      {"set_default_deny", "dave"},
                      {"chk_share", "dave"},
                      {"add_share", "dave", "/mnt/HD/HD_a2/dave", "no", "yes", "0", "1", "0", "1"},
                      {"public_off_share", "dave"},
                      {"insert_acnt_node", "dave", "dave", "2"},
                      {"acnt_mod_share", "dave", "0"}},
                     tail_for("dave")));
    EXPECT_EQ(logged(dev), (std::vector<std::string>{"SYSTEM: Account \"dave\" has been created."}));

    EXPECT_EQ(account_line(dev, "/etc/passwd", "dave"), "dave:x:1004:1000:Dave Doe,,,,dave@example.com:/shares/dave:/bin/sh");
    EXPECT_EQ(account_line(dev, "/etc/group", "allaccount"), "allaccount:x:1000:admin,alice,bob,carol,dave");
    EXPECT_EQ(account_line(dev, "/etc/group", "family"), "family:x:1004:alice,bob,dave");
    EXPECT_EQ(account_line(dev, "/etc/group", "office"), "office:x:1005:carol,dave");
    EXPECT_THAT(account_field(dev, "/etc/shadow", "dave", 1), testing::StartsWith("$6$"));
    EXPECT_TRUE(password_verifies(dev, "dave", "s3cret"));
    EXPECT_FALSE(password_verifies(dev, "dave", "secret"));
    EXPECT_EQ(dev.read_file("/var/lib/platform/hints"), "dave\tusual\n");
    EXPECT_THAT(dev.read_file("/var/lib/platform/shares"),
                testing::HasSubstr("\ndave\t/mnt/HD/HD_a2/dave\tno\tyes\t0\t0\t0\t1\tdave:2\n"));
    EXPECT_EQ(resolved(dev, "/shares/dave"), "/mnt/HD/HD_a2/dave");
}

TEST(UserAdd, ChoosesTheCommandLineByDialog)
{
    const struct {
        const char* what;
        Fields fields;
        Journal head;           // the lines before the default-deny call
        Journal share;          // the home share's calls
        std::vector<std::string> events;
        std::string name;
        std::string quota_word;     // the name as the quota line quotes it, when not 'name'
    } cases[] = {
        {"no password: an empty word, and the share stays public",
         {{"name", "eve"}, {"pw", base64("ignored")}, {"description", "E"}},
         {{"sh", "-c", "account -a -u 'eve' -p '' -l '' -f 'E' -h '' -e ''"},
          {"account", "-a", "-u", "eve", "-p", "", "-l", "", "-f", "E", "-h", "", "-e", ""}},
         {{"chk_share", "eve"}, {"add_share", "eve", "/mnt/HD/HD_a2/eve", "no", "yes", "0", "1", "0", "1"}},
         {"SYSTEM: Account \"eve\" has been created."},
         "eve", ""},
        {"the wizard's user starts without password, groups or hint",
         {{"type", "wizard"}, {"name", "eve"}, {"pw", base64("x")}, {"pw_onoff", "1"}, {"group", "family"},
          {"description", "E"}, {"mail", "e@x"}, {"pw_hit", "h"}},
         {{"sh", "-c", "account -a -u 'eve' -p '' -l '' -f 'E' -h '' -e 'e@x'"},
          {"account", "-a", "-u", "eve", "-p", "", "-l", "", "-f", "E", "-h", "", "-e", "e@x"}},
         {{"chk_share", "eve"},
          {"add_share", "eve", "/mnt/HD/HD_a2/eve", "no", "yes", "0", "1", "0", "1"},
          {"public_off_share", "eve"},
          {"insert_acnt_node", "eve", "eve", "2"},
          {"acnt_mod_share", "eve", "0"}},
         {"SYSTEM: Account \"eve\" has been created."},
         "eve", ""},
        {"the wizard's administrator renames admin: no event, no home share",
         {{"type", "wizard"}, {"isAdmin", "1"}, {"name", "boss"}, {"description", "The Boss"}, {"mail", "b@x"}},
         {{"sh", "-c", "account -u admin -n 'boss'"},
          {"account", "-u", "admin", "-n", "boss"},
          {"sh", "-c", "account -m -u 'boss' -f 'The Boss' -e 'b@x'"},
          {"account", "-m", "-u", "boss", "-f", "The Boss", "-e", "b@x"}},
         {},
         {},
         "boss", ""},
        {"a quote in a value stays one word",
         {{"name", "o'neil"}, {"description", "it's"}},
         {{"sh", "-c", "account -a -u 'o'\\''neil' -p '' -l '' -f 'it'\\''s' -h '' -e ''"},
          {"account", "-a", "-u", "o'neil", "-p", "", "-l", "", "-f", "it's", "-h", "", "-e", ""}},
         {{"chk_share", "o'neil"}, {"add_share", "o'neil", "/mnt/HD/HD_a2/o'neil", "no", "yes", "0", "1", "0", "1"}},
         {"SYSTEM: Account \"o'neil\" has been created."},
         "o'neil", "'o'\\''neil'"},
    };
    for (const auto& c : cases) {
        Device dev;
        EXPECT_EQ(dev.request("cgi_user_add", c.fields), kAdded) << c.what;
        Journal expected = c.head;
        expected.push_back({"set_default_deny", c.name});
        expected = concat(concat(expected, c.share), tail_for(c.name, c.quota_word));
        EXPECT_EQ(dev.journal(), expected) << c.what;
        EXPECT_EQ(logged(dev), c.events) << c.what;
    }
}

TEST(UserAdd, RefusesShellMetacharactersBeforeAnyTool)
{
    const Fields cases[] = {
        {{"name", "a`id`"}},
        {{"name", "dave"}, {"description", "x$(reboot)"}},
        {{"name", "dave"}, {"mail", "`"}},
    };
    for (const auto& fields : cases) {
        Device dev;
        EXPECT_EQ(dev.request("cgi_user_add", fields), kEmptyHtml);
        EXPECT_TRUE(dev.journal().empty());
        EXPECT_TRUE(logged(dev).empty());
        EXPECT_EQ(account_line(dev, "/etc/passwd", "dave"), "(none)");
    }
    Device dev;     // "$" or "(" alone pass
    EXPECT_EQ(dev.request("cgi_user_add", {{"name", "dave"}, {"description", "$5 (cheap)"}}), kAdded);
    EXPECT_EQ(account_field(dev, "/etc/passwd", "dave", 4), "$5 (cheap),,,,");
}

TEST(UserAdd, HomeShareFollowsTheVolumeTable)
{
    const struct {
        const char* what;
        std::string table;          // "(none)": no shared_name file
        std::string name;
        Journal share;
    } cases[] = {
        {"first slot line is Volume_2", "USB_1 = sdc1\nVolume_2 = HD_c2\nVolume_1 = HD_a2\n", "dave",
         {{"chk_share", "dave"}, {"add_share", "dave", "/mnt/HD/HD_b2/dave", "no", "yes", "0", "1", "0", "1"}}},
        {"no slot line: no share", "Volume_9 = HD_a2\n", "dave", {{"chk_share", "dave"}}},
        {"no table: no share", "(none)", "dave", {{"chk_share", "dave"}}},
        {"a share of that name exists (any case)", "Volume_1 = HD_a2\n", "public", {{"chk_share", "public"}}},
    };
    for (const auto& c : cases) {
        Device dev;
        set_volume_table(dev, c.table);
        EXPECT_EQ(dev.request("cgi_user_add", {{"name", c.name}}), kAdded) << c.what;
        Journal expected{{"sh", "-c", "account -a -u '" + c.name + "' -p '' -l '' -f '' -h '' -e ''"},
                         {"account", "-a", "-u", c.name, "-p", "", "-l", "", "-f", "", "-h", "", "-e", ""},
                         {"set_default_deny", c.name}};
        expected = concat(concat(expected, c.share), tail_for(c.name));
        EXPECT_EQ(dev.journal(), expected) << c.what;
    }
}

TEST(UserAdd, AnAccountToolFailureStillAnswersOk)
{
    Device dev;
    // alice exists: the tool refuses, the page still hears "ok" and the event is logged.
    const std::string before = dev.read_file("/etc/passwd");
    EXPECT_EQ(dev.request("cgi_user_add", {{"name", "alice"}, {"group", "nosuchgroup"}}), kAdded);
    EXPECT_EQ(dev.read_file("/etc/passwd"), before);
    EXPECT_EQ(logged(dev), (std::vector<std::string>{"SYSTEM: Account \"alice\" has been created."}));
}

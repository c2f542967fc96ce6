// Creating users: the account tool's line, the share and quota calls, the event, and
// the account files and home share that result.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "accounts_testing.h"

namespace {

const std::string kAdded = xml_answer("<adduser><status>ok</status></adduser>");

// The home share's calls: a public one, or (`private_share`) closed to all but its user.
Journal home_share(const std::string& name, const std::string& volume, bool private_share)
{
    Journal calls{{"chk_share", name}, {"add_share", name, "/mnt/HD/" + volume + "/" + name, "no", "yes", "0", "1", "0", "1"}};
    if (private_share)
        calls = concat({calls, {{"public_off_share", name}, {"insert_acnt_node", name, name, "2"}, {"acnt_mod_share", name, "0"}}});
    return calls;
}

// What every creation ends with; the quota line quotes the name as one shell word.
Journal tail_for(const std::string& name)
{
    std::string word = "'";
    for (const char ch : name)
        word += ch == '\'' ? std::string("'\\''") : std::string(1, ch);
    word += "'";
    return concat({{{"sh", "-c", "quota_set -u " + word + " -s 0 -a >/dev/null 2>&1"}, {"quota_set", "-u", name, "-s", "0", "-a"}},
                   reload_events(), {{"LIB_CP_Config_To_MTD", "4390950"}}});
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
              concat({{{"sh", "-c",
                        "account -a -u 'dave' -p 's3cret' -l 'family,office' -f 'Dave Doe' -h 'usual' -e 'dave@example.com'"},
                       {"account", "-a", "-u", "dave", "-p", "s3cret", "-l", "family,office", "-f", "Dave Doe", "-h",
                        "usual", "-e", "dave@example.com"},
                       {"set_default_deny", "dave"}},
                      home_share("dave", "HD_a2", true), tail_for("dave")}));
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
    EXPECT_EQ(dev.run({"/usr/bin/realpath", "-e", "/shares/dave"}).out, "/mnt/HD/HD_a2/dave\n");
}

TEST(UserAdd, ChoosesLinesAndHomeShareByDialogAndVolumeTable)
{
    const std::string plain_dave = "account -a -u 'dave' -p '' -l '' -f '' -h '' -e ''";
    const struct {
        const char* what;
        std::string table;          // kNone: no shared_name file; "": the image's
        Fields fields;
        std::vector<std::string> lines;     // the account lines before the default-deny call
        Journal share;
        bool logged;                        // "Account ... has been created."
        std::string name;
    } cases[] = {
        {"no password: an empty word, and the share stays public", "",
         {{"name", "eve"}, {"pw", base64("ignored")}, {"description", "E"}},
         {"account -a -u 'eve' -p '' -l '' -f 'E' -h '' -e ''"}, home_share("eve", "HD_a2", false), true,
         "eve"},
        {"the wizard's user starts without password, groups or hint", "",
         {{"type", "wizard"}, {"name", "eve"}, {"pw", base64("x")}, {"pw_onoff", "1"}, {"group", "family"},
          {"description", "E"}, {"mail", "e@x"}, {"pw_hit", "h"}},
         {"account -a -u 'eve' -p '' -l '' -f 'E' -h '' -e 'e@x'"}, home_share("eve", "HD_a2", true), true,
         "eve"},
        {"the wizard's administrator renames admin: no event, no home share", "",
         {{"type", "wizard"}, {"isAdmin", "1"}, {"name", "boss"}, {"description", "The Boss"}, {"mail", "b@x"}},
         {"account -u admin -n 'boss'", "account -m -u 'boss' -f 'The Boss' -e 'b@x'"}, {}, false, "boss"},
        {"a quote in a value stays one word", "", {{"name", "o'neil"}, {"description", "it's"}},
         {"account -a -u 'o'\\''neil' -p '' -l '' -f 'it'\\''s' -h '' -e ''"}, home_share("o'neil", "HD_a2", false),
         true, "o'neil"},
        {"the first slot line is Volume_2", "USB_1 = sdc1\nVolume_2 = HD_c2\nVolume_1 = HD_a2\n", {{"name", "dave"}},
         {plain_dave}, home_share("dave", "HD_b2", false), true, "dave"},
        {"no slot line: no share", "Volume_9 = HD_a2\n", {{"name", "dave"}}, {plain_dave}, {{"chk_share", "dave"}}, true,
         "dave"},
        {"no table: no share", kNone, {{"name", "dave"}}, {plain_dave}, {{"chk_share", "dave"}}, true, "dave"},
        {"a share of that name exists (any case)", "", {{"name", "public"}},
         {"account -a -u 'public' -p '' -l '' -f '' -h '' -e ''"}, {{"chk_share", "public"}}, true, "public"},
    };
    for (const auto& c : cases) {
        Device dev;
        if (!c.table.empty())
            set_volume_table(dev, c.table);
        EXPECT_EQ(dev.request("cgi_user_add", c.fields), kAdded) << c.what;
        Journal expected;
        for (const std::string& line : c.lines)
            expected = concat({expected, ran(line)});
        expected = concat({expected, {{"set_default_deny", c.name}}, c.share, tail_for(c.name)});
        EXPECT_EQ(dev.journal(), expected) << c.what;
        EXPECT_EQ(logged(dev), c.logged ? std::vector<std::string>{"SYSTEM: Account \"" + c.name + "\" has been created."}
                                        : std::vector<std::string>{})
            << c.what;
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
    }
    Device dev;     // "$" or "(" alone pass
    EXPECT_EQ(dev.request("cgi_user_add", {{"name", "dave"}, {"description", "$5 (cheap)"}}), kAdded);
    EXPECT_EQ(account_field(dev, "/etc/passwd", "dave", 4), "$5 (cheap),,,,");
}

TEST(UserAdd, AnAccountToolFailureStillAnswersOk)
{
    Device dev;     // alice exists: the tool refuses, the page still hears "ok" and the event is logged
    const std::string before = dev.read_file("/etc/passwd");
    EXPECT_EQ(dev.request("cgi_user_add", {{"name", "alice"}, {"group", "nosuchgroup"}}), kAdded);
    EXPECT_EQ(dev.read_file("/etc/passwd"), before);
    EXPECT_EQ(logged(dev), (std::vector<std::string>{"SYSTEM: Account \"alice\" has been created."}));
}

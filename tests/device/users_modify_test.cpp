// Changing one property of a user per request, the admin password, and the e-mail removal.
#include <gtest/gtest.h>

#include "accounts_testing.h"

namespace {

std::string status(int value)
{
    return xml_answer("<info><status>" + std::to_string(value) + "</status></info>\n");
}

Journal with_save(const Journal& journal)
{
    return concat({journal, {{"LIB_CP_Config_To_MTD", "4390950"}}});
}

} // namespace

TEST(ModifyAccount, ChangesOnePropertyByType)
{
    const struct { const char* what; Fields fields; Journal journal; } cases[] = {
        {"1: description", {{"mtype", "1"}, {"username", "alice"}, {"description", "Alice L."}, {"mail", "x"}},
         ran("account -m -u 'alice' -f 'Alice L.'")},
        {"2: e-mail", {{"mtype", "2"}, {"username", "alice"}, {"mail", "a@b.c"}}, ran("account -m -u 'alice' -e 'a@b.c'")},
        {"3x acts as 3: password with hint",
         {{"mtype", "3x"}, {"username", "alice"}, {"pw", base64("new pass")}, {"pw_hit", "h"}},
         ran("account -m -u 'alice' -p 'new pass' -h 'h'")},
        {"3: an unknown user changes nothing", {{"mtype", "3"}, {"username", "zed"}, {"pw", base64("x")}}, {}},
        {"4: group list, then the quota check against the primary group",
         {{"mtype", "4"}, {"username", "alice"}, {"group", "office"}},
         concat({ran("account -m -u 'alice' -l 'office'"), {{"LIB_Compare_User_and_Group_Quota", "alice", "allaccount"}}})},
        {"4: no quota check for an unknown user", {{"mtype", "4"}, {"username", "zed"}, {"group", "office"}},
         ran("account -m -u 'zed' -l 'office'")},
        {"5: limits on the internal volumes, empty means none",
         {{"mtype", "5"}, {"username", "alice"}, {"available1", "100MB"}, {"available3", "7"}},
         {{"LIB_Set_User_Quota", "HD_a2", "alice", "102400"}, {"LIB_Set_User_Quota", "HD_b2", "alice", "0"}}},
        {"8: expiry", {{"mtype", "8"}, {"username", "alice"}, {"expires_time", "2030-12-31"}},
         ran("account -m -u 'alice' -x '2030-12-31'")},
        {"9: a group list", {{"mtype", "9"}, {"username", "alice"}, {"group", "office,family"}},
         ran("account -m -u 'alice' -l 'office,family'")},
        {"9: no list leaves the administrators", {{"mtype", "9"}, {"username", "carol"}},
         concat({ran("gpasswd -d 'carol' administrators >/dev/null"), ran("usermod -g 1000 'carol' >/dev/null"),
                 ran("account")})},
        {"6 changes nothing", {{"mtype", "6"}, {"username", "alice"}, {"description", "x"}}, {}},
        {"no type changes nothing", {{"username", "alice"}, {"description", "x"}}, {}},
    };
    for (const auto& c : cases) {
        Device dev;
        set_volume_table(dev, kUsbBetween);
        EXPECT_EQ(dev.request("cgi_modify_account", c.fields), status(0)) << c.what;
        EXPECT_EQ(dev.journal(), with_save(c.journal)) << c.what;
    }
}

TEST(ModifyAccount, TheAccountFilesChange)
{
    Device dev;
    dev.request("cgi_modify_account", {{"mtype", "1"}, {"username", "alice"}, {"description", "Alice L."}});
    dev.request("cgi_modify_account", {{"mtype", "2"}, {"username", "alice"}, {"mail", "al@wonder.land"}});
    EXPECT_EQ(account_line(dev, "/etc/passwd", "alice"),
              "alice:x:1001:1000:Alice L.,,,,al@wonder.land:/shares/alice:/bin/sh");
    dev.request("cgi_modify_account", {{"mtype", "3"}, {"username", "alice"}, {"pw", base64("rabbit hole")}});
    EXPECT_TRUE(password_verifies(dev, "alice", "rabbit hole"));
    dev.request("cgi_modify_account", {{"mtype", "4"}, {"username", "alice"}, {"group", "office"}});
    EXPECT_EQ(account_line(dev, "/etc/group", "family"), "family:x:1004:bob");
    EXPECT_EQ(account_line(dev, "/etc/group", "office"), "office:x:1005:carol,alice");
    dev.request("cgi_modify_account", {{"mtype", "8"}, {"username", "alice"}, {"expires_time", "2030-12-31"}});
    EXPECT_EQ(account_field(dev, "/etc/shadow", "alice", 7), "22279");
    dev.request("cgi_remove_email", {{"username", "alice"}});
    EXPECT_EQ(account_line(dev, "/etc/passwd", "alice"), "alice:x:1001:1000:Alice L.,,,,:/shares/alice:/bin/sh");
    dev.request("cgi_modify_account", {{"mtype", "4"}, {"username", "carol"}, {"group", "administrators"}});
    dev.request("cgi_modify_account", {{"mtype", "9"}, {"username", "carol"}});
    EXPECT_EQ(account_line(dev, "/etc/passwd", "carol"), "carol:x:1003:1000:Carol,,,,:/shares/carol:/bin/sh");
    EXPECT_EQ(account_line(dev, "/etc/group", "administrators"), "administrators:x:1001:admin");
}

TEST(ModifyAccount, RenamesOnlyFromAnExistingUserAndFollowsUpOnSuccess)
{
    const struct { const char* what; std::string old_name, name; Journal journal; } cases[] = {
        {"renamed: the follow-ups run", "alice", "alicia",
         concat({ran("account -u 'alice' -n 'alicia'"),
                 {{"isoMount_user_rename", "alice", "alicia"}, {"change_user_group_name", "alice", "alicia"},
                  {"LIB_FTP_Change_User_Group", "0", "alice", "alicia"}, {"sh", "-c", "makedav start  > /dev/null 2>&1 &"}},
                 ran("afpcom >/dev/null 2>&1")})},
        {"the tool refuses the new name: it does not resolve, no follow-up", "alice", "al;ice",
         ran("account -u 'alice' -n 'al;ice'")},
        {"no such old name: nothing runs", "zed", "zoe", {}},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.write_file("/var/lib/platform/quota", "u\tHD_a2\talice\t1024\n");
        EXPECT_EQ(dev.request("cgi_modify_account", {{"mtype", "7"}, {"oldName", c.old_name}, {"username", c.name}}),
                  status(0)) << c.what;
        EXPECT_EQ(without(dev.journal(), {"makedav"}), with_save(c.journal)) << c.what;
        if (c.name != "alicia")
            continue;
        EXPECT_EQ(account_line(dev, "/etc/passwd", "alicia"),
                  "alicia:x:1001:1000:Alice Liddell,,,,alice@example.com:/shares/alice:/bin/sh");
        EXPECT_EQ(account_line(dev, "/etc/group", "family"), "family:x:1004:alicia,bob");
        EXPECT_TRUE(password_verifies(dev, "alicia", "wonderland"));
        EXPECT_EQ(dev.read_file("/var/lib/platform/quota"), "u\tHD_a2\talicia\t1024\n");   // limits follow the id
    }
}

TEST(AdminPassword, ChangesOnlyWithTheOldPassword)
{
    // The new password's base64 text holds a "+", which the form transport may turn into a blank.
    const std::string new_password = "n3w>>>pass", sent = base64(new_password);
    std::string blanked = sent;
    std::replace(blanked.begin(), blanked.end(), '+', ' ');
    ASSERT_NE(blanked, sent);
    // boss, a member of administrators, has the case's hash; "$2$" is the SHA-1 block route.
    const std::string sha1_block = "$2$8cd71d4ef7af97c0133d5d8e27b1628772a0031f";
    const struct { const char* what; std::string user, hash, old_password, pw; bool changed; } cases[] = {
        {"right old password", "admin", "", "admin", sent, true},
        {"a + that arrived as a blank", "admin", "", "admin", blanked, true},
        {"wrong old password", "admin", "", "Admin", sent, false},
        {"empty old password", "admin", "", "", sent, false},
        {"$2$ route, first three characters do not count", "boss", sha1_block, "abcpassword-tail", sent, true},
        {"$2$ route, wrong password", "boss", sha1_block, "abcpassword-tale", sent, false},
        {"empty hash takes only the empty password", "boss", "", "", sent, true},
        {"empty hash refuses a password", "boss", "", "x", sent, false},
        {"locked hash refuses everything", "boss", "!", "", sent, false},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.write_file("/etc/passwd", dev.read_file("/etc/passwd") + "boss:x:1010:1001:,,,,:/shares/boss:/bin/sh\n");
        dev.write_file("/etc/shadow", dev.read_file("/etc/shadow") + "boss:" + c.hash + ":20000:0:99999:7:::\n");
        EXPECT_EQ(dev.request("cgi_modify_account", {{"mtype", "3"}, {"username", c.user}, {"old_pw", base64(c.old_password)},
                                                     {"pw", c.pw}, {"pw_hit", "never used"}}),
                  status(c.changed ? 0 : -1))
            << c.what;
        const Journal changed = concat({ran("account -m -u '" + c.user + "' -p '" + new_password + "'"),
                                        ran("snmp_tool -t 1 >/dev/null 2>&1"), {{"LIB_CP_Config_To_MTD", "196644"}}});
        EXPECT_EQ(dev.journal(), with_save(c.changed ? changed : Journal{})) << c.what;
        // Only user id 500's change is an event.
        EXPECT_EQ(logged(dev), c.changed && c.user == "admin" ? std::vector<std::string>{"SYSTEM: Admin password has been modified."}
                                                                : std::vector<std::string>{})
            << c.what;
        EXPECT_EQ(password_verifies(dev, c.user, new_password), c.changed) << c.what;
    }
}

TEST(RemoveEmail, EmptiesTheOtherField)
{
    Device dev;
    EXPECT_EQ(dev.request("cgi_remove_email", {{"username", "bob"}}), kEmptyHtml);
    EXPECT_EQ(dev.journal(),
              concat({ran("chfn -o \"\" 'bob'"), ran("account >/dev/null"), {{"LIB_CP_Config_To_MTD", "4"}}}));
    EXPECT_EQ(account_line(dev, "/etc/passwd", "bob"), "bob:x:1002:1000:Bob Builder,,,,:/shares/bob:/bin/sh");
}

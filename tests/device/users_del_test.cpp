// Deleting users: per name its tool line, event, quota and FTP calls, and the group
// clean-up that always names the first user of the list.
#include <gtest/gtest.h>

#include "accounts_testing.h"

namespace {

Journal deletion_of(const std::string& name, const std::string& first)
{
    return concat({ran("account -d -u '" + name + "'"), per_volume({"LIB_Set_User_Quota", "{}", name, "0"}, 4),
                   {{"LIB_FTP_Del_User", name}, {"delete_user_group_name", first}}});
}

Journal around(const Journal& deletions)
{
    return concat({{{"LIB_WEB_STOP_FTP"}}, deletions, {{"LIB_WEB_START_FTP"}}, reload_events(),
                   {{"LIB_CP_Config_To_MTD", "4390950"}, {"sh", "-c", "makedav start > /dev/null 2>&1 &"}}});
}

std::string deleted(const std::string& name)
{
    return "SYSTEM: Account \"" + name + "\" has been deleted.";
}

} // namespace

TEST(UserDel, DeletesEachListedUser)
{
    const Journal alice_bob = concat({deletion_of("alice", "alice"), deletion_of("bob", "alice")});
    const struct { const char* what; std::string names; Journal journal; std::vector<std::string> events; } cases[] = {
        {"two users: the clean-up names alice twice", "alice,bob", around(alice_bob), {deleted("alice"), deleted("bob")}},
        {"a run of commas is one separator", "alice,,bob,", around(alice_bob), {deleted("alice"), deleted("bob")}},
        {"a leading comma stays at the buffer's start", ",alice", around(deletion_of("alice", ",alice")),
         {deleted("alice")}},
        {"an unknown name still gets its event and calls", "nobody2", around(deletion_of("nobody2", "nobody2")),
         {deleted("nobody2")}},
        {"nothing to delete", "", around({}), {}},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.write_file("/var/lib/platform/quota", "u\tHD_a2\talice\t1024\nu\tHD_a2\tcarol\t2048\n");
        EXPECT_EQ(dev.request("cgi_user_del", {{"name", c.names}}), kEmptyHtml) << c.what;
        EXPECT_EQ(without(dev.journal(), {"makedav"}), c.journal) << c.what;
        EXPECT_EQ(logged(dev), c.events) << c.what;
        if (c.names != "alice,bob")
            continue;
        EXPECT_EQ(account_line(dev, "/etc/passwd", "alice"), "(none)");
        EXPECT_EQ(account_line(dev, "/etc/shadow", "bob"), "(none)");
        EXPECT_EQ(account_line(dev, "/etc/group", "allaccount"), "allaccount:x:1000:admin,carol");
        EXPECT_EQ(account_line(dev, "/etc/group", "family"), "family:x:1004:");
        EXPECT_EQ(dev.read_file("/var/lib/platform/quota"), "u\tHD_a2\tcarol\t2048\n");
    }
}

TEST(UserDel, AQuoteStaysInsideItsWord)
{
    Device dev;
    dev.request("cgi_user_del", {{"name", "o'neil,bob"}});
    const auto lines = shell_lines(dev.journal());
    ASSERT_GE(lines.size(), 2u);
    EXPECT_EQ(lines[0], "account -d -u 'o'\\''neil'");
    EXPECT_EQ(lines[1], "account -d -u 'bob'");
    EXPECT_EQ(account_line(dev, "/etc/passwd", "bob"), "(none)");
}

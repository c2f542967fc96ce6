// Deleting users: per name its tool line, event, quota and FTP calls, and the group
// clean-up that always names the first user of the list.
#include <gtest/gtest.h>

#include "accounts_testing.h"

namespace {

Journal deletion_of(const std::string& name, const std::string& first)
{
    return {{"sh", "-c", "account -d -u '" + name + "'"},
            {"account", "-d", "-u", name},
            {"LIB_Set_User_Quota", "HD_a2", name, "0"},
            {"LIB_Set_User_Quota", "HD_b2", name, "0"},
            {"LIB_Set_User_Quota", "HD_c2", name, "0"},
            {"LIB_Set_User_Quota", "HD_d2", name, "0"},
            {"LIB_FTP_Del_User", name},
            {"delete_user_group_name", first}};
}

Journal around(const std::vector<Journal>& deletions)
{
    Journal journal{{"LIB_WEB_STOP_FTP"}};
    for (const Journal& part : deletions)
        journal.insert(journal.end(), part.begin(), part.end());
    const Journal tail{{"LIB_WEB_START_FTP"},
                       {"sh", "-c", "smbcom >/dev/null 2>&1"}, {"smbcom"},
                       {"sh", "-c", "afpcom >/dev/null 2>&1"}, {"afpcom"},
                       {"LIB_CP_Config_To_MTD", "4390950"},
                       {"sh", "-c", "makedav start > /dev/null 2>&1 &"}};
    journal.insert(journal.end(), tail.begin(), tail.end());
    return journal;
}

} // namespace

TEST(UserDel, DeletesEachListedUser)
{
    const struct {
        const char* what;
        std::string names;
        Journal journal;
        std::vector<std::string> events;
    } cases[] = {
        {"two users: the clean-up names alice twice", "alice,bob",
         around({deletion_of("alice", "alice"), deletion_of("bob", "alice")}),
         {"SYSTEM: Account \"alice\" has been deleted.", "SYSTEM: Account \"bob\" has been deleted."}},
        {"a run of commas is one separator", "alice,,bob,",
         around({deletion_of("alice", "alice"), deletion_of("bob", "alice")}),
         {"SYSTEM: Account \"alice\" has been deleted.", "SYSTEM: Account \"bob\" has been deleted."}},
        {"a leading comma stays at the buffer's start", ",alice",
         around({deletion_of("alice", ",alice")}), {"SYSTEM: Account \"alice\" has been deleted."}},
        {"an unknown name still gets its event and calls", "nobody2",
         around({deletion_of("nobody2", "nobody2")}), {"SYSTEM: Account \"nobody2\" has been deleted."}},
        {"nothing to delete", "", around({}), {}},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.write_file("/var/lib/platform/quota", "u\tHD_a2\talice\t1024\nu\tHD_a2\tcarol\t2048\n");
        EXPECT_EQ(dev.request("cgi_user_del", {{"name", c.names}}), kEmptyHtml) << c.what;
        EXPECT_EQ(without(dev.journal(), {"makedav"}), c.journal) << c.what;
        EXPECT_EQ(logged(dev), c.events) << c.what;
    }
}

TEST(UserDel, RemovesTheAccountsFromTheDevice)
{
    Device dev;
    dev.write_file("/var/lib/platform/quota", "u\tHD_a2\talice\t1024\nu\tHD_a2\tcarol\t2048\n");
    dev.request("cgi_user_del", {{"name", "alice,bob"}});
    EXPECT_EQ(account_line(dev, "/etc/passwd", "alice"), "(none)");
    EXPECT_EQ(account_line(dev, "/etc/shadow", "bob"), "(none)");
    EXPECT_EQ(account_line(dev, "/etc/group", "allaccount"), "allaccount:x:1000:admin,carol");
    EXPECT_EQ(account_line(dev, "/etc/group", "family"), "family:x:1004:");
    EXPECT_EQ(dev.read_file("/var/lib/platform/quota"), "u\tHD_a2\tcarol\t2048\n");
}

TEST(UserDel, AQuoteBreaksOnlyItsOwnLine)
{
    Device dev;
    dev.request("cgi_user_del", {{"name", "o'neil,bob"}});
    const auto lines = shell_lines(dev.journal());
    ASSERT_GE(lines.size(), 2u);
    EXPECT_EQ(lines[0], "account -d -u 'o'neil'");
    EXPECT_EQ(lines[1], "account -d -u 'bob'");
    EXPECT_EQ(account_line(dev, "/etc/passwd", "bob"), "(none)");
}

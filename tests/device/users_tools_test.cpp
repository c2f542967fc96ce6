// The simulated account tools as the device's programs use them: what they change in
// the account files and the stores, and what they print.
#include <gtest/gtest.h>

#include "accounts_testing.h"

TEST(AccountTool, RefusesWithoutChangingAnything)
{
    const std::vector<std::string> cases[] = {
        {"account", "-a", "-u", "alice"},                             // the name is in use
        {"account", "-a", "-u", "bad%name"},                          // no "%" in names
        {"account", "-a", "-u", "dave", "-l", "nosuch"},              // unknown group
        {"account", "-a", "-u", "dave", "-f", "Doe, John"},           // a GECOS separator
        {"account", "-m", "-u", "zed", "-f", "x"},                    // unknown user
        {"account", "-m", "-u", "alice", "-x", "31.12.2030"},          // not a day
        {"account", "-a", "-g", "team", "-l", "alice,zed"},           // unknown member
        {"account", "-g", "family", "-o", "office"},                  // the new name is in use
        {"account", "-d", "-g", "ghost"},
        {"account", "-q"},
    };
    for (const auto& argv : cases) {
        Device dev;
        const std::string passwd = dev.read_file("/etc/passwd"), group = dev.read_file("/etc/group"),
                          shadow = dev.read_file("/etc/shadow");
        EXPECT_NE(dev.run(argv).status, 0) << argv[2];
        EXPECT_EQ(dev.read_file("/etc/passwd"), passwd) << argv[2];
        EXPECT_EQ(dev.read_file("/etc/group"), group) << argv[2];
        EXPECT_EQ(dev.read_file("/etc/shadow"), shadow) << argv[2];
    }
}

TEST(AccountTool, ChangesUsersAndGroups)
{
    Device dev;
    EXPECT_EQ(dev.run({"account", "-a", "-u", "dave", "-p", "pw", "-l", "family", "-f", "D", "-h", "hint", "-e", "d@x"}).status, 0);
    EXPECT_EQ(dev.run({"account", "-m", "-u", "dave", "-p", "", "-h", ""}).status, 0);
    EXPECT_EQ(account_field(dev, "/etc/shadow", "dave", 1), "");         // no password
    EXPECT_EQ(dev.read_file("/var/lib/platform/hints"), "");
    EXPECT_EQ(dev.run({"account", "-m", "-u", "dave", "-x", "1970/01/11"}).status, 0);
    EXPECT_EQ(account_field(dev, "/etc/shadow", "dave", 7), "10");
    EXPECT_EQ(dev.run({"account", "-a", "-g", "team", "-l", "dave,,alice"}).status, 0);
    EXPECT_EQ(account_line(dev, "/etc/group", "team"), "team:x:1006:dave,alice");
    EXPECT_EQ(dev.run({"account", "-d", "-u", "dave"}).status, 0);
    EXPECT_EQ(account_line(dev, "/etc/group", "team"), "team:x:1006:alice");
    EXPECT_EQ(account_line(dev, "/etc/group", "family"), "family:x:1004:alice,bob");
    EXPECT_EQ(dev.run({"account"}).status, 0);
    EXPECT_EQ(dev.journal().back(), (Event{"account"}));
}

TEST(PasswdTools, ChangeTheFilesAsTheRealToolsDo)
{
    Device dev;
    const Reply removed = dev.run({"gpasswd", "-d", "alice", "family"});
    EXPECT_EQ(removed.out, "Removing user alice from group family\n");
    EXPECT_EQ(account_line(dev, "/etc/group", "family"), "family:x:1004:bob");
    EXPECT_EQ(dev.run({"gpasswd", "-d", "alice", "family"}).status, 3);     // no longer a member
    EXPECT_EQ(dev.run({"usermod", "-g", "office", "alice"}).status, 0);
    EXPECT_EQ(account_field(dev, "/etc/passwd", "alice", 3), "1005");
    EXPECT_EQ(dev.run({"usermod", "-g", "nosuch", "bob"}).status, 6);
    EXPECT_EQ(dev.run({"chfn", "-o", "new@x", "carol"}).status, 0);
    EXPECT_EQ(account_line(dev, "/etc/passwd", "carol"), "carol:x:1003:1000:Carol,,,,new@x:/shares/carol:/bin/sh");
}

TEST(QuotaSetTool, SetsEveryInternalVolumeAndReadsBackThroughTheLibrary)
{
    Device dev;
    set_volume_table(dev, kUsbBetween);
    EXPECT_EQ(dev.run({"quota_set", "-g", "family", "-s", "3", "-a"}).status, 0);
    EXPECT_EQ(dev.read_file("/var/lib/platform/quota"), "g\tHD_a2\tfamily\t3072\ng\tHD_b2\tfamily\t3072\n");
    EXPECT_EQ(dev.run({"quota_set", "-g", "family", "-s", "0", "-a"}).status, 0);
    EXPECT_EQ(dev.read_file("/var/lib/platform/quota"), "");
}

TEST(WbinfoTool, ReportsTheTrustInTheRealToolsWords)
{
    const std::string no_winbind = "failed to call wbcCheckTrustCredentials: WBC_ERR_WINBIND_NOT_AVAILABLE\nCould not check secret\n";
    const struct {
        std::string trust;      // "(no domain)": no domain file
        std::string out;
        int status;
    } cases[] = {
        {"good", "checking the trust secret for domain EXAMPLE via RPC calls succeeded\n", 0},
        {"failed",
         "checking the trust secret for domain EXAMPLE via RPC calls failed\n"
         "failed to call wbcCheckTrustCredentials: WBC_ERR_AUTH_ERROR\nCould not check secret\n", 1},
        {"unreachable", no_winbind, 1},
        {"(no domain)", no_winbind, 1},
    };
    for (const auto& c : cases) {
        Device dev;
        if (c.trust == "(no domain)")
            dev.remove("/sim/domain.conf");
        else
            dev.write_file("/sim/domain.conf", "workgroup=EXAMPLE\ntrust=" + c.trust + "\nusers=a,b\n");
        const Reply reply = dev.run({"wbinfo", "-t"});
        EXPECT_EQ(reply.out, c.out) << c.trust;
        EXPECT_EQ(reply.status, c.status) << c.trust;
    }
    Device dev;
    EXPECT_EQ(dev.run({"wbinfo", "-u"}).out,
              "Administrator\nGuest\nkrbtgt\njdoe\nmsmith\nNASDEVICE+admin\nnasdevice+guest\n");
}

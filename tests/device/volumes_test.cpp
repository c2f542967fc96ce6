// The volume table and the small helpers, run inside a device by a probe.
#include <gtest/gtest.h>

#include "device.h"

namespace {

std::string probe(Device& dev, const std::vector<std::string>& args)
{
    std::vector<std::string> argv{"/sbin/shared_probe"};
    argv.insert(argv.end(), args.begin(), args.end());
    return dev.run(argv).out;
}

} // namespace

TEST(VolumeTable, ResolvesNamesCountsAndSizes)
{
    const std::string two = "Volume_1 = HD_a2\nVolume_2 = HD_b2\n";
    const struct {
        const char* what;
        std::string table;       // "(none)": no shared_name file
        std::string source;
        std::string mode;
        std::string resolved, count, sizes;
    } cases[] = {
        {"path below a volume", two, "Volume_2/docs", "1", "[/mnt/HD/HD_b2/docs]", "2", "[1877538,937795]"},
        {"a volume alone", "Volume_3 = HD_c2\n", "Volume_3", "1", "[/mnt/HD/HD_c2]", "1", "[0]"},
        {"mode 0 gives the name column", two, "Volume_1/x", "0", "[Volume_1/x]", "2", "[1877538,937795]"},
        {"unknown volume", two, "Volume_9/x", "1", "[null]", "2", "[1877538,937795]"},
        {"substring match, first line wins", "Volume_10 = HD_b2\nVolume_1 = HD_a2\n", "Volume_1", "1",
         "[/mnt/HD/HD_b2]", "2", "[937795,1877538]"},
        {"last line without newline loses a character", "Volume_1 = HD_a2", "Volume_1", "1", "[/mnt/HD/HD_a]",
         "1", "[0]"},
        {"empty table", "", "Volume_1", "1", "[null]", "0", "[]"},
        {"no table", "(none)", "Volume_1", "1", "open file error \n[(untouched)]", "0", "[null,null,null,null]"},
        {"a USB line is sized only with HD_", "Volume_1 = HD_a2\nUSB_1 = sdc1\n", "USB_1", "1", "[/mnt/HD/sdc1]",
         "1", "[1877538]"},
        {"a long line comes in pieces", "Volume_1 = HD_a2\n" + std::string(600, 'x') + "\n", "xxxx", "1",
         "[/mnt/HD/]", "1", "[1877538]"},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.install_probe("shared_probe");
        if (c.table == "(none)")
            dev.remove("/etc/shared_name");
        else
            dev.write_file("/etc/shared_name", c.table);
        EXPECT_EQ(probe(dev, {"resolve", c.source, c.mode}), c.resolved) << c.what;
        EXPECT_EQ(probe(dev, {"count"}), c.count) << c.what;
        EXPECT_EQ(probe(dev, {"sizes"}), c.sizes) << c.what;
    }
}

TEST(VolumeTable, AsksTheDiskLibraryPerHardDiskLine)
{
    Device dev;
    dev.install_probe("shared_probe");
    probe(dev, {"sizes"});
    EXPECT_EQ(dev.journal(), (Journal{{"LIB_Get_Disk_Size", "/mnt/HD/HD_a2"}, {"LIB_Get_Disk_Size", "/mnt/HD/HD_b2"}}));
}

TEST(ReservedAccounts, AreNeverCounted)
{
    Device dev;
    dev.install_probe("shared_probe");
    // The default device: three ordinary users beside the reserved ones.
    EXPECT_EQ(probe(dev, {"users"}), "3");
    EXPECT_EQ(probe(dev, {"groups"}), "2");

    dev.write_file("/etc/passwd",
                   "root:x:0:0::/:/bin/sh\nAdmin:x:1001:1000::/:/bin/sh\nshare:x:1002:1000::/:/bin/sh\n"
                   "admin:x:500:1001::/:/bin/sh\nsqueezecenter:x:505:1000::/:/bin/false\n");
    dev.write_file("/etc/group", "share:x:1003:\nShare:x:1004:\nnetdev:x:1002:\nadministrators:x:1001:\n");
    EXPECT_EQ(probe(dev, {"users"}), "2");    // "Admin" and "share" are ordinary users
    EXPECT_EQ(probe(dev, {"groups"}), "1");   // only "Share"

    dev.remove("/etc/passwd");
    EXPECT_EQ(probe(dev, {"users"}), "0");
}

TEST(SmallHelpers, RefuseMetacharactersDecodeAndEscape)
{
    Device dev;
    dev.install_probe("shared_probe");
    const struct {
        std::vector<std::string> args;
        std::string printed;
    } cases[] = {
        {{"metachars", "plain $ and ( alone"}, "|0"},
        {{"metachars", "a`b"}, "Content-Type: text/html\r\n\r\n|1"},
        {{"metachars", "x$(id)"}, "Content-Type: text/html\r\n\r\n|1"},
        {{"metachars", "$ (id)"}, "|0"},
        {{"base64", "c2VjcmV0", "15"}, std::string("secret") + std::string(10, '\0')},
        // Never more than the given size, and no terminator of its own.
        {{"base64", "c2VjcmV0", "3"}, std::string("sec") + std::string(13, '\0')},
        {{"base64", "!!!!", "15"}, std::string(16, '\0')},
        {{"element", "realm", "a&b<c>\"d\""}, "<realm>a&amp;b&lt;c&gt;&quot;d&quot;</realm>"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(probe(dev, c.args), c.printed) << c.args[0] << " " << c.args[1];
}

TEST(Trace, WritesToTheConsoleOnlyWhileSwitchedOnAndCutsLongLines)
{
    Device dev;
    dev.install_probe("shared_probe");
    probe(dev, {"trace", "10"});
    EXPECT_EQ(dev.console(), "");

    dev.trace_on();
    probe(dev, {"trace", "10"});
    EXPECT_EQ(dev.console(), std::string(10, 'x') + "|");
    dev.clear_records();
    probe(dev, {"trace", "5000"});
    EXPECT_EQ(dev.console(), std::string(2559, 'x'));
}

TEST(EventLog, WritesAccountEventsAsSystemInformation)
{
    Device dev;
    dev.install_probe("shared_probe");
    probe(dev, {"event", "bob \"the\" builder"});
    EXPECT_EQ(dev.messages(), (std::vector<std::string>{"<14>SYSTEM: Account \"bob \"the\" builder\" has been created.",
                                                         "<14>SYSTEM: Admin password has been modified."}));
}

TEST(ShellRunner, AnEscapedArgumentReachesTheToolAsOneWord)
{
    Device dev;
    dev.install_probe("shared_probe");
    probe(dev, {"shell", "it's a \"word\"; rm -rf / $(id)"});
    EXPECT_EQ(dev.journal(), (Journal{{"sh", "-c", "account -m -u 'it'\\''s a \"word\"; rm -rf / $(id)'"},
                                      {"account", "-m", "-u", "it's a \"word\"; rm -rf / $(id)"}}));
}

// The exports file engine inside a device, run through the engine probe: the line
// formatter, "/etc/exports" with its one host per folder, the per-volume copies, USB
// folders, ISO folders on every volume, and the default ACLs set only once.
#include <gtest/gtest.h>

#include "device.h"

namespace {

const std::string kPublic = "/mnt/HD/HD_a2/Public";
const std::string kBackup = "/mnt/HD/HD_b2/Backup";
const std::string kHdMounts = "/dev/sda4 /mnt/HD/HD_a2 ext4 rw,noatime 0 0\n/dev/sdb4 /mnt/HD/HD_b2 ext4 rw,noatime 0 0\n";
const std::string kVfatMount = "/dev/sdc1 /mnt/USB/USB1_c1 vfat rw 0 0\n";

std::string rule(const std::string& folder, const std::string& host, const std::string& access = "rw",
                 const std::string& ids = "501,anongid=1000")
{
    return "\"" + folder + "\" " + host + "(" + access +
           ",all_squash,sync,no_wdelay,insecure_locks,insecure,no_subtree_check,anonuid=" + ids + ")\n";
}

std::string probe(Device& dev, const std::vector<std::string>& args)
{
    std::vector<std::string> argv{"/sbin/nfs_probe"};
    argv.insert(argv.end(), args.begin(), args.end());
    return dev.run(argv).out;
}

// A device with the probe and the "/nfs" root the share-link lines resolve through.
void prepare(Device& dev)
{
    dev.install_probe("nfs_probe");
    dev.symlink("/shares", "/nfs");
}

Event sh(const std::string& line) { return {"sh", "-c", line}; }

// What a folder's first rule in "/etc/exports" runs: the "/nfs" link, the ACL test,
// and, without default entries, the background setfacl (left out by without()).
Journal first_rule_follow_up(const std::string& folder, bool acl_set)
{
    Journal journal{sh("rm -rf /nfs ; ln -s /shares /nfs"), sh("getfacl -p '" + folder + "' 2>/dev/null"),
                    {"getfacl", "-p", folder}};
    if (acl_set)
        journal.push_back(sh("setfacl -m d:u::rwx,d:o::rwx,d:g::rwx '" + folder + "' > /dev/null 2>&1 &"));
    return journal;
}

std::string volume_copy(Device& dev, const std::string& volume, const std::string& item = "exports")
{
    const std::string path = volume + "/.systemfile/" + item;
    return dev.exists(path) ? dev.read_file(path) : "(none)";
}

} // namespace

TEST(ExportsFormat, ChoosesFolderTextIdsAndHost)
{
    const struct {
        const char* what;
        std::string mtab_extra;
        std::vector<std::string> args;   // folder, host, rw, root_squash, hidden
        std::string line;
    } cases[] = {
        {"share link, read-write", "", {kPublic, "10.0.0.1", "1", "1", "0"}, rule("/nfs/Public", "10.0.0.1")},
        {"only bit 0 gives rw", "", {kPublic, "h", "2", "1", "0"}, rule("/nfs/Public", "h", "ro")},
        {"odd numbers are rw", "", {kPublic, "h", "3", "0", "0"}, rule("/nfs/Public", "h")},
        {"a trailing slash still finds the link", "", {kPublic + "/", "h", "1", "1", "0"}, rule("/nfs/Public", "h")},
        {"empty host", "", {kPublic, "", "1", "1", "0"}, rule("/nfs/Public", "*")},
        {"no host", "", {kPublic, "(none)", "1", "1", "0"}, rule("/nfs/Public", "*")},
        {"(NULL) host", "", {kPublic, "(null)", "1", "1", "0"}, rule("/nfs/Public", "*")},
        {"blank (NULL) host", "", {kPublic, " (NULL)", "1", "1", "0"}, rule("/nfs/Public", "*")},
        {"no share link: no line", "", {"/mnt/HD/HD_a2/Other", "h", "1", "1", "0"}, ""},
        {"per-volume copy: below the volume", "", {kPublic, "h", "0", "0", "1"}, rule("/Public", "h", "ro")},
        {"ISO copy: below /mnt/isoMount", "", {"/mnt/isoMount/img/x", "h", "1", "1", "1"}, rule("/img/x", "h")},
        {"USB without link and vfat", "", {"/mnt/USB/USB1_c1/a", "h", "1", "1", "0"},
         rule("/mnt/USB/USB1_c1/a", "h", "rw", "0,anongid=0")},
        {"USB with a vfat mount", kVfatMount, {"/mnt/USB/USB1_c1/a", "h", "1", "1", "0"},
         rule("/mnt/USB/USB1_c1/a", "h", "rw", "500,anongid=1000")},
        {"no mount table: no vfat", "(none)", {"/mnt/USB/USB1_c1/a", "h", "1", "1", "0"},
         rule("/mnt/USB/USB1_c1/a", "h", "rw", "0,anongid=0")},
        {"USB behind a share link", kVfatMount, {"/mnt/USB/USB1_c1/linked", "h", "0", "1", "0"},
         rule("/nfs/usbshare", "h", "ro", "500,anongid=1000")},
        {"USB copy ignores the link; any vfat mount counts", "/dev/sdd1 /media/card vfat rw 0 0\n",
         {"/mnt/USB/USB1_c1/linked", "h", "1", "1", "1"},
         rule("/mnt/USB/USB1_c1/linked", "h", "rw", "500,anongid=1000")},
    };
    for (const auto& c : cases) {
        Device dev;
        prepare(dev);
        if (c.mtab_extra == "(none)")
            dev.remove("/etc/mtab");
        else
            dev.write_file("/etc/mtab", kHdMounts + c.mtab_extra);
        dev.write_file("/mnt/USB/USB1_c1/a/.keep", "");
        dev.write_file("/mnt/USB/USB1_c1/linked/.keep", "");
        dev.symlink("/mnt/USB/USB1_c1/linked", "/shares/usbshare");
        dev.write_file("/shares/not-a-link", "the link search passes over files");
        dev.symlink("/nowhere", "/shares/dangling");
        std::vector<std::string> args{"format"};
        args.insert(args.end(), c.args.begin(), c.args.end());
        EXPECT_EQ(probe(dev, args), "[" + c.line + "]") << c.what;
    }
}

TEST(SystemExports, KeepsOneHostPerFolder)
{
    Device dev;
    prepare(dev);
    // The first rule of the folder: appended to the empty file, then the follow-up.
    EXPECT_EQ(probe(dev, {"add", kPublic, "10.0.0.1", "1", "1"}), "0");
    EXPECT_EQ(dev.read_file("/etc/exports"), rule("/nfs/Public", "10.0.0.1"));
    EXPECT_EQ(without(dev.journal(), {"setfacl"}), first_rule_follow_up(kPublic, true));
    EXPECT_EQ(dev.read_file("/var/lib/platform/acl"), kPublic + "\tdefault:user::rwx,default:other::rwx,default:group::rwx\n");

    // A second host replaces the first; the other folder's rule stays. The ACLs are
    // already there, so no setfacl runs.
    dev.clear_records();
    EXPECT_EQ(probe(dev, {"add", kBackup, "*", "0", "1"}), "0");
    EXPECT_EQ(probe(dev, {"add", kPublic, "10.0.0.2", "0", "0"}), "0");
    EXPECT_EQ(dev.read_file("/etc/exports"), rule("/nfs/Backup", "*", "ro") + rule("/nfs/Public", "10.0.0.2", "ro"));
    Journal expected = first_rule_follow_up(kBackup, true);
    const Journal again = first_rule_follow_up(kPublic, false);
    expected.insert(expected.end(), again.begin(), again.end());
    EXPECT_EQ(without(dev.journal(), {"setfacl"}), expected);

    // The same host again takes the found branch: new access, no follow-up.
    dev.clear_records();
    EXPECT_EQ(probe(dev, {"add", kPublic, "10.0.0.2", "1", "1"}), "0");
    EXPECT_EQ(dev.read_file("/etc/exports"), rule("/nfs/Backup", "*", "ro") + rule("/nfs/Public", "10.0.0.2"));
    EXPECT_TRUE(dev.journal().empty());

    // Deleting the host removes the folder's rule; deleting it again rewrites the
    // file and fails.
    EXPECT_EQ(probe(dev, {"delete", kPublic, "10.0.0.2"}), "0");
    EXPECT_EQ(dev.read_file("/etc/exports"), rule("/nfs/Backup", "*", "ro"));
    EXPECT_EQ(probe(dev, {"delete", kPublic, "10.0.0.2"}), "-1");
    EXPECT_EQ(dev.read_file("/etc/exports"), rule("/nfs/Backup", "*", "ro"));
    EXPECT_TRUE(dev.journal().empty());
}

TEST(SystemExports, RewriteDropsWhatItCannotWriteBack)
{
    const struct {
        const char* what;
        std::string before;
        std::string op_result;
        std::string after;
    } cases[] = {
        {"delete from an empty file writes nothing", "", "0", ""},
        {"deleting one host removes the folder's others", rule("/nfs/Public", "a") + rule("/nfs/Public", "b"), "0", ""},
        {"lines without quotes and (NULL) hosts are dropped",
         "/nfs/Backup h(rw)\n\"/nfs/Backup\" (NULL)(rw,x)\n" + rule("/nfs/Backup", "h"), "-1", rule("/nfs/Backup", "h")},
        {"a folder no link points at disappears", rule("/mnt/HD/HD_a2/gone", "h") + rule("/nfs/Backup", "h"), "-1",
         rule("/nfs/Backup", "h")},
        {"the canonical path in the file becomes the link form", rule(kBackup, "h", "ro"), "-1", rule("/nfs/Backup", "h", "ro")},
        {"a USB folder without link stays in the path form", rule("/mnt/USB/USB1_c1/a", "h", "rw", "0,anongid=0"), "-1",
         rule("/mnt/USB/USB1_c1/a", "h", "rw", "0,anongid=0")},
        {"a last line without newline is lost", rule("/nfs/Backup", "h") + "\"/nfs/Backup\" k(rw,x)", "-1",
         rule("/nfs/Backup", "h")},
    };
    for (const auto& c : cases) {
        Device dev;
        prepare(dev);
        dev.write_file("/mnt/USB/USB1_c1/a/.keep", "");
        dev.write_file("/etc/exports", c.before);
        EXPECT_EQ(probe(dev, {"delete", kPublic, "a"}), c.op_result) << c.what;
        EXPECT_EQ(dev.read_file("/etc/exports"), c.after) << c.what;
        EXPECT_TRUE(dev.journal().empty()) << c.what;   // a delete never runs the follow-up
    }
}

TEST(SystemExports, MissingFileFailsAndIsNotCreated)
{
    Device dev;
    prepare(dev);
    dev.remove("/etc/exports");
    dev.trace_on();
    EXPECT_EQ(probe(dev, {"add", kPublic, "h", "1", "1"}), "-1");
    EXPECT_FALSE(dev.exists("/etc/exports"));
    EXPECT_EQ(dev.console(), "I can't find any config file.\ncan't malloc memory.\n");
    EXPECT_TRUE(dev.journal().empty());
}

TEST(SystemExports, ModifyChangesTheHostOrSkips)
{
    Device dev;
    prepare(dev);
    dev.write_file("/etc/exports", rule("/nfs/Public", "a"));
    dev.trace_on();
    // A modify of a rule that does not exist adds none, but still runs the follow-up.
    EXPECT_EQ(probe(dev, {"modify", kPublic, "b", "c", "1", "1"}), "0");
    EXPECT_EQ(dev.read_file("/etc/exports"), "");
    EXPECT_EQ(dev.console(), "folder_realp[" + kPublic + "] ip[b] newip[c] setting not exist, modify skip!!!\n\n");
    EXPECT_EQ(without(dev.journal(), {"setfacl"}), first_rule_follow_up(kPublic, true));

    dev.write_file("/etc/exports", rule("/nfs/Public", "a"));
    dev.clear_records();
    EXPECT_EQ(probe(dev, {"modify", kPublic, "a", "c", "0", "1"}), "0");
    EXPECT_EQ(dev.read_file("/etc/exports"), rule("/nfs/Public", "c", "ro"));
    EXPECT_EQ(dev.console(), kPublic + " a found!!!\nwrite buf\n[" + rule("/nfs/Public", "c", "ro") + "]\n\n");
    EXPECT_TRUE(dev.journal().empty());
}

TEST(VolumeExports, KeepsEveryHostOfAFolder)
{
    Device dev;
    prepare(dev);
    EXPECT_EQ(probe(dev, {"hadd", kPublic, "a", "1", "1"}), "0");
    EXPECT_EQ(probe(dev, {"hadd", kPublic, "b", "0", "0"}), "0");
    EXPECT_EQ(probe(dev, {"hadd", kBackup, "a", "1", "1"}), "0");
    EXPECT_EQ(volume_copy(dev, "/mnt/HD/HD_a2"), rule("/Public", "a") + rule("/Public", "b", "ro"));
    EXPECT_EQ(volume_copy(dev, "/mnt/HD/HD_b2"), rule("/Backup", "a"));
    EXPECT_FALSE(dev.exists("/tmp/exports"));
    Journal expected;
    for (const std::string volume : {"/mnt/HD/HD_a2", "/mnt/HD/HD_a2", "/mnt/HD/HD_b2"})
        expected.insert(expected.end(), {{"getDataLocationByVolume", "exports", volume},
                                         {"saveDataToHiddenByVolume", "/tmp/exports", volume}});
    EXPECT_EQ(dev.journal(), expected);

    // The same host takes the new access; a modify renames one host; a modify of a
    // host that is not there changes nothing.
    EXPECT_EQ(probe(dev, {"hadd", kPublic, "a", "0", "1"}), "0");
    EXPECT_EQ(probe(dev, {"hmodify", kPublic, "b", "c", "1", "1"}), "0");
    EXPECT_EQ(probe(dev, {"hmodify", kPublic, "zz", "d", "1", "1"}), "0");
    EXPECT_EQ(volume_copy(dev, "/mnt/HD/HD_a2"), rule("/Public", "a", "ro") + rule("/Public", "c"));

    // Delete takes one host; a host that is not there fails and leaves the staging file.
    EXPECT_EQ(probe(dev, {"hdelete", kPublic, "a"}), "0");
    EXPECT_EQ(volume_copy(dev, "/mnt/HD/HD_a2"), rule("/Public", "c"));
    dev.clear_records();
    EXPECT_EQ(probe(dev, {"hdelete", kPublic, "a"}), "-1");
    EXPECT_EQ(volume_copy(dev, "/mnt/HD/HD_a2"), rule("/Public", "c"));
    EXPECT_EQ(dev.read_file("/tmp/exports"), rule("/Public", "c"));
    EXPECT_EQ(dev.journal(), (Journal{{"getDataLocationByVolume", "exports", "/mnt/HD/HD_a2"}}));

    // An empty host matches every rule of the folder.
    EXPECT_EQ(probe(dev, {"hdelete", kPublic, ""}), "0");
    EXPECT_EQ(volume_copy(dev, "/mnt/HD/HD_a2"), "");
    // Nothing to delete from an empty copy.
    EXPECT_EQ(probe(dev, {"hdelete", kPublic, "c"}), "0");
}

TEST(VolumeExports, UsbFolderHasItsOwnOneLineFile)
{
    Device dev;
    prepare(dev);
    const std::string folder = "/mnt/USB/USB1_c1/photos";
    dev.write_file("/etc/mtab", kHdMounts + kVfatMount);
    dev.write_file(folder + "/.keep", "");
    EXPECT_EQ(probe(dev, {"hadd", folder, "a", "1", "1"}), "0");
    EXPECT_EQ(probe(dev, {"hadd", folder, "b", "0", "1"}), "0");
    EXPECT_EQ(dev.read_file(folder + "/.exports"), rule(folder, "b", "ro", "500,anongid=1000"));
    EXPECT_EQ(probe(dev, {"hdelete", folder, "not-the-host"}), "0");
    EXPECT_FALSE(dev.exists(folder + "/.exports"));
    EXPECT_EQ(probe(dev, {"hadd", "/mnt/USB/USB1_c1/missing", "a", "1", "1"}), "-1");
    EXPECT_TRUE(dev.journal().empty());
}

TEST(VolumeExports, IsoRulesGoToEveryVolume)
{
    Device dev;
    prepare(dev);
    const std::string folder = "/mnt/isoMount/disc";
    dev.write_file(folder + "/.keep", "");
    EXPECT_EQ(probe(dev, {"hadd", folder, "a", "1", "1"}), "0");
    EXPECT_EQ(volume_copy(dev, "/mnt/HD/HD_a2", "exports_iso"), rule("/disc", "a"));
    EXPECT_EQ(volume_copy(dev, "/mnt/HD/HD_b2", "exports_iso"), rule("/disc", "a"));
    EXPECT_FALSE(dev.exists("/tmp/exports_iso"));
    EXPECT_EQ(dev.journal(), (Journal{{"getDataLocationByVolume", "exports_iso", "/mnt/HD/HD_a2"},
                                      {"getDataLocationByVolume", "exports_iso", "/mnt/HD/HD_b2"},
                                      {"saveDataToHiddenByVolume", "/tmp/exports_iso", "/mnt/HD/HD_a2"},
                                      {"saveDataToHiddenByVolume", "/tmp/exports_iso", "/mnt/HD/HD_b2"}}));

    // Read from the first volume that has the copy.
    dev.remove("/mnt/HD/HD_a2/.systemfile/exports_iso");
    dev.clear_records();
    EXPECT_EQ(probe(dev, {"hadd", folder, "b", "1", "1"}), "0");
    EXPECT_EQ(volume_copy(dev, "/mnt/HD/HD_a2", "exports_iso"), rule("/disc", "a") + rule("/disc", "b"));
    EXPECT_EQ(volume_copy(dev, "/mnt/HD/HD_b2", "exports_iso"), rule("/disc", "a") + rule("/disc", "b"));
    EXPECT_EQ(dev.journal().at(1), (Event{"getDataLocationByVolume", "exports_iso", "/mnt/HD/HD_b2"}));

    // Without a hard-disk mount there is nowhere to keep them.
    dev.write_file("/etc/mtab", kVfatMount);
    EXPECT_EQ(probe(dev, {"hadd", folder, "c", "1", "1"}), "-1");
}

// The NFS commands: exporting a share, the rule count, the NFS switch and the removal
// of a share from every file service; the answer bytes, the files afterwards and the
// journal of each.
#include <gtest/gtest.h>

#include <algorithm>

#include "device.h"

namespace {

const std::string kPublic = "/mnt/HD/HD_a2/Public";

std::string rule(const std::string& folder, const std::string& host, const std::string& access = "rw")
{
    return "\"" + folder + "\" " + host + "(" + access +
           ",all_squash,sync,no_wdelay,insecure_locks,insecure,no_subtree_check,anonuid=501,anongid=1000)\n";
}

Event sh(const std::string& line) { return {"sh", "-c", line}; }

// A folder's rule in "/etc/exports" runs the "/nfs" link and the ACL test, and sets the
// default ACLs if they are missing; then the volume copy is saved and the exports reloaded.
Journal export_journal(const std::string& folder, const std::string& volume, bool acl_set = true)
{
    Journal journal{sh("rm -rf /nfs ; ln -s /shares /nfs"), sh("getfacl -p '" + folder + "' 2>/dev/null"),
                    {"getfacl", "-p", folder}};
    if (acl_set)
        journal.push_back(sh("setfacl -m d:u::rwx,d:o::rwx,d:g::rwx '" + folder + "' > /dev/null 2>&1 &"));
    journal.insert(journal.end(), {{"getDataLocationByVolume", "exports", volume},
                                   {"saveDataToHiddenByVolume", "/tmp/exports", volume},
                                   sh("exportfs -r > /dev/null 2>&1"),
                                   {"exportfs", "-r"}});
    return journal;
}

} // namespace

TEST(SetNfsShare, ExportsToBothStores)
{
    const struct {
        const char* what;
        Fields fields;
        std::string host, access;
    } cases[] = {
        {"read-write to a network", {{"host", "192.168.1.0/24"}, {"path", kPublic}, {"rw", "1"}, {"rootsquash", "1"}},
         "192.168.1.0/24", "rw"},
        {"empty host exports to every host", {{"host", ""}, {"path", kPublic}, {"rw", "0"}, {"rootsquash", "0"}}, "*", "ro"},
        {"only bit 0 of rw counts, text is 0", {{"host", "h"}, {"path", kPublic}, {"rw", "2"}, {"rootsquash", "x"}}, "h", "ro"},
        {"the host is cut to 31 bytes", {{"host", std::string(40, 'h')}, {"path", kPublic}, {"rw", "1"}},
         std::string(31, 'h'), "rw"},
    };
    for (const auto& c : cases) {
        Device dev;
        EXPECT_EQ(dev.request("cgi_set_nfs_share", c.fields), kEmptyHtml) << c.what;
        EXPECT_EQ(dev.read_file("/etc/exports"), rule("/nfs/Public", c.host, c.access)) << c.what;
        EXPECT_EQ(dev.read_file("/mnt/HD/HD_a2/.systemfile/exports"), rule("/Public", c.host, c.access)) << c.what;
        EXPECT_EQ(without(dev.journal(), {"setfacl"}), export_journal(kPublic, "/mnt/HD/HD_a2")) << c.what;
    }
}

TEST(SetNfsShare, SecondHostReplacesTheFirstOnlyInTheSystemFile)
{
    Device dev;
    dev.request("cgi_set_nfs_share", {{"host", "10.0.0.1"}, {"path", kPublic}, {"rw", "1"}});
    dev.clear_records();
    EXPECT_EQ(dev.request("cgi_set_nfs_share", {{"host", "10.0.0.2"}, {"path", kPublic}, {"rw", "1"}}), kEmptyHtml);
    EXPECT_EQ(dev.read_file("/etc/exports"), rule("/nfs/Public", "10.0.0.2"));
    EXPECT_EQ(dev.read_file("/mnt/HD/HD_a2/.systemfile/exports"), rule("/Public", "10.0.0.1") + rule("/Public", "10.0.0.2"));
    // The ACLs are there since the first export: getfacl, but no setfacl.
    EXPECT_EQ(dev.journal(), export_journal(kPublic, "/mnt/HD/HD_a2", false));
}

TEST(GetNfsInfo, CountsLinesAndEchoesTheSwitch)
{
    const struct {
        const char* what;
        std::string exports;     // "(none)": no file
        std::string enable;
        std::string body;
    } cases[] = {
        {"three lines, one blank", rule("/nfs/a", "h") + "\n" + rule("/nfs/b", "h"), "1",
         "<nfs_info><total>3</total><enable>1</enable></nfs_info>"},
        {"no file", "(none)", "0", "<nfs_info><total>0</total><enable>0</enable></nfs_info>"},
        {"a last line without newline counts", "x\ny", "1", "<nfs_info><total>2</total><enable>1</enable></nfs_info>"},
        {"a long line counts per 2047 bytes", std::string(5000, 'x') + "\n", "1",
         "<nfs_info><total>3</total><enable>1</enable></nfs_info>"},
        {"the switch raw, cut to 7", "", "a<b>cdefgh", "<nfs_info><total>0</total><enable>a<b>cde</enable></nfs_info>"},
    };
    for (const auto& c : cases) {
        Device dev;
        if (c.exports == "(none)")
            dev.remove("/etc/exports");
        else
            dev.write_file("/etc/exports", c.exports);
        dev.config({{"/system_mgr/nfs/enable", c.enable}});
        EXPECT_EQ(dev.request("cgi_get_nfs_info"), xml_answer(c.body)) << c.what;
        EXPECT_TRUE(dev.journal().empty()) << c.what;
    }
}

TEST(NfsEnable, StoresTheSwitchAndStartsOrStops)
{
    const std::string answer = "Pragma: no-cache\r\nCache-Control: no-cache\r\nContent-Type: text/xml\r\n\r\n"
                               "<?xml version=\"1.0\" encoding=\"UTF-8\" ?>\n<info>\n<status>1</status>\n</info>\n";
    for (const auto& [status, action] : {std::pair{"1", "start"}, {"0", "stop"}, {"abc", "stop"}, {"2x", "start"},
                                         {"", "stop"}, {"123456789", "start"}}) {
        Device dev;
        const std::string stored = std::string(status).substr(0, 7);
        EXPECT_EQ(dev.request("cgi_nfs_enable", {{"nfs_status", status}}), answer) << status;
        EXPECT_EQ(dev.config_value("/system_mgr/nfs/enable"), stored) << status;
        EXPECT_EQ(dev.journal(), (Journal{{"xml_set_str", "/system_mgr/nfs/enable", stored},
                                          {"xml_write_file", "/etc/NAS_CFG/config.xml"}, {"LIB_CP_Config_To_MTD", "1"},
                                          sh("nfs " + std::string(action) + " >/dev/null 2>&1"), {"nfs", action},
                                          sh("smbcom >/dev/null 2>&1"), {"smbcom"}}))
            << status;
    }
}

TEST(DelSession, RemovesTheShareFromEveryService)
{
    Device dev;
    dev.request("cgi_set_nfs_share", {{"host", "10.0.0.1"}, {"path", kPublic}, {"rw", "1"}});
    dev.request("cgi_set_nfs_share", {{"host", "10.0.0.2"}, {"path", kPublic}, {"rw", "1"}});
    dev.clear_records();
    dev.trace_on();
    EXPECT_EQ(dev.request("cgi_del_session", {{"name", "Public"}, {"path", kPublic}, {"host", "10.0.0.2"},
                                              {"smb_path", "\\\\NAS\\Public"}}),
              kEmptyHtml);

    EXPECT_EQ(dev.read_file("/var/lib/platform/shares"), "Backup\t/mnt/HD/HD_b2/Backup\tno\tyes\t0\t0\t0\t1\tadmin:2,@family:1\n");
    EXPECT_FALSE(dev.exists("/shares/Public"));
    EXPECT_TRUE(dev.exists(kPublic));
    EXPECT_EQ(dev.read_file("/etc/exports"), "");
    EXPECT_EQ(dev.read_file("/mnt/HD/HD_a2/.systemfile/exports"), rule("/Public", "10.0.0.1"));
    EXPECT_EQ(without(dev.journal(), {"avahi_tm_serv"}),
              (Journal{{"del_share", "Public"}, {"LIB_WEB_STOP_FTP"}, {"LIB_FTP_Del_Share", "Public"}, {"LIB_WEB_START_FTP"},
                       {"getDataLocationByVolume", "exports", "/mnt/HD/HD_a2"},
                       {"saveDataToHiddenByVolume", "/tmp/exports", "/mnt/HD/HD_a2"},
                       {"afpIf_delShareByPath", kPublic},
                       sh("(avahi_tm_serv --tm_delall >/dev/null 2>&1;avahi_tm_serv --tm_start >/dev/null 2>&1)&"),
                       sh("smbcom >/dev/null 2>&1"), {"smbcom"}, sh("afpcom >/dev/null 2>&1"), {"afpcom"}}));
    const Journal journal = dev.journal();
    EXPECT_EQ(std::count(journal.begin(), journal.end(), Event{"avahi_tm_serv", "--tm_delall"}), 1);
    EXPECT_EQ(std::count(journal.begin(), journal.end(), Event{"avahi_tm_serv", "--tm_start"}), 1);
    EXPECT_EQ(dev.console(), "name=[Public]\npath=[" + kPublic + "]\nhost=[10.0.0.2]\nsmb_path=[\\\\NAS\\Public]\n"
                             "cur->volume[/Public] cur->ip[10.0.0.1] modify_hidden_config_string_base cgi\n\n"
                             "cur->volume[/Public] cur->ip[10.0.0.2] modify_hidden_config_string_base cgi\n\n"
                             "found!!! cur->volume[/Public] cur->ip[10.0.0.2] hidden delete cgi\n\n");
}

TEST(DelSession, WithoutRulesStillRemovesTheShare)
{
    Device dev;
    EXPECT_EQ(dev.request("cgi_del_session", {{"name", "Backup"}, {"path", "/mnt/HD/HD_b2/Backup"}, {"host", "h"}}),
              kEmptyHtml);
    EXPECT_FALSE(dev.exists("/shares/Backup"));
    EXPECT_EQ(dev.read_file("/etc/exports"), "");
    const Journal journal = without(dev.journal(), {"avahi_tm_serv"});
    EXPECT_EQ(Journal(journal.begin(), journal.begin() + 6),
              (Journal{{"del_share", "Backup"}, {"LIB_WEB_STOP_FTP"}, {"LIB_FTP_Del_Share", "Backup"}, {"LIB_WEB_START_FTP"},
                       {"getDataLocationByVolume", "exports", "/mnt/HD/HD_b2"}, {"afpIf_delShareByPath", "/mnt/HD/HD_b2/Backup"}}));
}

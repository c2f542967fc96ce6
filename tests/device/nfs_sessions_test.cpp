// The per-share overview: service switches, every share of the share list, and the
// NFS part that "/etc/exports" gives each share.
#include <gtest/gtest.h>

#include "device.h"

namespace {

const std::string kSwitches =
    "<session><ftp>1</ftp><nfs_server>1</nfs_server><media_serving>1</media_serving><webdav_server>1</webdav_server>";

std::string share_line(const std::string& name, const std::string& path)
{
    return name + "\t" + path + "\tno\tyes\t0\t1\t0\t1\t\n";
}

std::string no_rule(const std::string& name, const std::string& path, const std::string& before_status = "")
{
    return "<share><name>" + name + "</name><path>" + path + "</path><nfs>" + before_status +
           "<status>0</status><real_path>" + path + "</real_path><host></host></nfs></share>\n";
}

std::string with_rule(const std::string& name, const std::string& path, const std::string& squash,
                      const std::string& write, const std::string& host)
{
    return "<share><name>" + name + "</name><path>" + path + "</path><nfs><status>1</status><real_path>" + path +
           "</real_path><root_squash>" + squash + "</root_squash><write>" + write + "</write><host>" + host +
           "</host></nfs></share>\n";
}

const std::string kEngineOptions =
    "(rw,all_squash,sync,no_wdelay,insecure_locks,insecure,no_subtree_check,anonuid=501,anongid=1000)\n";

} // namespace

TEST(AllSession, ListsSharesWithTheirNfsRule)
{
    const std::string gone = "/mnt/HD/HD_a2/Gone";
    const std::string defaults = share_line("Public", "/mnt/HD/HD_a2/Public") + share_line("Backup", "/mnt/HD/HD_b2/Backup");
    const struct {
        const char* what;
        std::string shares;
        std::string exports;
        std::string list;     // the share elements and the total
    } cases[] = {
        {"no shares", "", "\"/nfs/Public\" h" + kEngineOptions, "<total>0</total>"},
        {"rules the engine writes resolve and match no share", defaults,
         "\"/nfs/Public\" h" + kEngineOptions + "\"/nfs/Backup\" h" + kEngineOptions,
         no_rule("Public", "/mnt/HD/HD_a2/Public") + no_rule("Backup", "/mnt/HD/HD_b2/Backup") + "<total>2</total>"},
        {"a rule whose path does not resolve matches verbatim; the last one wins", share_line("Gone", gone),
         "\"" + gone + "\" h1(rw,no_root_squash)\n\"" + gone + "\" h2(ro,all_squash)\n",
         with_rule("Gone", gone, "Yes", "No", "h2") + "<total>1</total>"},
        {"a single rule is examined too", share_line("Gone", gone), "\"" + gone + "\" h1(rw,no_root_squash)\n",
         with_rule("Gone", gone, "No", "Yes", "h1") + "<total>1</total>"},
        {"a single invalid line prints into the body", defaults, "\"/nfs/Public\" (NULL)(rw,x)\n",
         no_rule("Public", "/mnt/HD/HD_a2/Public", "Nothing to show.\n") +
             no_rule("Backup", "/mnt/HD/HD_b2/Backup", "Nothing to show.\n") + "<total>2</total>"},
        {"an empty file gives no rule", share_line("Gone", gone), "", no_rule("Gone", gone) + "<total>1</total>"},
        {"names and paths are escaped", share_line("a&b", "/x<y"), "",
         no_rule("a&amp;b", "/x&lt;y") + "<total>1</total>"},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.symlink("/shares", "/nfs");
        dev.write_file("/var/lib/platform/shares", c.shares);
        dev.write_file("/etc/exports", c.exports);
        EXPECT_EQ(dev.request("cgi_get_all_session"), xml_answer(kSwitches + c.list + "</session>\n")) << c.what;
        EXPECT_EQ(dev.journal(), (Journal{{"get_samba_info2"}, {"Free_All_List"}})) << c.what;
    }
}

TEST(AllSession, SwitchesAsStoredAndWebdavOnlyWhenOne)
{
    Device dev;
    dev.write_file("/var/lib/platform/shares", "");
    dev.remove("/etc/exports");
    dev.config({{"/app_mgr/ftp/setting/state", "a&b"}, {"/system_mgr/nfs/enable", "0"},
                {"/app_mgr/upnpavserver/enable", "12345678"}, {"/system_mgr/webdav/enable", "2"}});
    EXPECT_EQ(dev.request("cgi_get_all_session"),
              xml_answer("<session><ftp>a&b</ftp><nfs_server>0</nfs_server><media_serving>1234567</media_serving>"
                         "<webdav_server>0</webdav_server><total>0</total></session>\n"));
}

TEST(AllSession, TracesEachRecordOfAManyRuleFile)
{
    Device dev;
    dev.write_file("/var/lib/platform/shares", share_line("S", "/s"));
    dev.write_file("/etc/exports", "\"/a\" h(rw)\n\"/b\" h(rw)\n");
    dev.trace_on();
    dev.request("cgi_get_all_session");
    EXPECT_EQ(dev.console(), "path=/s\ncurrent->volume=/a\npath=/s\ncurrent->volume=/b\n");
}

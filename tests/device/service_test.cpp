// The service report, the restart of the share services and the FTP switch.
#include <gtest/gtest.h>

#include "device.h"

TEST(ServiceInfo, ReportsTheSwitchesAsStored)
{
    const struct {
        const char* what;
        std::string ftp, nfs, cloud, webdav;
        std::string body;
    } cases[] = {
        {"mixed switches", "1", "0", "2", "1",
         "<service><ftp>1</ftp><nfs_server>0</nfs_server><cloud_access>0</cloud_access><webdav_server>1</webdav_server></service>"},
        {"texts are echoed raw, cut to 7 bytes", "on&off", "abcdefghij", "1", "0",
         "<service><ftp>on&off</ftp><nfs_server>abcdefg</nfs_server><cloud_access>1</cloud_access><webdav_server>0</webdav_server></service>"},
        {"non-numbers count as off", "1", "1", "yes", " 1x",
         "<service><ftp>1</ftp><nfs_server>1</nfs_server><cloud_access>0</cloud_access><webdav_server>1</webdav_server></service>"},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.config({{"/app_mgr/ftp/setting/state", c.ftp}, {"/system_mgr/nfs/enable", c.nfs},
                    {"/cloud/cloud_access", c.cloud}, {"/system_mgr/webdav/enable", c.webdav}});
        EXPECT_EQ(dev.request("cgi_get_service_info"), xml_answer(c.body)) << c.what;
        EXPECT_TRUE(dev.journal().empty()) << c.what;   // a report changes nothing
    }
}

TEST(ServiceInfo, MissingKeysLeaveTheSharedBuffer)
{
    Device dev;
    // Without an NFS key the FTP text stays in the one buffer and is repeated.
    dev.remove_config("/system_mgr/nfs/enable");
    dev.remove_config("/cloud/cloud_access");
    EXPECT_EQ(dev.request("cgi_get_service_info"),
              xml_answer("<service><ftp>1</ftp><nfs_server>1</nfs_server><cloud_access>0</cloud_access>"
                         "<webdav_server>1</webdav_server></service>"));

    dev.remove_config("/app_mgr/ftp/setting/state");
    dev.remove_config("/system_mgr/webdav/enable");
    EXPECT_EQ(dev.request("cgi_get_service_info"),
              xml_answer("<service><ftp></ftp><nfs_server></nfs_server><cloud_access>0</cloud_access>"
                         "<webdav_server>0</webdav_server></service>"));
}

TEST(RestartService, RerunsShareServicesThenAnswersAnEmptyPage)
{
    const struct {
        const char* rsyncd;
        bool rsync_runs;
    } cases[] = {{"1", true}, {"0", false}, {"1 ", false}, {"10", false}};
    for (const auto& c : cases) {
        Device dev;
        dev.config({{"/backup_mgr/rsyncd/enable", c.rsyncd}});
        EXPECT_EQ(dev.request("cgi_restart_service"), kEmptyHtml) << c.rsyncd;
        Journal expected{{"sh", "-c", "smbcom >/dev/null 2>&1"}, {"smbcom"},
                         {"sh", "-c", "afpcom >/dev/null 2>&1"}, {"afpcom"}};
        if (c.rsync_runs)
            expected.push_back({"sh", "-c", "rsyncom -x > /dev/null 2>&1 0</dev/null &"});
        EXPECT_EQ(without(dev.journal(), {"rsyncom"}), expected) << c.rsyncd;
        const Journal rsync{{"rsyncom", "-x"}};
        EXPECT_EQ(dev.journal().back() == rsync.front(), c.rsync_runs) << c.rsyncd;
    }
}

TEST(FtpService, StopsOrRebuildsByType)
{
    const struct {
        std::string type;
        Journal journal;
    } cases[] = {
        {"0", {{"LIB_WEB_STOP_FTP"}}},
        {"1", {{"LIB_WEB_STOP_FTP"}, {"LIB_FTP_Create_Share_Link"}, {"LIB_WEB_START_FTP"}}},
        {"2", {}},
        {"01", {}},
        {"", {}},
    };
    for (const auto& c : cases) {
        Device dev;
        EXPECT_EQ(dev.request("cgi_ftp_service", {{"type", c.type}}), kEmptyHtml) << c.type;
        EXPECT_EQ(dev.journal(), c.journal) << c.type;
    }
    Device dev;
    EXPECT_EQ(dev.request("cgi_ftp_service"), kEmptyHtml);   // no type at all
    EXPECT_TRUE(dev.journal().empty());
}

// The AFP switch and its status.
#include <gtest/gtest.h>

#include "device.h"

TEST(AfpSwitch, OffStopsAfpAndTimeMachineOnRebuildsSambaAfterTheAnswer)
{
    const Journal kSave{{"xml_write_file", "/etc/NAS_CFG/config.xml"}, {"LIB_CP_Config_To_MTD", "1"}};
    const Journal kSamba{{"sh", "-c", "smbcom >/dev/null 2>&1"}, {"smbcom"}};
    const struct {
        const char* what;
        std::string afp, time_machine;
        Journal work;
        std::string time_machine_after;
    } cases[] = {
        {"off with Time Machine on", "0", "1",
         {{"xml_set_str", "/backup_mgr/time_machine/enable", "0"},
          {"sh", "-c", "avahi_tm_serv --tm_delall >/dev/null 2>&1"},
          {"avahi_tm_serv", "--tm_delall"},
          {"sh", "-c", "afp stop >/dev/null 2>&1"},
          {"afp", "stop"}},
         "0"},
        {"off with Time Machine off", "0", "0", {{"sh", "-c", "afp stop >/dev/null 2>&1"}, {"afp", "stop"}}, "0"},
        {"off, Time Machine read as one character", "0", "10",
         {{"xml_set_str", "/backup_mgr/time_machine/enable", "0"},
          {"sh", "-c", "avahi_tm_serv --tm_delall >/dev/null 2>&1"},
          {"avahi_tm_serv", "--tm_delall"},
          {"sh", "-c", "afp stop >/dev/null 2>&1"},
          {"afp", "stop"}},
         "0"},
        {"on leaves Time Machine", "1", "1", {{"sh", "-c", "afpcom >/dev/null 2>&1"}, {"afpcom"}}, "1"},
        {"empty counts as on", "", "1", {{"sh", "-c", "afpcom >/dev/null 2>&1"}, {"afpcom"}}, "1"},
        {"00 counts as on", "00", "0", {{"sh", "-c", "afpcom >/dev/null 2>&1"}, {"afpcom"}}, "0"},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.config({{"/backup_mgr/time_machine/enable", c.time_machine}});
        EXPECT_EQ(dev.request("cgi_set_afp", {{"afp", c.afp}}), kEmptyHtml) << c.what;
        Journal expected{{"xml_set_str", "/system_mgr/afp/enable", c.afp}};
        expected.insert(expected.end(), c.work.begin(), c.work.end());
        expected.insert(expected.end(), kSave.begin(), kSave.end());
        expected.insert(expected.end(), kSamba.begin(), kSamba.end());
        EXPECT_EQ(dev.journal(), expected) << c.what;
        EXPECT_EQ(dev.config_value("/system_mgr/afp/enable"), c.afp) << c.what;
        EXPECT_EQ(dev.config_value("/backup_mgr/time_machine/enable"), c.time_machine_after) << c.what;
    }
}

TEST(AfpSwitch, StoresAnyTextCutTo15Bytes)
{
    Device dev;
    EXPECT_EQ(dev.request("cgi_set_afp", {{"afp", "on & <off> and more"}}), kEmptyHtml);
    EXPECT_EQ(dev.config_value("/system_mgr/afp/enable"), "on & <off> and ");
}

TEST(AfpInfo, ReportsTheStoredSwitchAsANumber)
{
    const struct {
        std::string stored, body;
    } cases[] = {
        {"1", "<afp_info><enable>1</enable></afp_info>"},
        {"0", "<afp_info><enable>0</enable></afp_info>"},
        {"7", "<afp_info><enable>7</enable></afp_info>"},
        {"on", "<afp_info><enable>-1</enable></afp_info>"},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.config({{"/system_mgr/afp/enable", c.stored}});
        EXPECT_EQ(dev.request("cgi_get_afp_info"), xml_answer(c.body)) << c.stored;
        EXPECT_TRUE(dev.journal().empty()) << c.stored;
    }
}

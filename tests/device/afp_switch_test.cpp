// The AFP switch and its status.
#include <gtest/gtest.h>

#include "device.h"

TEST(AfpSwitch, OffStopsAfpAndTimeMachineOnRebuildsSambaAfterTheAnswer)
{
    const Journal stop_tm{{"xml_set_str", "/backup_mgr/time_machine/enable", "0"},
                          {"sh", "-c", "avahi_tm_serv --tm_delall >/dev/null 2>&1"},
                          {"avahi_tm_serv", "--tm_delall"}};
    const Journal stop{{"sh", "-c", "afp stop >/dev/null 2>&1"}, {"afp", "stop"}};
    const Journal start{{"sh", "-c", "afpcom >/dev/null 2>&1"}, {"afpcom"}};
    const struct {
        const char* what;
        std::string afp, time_machine;
        Journal tm_work, afp_work;
        std::string time_machine_after;
    } cases[] = {
        {"off with Time Machine on", "0", "1", stop_tm, stop, "0"},
        {"off with Time Machine off", "0", "0", {}, stop, "0"},
        {"off, Time Machine read as one character", "0", "10", stop_tm, stop, "0"},
        {"on leaves Time Machine", "1", "1", {}, start, "1"},
        {"empty counts as on", "", "1", {}, start, "1"},
        {"00 counts as on", "00", "0", {}, start, "0"},
        {"any text, stored cut to 15 bytes", "on & <off> and more", "1", {}, start, "1"},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.config({{"/backup_mgr/time_machine/enable", c.time_machine}});
        EXPECT_EQ(dev.request("cgi_set_afp", {{"afp", c.afp}}), kEmptyHtml) << c.what;
        const std::string stored = c.afp.substr(0, 15);
        Journal expected{{"xml_set_str", "/system_mgr/afp/enable", stored}};
        for (const Journal& part : {c.tm_work, c.afp_work,
                                    Journal{{"xml_write_file", "/etc/NAS_CFG/config.xml"}, {"LIB_CP_Config_To_MTD", "1"},
                                            {"sh", "-c", "smbcom >/dev/null 2>&1"}, {"smbcom"}}})
            expected.insert(expected.end(), part.begin(), part.end());
        EXPECT_EQ(dev.journal(), expected) << c.what;
        EXPECT_EQ(dev.config_value("/system_mgr/afp/enable"), stored) << c.what;
        EXPECT_EQ(dev.config_value("/backup_mgr/time_machine/enable"), c.time_machine_after) << c.what;
    }
}

TEST(AfpInfo, ReportsTheStoredSwitchAsANumber)
{
    for (const auto& [stored, shown] : {std::pair{"1", "1"}, {"0", "0"}, {"7", "7"}, {"on", "-1"}}) {
        Device dev;
        dev.config({{"/system_mgr/afp/enable", stored}});
        EXPECT_EQ(dev.request("cgi_get_afp_info"),
                  xml_answer(std::string("<afp_info><enable>") + shown + "</enable></afp_info>"))
            << stored;
        EXPECT_TRUE(dev.journal().empty()) << stored;
    }
}

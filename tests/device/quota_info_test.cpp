// The quota page's overview: volumes, account counts, the switch, the volume names.
#include <gtest/gtest.h>

#include "accounts_testing.h"

namespace {

std::string overview(const std::string& num, const std::string& sizes, const std::string& users,
                     const std::string& groups, const std::string& enable, const std::string& names)
{
    return "<quota_info>\n<hddnum>" + num + "</hddnum><hddsize>" + sizes + "</hddsize><usernum>" + users +
           "</usernum><groupnum>" + groups + "</groupnum><enable>" + enable + "</enable><v_name>" + names +
           "</v_name></quota_info>";
}

} // namespace

TEST(QuotaInfo, NamesTheFirstFourInternalVolumes)
{
    const std::string long_name(40, 'V');
    const struct {
        const char* what;
        std::string table;
        std::string num, sizes, names;
        int disks;      // the volumes sized, HD_a2 on
    } cases[] = {
        {"one volume", kOne, "1", "1877538", "Volume_1:::", 1},
        {"four volumes", kFour, "4", "1877538,937795,4096,2048", "Volume_1:Volume_2:Volume_3:Volume_4", 4},
        {"a USB disk between internal volumes takes no number", kUsbBetween, "2", "1877538,937795",
         "Volume_1:Volume_2::", 2},
        {"a fifth volume is counted and sized, not named", kFour + "Volume_5 = HD_e2\n", "5",
         "1877538,937795,4096,2048,0", "Volume_1:Volume_2:Volume_3:Volume_4", 5},
        {"a blank line takes a number with an empty name", "Volume_1 = HD_a2\n\nVolume_2 = HD_b2\n", "2",
         "1877538,937795", "Volume_1::Volume_2:", 2},
        {"a name longer than its slot is cut to 31", long_name + " = HD_a2\n", "0", "1877538",
         std::string(31, 'V') + ":::", 1},
        {"no table", kNone, "0", "null,null,null,null", ":::", 0},
    };
    for (const auto& c : cases) {
        Device dev;
        set_volume_table(dev, c.table);
        EXPECT_EQ(dev.request("cgi_get_quota_info"), xml_utf8_answer(overview(c.num, c.sizes, "3", "2", "1", c.names)))
            << c.what;
        EXPECT_EQ(dev.journal(), per_volume({"LIB_Get_Disk_Size", "/mnt/HD/{}"}, c.disks)) << c.what;
    }
}

TEST(QuotaInfo, CountsListedAccountsReportsTheSwitchAndTraces)
{
    Device dev;
    dev.write_file("/etc/passwd", "root:x:0:0::/:/bin/sh\nadmin:x:500:1001::/:/bin/sh\n"
                                  "Admin:x:1001:1000::/:/bin/sh\nshare:x:1002:1000::/:/bin/sh\n");
    dev.write_file("/etc/group", "allaccount:x:1000:\nshare:x:1003:\nteam:x:1004:\nteam2:x:1005:\n");
    const struct {
        const char* enable;   // nullptr: no key
        const char* shown;
    } cases[] = {{"0", "0"}, {"1", "1"}, {"7", "7"}, {nullptr, "-1"}};
    dev.trace_on();
    for (const auto& c : cases) {
        if (c.enable)
            dev.config({{"/system_mgr/quota/enable", c.enable}});
        else
            dev.remove_config("/system_mgr/quota/enable");
        EXPECT_EQ(dev.request("cgi_get_quota_info"),
                  xml_utf8_answer(overview("2", "1877538,937795", "2", "2", c.shown, "Volume_1:Volume_2::")));
        EXPECT_EQ(dev.console(), "------get quota info--------\nnum=2\nhddsize=1877538,937795\n"
                                 "---------------------------\n");
        dev.clear_records();
    }
}

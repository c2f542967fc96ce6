// The edit dialog of one user: limits and bounds per internal volume, the volumes, the
// first group.
#include <gtest/gtest.h>

#include "accounts_testing.h"

TEST(UserEditInfo, ShowsLimitsPerInternalVolume)
{
    const Journal disks = per_volume({"LIB_Get_Disk_Size", "/mnt/HD/{}"}, 2);
    const struct { const char* what; std::string name, table, body; Journal journal; } cases[] = {
        {"limits in megabytes, rounded down", "alice", kUsbBetween,
         "<quota_info><v_name>Volume_1</v_name><quota>100</quota><max_quota>0</max_quota></quota_info>"
         "<quota_info><v_name>Volume_2</v_name><quota>0</quota><max_quota>0</max_quota></quota_info>"
         "<hddnum>2</hddnum><hddsize>1877538,937795</hddsize><main_group>allaccount</main_group>",
         concat({disks, {{"LIB_Quota", "117", "HD_a2", "alice"}, {"Lib_Gen_Get_Max_User_Quota", "HD_a2", "alice"},
                         {"LIB_Quota", "117", "HD_b2", "alice"}, {"Lib_Gen_Get_Max_User_Quota", "HD_b2", "alice"},
                         {"LIB_Get_User_First_Group_Name", "alice"}}})},
        {"no volume table", "bob", kNone,
         "<hddnum>0</hddnum><hddsize>null,null,null,null</hddsize><main_group>allaccount</main_group>",
         {{"LIB_Get_User_First_Group_Name", "bob"}}},
        {"an unknown user: nothing but the volumes asked", "nosuchuser", kTwo, "", disks},
        {"user id 500 is left out", "admin", kTwo, "", disks},
        {"no name", "", kTwo, "", disks},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.write_file("/var/lib/platform/quota", "u\tHD_a2\talice\t103423\nu\tHD_b2\talice\t1023\n");
        set_volume_table(dev, c.table);
        EXPECT_EQ(dev.request("cgi_get_modify_user_info", {{"name", c.name}}),
                  xml_answer("<user_info>\n" + c.body + "</user_info>"))
            << c.what;
        EXPECT_EQ(dev.journal(), c.journal) << c.what;
    }
}

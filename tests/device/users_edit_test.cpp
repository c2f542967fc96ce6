// The edit dialog of one user: limits and bounds per internal volume, the volumes, the
// first group.
#include <gtest/gtest.h>

#include "accounts_testing.h"

TEST(UserEditInfo, ShowsLimitsPerInternalVolume)
{
    const struct {
        const char* what;
        std::string name;
        std::string table;          // "(none)": no shared_name file
        std::string body;
        Journal journal;
    } cases[] = {
        {"limits in megabytes, rounded down", "alice", "Volume_1 = HD_a2\nUSB_1 = sdc1\nVolume_2 = HD_b2\n",
         "<quota_info><v_name>Volume_1</v_name><quota>100</quota><max_quota>0</max_quota></quota_info>"
         "<quota_info><v_name>Volume_2</v_name><quota>0</quota><max_quota>0</max_quota></quota_info>"
         "<hddnum>2</hddnum><hddsize>1877538,937795</hddsize><main_group>allaccount</main_group>",
         {{"LIB_Get_Disk_Size", "/mnt/HD/HD_a2"}, {"LIB_Get_Disk_Size", "/mnt/HD/HD_b2"},
          {"LIB_Quota", "117", "HD_a2", "alice"}, {"Lib_Gen_Get_Max_User_Quota", "HD_a2", "alice"},
          {"LIB_Quota", "117", "HD_b2", "alice"}, {"Lib_Gen_Get_Max_User_Quota", "HD_b2", "alice"},
          {"LIB_Get_User_First_Group_Name", "alice"}}},
        {"no volume table", "bob", "(none)",
         "<hddnum>0</hddnum><hddsize>null,null,null,null</hddsize><main_group>allaccount</main_group>",
         {{"LIB_Get_User_First_Group_Name", "bob"}}},
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

TEST(UserEditInfo, LeavesOutUnknownUsersAndUserId500)
{
    for (const std::string name : {"nosuchuser", "admin", ""}) {
        Device dev;
        EXPECT_EQ(dev.request("cgi_get_modify_user_info", {{"name", name}}), xml_answer("<user_info>\n</user_info>"))
            << name;
        EXPECT_EQ(dev.journal(), (Journal{{"LIB_Get_Disk_Size", "/mnt/HD/HD_a2"},
                                          {"LIB_Get_Disk_Size", "/mnt/HD/HD_b2"}}))
            << name;
    }
}

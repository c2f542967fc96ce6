// The bounds beside the quota boxes: per-volume answers in kilobytes as the library
// gives them, and the library calls behind them.
#include <gtest/gtest.h>

#include "device.h"
#include "quota_volumes.h"

using namespace quota_volumes;

namespace {

// The default device's accounts (alice, bob in "family"; carol in "office"; all three
// in "allaccount", their primary group) with limits in kilobytes.
const std::string kStore = "g\tHD_a2\tfamily\t102400\n"
                           "g\tHD_b2\tfamily\t51200\n"
                           "g\tHD_c2\tfamily\t3000\n"
                           "g\tHD_a2\toffice\t40960\n"
                           "u\tHD_a2\talice\t20480\n"
                           "u\tHD_a2\tbob\t30720\n"
                           "u\tHD_b2\tcarol\t9999\n"
                           "u\tHD_c2\tbob\t1500\n";

void prepare(Device& dev, const std::string& table)
{
    use_table(dev, table);
    dev.write_file("/var/lib/platform/quota", kStore);
}

std::string user_max_answer(const std::string& values)
{
    return xml_utf8_answer("<quota_info>\n<max_size>\n" + values + "</max_size>\n</quota_info>\n");
}

std::string group_min_answer(const std::string& values)
{
    return xml_utf8_answer("<quota_info>\n<min_size>" + values + "</min_size>\n</quota_info>\n");
}

} // namespace

TEST(QuotaLimits, AddUserMaximumPerVolume)
{
    const struct {
        const char* what;
        std::string table, type, name, values;
        Journal journal;
    } cases[] = {
        {"plain: the name is a group, one volume", kOne, "", "family", "102400:0:0:0",
         {{"LIB_Quota", "103", "HD_a2", "family"}}},
        {"plain, two volumes", kTwo, "x", "family", "102400:51200:0:0",
         {{"LIB_Quota", "103", "HD_a2", "family"}, {"LIB_Quota", "103", "HD_b2", "family"}}},
        {"plain, four volumes; only exactly ad is ad", kFour, "AD", "family", "102400:51200:3000:0",
         {{"LIB_Quota", "103", "HD_a2", "family"}, {"LIB_Quota", "103", "HD_b2", "family"},
          {"LIB_Quota", "103", "HD_c2", "family"}, {"LIB_Quota", "103", "HD_d2", "family"}}},
        {"plain, USB between", kUsbBetween, "", "family", "102400:51200:0:0",
         {{"LIB_Quota", "103", "HD_a2", "family"}, {"LIB_Quota", "103", "HD_b2", "family"}}},
        {"ad: the smallest limit among the user's groups", kFour, "ad", "alice", "40960:51200:3000:0",
         {{"Lib_Get_Max_User_Quota", "HD_a2", "alice"}, {"Lib_Get_Max_User_Quota", "HD_b2", "alice"},
          {"Lib_Get_Max_User_Quota", "HD_c2", "alice"}, {"Lib_Get_Max_User_Quota", "HD_d2", "alice"}}},
        {"ad, USB between", kUsbBetween, "ad", "carol", "40960:0:0:0",
         {{"Lib_Get_Max_User_Quota", "HD_a2", "carol"}, {"Lib_Get_Max_User_Quota", "HD_b2", "carol"}}},
        {"no table", kNone, "ad", "alice", "0:0:0:0", {}},
    };
    for (const auto& c : cases) {
        Device dev;
        prepare(dev, c.table);
        // alice is also a member of office here, on top of family.
        dev.write_file("/etc/group", dev.read_file("/etc/group") + "team:x:1006:alice\n");
        dev.write_file("/var/lib/platform/quota", kStore + "g\tHD_a2\tteam\t40960\n");
        EXPECT_EQ(dev.request("cgi_adduser_get_user_quota_maxsize", {{"name", c.name}, {"type", c.type}}),
                  user_max_answer(c.values))
            << c.what;
        EXPECT_EQ(dev.journal(), c.journal) << c.what;
    }
}

TEST(QuotaLimits, UserMaximumOfOneVolumeNamedExactly)
{
    const struct {
        std::string table, hdd, name;
        std::string max;
        Journal journal;
    } cases[] = {
        {kTwo, "1", "bob", "102400", {{"Lib_Get_Max_User_Quota", "HD_a2", "bob"}}},
        {kTwo, "2", "bob", "51200", {{"Lib_Get_Max_User_Quota", "HD_b2", "bob"}}},
        {kUsbBetween, "2", "carol", "0", {{"Lib_Get_Max_User_Quota", "HD_b2", "carol"}}},
        {kFour, "3", "alice", "3000", {{"Lib_Get_Max_User_Quota", "HD_c2", "alice"}}},
        {kOne, "1", "carol", "40960", {{"Lib_Get_Max_User_Quota", "HD_a2", "carol"}}},
        // A volume the table does not have: the library is asked with an empty directory.
        {kTwo, "3", "bob", "0", {{"Lib_Get_Max_User_Quota", "", "bob"}}},
        {kTwo, "01", "bob", "0", {}},
        {kTwo, " 1", "bob", "0", {}},
        {kTwo, "2x", "bob", "0", {}},
        {kTwo, "5", "bob", "0", {}},
        {kTwo, "", "bob", "0", {}},
    };
    for (const auto& c : cases) {
        Device dev;
        prepare(dev, c.table);
        EXPECT_EQ(dev.request("cgi_get_user_quota_maxsize", {{"name", c.name}, {"hdd", c.hdd}}),
                  xml_utf8_answer("<quota_info>\n<max_size>" + c.max + "</max_size>\n</quota_info>\n"))
            << "hdd=" << c.hdd;
        EXPECT_EQ(dev.journal(), c.journal) << "hdd=" << c.hdd;
    }
}

TEST(QuotaLimits, AddGroupMinimumPerVolume)
{
    const struct {
        const char* what;
        std::string table, type, name, values;
        Journal journal;
    } cases[] = {
        {"plain: over the member list", kTwo, "", "alice,bob,carol", "30720:9999:0:0",
         {{"LIB_Get_Add_New_Group_Min_Quota", "HD_a2", "alice,bob,carol"},
          {"LIB_Get_Add_New_Group_Min_Quota", "HD_b2", "alice,bob,carol"}}},
        {"plain, one volume", kOne, "x", "alice", "20480:0:0:0", {{"LIB_Get_Add_New_Group_Min_Quota", "HD_a2", "alice"}}},
        {"plain, four volumes", kFour, "", "bob", "30720:0:1500:0",
         {{"LIB_Get_Add_New_Group_Min_Quota", "HD_a2", "bob"}, {"LIB_Get_Add_New_Group_Min_Quota", "HD_b2", "bob"},
          {"LIB_Get_Add_New_Group_Min_Quota", "HD_c2", "bob"}, {"LIB_Get_Add_New_Group_Min_Quota", "HD_d2", "bob"}}},
        {"ad: the name as an existing group", kUsbBetween, "ad", "family", "30720:0:0:0",
         {{"Lib_Get_Min_Group_Quota", "HD_a2", "family"}, {"Lib_Get_Min_Group_Quota", "HD_b2", "family"}}},
        {"no table", kNone, "", "alice", "0:0:0:0", {}},
    };
    for (const auto& c : cases) {
        Device dev;
        prepare(dev, c.table);
        EXPECT_EQ(dev.request("cgi_addgroup_get_group_quota_minsize", {{"name", c.name}, {"type", c.type}}),
                  group_min_answer(c.values))
            << c.what;
        EXPECT_EQ(dev.journal(), c.journal) << c.what;
    }
}

TEST(QuotaLimits, AddGroupTakesALongMemberList)
{
    Device dev;
    use_table(dev, kOne);
    std::string members;
    for (int i = 0; i < 7000; ++i)
        members += "user" + std::to_string(i) + ",";
    members += "bob";   // past 55,295 characters: cut away
    dev.write_file("/var/lib/platform/quota", kStore);
    EXPECT_EQ(dev.post("cgi_addgroup_get_group_quota_minsize", {{"name", members}}), group_min_answer("0:0:0:0"));
    EXPECT_EQ(dev.journal(), (Journal{{"LIB_Get_Add_New_Group_Min_Quota", "HD_a2", members.substr(0, 55295)}}));
}

TEST(QuotaLimits, GroupMinimumOfOneVolumeReadAsANumber)
{
    const struct {
        std::string table, hdd, name;
        std::string min;
        Journal journal;
    } cases[] = {
        {kTwo, "1", "family", "30720", {{"Lib_Get_Min_Group_Quota", "HD_a2", "family"}}},
        {kTwo, "01", "family", "30720", {{"Lib_Get_Min_Group_Quota", "HD_a2", "family"}}},
        {kTwo, " +1", "family", "30720", {{"Lib_Get_Min_Group_Quota", "HD_a2", "family"}}},
        {kUsbBetween, "2x", "office", "9999", {{"Lib_Get_Min_Group_Quota", "HD_b2", "office"}}},
        {kFour, "3", "allaccount", "1500", {{"Lib_Get_Min_Group_Quota", "HD_c2", "allaccount"}}},
        {kOne, "1", "office", "0", {{"Lib_Get_Min_Group_Quota", "HD_a2", "office"}}},
        {kOne, "4", "family", "0", {{"Lib_Get_Min_Group_Quota", "", "family"}}},
        {kTwo, "5", "family", "0", {}},
        {kTwo, "0", "family", "0", {}},
        {kTwo, "-1", "family", "0", {}},
        {kTwo, "", "family", "0", {}},
    };
    for (const auto& c : cases) {
        Device dev;
        prepare(dev, c.table);
        // The minimum travels under the maximum's element name, on one line.
        EXPECT_EQ(dev.request("cgi_get_group_quota_minsize", {{"name", c.name}, {"hdd", c.hdd}}),
                  xml_utf8_answer("<quota_info><max_size>" + c.min + "</max_size></quota_info>"))
            << "hdd=" << c.hdd;
        EXPECT_EQ(dev.journal(), c.journal) << "hdd=" << c.hdd;
    }
}

TEST(QuotaLimits, TraceTheQuestionAndTheAnswer)
{
    const struct {
        const char* cmd;
        Fields fields;
        std::string console;
    } cases[] = {
        {"cgi_adduser_get_user_quota_maxsize", {{"name", "family"}},
         "------get user max quota--------\nname=family\nmaxsize=102400:51200:0:0\n---------------------------\n"},
        {"cgi_get_user_quota_maxsize", {{"name", "bob"}, {"hdd", "2"}},
         "------get user max quota--------\nhdd=2\nname=bob\npath1=HD_a2\npath2=HD_b2\nmaxsize=51200\n"
         "---------------------------\n"},
        {"cgi_addgroup_get_group_quota_minsize", {{"name", "bob"}}, ""},
        {"cgi_get_group_quota_minsize", {{"name", "family"}, {"hdd", "01"}},
         "------get group min quota--------\nhdd=01\nname=family\npath1=HD_a2\npath2=HD_b2\nmaxsize=30720\n"
         "---------------------------\n"},
    };
    for (const auto& c : cases) {
        Device dev;
        prepare(dev, kTwo);
        dev.trace_on();
        dev.request(c.cmd, c.fields);
        EXPECT_EQ(dev.console(), c.console) << c.cmd;
    }
}

// Limits set through the page show up in the bounds the pages read.
TEST(QuotaLimits, FollowLimitsSetThroughThePage)
{
    Device dev;
    dev.request("cgi_group_set_quota", {{"name", "family"}, {"available1", "100"}, {"available2", "null"}});
    dev.request("cgi_user_set_quota", {{"name", "bob"}, {"available1", "30"}, {"available2", "null"}});
    EXPECT_EQ(dev.request("cgi_get_user_quota_maxsize", {{"name", "alice"}, {"hdd", "1"}}),
              xml_utf8_answer("<quota_info>\n<max_size>102400</max_size>\n</quota_info>\n"));
    EXPECT_EQ(dev.request("cgi_get_group_quota_minsize", {{"name", "family"}, {"hdd", "1"}}),
              xml_utf8_answer("<quota_info><max_size>30720</max_size></quota_info>"));
    EXPECT_EQ(dev.request("cgi_adduser_get_user_quota_maxsize", {{"name", "family"}}),
              user_max_answer("102400:0:0:0"));
}

// The bounds beside the quota boxes: per-volume answers in kilobytes as the library
// gives them, and the library calls behind them.
#include <gtest/gtest.h>

#include "accounts_testing.h"

namespace {

// The default device's accounts (alice, bob in "family"; carol in "office"; all three
// in "allaccount", their primary group) with limits in kilobytes.
const std::string kStore = "g\tHD_a2\tfamily\t102400\ng\tHD_b2\tfamily\t51200\ng\tHD_c2\tfamily\t3000\ng\tHD_a2\toffice\t40960\n"
                           "u\tHD_a2\talice\t20480\nu\tHD_a2\tbob\t30720\nu\tHD_b2\tcarol\t9999\nu\tHD_c2\tbob\t1500\n";

void prepare(Device& dev, const std::string& table)
{
    set_volume_table(dev, table);
    dev.write_file("/var/lib/platform/quota", kStore);
}

std::string group_min_answer(const std::string& values)
{
    return xml_utf8_answer("<quota_info>\n<min_size>" + values + "</min_size>\n</quota_info>\n");
}

} // namespace

TEST(QuotaLimits, AddUserMaximumPerVolume)
{
    const struct { const char* what; std::string table, type, name, values; Journal journal; } cases[] = {
        {"plain: the name is a group's, other types are plain", kTwo, "x", "family", "102400:51200:0:0",
         per_volume({"LIB_Quota", "103", "{}", "family"}, 2)},
        {"plain, four volumes; only exactly ad is ad", kFour, "AD", "family", "102400:51200:3000:0",
         per_volume({"LIB_Quota", "103", "{}", "family"}, 4)},
        {"plain, USB between", kUsbBetween, "", "family", "102400:51200:0:0",
         per_volume({"LIB_Quota", "103", "{}", "family"}, 2)},
        {"ad: the smallest limit among the user's groups", kFour, "ad", "alice", "40960:51200:3000:0",
         per_volume({"Lib_Get_Max_User_Quota", "{}", "alice"}, 4)},
        {"ad, USB between", kUsbBetween, "ad", "carol", "40960:0:0:0",
         per_volume({"Lib_Get_Max_User_Quota", "{}", "carol"}, 2)},
        {"no table", kNone, "ad", "alice", "0:0:0:0", {}},
    };
    for (const auto& c : cases) {
        Device dev;
        prepare(dev, c.table);
        // alice is also in team here, limited to 40960 on HD_a2.
        dev.write_file("/etc/group", dev.read_file("/etc/group") + "team:x:1006:alice\n");
        dev.write_file("/var/lib/platform/quota", kStore + "g\tHD_a2\tteam\t40960\n");
        EXPECT_EQ(dev.request("cgi_adduser_get_user_quota_maxsize", {{"name", c.name}, {"type", c.type}}),
                  xml_utf8_answer("<quota_info>\n<max_size>\n" + c.values + "</max_size>\n</quota_info>\n"))
            << c.what;
        EXPECT_EQ(dev.journal(), c.journal) << c.what;
    }
}

TEST(QuotaLimits, AddGroupMinimumPerVolume)
{
    const struct { const char* what; std::string table, type, name, values; Journal journal; } cases[] = {
        {"plain: over the member list", kTwo, "x", "alice,bob,carol", "30720:9999:0:0",
         per_volume({"LIB_Get_Add_New_Group_Min_Quota", "{}", "alice,bob,carol"}, 2)},
        {"plain, four volumes", kFour, "", "bob", "30720:0:1500:0",
         per_volume({"LIB_Get_Add_New_Group_Min_Quota", "{}", "bob"}, 4)},
        {"ad: the name as an existing group", kUsbBetween, "ad", "family", "30720:0:0:0",
         per_volume({"Lib_Get_Min_Group_Quota", "{}", "family"}, 2)},
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
    prepare(dev, kOne);
    std::string members;
    for (int i = 0; i < 7000; ++i)
        members += "user" + std::to_string(i) + ",";
    members += "bob";   // past 55,295 characters: cut away
    EXPECT_EQ(dev.post("cgi_addgroup_get_group_quota_minsize", {{"name", members}}), group_min_answer("0:0:0:0"));
    EXPECT_EQ(dev.journal(), (Journal{{"LIB_Get_Add_New_Group_Min_Quota", "HD_a2", members.substr(0, 55295)}}));
}

TEST(QuotaLimits, BoundOfOneVolumeByNumber)
{
    // The user's maximum takes only an exact number, the group's minimum reads it as a
    // number. A number the table lacks asks the library with an empty directory.
    const struct {
        bool user;                  // the user's maximum, or the group's minimum
        std::string table, hdd, name, bound;
        std::string dir;            // the directory the library is asked about; "-": not asked
    } cases[] = {
        {true, kTwo, "1", "bob", "102400", "HD_a2"},
        {true, kTwo, "2", "bob", "51200", "HD_b2"},
        {true, kUsbBetween, "2", "carol", "0", "HD_b2"},
        {true, kFour, "3", "alice", "3000", "HD_c2"},
        {true, kTwo, "3", "bob", "0", ""},
        {true, kTwo, "01", "bob", "0", "-"},
        {true, kTwo, " 1", "bob", "0", "-"},
        {true, kTwo, "2x", "bob", "0", "-"},
        {true, kTwo, "5", "bob", "0", "-"},
        {true, kTwo, "", "bob", "0", "-"},
        {false, kTwo, "1", "family", "30720", "HD_a2"},
        {false, kTwo, "01", "family", "30720", "HD_a2"},
        {false, kTwo, " +1", "family", "30720", "HD_a2"},
        {false, kUsbBetween, "2x", "office", "9999", "HD_b2"},
        {false, kFour, "3", "allaccount", "1500", "HD_c2"},
        {false, kOne, "1", "office", "0", "HD_a2"},
        {false, kOne, "4", "family", "0", ""},
        {false, kTwo, "5", "family", "0", "-"},
        {false, kTwo, "0", "family", "0", "-"},
        {false, kTwo, "-1", "family", "0", "-"},
        {false, kTwo, "", "family", "0", "-"},
    };
    for (const auto& c : cases) {
        Device dev;
        prepare(dev, c.table);
        // The minimum travels under the maximum's element name, on one line.
        const std::string answer = c.user ? "<quota_info>\n<max_size>" + c.bound + "</max_size>\n</quota_info>\n"
                                          : "<quota_info><max_size>" + c.bound + "</max_size></quota_info>";
        EXPECT_EQ(dev.request(c.user ? "cgi_get_user_quota_maxsize" : "cgi_get_group_quota_minsize",
                              {{"name", c.name}, {"hdd", c.hdd}}),
                  xml_utf8_answer(answer))
            << c.name << " hdd=" << c.hdd;
        const Journal asked{{c.user ? "Lib_Get_Max_User_Quota" : "Lib_Get_Min_Group_Quota", c.dir, c.name}};
        EXPECT_EQ(dev.journal(), c.dir == "-" ? Journal{} : asked) << c.name << " hdd=" << c.hdd;
    }
}

TEST(QuotaLimits, TraceTheQuestionAndTheAnswer)
{
    const struct { const char* cmd; Fields fields; std::string console; } cases[] = {
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

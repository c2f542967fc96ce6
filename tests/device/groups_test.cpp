// Groups: creation and deletion, the new-group and edit-group pages, and the changes
// of quotas, members and name.
#include <gtest/gtest.h>

#include "accounts_testing.h"

namespace {

// One group's deletion; `grep_id` is the group id whose members are saved first ("": none).
Journal deletion_of(const std::string& name, const std::string& first, const std::string& grep_id)
{
    const Journal saved{{"sh", "-c", "more /etc/passwd | grep :" + grep_id + ": > /tmp/tmp_old_group_etc_passwd_user.quota"}};
    return concat({grep_id.empty() ? Journal{} : saved, per_volume({"LIB_Set_Group_Quota", "{}", name, "0"}, 4),
                   ran("account -d -g '" + name + "'"), {{"LIB_FTP_Del_Group", name}, {"delete_user_group_name", first}}});
}

} // namespace

TEST(GroupAdd, CreatesTheGroupWithItsMembers)
{
    const struct {
        const char* what;
        std::string group, member;
        std::string line;           // the group's line in /etc/group afterwards
    } cases[] = {
        {"with members", "team", "alice,carol", "team:x:1006:alice,carol"},
        {"an empty member list is still passed", "solo", "", "solo:x:1006:"},
        {"an existing name: the tool refuses, the rest runs", "family", "carol", "family:x:1004:alice,bob"},
    };
    for (const auto& c : cases) {
        Device dev;
        EXPECT_EQ(dev.request("cgi_group_add", {{"group", c.group}, {"member", c.member}}), kEmptyHtml) << c.what;
        EXPECT_EQ(without(dev.journal(), {"quota_set"}),
                  concat({ran("account -a -g '" + c.group + "' -l '" + c.member + "'"),
                          {{"sh", "-c", "(quota_set -g '" + c.group + "' -s 0 -a >/dev/null 2>&1) &"},
                           {"set_default_deny", "@" + c.group}},
                          reload_events(), {{"LIB_CP_Config_To_MTD", "4194342"}}}))
            << c.what;
        EXPECT_EQ(logged(dev), std::vector<std::string>{"SYSTEM: Group \"" + c.group + "\" has been created."}) << c.what;
        EXPECT_EQ(account_line(dev, "/etc/group", c.group), c.line) << c.what;
    }
}

TEST(GroupAdd, CutsTheBackgroundQuotaLineAt127Characters)
{
    Device dev;
    const std::string name(63, 'g');
    dev.request("cgi_group_add", {{"group", name + "tail"}, {"member", ""}});
    const std::string line = "(quota_set -g '" + name + "' -s 0 -a >/dev/null 2>&1) &";
    EXPECT_EQ(shell_lines(dev.journal()).at(1), line.substr(0, 127));
    // The event and the deny name carry the name as typed, cut to 63 bytes.
    EXPECT_EQ(logged(dev), std::vector<std::string>{"SYSTEM: Group \"" + name + "\" has been created."});
}

TEST(GroupDel, DeletesEachListedGroupKeepingItsMembers)
{
    const Journal family_office = concat({deletion_of("family", "family", "1004"), deletion_of("office", "family", "1005")});
    const std::vector<std::string> both{"SYSTEM: Group \"family\" has been deleted.", "SYSTEM: Group \"office\" has been deleted."};
    const struct { const char* what; std::string list; Journal deletions; std::vector<std::string> events; } cases[] = {
        {"two groups: the clean-up names the first twice", "family,office", family_office, both},
        {"empty items are skipped", "family,,office", family_office, both},
        {"one group", "family", deletion_of("family", "family", "1004"), {both[0]}},
        {"a name that is no group has no id to look for", "ghost", deletion_of("ghost", "ghost", ""),
         {"SYSTEM: Group \"ghost\" has been deleted."}},
        {"only a comma", ",", {}, {}},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.write_file("/etc/passwd", dev.read_file("/etc/passwd") + "fam:x:1010:1004:,,,,:/shares/fam:/bin/sh\n");
        dev.write_file("/var/lib/platform/quota", "g\tHD_a2\tfamily\t2048\ng\tHD_a2\toffice\t4096\n");
        EXPECT_EQ(dev.request("cgi_group_del", {{"group", c.list}}), kEmptyHtml) << c.what;
        EXPECT_EQ(dev.journal(), concat({{{"LIB_WEB_STOP_FTP"}}, c.deletions,
                                         {{"LIB_Rejoin_Other_Group_Quota"}, {"LIB_WEB_START_FTP"}}, reload_events(),
                                         {{"LIB_CP_Config_To_MTD", "4194342"},
                                          {"sh", "-c", "makedav start > /dev/null 2>&1 &"}, {"makedav", "start"}}}))
            << c.what;
        EXPECT_EQ(logged(dev), c.events) << c.what;
        if (c.list != "family")
            continue;
        EXPECT_EQ(account_line(dev, "/etc/group", "family"), "(none)");
        EXPECT_EQ(account_field(dev, "/etc/passwd", "fam", 3), "1000");     // its primary group falls back
        EXPECT_EQ(dev.read_file("/tmp/tmp_old_group_etc_passwd_user.quota"), "fam:x:1010:1004:,,,,:/shares/fam:/bin/sh\n");
        EXPECT_EQ(dev.read_file("/var/lib/platform/quota"), "g\tHD_a2\toffice\t4096\n");
        EXPECT_EQ(dev.read_file("/var/lib/platform/shares").find("@family"), std::string::npos);   // its access entry
    }
}

TEST(GroupInfo, NamesTheInternalVolumes)
{
    const struct {
        const char* what;
        std::string table;          // "(none)": no shared_name file
        std::string body;
    } cases[] = {
        {"two volumes", "Volume_1 = HD_a2\nVolume_2 = HD_b2\n",
         "<v_name>Volume_1</v_name><v_name>Volume_2</v_name><hddnum>2</hddnum><hddsize>1877538,937795</hddsize>"},
        {"USB left out, a blank line repeats the name before", "Volume_1 = HD_a2\n\nUSB_2 = sdc1\n",
         "<v_name>Volume_1</v_name><v_name>Volume_1</v_name><hddnum>1</hddnum><hddsize>1877538</hddsize>"},
        {"no table", "(none)", "<hddnum>0</hddnum><hddsize>null,null,null,null</hddsize>"},
    };
    for (const auto& c : cases) {
        Device dev;
        set_volume_table(dev, c.table);
        EXPECT_EQ(dev.request("cgi_get_group_info"), xml_answer("<group_info>" + c.body + "</group_info>")) << c.what;
    }
}

TEST(GroupEditInfo, ShowsTheLimitsInMegabytes)
{
    const struct {
        const char* what;
        std::string group;
        std::string table;
        std::string quotas;
        Journal journal;
    } cases[] = {
        {"limits per internal volume, 1023 KB shows 0", "family", "Volume_1 = HD_a2\nUSB_1 = sdc1\nVolume_2 = HD_b2\n",
         "<quota><v_name>Volume_1</v_name><size>2</size></quota><quota><v_name>Volume_2</v_name><size>0</size></quota>",
         per_volume({"LIB_Quota", "103", "{}", "family"}, 2)},
        {"an empty name is asked for too", "", "Volume_1 = HD_a2\n",
         "<quota><v_name>Volume_1</v_name><size>0</size></quota>", {{"LIB_Quota", "103", "HD_a2", ""}}},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.write_file("/etc/shared_name", c.table);
        dev.write_file("/var/lib/platform/quota", "g\tHD_a2\tfamily\t2048\ng\tHD_b2\tfamily\t1023\n");
        const std::string counts = c.table.find("Volume_2") != std::string::npos
            ? "<hddnum>2</hddnum><hddsize>1877538,937795</hddsize>"
            : "<hddnum>1</hddnum><hddsize>1877538</hddsize>";
        EXPECT_EQ(dev.request("cgi_get_modify_group_info", {{"group", c.group}, {"type", "x"}}),
                  xml_answer("<group_info>" + counts + c.quotas + "</group_info>"))
            << c.what;
        EXPECT_EQ(without(dev.journal(), {"LIB_Get_Disk_Size"}), c.journal) << c.what;
    }
}

TEST(GroupModify, ChangesQuotasMembersOrName)
{
    const struct { const char* what; Fields fields; Journal journal; } cases[] = {
        {"1: limits on two internal volumes, the rest ignored",
         {{"mtype", "1"}, {"group", "family"}, {"available1", "2"}, {"available3", "9"}, {"available4", "9"}},
         {{"LIB_Set_Group_Quota", "HD_a2", "family", "2048"}, {"LIB_Set_Group_Quota", "HD_b2", "family", "0"}}},
        {"2: members", {{"mtype", "2"}, {"group", "family"}, {"member", "carol"}},
         ran("account -m -g 'family' -l 'carol'")},
        {"3: rename, follow-ups even when the tool fails", {{"mtype", "3"}, {"oldGroup", "ghost"}, {"group", "spirit"}},
         concat({ran("account -g 'ghost' -o 'spirit'"),
                 {{"change_user_group_name", "ghost", "spirit"}, {"LIB_FTP_Change_User_Group", "1", "ghost", "spirit"},
                  {"sh", "-c", "makedav start > /dev/null 2>&1 &"}},
                 ran("afpcom >/dev/null 2>&1")})},
        {"other types change nothing", {{"mtype", "4"}, {"group", "family"}, {"member", "carol"}}, {}},
    };
    for (const auto& c : cases) {
        Device dev;
        EXPECT_EQ(dev.request("cgi_modify_group", c.fields), kEmptyHtml) << c.what;
        EXPECT_EQ(without(dev.journal(), {"makedav"}), concat({c.journal, {{"LIB_CP_Config_To_MTD", "4194306"}}}))
            << c.what;
    }
}

TEST(GroupModify, TheDeviceChanges)
{
    Device dev;
    dev.trace_on();
    dev.request("cgi_modify_group", {{"mtype", "2"}, {"group", "family"}, {"member", "carol,bob"}});
    EXPECT_EQ(account_line(dev, "/etc/group", "family"), "family:x:1004:carol,bob");
    dev.request("cgi_modify_group", {{"mtype", "1"}, {"group", "family"}, {"available1", "5"}});
    dev.request("cgi_modify_group", {{"mtype", "3"}, {"oldGroup", "family"}, {"group", "kin"}});
    EXPECT_EQ(dev.console(), "account -g 'family' -o 'kin'");     // no line end
    EXPECT_EQ(account_line(dev, "/etc/group", "kin"), "kin:x:1004:carol,bob");
    EXPECT_EQ(dev.read_file("/var/lib/platform/quota"), "g\tHD_a2\tkin\t5120\n");
    EXPECT_NE(dev.read_file("/var/lib/platform/shares").find("@kin:1"), std::string::npos);
}

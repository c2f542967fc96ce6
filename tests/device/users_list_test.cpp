// The users page: the paged grid of local or domain users, and the totals and names.
#include <gtest/gtest.h>

#include "accounts_testing.h"

namespace {

// A password file of the reserved root and the named users, without groups.
std::string passwd_of(const std::vector<std::string>& names)
{
    std::string text = "root:x:0:0:root:/home/root:/bin/sh\nadmin:x:500:1001:Administrator,,,,:/shares:/bin/sh\n";
    int uid = 1001;
    for (const std::string& name : names)
        text += name + ":x:" + std::to_string(uid++) + ":1000:,,,,:/shares/" + name + ":/bin/sh\n";
    return text;
}

std::vector<std::string> numbered(const char* prefix, int count)
{
    std::vector<std::string> names;
    for (int i = 1; i <= count; ++i)
        names.push_back(prefix + std::string(i < 10 ? "0" : "") + std::to_string(i));
    return names;
}

// The grid's rows from `first_id` on, one per name with an empty group cell.
std::string rows(int first_id, const std::vector<std::string>& names, const std::string& page, int total)
{
    std::string body = "<rows>";
    for (const std::string& name : names)
        body += "<row id=\"" + std::to_string(first_id++) + "\"><cell>" + name + "</cell><cell></cell></row>";
    return body + "<page>" + page + "</page><total>" + std::to_string(total) + "</total></rows>";
}

} // namespace

TEST(UserList, ListsLocalUsersWithTheirGroups)
{
    Device dev;
    EXPECT_EQ(dev.request("cgi_get_user_list", {{"page", "1"}, {"rp", "10"}}),
              xml_answer("<rows><row id=\"1\"><cell>alice</cell><cell>family</cell></row>"
                         "<row id=\"2\"><cell>bob</cell><cell>family</cell></row>"
                         "<row id=\"3\"><cell>carol</cell><cell>office</cell></row>"
                         "<page>1</page><total>3</total></rows>"));
    // The groups are asked for the shown rows only.
    EXPECT_EQ(dev.journal(), (Journal{{"LIB_Web_Get_User_Join_Group", "alice"},
                                      {"LIB_Web_Get_User_Join_Group", "bob"},
                                      {"LIB_Web_Get_User_Join_Group", "carol"}}));
}

TEST(UserList, PagesAndFiltersAsTheGridCounts)
{
    const auto users25 = numbered("u", 25);
    auto users30 = numbered("u", 30);
    users30[4] = "xa";      // three of thirty match "x": items 5, 12 and 27
    users30[11] = "xb";
    users30[26] = "xc";
    const struct { const char* what; std::vector<std::string> users; Fields fields; std::string body; } cases[] = {
        {"page 2 of 25", users25, {{"page", "2"}, {"rp", "10"}},
         rows(11, {users25.begin() + 10, users25.begin() + 20}, "2", 25)},
        {"page 1 waits for matches", users30, {{"page", "1"}, {"rp", "10"}, {"query", "x"}, {"qtype", "name"}},
         rows(1, {"xa", "xb", "xc"}, "1", 3)},
        {"page 2 counts the first ten unfiltered", users30,
         {{"page", "2"}, {"rp", "10"}, {"query", "x"}, {"qtype", "name"}}, rows(11, {"xb", "xc"}, "2", 12)},
        {"another search kind does not filter", users25,
         {{"page", "3"}, {"rp", "10"}, {"query", "zzz"}, {"qtype", "group"}},
         rows(21, {users25.begin() + 20, users25.end()}, "3", 25)},
        {"a page that is no number shows nothing", users25, {{"page", "abc"}, {"rp", "10"}}, rows(1, {}, "abc", 25)},
        {"no paging fields", users25, {}, rows(1, {}, "", 25)},
        {"the page text is cut to three characters", users25, {{"page", "0002"}, {"rp", "10"}}, rows(1, {}, "000", 25)},
        {"the search is case-sensitive", users30, {{"page", "1"}, {"rp", "10"}, {"query", "X"}, {"qtype", "name"}},
         rows(1, {}, "1", 0)},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.write_file("/etc/passwd", passwd_of(c.users));
        dev.write_file("/etc/group", "allaccount:x:1000:\n");
        EXPECT_EQ(dev.request("cgi_get_user_list", c.fields), xml_answer(c.body)) << c.what;
    }
}

TEST(UserList, ShowsTheDomainUsersWhileJoined)
{
    std::string thousand;
    std::vector<std::string> shown;     // the last page of the 800 counted
    for (int i = 0; i < 1000; ++i) {
        thousand += (i ? ",d" : "d") + std::to_string(i);
        if (i >= 790 && i < 800)
            shown.push_back("EXAMPLE\\d" + std::to_string(i));
    }
    const struct {
        const char* what;
        std::string users;          // "(no domain)": no domain file
        Fields fields;
        std::string body;
    } cases[] = {
        {"the device's own and the ticket account are left out",
         "Administrator,krbtgt,j&doe,NASDEVICE+admin,nasdevice+guest,OTHER+x,Krbtgt", {{"page", "1"}, {"rp", "10"}},
         rows(1, {"EXAMPLE\\Administrator", "EXAMPLE\\j&amp;doe", "EXAMPLE\\OTHER+x", "EXAMPLE\\Krbtgt"}, "1", 4)},
        {"the search sees the line without the workgroup", "jdoe,msmith,jroe",
         {{"page", "1"}, {"rp", "10"}, {"query", "j"}, {"qtype", "name"}},
         rows(1, {"EXAMPLE\\jdoe", "EXAMPLE\\jroe"}, "1", 2)},
        {"at most 800 are counted", thousand, {{"page", "80"}, {"rp", "10"}}, rows(791, shown, "80", 800)},
        {"no domain reachable: nothing listed", "(no domain)", {{"page", "1"}, {"rp", "10"}}, rows(1, {}, "1", 0)},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.config({{"/system_mgr/samba/ads_enable", "1"}, {"/system_mgr/samba/ads_workgroup", "EXAMPLE"}});
        if (c.users == "(no domain)")
            dev.remove("/sim/domain.conf");
        else
            dev.write_file("/sim/domain.conf", "workgroup=EXAMPLE\nusers=" + c.users + "\n");
        EXPECT_EQ(dev.request("cgi_get_user_list", c.fields), xml_answer(c.body)) << c.what;
        EXPECT_EQ(dev.journal(), ran("wbinfo -u")) << c.what;
    }
}

TEST(UserInfo, GivesTotalsNamesAndVolumes)
{
    const std::string accounts = "<total>3</total><all_user>alice#bob#carol</all_user><all_group>family#office</all_group>";
    const struct {
        const char* what;
        std::string table;
        std::string passwd;         // "(default)": the image's
        std::string body;
        Journal journal;
    } cases[] = {
        {"the demo device, which also traces its counts", kTwo, "(default)",
         accounts + "<hddnum>2</hddnum><hddsize>1877538,937795</hddsize><v_name>Volume_1</v_name><v_name>Volume_2</v_name>",
         per_volume({"LIB_Get_Disk_Size", "/mnt/HD/{}"}, 2)},
        {"USB volumes get no name; a blank line repeats the one before", "Volume_1 = HD_a2\nUSB_1 = sdc1\n\n",
         "(default)", accounts + "<hddnum>1</hddnum><hddsize>1877538</hddsize><v_name>Volume_1</v_name>",
         {{"LIB_Get_Disk_Size", "/mnt/HD/HD_a2"}}},
        {"no volume table, no users", kNone, "root:x:0:0::/:/bin/sh\n",
         "<total>0</total><all_user></all_user><all_group>family#office</all_group>"
         "<hddnum>0</hddnum><hddsize>null,null,null,null</hddsize>",
         {}},
    };
    for (const auto& c : cases) {
        Device dev;
        set_volume_table(dev, c.table);
        if (c.passwd != "(default)")
            dev.write_file("/etc/passwd", c.passwd);
        dev.trace_on();
        EXPECT_EQ(dev.request("cgi_get_user_info"), xml_utf8_answer("<user_info>\n" + c.body + "</user_info>")) << c.what;
        EXPECT_EQ(dev.journal(), c.journal) << c.what;
        if (c.table == kTwo) {
            EXPECT_EQ(dev.console(), "------get user info--------\nnum=3\nalluser=alice#bob#carol\nhd_num=2\n"
                                     "hd_size=1877538,937795\n---------------------------\n");
        }
    }
}

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

std::string rows(const std::vector<std::pair<int, std::string>>& items, const std::string& page, int total)
{
    std::string body = "<rows>";
    for (const auto& [id, name] : items)
        body += "<row id=\"" + std::to_string(id) + "\"><cell>" + name + "</cell><cell></cell></row>";
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
    const struct {
        const char* what;
        std::vector<std::string> users;
        Fields fields;
        std::string body;
    } cases[] = {
        {"page 2 of 25", users25, {{"page", "2"}, {"rp", "10"}},
         rows({{11, "u11"}, {12, "u12"}, {13, "u13"}, {14, "u14"}, {15, "u15"}, {16, "u16"}, {17, "u17"},
               {18, "u18"}, {19, "u19"}, {20, "u20"}}, "2", 25)},
        {"page 1 waits for matches", users30, {{"page", "1"}, {"rp", "10"}, {"query", "x"}, {"qtype", "name"}},
         rows({{1, "xa"}, {2, "xb"}, {3, "xc"}}, "1", 3)},
        {"page 2 counts the first ten unfiltered", users30,
         {{"page", "2"}, {"rp", "10"}, {"query", "x"}, {"qtype", "name"}}, rows({{11, "xb"}, {12, "xc"}}, "2", 12)},
        {"another search kind does not filter", users25,
         {{"page", "3"}, {"rp", "10"}, {"query", "zzz"}, {"qtype", "group"}},
         rows({{21, "u21"}, {22, "u22"}, {23, "u23"}, {24, "u24"}, {25, "u25"}}, "3", 25)},
        {"a page that is no number shows nothing", users25, {{"page", "abc"}, {"rp", "10"}}, rows({}, "abc", 25)},
        {"no paging fields", users25, {}, rows({}, "", 25)},
        {"the page text is cut to three characters", users25, {{"page", "0002"}, {"rp", "10"}}, rows({}, "000", 25)},
        {"the search is case-sensitive", users30, {{"page", "1"}, {"rp", "10"}, {"query", "X"}, {"qtype", "name"}},
         rows({}, "1", 0)},
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
    for (int i = 0; i < 1000; ++i)
        thousand += (i ? "," : "") + std::string("d") + std::to_string(i);
    const struct {
        const char* what;
        std::string users;          // "(no domain)": no domain file
        Fields fields;
        std::string body;
    } cases[] = {
        {"the device's own and the ticket account are left out",
         "Administrator,krbtgt,j&doe,NASDEVICE+admin,nasdevice+guest,OTHER+x,Krbtgt", {{"page", "1"}, {"rp", "10"}},
         "<rows><row id=\"1\"><cell>EXAMPLE\\Administrator</cell><cell></cell></row>"
         "<row id=\"2\"><cell>EXAMPLE\\j&amp;doe</cell><cell></cell></row>"
         "<row id=\"3\"><cell>EXAMPLE\\OTHER+x</cell><cell></cell></row>"
         "<row id=\"4\"><cell>EXAMPLE\\Krbtgt</cell><cell></cell></row>"
         "<page>1</page><total>4</total></rows>"},
        {"the search sees the line without the workgroup", "jdoe,msmith,jroe",
         {{"page", "1"}, {"rp", "10"}, {"query", "j"}, {"qtype", "name"}},
         "<rows><row id=\"1\"><cell>EXAMPLE\\jdoe</cell><cell></cell></row>"
         "<row id=\"2\"><cell>EXAMPLE\\jroe</cell><cell></cell></row><page>1</page><total>2</total></rows>"},
        {"at most 800 are counted", thousand, {{"page", "80"}, {"rp", "10"}},
         "<rows><row id=\"791\"><cell>EXAMPLE\\d790</cell><cell></cell></row>"
         "<row id=\"792\"><cell>EXAMPLE\\d791</cell><cell></cell></row>"
         "<row id=\"793\"><cell>EXAMPLE\\d792</cell><cell></cell></row>"
         "<row id=\"794\"><cell>EXAMPLE\\d793</cell><cell></cell></row>"
         "<row id=\"795\"><cell>EXAMPLE\\d794</cell><cell></cell></row>"
         "<row id=\"796\"><cell>EXAMPLE\\d795</cell><cell></cell></row>"
         "<row id=\"797\"><cell>EXAMPLE\\d796</cell><cell></cell></row>"
         "<row id=\"798\"><cell>EXAMPLE\\d797</cell><cell></cell></row>"
         "<row id=\"799\"><cell>EXAMPLE\\d798</cell><cell></cell></row>"
         "<row id=\"800\"><cell>EXAMPLE\\d799</cell><cell></cell></row>"
         "<page>80</page><total>800</total></rows>"},
        {"no domain reachable: nothing listed", "(no domain)", {{"page", "1"}, {"rp", "10"}},
         "<rows><page>1</page><total>0</total></rows>"},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.config({{"/system_mgr/samba/ads_enable", "1"}, {"/system_mgr/samba/ads_workgroup", "EXAMPLE"}});
        if (c.users == "(no domain)")
            dev.remove("/sim/domain.conf");
        else
            dev.write_file("/sim/domain.conf", "workgroup=EXAMPLE\nusers=" + c.users + "\n");
        EXPECT_EQ(dev.request("cgi_get_user_list", c.fields), xml_answer(c.body)) << c.what;
        EXPECT_EQ(dev.journal(), (Journal{{"sh", "-c", "wbinfo -u"}, {"wbinfo", "-u"}})) << c.what;
    }
}

TEST(UserInfo, GivesTotalsNamesAndVolumes)
{
    const struct {
        const char* what;
        std::string table;          // "(none)": no shared_name file
        std::string passwd;         // "(default)": the image's
        std::string body;
        Journal journal;
    } cases[] = {
        {"the demo device", "Volume_1 = HD_a2\nVolume_2 = HD_b2\n", "(default)",
         "<user_info>\n<total>3</total><all_user>alice#bob#carol</all_user><all_group>family#office</all_group>"
         "<hddnum>2</hddnum><hddsize>1877538,937795</hddsize><v_name>Volume_1</v_name><v_name>Volume_2</v_name>"
         "</user_info>",
         {{"LIB_Get_Disk_Size", "/mnt/HD/HD_a2"}, {"LIB_Get_Disk_Size", "/mnt/HD/HD_b2"}}},
        {"USB volumes get no name; a blank line repeats the one before", "Volume_1 = HD_a2\nUSB_1 = sdc1\n\n",
         "(default)",
         "<user_info>\n<total>3</total><all_user>alice#bob#carol</all_user><all_group>family#office</all_group>"
         "<hddnum>1</hddnum><hddsize>1877538</hddsize><v_name>Volume_1</v_name></user_info>",
         {{"LIB_Get_Disk_Size", "/mnt/HD/HD_a2"}}},
        {"no volume table, no users", "(none)", "root:x:0:0::/:/bin/sh\n",
         "<user_info>\n<total>0</total><all_user></all_user><all_group>family#office</all_group>"
         "<hddnum>0</hddnum><hddsize>null,null,null,null</hddsize></user_info>",
         {}},
    };
    for (const auto& c : cases) {
        Device dev;
        set_volume_table(dev, c.table);
        if (c.passwd != "(default)")
            dev.write_file("/etc/passwd", c.passwd);
        EXPECT_EQ(dev.request("cgi_get_user_info"), xml_utf8_answer(c.body)) << c.what;
        EXPECT_EQ(dev.journal(), c.journal) << c.what;
    }
}

TEST(UserInfo, TracesItsCounts)
{
    Device dev;
    dev.trace_on();
    dev.request("cgi_get_user_info");
    EXPECT_EQ(dev.console(), "------get user info--------\nnum=3\nalluser=alice#bob#carol\nhd_num=2\n"
                             "hd_size=1877538,937795\n---------------------------\n");
}

// DFS: the switch, groups and links, the two grids and the look-ups.
#include <gtest/gtest.h>

#include <string>

#include "device.h"

namespace {

// Links as the Samba library keeps them: host, path, link name, group.
const std::string kLinks = "fileserver\tDocuments\tdocs\tSales\n"
                           "fileserver\tMedia\tmedia\tSales\n"
                           "nas2\tBackup\tbackup\tIT\n"
                           "nas2\tR&D <new>\tlab\tSales\n";
const std::string kGroups = "Sales\nIT\nR&D\n";

// The store of the switch, its save and the Samba rebuild.
Journal switch_journal(const std::string& value)
{
    return {{"xml_set_str", "/system_mgr/samba/dfs_enable", value},
            {"xml_write_file", "/etc/NAS_CFG/config.xml"},
            {"LIB_CP_Config_To_MTD", "1"},
            {"sh", "-c", "smbcom >/dev/null 2>&1"},
            {"smbcom"}};
}

Journal operator+(Journal a, const Journal& b)
{
    a.insert(a.end(), b.begin(), b.end());
    return a;
}

// After every group or link change: the links rebuilt, then the save of the given parts.
Journal rebuild(const std::string& parts)
{
    return {{"create_dfs_link"}, {"LIB_CP_Config_To_MTD", parts}};
}

} // namespace

TEST(DfsSwitch, StoresTheValueAndRebuildsTheLinks)
{
    for (const std::string value : {"1", "0", "on", "1234567"}) {
        Device dev;
        EXPECT_EQ(dev.request("cgi_set_dfs_enable", {{"dfs", value + "89"}}), kEmptyHtml);
        const std::string stored = (value + "89").substr(0, 7);
        EXPECT_EQ(dev.journal(), switch_journal(stored) + Journal{{"create_dfs_link"}}) << value;
        EXPECT_EQ(dev.config_value("/system_mgr/samba/dfs_enable"), stored) << value;
    }
}

TEST(DfsGroups, FlagOneCreatesAnythingElseRenamesAndTheFirstChangeSwitchesDfsOn)
{
    const struct {
        const char* what;
        std::string flag, dfs_enable;
        Journal change;
        bool switches_on;
        std::string groups_after;
    } cases[] = {
        {"create while off", "1", "0", {{"add_dfs_group_node", "HR"}}, true, "Sales\nIT\nR&D\nHR\n"},
        {"create while on", "1", "1", {{"add_dfs_group_node", "HR"}}, false, "Sales\nIT\nR&D\nHR\n"},
        {"flag 10 renames", "10", "1", {{"mod_dfs_group_node", "IT", "HR"}}, false, "Sales\nHR\nR&D\n"},
        {"empty flag renames", "", "0", {{"mod_dfs_group_node", "IT", "HR"}}, true, "Sales\nHR\nR&D\n"},
        {"a switch that is no number stays", "1", "yes", {{"add_dfs_group_node", "HR"}}, false,
         "Sales\nIT\nR&D\nHR\n"},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.write_file("/var/lib/platform/dfs_groups", kGroups);
        dev.write_file("/var/lib/platform/dfs_links", kLinks);
        dev.config({{"/system_mgr/samba/dfs_enable", c.dfs_enable}});
        EXPECT_EQ(dev.request("cgi_set_dfs_group", {{"group", "HR"}, {"old_group", "IT"}, {"flag", c.flag}}),
                  kEmptyHtml)
            << c.what;
        EXPECT_EQ(dev.journal(), c.change + (c.switches_on ? switch_journal("1") : Journal{}) + rebuild("100663296"))
            << c.what;
        EXPECT_EQ(dev.read_file("/var/lib/platform/dfs_groups"), c.groups_after) << c.what;
    }
}

TEST(DfsLinks, ChangesGoToTheLibraryThenRebuildAndSave)
{
    const std::string long_name(200, 'n');
    const std::string add = "100663296", del = "67108864";
    const struct {
        const char* what;
        std::string cmd;
        Fields fields;
        Event change;
        std::string parts, links_after;
    } cases[] = {
        {"add", "cgi_set_dfs", {{"host", "nas3"}, {"sharename", "music"}, {"path", "Music"}, {"group", "IT"}},
         {"add_dfs_node", "nas3", "Music", "music", "IT"}, add, kLinks + "nas3\tMusic\tmusic\tIT\n"},
        {"add cuts the name to 127 bytes", "cgi_set_dfs",
         {{"host", "nas3"}, {"sharename", long_name}, {"path", "Music"}, {"group", "IT"}},
         {"add_dfs_node", "nas3", "Music", long_name.substr(0, 127), "IT"}, add,
         kLinks + "nas3\tMusic\t" + long_name.substr(0, 127) + "\tIT\n"},
        {"modify, found by old name and group", "cgi_modify_dfs",
         {{"host", "nas9"}, {"sharename", "video"}, {"path", "Video"}, {"group", "IT"}, {"old_share", "media"},
          {"old_group", "Sales"}},
         {"mod_dfs_node", "nas9", "Video", "video", "IT", "media", "Sales"}, add,
         "fileserver\tDocuments\tdocs\tSales\nnas9\tVideo\tvideo\tIT\nnas2\tBackup\tbackup\tIT\n"
         "nas2\tR&D <new>\tlab\tSales\n"},
        {"delete", "cgi_del_dfs", {{"group", "Sales"}, {"local", "docs"}}, {"del_dfs_node", "docs", "Sales"}, del,
         "fileserver\tMedia\tmedia\tSales\nnas2\tBackup\tbackup\tIT\nnas2\tR&D <new>\tlab\tSales\n"},
        {"delete of a link the group does not have", "cgi_del_dfs", {{"group", "IT"}, {"local", "docs"}},
         {"del_dfs_node", "docs", "IT"}, del, kLinks},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.write_file("/var/lib/platform/dfs_links", kLinks);
        EXPECT_EQ(dev.request(c.cmd, c.fields), kEmptyHtml) << c.what;
        EXPECT_EQ(dev.journal(), Journal{c.change} + rebuild(c.parts)) << c.what;   // DFS is never switched on
        EXPECT_EQ(dev.read_file("/var/lib/platform/dfs_links"), c.links_after) << c.what;
    }
}

TEST(DfsGrids, NumberTheItemsOfTheListFromOne)
{
    std::string many_links;
    std::string many_groups;
    for (int i = 1; i <= 25; ++i) {
        many_links += "h" + std::to_string(i) + "\tp\tl" + std::to_string(i) + "\t" + (i % 2 ? "odd" : "even") + "\n";
        many_groups += "g" + std::to_string(i) + "\n";
    }
    auto link_row = [](int id, int n) {
        return "<row id=\"" + std::to_string(id) + "\"><cell>l" + std::to_string(n) + "</cell><cell>h" +
               std::to_string(n) + "</cell><cell>p</cell></row>";
    };
    auto group_row = [](int n) {
        return "<row id=\"" + std::to_string(n) + "\"><cell>g" + std::to_string(n) + "</cell></row>";
    };
    std::string odd_page2;   // the 13 odd links are numbered 1..13; page 2 of 5 shows 6..10
    for (int id = 6; id <= 10; ++id)
        odd_page2 += link_row(id, 2 * id - 1);
    std::string all_groups, groups_page3;
    for (int n = 1; n <= 25; ++n)
        all_groups += group_row(n);
    for (int n = 21; n <= 25; ++n)
        groups_page3 += group_row(n);

    const struct {
        const char* what;
        std::string cmd;
        Fields fields;
        std::string body;
    } cases[] = {
        {"links of one group, page 2", "cgi_get_dfs_list", {{"page", "2"}, {"rp", "5"}, {"f_field", "odd"}},
         "<rows>" + odd_page2 + "<page>2</page><total>13</total></rows>"},
        {"a group no link has", "cgi_get_dfs_list", {{"page", "1"}, {"rp", "10"}, {"f_field", "Odd"}},
         "<rows><page>1</page><total>0</total></rows>"},
        {"page 0 shows nothing but counts", "cgi_get_dfs_list", {{"page", "0"}, {"rp", "10"}, {"f_field", "even"}},
         "<rows><page>0</page><total>12</total></rows>"},
        {"page text echoed as sent", "cgi_get_dfs_list", {{"page", "abc"}, {"rp", "10"}, {"f_field", "even"}},
         "<rows><page>abc</page><total>12</total></rows>"},
        {"groups, the last page", "cgi_get_dfs_gorup_list", {{"page", "3"}, {"rp", "10"}},
         "<rows>" + groups_page3 + "<page>3</page><total>25</total></rows>"},
        {"groups without paging", "cgi_get_dfs_gorup_list", {},
         "<rows><page></page><total>25</total></rows>"},
        {"page cut to 7 characters", "cgi_get_dfs_gorup_list", {{"page", "1234567890"}, {"rp", "1"}},
         "<rows><page>1234567</page><total>25</total></rows>"},
        {"a page past the end", "cgi_get_dfs_gorup_list", {{"page", "4"}, {"rp", "10"}},
         "<rows><page>4</page><total>25</total></rows>"},
        {"a negative page", "cgi_get_dfs_gorup_list", {{"page", "-1"}, {"rp", "10"}},
         "<rows><page>-1</page><total>25</total></rows>"},
        {"no rows per page", "cgi_get_dfs_list", {{"page", "2"}, {"rp", "0"}, {"f_field", "odd"}},
         "<rows><page>2</page><total>13</total></rows>"},
        {"more rows per page than items", "cgi_get_dfs_gorup_list", {{"page", "1"}, {"rp", "100"}},
         "<rows>" + all_groups + "<page>1</page><total>25</total></rows>"},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.write_file("/var/lib/platform/dfs_links", many_links);
        dev.write_file("/var/lib/platform/dfs_groups", many_groups);
        EXPECT_EQ(dev.request(c.cmd, c.fields), xml_answer(c.body)) << c.what;
    }
}

// The look-ups on the default links and groups, with DFS on.
TEST(DfsQueries, AnswerFromTheLibrary)
{
    const std::string one = "<info><status>1</status></info>\n", zero = "<info><status>0</status></info>\n";
    const struct {
        const char* what;
        std::string cmd;
        Fields fields;
        std::string body;
        Journal journal;
    } cases[] = {
        {"switch and escaped group names", "cgi_get_dfs_info", {},
         "<dfs_info><enable>1</enable><groupname>Sales</groupname><groupname>IT</groupname>"
         "<groupname>R&amp;D</groupname></dfs_info>", {{"get_dfs_group_info"}}},
        {"the second text of every link", "cgi_get_dfs_sharename", {},
         "<dfs_info><sharename>Documents</sharename><sharename>Media</sharename><sharename>Backup</sharename>"
         "<sharename>R&amp;D &lt;new&gt;</sharename></dfs_info>", {{"get_dfs_info"}}},
        {"link grid, page 1", "cgi_get_dfs_list", {{"page", "1"}, {"rp", "2"}, {"f_field", "Sales"}},
         "<rows><row id=\"1\"><cell>docs</cell><cell>fileserver</cell><cell>Documents</cell></row>"
         "<row id=\"2\"><cell>media</cell><cell>fileserver</cell><cell>Media</cell></row>"
         "<page>1</page><total>3</total></rows>", {{"get_dfs_info"}}},
        {"link grid cells escaped", "cgi_get_dfs_list", {{"page", "2"}, {"rp", "2"}, {"f_field", "Sales"}},
         "<rows><row id=\"3\"><cell>lab</cell><cell>nas2</cell><cell>R&amp;D &lt;new&gt;</cell></row>"
         "<page>2</page><total>3</total></rows>", {{"get_dfs_info"}}},
        {"folders of a reachable host", "cgi_get_host_folder", {{"host", "fileserver"}},
         "<info><folder>Documents</folder><folder>Media</folder><folder>Projects</folder><status>1</status>\n"
         "<count>3</count>\n</info>", {{"get_host_share_name", "fileserver"}}},
        {"a host without folders", "cgi_get_host_folder", {{"host", "emptyhost"}},
         "<info><status>1</status>\n<count>0</count>\n</info>", {{"get_host_share_name", "emptyhost"}}},
        {"an unreachable host", "cgi_get_host_folder", {{"host", "nowhere"}},
         "<info><status>-1</status>\n<count>0</count>\n</info>", {{"get_host_share_name", "nowhere"}}},
        {"group exists", "cgi_chk_dfs_group", {{"group", "IT"}}, one, {{"chk_dfs_group_exist", "IT"}}},
        {"group is new", "cgi_chk_dfs_group", {{"group", "it"}}, zero, {{"chk_dfs_group_exist", "it"}}},
        {"link in that group", "cgi_chk_dfs", {{"host", "x"}, {"remote_share", "y"}, {"sharename", "docs"}, {"group", "Sales"}},
         one, {{"get_dfs_info"}, {"chk_dfs_node_exist", "Sales", "docs"}}},
        {"link name used in another group", "cgi_chk_dfs", {{"sharename", "backup"}, {"group", "Sales"}}, zero,
         {{"get_dfs_info"}, {"chk_dfs_node_exist", "Sales", "backup"}}},
        {"no link has the name: 2", "cgi_chk_dfs", {{"sharename", "nothing"}, {"group", "Sales"}},
         "<info><status>2</status></info>\n", {{"get_dfs_info"}}},
    };
    for (const auto& c : cases) {
        Device dev;
        dev.write_file("/var/lib/platform/dfs_links", kLinks);
        dev.write_file("/var/lib/platform/dfs_groups", kGroups);
        dev.config({{"/system_mgr/samba/dfs_enable", "1"}});
        EXPECT_EQ(dev.request(c.cmd, c.fields), xml_answer(c.body)) << c.what;
        EXPECT_EQ(dev.journal(), c.journal) << c.what;
    }
}

TEST(DfsQueries, NoGroupsAndNoSwitch)
{
    Device dev;
    dev.remove("/var/lib/platform/dfs_groups");
    dev.remove_config("/system_mgr/samba/dfs_enable");
    EXPECT_EQ(dev.request("cgi_get_dfs_info"), xml_answer("<dfs_info><enable>-1</enable></dfs_info>"));
}

// The DFS switch and DFS groups, the named collections of DFS links. There is no
// command that deletes a group.
#include "cgi/event_log.h"
#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "cgi/grid.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/shell.h"
#include "platform/config_store.h"
#include "platform/flash.h"
#include "platform/samba.h"
#include "volumes/names.h"

namespace {

// What the flash copy saves after a config-store change, and after a group change.
constexpr int kSaveConfig = 1;
constexpr int kSaveDfsChange = 0x6000000;

void store_dfs_switch(const char* value)
{
    xml_set_str("/system_mgr/samba/dfs_enable", value);
    xml_write_file("/etc/NAS_CFG/config.xml");
    LIB_CP_Config_To_MTD(kSaveConfig);
    run_system("smbcom >/dev/null 2>&1");
}

} // namespace

void cgi_set_dfs_enable()
{
    const auto dfs = form_value<8>("dfs");
    store_dfs_switch(dfs.c_str());
    create_dfs_link();
    answer_empty_html();
}

void cgi_get_dfs_info()
{
    const int enable = xml_get_int("/system_mgr/samba/dfs_enable");
    write_xml_header(Charset::Plain);
    write_xml_prologue();
    out("<dfs_info><enable>%d</enable>", enable);
    get_dfs_group_info();
    for (const name_list* group = pnl; group; group = group->next) {
        out("<groupname>");
        cgiHtmlEscape(group->name);
        out("</groupname>");
    }
    out("</dfs_info>");
}

// Flag "1" creates a group; anything else ("10" and the empty text too) renames
// "old_group". The first group change while DFS is off switches DFS on by the way.
void cgi_set_dfs_group()
{
    const auto group = form_value<128>("group");
    const auto old_group = form_value<128>("old_group");
    const auto flag = form_value<8>("flag");
    // A group name becomes a folder of the DFS tree: one the name rule refuses changes
    // nothing.
    if (!is_acceptable_name(group.view()) || (flag != "1" && !is_acceptable_name(old_group.view()))) {
        log_refusal("cgi_set_dfs_group", is_acceptable_name(group.view()) ? "old_group" : "group");
        answer_empty_html();
        return;
    }

    if (flag == "1")
        add_dfs_group_node(group.c_str());
    else
        mod_dfs_group_node(old_group.c_str(), group.c_str());

    if (xml_get_int("/system_mgr/samba/dfs_enable") == 0)
        store_dfs_switch("1");
    create_dfs_link();
    LIB_CP_Config_To_MTD(kSaveDfsChange);
    answer_empty_html();
}

void cgi_chk_dfs_group()
{
    const auto group = form_value<128>("group");
    write_xml_header(Charset::Plain);
    write_xml_prologue();
    out("<info>");
    out("<status>%d</status></info>\n", chk_dfs_group_exist(group.c_str()));
}

// The group names as a grid of one cell per row, every group numbered and counted.
void cgi_get_dfs_gorup_list()
{
    const auto page = form_value<8>("page");
    const auto rows_per_page = form_value<8>("rp");

    write_xml_header(Charset::Plain);
    write_xml_prologue();
    out("<rows>");
    get_dfs_group_info();
    const ListPageRange range(paging_number(page.c_str()), paging_number(rows_per_page.c_str()));
    int count = 0;
    for (const name_list* group = pnl; group; group = group->next) {
        if (range.shows(count))
            write_grid_row(count + 1, {group->name});
        ++count;
    }
    write_grid_end(page.c_str(), count);
}

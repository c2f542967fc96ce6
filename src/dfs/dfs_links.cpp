// DFS links: each points at a folder that another host shares and belongs to one DFS
// group. The records live in the Samba library; after every change the links are
// rebuilt and the configuration is copied to flash.
#include <initializer_list>
#include <utility>

#include "cgi/event_log.h"
#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "cgi/grid.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "platform/flash.h"
#include "platform/samba.h"
#include "volumes/names.h"

namespace {

// What the flash copy saves after a link change, and after a link deletion.
constexpr int kSaveDfsChange = 0x6000000;
constexpr int kSaveDfsDeletion = 0x4000000;

// A link's host, name and group become parts of the DFS tree's paths: a value the name
// rule refuses changes nothing (the first one found is named in the warning).
bool refuses(const char* command, std::initializer_list<std::pair<const char*, const char*>> fields)
{
    for (const auto& [field, value] : fields) {
        if (!is_acceptable_name(value)) {
            log_refusal(command, field);
            answer_empty_html();
            return true;
        }
    }
    return false;
}

} // namespace

void cgi_set_dfs()
{
    const auto host = form_value<128>("host");
    const auto sharename = form_value<128>("sharename");
    const auto path = form_value<1024>("path");
    const auto group = form_value<128>("group");
    if (refuses("cgi_set_dfs", {{"host", host.c_str()}, {"sharename", sharename.c_str()}, {"group", group.c_str()}}))
        return;

    // A new link does not switch DFS on; only a group change does.
    add_dfs_node(host.c_str(), path.c_str(), sharename.c_str(), group.c_str());
    create_dfs_link();
    LIB_CP_Config_To_MTD(kSaveDfsChange);
    answer_empty_html();
}

// The link is found by its old name and old group.
void cgi_modify_dfs()
{
    const auto host = form_value<128>("host");
    const auto sharename = form_value<128>("sharename");
    const auto path = form_value<1024>("path");
    const auto group = form_value<128>("group");
    const auto old_share = form_value<128>("old_share");
    const auto old_group = form_value<128>("old_group");
    if (refuses("cgi_modify_dfs", {{"host", host.c_str()}, {"sharename", sharename.c_str()}, {"group", group.c_str()},
                                   {"old_share", old_share.c_str()}, {"old_group", old_group.c_str()}}))
        return;

    mod_dfs_node(host.c_str(), path.c_str(), sharename.c_str(), group.c_str(), old_share.c_str(),
                 old_group.c_str());
    create_dfs_link();
    LIB_CP_Config_To_MTD(kSaveDfsChange);
    answer_empty_html();
}

void cgi_del_dfs()
{
    const auto group = form_value<128>("group");
    const auto local = form_value<128>("local");
    if (refuses("cgi_del_dfs", {{"group", group.c_str()}, {"local", local.c_str()}}))
        return;

    del_dfs_node(local.c_str(), group.c_str());
    create_dfs_link();
    LIB_CP_Config_To_MTD(kSaveDfsDeletion);
    answer_empty_html();
}

// The links of one group ("f_field"), three cells each: the link's name, the host,
// the host's share. Only the links of that group are numbered and counted.
void cgi_get_dfs_list()
{
    const auto page = form_value<8>("page");
    const auto rows_per_page = form_value<8>("rp");
    const auto group = form_value<128>("f_field");

    write_xml_header(Charset::Plain);
    write_xml_prologue();
    out("<rows>");
    get_dfs_info();
    const ListPageRange range(paging_number(page.c_str()), paging_number(rows_per_page.c_str()));
    int count = 0;
    for (const dfs_info* link = pdfs; link; link = link->next) {
        if (group != link->group)
            continue;
        if (range.shows(count))
            write_grid_row(count + 1, {link->link, link->host, link->share});
        ++count;
    }
    write_grid_end(page.c_str(), count);
}

void cgi_get_dfs_sharename()
{
    get_dfs_info();
    write_xml_header(Charset::Plain);
    write_xml_prologue();
    out("<dfs_info>");
    for (const dfs_info* link = pdfs; link; link = link->next) {
        out("<sharename>");
        cgiHtmlEscape(link->share);
        out("</sharename>");
    }
    out("</dfs_info>");
}

// The folders a host shares, for the page's folder picker. Only a listing that
// succeeded (1) is shown; otherwise the library's status goes back with a count of 0.
void cgi_get_host_folder()
{
    const auto host = form_value<256>("host");
    const int result = get_host_share_name(host.c_str());

    write_xml_header(Charset::Plain);
    write_xml_prologue();
    out("<info>");
    int count = 0;
    if (result == 1) {
        for (const name_list* folder = pnl; folder; folder = folder->next) {
            out("<folder>");
            cgiHtmlEscape(folder->name);
            out("</folder>");
            ++count;
        }
    }
    out("<status>%d</status>\n", result);
    out("<count>%d</count>\n", count);
    out("</info>");
}

// Whether a link name may be used in a group. The host and the remote share are read
// as the page sends them but play no part. A name no link has is answered 2 at once.
void cgi_chk_dfs()
{
    [[maybe_unused]] const auto host = form_value<128>("host");
    [[maybe_unused]] const auto remote_share = form_value<1024>("remote_share");
    const auto sharename = form_value<128>("sharename");
    const auto group = form_value<128>("group");

    write_xml_header(Charset::Plain);
    write_xml_prologue();
    out("<info>");
    get_dfs_info();
    for (const dfs_info* link = pdfs; link; link = link->next) {
        if (sharename == link->link) {
            out("<status>%d</status></info>\n", chk_dfs_node_exist(group.c_str(), sharename.c_str()));
            return;
        }
    }
    out("<status>2</status></info>\n");
}

// The service report, the reload of the share services, and the FTP switch.
#include "cgi/service.h"

#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/shell.h"
#include "platform/config_store.h"
#include "platform/ftp.h"

// Which services are on, so that the pages can show or hide their columns.
void cgi_get_service_info()
{
    write_xml_header(Charset::Plain);
    write_xml_prologue();
    out("<service>");

    // One buffer, zeroed once, serves both texts: when the NFS key cannot be read the
    // FTP state stays in it and is repeated. The pages have always seen it so.
    FixedText<8> state;
    xml_get_str("/app_mgr/ftp/setting/state", state.size(), state.data());
    out("<ftp>%s</ftp>", state.c_str());
    xml_get_str("/system_mgr/nfs/enable", state.size(), state.data());
    out("<nfs_server>%s</nfs_server>", state.c_str());

    out("<cloud_access>%d</cloud_access>", xml_get_int("/cloud/cloud_access") == 1 ? 1 : 0);
    out("<webdav_server>%d</webdav_server>", xml_get_int("/system_mgr/webdav/enable") == 1 ? 1 : 0);
    out("</service>");
}

void reload_share_services()
{
    run_system("smbcom >/dev/null 2>&1");
    run_system("afpcom >/dev/null 2>&1");

    FixedText<8> rsyncd;
    xml_get_str("/backup_mgr/rsyncd/enable", rsyncd.size(), rsyncd.data());
    // Input from /dev/null, so that the background rsync cannot hold the CGI's streams.
    if (rsyncd == "1")
        run_system("rsyncom -x > /dev/null 2>&1 0</dev/null &");
}

// The dispatcher writes this command's answer.
void cgi_restart_service()
{
    reload_share_services();
}

// Type 0 stops FTP for the duration of a change; type 1 rebuilds its share links and
// starts it again. Any other type only answers.
void cgi_ftp_service()
{
    const auto type = form_value<8>("type");
    if (type == "0")
        LIB_WEB_STOP_FTP();
    if (type == "1") {
        LIB_WEB_STOP_FTP();
        LIB_FTP_Create_Share_Link();
        LIB_WEB_START_FTP();
    }
    answer_empty_html();
}

// The NFS pages: export a share's folder, the rule count and switch, NFS on and off,
// and the removal of a share from every file service at once.
#include <cstdlib>

#include "cgi/event_log.h"
#include "cgi/file.h"
#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/service.h"
#include "cgi/shell.h"
#include "cgi/trace.h"
#include "nfs/export_checks.h"
#include "nfs/exports_engine.h"
#include "platform/config_store.h"
#include "platform/flash.h"
#include "platform/ftp.h"
#include "platform/share.h"
#include "platform/storage.h"
#include "volumes/names.h"

// Exports the folder to the host in "/etc/exports" and in the folder's second store,
// then has the NFS server reread its rules. Only bit 0 of "rw" decides the access, and
// "rootsquash" never changes the written line.
void cgi_set_nfs_share()
{
    const auto host = form_value<32>("host");
    const auto path = form_value<512>("path");
    const auto rw = form_value<8>("rw");
    const auto rootsquash = form_value<8>("rootsquash");
    const int read_write = std::atoi(rw.c_str());
    const int root_squash = std::atoi(rootsquash.c_str());
    // A host outside the exports grammar, or a folder outside the volumes or one that
    // would break its line, leaves every exports file as it is.
    if (!is_export_host(host.view()) || !is_export_folder(path.c_str())) {
        log_refusal("cgi_set_nfs_share", is_export_host(host.view()) ? "path" : "host");
        answer_empty_html();
        return;
    }

    add_config_string(path.c_str(), host.c_str(), read_write, root_squash);
    add_hidden_config_string(path.c_str(), host.c_str(), read_write, root_squash);
    run_system("exportfs -r > /dev/null 2>&1");

    answer_empty_html();
}

// The number of lines of "/etc/exports" (blank and invalid ones too; a line longer
// than the 2048-byte buffer counts once per piece) and the NFS switch as stored.
void cgi_get_nfs_info()
{
    int total = 0;
    if (const UniqueFile exports = open_file("/etc/exports", "r")) {
        FixedText<2048> line;
        while (read_line(exports.get(), line))
            ++total;
    }
    FixedText<8> enable;
    xml_get_str("/system_mgr/nfs/enable", enable.size(), enable.data());

    write_xml_header(Charset::Plain);
    write_xml_prologue();
    out("<nfs_info><total>%d</total><enable>%s</enable></nfs_info>", total, enable.c_str());
}

// Stores the switch as sent, then starts NFS for any non-zero number and stops it
// otherwise. The answer is status 1 whatever the service did.
void cgi_nfs_enable()
{
    const auto nfs_status = form_value<8>("nfs_status");
    xml_set_str("/system_mgr/nfs/enable", nfs_status.c_str());
    xml_write_file("/etc/NAS_CFG/config.xml");
    LIB_CP_Config_To_MTD(1);

    if (std::atoi(nfs_status.c_str()) != 0)
        run_system("nfs start >/dev/null 2>&1");
    else
        run_system("nfs stop >/dev/null 2>&1");
    run_system("smbcom >/dev/null 2>&1");

    write_xml_header(Charset::Plain);
    write_xml_prologue_spaced();
    out("<info>\n<status>1</status>\n</info>\n");
}

// Removes a share from every file service: its record, FTP, both NFS stores, AFP and
// the Time Machine announcement, then the share services reread their configuration.
// NFS is not re-exported here: the server keeps serving the removed rule until the
// next re-export or restart, as it always has.
void cgi_del_session()
{
    const auto name = form_value<512>("name");
    const auto path = form_value<512>("path");
    const auto host = form_value<512>("host");
    const auto smb_path = form_value<512>("smb_path");    // only traced
    printf_out("name=[%s]\n", name.c_str());
    printf_out("path=[%s]\n", path.c_str());
    printf_out("host=[%s]\n", host.c_str());
    printf_out("smb_path=[%s]\n", smb_path.c_str());
    // A share name that would leave "/shares", or a folder outside the volumes,
    // changes nothing.
    if (!is_acceptable_name(name.view()) || !is_export_folder(path.c_str())) {
        log_refusal("cgi_del_session", is_acceptable_name(name.view()) ? "path" : "name");
        answer_empty_html();
        return;
    }

    del_share(name.c_str());

    LIB_WEB_STOP_FTP();
    LIB_FTP_Del_Share(name.c_str());
    LIB_WEB_START_FTP();

    delete_config_string(path.c_str(), host.c_str());
    delete_hidden_config_string(path.c_str(), host.c_str());

    afpIf_delShareByPath(path.c_str());

    run_system("(avahi_tm_serv --tm_delall >/dev/null 2>&1;avahi_tm_serv --tm_start >/dev/null 2>&1)&");

    reload_share_services();
    answer_empty_html();
}

// The AFP file service switch and its state. Time Machine backups are served over
// AFP, so switching AFP off switches Time Machine off too; switching it on leaves
// Time Machine as it was.
#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/shell.h"
#include "platform/config_store.h"
#include "platform/flash.h"

void cgi_set_afp()
{
    // Stored as received: any text but "0" counts as on.
    const auto afp = form_value<16>("afp");
    xml_set_str("/system_mgr/afp/enable", afp.c_str());

    if (afp == "0") {
        FixedText<2> time_machine;   // one character: "1" when on
        xml_get_str("/backup_mgr/time_machine/enable", time_machine.size(), time_machine.data());
        if (time_machine == "1") {
            xml_set_str("/backup_mgr/time_machine/enable", "0");
            run_system("avahi_tm_serv --tm_delall >/dev/null 2>&1");
        }
        run_system("afp stop >/dev/null 2>&1");
    } else {
        run_system("afpcom >/dev/null 2>&1");
    }

    xml_write_file("/etc/NAS_CFG/config.xml");
    LIB_CP_Config_To_MTD(1);
    answer_empty_html();
    // The Samba configuration is rebuilt once the page has its answer.
    std::fflush(cgiOut);
    run_system("smbcom >/dev/null 2>&1");
}

void cgi_get_afp_info()
{
    const int enable = xml_get_int("/system_mgr/afp/enable");
    write_xml_header(Charset::Plain);
    write_xml_prologue();
    out("<afp_info><enable>%d</enable></afp_info>", enable);
}

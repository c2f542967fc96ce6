// Joining and leaving an Active Directory domain. A join makes the given DNS server
// the primary one, asks the domain for its workgroup and a controller with `net ads`,
// stores everything and calls the platform's join; a failed join puts the previous
// DNS setup back. Either way the file services are refreshed and the configuration
// is saved, and the page gets a status number:
//   1              left the domain
//   1, 50 or 100   joined (what ads_start answered)
//   54             the workgroup or the controller could not be found
//   other          the join failed with what ads_start answered
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

#include "cgi/file.h"
#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/shell.h"
#include "cgi/text_escape.h"
#include "cgi/trace.h"
#include "platform/cgic.h"
#include "platform/config_store.h"
#include "platform/flash.h"
#include "platform/samba.h"
#include "volumes/helpers.h"

namespace {

constexpr int kDomainNotFound = 54;
constexpr int kCommandLineSize = 512;

// The DNS servers of the LAN as they were when the request came.
struct LanDns {
    FixedText<256> dns1;
    FixedText<256> dns2;
    FixedText<256> dns3;
};

template <std::size_t N>
FixedText<N> config_text(const char* key)
{
    FixedText<N> value;
    xml_get_str(key, value.size(), value.data());
    return value;
}

bool join_succeeded(int status)
{
    return status == 1 || status == 50 || status == 100;
}

// Puts three DNS servers back as the LAN's. The config values stand inside the line's
// double quotes, escaped for them (a page filled them). The trace is
// "set old dns1 to xml cmd1=[...]" after a leave, "...cmd2=[...]" after a failure.
void restore_dns(const char* dns1, const LanDns& lan, int trace_number)
{
    FixedText<kCommandLineSize> line;
    line.format("network -x \"%s\" -D \"%s %s %s\" >/dev/null 2>&1", "0", inside_double_quotes(dns1).c_str(),
                inside_double_quotes(lan.dns2.view()).c_str(), inside_double_quotes(lan.dns3.view()).c_str());
    printf_out("set old dns1 to xml cmd%d=[%s]\n", trace_number, line.c_str());
    run_system(line.c_str());
}

void restore_dns_manual()
{
    const auto saved = config_text<8>("/network_mgr/lan0/dns_manual_bak");
    xml_set_str("/network_mgr/lan0/dns_manual", saved.c_str());
}

// The first line a `net ads` pipeline prints, without its line end; false when the
// pipeline cannot be started.
bool first_line_of(const char* command, FixedText<512>& line, bool trace_workgroup)
{
    const UniquePipe pipe = open_pipe(command);
    if (!pipe)
        return false;
    read_line(pipe.get(), line);
    if (trace_workgroup && trace_enabled()) {
        // The line keeps the line end it was read with, as the trace always showed it;
        // anything else in it that would start a line is escaped.
        std::string text(line.view());
        const bool line_end = !text.empty() && text.back() == '\n';
        if (line_end)
            text.pop_back();
        printf_out_text(("workgroup=[" + one_line(text) + (line_end ? "\n" : "") + "]\n").c_str());
    }
    // Only the last character goes; an empty line stays empty.
    if (const std::size_t length = line.length(); length > 0)
        line[length - 1] = '\0';
    return true;
}

// Asks the domain for its workgroup and a domain controller through the DNS server
// now in use. False when the workgroup query cannot be run or prints nothing, or the
// controller query cannot be run.
bool query_domain(const char* realm, const char* user, const char* password, FixedText<512>& workgroup,
                  FixedText<512>& controller)
{
    FixedText<kCommandLineSize> line;
    line.format(
                  "net ads workgroup -S %s -U %s%%%s | grep '^Workgroup'  | sed 's/Workgroup: //g'",
                  cgi_escapeshellarg(realm), cgi_escapeshellarg(user), cgi_escapeshellarg(password));
    cgi_escapeshellarg_free();
    printf_out("cmd=[%s]\n", line.c_str());
    if (!first_line_of(line.c_str(), workgroup, true) || workgroup.empty())
        return false;

    // The command line holds one backslash before the blank of "Domain Controller".
    line.format(
                  "net ads lookup -S %s -U %s%%%s | grep '^Domain Controller' | sed 's/Domain\\ Controller://g' | "
                  "sed 's/[[:space:]]//g'",
                  cgi_escapeshellarg(realm), cgi_escapeshellarg(user), cgi_escapeshellarg(password));
    cgi_escapeshellarg_free();
    printf_out("cmd=[%s]\n", line.c_str());
    return first_line_of(line.c_str(), controller, false);
}

// Leaves the domain and puts back the DNS setup saved at the join.
int leave_domain(const char* enable, const LanDns& lan)
{
    xml_set_str("/system_mgr/samba/ads_enable", enable);
    run_system("network -r >/dev/null 2>&1 &");
    ads_stop();
    run_system("smbcmd -r >/dev/null 2>&1");
    xml_set_str("/system_mgr/samba/ads_enable", enable);

    const auto saved_dns1 = config_text<256>("/network_mgr/lan0/dns1_bak");
    restore_dns(saved_dns1.c_str(), lan, 1);
    restore_dns_manual();
    run_system("makedav stop >/dev/null 2>&1");
    return 1;
}

int join_domain(const char* user, const char* encoded_password, const char* password, const char* realm,
                const char* dns, const LanDns& lan)
{
    // With DHCP on, the DNS servers become manual ones for the join; the setting as
    // it was is kept for a later leave or a failure.
    const auto dhcp = config_text<8>("/network_mgr/lan0/dhcp_enable");
    const auto dns_manual = config_text<8>("/network_mgr/lan0/dns_manual");
    if (std::strtol(dhcp.c_str(), nullptr, 10) == 1)
        xml_set_str("/network_mgr/lan0/dns_manual", "1");
    xml_set_str("/network_mgr/lan0/dns_manual_bak", dns_manual.c_str());

    // The given server becomes the primary DNS; the other two stay.
    FixedText<128> dns_list;
    dns_list.format("%s %s %s", dns, lan.dns2.c_str(), lan.dns3.c_str());
    FixedText<kCommandLineSize> line;
    line.format("network -x \"%s\" -D %s >/dev/null 2>&1", "0",
                  cgi_escapeshellarg(dns_list.c_str()));
    cgi_escapeshellarg_free();
    printf_out("cmd=[%s]\n", line.c_str());
    run_system(line.c_str());

    FixedText<512> workgroup;
    FixedText<512> controller;
    const bool found = query_domain(realm, user, password, workgroup, controller);

    // Saved whatever the queries gave; the password keeps the page's base64 text
    // behind the 0xFF byte that marks it as encoded.
    FixedText<128> stored_password;
    stored_password.format("%c%s", 255, encoded_password);
    xml_set_str("/system_mgr/samba/ads_workgroup", workgroup.c_str());
    xml_set_str("/system_mgr/samba/ads_username", user);
    xml_set_str("/system_mgr/samba/ads_password", stored_password.c_str());
    xml_set_str("/system_mgr/samba/ads_realm", realm);
    xml_set_str("/system_mgr/samba/ads_pwd_server", controller.c_str());
    xml_set_str("/network_mgr/lan0/dns1", dns);
    xml_set_str("/system_mgr/samba/ads_enable", "1");
    run_system("network -r >/dev/null 2>&1 &");
    ads_stop();

    int status = kDomainNotFound;
    if (found && !controller.empty()) {
        status = ads_start();
        printf_out("ret=[%d]\n", status);
    }

    if (join_succeeded(status)) {
        // No "smbcmd -r" on this path.
        xml_set_str("/system_mgr/samba/ads_enable", "1");
        xml_set_str("/network_mgr/lan0/dns1_bak", lan.dns1.c_str());
        printf_out("set old dns1 to xml cmd1=[%s]\n", lan.dns1.c_str());
        xml_set_str("/system_mgr/samba/ads_dns", dns);
        run_system("makedav stop >/dev/null 2>&1");
        return status;
    }

    // The other join settings stay stored.
    xml_set_str("/system_mgr/samba/ads_enable", "0");
    run_system("smbcmd -r >/dev/null 2>&1");
    xml_set_str("/network_mgr/lan0/dns1_bak", lan.dns1.c_str());
    restore_dns(lan.dns1.c_str(), lan, 2);
    restore_dns_manual();
    // The "&" before the redirection is the device's own line.
    run_system("network -r & >/dev/null 2>&1");
    return status;
}

} // namespace

void cgi_set_ads()
{
    const auto enable = form_value<8>("f_enable");
    const auto user = form_value<64>("f_name");
    const auto encoded_password = form_value<64>("f_pw");
    const auto realm = form_value<128>("f_realm_name");
    const auto dns = form_value<256>("f_dns1");
    FixedText<64> password;   // decoded; always terminated
    decode_base64_field(reinterpret_cast<unsigned char*>(password.data()), encoded_password.c_str(),
                        password.size() - 1);

    LanDns lan;
    xml_get_str("/network_mgr/lan0/dns2", lan.dns2.size(), lan.dns2.data());
    xml_get_str("/network_mgr/lan0/dns3", lan.dns3.size(), lan.dns3.data());
    xml_get_str("/network_mgr/lan0/dns1", lan.dns1.size(), lan.dns1.data());

    const int status = enable == "1"
        ? join_domain(user.c_str(), encoded_password.c_str(), password.c_str(), realm.c_str(), dns.c_str(), lan)
        : leave_domain(enable.c_str(), lan);

    run_system("afpcom > /dev/null 2>&1");
    run_system("afp restart > /dev/null 2>&1");
    run_system("(ftp reload > /dev/null 2>&1) &");
    xml_write_file("/etc/NAS_CFG/config.xml");
    LIB_CP_Config_To_MTD(1);

    cgiHeaderContentType("text/xml");
    write_xml_prologue_spaced();
    out("<ads><status>%d</status></ads>\n", status);
}

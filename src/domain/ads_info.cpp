// The domain settings page: the settings stored at the last join and, on request, a
// live test of the domain trust. Changes nothing.
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "cgi/file.h"
#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/trace.h"
#include "platform/cgic.h"
#include "platform/config_store.h"
#include "volumes/helpers.h"

namespace {

template <std::size_t N>
void read_config(const char* key, FixedText<N>& value)
{
    xml_get_str(key, value.size(), value.data());
}

// "1" when the trust is good or cannot be checked, "0" when wbinfo reports a failure.
FixedText<8> trust_status()
{
    FixedText<8> status("1");
    const UniquePipe wbinfo = open_pipe("wbinfo -t");
    if (!wbinfo)
        return status;
    FixedText<1024> line;
    while (read_line(wbinfo.get(), line)) {
        if (strcasestr(line.c_str(), "failed") || strcasestr(line.c_str(), "Could not")) {
            status.assign("0");
            break;
        }
    }
    return status;
}

} // namespace

void cgi_get_ads_info()
{
    const auto get_domain_status = form_value<8>("get_domain_status");
    FixedText<8> enable;
    FixedText<64> workgroup;
    FixedText<64> user;
    FixedText<64> stored_password;
    FixedText<128> realm;
    FixedText<64> controller;
    FixedText<32> dns1;
    FixedText<32> dns2;
    read_config("/system_mgr/samba/ads_enable", enable);
    read_config("/system_mgr/samba/ads_workgroup", workgroup);
    read_config("/system_mgr/samba/ads_username", user);
    read_config("/system_mgr/samba/ads_password", stored_password);
    read_config("/system_mgr/samba/ads_realm", realm);
    read_config("/system_mgr/samba/ads_pwd_server", controller);
    read_config("/network_mgr/lan0/dns2", dns2);

    // Empty when not tested.
    FixedText<8> trust;
    if (std::strtol(enable.c_str(), nullptr, 10) == 1 && std::strtol(get_domain_status.c_str(), nullptr, 10) == 1)
        trust = trust_status();

    cgiHeaderContentType("text/xml");
    write_xml_prologue_spaced();
    out("<ads>\n");
    printf_out("u_pwd[0]=[%x]\n", static_cast<unsigned>(static_cast<int>(stored_password[0])));

    // A password stored at a join carries the 0xFF marker before the page's base64
    // text; the page decodes it again when b64Flag is 1. One set by other means comes
    // back as it is.
    const char* password = stored_password.c_str();
    const char* marker = std::strchr(password, '\xff');
    const char* b64_flag = marker ? "1" : "0";
    if (marker) {
        password = marker + 1;
        printf_out("tmp_pw1=[%s]\n", password);
    } else {
        printf_out("tmp_pw2=[%s]\n", password);
    }

    // The DNS server of the join, or the LAN's primary one when none was stored.
    read_config("/system_mgr/samba/ads_dns", dns1);
    if (dns1.empty())
        read_config("/network_mgr/lan0/dns1", dns1);

    write_xml_element("enable", enable.c_str());
    write_xml_element("workgroup", workgroup.c_str());
    write_xml_element("u_name", user.c_str());
    write_xml_element("u_pwd", password);
    write_xml_element("b64Flag", b64_flag);
    write_xml_element("realm", realm.c_str());
    write_xml_element("s_pwd", controller.c_str());
    write_xml_element("dns1", dns1.c_str());
    write_xml_element("dns2", dns2.c_str());
    write_xml_element("status", trust.c_str());
    write_xml_element("ldap_server", "");
    out("</ads>\n");
}

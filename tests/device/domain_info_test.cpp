// The domain settings report and its trust test.
#include <gtest/gtest.h>

#include <string>

#include "device.h"

namespace {

std::string ads_info_answer(const std::string& elements)
{
    return "Content-Type: text/xml\r\n\r\n<?xml version=\"1.0\" encoding=\"UTF-8\" ?>\n<ads>\n" + elements + "</ads>\n";
}

// A wbinfo that prints `output`: the report reads only the words of its trust test.
void fake_wbinfo(Device& dev, const std::string& output)
{
    dev.remove("/sbin/wbinfo");
    dev.write_file("/sbin/wbinfo", "#!/bin/sh\nprintf '%s' '" + output + "'\n");
    dev.run({"/bin/chmod", "755", "/sbin/wbinfo"});
}

const std::string kGood = "checking the trust secret for domain EXAMPLE via RPC calls succeeded\n";
const std::string kFailed = "checking the trust secret for domain EXAMPLE via RPC calls failed\n"
                            "failed to call wbcCheckTrustCredentials: WBC_ERR_AUTH_ERROR\n";

} // namespace

TEST(DomainInfo, ReportsTheStoredSettingsAndTestsTheTrustOnlyWhenAsked)
{
    const std::string pw = "\xffU2VjcmV0MQ==", shown = "U2VjcmV0MQ==", dc_dns = "192.168.1.10", lan_dns = "192.168.1.1";
    const struct {
        const char* what;
        std::string enable, ask, trust_output, password, ads_dns;
        bool wbinfo_runs;
        std::string u_pwd, b64_flag, dns1, status;
    } cases[] = {
        {"joined, asked, trust good", "1", "1", kGood, pw, dc_dns, true, shown, "1", dc_dns, "1"},
        {"joined, asked, trust failed", "1", "1", kFailed, pw, dc_dns, true, shown, "1", dc_dns, "0"},
        {"joined, asked, secret not checked", "1", "1", "Could not check secret\n", pw, "", true, shown, "1", lan_dns, "0"},
        {"joined, asked, FAILED in capitals", "1", "1", "TRUST CHECK FAILED\n", pw, "", true, shown, "1", lan_dns, "0"},
        {"joined, asked, no output at all", "1", "1", "", pw, "", true, shown, "1", lan_dns, "1"},
        {"joined, not asked", "1", "", kFailed, pw, dc_dns, false, shown, "1", dc_dns, ""},
        {"not joined", "0", "1", kFailed, "plain<pw>", "", false, "plain&lt;pw&gt;", "0", lan_dns, ""},
        {"marker inside the value", "01", "01", kGood, "ab\xff" "cd", "10.0.0.1", true, "cd", "1", "10.0.0.1", "1"},
    };
    for (const auto& c : cases) {
        Device dev;
        fake_wbinfo(dev, c.trust_output);
        dev.config({{"/system_mgr/samba/ads_enable", c.enable},
                    {"/system_mgr/samba/ads_workgroup", "EXAMPLE"},
                    {"/system_mgr/samba/ads_username", "Administrator"},
                    {"/system_mgr/samba/ads_password", c.password},
                    {"/system_mgr/samba/ads_realm", "EXAMPLE.COM"},
                    {"/system_mgr/samba/ads_pwd_server", "dc1.example.com"},
                    {"/system_mgr/samba/ads_dns", c.ads_dns}});
        EXPECT_EQ(dev.request("cgi_get_ads_info", {{"get_domain_status", c.ask}}),
                  ads_info_answer("<enable>" + c.enable + "</enable><workgroup>EXAMPLE</workgroup>"
                                  "<u_name>Administrator</u_name><u_pwd>" + c.u_pwd + "</u_pwd><b64Flag>" +
                                  c.b64_flag + "</b64Flag><realm>EXAMPLE.COM</realm><s_pwd>dc1.example.com</s_pwd>"
                                  "<dns1>" + c.dns1 + "</dns1><dns2>8.8.8.8</dns2><status>" + c.status +
                                  "</status><ldap_server></ldap_server>"))
            << c.what;
        EXPECT_EQ(dev.journal(), (c.wbinfo_runs ? Journal{{"sh", "-c", "wbinfo -t"}} : Journal{})) << c.what;
    }
}

TEST(DomainInfo, ValuesAreCutToTheirBuffers)
{
    Device dev;
    const std::string long_text(200, 'w');
    dev.config({{"/system_mgr/samba/ads_enable", "0"},
                {"/system_mgr/samba/ads_workgroup", long_text},
                {"/system_mgr/samba/ads_username", long_text},
                {"/system_mgr/samba/ads_password", "\xff" + long_text},
                {"/system_mgr/samba/ads_realm", long_text},
                {"/system_mgr/samba/ads_pwd_server", long_text},
                {"/system_mgr/samba/ads_dns", long_text},
                {"/network_mgr/lan0/dns2", long_text}});
    EXPECT_EQ(dev.request("cgi_get_ads_info"),
              ads_info_answer("<enable>0</enable><workgroup>" + long_text.substr(0, 63) + "</workgroup><u_name>" +
                              long_text.substr(0, 63) + "</u_name><u_pwd>" + long_text.substr(0, 62) +
                              "</u_pwd><b64Flag>1</b64Flag><realm>" + long_text.substr(0, 127) + "</realm><s_pwd>" +
                              long_text.substr(0, 63) + "</s_pwd><dns1>" + long_text.substr(0, 31) + "</dns1><dns2>" +
                              long_text.substr(0, 31) + "</dns2><status></status><ldap_server></ldap_server>"));
}

TEST(DomainInfo, AJoinIsReportedAsThePageSentIt)
{
    Device dev;
    dev.config({{"/network_mgr/lan0/dns1", "192.168.1.10"}});
    ASSERT_EQ(dev.request("cgi_set_ads", {{"f_enable", "1"}, {"f_name", "administrator"}, {"f_pw", "U2VjcmV0MQ=="},
                                          {"f_realm_name", "example.com"}, {"f_dns1", "192.168.1.10"}}),
              "Content-Type: text/xml\r\n\r\n<?xml version=\"1.0\" encoding=\"UTF-8\" ?>\n<ads><status>1</status></ads>\n");
    EXPECT_EQ(dev.request("cgi_get_ads_info", {{"get_domain_status", "1"}}),
              ads_info_answer("<enable>1</enable><workgroup>EXAMPLE</workgroup><u_name>administrator</u_name>"
                              "<u_pwd>U2VjcmV0MQ==</u_pwd><b64Flag>1</b64Flag><realm>example.com</realm>"
                              "<s_pwd>dc1.example.com</s_pwd><dns1>192.168.1.10</dns1><dns2>8.8.8.8</dns2>"
                              "<status>1</status><ldap_server></ldap_server>"));
}

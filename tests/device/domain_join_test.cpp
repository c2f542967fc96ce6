// Joining and leaving the directory domain: the DNS switch and its restoration, the
// domain queries, the stored settings and the status codes.
#include <gtest/gtest.h>

#include <algorithm>
#include <iterator>
#include <string>

#include "device.h"

namespace {

const std::string kEncodedPassword = "U2VjcmV0MQ==";   // Secret1, the domain's admin password
const std::string kWorkgroupLine =
    "net ads workgroup -S 'EXAMPLE.COM' -U 'Administrator'%'Secret1' | grep '^Workgroup'  | sed 's/Workgroup: //g'";
const std::string kLookupLine = "net ads lookup -S 'EXAMPLE.COM' -U 'Administrator'%'Secret1' | grep '^Domain "
                                "Controller' | sed 's/Domain\\ Controller://g' | sed 's/[[:space:]]//g'";

std::string ads_answer(int status)
{
    return "Content-Type: text/xml\r\n\r\n<?xml version=\"1.0\" encoding=\"UTF-8\" ?>\n<ads><status>" +
           std::to_string(status) + "</status></ads>\n";
}

Fields join_fields(const std::string& dns, const std::string& password = kEncodedPassword)
{
    return {{"f_enable", "1"}, {"f_name", "Administrator"}, {"f_pw", password}, {"f_realm_name", "EXAMPLE.COM"},
            {"f_dns1", dns}};
}

// The reachable domain as the image describes it, with some of its keys replaced.
void set_domain(Device& dev, const std::string& changed_keys)
{
    dev.write_file("/sim/domain.conf", dev.read_file("/sim/domain.conf") + changed_keys);
}

// The restart of the network and the FTP reload run in the background: their own
// lines may fall anywhere after the command lines that started them.
Journal foreground(const Journal& journal)
{
    Journal kept;
    std::copy_if(journal.begin(), journal.end(), std::back_inserter(kept),
                 [](const Event& e) { return e != Event{"network", "-r"} && e != Event{"ftp", "reload"}; });
    return kept;
}

Event sh(const std::string& line) { return {"sh", "-c", line}; }

Journal operator+(Journal a, const Journal& b)
{
    a.insert(a.end(), b.begin(), b.end());
    return a;
}

// Up to the queries of the domain, with the given server as primary DNS.
Journal join_start(const std::string& dns, const std::string& dns_manual, bool dhcp)
{
    Journal journal;
    if (dhcp)
        journal.push_back({"xml_set_str", "/network_mgr/lan0/dns_manual", "1"});
    return journal + Journal{{"xml_set_str", "/network_mgr/lan0/dns_manual_bak", dns_manual},
                             sh("network -x \"0\" -D '" + dns + " 8.8.8.8 ' >/dev/null 2>&1"),
                             {"network", "-x", "0", "-D", dns + " 8.8.8.8 "}};
}

const Journal kQueries{sh(kWorkgroupLine),
                       {"net", "ads", "workgroup", "-S", "EXAMPLE.COM", "-U", "Administrator%Secret1"},
                       sh(kLookupLine),
                       {"net", "ads", "lookup", "-S", "EXAMPLE.COM", "-U", "Administrator%Secret1"}};

Journal saved_settings(const std::string& workgroup, const std::string& controller, const std::string& dns)
{
    return {{"xml_set_str", "/system_mgr/samba/ads_workgroup", workgroup},
            {"xml_set_str", "/system_mgr/samba/ads_username", "Administrator"},
            {"xml_set_str", "/system_mgr/samba/ads_password", "\xff" + kEncodedPassword},
            {"xml_set_str", "/system_mgr/samba/ads_realm", "EXAMPLE.COM"},
            {"xml_set_str", "/system_mgr/samba/ads_pwd_server", controller},
            {"xml_set_str", "/network_mgr/lan0/dns1", dns},
            {"xml_set_str", "/system_mgr/samba/ads_enable", "1"},
            sh("network -r >/dev/null 2>&1 &"),
            {"ads_stop"}};
}

const Journal kClosing{sh("afpcom > /dev/null 2>&1"), {"afpcom"}, sh("afp restart > /dev/null 2>&1"), {"afp", "restart"},
                       sh("(ftp reload > /dev/null 2>&1) &"), {"xml_write_file", "/etc/NAS_CFG/config.xml"},
                       {"LIB_CP_Config_To_MTD", "1"}};

Journal failure_path(const std::string& dns_manual)
{
    return Journal{{"xml_set_str", "/system_mgr/samba/ads_enable", "0"},
                   sh("smbcmd -r >/dev/null 2>&1"),
                   {"smbcmd", "-r"},
                   {"xml_set_str", "/network_mgr/lan0/dns1_bak", "192.168.1.1"},
                   sh("network -x \"0\" -D \"192.168.1.1 8.8.8.8 \" >/dev/null 2>&1"),
                   {"network", "-x", "0", "-D", "192.168.1.1 8.8.8.8 "},
                   {"xml_set_str", "/network_mgr/lan0/dns_manual", dns_manual},
                   sh("network -r & >/dev/null 2>&1")} +
           kClosing;
}

} // namespace

TEST(DomainJoin, SucceedsWithWhatAdsStartAnswers)
{
    const Journal success{{"ads_start"},
                          {"xml_set_str", "/system_mgr/samba/ads_enable", "1"},
                          {"xml_set_str", "/network_mgr/lan0/dns1_bak", "192.168.1.1"},
                          {"xml_set_str", "/system_mgr/samba/ads_dns", "192.168.1.10"},
                          sh("makedav stop >/dev/null 2>&1"),
                          {"makedav", "stop"}};
    for (const int result : {1, 50, 100}) {
        Device dev;
        set_domain(dev, "join_result=" + std::to_string(result) + "\n");
        EXPECT_EQ(dev.request("cgi_set_ads", join_fields("192.168.1.10")), ads_answer(result)) << result;
        EXPECT_EQ(foreground(dev.journal()), join_start("192.168.1.10", "0", true) + kQueries +
                                                 saved_settings("EXAMPLE", "dc1.example.com", "192.168.1.10") +
                                                 success + kClosing)
            << result;
        const Journal all = dev.journal();
        EXPECT_EQ(std::count(all.begin(), all.end(), Event{"network", "-r"}), 1) << result;
        EXPECT_EQ(std::count(all.begin(), all.end(), Event{"ftp", "reload"}), 1) << result;
        EXPECT_EQ(dev.read_file("/etc/resolv.conf"), "nameserver 192.168.1.10\nnameserver 8.8.8.8\n");
    }
}

// The failure path: the old DNS goes back, the settings of the attempt stay.
TEST(DomainJoin, FailureRestoresTheDnsAndKeepsTheAttempt)
{
    Device dev;
    set_domain(dev, "join_result=7\n");
    dev.config({{"/network_mgr/lan0/dhcp_enable", "0"}, {"/network_mgr/lan0/dns_manual", "1"}});
    EXPECT_EQ(dev.request("cgi_set_ads", join_fields("192.168.1.10")), ads_answer(7));
    EXPECT_EQ(foreground(dev.journal()), join_start("192.168.1.10", "1", false) + kQueries +
                                             saved_settings("EXAMPLE", "dc1.example.com", "192.168.1.10") +
                                             Journal{{"ads_start"}} + failure_path("1"));
    EXPECT_EQ(dev.config_value("/system_mgr/samba/ads_dns"), "");
    EXPECT_EQ(dev.read_file("/etc/resolv.conf"), "nameserver 192.168.1.1\nnameserver 8.8.8.8\n");
}

TEST(DomainJoin, ADomainThatCannotBeQueriedIs54)
{
    const struct {
        const char* what;
        std::string dns, password, controller;
        bool lookup_runs;
        std::string workgroup_saved;
    } cases[] = {
        {"a DNS server that does not resolve the realm", "192.168.1.99", kEncodedPassword, "dc1.example.com", false, ""},
        {"a wrong password", "192.168.1.10", "V3Jvbmc=", "dc1.example.com", false, ""},
        {"a workgroup but no controller", "192.168.1.10", kEncodedPassword, "", true, "EXAMPLE"},
    };
    for (const auto& c : cases) {
        Device dev;
        set_domain(dev, "controller=" + c.controller + "\n");
        EXPECT_EQ(dev.request("cgi_set_ads", join_fields(c.dns, c.password)), ads_answer(54)) << c.what;
        const Journal journal = foreground(dev.journal());
        EXPECT_EQ(std::count(journal.begin(), journal.end(), Event{"ads_start"}), 0) << c.what;
        const std::vector<std::string> lines = shell_lines(journal);
        EXPECT_EQ(std::count(lines.begin(), lines.end(), kLookupLine) == 1, c.lookup_runs) << c.what;
        EXPECT_EQ(Journal(journal.end() - static_cast<long>(failure_path("0").size()), journal.end()),
                  failure_path("0"))
            << c.what;
        EXPECT_EQ(dev.config_value("/system_mgr/samba/ads_workgroup"), c.workgroup_saved) << c.what;
        EXPECT_EQ(dev.config_value("/system_mgr/samba/ads_pwd_server"), "") << c.what;
        EXPECT_EQ(dev.read_file("/etc/resolv.conf"), "nameserver 192.168.1.1\nnameserver 8.8.8.8\n") << c.what;
    }
}

TEST(DomainLeave, AnyOtherEnableLeavesAndRestoresTheSavedDns)
{
    for (const std::string enable : {"0", "", "11"}) {
        Device dev;
        dev.config({{"/system_mgr/samba/ads_enable", "1"},
                    {"/network_mgr/lan0/dns1", "192.168.1.10"},
                    {"/network_mgr/lan0/dns1_bak", "192.168.1.1"},
                    {"/network_mgr/lan0/dns_manual", "1"},
                    {"/network_mgr/lan0/dns_manual_bak", "0"}});
        EXPECT_EQ(dev.request("cgi_set_ads", {{"f_enable", enable}}), ads_answer(1)) << enable;
        const Journal leave{{"xml_set_str", "/system_mgr/samba/ads_enable", enable},
                            sh("network -r >/dev/null 2>&1 &"),
                            {"ads_stop"},
                            sh("smbcmd -r >/dev/null 2>&1"),
                            {"smbcmd", "-r"},
                            {"xml_set_str", "/system_mgr/samba/ads_enable", enable},
                            sh("network -x \"0\" -D \"192.168.1.1 8.8.8.8 \" >/dev/null 2>&1"),
                            {"network", "-x", "0", "-D", "192.168.1.1 8.8.8.8 "},
                            {"xml_set_str", "/network_mgr/lan0/dns_manual", "0"},
                            sh("makedav stop >/dev/null 2>&1"),
                            {"makedav", "stop"}};
        EXPECT_EQ(foreground(dev.journal()), leave + kClosing) << enable;
        EXPECT_EQ(dev.read_file("/etc/resolv.conf"), "nameserver 192.168.1.1\nnameserver 8.8.8.8\n");
    }
}

TEST(DomainJoin, HostileFormValuesStayOneWordEach)
{
    Device dev;
    EXPECT_EQ(dev.request("cgi_set_ads", {{"f_enable", "1"},
                                          {"f_name", "x'; touch /tmp/owned; '"},
                                          {"f_pw", "J2AkKGlkKQ=="},   // '`$(id)
                                          {"f_realm_name", "$(touch /tmp/owned)"},
                                          {"f_dns1", "1.2.3.4; touch /tmp/owned"}}),
              ads_answer(54));
    EXPECT_FALSE(dev.exists("/tmp/owned"));
    const Journal journal = dev.journal();
    EXPECT_NE(std::find(journal.begin(), journal.end(),
                        Event{"net", "ads", "workgroup", "-S", "$(touch /tmp/owned)", "-U",
                              "x'; touch /tmp/owned; '%'`$(id)"}),
              journal.end());
}

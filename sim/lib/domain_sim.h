// The directory domain that the simulated device can see: "/sim/domain.conf",
// lines of KEY=VALUE ("#" starts a comment):
//     realm=EXAMPLE.COM          the domain's DNS name
//     workgroup=EXAMPLE          its NetBIOS name, printed by `net ads workgroup`
//     controller=dc1.example.com printed by `net ads lookup`
//     dns=192.168.1.10           the DNS server that resolves the domain
//     join_result=1              what ads_start returns when the settings match (1, 50, 100 or a failure code)
//     trust=good                 `wbinfo -t`: good, failed or unreachable
//     users=a,b,NASDEVICE+guest  `wbinfo -u`, one per line, in this order
//     admin_user=Administrator   the account `net ads` accepts (name compared without case)
//     admin_password=Secret1     and its password (compared exactly)
// A missing file means no domain is reachable.
#pragma once

#include <optional>
#include <string>
#include <vector>

inline constexpr const char* kDomainFile = "/sim/domain.conf";

struct SimulatedDomain {
    std::string realm;
    std::string workgroup;
    std::string controller;
    std::string dns;
    int join_result = 1;
    std::string trust = "good";
    std::vector<std::string> users;
    std::string admin_user = "Administrator";
    std::string admin_password;
};

std::optional<SimulatedDomain> load_simulated_domain();

// The DNS servers the device's resolver uses: "/etc/resolv.conf", one
// "nameserver ADDRESS" line per server, primary first. The `network` tool writes it
// (network -x N -D "DNS1 DNS2 DNS3"); `net ads` finds the domain only through it.
inline constexpr const char* kResolverFile = "/etc/resolv.conf";

// The first nameserver of the resolver file, or "" when there is none.
std::string primary_dns_server();
// Replaces the resolver file with these servers (blank-separated, empty ones skipped).
bool set_dns_servers(const std::string& blank_separated);

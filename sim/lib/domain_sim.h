// The directory domain that the simulated device can see: "/sim/domain.conf",
// lines of KEY=VALUE ("#" starts a comment):
//     realm=EXAMPLE.COM          the domain's DNS name
//     workgroup=EXAMPLE          its NetBIOS name, printed by `net ads workgroup`
//     controller=dc1.example.com printed by `net ads lookup`
//     dns=192.168.1.10           the DNS server that resolves the domain
//     join_result=1              what ads_start returns when the settings match (1, 50, 100 or a failure code)
//     trust=good                 `wbinfo -t`: good, failed or unreachable
//     users=a,b,NASDEVICE+guest  `wbinfo -u`, one per line, in this order
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
};

std::optional<SimulatedDomain> load_simulated_domain();

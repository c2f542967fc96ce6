// net ads: what the directory domain of "/sim/domain.conf" (sim/lib/domain_sim.h)
// tells about itself, in the real tool's words.
//
//   net ads workgroup -S REALM -U USER%PASSWORD   "Workgroup: NAME"
//   net ads lookup -S REALM -U USER%PASSWORD      the CLDAP answer of the controller,
//                                                 with its "Domain Controller:" line
//
// The domain answers only when REALM is its realm (without case), the device's
// primary DNS server (the resolver file) is the domain's, and USER and PASSWORD are
// the domain file's admin_user (without case) and admin_password. Otherwise the tool
// prints an error to standard error, nothing to standard output, and exits with 1.
#include <strings.h>

#include <cctype>
#include <cstdio>
#include <cstring>
#include <string>

#include "sim/lib/domain_sim.h"
#include "tools.h"

namespace {

int usage()
{
    std::fprintf(stderr, "Usage: net ads workgroup|lookup -S REALM -U USER%%PASSWORD\n");
    return 2;
}

int unreachable()
{
    std::fprintf(stderr, "ads_connect: No logon servers are currently available to service the logon request.\n");
    return 1;
}

void print_lookup(const SimulatedDomain& domain)
{
    std::string lower_realm = domain.realm;
    for (char& c : lower_realm)
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    std::printf("Information for Domain Controller: %s\n\n", domain.dns.c_str());
    std::printf("Response Type: LOGON_SAM_LOGON_RESPONSE_EX\n");
    std::printf("GUID: 7c4d5b5e-1f2a-4e8b-9a34-5d6e7f809a1b\n");
    std::printf("Flags:\n");
    std::printf("\tIs a PDC:                                   yes\n");
    std::printf("\tIs a GC of the forest:                      yes\n");
    std::printf("\tIs an LDAP server:                          yes\n");
    std::printf("\tSupports DS:                                yes\n");
    std::printf("\tIs running a KDC:                           yes\n");
    std::printf("\tIs running time services:                   yes\n");
    std::printf("\tIs the closest DC:                          yes\n");
    std::printf("\tIs writable:                                yes\n");
    std::printf("Forest:\t\t\t%s\n", lower_realm.c_str());
    std::printf("Domain:\t\t\t%s\n", lower_realm.c_str());
    std::printf("Domain Controller:\t%s\n", domain.controller.c_str());
    std::printf("Pre-Win2k Domain:\t%s\n", domain.workgroup.c_str());
    std::printf("Pre-Win2k Hostname:\t%s\n", domain.controller.substr(0, domain.controller.find('.')).c_str());
    std::printf("Server Site Name :\t\tDefault-First-Site-Name\n");
    std::printf("Client Site Name :\t\tDefault-First-Site-Name\n");
    std::printf("NT Version: 5\n");
    std::printf("LMNT Token: ffff\n");
    std::printf("LM20 Token: ffff\n");
}

} // namespace

int tool_net(int argc, char** argv)
{
    if (argc != 7 || std::strcmp(argv[1], "ads") != 0 || std::strcmp(argv[3], "-S") != 0
        || std::strcmp(argv[5], "-U") != 0)
        return usage();
    const std::string what = argv[2];
    if (what != "workgroup" && what != "lookup")
        return usage();
    const std::string credentials = argv[6];
    const auto percent = credentials.find('%');
    const std::string user = credentials.substr(0, percent);
    const std::string password = percent == std::string::npos ? "" : credentials.substr(percent + 1);

    const std::optional<SimulatedDomain> domain = load_simulated_domain();
    if (!domain || strcasecmp(argv[4], domain->realm.c_str()) != 0 || primary_dns_server() != domain->dns)
        return unreachable();
    if (strcasecmp(user.c_str(), domain->admin_user.c_str()) != 0 || password != domain->admin_password) {
        std::fprintf(stderr, "ads_connect: The attempted logon is invalid. This is either due to a bad username or "
                             "authentication information.\n");
        return 1;
    }
    if (what == "workgroup")
        std::printf("Workgroup: %s\n", domain->workgroup.c_str());
    else
        print_lookup(*domain);
    return 0;
}

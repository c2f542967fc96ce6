// wbinfo: the directory domain as the device's winbind sees it, from the simulated
// domain ("/sim/domain.conf", sim/lib/domain_sim.h).
//
//   wbinfo -u    the domain's users, one per line, in the file's order (without a
//                domain: the real tool's error on standard error, exit 1)
//   wbinfo -t    the trust check, in the real tool's words: "good" succeeds, "failed"
//                fails, "unreachable" (or no domain at all) cannot check.
#include <cstdio>
#include <cstring>

#include "sim/lib/domain_sim.h"
#include "tools.h"

namespace {

int list_users(const std::optional<SimulatedDomain>& domain)
{
    if (!domain) {
        std::fprintf(stderr, "failed to call wbcListUsers: WBC_ERR_WINBIND_NOT_AVAILABLE\nError looking up domain users\n");
        return 1;
    }
    for (const std::string& user : domain->users)
        std::printf("%s\n", user.c_str());
    return 0;
}

int check_trust(const std::optional<SimulatedDomain>& domain)
{
    if (domain && domain->trust == "good") {
        std::printf("checking the trust secret for domain %s via RPC calls succeeded\n", domain->workgroup.c_str());
        return 0;
    }
    if (domain && domain->trust == "failed") {
        std::printf("checking the trust secret for domain %s via RPC calls failed\n"
                    "failed to call wbcCheckTrustCredentials: WBC_ERR_AUTH_ERROR\n"
                    "Could not check secret\n",
                    domain->workgroup.c_str());
        return 1;
    }
    std::printf("failed to call wbcCheckTrustCredentials: WBC_ERR_WINBIND_NOT_AVAILABLE\n"
                "Could not check secret\n");
    return 1;
}

} // namespace

int tool_wbinfo(int argc, char** argv)
{
    const std::optional<SimulatedDomain> domain = load_simulated_domain();
    if (argc == 2 && std::strcmp(argv[1], "-u") == 0)
        return list_users(domain);
    if (argc == 2 && std::strcmp(argv[1], "-t") == 0)
        return check_trust(domain);
    std::fprintf(stderr, "Usage: wbinfo [-u|-t]\n");
    return 1;
}

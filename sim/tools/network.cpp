// network: the device's network manager. Of its work the simulated device keeps one
// effect, the DNS servers the resolver uses:
//
//   network -x N -D "DNS1 DNS2 DNS3"   the listed servers, primary first, become the
//                                      resolver's (sim/lib/domain_sim.h); N is the
//                                      interface number
// Every other use (network -r, the restart) only records itself.
#include <cstring>

#include "sim/lib/domain_sim.h"
#include "tools.h"

int tool_network(int argc, char** argv)
{
    for (int i = 1; i + 1 < argc; ++i) {
        if (std::strcmp(argv[i], "-D") == 0)
            return set_dns_servers(argv[i + 1]) ? 0 : 1;
    }
    return 0;
}

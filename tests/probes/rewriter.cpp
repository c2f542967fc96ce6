// Rewrites a shared file many times through the program's own code, as requests do:
//   rewriter config N     N saves of config.xml, "/system_mgr/nfs/enable" alternating 0 and 1
//   rewriter exports N    N rewrites of /etc/exports: the rules of S0 to S9 (on the
//                         first volume, host 10.0.0.1) in turn switch between rw and ro
#include <cstdio>
#include <cstdlib>
#include <string>
#include <string_view>

#include "nfs/exports_engine.h"
#include "platform/config_store.h"

int main(int argc, char** argv)
{
    if (argc != 3)
        return 2;
    const std::string_view what = argv[1];
    const long count = std::atol(argv[2]);
    int failed = 0;
    for (long i = 0; i < count; ++i) {
        if (what == "config") {
            xml_set_str("/system_mgr/nfs/enable", i % 2 == 0 ? "0" : "1");
            failed += xml_write_file("/etc/NAS_CFG/config.xml") != 0 ? 1 : 0;
        } else if (what == "exports") {
            const std::string folder = "/mnt/HD/HD_a2/S" + std::to_string(i % 10);
            failed += modify_config_string(folder.c_str(), "10.0.0.1", "10.0.0.1", static_cast<int>(i / 10 % 2), 1) != 0;
        } else {
            return 2;
        }
    }
    std::printf("%d failed\n", failed);
    return 0;
}

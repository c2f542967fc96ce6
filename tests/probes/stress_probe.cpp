// Rewrites shared files through the program's own code as requests do, or reads them
// over and over meanwhile:
//   stress_probe rewrite config N     N saves of config.xml ("/system_mgr/nfs/enable" 0, 1, ...)
//   stress_probe rewrite exports N    N rewrites of /etc/exports: the rules of S0 to S9 (first
//                                     volume, host 10.0.0.1) in turn switch between rw and ro
//   stress_probe read ROUNDS PAUSE_US FILE...
// A rewriter prints "FAILED failed". A reader counts the rounds in which a file was empty
// or cut short: it is whole when it ends in a newline and, for XML, with "</config>\n",
// and every line of any other file begins with a double quote. It prints "TORN of ROUNDS".
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <string>
#include <string_view>
#include <thread>

#include "nfs/exports_engine.h"
#include "platform/config_store.h"

namespace {

bool whole(std::string_view path, std::string_view content)
{
    if (!content.ends_with('\n'))
        return false;
    if (path.ends_with(".xml"))
        return content.ends_with("</config>\n");
    for (std::size_t begin = 0; begin < content.size(); begin = content.find('\n', begin) + 1) {
        if (content[begin] != '"')
            return false;
    }
    return true;
}

} // namespace

int main(int argc, char** argv)
{
    const std::string_view what = argc > 2 ? argv[1] : "";
    const long count = argc > 2 ? std::atol(argv[2]) : 0;
    if (what == "rewrite" && argc == 4) {
        const std::string_view file = argv[2];
        const long times = std::atol(argv[3]);
        int failed = 0;
        for (long i = 0; i < times; ++i) {
            if (file == "config") {
                xml_set_str("/system_mgr/nfs/enable", i % 2 == 0 ? "0" : "1");
                failed += xml_write_file("/etc/NAS_CFG/config.xml") != 0 ? 1 : 0;
            } else {
                const std::string folder = "/mnt/HD/HD_a2/S" + std::to_string(i % 10);
                failed += modify_config_string(folder.c_str(), "10.0.0.1", "10.0.0.1", static_cast<int>(i / 10 % 2), 1) != 0;
            }
        }
        std::printf("%d failed\n", failed);
    } else if (what == "read" && argc > 4) {
        long torn = 0;
        for (long round = 0; round < count; ++round) {
            bool seen_torn = false;
            for (int i = 4; i < argc; ++i) {
                std::ifstream in(argv[i], std::ios::binary);
                seen_torn = seen_torn || !whole(argv[i], std::string(std::istreambuf_iterator<char>(in), {}));
            }
            torn += seen_torn ? 1 : 0;
            std::this_thread::sleep_for(std::chrono::microseconds(std::atol(argv[3])));
        }
        std::printf("%ld of %ld\n", torn, count);
    } else {
        return 2;
    }
    return 0;
}

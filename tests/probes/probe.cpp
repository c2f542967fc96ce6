// Runs one piece of the program's code inside a device and prints its result.
// The exports engine:
//   probe format FOLDER HOST RW ROOT_SQUASH HIDDEN     the line, in brackets
//   probe add|hadd FOLDER HOST RW ROOT_SQUASH           the operation's result
//   probe delete|hdelete FOLDER HOST
//   (a HOST of "(none)" passes no host at all)
// The shared helpers:
//   probe resolve SOURCE MODE | sizes | count | users | groups
//   probe base64 TEXT SIZE | element TAG VALUE | trace LENGTH | event NAME
// Shared files rewritten as requests do, or read over and over meanwhile:
//   probe rewrite config N     N saves of config.xml ("/system_mgr/nfs/enable" 0, 1, ...)
//   probe rewrite exports N    N rewrites of /etc/exports: the rules of S0 to S9 (first
//                              volume, host 10.0.0.1) in turn switch between rw and ro
//   probe read ROUNDS PAUSE_US FILE...
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

#include "cgi/event_log.h"
#include "cgi/fixed_text.h"
#include "cgi/trace.h"
#include "nfs/exports_engine.h"
#include "nfs/exports_parser.h"
#include "platform/cgic.h"
#include "platform/config_store.h"
#include "volumes/helpers.h"
#include "volumes/reserved_accounts.h"
#include "volumes/volume_table.h"

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
    if (argc < 2)
        return 2;
    const std::string_view what = argv[1];
    const char* folder = argc > 2 ? argv[2] : "";
    const char* host = argc > 3 && std::string_view(argv[3]) != "(none)" ? argv[3] : nullptr;
    auto number = [&](int i) { return std::atoi(argv[i]); };

    if (what == "format" && argc == 7) {
        FixedText<512> line;
        make_config_string(folder, host, number(4), number(5), line, number(6));
        std::printf("[%s]", line.c_str());
    } else if (what == "add" && argc == 6) {
        std::printf("%d", add_config_string(folder, host, number(4), number(5)));
    } else if (what == "hadd" && argc == 6) {
        std::printf("%d", add_hidden_config_string(folder, host, number(4), number(5)));
    } else if (what == "delete" && argc == 4) {
        std::printf("%d", delete_config_string(folder, host));
    } else if (what == "hdelete" && argc == 4) {
        std::printf("%d", delete_hidden_config_string(folder, host));
    } else if (what == "resolve" && argc == 4) {
        FixedText<512> result("(untouched)");
        resolve_volume_path(argv[2], result, number(3));
        std::printf("[%s]", result.c_str());
    } else if (what == "sizes") {
        FixedText<256> sizes;
        list_volume_sizes(sizes);
        std::printf("[%s]", sizes.c_str());
    } else if (what == "count") {
        std::printf("%d", count_volumes());
    } else if (what == "users") {
        std::printf("%d", count_listed_users());
    } else if (what == "groups") {
        std::printf("%d", count_listed_groups());
    } else if (what == "base64" && argc == 4) {
        FixedText<16> decoded;
        decode_base64_field(reinterpret_cast<unsigned char*>(decoded.data()), argv[2], static_cast<std::size_t>(number(3)));
        std::fwrite(decoded.data(), 1, decoded.capacity, stdout);
    } else if (what == "element" && argc == 4) {
        write_xml_element(argv[2], argv[3]);
    } else if (what == "trace" && argc == 3) {
        const std::string line(static_cast<std::size_t>(number(2)), 'x');
        printf_out("%s|", line.c_str());
    } else if (what == "event" && argc == 3) {
        log_event("Account \"%s\" has been created.", argv[2]);
        log_event("Admin password has been modified.");
    } else if (what == "rewrite" && argc == 4) {
        int failed = 0;
        for (long i = 0; i < std::atol(argv[3]); ++i) {
            if (std::string_view(argv[2]) == "config") {
                xml_set_str("/system_mgr/nfs/enable", i % 2 == 0 ? "0" : "1");
                failed += xml_write_file("/etc/NAS_CFG/config.xml") != 0 ? 1 : 0;
            } else {
                const std::string share = "/mnt/HD/HD_a2/S" + std::to_string(i % 10);
                failed += modify_config_string(share.c_str(), "10.0.0.1", "10.0.0.1", static_cast<int>(i / 10 % 2), 1) != 0;
            }
        }
        std::printf("%d failed\n", failed);
    } else if (what == "read" && argc > 4) {
        long torn = 0;
        for (long round = 0; round < std::atol(argv[2]); ++round) {
            bool seen_torn = false;
            for (int i = 4; i < argc; ++i) {
                std::ifstream in(argv[i], std::ios::binary);
                seen_torn = seen_torn || !whole(argv[i], std::string(std::istreambuf_iterator<char>(in), {}));
            }
            torn += seen_torn ? 1 : 0;
            std::this_thread::sleep_for(std::chrono::microseconds(std::atol(argv[3])));
        }
        std::printf("%ld of %s\n", torn, argv[2]);
    } else {
        return 2;
    }
    return 0;
}

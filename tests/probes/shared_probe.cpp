// Runs one shared helper of the program inside a device and prints its result:
//   shared_probe resolve SOURCE MODE | sizes | count | users | groups
//   shared_probe base64 TEXT SIZE | element TAG VALUE | trace LENGTH | event NAME
#include <cstdio>
#include <cstdlib>
#include <string>
#include <string_view>

#include "cgi/event_log.h"
#include "cgi/fixed_text.h"
#include "cgi/trace.h"
#include "platform/cgic.h"
#include "volumes/helpers.h"
#include "volumes/reserved_accounts.h"
#include "volumes/volume_table.h"

int main(int argc, char** argv)
{
    if (argc < 2)
        return 2;
    const std::string_view what = argv[1];
    if (what == "resolve" && argc == 4) {
        FixedText<512> result("(untouched)");
        resolve_volume_path(argv[2], result, std::atoi(argv[3]));
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
        decode_base64_field(reinterpret_cast<unsigned char*>(decoded.data()), argv[2],
                            static_cast<std::size_t>(std::atoi(argv[3])));
        std::fwrite(decoded.data(), 1, decoded.capacity, stdout);
    } else if (what == "element" && argc == 4) {
        write_xml_element(argv[2], argv[3]);
    } else if (what == "trace" && argc == 3) {
        const std::string line(static_cast<std::size_t>(std::atoi(argv[2])), 'x');
        printf_out("%s|", line.c_str());
    } else if (what == "event" && argc == 3) {
        log_event("Account \"%s\" has been created.", argv[2]);
        log_event("Admin password has been modified.");
    } else {
        return 2;
    }
    return 0;
}

// Runs one piece of the NFS exports engine inside a device and prints its result:
//   nfs_probe format FOLDER HOST RW ROOT_SQUASH HIDDEN     the line, in brackets
//   nfs_probe add|hadd FOLDER HOST RW ROOT_SQUASH           the operation's result
//   nfs_probe modify|hmodify FOLDER HOST NEWIP RW ROOT_SQUASH
//   nfs_probe delete|hdelete FOLDER HOST
// A HOST of "(none)" passes no host at all.
#include <cstdio>
#include <cstdlib>
#include <string_view>

#include "cgi/fixed_text.h"
#include "nfs/exports_engine.h"
#include "nfs/exports_parser.h"

int main(int argc, char** argv)
{
    if (argc < 3)
        return 2;
    const std::string_view what = argv[1];
    const char* folder = argv[2];
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
    } else if (what == "modify" && argc == 7) {
        std::printf("%d", modify_config_string(folder, host, argv[4], number(5), number(6)));
    } else if (what == "hmodify" && argc == 7) {
        std::printf("%d", modify_hidden_config_string(folder, host, argv[4], number(5), number(6)));
    } else if (what == "delete" && argc == 4) {
        std::printf("%d", delete_config_string(folder, host));
    } else if (what == "hdelete" && argc == 4) {
        std::printf("%d", delete_hidden_config_string(folder, host));
    } else {
        return 2;
    }
    return 0;
}

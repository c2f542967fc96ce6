// Entry of the simulated platform tools: the name it was started under picks the tool.
#include <array>
#include <cstdio>
#include <string>
#include <vector>

#include "sim/lib/journal.h"
#include "tools.h"

namespace {

constexpr std::array<Tool, 22> kTools{{
    {"account", tool_account},
    {"account_mgr", tool_account_mgr},
    {"quota_set", tool_quota_set},
    {"smbcom", record_only},
    {"afpcom", record_only},
    {"rsyncom", record_only},
    {"makedav", record_only},
    {"nfs", record_only},
    {"exportfs", record_only},
    {"afp", record_only},
    {"ftp", record_only},
    {"network", tool_network},
    {"smbcmd", record_only},
    {"net", tool_net},
    {"wbinfo", tool_wbinfo},
    {"getfacl", tool_getfacl},
    {"setfacl", tool_setfacl},
    {"gpasswd", tool_gpasswd},
    {"usermod", tool_usermod},
    {"chfn", tool_chfn},
    {"snmp_tool", record_only},
    {"avahi_tm_serv", record_only},
}};

std::string_view base_name(std::string_view path)
{
    const auto slash = path.rfind('/');
    return slash == std::string_view::npos ? path : path.substr(slash + 1);
}

} // namespace

int record_only(int, char**)
{
    return 0;
}

int main(int argc, char** argv)
{
    if (argc < 1)
        return 127;
    const std::string_view name = base_name(argv[0]);
    for (const Tool& tool : kTools) {
        if (tool.name != name)
            continue;
        journal_record(name, std::vector<std::string>(argv + 1, argv + argc));
        return tool.run(argc, argv);
    }
    std::fprintf(stderr, "nas-platform: no tool called %.*s\n", static_cast<int>(name.size()), name.data());
    return 127;
}

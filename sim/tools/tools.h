// The simulated platform tools: one program installed under every tool name. Each
// run is recorded in the journal with its argv before the tool does its work.
#pragma once

#include <string_view>

using ToolMain = int (*)(int argc, char** argv);

struct Tool {
    std::string_view name;
    ToolMain run;
};

// A tool whose only effect on the simulated device is its journal line.
int record_only(int argc, char** argv);

// account.cpp
int tool_account(int argc, char** argv);
// account_mgr.cpp
int tool_account_mgr(int argc, char** argv);
// quota_set.cpp
int tool_quota_set(int argc, char** argv);
// passwd_tools.cpp
int tool_gpasswd(int argc, char** argv);
int tool_usermod(int argc, char** argv);
int tool_chfn(int argc, char** argv);
// wbinfo.cpp
int tool_wbinfo(int argc, char** argv);
// net.cpp
int tool_net(int argc, char** argv);
// network.cpp
int tool_network(int argc, char** argv);

// acl.cpp
int tool_getfacl(int argc, char** argv);
int tool_setfacl(int argc, char** argv);

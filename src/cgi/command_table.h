// The names the pages send in "cmd", and their handlers.
#pragma once

#include <span>
#include <string_view>

struct Command {
    std::string_view name;
    void (*handler)();
};

// All 52 commands, in the order in which "cmd" is compared with them.
std::span<const Command> command_table();

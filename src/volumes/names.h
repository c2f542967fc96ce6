// The one name rule: which user, group and share names can never be valid, because
// they would break a path, a line-based file or a tool's options.
#pragma once

#include <string_view>

// False for a name that holds a control character (tab, newline, DEL, ...) or "/",
// for "." and "..", and for a name that begins with "-". The empty name passes:
// each command keeps its own answer for a missing name.
// Everything else is left to the platform tools, which decide as they always did.
bool is_acceptable_name(std::string_view name);

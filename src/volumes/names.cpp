// The one name rule.
#include "volumes/names.h"

bool is_acceptable_name(std::string_view name)
{
    if (name == "." || name == ".." || (!name.empty() && name.front() == '-'))
        return false;
    for (const unsigned char c : name) {
        if (c < 0x20 || c == 0x7f || c == '/')
            return false;
    }
    return true;
}

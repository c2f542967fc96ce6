// wbinfo: the directory domain's users and trust as the device sees them. Not built yet.
#include "tools.h"

int tool_wbinfo(int, char**) { return 1; }

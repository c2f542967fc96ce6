// gpasswd, usermod and chfn. Not built yet: only their journal lines.
#include "tools.h"

int tool_gpasswd(int, char**) { return 0; }
int tool_usermod(int, char**) { return 0; }
int tool_chfn(int, char**) { return 0; }

// The bulk account tool. Not built yet: only its journal line.
#include "tools.h"

int tool_account_mgr(int, char**) { return 0; }

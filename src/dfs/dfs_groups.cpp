// Not built yet: until then these commands answer nothing, like unknown ones.
#include "cgi/handlers.h"

void cgi_set_dfs_enable() {}
void cgi_get_dfs_info() {}
void cgi_set_dfs_group() {}
void cgi_chk_dfs_group() {}
void cgi_get_dfs_gorup_list() {}

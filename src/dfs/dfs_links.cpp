// Not built yet: until then these commands answer nothing, like unknown ones.
#include "cgi/handlers.h"

void cgi_set_dfs() {}
void cgi_modify_dfs() {}
void cgi_del_dfs() {}
void cgi_get_dfs_list() {}
void cgi_get_dfs_sharename() {}
void cgi_get_host_folder() {}
void cgi_chk_dfs() {}

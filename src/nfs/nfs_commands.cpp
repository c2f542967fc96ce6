// Not built yet: until then these commands answer nothing, like unknown ones.
#include "cgi/handlers.h"

void cgi_set_nfs_share() {}
void cgi_get_nfs_info() {}
void cgi_nfs_enable() {}
void cgi_del_session() {}

// Not built yet: until then these commands answer nothing, like unknown ones.
#include "cgi/handlers.h"

void cgi_get_group_info() {}
void cgi_get_modify_group_info() {}

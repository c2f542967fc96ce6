// Not built yet: until then these commands answer nothing, like unknown ones.
#include "cgi/handlers.h"

void cgi_set_afp() {}
void cgi_get_afp_info() {}

// Not built yet: until then these commands answer nothing, like unknown ones.
#include "cgi/handlers.h"

void cgi_user_batch_create() {}

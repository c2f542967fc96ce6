// Not built yet: until then these commands answer nothing, like unknown ones.
#include "cgi/handlers.h"

void cgi_adduser_get_user_quota_maxsize() {}
void cgi_get_user_quota_maxsize() {}
void cgi_addgroup_get_group_quota_minsize() {}
void cgi_get_group_quota_minsize() {}

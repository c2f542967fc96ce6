// Not built yet: until then these commands answer nothing, like unknown ones.
#include "cgi/handlers.h"

void cgi_import_uesrs() {}
void cgi_get_import_uesrs() {}
void cgi_get_import_groups() {}
void cgi_create_import_users() {}
void cgi_create_import_groups() {}
void cgi_get_create_status() {}
void cgi_download_import_sample() {}
void cgi_download_import_group_sample() {}

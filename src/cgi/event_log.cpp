#include "cgi/event_log.h"

#include <syslog.h>

void log_event(const char* format, const char* name)
{
    openlog("SYSTEM", 0, 0);
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"
    syslog(LOG_INFO, format, name);
#pragma GCC diagnostic pop
    closelog();
}

void log_event(const char* message)
{
    openlog("SYSTEM", 0, 0);
    syslog(LOG_INFO, "%s", message);
    closelog();
}

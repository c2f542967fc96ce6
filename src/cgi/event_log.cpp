#include "cgi/event_log.h"

#include <string>
#include <syslog.h>

#include "cgi/text_escape.h"

void log_event(const char* format, const char* name)
{
    const std::string text = one_line(name);
    openlog("SYSTEM", 0, 0);
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"
    syslog(LOG_INFO, format, text.c_str());
#pragma GCC diagnostic pop
    closelog();
}

void log_event(const char* message)
{
    openlog("SYSTEM", 0, 0);
    syslog(LOG_INFO, "%s", message);
    closelog();
}

void log_refusal(const char* command, const char* field)
{
    openlog("SYSTEM", 0, 0);
    syslog(LOG_WARNING, "%s: refused the value of \"%s\"; nothing was changed for it.", command, field);
    closelog();
}

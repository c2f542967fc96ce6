// Account events for the system log: ident "SYSTEM", informational priority.
#pragma once

// Opens the log, writes `format` with its one text argument, closes the log.
void log_event(const char* format, const char* name);
// The same for an event without argument.
void log_event(const char* message);

// Account events for the system log: ident "SYSTEM", informational priority.
#pragma once

// Opens the log, writes `format` with its one text argument, closes the log. A control
// character in the text is written escaped: one event is one line.
void log_event(const char* format, const char* name);
// The same for an event without argument.
void log_event(const char* message);
// A warning event: `command` refused the value of its form field `field` (a value that
// can never be valid) and changed nothing for it. The value itself is not logged.
void log_refusal(const char* command, const char* field);

// The developer trace: lines to "/dev/console", only while "/tmp/cgi_debug" exists.
#pragma once

// A control character in a "%s" argument is written escaped ("\n" as the two
// characters): a value never adds a line of its own. The format's own line ends stay.
int printf_out(const char* format, ...) __attribute__((format(printf, 1, 2)));

// The program's own multi-line text (an export line with its line end, a heading),
// written as it is.
int printf_out_text(const char* text);

// Whether the trace is on now ("/tmp/cgi_debug" exists): for callers that would
// otherwise ask printf_out thousands of times in one request.
bool trace_enabled();

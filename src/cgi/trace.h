// The developer trace: lines to "/dev/console", only while "/tmp/cgi_debug" exists.
#pragma once

int printf_out(const char* format, ...) __attribute__((format(printf, 1, 2)));

// Whether the trace is on now ("/tmp/cgi_debug" exists): for callers that would
// otherwise ask printf_out thousands of times in one request.
bool trace_enabled();

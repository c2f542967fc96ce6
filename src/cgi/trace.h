// The developer trace: lines to "/dev/console", only while "/tmp/cgi_debug" exists.
#pragma once

int printf_out(const char* format, ...) __attribute__((format(printf, 1, 2)));

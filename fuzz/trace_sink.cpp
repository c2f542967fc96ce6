// The developer trace, for the fuzz targets: every line is formatted, as the device
// does while "/tmp/cgi_debug" exists (so a bad argument shows under the sanitizers),
// and then dropped instead of going to the console.
#include "cgi/trace.h"

#include <array>
#include <cstdarg>
#include <cstdio>
#include <cstring>

bool trace_enabled()
{
    return true;
}

int printf_out(const char* format, ...)
{
    std::array<char, 2560> line{};
    va_list args;
    va_start(args, format);
    std::vsnprintf(line.data(), line.size(), format, args);
    va_end(args);
    return static_cast<int>(std::strlen(line.data()));
}

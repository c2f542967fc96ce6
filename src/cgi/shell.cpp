#include "cgi/shell.h"

#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <memory>

namespace {

int format_and_run(std::size_t size, const char* format, va_list args)
{
    const std::unique_ptr<char, decltype(&std::free)> line(static_cast<char*>(std::calloc(size, 1)), std::free);
    if (!line)
        return 1;
    std::vsnprintf(line.get(), size, format, args);
    [[maybe_unused]] const int status = std::system(line.get());
    return 0;
}

} // namespace

int run_shell_command(const char* format, ...)
{
    va_list args;
    va_start(args, format);
    const int result = format_and_run(8192, format, args);
    va_end(args);
    return result;
}

void run_bounded_command(int size, const char* format, ...)
{
    va_list args;
    va_start(args, format);
    format_and_run(static_cast<std::size_t>(size), format, args);
    va_end(args);
}

void run_system(const char* line)
{
    [[maybe_unused]] const int status = std::system(line);
}

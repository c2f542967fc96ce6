#include "cgi/trace.h"

#include <array>
#include <cstdarg>
#include <cstdio>
#include <cstring>
#include <fcntl.h>
#include <string>
#include <string_view>
#include <unistd.h>

#include "cgi/text_escape.h"

namespace {

// 2560 bytes: a longer line is cut to 2559 characters.
constexpr std::size_t kLineLimit = 2559;

void append_formatted(std::string& out, const char* spec, ...) __attribute__((format(printf, 2, 3)));

void append_formatted(std::string& out, const char* spec, ...)
{
    std::array<char, kLineLimit + 1> piece{};
    va_list args;
    va_start(args, spec);
    std::vsnprintf(piece.data(), piece.size(), spec, args);
    va_end(args);
    out += piece.data();
}

// printf's conversions as the trace formats use them (flags, width, precision, the
// h/l/ll/z/j/t lengths; d i u o x X c s p %), with every "%s" argument escaped.
std::string format_escaped(const char* format, va_list args)
{
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"
#pragma GCC diagnostic ignored "-Wformat-security"
    std::string out;
    const char* p = format;
    while (*p != '\0' && out.size() <= kLineLimit) {
        if (*p != '%') {
            out += *p++;
            continue;
        }
        const char* start = p++;
        int star_args[2] = {0, 0};
        int stars = 0;
        while (*p != '\0' && std::strchr("-+ #0123456789.*", *p) != nullptr) {
            if (*p == '*' && stars < 2)
                star_args[stars++] = va_arg(args, int);
            ++p;
        }
        std::string length;
        while (*p != '\0' && std::strchr("hlLzjt", *p) != nullptr)
            length += *p++;
        if (*p == '\0')
            break;
        const char conversion = *p++;
        std::string spec(start, p);
        // Widths given as arguments are written into the spec.
        for (int i = 0; i < stars; ++i) {
            const std::size_t star = spec.find('*');
            spec.replace(star, 1, std::to_string(star_args[i]));
        }
        switch (conversion) {
        case '%':
            out += '%';
            break;
        case 's': {
            const char* text = va_arg(args, const char*);
            const std::string escaped = one_line(text != nullptr ? text : "(null)");
            append_formatted(out, spec.c_str(), escaped.c_str());
            break;
        }
        case 'c':
            append_formatted(out, spec.c_str(), va_arg(args, int));
            break;
        case 'p':
            append_formatted(out, spec.c_str(), va_arg(args, void*));
            break;
        case 'd':
        case 'i':
            if (length == "ll" || length == "j")
                append_formatted(out, spec.c_str(), va_arg(args, long long));
            else if (length == "l" || length == "z" || length == "t")
                append_formatted(out, spec.c_str(), va_arg(args, long));
            else
                append_formatted(out, spec.c_str(), va_arg(args, int));
            break;
        case 'u':
        case 'o':
        case 'x':
        case 'X':
            if (length == "ll" || length == "j")
                append_formatted(out, spec.c_str(), va_arg(args, unsigned long long));
            else if (length == "l" || length == "z" || length == "t")
                append_formatted(out, spec.c_str(), va_arg(args, unsigned long));
            else
                append_formatted(out, spec.c_str(), va_arg(args, unsigned int));
            break;
        default:
            // No other conversion is used by the trace; the rest of the format is dropped
            // rather than read with a wrong type.
            return out;
        }
    }
#pragma GCC diagnostic pop
    return out;
}

int write_console(std::string_view text)
{
    // A console that cannot be opened makes the write fail silently. Appending keeps
    // the lines of one request when the console is a plain file (the simulated device).
    const std::string_view line = text.substr(0, kLineLimit);
    const int console = open("/dev/console", O_WRONLY | O_APPEND);
    const ssize_t written = write(console, line.data(), line.size());
    if (console >= 0)
        close(console);
    return static_cast<int>(written);
}

} // namespace

bool trace_enabled()
{
    return access("/tmp/cgi_debug", F_OK) == 0;
}

int printf_out(const char* format, ...)
{
    // The switch file's mere existence turns the trace on; nothing is formatted otherwise.
    if (!trace_enabled())
        return 0;
    va_list args;
    va_start(args, format);
    const std::string line = format_escaped(format, args);
    va_end(args);
    return write_console(line);
}

int printf_out_text(const char* text)
{
    if (!trace_enabled())
        return 0;
    return write_console(text);
}

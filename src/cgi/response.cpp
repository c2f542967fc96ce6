#include "cgi/response.h"

#include <array>
#include <charconv>
#include <cstdarg>
#include <string_view>

namespace {

// True when the format has no conversions but %s, %d and %%, the answers' own.
bool plain_format(std::string_view format)
{
    for (std::size_t at = format.find('%'); at != std::string_view::npos; at = format.find('%', at + 2)) {
        if (at + 1 >= format.size() || (format[at + 1] != 's' && format[at + 1] != 'd' && format[at + 1] != '%'))
            return false;
    }
    return true;
}

// The pieces of one out() call, gathered and written with fputs (a part of the C
// library that every request loads anyway).
class Pieces {
public:
    ~Pieces() { flush(); }
    void add(std::string_view piece)
    {
        for (const char c : piece) {
            if (m_size + 1 == m_buffer.size())
                flush();
            m_buffer[m_size++] = c;
        }
    }

private:
    void flush()
    {
        m_buffer[m_size] = '\0';
        std::fputs(m_buffer.data(), cgiOut);
        m_size = 0;
    }
    std::array<char, 256> m_buffer{};
    std::size_t m_size = 0;
};

} // namespace

// Most answers are text with %s and %d: those are written here as printf would write
// them, so that a request does not load printf's code; any other format goes to it.
void out(const char* format, ...)
{
    va_list args;
    va_start(args, format);
    const std::string_view text(format);
    if (!plain_format(text)) {
        std::vfprintf(cgiOut, format, args);
        va_end(args);
        return;
    }
    Pieces pieces;
    std::size_t done = 0;
    for (std::size_t at = text.find('%'); at != std::string_view::npos; at = text.find('%', done)) {
        pieces.add(text.substr(done, at - done));
        done = at + 2;
        if (text[at + 1] == '%') {
            pieces.add("%");
        } else if (text[at + 1] == 's') {
            const char* value = va_arg(args, const char*);
            pieces.add(value ? value : "(null)");
        } else {
            std::array<char, 16> digits{};
            const auto [end, error] = std::to_chars(digits.data(), digits.data() + digits.size(), va_arg(args, int));
            pieces.add({digits.data(), static_cast<std::size_t>(end - digits.data())});
        }
    }
    pieces.add(text.substr(done));
    va_end(args);
}

void write_no_cache_lines()
{
    std::fputs("Pragma: no-cache\r\nCache-Control: no-cache\r\n", cgiOut);
}

void write_xml_header(Charset charset)
{
    write_no_cache_lines();
    cgiHeaderContentType(charset == Charset::Utf8 ? "text/xml; charset=utf-8" : "text/xml");
}

void write_xml_prologue()
{
    std::fputs("<?xml version=\"1.0\" encoding=\"UTF-8\"?>", cgiOut);
}

void write_xml_prologue_spaced()
{
    std::fputs("<?xml version=\"1.0\" encoding=\"UTF-8\" ?>\n", cgiOut);
}

void answer_empty_html()
{
    cgiHeaderContentType("text/html");
}

#include "cgi/response.h"

#include <cstdarg>

void out(const char* format, ...)
{
    va_list args;
    va_start(args, format);
    std::vfprintf(cgiOut, format, args);
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

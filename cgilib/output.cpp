// The response stream and what the program writes to it through the library.
#include "platform/cgic.h"

#include <cstdio>

FILE* cgiOut = stdout;

extern "C" cgiFormResultType cgiHeaderContentType(const char* mime_type)
{
    // Three writes rather than a formatted one: printf's code is pages a request need not load.
    const bool ok = std::fputs("Content-Type: ", cgiOut) >= 0 && std::fputs(mime_type ? mime_type : "", cgiOut) >= 0 &&
                    std::fputs("\r\n\r\n", cgiOut) >= 0;
    return ok ? cgiFormSuccess : cgiFormIO;
}

extern "C" cgiFormResultType cgiHtmlEscape(const char* text)
{
    if (text == nullptr)
        return cgiFormSuccess;
    const char* rest = text;
    bool ok = true;
    while (true) {
        // Runs of ordinary characters go out in one write.
        const char* special = rest;
        while (*special != '\0' && *special != '&' && *special != '<' && *special != '>' && *special != '"')
            ++special;
        const auto run = static_cast<std::size_t>(special - rest);
        ok = std::fwrite(rest, 1, run, cgiOut) == run && ok;
        if (*special == '\0')
            break;
        const char* entity = "&quot;";
        switch (*special) {
        case '&': entity = "&amp;"; break;
        case '<': entity = "&lt;"; break;
        case '>': entity = "&gt;"; break;
        default: break;
        }
        ok = std::fputs(entity, cgiOut) >= 0 && ok;
        rest = special + 1;
    }
    return ok ? cgiFormSuccess : cgiFormIO;
}

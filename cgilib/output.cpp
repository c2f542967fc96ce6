// The response stream and what the program writes to it through the library.
#include "platform/cgic.h"

#include <algorithm>
#include <cstdio>
#include <string_view>

FILE* cgiOut = stdout;

extern "C" cgiFormResultType cgiHeaderContentType(const char* mime_type)
{
    const int written = std::fprintf(cgiOut, "Content-Type: %s\r\n\r\n", mime_type ? mime_type : "");
    return written < 0 ? cgiFormIO : cgiFormSuccess;
}

extern "C" cgiFormResultType cgiHtmlEscape(const char* text)
{
    if (text == nullptr)
        return cgiFormSuccess;
    std::string_view rest(text);
    bool ok = true;
    while (!rest.empty()) {
        // Runs of ordinary characters go out in one write.
        const std::size_t special = std::min(rest.find_first_of("&<>\""), rest.size());
        ok = std::fwrite(rest.data(), 1, special, cgiOut) == special && ok;
        if (special == rest.size())
            break;
        const char* entity = "&quot;";
        switch (rest[special]) {
        case '&': entity = "&amp;"; break;
        case '<': entity = "&lt;"; break;
        case '>': entity = "&gt;"; break;
        default: break;
        }
        ok = std::fputs(entity, cgiOut) >= 0 && ok;
        rest.remove_prefix(special + 1);
    }
    return ok ? cgiFormSuccess : cgiFormIO;
}

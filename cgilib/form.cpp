// Placeholder until the request parser lands.
#include "platform/cgic.h"

#include <cstdio>
#include <cstring>

FILE* cgiOut = stdout;

extern "C" cgiFormResultType cgiFormString(const char*, char* result, int max)
{
    if (max > 0)
        result[0] = '\0';
    return cgiFormNotFound;
}
extern "C" cgiFormResultType cgiFormFileName(const char*, char* result, int max)
{
    if (max > 0)
        result[0] = '\0';
    return cgiFormNotFound;
}
extern "C" cgiFormResultType cgiFormFileRename(const char*, const char*) { return cgiFormNotFound; }
extern "C" cgiFormResultType cgiHeaderContentType(const char* mime)
{
    std::fprintf(cgiOut, "Content-Type: %s\r\n\r\n", mime);
    return cgiFormSuccess;
}
extern "C" cgiFormResultType cgiHtmlEscape(const char* text)
{
    std::fputs(text, cgiOut);
    return cgiFormSuccess;
}
extern "C" char* cgi_escapeshellarg(const char*) { return nullptr; }
extern "C" void cgi_escapeshellarg_free(void) {}

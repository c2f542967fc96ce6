// The CGI library: process entry, request parsing and the response stream.
// It owns main(): it parses the request from the CGI environment, sets up cgiOut
// and calls the program's cgiMain().
#pragma once

#include <stdio.h>

#ifdef __cplusplus
extern "C" {
#endif

typedef enum {
    cgiFormSuccess = 0,     // the field was found and copied whole
    cgiFormTruncated,       // the field was found and cut to fit
    cgiFormEmpty,           // the field was found and is empty
    cgiFormNotFound,        // there is no such field
    cgiFormNotAFile,        // the field is not a file upload
    cgiFormIO,              // a file operation failed
    cgiFormMemory,          // out of memory
} cgiFormResultType;

// The response stream (standard output).
extern FILE* cgiOut;

// Implemented by the program: the whole request after parsing.
int cgiMain(void);

// Copies at most max-1 bytes of the first field called `name` into `result` and
// always terminates it; a missing field gives the empty string.
cgiFormResultType cgiFormString(const char* name, char* result, int max);

// The client's file name of an uploaded file field, cut like cgiFormString.
cgiFormResultType cgiFormFileName(const char* name, char* result, int max);

// Moves the uploaded file of field `name` to `path` (across file systems too).
cgiFormResultType cgiFormFileRename(const char* name, const char* path);

// Writes "Content-Type: TYPE\r\n\r\n".
cgiFormResultType cgiHeaderContentType(const char* mime_type);

// Writes `text` to cgiOut with &, <, > and " as entities.
cgiFormResultType cgiHtmlEscape(const char* text);

// Returns `text` as one single-quoted shell word ("'" becomes '\''). The string
// stays valid until the next cgi_escapeshellarg_free(), which releases all of them.
char* cgi_escapeshellarg(const char* text);
void cgi_escapeshellarg_free(void);

#ifdef __cplusplus
}
#endif

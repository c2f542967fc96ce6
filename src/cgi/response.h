// The shapes every answer is built from, and the response stream itself.
#pragma once

#include <cstdio>

#include "platform/cgic.h"

// Writes to the response stream with printf formatting.
void out(const char* format, ...) __attribute__((format(printf, 1, 2)));

// "Pragma: no-cache\r\nCache-Control: no-cache\r\n", 43 bytes, ahead of the content type.
void write_no_cache_lines();

enum class Charset { Plain, Utf8 };
// The no-cache lines and the content type "text/xml" or "text/xml; charset=utf-8".
void write_xml_header(Charset charset);

// "<?xml version=\"1.0\" encoding=\"UTF-8\"?>", no newline.
void write_xml_prologue();
// "<?xml version=\"1.0\" encoding=\"UTF-8\" ?>\n": the NFS switch and the domain pages'.
void write_xml_prologue_spaced();

// The answer of change commands: the text/html content type and no body.
void answer_empty_html();

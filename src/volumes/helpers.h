// Small helpers that several command families share.
#pragma once

#include <cstddef>

// "<tag>", the value HTML-escaped, "</tag>". Tags are literal names from the program.
void write_xml_element(const char* tag, const char* value);

// Decodes standard base64 into `destination`, at most `size` bytes, without a
// terminator: callers zero the destination and pass a size smaller than it. Invalid
// input leaves what was decoded so far.
void decode_base64_field(unsigned char* destination, const char* source, std::size_t size);

// 1 when the text holds a backquote or "$(", after answering the request with an
// empty text/html page; the caller then stops. 0 otherwise, writing nothing.
int has_shell_metachars(const char* text);

// The config store's "/system_mgr/samba/ads_enable"; exactly 1 means joined.
int ads_enabled();

// The listing of an import file, as the import page shows what the device received.
#pragma once

#include <cstdio>

// Writes the records of `file` (read from its current position) to the response as
// "<info>\n", one "<item>...</item>\n" per record line, HTML-escaped, and "</info>\n".
// CR/LF are cut, empty and "#" lines are comments. A line longer than the
// 12288-byte reader comes out as several items.
void write_import_items(FILE* file);

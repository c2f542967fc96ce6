#include "bulk/import_listing.h"

#include "cgi/file.h"
#include "cgi/fixed_text.h"
#include "cgi/response.h"
#include "platform/cgic.h"
#include "platform/share.h"

void write_import_items(FILE* file)
{
    out("<info>\n");
    FixedText<12288> line;
    while (read_line(file, line)) {
        remove_0D_0A(line.data());
        if (line.empty() || line[0] == '#')
            continue;
        out("<item>");
        cgiHtmlEscape(line.c_str());
        out("</item>\n");
    }
    out("</info>\n");
}

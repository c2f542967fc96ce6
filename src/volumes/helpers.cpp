#include "volumes/helpers.h"

#include <cstdio>
#include <cstring>
#include <resolv.h>
#include <string>

#include "cgi/fixed_text.h"
#include "cgi/response.h"
#include "platform/config_store.h"

void write_xml_element(const char* tag, const char* value)
{
    // Each tag is formatted into a 1024-byte buffer; tags are literal names from the
    // program, never user text.
    FixedText<1024> opening;
    std::snprintf(opening.data(), opening.size(), "<%s>", tag);
    std::fputs(opening.c_str(), cgiOut);
    cgiHtmlEscape(value);
    FixedText<1024> closing;
    std::snprintf(closing.data(), closing.size(), "</%s>", tag);
    std::fputs(closing.c_str(), cgiOut);
}

void decode_base64_field(unsigned char* destination, const char* source, std::size_t size)
{
    [[maybe_unused]] const int length = b64_pton(source, destination, size);
}

int has_shell_metachars(const char* text)
{
    if (!std::strchr(text, '`') && !std::strstr(text, "$("))
        return 0;
    answer_empty_html();
    return 1;
}

int ads_enabled()
{
    return xml_get_int("/system_mgr/samba/ads_enable");
}

#include "cgilib/urlencoded.h"

namespace cgilib {

namespace {

int hex_digit(char c)
{
    if (c >= '0' && c <= '9')
        return c - '0';
    if (c >= 'a' && c <= 'f')
        return c - 'a' + 10;
    if (c >= 'A' && c <= 'F')
        return c - 'A' + 10;
    return -1;
}

} // namespace

std::string url_decode(std::string_view text)
{
    std::string decoded;
    decoded.reserve(text.size());
    for (std::size_t i = 0; i < text.size(); ++i) {
        const char c = text[i];
        if (c == '+') {
            decoded += ' ';
            continue;
        }
        if (c == '%' && i + 2 < text.size()) {
            const int high = hex_digit(text[i + 1]);
            const int low = hex_digit(text[i + 2]);
            if (high >= 0 && low >= 0) {
                decoded += static_cast<char>(high * 16 + low);
                i += 2;
                continue;
            }
        }
        decoded += c;
    }
    return decoded;
}

void parse_urlencoded(std::string_view text, FormFields& fields)
{
    while (!text.empty() && fields.size() < kMaxFields) {
        const std::size_t amp = text.find('&');
        const std::string_view piece = text.substr(0, amp);
        text.remove_prefix(amp == std::string_view::npos ? text.size() : amp + 1);

        const std::size_t eq = piece.find('=');
        std::string name = url_decode(piece.substr(0, eq));
        if (name.empty())
            continue;
        std::string value = eq == std::string_view::npos ? std::string() : url_decode(piece.substr(eq + 1));
        fields.push_back({std::move(name), std::move(value), std::nullopt});
    }
}

} // namespace cgilib

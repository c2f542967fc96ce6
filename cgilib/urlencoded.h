// Form fields in application/x-www-form-urlencoded text: query strings and bodies.
#pragma once

#include <string>
#include <string_view>

#include "cgilib/request.h"

namespace cgilib {

// "+" becomes a blank and %XX the byte XX. A percent sign not followed by two hex
// digits (%G1, %4 at the end, a lone %) is kept as it stands.
std::string url_decode(std::string_view text);

// Appends the fields of `text` ("a=1&b=2") to `fields`, up to kMaxFields in all.
// "name" without "=" is a field with an empty value; empty pieces and pieces
// with an empty name are skipped.
void parse_urlencoded(std::string_view text, FormFields& fields);

} // namespace cgilib

// Header values with parameters, as in Content-Type and Content-Disposition:
// `form-data; name="field"; filename="a.txt"`.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace cgilib {

struct HeaderValue {
    std::string value;   // lower-case, e.g. "multipart/form-data"
    std::vector<std::pair<std::string, std::string>> params;   // names lower-case

    // The first parameter so named (`name` in lower case), unquoted.
    std::optional<std::string> param(std::string_view name) const;
};

// A quoted parameter ends at the next double quote: browsers send a quote inside
// a file name as %22 and a backslash as itself, so a backslash escapes nothing.
HeaderValue parse_header_value(std::string_view text);

std::string to_lower(std::string_view text);

} // namespace cgilib

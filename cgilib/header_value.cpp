#include "cgilib/header_value.h"

namespace cgilib {

namespace {

constexpr std::string_view kBlanks = " \t";

std::string_view trim(std::string_view text)
{
    const std::size_t first = text.find_first_not_of(kBlanks);
    if (first == std::string_view::npos)
        return {};
    return text.substr(first, text.find_last_not_of(kBlanks) - first + 1);
}

// Takes text up to (not including) the first of `stops`, or all of it.
std::string_view take_until(std::string_view& text, std::string_view stops)
{
    const std::size_t end = std::min(text.find_first_of(stops), text.size());
    const std::string_view taken = text.substr(0, end);
    text.remove_prefix(end);
    return taken;
}

std::string take_param_value(std::string_view& text)
{
    text = text.substr(std::min(text.find_first_not_of(kBlanks), text.size()));
    if (text.empty() || text.front() != '"')
        return std::string(trim(take_until(text, ";")));
    text.remove_prefix(1);
    std::string value(take_until(text, "\""));
    if (!text.empty())
        text.remove_prefix(1);   // the closing quote
    take_until(text, ";");        // anything after it up to the next parameter
    return value;
}

} // namespace

std::string to_lower(std::string_view text)
{
    std::string lower(text);
    for (char& c : lower) {
        if (c >= 'A' && c <= 'Z')
            c = static_cast<char>(c - 'A' + 'a');
    }
    return lower;
}

std::optional<std::string> HeaderValue::param(std::string_view name) const
{
    for (const auto& [key, value] : params) {
        if (key == name)
            return value;
    }
    return std::nullopt;
}

HeaderValue parse_header_value(std::string_view text)
{
    HeaderValue parsed;
    parsed.value = to_lower(trim(take_until(text, ";")));
    while (!text.empty()) {
        text.remove_prefix(1);   // the ';'
        std::string name = to_lower(trim(take_until(text, "=;")));
        std::string value;
        if (!text.empty() && text.front() == '=') {
            text.remove_prefix(1);
            value = take_param_value(text);
        }
        if (!name.empty())
            parsed.params.emplace_back(std::move(name), std::move(value));
    }
    return parsed;
}

} // namespace cgilib

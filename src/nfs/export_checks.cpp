#include "nfs/export_checks.h"

#include <arpa/inet.h>
#include <array>
#include <cstdlib>
#include <string>

#include "cgi/fixed_text.h"
#include "nfs/exports_parser.h"

namespace {

bool all_of(std::string_view text, bool (*allowed)(char))
{
    for (const char c : text) {
        if (!allowed(c))
            return false;
    }
    return true;
}

bool is_digit(char c)
{
    return c >= '0' && c <= '9';
}

bool is_host_name_char(char c)
{
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || is_digit(c) || c == '-' || c == '.' || c == '_'
        || c == '*' || c == '?';
}

bool is_netgroup_char(char c)
{
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || is_digit(c) || c == '-' || c == '.' || c == '_';
}

// A decimal number of at most three digits no greater than `max`.
bool is_small_number(std::string_view text, int max)
{
    if (text.empty() || text.size() > 3 || !all_of(text, is_digit))
        return false;
    return std::atoi(std::string(text).c_str()) <= max;
}

bool is_address(int family, std::string_view text)
{
    std::array<unsigned char, 16> address{};
    return text.size() < 64 && inet_pton(family, std::string(text).c_str(), address.data()) == 1;
}

bool is_host_name(std::string_view host)
{
    // Labels of letters, digits, "-", "_" and wildcards, separated by single dots.
    return !host.empty() && all_of(host, is_host_name_char) && host.front() != '-' && host.front() != '.'
        && host.back() != '.' && host.find("..") == std::string_view::npos;
}

bool is_below_a_volume(std::string_view path)
{
    constexpr std::array<std::string_view, 3> kBases{"/mnt/HD/", "/mnt/USB/", "/mnt/isoMount/"};
    for (std::string_view base : kBases) {
        if (path.size() > base.size() && path.substr(0, base.size()) == base)
            return true;
    }
    return false;
}

bool fits_in_a_line(std::string_view path)
{
    for (const char c : path) {
        const auto byte = static_cast<unsigned char>(c);
        if (c == '"' || byte < 0x20 || byte == 0x7f)
            return false;
    }
    return true;
}

bool has_dot_component(std::string_view path)
{
    while (!path.empty()) {
        const std::size_t slash = path.find('/');
        const std::string_view component = path.substr(0, slash);
        if (component == "." || component == "..")
            return true;
        if (slash == std::string_view::npos)
            break;
        path.remove_prefix(slash + 1);
    }
    return false;
}

} // namespace

bool is_export_host(std::string_view host)
{
    if (host.empty() || host == "*")
        return true;
    if (host.front() == '@')
        return host.size() > 1 && all_of(host.substr(1), is_netgroup_char);
    const std::size_t slash = host.find('/');
    if (slash == std::string_view::npos)
        return is_address(AF_INET6, host) || is_host_name(host);
    const std::string_view address = host.substr(0, slash);
    const std::string_view mask = host.substr(slash + 1);
    if (is_address(AF_INET, address))
        return is_small_number(mask, 32) || is_address(AF_INET, mask);
    return is_address(AF_INET6, address) && is_small_number(mask, 128);
}

bool is_export_folder(const char* folder)
{
    const std::string_view text(folder);
    if (text.empty())
        return true;
    if (!fits_in_a_line(text))
        return false;
    FixedText<4096> resolved;
    if (canonical_path(folder, resolved))
        return is_below_a_volume(resolved.view()) && fits_in_a_line(resolved.view());
    return is_below_a_volume(text) && !has_dot_component(text);
}

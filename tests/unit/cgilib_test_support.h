// Driving the CGI library's request parser in-process, and reading fields back.
#pragma once

#include <algorithm>
#include <optional>
#include <sstream>
#include <string>

#include "cgilib/request.h"
#include "platform/cgic.h"

namespace cgilib_test {

struct TestRequest {
    std::string method = "POST";
    std::string query;
    std::string content_type;
    std::string body;
    std::optional<std::string> content_length;   // default: the body's size
};

// Parses `request`; returns how many body bytes the parser took from its stream.
inline std::streamoff parse(const TestRequest& request)
{
    std::istringstream body(request.body);
    cgilib::parse_request({request.method, request.query, request.content_type,
                           request.content_length.value_or(std::to_string(request.body.size()))},
                          body);
    body.clear();
    return body.tellg();
}

struct Read {
    cgiFormResultType result;
    std::string text;
    bool operator==(const Read&) const = default;
};

inline std::ostream& operator<<(std::ostream& out, const Read& read)
{
    return out << "{" << read.result << ", \"" << read.text << "\"}";
}

// Reads a field the way the program does, into a `size`-byte buffer; guard bytes
// after the buffer catch writes beyond it.
template <typename ReadFunction>
Read read_into(ReadFunction read, const char* name, int size)
{
    constexpr std::size_t guard = 16;
    std::string buffer(static_cast<std::size_t>(std::max(size, 0)) + guard, '#');
    const cgiFormResultType result = read(name, buffer.data(), size);
    const std::size_t after = static_cast<std::size_t>(std::max(size, 0));
    if (buffer.substr(after) != std::string(guard, '#'))
        return {result, "<written beyond the buffer>"};
    if (size <= 0)
        return {result, ""};
    const std::size_t end = buffer.find('\0');
    if (end >= after)
        return {result, "<not terminated>"};
    return {result, buffer.substr(0, end)};
}

inline Read form_string(const char* name, int size = 256) { return read_into(cgiFormString, name, size); }
inline Read form_file_name(const char* name, int size = 256) { return read_into(cgiFormFileName, name, size); }

} // namespace cgilib_test

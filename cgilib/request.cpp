#include "cgilib/request.h"

#include <charconv>
#include <cstdlib>

#include "cgilib/body_reader.h"
#include "cgilib/header_value.h"
#include "cgilib/multipart.h"
#include "cgilib/urlencoded.h"

namespace cgilib {

namespace {

FormFields& request_fields()
{
    // Destroyed at exit, which removes the uploads nobody renamed.
    static FormFields fields;
    return fields;
}

std::string variable(const char* name)
{
    const char* value = std::getenv(name);
    return value ? value : "";
}

// CONTENT_LENGTH as a plain decimal number; anything else (a sign, blanks, a
// number too large for 64 bits) means there is no body to read.
std::optional<std::uint64_t> content_length(std::string_view text)
{
    std::uint64_t length = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), length);
    if (text.empty() || error != std::errc() || end != text.data() + text.size())
        return std::nullopt;
    return length;
}

FormFields read_urlencoded_body(const ByteSource& body, std::uint64_t length)
{
    // Read in pieces: memory grows with what arrives, not with what was announced.
    BodyReader reader(body, length);
    const std::string_view text = reader.peek(static_cast<std::size_t>(length));
    FormFields fields;
    if (!reader.short_read())
        parse_urlencoded(text, fields);
    return fields;
}

FormFields read_body(const CgiEnvironment& environment, const ByteSource& body)
{
    const auto length = content_length(environment.content_length);
    if (environment.request_method != "POST" || !length || *length == 0)
        return {};
    if (parse_header_value(environment.content_type).value == "application/x-www-form-urlencoded")
        return *length <= kMaxUrlencodedBody ? read_urlencoded_body(body, *length) : FormFields{};
    const auto boundary = multipart_boundary(environment.content_type);
    if (boundary && *length <= kMaxMultipartBody)
        return parse_multipart(body, *length, *boundary);
    return {};
}

} // namespace

CgiEnvironment environment_from_process()
{
    return {variable("REQUEST_METHOD"), variable("QUERY_STRING"), variable("CONTENT_TYPE"),
            variable("CONTENT_LENGTH")};
}

void parse_request(const CgiEnvironment& environment, const ByteSource& body)
{
    FormFields fields = read_body(environment, body);
    parse_urlencoded(environment.query_string, fields);
    request_fields() = std::move(fields);
}

void parse_request(const CgiEnvironment& environment)
{
    FormFields fields;
    parse_urlencoded(environment.query_string, fields);
    request_fields() = std::move(fields);
}

FormField* find_field(std::string_view name)
{
    for (FormField& field : request_fields()) {
        if (field.name == name)
            return &field;
    }
    return nullptr;
}

} // namespace cgilib

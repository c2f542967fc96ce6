// Form fields in a multipart/form-data body: ordinary fields and file uploads.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "cgilib/request.h"

namespace cgilib {

// The boundary named by a multipart/form-data content type, if it names a usable one
// (1 to 200 bytes).
std::optional<std::string> multipart_boundary(std::string_view content_type);

// Reads the `length`-byte body from `body` and returns its fields in body order.
// A part with a non-empty file name is an upload, written to a temporary file as it
// arrives; any other part is a field whose value is the part's content.
// Parts that cannot be read are left out: a part without a name, one without a
// complete header block, one cut off by the end of the body. Whatever follows the
// closing delimiter is ignored and not read. When the input ends before `length`
// bytes while parts are still being read, the body gives no fields at all.
FormFields parse_multipart(const ByteSource& body, std::uint64_t length, std::string_view boundary);
inline FormFields parse_multipart(std::istream& body, std::uint64_t length, std::string_view boundary)
{
    return parse_multipart(stream_source(body), length, boundary);
}

} // namespace cgilib

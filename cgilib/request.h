// The parsed request: the CGI variables the parser reads, the form fields it found,
// and the limits that keep a hostile request from costing more than a fair one.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "cgilib/body_reader.h"
#include "cgilib/temp_file.h"

namespace cgilib {

// What is read of a request at most. A body announced as longer is not read at all.
inline constexpr std::uint64_t kMaxUrlencodedBody = 16u << 20;
inline constexpr std::uint64_t kMaxMultipartBody = 64u << 20;
// Fields beyond these counts are ignored (uploads beyond theirs are not stored).
inline constexpr std::size_t kMaxFields = 10000;
inline constexpr std::size_t kMaxUploads = 16;

// The CGI variables of one request; an unset variable is the empty string.
struct CgiEnvironment {
    std::string request_method;
    std::string query_string;
    std::string content_type;
    std::string content_length;
};

// A file that arrived as a multipart part with a non-empty file name.
struct Upload {
    std::string client_name;   // as the browser sent it, path and all
    TempFile file;             // the received bytes; removed unless renamed
};

struct FormField {
    std::string name;
    std::string value;              // may hold any bytes, NUL included; empty for uploads
    std::optional<Upload> upload;
};

using FormFields = std::vector<FormField>;

// The CGI variables of this process.
CgiEnvironment environment_from_process();

// Parses the request and makes its fields the ones the cgiForm* calls see, replacing
// (and removing the uploads of) any earlier request. Reads at most CONTENT_LENGTH
// bytes of `body`, and only for a POST whose body type is understood.
// Field order, which decides repeated names (the first wins): the body's fields
// in body order, then the query string's.
// A body that ends before CONTENT_LENGTH bytes (a multipart one: before its closing
// delimiter) is dropped whole: a cut request must not act on a cut value.
void parse_request(const CgiEnvironment& environment, const ByteSource& body);
inline void parse_request(const CgiEnvironment& environment, std::istream& body)
{
    parse_request(environment, stream_source(body));
}
// The same for a request without a body to read (anything but a POST).
void parse_request(const CgiEnvironment& environment);

// The first field called `name`, or nullptr.
FormField* find_field(std::string_view name);

} // namespace cgilib

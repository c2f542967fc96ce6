// The request parser: query strings, url-encoded bodies and multipart bodies, with
// any bytes, any content type and lengths that lie. Afterwards every field is read
// back through the library's calls into buffers of exactly their size. And any
// bytes, sent properly encoded as a url-encoded value or as a multipart field,
// come back as exactly those bytes.
//
// Input: the first byte chooses the request; then CONTENT_TYPE up to the first
// newline, QUERY_STRING up to the next, and the rest is the body.
//   byte & 3:  0 GET, 1 POST url-encoded, 2 POST multipart/form-data with the
//              content-type line as its boundary, 3 POST with the content-type line
//   byte & 4:  CONTENT_LENGTH announces one byte more than the body holds
//   byte & 8:  the whole input is also sent as a value, percent-encoded and as a
//              multipart field (the round trips)
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <sstream>
#include <string>
#include <string_view>
#include <vector>

#include "cgilib/multipart.h"
#include "cgilib/request.h"
#include "cgilib/urlencoded.h"
#include "fuzz_check.h"
#include "platform/cgic.h"

namespace {

std::string_view take_line(std::string_view& text)
{
    const std::size_t end = text.find('\n');
    const std::string_view line = text.substr(0, end);
    text.remove_prefix(end == std::string_view::npos ? text.size() : end + 1);
    return line;
}

// Reads `name` back with cgiFormString and cgiFormFileName into heap buffers of
// exactly `max` bytes: anything written past them shows.
void read_back(const std::string& name)
{
    for (const int max : {0, 1, 8, 1024}) {
        std::vector<char> buffer(static_cast<std::size_t>(max), 'x');
        char* const result = max > 0 ? buffer.data() : nullptr;
        const cgiFormResultType string_result = cgiFormString(name.c_str(), result, max);
        fuzz_check(string_result >= cgiFormSuccess && string_result <= cgiFormNotFound, "a value's result");
        fuzz_check(max == 0 || std::memchr(result, '\0', buffer.size()) != nullptr, "the value is terminated");
        if (max == 0)
            continue;
        std::fill(buffer.begin(), buffer.end(), 'x');
        cgiFormFileName(name.c_str(), result, max);
        fuzz_check(std::memchr(result, '\0', buffer.size()) != nullptr, "the file name is terminated");
    }
}

void parse_request_from(std::string_view input)
{
    const unsigned mode = static_cast<unsigned char>(input.front());
    input.remove_prefix(1);
    const std::string_view type_line = take_line(input);
    const std::string_view query = take_line(input);
    const std::string_view body = input;

    cgilib::CgiEnvironment environment;
    environment.query_string = query;
    switch (mode & 3) {
    case 0: environment.request_method = "GET"; break;
    case 1: environment.content_type = "application/x-www-form-urlencoded"; break;
    case 2: environment.content_type = "multipart/form-data; boundary=" + std::string(type_line); break;
    default: environment.content_type = type_line; break;
    }
    if ((mode & 3) != 0) {
        environment.request_method = "POST";
        environment.content_length = std::to_string(body.size() + ((mode & 4) != 0 ? 1 : 0));
    }
    std::istringstream stream{std::string(body)};
    cgilib::parse_request(environment, stream);
    fuzz_check(stream.tellg() == -1 || static_cast<std::size_t>(stream.tellg()) <= body.size(), "read inside the body");

    fuzz_check(cgilib::find_field("") == nullptr, "no field without a name");
    // The names the program asks for most, and the first name the query string holds.
    for (const char* name : {"cmd", "name", "fileToUpload"})
        read_back(name);
    read_back(cgilib::url_decode(query.substr(0, query.find_first_of("=&"))));
}

std::string percent_encoded(std::string_view bytes)
{
    static constexpr char kHex[] = "0123456789ABCDEF";
    std::string text;
    text.reserve(3 * bytes.size());
    for (const unsigned char c : bytes) {
        text += '%';
        text += kHex[c >> 4];
        text += kHex[c & 15];
    }
    return text;
}

void check_urlencoded_round_trip(std::string_view bytes)
{
    cgilib::FormFields fields;
    cgilib::parse_urlencoded("v=" + percent_encoded(bytes) + "&w=1", fields);
    fuzz_check(fields.size() == 2 && fields[0].name == "v" && fields[0].value == bytes && fields[1].value == "1",
               "a percent-encoded value comes back whole");
}

void check_multipart_round_trip(std::string_view bytes)
{
    // A boundary that the value does not hold, as a sender chooses it: the value
    // follows a line break, so it must not begin with "--" and the boundary either.
    const std::string after_break = "\r\n" + std::string(bytes);
    std::string boundary = "b";
    while (after_break.find("\r\n--" + boundary) != std::string::npos)
        boundary += 'b';
    const std::string body = "--" + boundary + "\r\nContent-Disposition: form-data; name=\"v\"\r\n\r\n" +
                             std::string(bytes) + "\r\n--" + boundary + "--\r\n";
    std::istringstream stream(body);
    const cgilib::FormFields fields = cgilib::parse_multipart(stream, body.size(), boundary);
    fuzz_check(fields.size() == 1 && fields[0].name == "v" && fields[0].value == bytes && !fields[0].upload,
               "a multipart value comes back whole");
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    if (size == 0)
        return 0;
    const std::string_view input(reinterpret_cast<const char*>(data), size);
    parse_request_from(input);
    if ((data[0] & 8) != 0) {
        check_urlencoded_round_trip(input);
        check_multipart_round_trip(input);
    }
    return 0;
}

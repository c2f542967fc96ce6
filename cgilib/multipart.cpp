#include "cgilib/multipart.h"

#include <algorithm>

#include "cgilib/body_reader.h"
#include "cgilib/header_value.h"

namespace cgilib {

namespace {

constexpr std::size_t kMaxBoundary = 200;
// Bounds of what may stand between a delimiter and a part's content.
constexpr std::size_t kMaxBoundaryLineRest = 256;
constexpr std::size_t kMaxHeaderBlock = 16 * 1024;

constexpr std::string_view kLineBreak = "\r\n";
constexpr std::string_view kHeaderEnd = "\r\n\r\n";

void discard(std::string_view) {}

struct PartHeaders {
    std::optional<std::string> name;
    std::optional<std::string> file_name;
};

// `block` is the header block with the line break before each line, as it follows
// a boundary line: "\r\nContent-Disposition: ...\r\nContent-Type: ...".
PartHeaders parse_part_headers(std::string_view block)
{
    PartHeaders headers;
    while (!block.empty()) {
        block.remove_prefix(std::min(block.size(), kLineBreak.size()));
        const std::size_t end = block.find(kLineBreak);
        const std::string_view line = block.substr(0, end);
        block.remove_prefix(std::min(end, block.size()));

        const std::size_t colon = line.find(':');
        if (colon == std::string_view::npos || to_lower(line.substr(0, colon)) != "content-disposition")
            continue;
        const HeaderValue disposition = parse_header_value(line.substr(colon + 1));
        headers.name = disposition.param("name");
        headers.file_name = disposition.param("filename");
    }
    return headers;
}

class MultipartParser {
public:
    MultipartParser(const ByteSource& body, std::uint64_t length, std::string_view boundary)
        : m_reader(body, length, std::string(kLineBreak)), m_delimiter("\r\n--" + std::string(boundary))
    {
    }

    FormFields parse()
    {
        // The body is read as if it began with a line break, so that the first
        // delimiter looks like all the others.
        bool at_delimiter = m_reader.copy_until(m_delimiter, discard);
        while (at_delimiter && m_reader.peek(2) != "--") {
            // Anything else on the boundary line is padding; the line break that
            // ends it is left to start the header block.
            const std::size_t line_end = m_reader.find(kLineBreak, kMaxBoundaryLineRest);
            if (line_end == std::string_view::npos)
                break;
            m_reader.skip(line_end);
            at_delimiter = read_part();
        }
        if (m_reader.short_read())
            return {};
        return std::move(m_fields);
    }

private:
    // Reads one part up to and including the delimiter after it; false when the
    // body ended before that delimiter.
    bool read_part()
    {
        const std::size_t header_end = m_reader.find(kHeaderEnd, kMaxHeaderBlock);
        const std::size_t next = m_reader.find(m_delimiter, kMaxHeaderBlock + kHeaderEnd.size());
        const bool headers_complete = header_end != std::string_view::npos &&
                                      (next == std::string_view::npos || next >= header_end + kHeaderEnd.size());
        if (!headers_complete)
            return m_reader.copy_until(m_delimiter, discard);

        const PartHeaders headers = parse_part_headers(m_reader.peek(header_end));
        m_reader.skip(header_end + kHeaderEnd.size());
        if (!headers.name || headers.name->empty() || m_fields.size() >= kMaxFields)
            return m_reader.copy_until(m_delimiter, discard);
        if (headers.file_name && !headers.file_name->empty())
            return read_upload(*headers.name, *headers.file_name);
        return read_value(*headers.name);
    }

    bool read_value(const std::string& name)
    {
        std::string value;
        const bool complete = m_reader.copy_until(m_delimiter, [&](std::string_view bytes) { value += bytes; });
        if (complete)
            m_fields.push_back({name, std::move(value), std::nullopt});
        return complete;
    }

    bool read_upload(const std::string& name, const std::string& file_name)
    {
        const auto uploads = std::count_if(m_fields.begin(), m_fields.end(),
                                           [](const FormField& field) { return field.upload.has_value(); });
        auto file = static_cast<std::size_t>(uploads) < kMaxUploads ? TempFile::create() : std::nullopt;
        if (!file)
            return m_reader.copy_until(m_delimiter, discard);

        bool written = true;
        const bool complete = m_reader.copy_until(m_delimiter, [&](std::string_view bytes) {
            written = written && file->write(bytes);
        });
        written = file->finish() && written;
        if (complete && written)
            m_fields.push_back({name, {}, Upload{file_name, std::move(*file)}});
        return complete;
    }

    BodyReader m_reader;
    const std::string m_delimiter;
    FormFields m_fields;
};

} // namespace

std::optional<std::string> multipart_boundary(std::string_view content_type)
{
    const HeaderValue type = parse_header_value(content_type);
    if (type.value != "multipart/form-data")
        return std::nullopt;
    auto boundary = type.param("boundary");
    if (!boundary || boundary->empty() || boundary->size() > kMaxBoundary)
        return std::nullopt;
    return boundary;
}

FormFields parse_multipart(const ByteSource& body, std::uint64_t length, std::string_view boundary)
{
    return MultipartParser(body, length, boundary).parse();
}

} // namespace cgilib

#include "cgilib/body_reader.h"

#include <algorithm>

namespace cgilib {

namespace {
constexpr std::size_t kChunk = 64 * 1024;
}

BodyReader::BodyReader(const ByteSource& in, std::uint64_t length, std::string prefix)
    : m_in(in), m_remaining(length), m_buffer(std::move(prefix))
{
}

std::string_view BodyReader::available() const
{
    return std::string_view(m_buffer).substr(m_pos);
}

// Appends up to one chunk of input; false when nothing more comes.
bool BodyReader::read_chunk()
{
    if (m_remaining == 0)
        return false;
    m_buffer.erase(0, m_pos);
    m_pos = 0;
    const std::size_t wanted = static_cast<std::size_t>(std::min<std::uint64_t>(kChunk, m_remaining));
    const std::size_t old_size = m_buffer.size();
    m_buffer.resize(old_size + wanted);
    std::size_t got = 0;
    while (got < wanted) {
        const std::size_t piece = m_in(m_buffer.data() + old_size + got, wanted - got);
        if (piece == 0)
            break;
        got += piece;
    }
    m_buffer.resize(old_size + got);
    m_remaining -= got;
    if (got < wanted) {
        m_short = true;
        m_remaining = 0;
    }
    return got > 0;
}

void BodyReader::fill(std::size_t wanted)
{
    while (available().size() < wanted && read_chunk()) {
    }
}

std::size_t BodyReader::find(std::string_view needle, std::size_t window)
{
    fill(window + needle.size());
    const std::size_t at = available().substr(0, window + needle.size()).find(needle);
    return at < window ? at : std::string_view::npos;
}

std::string_view BodyReader::peek(std::size_t count)
{
    fill(count);
    return available().substr(0, count);
}

void BodyReader::skip(std::size_t count)
{
    m_pos += std::min(count, available().size());
}

bool BodyReader::copy_until(std::string_view delimiter, const Sink& sink)
{
    for (;;) {
        const std::string_view bytes = available();
        const std::size_t at = bytes.find(delimiter);
        if (at != std::string_view::npos) {
            sink(bytes.substr(0, at));
            m_pos += at + delimiter.size();
            return true;
        }
        // Everything but a tail that may be the start of the delimiter is passed on.
        const std::size_t keep = std::min(bytes.size(), delimiter.size() - 1);
        if (bytes.size() > keep) {
            sink(bytes.substr(0, bytes.size() - keep));
            m_pos += bytes.size() - keep;
        }
        if (!read_chunk()) {
            sink(available());
            m_pos = m_buffer.size();
            return false;
        }
    }
}

} // namespace cgilib

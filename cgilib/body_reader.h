// Reads a request body of announced length in pieces, with look-ahead, so that a
// multipart body is split at its delimiters without holding the whole body.
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <istream>
#include <string>
#include <string_view>

namespace cgilib {

// Where a body's bytes come from: puts at most `most` bytes at `into` and returns how
// many; 0 only at the end of the input. (Plain reads of the standard input keep the
// program free of the C++ streams, which are a good part of its size.)
using ByteSource = std::function<std::size_t(char* into, std::size_t most)>;

// A stream as a source of bytes (for the tests and the fuzz targets).
inline ByteSource stream_source(std::istream& in)
{
    return [&in](char* into, std::size_t most) {
        in.read(into, static_cast<std::streamsize>(most));
        return static_cast<std::size_t>(in.gcount());
    };
}

class BodyReader {
public:
    using Sink = std::function<void(std::string_view)>;

    // Reads at most `length` bytes of `in`, and never asks it for more. `prefix` is
    // seen as if it came first in the body.
    BodyReader(const ByteSource& in, std::uint64_t length, std::string prefix = {});

    // Where `needle` starts, counted from the current position, if it starts within
    // the next `window` bytes; npos otherwise. Consumes nothing.
    std::size_t find(std::string_view needle, std::size_t window);
    // The next `count` bytes, or fewer at the end of the body. Consumes nothing.
    std::string_view peek(std::size_t count);
    void skip(std::size_t count);

    // Passes everything before the next `delimiter` to `sink`, in pieces, and
    // consumes the delimiter. False when the body ended first; then `sink` got
    // all that was left.
    bool copy_until(std::string_view delimiter, const Sink& sink);

    // True when the input ended before the announced length.
    bool short_read() const { return m_short; }

private:
    std::string_view available() const;
    bool read_chunk();
    void fill(std::size_t wanted);

    const ByteSource& m_in;
    std::uint64_t m_remaining;
    std::string m_buffer;
    std::size_t m_pos = 0;
    bool m_short = false;
};

} // namespace cgilib

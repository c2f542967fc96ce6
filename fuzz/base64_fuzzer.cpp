// Base64 form values (passwords). The decoder never writes past the size it is
// given, whatever the text; and what a standard encoder makes of any bytes comes
// back whole when the destination has room.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "fuzz_check.h"
#include "volumes/helpers.h"

namespace {

constexpr std::size_t kGuard = 64;
constexpr unsigned char kGuardByte = 0xA5;

std::string encode_base64(const std::uint8_t* data, std::size_t size)
{
    static constexpr char kAlphabet[] = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
    std::string text;
    for (std::size_t i = 0; i < size; i += 3) {
        const std::size_t n = std::min<std::size_t>(3, size - i);
        std::uint32_t group = static_cast<std::uint32_t>(data[i]) << 16;
        if (n > 1)
            group |= static_cast<std::uint32_t>(data[i + 1]) << 8;
        if (n > 2)
            group |= data[i + 2];
        text += kAlphabet[(group >> 18) & 63];
        text += kAlphabet[(group >> 12) & 63];
        text += n > 1 ? kAlphabet[(group >> 6) & 63] : '=';
        text += n > 2 ? kAlphabet[group & 63] : '=';
    }
    return text;
}

// Decodes `source` into a zeroed destination of `size` bytes followed by a guard;
// the guard must come back untouched.
std::vector<unsigned char> decode(const std::string& source, std::size_t size)
{
    std::vector<unsigned char> destination(size + kGuard, kGuardByte);
    std::fill_n(destination.begin(), size, 0);
    decode_base64_field(destination.data(), source.c_str(), size);
    fuzz_check(std::all_of(destination.begin() + static_cast<std::ptrdiff_t>(size), destination.end(),
                           [](unsigned char c) { return c == kGuardByte; }),
               "the decoder wrote past its size");
    destination.resize(size);
    return destination;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    if (size == 0)
        return 0;
    // The first byte is the destination size; the rest is the text as a form value
    // (a C string: it ends at its first NUL).
    const std::size_t room = data[0];
    const std::string text(reinterpret_cast<const char*>(data + 1), size - 1);
    decode(text, room);
    decode(text, 0);

    // The bytes after the first, encoded: decoded again with room to spare, they come
    // back, and the rest of the destination stays zero.
    const std::string encoded = encode_base64(data + 1, size - 1);
    const std::vector<unsigned char> decoded = decode(encoded, size - 1 + 2);
    fuzz_check(std::equal(data + 1, data + size, decoded.begin()), "valid base64 decodes to its bytes");
    fuzz_check(decoded[size - 1] == 0 && decoded[size] == 0, "nothing beyond the decoded bytes");
    // With too little room the decoder stops short, inside its size.
    if (size > 2)
        decode(encoded, (size - 1) / 2);
    return 0;
}

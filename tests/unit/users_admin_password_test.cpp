// The verifier's single-block "$2$" digest (its crypt() route and the route choice are
// covered by the device's password tests).
#include <gtest/gtest.h>

#include <cstring>

#include "users/admin_password.h"

namespace {

FixedText<256> buffer_of(std::string_view bytes)
{
    FixedText<256> buffer;
    std::memcpy(buffer.data(), bytes.data(), bytes.size());
    return buffer;
}

// "abc" as one padded SHA-1 message block (0x80, zeros, the bit length 24), whose
// digest is the published a9993e36 4706816a ba3e2571 7850c26c 9cd0d89d.
std::string padded_abc()
{
    std::string block = "abc";
    block += '\x80';
    block.resize(63, '\0');
    block += '\x18';
    return block;
}

} // namespace

TEST(Sha1Block, HashesTheBlockAfterTheFirstThreeCharacters)
{
    const struct {
        const char* what;
        std::string bytes;
        std::string digest;
    } cases[] = {
        {"the block from the fourth byte on", "xyz" + padded_abc(), "$2$a9993e364706816aba3e25717850c26c9cd0d89d"},
        {"other first three characters, same digest", "123" + padded_abc(),
         "$2$a9993e364706816aba3e25717850c26c9cd0d89d"},
        {"characters from the 68th on are ignored", "xyz" + padded_abc() + "tail",
         "$2$a9993e364706816aba3e25717850c26c9cd0d89d"},
        {"up to three characters: the zero block", "ab", "$2$92b404e556588ced6c1acd4ebf053f6809f73a93"},
        {"the empty password: the zero block too", "", "$2$92b404e556588ced6c1acd4ebf053f6809f73a93"},
        {"a plain password", "xyzpassword-tail", "$2$8cd71d4ef7af97c0133d5d8e27b1628772a0031f"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(sha1_block_digest(buffer_of(c.bytes)), std::string_view(c.digest)) << c.what;
}

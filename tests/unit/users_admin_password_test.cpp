// The verifier's hashing routes: the single-block "$2$" digest and crypt().
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

// "abc" as one padded SHA-1 message block: 0x80, zeros, the bit length 24.
std::string padded_abc()
{
    std::string block = "abc";
    block += '\x80';
    block.resize(63, '\0');
    block += '\x18';
    return block;
}

} // namespace

TEST(Sha1Block, CompressesAPublishedOneBlockMessage)
{
    // FIPS 180-4's example: SHA-1("abc") = a9993e36 4706816a ba3e2571 7850c26c 9cd0d89d.
    Sha1State state{0x67452301, 0xEFCDAB89, 0x98BADCFE, 0x10325476, 0xC3D2E1F0};
    Sha1Block block{};
    const std::string abc = padded_abc();
    std::memcpy(block.data(), abc.data(), block.size());
    sha1_compress(block, state);
    EXPECT_EQ(format_sha1_hex(state), std::string_view("$2$a9993e364706816aba3e25717850c26c9cd0d89d"));
}

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

TEST(ShadowHash, PicksTheRouteFromTheStoredHash)
{
    const std::string admin = "$6$nasdemo1$LPJq1UqZX4ynvqQ6iNvvmW5Pqi6Eg4zN7Sbmm8cO884Qa3i52gi6tvgy7a/CMQRZfdo/DU5jisx1cApB/Kx3e/";
    EXPECT_EQ(shadow_hash(FixedText<256>("admin"), admin.c_str()), std::string_view(admin));
    EXPECT_NE(shadow_hash(FixedText<256>("Admin"), admin.c_str()), std::string_view(admin));
    EXPECT_EQ(shadow_hash(FixedText<256>("abcpassword-tail"), "$2$anything"),
              std::string_view("$2$8cd71d4ef7af97c0133d5d8e27b1628772a0031f"));
    // A hash crypt() refuses ("*", "!") matches nothing.
    EXPECT_NE(shadow_hash(FixedText<256>("x"), "*"), std::string_view("*"));
}

// The verifier's single-block "$2$" digest (its crypt() route and the route choice are
// covered by the device's password tests).
#include <gtest/gtest.h>

#include <cstring>

#include "users/admin_password.h"

TEST(Sha1Block, HashesTheBlockAfterTheFirstThreeCharacters)
{
    // "abc" as one padded SHA-1 message block (0x80, zeros, the bit length 24), whose
    // digest is the published a9993e36 4706816a ba3e2571 7850c26c 9cd0d89d.
    std::string abc = "abc\x80";
    abc.resize(63, '\0');
    abc += '\x18';
    const std::string of_abc = "$2$a9993e364706816aba3e25717850c26c9cd0d89d";
    const std::string zero_block = "$2$92b404e556588ced6c1acd4ebf053f6809f73a93";
    const std::pair<std::string, std::string> cases[] = {
        {"xyz" + abc, of_abc}, {"123" + abc, of_abc},   // the first three characters do not count
        {"xyz" + abc + "tail", of_abc},                  // nor those from the 68th on
        {"ab", zero_block}, {"", zero_block}, {"xyzpassword-tail", "$2$8cd71d4ef7af97c0133d5d8e27b1628772a0031f"},
    };
    for (const auto& [bytes, digest] : cases) {
        FixedText<256> buffer;
        std::memcpy(buffer.data(), bytes.data(), bytes.size());
        EXPECT_EQ(sha1_block_digest(buffer), std::string_view(digest)) << testing::PrintToString(bytes);
    }
}

#include "users/admin_password.h"

#include <cstdio>
#include <cstring>
#include <string>

#include "cgi/crypt_library.h"
#include "cgi/event_log.h"
#include "cgi/file.h"
#include "cgi/shell.h"
#include "cgi/trace.h"
#include "platform/cgic.h"
#include "platform/flash.h"
#include "volumes/helpers.h"

namespace {

// The form transport may turn each "+" of the base64 text into a blank.
FixedText<256> decode_page_password(const char* sent)
{
    FixedText<256> text(sent);
    for (std::size_t i = 0; i < text.length(); ++i) {
        if (text[i] == ' ')
            text[i] = '+';
    }
    FixedText<256> decoded;
    // 255: the decoded text always keeps its terminator.
    decode_base64_field(reinterpret_cast<unsigned char*>(decoded.data()), text.c_str(), decoded.size() - 1);
    return decoded;
}

std::uint32_t rotate_left(std::uint32_t word, int bits)
{
    return (word << bits) | (word >> (32 - bits));
}

} // namespace

int change_admin_password(const passwd* account, const char* old_password, const char* new_password)
{
    const FixedText<256> old_decoded = decode_page_password(old_password);
    const FixedText<256> new_decoded = decode_page_password(new_password);
    if (!account)
        return -1;
    const std::string name = account->pw_name;
    const uid_t uid = account->pw_uid;
    if (!check_shadow_password(name.c_str(), old_decoded.c_str()))
        return -1;

    run_shell_command("account -m -u %s -p %s", cgi_escapeshellarg(name.c_str()),
                      cgi_escapeshellarg(new_decoded.c_str()));
    cgi_escapeshellarg_free();

    FixedText<64> snmp;
    std::snprintf(snmp.data(), snmp.size(), "snmp_tool -t %d >/dev/null 2>&1", 1);
    run_system(snmp.c_str());
    printf_out("%s", snmp.c_str());

    // Only the built-in administrator's change is an event; other members of the
    // administrators group change theirs silently.
    if (uid == 500)
        log_event("Admin password has been modified.");
    LIB_CP_Config_To_MTD(196644);
    return 0;
}

int check_shadow_password(const char* name, const char* candidate)
{
    FixedText<256> stored;
    {
        const UniqueFile shadow = open_file("/etc/shadow", "r");
        if (!shadow)
            return 0;
        // Read as password entries: only the name and the hash (the first two fields) count.
        const passwd* entry = nullptr;
        while ((entry = fgetpwent(shadow.get())) && std::strcmp(entry->pw_name, name) != 0) {
        }
        if (!entry)
            return 0;
        stored.assign(entry->pw_passwd);
    }
    const FixedText<256> password(candidate);
    if (stored.empty())
        return password.empty() ? 1 : 0;
    return shadow_hash(password, stored.c_str()) == stored.view() ? 1 : 0;
}

FixedText<256> shadow_hash(const FixedText<256>& candidate, const char* stored)
{
    if (std::strncmp(stored, "$2$", 3) == 0)
        return sha1_block_digest(candidate);
    const char* hash = libcrypt::crypt(candidate.c_str(), stored);
    return FixedText<256>(hash ? hash : "");
}

FixedText<256> sha1_block_digest(const FixedText<256>& candidate)
{
    Sha1State state{0x67452301, 0xEFCDAB89, 0x98BADCFE, 0x10325476, 0xC3D2E1F0};
    // Bytes 3 to 66 of the buffer: the platform's writer of these hashes skips the
    // first three characters and pads with the buffer's zeros. Not full SHA-1, and
    // not to be made so: stored "$2$" hashes would stop verifying.
    Sha1Block block{};
    std::memcpy(block.data(), candidate.c_str() + 3, block.size());
    sha1_compress(block, state);
    return format_sha1_hex(state);
}

void sha1_compress(const Sha1Block& block, Sha1State& state)
{
    std::array<std::uint32_t, 80> w{};
    for (std::size_t t = 0; t < 16; ++t) {
        w[t] = static_cast<std::uint32_t>(block[4 * t]) << 24 | static_cast<std::uint32_t>(block[4 * t + 1]) << 16
            | static_cast<std::uint32_t>(block[4 * t + 2]) << 8 | static_cast<std::uint32_t>(block[4 * t + 3]);
    }
    for (std::size_t t = 16; t < 80; ++t)
        w[t] = rotate_left(w[t - 3] ^ w[t - 8] ^ w[t - 14] ^ w[t - 16], 1);

    std::uint32_t a = state[0], b = state[1], c = state[2], d = state[3], e = state[4];
    for (std::size_t t = 0; t < 80; ++t) {
        std::uint32_t f = 0, k = 0;
        if (t < 20) {
            f = (b & c) | (~b & d);
            k = 0x5A827999;
        } else if (t < 40) {
            f = b ^ c ^ d;
            k = 0x6ED9EBA1;
        } else if (t < 60) {
            f = (b & c) | (b & d) | (c & d);
            k = 0x8F1BBCDC;
        } else {
            f = b ^ c ^ d;
            k = 0xCA62C1D6;
        }
        const std::uint32_t temp = rotate_left(a, 5) + f + e + k + w[t];
        e = d;
        d = c;
        c = rotate_left(b, 30);
        b = a;
        a = temp;
    }
    state[0] += a;
    state[1] += b;
    state[2] += c;
    state[3] += d;
    state[4] += e;
}

FixedText<256> format_sha1_hex(const Sha1State& state)
{
    FixedText<256> text;
    std::snprintf(text.data(), text.size(), "$2$%08x%08x%08x%08x%08x", state[0], state[1], state[2], state[3],
                  state[4]);
    return text;
}

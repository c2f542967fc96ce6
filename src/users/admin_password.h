// The password change of administrative accounts, and the verifier of old passwords.
#pragma once

#include <array>
#include <cstdint>
#include <pwd.h>

#include "cgi/fixed_text.h"

// Verifies `old_password` against "/etc/shadow", then sets `new_password` with the
// account tool. Both arrive as the page sends them: base64, with each "+" perhaps
// turned into a blank on the way. 0 when changed; -1 without an account or when the
// old password does not verify (nothing is then changed).
int change_admin_password(const passwd* account, const char* old_password, const char* new_password);

// 1 when `candidate` is the password that "/etc/shadow" holds for `name`, else 0.
// An empty stored hash matches only the empty password; a missing entry or file never
// matches.
int check_shadow_password(const char* name, const char* candidate);

// The hash to compare with `stored`: the single-block "$2$" digest for a "$2$" hash,
// else crypt()'s result (empty when crypt refuses), cut to 255 characters.
FixedText<256> shadow_hash(const FixedText<256>& candidate, const char* stored);

// The "$2$" scheme: one SHA-1 compression (FIPS 180-4) of the 64 bytes that begin at
// the fourth byte of the candidate's zero-filled buffer, from the initial state, with
// no padding and no length; "$2$" and the five state words as "%08x". So the first
// three characters and anything from the 68th on never count.
using Sha1State = std::array<std::uint32_t, 5>;
using Sha1Block = std::array<unsigned char, 64>;
FixedText<256> sha1_block_digest(const FixedText<256>& candidate);
void sha1_compress(const Sha1Block& block, Sha1State& state);
FixedText<256> format_sha1_hex(const Sha1State& state);

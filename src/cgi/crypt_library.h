// libcrypt, opened by the first call that hashes a password, not by every process at
// its start. The program and the platform library start once per request and most
// requests never hash: linked in, libcrypt's calls into the C library are bound at every
// start (it calls them through its own table, never lazily) and its pages are mapped,
// about 3 % of a short request; opened on first use it costs a hashing request about
// 200 microseconds beside the milliseconds the hash itself takes.
#pragma once

namespace libcrypt {

// crypt(3): the hash of `phrase` by the method and salt that `setting` names. Nothing
// (nullptr) when libcrypt refuses, or when it cannot be opened.
const char* crypt(const char* phrase, const char* setting);

// crypt_gensalt(3) with random bytes of libcrypt's own choosing; nullptr likewise.
const char* crypt_gensalt(const char* prefix, unsigned long count);

} // namespace libcrypt

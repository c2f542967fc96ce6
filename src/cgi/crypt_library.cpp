#include "cgi/crypt_library.h"

#include <dlfcn.h>
#include <memory>

namespace {

// The name libxcrypt's library has had since it replaced the C library's own.
constexpr const char* kLibcrypt = "libcrypt.so.1";

struct LibraryCloser {
    void operator()(void* handle) const { dlclose(handle); }
};

// The address of a function of libcrypt, the library opened at the first asking and
// kept to the end of the process; nullptr when it cannot be opened or lacks the name.
template <typename Function>
Function* libcrypt_function(const char* name)
{
    static const std::unique_ptr<void, LibraryCloser> library(dlopen(kLibcrypt, RTLD_NOW | RTLD_LOCAL));
    if (!library)
        return nullptr;
    return reinterpret_cast<Function*>(dlsym(library.get(), name));
}

} // namespace

const char* libcrypt::crypt(const char* phrase, const char* setting)
{
    using Crypt = char*(const char*, const char*);
    static Crypt* const call = libcrypt_function<Crypt>("crypt");
    return call ? call(phrase, setting) : nullptr;
}

const char* libcrypt::crypt_gensalt(const char* prefix, unsigned long count)
{
    using Gensalt = char*(const char*, unsigned long, const char*, int);
    static Gensalt* const call = libcrypt_function<Gensalt>("crypt_gensalt");
    return call ? call(prefix, count, nullptr, 0) : nullptr;
}

// Fixed-size, zero-filled text buffers. The device's pages depend on how long each
// value may be: a form value is cut to size-1 bytes, a config value likewise. The
// size is part of the behaviour, so it is spelled out at every use.
#pragma once

#include <array>
#include <cstdarg>
#include <cstddef>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <string_view>
#include <sys/mman.h>

template <std::size_t N>
class FixedText {
    static_assert(N > 0);

public:
    static constexpr std::size_t capacity = N;

    FixedText() { m_bytes.fill('\0'); }
    explicit FixedText(std::string_view text) : FixedText() { assign(text); }

    char* data() { return m_bytes.data(); }
    const char* c_str() const { return m_bytes.data(); }
    // Size as the C libraries take it.
    static constexpr int size() { return static_cast<int>(N); }

    // Bounded by the buffer even when a caller fills every byte without a terminator.
    std::size_t length() const { return strnlen(m_bytes.data(), N); }
    std::string_view view() const { return {m_bytes.data(), length()}; }
    bool empty() const { return m_bytes[0] == '\0'; }

    void clear() { m_bytes.fill('\0'); }
    // Copies at most N-1 bytes and terminates, like the device's bounded copies.
    void assign(std::string_view text)
    {
        clear();
        std::memcpy(m_bytes.data(), text.data(), std::min(text.size(), N - 1));
    }

    // Bounded formatting into the buffer: longer output is cut to N-1 bytes, which is
    // how the device's fixed-size lines behave.
    void format(const char* pattern, ...) __attribute__((format(printf, 2, 3)))
    {
        va_list args;
        va_start(args, pattern);
        std::vsnprintf(m_bytes.data(), N, pattern, args);
        va_end(args);
    }

    bool operator==(std::string_view other) const { return view() == other; }
    char& operator[](std::size_t i) { return m_bytes.at(i); }
    char operator[](std::size_t i) const { return m_bytes.at(i); }

private:
    std::array<char, N> m_bytes;
};

// A zero-filled buffer of N bytes that a library fills with a C string, mapped on its
// own: the kernel's fresh pages are zero, so of a large buffer only the pages the
// library writes are ever touched (calloc clears what the heap held before, a page
// fault a page).
template <std::size_t N>
class ZeroedBuffer {
public:
    ZeroedBuffer()
    {
        void* bytes = mmap(nullptr, N, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
        if (bytes != MAP_FAILED)
            m_bytes.reset(static_cast<char*>(bytes));
    }
    explicit operator bool() const { return m_bytes != nullptr; }

    char* data() { return m_bytes.get(); }
    const char* c_str() const { return m_bytes.get(); }
    static constexpr int size() { return static_cast<int>(N); }

    // Zero-filled again after a C string was written into it (at most N-1 characters
    // and their terminator): only what the string covers is cleared.
    void clear_string() { std::memset(m_bytes.get(), 0, strnlen(m_bytes.get(), N)); }

private:
    struct Unmap {
        void operator()(char* bytes) const { munmap(bytes, N); }
    };
    std::unique_ptr<char, Unmap> m_bytes;
};

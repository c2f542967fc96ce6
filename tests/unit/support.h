// Shared pieces of the unit tests: a scratch folder, whole-file reads and writes, and the
// CGI library's request parser driven in-process with fields read back as the program does.
#pragma once

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <optional>
#include <sstream>
#include <stdexcept>
#include <string>

#include "cgilib/request.h"
#include "platform/cgic.h"

namespace fs = std::filesystem;

// A folder of its own (under $TMPDIR or /tmp unless told), removed with all it holds.
struct Scratch {
    fs::path path;
    explicit Scratch(const fs::path& base = fs::temp_directory_path())
    {
        std::string pattern = (base / "unit-XXXXXX").string();
        if (mkdtemp(pattern.data()) == nullptr)
            throw std::runtime_error("mkdtemp " + pattern);
        path = pattern;
    }
    ~Scratch() { fs::remove_all(path); }
    Scratch(const Scratch&) = delete;
    Scratch& operator=(const Scratch&) = delete;
    std::string operator/(const std::string& name) const { return (path / name).string(); }
};

inline std::string slurp(const fs::path& path)
{
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

inline void spit(const fs::path& path, const std::string& content) { std::ofstream(path, std::ios::binary) << content; }

struct TestRequest {
    std::string method = "POST", query, content_type, body;
    std::optional<std::string> content_length;   // default: the body's size
};

// Parses `request`; returns how many body bytes the parser took from its stream.
inline std::streamoff parse(const TestRequest& request)
{
    std::istringstream body(request.body);
    cgilib::parse_request({request.method, request.query, request.content_type,
                           request.content_length.value_or(std::to_string(request.body.size()))},
                          body);
    body.clear();
    return body.tellg();
}

struct Read {
    cgiFormResultType result;
    std::string text;
    bool operator==(const Read&) const = default;
};

inline std::ostream& operator<<(std::ostream& out, const Read& read)
{
    return out << "{" << read.result << ", \"" << read.text << "\"}";
}

// Reads a field into a `size`-byte buffer; guard bytes after it catch writes beyond it.
template <typename ReadFunction>
Read read_into(ReadFunction read, const char* name, int size)
{
    const std::size_t after = static_cast<std::size_t>(std::max(size, 0)), guard = 16;
    std::string buffer(after + guard, '#');
    const cgiFormResultType result = read(name, buffer.data(), size);
    if (buffer.substr(after) != std::string(guard, '#'))
        return {result, "<written beyond the buffer>"};
    const std::size_t end = buffer.find('\0');
    if (size > 0 && end >= after)
        return {result, "<not terminated>"};
    return {result, size <= 0 ? "" : buffer.substr(0, end)};
}

inline Read form_string(const char* name, int size = 256) { return read_into(cgiFormString, name, size); }
inline Read form_file_name(const char* name, int size = 256) { return read_into(cgiFormFileName, name, size); }

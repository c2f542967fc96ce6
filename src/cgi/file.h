// Files and pipes that close themselves, and line reading in fgets-sized pieces.
#pragma once

#include <cstdio>
#include <memory>

#include "cgi/fixed_text.h"

struct FileCloser {
    void operator()(FILE* file) const { std::fclose(file); }
};
using UniqueFile = std::unique_ptr<FILE, FileCloser>;

struct PipeCloser {
    void operator()(FILE* pipe) const { pclose(pipe); }
};
using UniquePipe = std::unique_ptr<FILE, PipeCloser>;

inline UniqueFile open_file(const char* path, const char* mode)
{
    return UniqueFile(std::fopen(path, mode));
}

inline UniquePipe open_pipe(const char* command)
{
    return UniquePipe(popen(command, "r"));
}

// Reads the next piece of at most N-1 characters into `line`, as fgets does: a longer
// line comes in several pieces, and the buffer is not cleared between reads.
template <std::size_t N>
bool read_line(FILE* file, FixedText<N>& line)
{
    return std::fgets(line.data(), FixedText<N>::size(), file) != nullptr;
}

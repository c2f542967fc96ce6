// What the fuzz targets share: a check that stops the run with a message, which
// libFuzzer reports as a crash along with the input that caused it.
#pragma once

#include <cstdio>
#include <cstdlib>

inline void fuzz_check(bool holds, const char* what)
{
    if (!holds) {
        std::fprintf(stderr, "fuzz check failed: %s\n", what);
        std::abort();
    }
}

// Walking the password file with the standard password-entry reader.
#pragma once

#include <cstdio>
#include <pwd.h>
#include <string>

#include "cgi/file.h"

// Calls visit(entry) for each entry of the password file at `path`, in file order, as
// fgetpwent reads them (comment and malformed lines skipped the same way). Returns
// false when the file cannot be read. The reader runs over an in-memory copy of the
// file: over a file stream it asks the kernel for its position twice per entry, which
// on a device of thousands of users costs more than the whole rest of the request.
template <typename Visit>
bool for_each_password_entry(const char* path, Visit visit)
{
    const UniqueFile file = open_file(path, "r");
    if (!file)
        return false;
    std::string text;
    std::string chunk(64 * 1024, '\0');
    while (const std::size_t got = std::fread(chunk.data(), 1, chunk.size(), file.get()))
        text.append(chunk, 0, got);
    if (text.empty())
        return true;
    const UniqueFile entries(fmemopen(text.data(), text.size(), "r"));
    if (!entries)
        return false;
    while (const passwd* entry = fgetpwent(entries.get()))
        visit(*entry);
    return true;
}

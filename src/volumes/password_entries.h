// Walking the password file with the standard password-entry reader.
#pragma once

#include <cstdio>
#include <pwd.h>

#include "cgi/file.h"

// Calls visit(entry) for each entry of the password file at `path`, in file order, as
// fgetpwent reads them (comment and malformed lines skipped the same way). Returns
// false when the file cannot be opened.
template <typename Visit>
bool for_each_password_entry(const char* path, Visit visit)
{
    const UniqueFile file = open_file(path, "r");
    if (!file)
        return false;
    // A seek to the start lets the stream know its offset: the entry reader asks for it
    // before every entry and would otherwise ask the kernel each time, which on a device
    // of thousands of users costs more than the whole rest of the request.
    std::fseek(file.get(), 0, SEEK_SET);
    while (const passwd* entry = fgetpwent(file.get()))
        visit(*entry);
    return true;
}

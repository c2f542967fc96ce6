// Every command line the program hands to the shell is an event of the device: it is
// recorded as `sh -c LINE` before the shell runs it. The program is linked with
// --wrap=system,--wrap=popen so that its calls come here first.
#include <cstdio>
#include <cstdlib>

#include "journal.h"

extern "C" int __real_system(const char* line);
extern "C" FILE* __real_popen(const char* line, const char* mode);

extern "C" int __wrap_system(const char* line)
{
    if (line)
        journal_record("sh", {"-c", line});
    return __real_system(line);
}

extern "C" FILE* __wrap_popen(const char* line, const char* mode)
{
    journal_record("sh", {"-c", line});
    return __real_popen(line, mode);
}

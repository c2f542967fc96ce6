// The flash copy of the configuration: the simulated device has no flash, so the
// call is only an event.
#include "platform/flash.h"

#include <string>

#include "journal.h"

extern "C" int LIB_CP_Config_To_MTD(int flags)
{
    journal_record("LIB_CP_Config_To_MTD", {std::to_string(flags)});
    return 0;
}

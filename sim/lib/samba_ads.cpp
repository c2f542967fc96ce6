// Directory domain membership of the simulated device. Not built yet: each call is
// only an event.
#include "platform/samba.h"

#include "journal.h"

extern "C" int ads_start(void)
{
    journal_record("ads_start", {});
    return 0;
}

extern "C" int ads_stop(void)
{
    journal_record("ads_stop", {});
    return 0;
}

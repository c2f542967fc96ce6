// The Samba share list of the simulated device. Not built yet: each call is only an
// event, and the list stays empty.
#include "platform/samba.h"

#include "journal.h"

struct share_info* pss = nullptr;

extern "C" int get_samba_info2(void)
{
    journal_record("get_samba_info2", {});
    return 0;
}

extern "C" void Free_All_List(void)
{
    journal_record("Free_All_List", {});
}

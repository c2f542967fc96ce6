// The Samba share list of the simulated device: get_samba_info2 fills `pss` from the
// share store (share_store.h) in store order; Free_All_List releases it.
//
// Free_All_List also releases the DFS lists `pdfs` and `pnl`, whose records the DFS
// part of the library (samba_dfs.cpp) allocates: every record of the three lists is
// allocated with calloc and released here with free, one record at a time.
#include "platform/samba.h"

#include <cstdlib>
#include <cstring>

#include "journal.h"
#include "share_store.h"

struct share_info* pss = nullptr;

namespace {

template <typename Record>
void free_list(Record*& head)
{
    while (head != nullptr) {
        Record* next = head->next;
        std::free(head);
        head = next;
    }
}

void copy_field(char* field, std::size_t size, const std::string& text)
{
    std::strncpy(field, text.c_str(), size - 1);
}

} // namespace

extern "C" int get_samba_info2(void)
{
    journal_record("get_samba_info2", {});
    free_list(pss);
    share_info** tail = &pss;
    for (const ShareEntry& share : load_shares()) {
        auto* record = static_cast<share_info*>(std::calloc(1, sizeof(share_info)));
        if (record == nullptr)
            return -1;
        copy_field(record->name, sizeof record->name, share.name);
        copy_field(record->path, sizeof record->path, share.path);
        *tail = record;
        tail = &record->next;
    }
    return 0;
}

extern "C" void Free_All_List(void)
{
    journal_record("Free_All_List", {});
    free_list(pss);
    free_list(pdfs);
    free_list(pnl);
}

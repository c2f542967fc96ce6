// The Samba share list of the simulated device: get_samba_info2 fills `pss` from the
// share store (share_store.h) in store order; Free_All_List releases it.
//
// Free_All_List also releases the DFS lists `pdfs` and `pnl`, whose records the DFS
// part of the library (samba_dfs.cpp) allocates: every record of the three lists is
// allocated with calloc and released here with free, one record at a time.
#include "platform/samba.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>

#include "journal.h"
#include "share_store.h"

struct share_info* pss = nullptr;

namespace {

// The longest share path a record holds, as a path buffer of the system's size would.
constexpr std::size_t kLongestSharePath = 4095;

template <typename Record>
void free_list(Record*& head)
{
    while (head != nullptr) {
        Record* next = head->next;
        std::free(head);
        head = next;
    }
}

// The text up to its first NUL, of at most `longest` characters.
std::string_view c_text(std::string_view text, std::size_t longest)
{
    return text.substr(0, std::min(text.find('\0'), longest));
}

} // namespace

// A record and its path are one allocation, the path right after the record: the list
// of 200 shares is a few pages, not 200 records of a path's largest size.
extern "C" int get_samba_info2(void)
{
    journal_record("get_samba_info2", {});
    free_list(pss);
    share_info** tail = &pss;
    int result = 0;
    for_each_share_location([&](std::string_view name, std::string_view path) {
        if (result != 0)
            return;
        const std::string_view kept_name = c_text(name, sizeof(share_info::name) - 1);
        const std::string_view kept_path = c_text(path, kLongestSharePath);
        auto* record = static_cast<share_info*>(std::calloc(1, sizeof(share_info) + kept_path.size() + 1));
        if (record == nullptr) {
            result = -1;
            return;
        }
        std::memcpy(record->name, kept_name.data(), kept_name.size());
        record->path = reinterpret_cast<char*>(record + 1);
        std::memcpy(record->path, kept_path.data(), kept_path.size());
        *tail = record;
        tail = &record->next;
    });
    return result;
}

extern "C" void Free_All_List(void)
{
    journal_record("Free_All_List", {});
    free_list(pss);
    free_list(pdfs);
    free_list(pnl);
}

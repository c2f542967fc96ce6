// The Samba share list of the simulated device: get_samba_info2 fills `pss` from the
// share store (share_store.h) in store order; Free_All_List releases it.
//
// Free_All_List also releases the DFS lists `pdfs` and `pnl`, which the DFS part of
// the library (samba_dfs.cpp) fills. The share list is one block of records
// (record_block.h).
#include "platform/samba.h"

#include <string_view>
#include <utility>
#include <vector>

#include "dfs_store.h"
#include "journal.h"
#include "record_block.h"
#include "share_store.h"
#include "text_file.h"

struct share_info* pss = nullptr;

namespace {

// Made on first use, so that a process that lists nothing does not run its set-up and
// clean-up.
RecordBlock& share_records()
{
    static RecordBlock block;
    return block;
}

} // namespace

extern "C" int get_samba_info2(void)
{
    journal_record("get_samba_info2", {});
    pss = nullptr;
    const std::string store = read_text(kShareStorePath);
    std::vector<std::pair<std::string_view, std::string_view>> shares;
    for_each_share_location(store, [&](std::string_view name, std::string_view path) { shares.emplace_back(name, path); });
    const auto records = share_records().hold<share_info>(shares.size());
    if (records.size() != shares.size())
        return -1;
    for (std::size_t i = 0; i < shares.size(); ++i) {
        copy_text_field(records[i].name, shares[i].first);
        copy_text_field(records[i].path, shares[i].second);
    }
    pss = records.empty() ? nullptr : records.data();
    return 0;
}

extern "C" void Free_All_List(void)
{
    journal_record("Free_All_List", {});
    pss = nullptr;
    share_records().release();
    release_dfs_lists();
}

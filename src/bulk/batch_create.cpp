// Batch creation of numbered users. The accounts are not created here: one record per
// account goes into the batch record file, and account_mgr, started in the
// background, creates them while the page polls cgi_get_create_status.
#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <limits>
#include <new>
#include <string>
#include <string_view>

#include "cgi/atomic_file.h"
#include "cgi/event_log.h"
#include "cgi/file_lock.h"
#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/shell.h"
#include "cgi/text_escape.h"
#include "cgi/trace.h"
#include "platform/cgic.h"
#include "volumes/names.h"

namespace {

constexpr const char* kBatchRecordFile = "/tmp/account_batch_info";
// Holds the longest record and the longest tool line: the field buffers together
// stay under 39 000 bytes.
constexpr int kBatchLineSize = 49152;
// The most records one request writes: a larger "f_number" writes this many.
constexpr long long kMaxBatchRecords = 10000;

// 64 bits on every device, so that a number beyond the int range is seen as one there too.
long long decimal(const char* text)
{
    return std::strtoll(text, nullptr, 10);
}

// A record field may not hold the record file's separators.
bool fits_in_a_record(std::string_view text)
{
    return text.find_first_of("\t\r\n") == std::string_view::npos;
}

} // namespace

void cgi_user_batch_create()
{
    const auto prefix = form_value<16>("f_prefix");
    const auto start = form_value<16>("f_start");
    const auto number = form_value<16>("f_number");
    const auto password = form_value<256>("f_batch_pw");
    const auto groups = form_value<1024>("group_list");
    const auto overwrite = form_value<8>("f_overwrite");
    const auto read_list = form_value<12288>("r_list");
    const auto write_list = form_value<12288>("w_list");
    const auto deny_list = form_value<12288>("d_list");
    const auto quota = form_value<128>("quota");
    const auto app = form_value<64>("app");

    // The names are the prefix and a number; a prefix no name may begin with, a field
    // that would split its record, or a first number that the names cannot hold
    // (beyond the int range) writes no record and starts nothing.
    const long long first = decimal(start.c_str());
    const char* refused = nullptr;
    if (!is_acceptable_name(prefix.view()))
        refused = "f_prefix";
    else if (first < std::numeric_limits<int>::min() || first > std::numeric_limits<int>::max())
        refused = "f_start";
    else if (!fits_in_a_record(password.view()))
        refused = "f_batch_pw";
    else if (!fits_in_a_record(groups.view()))
        refused = "group_list";
    else if (!fits_in_a_record(read_list.view()))
        refused = "r_list";
    else if (!fits_in_a_record(write_list.view()))
        refused = "w_list";
    else if (!fits_in_a_record(deny_list.view()))
        refused = "d_list";
    else if (!fits_in_a_record(quota.view()))
        refused = "quota";
    if (refused != nullptr) {
        log_refusal("cgi_user_batch_create", refused);
        answer_empty_html();
        return;
    }

    // The names are as wide as the first number was typed: a start of "001" pads to
    // three digits, a start of "1" does not pad at all. They stop at the most records
    // one request writes, and at the last number an int holds: never a wrapped one.
    const int width = static_cast<int>(start.length());
    const long long count = std::clamp(decimal(number.c_str()), 0LL, kMaxBatchRecords);
    const long long end = std::min(first + count, static_cast<long long>(std::numeric_limits<int>::max()) + 1);
    long long last = -1;
    // The records are gathered first and replace the record file at once, under its
    // lock: an account_mgr run still working on the previous batch has read its whole
    // file already (sim/tools/account_mgr.cpp tells how runs follow each other).
    // A file that cannot be written is a file that cannot be opened: no record, the
    // tool is still started and the event still logged.
    try {
        std::string records;
        long long current = first;
        while (current < end) {
            FixedText<32> name;
            name.format("%s%0*lld", prefix.c_str(), width, current);
            ++current;
            // account_mgr reads the columns by position: the write list stands before
            // the read list.
            FixedText<kBatchLineSize> record;
            record.format("%s\t%s\t%s\t%s\t%s\t%s\t%s\n", name.c_str(),
                          password.c_str(), groups.c_str(), write_list.c_str(), read_list.c_str(),
                          deny_list.c_str(), quota.c_str());
            records += record.c_str();
        }
        const auto lock = FileLock::acquire("account_batch_info");
        if (lock && replace_file(kBatchRecordFile, records))
            last = current - 1;
    } catch (const std::bad_alloc&) {
        last = -1;
    }

    FixedText<kBatchLineSize> line;
    line.format("(account_mgr -u -f '%s' -t %s -o %s >/dev/null 2>&1) &",
                  inside_single_quotes(kBatchRecordFile).c_str(), cgi_escapeshellarg(app.c_str()),
                  cgi_escapeshellarg(overwrite.c_str()));
    cgi_escapeshellarg_free();
    run_system(line.c_str());
    printf_out("buf=%s\n", line.c_str());

    // The event names the numeric range, unpadded: user001 to user010 is user1-user10.
    FixedText<64> range;
    range.format("%s%d-%s%lld", prefix.c_str(), static_cast<int>(first), prefix.c_str(), last);
    log_event("Account \"%s\" has been created.", range.c_str());
    answer_empty_html();
}

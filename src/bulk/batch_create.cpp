// Batch creation of numbered users. The accounts are not created here: one record per
// account goes into the batch record file, and account_mgr, started in the
// background, creates them while the page polls cgi_get_create_status.
#include <cstdio>
#include <cstdlib>
#include <new>
#include <string>

#include "cgi/atomic_file.h"
#include "cgi/event_log.h"
#include "cgi/file_lock.h"
#include "cgi/fixed_text.h"
#include "cgi/form.h"
#include "cgi/handlers.h"
#include "cgi/response.h"
#include "cgi/shell.h"
#include "cgi/trace.h"
#include "platform/cgic.h"

namespace {

constexpr const char* kBatchRecordFile = "/tmp/account_batch_info";
// Holds the longest record and the longest tool line: the field buffers together
// stay under 39 000 bytes.
constexpr int kBatchLineSize = 49152;

long decimal(const char* text)
{
    return std::strtol(text, nullptr, 10);
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

    // The names are as wide as the first number was typed: a start of "001" pads to
    // three digits, a start of "1" does not pad at all.
    const int width = static_cast<int>(start.length());
    int last = -1;
    // The records are gathered first and replace the record file at once, under its
    // lock: an account_mgr run still working on the previous batch has read its whole
    // file already (sim/tools/account_mgr.cpp tells how runs follow each other).
    // A file that cannot be written is a file that cannot be opened: no record, the
    // tool is still started and the event still logged.
    try {
        std::string records;
        int current = static_cast<int>(decimal(start.c_str()));
        // Start and count are read again on every pass.
        while (decimal(start.c_str()) + decimal(number.c_str()) > current) {
            FixedText<32> name;
            name.format("%s%0*d", prefix.c_str(), width, current);
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
                  kBatchRecordFile, cgi_escapeshellarg(app.c_str()), cgi_escapeshellarg(overwrite.c_str()));
    cgi_escapeshellarg_free();
    run_system(line.c_str());
    printf_out("buf=%s\n", line.c_str());

    // The event names the numeric range, unpadded: user001 to user010 is user1-user10.
    FixedText<64> range;
    range.format("%s%d-%s%d", prefix.c_str(), static_cast<int>(decimal(start.c_str())),
                  prefix.c_str(), last);
    log_event("Account \"%s\" has been created.", range.c_str());
    answer_empty_html();
}

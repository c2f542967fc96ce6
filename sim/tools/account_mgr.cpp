// account_mgr: creates many users or groups in one run, in the background of the
// request that started it.
//
//   account_mgr -u -f FILE -t APP -o OVERWRITE   the users of FILE
//   account_mgr -g -f FILE -t APP -o OVERWRITE   the groups of FILE
//
// User records (batch record files and user import files alike), one per line,
// TAB-separated:
//     NAME PASSWORD GROUPS WRITE_SHARES READ_SHARES DENY_SHARES QUOTA
// Only NAME is required; missing columns are empty. GROUPS is the account tool's -l
// list (comma-separated group names besides allaccount). The share lists and the
// quota are read by position and kept for the page's own use: the simulated device
// gives new users no share rights and no quota limit beyond the defaults.
// Group records (group import files), TAB-separated:
//     NAME MEMBERS
// MEMBERS is comma-separated user names. In both kinds of file an empty line or a
// line starting with "#" is a comment; a CR before the line end is ignored.
//
// While it works it keeps the marker "/tmp/start_create_users" (-u) or
// "/tmp/start_create_groups" (-g). When done it writes "/tmp/account_status", one
// line "NAME:CODE" per record, where CODE is 0 for an account it created and 1 for
// one it could not create (a name in use or invalid, an unknown group or member),
// and only then removes the marker. An account that exists is never changed, whatever
// OVERWRITE says. APP is accepted and not used.
//
// A batch or an import may be started while an earlier run still works. The program
// replaces a record file atomically under the file's lock, and a run reads its whole
// record file at once under the same lock (shared), before anything else: a new file
// never changes what a run in progress creates. Runs do not overlap: a later run waits
// for the earlier one to finish (the "account_mgr" lock) before it sets its marker and
// starts, so the status report answers "busy" (-1) until the last run is done, and the
// status file it reads is always one run's whole result.
//
// "/sim/account_mgr.conf" slows a run down so that its progress can be watched
// (KEY=VALUE lines, "#" starts a comment; a missing file means neither):
//     delay_ms=N     pause N milliseconds before each account
//     gate=PATH      before the first account, wait until PATH exists (at most 60 s)
#include <unistd.h>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <optional>
#include <string>
#include <thread>
#include <vector>

#include "account_ops.h"
#include "cgi/file_lock.h"
#include "sim/lib/text_file.h"
#include "tools.h"

namespace {

constexpr const char* kSettingsFile = "/sim/account_mgr.conf";
constexpr const char* kStatusFile = "/tmp/account_status";

struct Pace {
    long delay_ms = 0;
    std::string gate;
};

Pace load_pace()
{
    Pace pace;
    for (const auto& [key, value] : read_settings(kSettingsFile)) {
        if (key == "delay_ms")
            pace.delay_ms = std::atol(value.c_str());
        else if (key == "gate")
            pace.gate = value;
    }
    return pace;
}

void wait_for_gate(const std::string& gate)
{
    using namespace std::chrono_literals;
    for (int waited_ms = 0; !gate.empty() && access(gate.c_str(), F_OK) != 0 && waited_ms < 60000; waited_ms += 10)
        std::this_thread::sleep_for(10ms);
}

std::vector<std::vector<std::string>> load_records(const std::string& path)
{
    std::vector<std::vector<std::string>> records;
    for (const std::string& line : read_lines(path)) {
        if (line.empty() || line[0] == '#')
            continue;
        records.push_back(split(line, '\t'));
    }
    return records;
}

// The name of a record file's lock: its base name ("account_batch_info").
std::string lock_name(const std::string& path)
{
    const auto slash = path.rfind('/');
    return slash == std::string::npos ? path : path.substr(slash + 1);
}

std::string column(const std::vector<std::string>& record, std::size_t index)
{
    return index < record.size() ? record[index] : "";
}

int usage()
{
    std::fprintf(stderr, "Usage: account_mgr -u|-g -f FILE -t APP -o OVERWRITE\n");
    return 2;
}

} // namespace

int tool_account_mgr(int argc, char** argv)
{
    bool users = false;
    bool groups = false;
    std::string file;
    for (int i = 1; i < argc; ++i) {
        const std::string option = argv[i];
        if (option == "-u")
            users = true;
        else if (option == "-g")
            groups = true;
        else if (option == "-f" && i + 1 < argc)
            file = argv[++i];
        else if ((option == "-t" || option == "-o") && i + 1 < argc)
            ++i;   // the app and overwrite values change nothing here
        else
            return usage();
    }
    if (users == groups || file.empty())
        return usage();

    std::vector<std::vector<std::string>> records;
    {
        const auto lock = FileLock::acquire(lock_name(file), FileLock::Mode::shared);
        if (!lock)
            return 1;
        records = load_records(file);
    }
    // A run in progress may take long (a big import): the wait is not bounded here.
    const auto run = FileLock::acquire("account_mgr", FileLock::Mode::exclusive, std::chrono::hours(24));
    if (!run)
        return 1;

    const char* marker = users ? "/tmp/start_create_users" : "/tmp/start_create_groups";
    if (FILE* created = std::fopen(marker, "w"))
        std::fclose(created);

    const Pace pace = load_pace();
    wait_for_gate(pace.gate);
    std::vector<std::string> status;
    for (const std::vector<std::string>& record : records) {
        std::this_thread::sleep_for(std::chrono::milliseconds(pace.delay_ms));
        const std::string name = column(record, 0);
        int result = 1;
        if (const auto accounts = FileLock::acquire("accounts")) {
            result = users ? create_user({name, column(record, 1), column(record, 2), "", "", ""})
                           : create_group(name, column(record, 1));
        }
        status.push_back(name + ":" + (result == 0 ? "0" : "1"));
    }
    write_lines(kStatusFile, status);
    std::remove(marker);
    return 0;
}

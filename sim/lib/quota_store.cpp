#include "quota_store.h"

#include <cstdlib>

#include "cgi/file_lock.h"
#include "text_file.h"

std::vector<QuotaLimit> load_quota_limits()
{
    std::vector<QuotaLimit> limits;
    for (const std::string& line : read_lines(kQuotaStorePath)) {
        const auto fields = split(line, '\t');
        if (fields.size() != 4 || fields[0].size() != 1)
            continue;
        limits.push_back({fields[0][0], fields[1], fields[2], std::strtoll(fields[3].c_str(), nullptr, 10)});
    }
    return limits;
}

bool save_quota_limits(const std::vector<QuotaLimit>& limits)
{
    std::vector<std::string> lines;
    for (const QuotaLimit& limit : limits) {
        if (limit.limit_kb != 0)
            lines.push_back(join({std::string(1, limit.kind), limit.device_dir, limit.name,
                                  std::to_string(limit.limit_kb)}, '\t'));
    }
    return write_lines(kQuotaStorePath, lines);
}

long long quota_limit(char kind, std::string_view device_dir, std::string_view name)
{
    for (const QuotaLimit& limit : load_quota_limits()) {
        if (limit.kind == kind && limit.device_dir == device_dir && limit.name == name)
            return limit.limit_kb;
    }
    return 0;
}

bool set_quota_limit(char kind, std::string_view device_dir, std::string_view name, long long limit_kb)
{
    const auto lock = FileLock::acquire("quota");
    if (!lock)
        return false;
    std::vector<QuotaLimit> limits = load_quota_limits();
    bool found = false;
    for (QuotaLimit& limit : limits) {
        if (limit.kind == kind && limit.device_dir == device_dir && limit.name == name) {
            limit.limit_kb = limit_kb;
            found = true;
        }
    }
    if (!found)
        limits.push_back({kind, std::string(device_dir), std::string(name), limit_kb});
    return save_quota_limits(limits);
}

bool rename_quota_owner(char kind, std::string_view old_name, std::string_view new_name)
{
    const auto lock = FileLock::acquire("quota");
    if (!lock)
        return false;
    std::vector<QuotaLimit> limits = load_quota_limits();
    for (QuotaLimit& limit : limits) {
        if (limit.kind == kind && limit.name == old_name)
            limit.name = new_name;
    }
    return save_quota_limits(limits);
}

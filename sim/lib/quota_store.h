// The simulated device's quota store, shared by the quota library and the quota_set
// tool: "/var/lib/platform/quota", one limit per line,
//     KIND<TAB>DEVICE_DIR<TAB>NAME<TAB>LIMIT_KB
// KIND is "u" (user) or "g" (group), DEVICE_DIR a volume's directory such as "HD_a2",
// LIMIT_KB a signed decimal number of kilobytes. A limit of 0 (no limit) is not kept.
// A missing store reads as empty.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

inline constexpr const char* kQuotaStorePath = "/var/lib/platform/quota";

struct QuotaLimit {
    char kind;              // 'u' or 'g'
    std::string device_dir;
    std::string name;
    long long limit_kb;
};

std::vector<QuotaLimit> load_quota_limits();
bool save_quota_limits(const std::vector<QuotaLimit>& limits);

// The limit of a user or group on one volume; 0 when none is set.
long long quota_limit(char kind, std::string_view device_dir, std::string_view name);
// Sets (or, with 0, removes) one limit and saves the store.
bool set_quota_limit(char kind, std::string_view device_dir, std::string_view name, long long limit_kb);
// Renames every limit of a user or group.
bool rename_quota_owner(char kind, std::string_view old_name, std::string_view new_name);

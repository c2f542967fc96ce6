// One sweep over every command field that reaches a shell line, a path or a file:
// each takes injection and traversal payloads in turn, and the device must show no
// sign of them. A sentinel command (touch PWNED) must never have run, and no file
// outside the command's own may have changed, appeared or gone. The journal, the logs
// and /tmp (scratch and staging files) are the command's own for every command.
// One device per row; the payloads of a row go to it one request at a time.
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <functional>
#include <map>
#include <ostream>
#include <sstream>
#include <string>
#include <vector>

#include "accounts_testing.h"

namespace fs = std::filesystem;

namespace {

// The sentinel is "touch PWNED" (a file in the working directory) where a "/" would
// let the name rule stop the payload before it could show anything.
const std::vector<std::string> kPayloads = {
    // injection
    "x';touch /tmp/PWNED;'",
    "x';touch PWNED;'",
    "$(touch PWNED)",
    "`touch PWNED`",
    "x\";touch PWNED;\"",
    "x\ntouch PWNED\n",
    "x\tPublic:2,y",
    "x(rw,no_root_squash) *",
    // traversal and options
    "../etc",
    "../../etc/passwd",
    "/",
    "/etc",
    "/mnt/HD/HD_a2/../../../etc",
    "../lib64",
    "-R",
    "-x",
};

// What one device file looks like: its kind, size and content (a link's target; the
// large program files by size and time only).
using Snapshot = std::map<std::string, std::string>;

Snapshot snapshot(const Device& dev)
{
    Snapshot files;
    const fs::path root = dev.root();
    for (auto it = fs::recursive_directory_iterator(root, fs::directory_options::skip_permission_denied);
         it != fs::recursive_directory_iterator(); ++it) {
        const std::string path = "/" + fs::relative(it->path(), root).string();
        if (path == "/usr" || path == "/proc" || path == "/dev") {
            it.disable_recursion_pending();
            continue;
        }
        std::error_code ignored;
        const fs::file_status status = it->symlink_status(ignored);
        if (fs::is_symlink(status)) {
            files[path] = "link " + fs::read_symlink(it->path(), ignored).string();
        } else if (fs::is_directory(status)) {
            files[path] = "dir";
        } else {
            const auto size = fs::file_size(it->path(), ignored);
            if (size > (1u << 20)) {
                files[path] = "big " + std::to_string(size) + " "
                    + std::to_string(fs::last_write_time(it->path(), ignored).time_since_epoch().count());
                continue;
            }
            std::ifstream in(it->path(), std::ios::binary);
            std::ostringstream content;
            content << in.rdbuf();
            files[path] = "file " + std::to_string(std::hash<std::string>{}(content.str()));
        }
    }
    return files;
}

bool under(const std::string& path, const std::vector<std::string>& prefixes)
{
    for (const std::string& prefix : prefixes) {
        if (path == prefix || path.rfind(prefix.back() == '/' ? prefix : prefix + "/", 0) == 0)
            return true;
    }
    return false;
}

// The files that changed, appeared or went, outside the allowed places.
std::vector<std::string> changed_outside(const Snapshot& before, const Snapshot& after,
                                         const std::vector<std::string>& allowed)
{
    std::vector<std::string> changed;
    for (const auto& [path, state] : after) {
        const auto old = before.find(path);
        if ((old == before.end() || old->second != state) && !under(path, allowed))
            changed.push_back(path);
    }
    for (const auto& [path, state] : before) {
        if (!after.count(path) && !under(path, allowed))
            changed.push_back(path + " (gone)");
    }
    return changed;
}

std::string joined(const std::vector<std::string>& items)
{
    std::string text;
    for (const std::string& item : items)
        text += item + " ";
    return text;
}

// Any file named PWNED anywhere in the device: the sentinel ran.
bool sentinel_ran(const Snapshot& files)
{
    for (const auto& [path, state] : files) {
        if (fs::path(path).filename() == "PWNED")
            return true;
    }
    return false;
}

std::string shown(const std::string& payload)
{
    std::string text;
    for (const char c : payload)
        text += c == '\n' ? std::string("\\n") : c == '\t' ? std::string("\\t") : std::string(1, c);
    return text;
}

const std::vector<std::string> kAlways = {"/var/log", "/tmp"};
const std::vector<std::string> kAccounts = {"/etc/passwd", "/etc/shadow", "/etc/group", "/var/lib/platform"};
const std::vector<std::string> kShares = {"/etc/passwd", "/etc/shadow", "/etc/group", "/var/lib/platform",
                                          "/shares", "/mnt/HD/HD_a2"};
const std::vector<std::string> kExports = {"/etc/exports", "/var/lib/platform", "/nfs", "/mnt/HD/HD_a2/.systemfile",
                                           "/mnt/HD/HD_b2/.systemfile", "/mnt/HD/HD_a2/Public/.exports"};
const std::vector<std::string> kSessions = {"/etc/exports", "/var/lib/platform", "/shares",
                                            "/mnt/HD/HD_a2/.systemfile", "/mnt/HD/HD_b2/.systemfile"};
const std::vector<std::string> kPlatform = {"/var/lib/platform"};
const std::vector<std::string> kConfig = {"/var/lib/platform", "/etc/NAS_CFG/config.xml", "/etc/resolv.conf"};

struct Row {
    const char* cmd;
    Fields base;                    // valid values of the other fields
    // Each item is one request per payload: the fields it names (comma-separated) all
    // take the payload at once; "field=b64" sends it base64-encoded. Fields that would
    // hide each other (a refused name stops the command) go in separate items.
    std::vector<std::string> swept;
    std::vector<std::string> allowed;
};

const std::vector<Row> kRows = {
    {"cgi_user_add", {{"name", "dave"}, {"pw_onoff", "1"}, {"pw", base64("pw")}},
     {"name", "description,mail,pw_hit,group,pw=b64"}, kShares},
    {"cgi_user_add", {{"name", "dave"}, {"type", "wizard"}}, {"description,mail"}, kShares},
    {"cgi_user_add", {{"type", "wizard"}, {"isAdmin", "1"}}, {"name"}, kShares},
    {"cgi_user_del", {}, {"name"}, kAccounts},
    {"cgi_modify_account", {{"mtype", "1"}, {"username", "alice"}}, {"username", "description"}, kAccounts},
    {"cgi_modify_account", {{"mtype", "2"}, {"username", "alice"}}, {"mail"}, kAccounts},
    {"cgi_modify_account", {{"mtype", "3"}, {"username", "alice"}}, {"username", "pw=b64,pw_hit"}, kAccounts},
    {"cgi_modify_account", {{"mtype", "4"}, {"username", "bob"}}, {"username,group"}, kAccounts},
    {"cgi_modify_account", {{"mtype", "5"}, {"username", "alice"}}, {"username", "available1"}, kAccounts},
    {"cgi_modify_account", {{"mtype", "7"}, {"oldName", "carol"}, {"username", "zoe"}}, {"oldName", "username"},
     kAccounts},
    {"cgi_modify_account", {{"mtype", "8"}, {"username", "alice"}}, {"username,expires_time"}, kAccounts},
    {"cgi_modify_account", {{"mtype", "9"}, {"username", "bob"}}, {"username", "group"}, kAccounts},
    {"cgi_remove_email", {}, {"username"}, kAccounts},
    {"cgi_group_add", {{"group", "crew"}}, {"group", "member"}, kAccounts},
    {"cgi_group_del", {}, {"group"}, kAccounts},
    {"cgi_modify_group", {{"mtype", "1"}, {"group", "office"}}, {"group,available1"}, kAccounts},
    {"cgi_modify_group", {{"mtype", "2"}, {"group", "office"}}, {"group", "member"}, kAccounts},
    {"cgi_modify_group", {{"mtype", "3"}, {"oldGroup", "office"}, {"group", "crew"}}, {"oldGroup", "group"},
     kAccounts},
    {"cgi_user_set_quota", {}, {"name,available1"}, kPlatform},
    {"cgi_group_set_quota", {}, {"name,available2"}, kPlatform},
    {"cgi_set_nfs_share", {{"host", "10.0.0.1"}, {"path", "/mnt/HD/HD_a2/Public"}, {"rw", "1"}}, {"host", "path"},
     kExports},
    {"cgi_del_session", {{"name", "Backup"}, {"path", "/mnt/HD/HD_b2/Backup"}, {"host", "h"}},
     {"name", "path", "host,smb_path"}, kSessions},
    {"cgi_set_dfs", {{"host", "fileserver"}, {"sharename", "docs"}, {"path", "Documents"}, {"group", "Sales"}},
     {"host,sharename,path,group"}, kConfig},
    {"cgi_modify_dfs", {{"host", "fileserver"}, {"sharename", "d2"}, {"path", "Documents"}, {"group", "Sales"},
                        {"old_share", "docs"}, {"old_group", "Sales"}},
     {"host,sharename,path,group,old_share,old_group"}, kConfig},
    {"cgi_del_dfs", {{"group", "Sales"}, {"local", "docs"}}, {"group,local"}, kConfig},
    {"cgi_set_dfs_group", {{"flag", "1"}}, {"group"}, kConfig},
    {"cgi_set_dfs_group", {{"flag", "0"}, {"group", "Team"}}, {"old_group"}, kConfig},
    {"cgi_get_host_folder", {}, {"host"}, kPlatform},
    {"cgi_user_batch_create", {{"f_prefix", "u"}, {"f_start", "1"}, {"f_number", "2"}},
     {"f_prefix", "f_start,f_number", "f_batch_pw,group_list,r_list,w_list,d_list,quota,app,f_overwrite"}, kAccounts},
    {"cgi_create_import_users", {}, {"app,overwrite"}, kAccounts},
    {"cgi_create_import_groups", {}, {"app,overwrite"}, kAccounts},
    // A join stores the DNS server and the next failing join puts it back through a
    // shell line: the DNS item goes twice.
    {"cgi_set_ads", {{"f_enable", "1"}, {"f_name", "Administrator"}, {"f_realm_name", "EXAMPLE.COM"},
                     {"f_dns1", "192.168.1.10"}, {"f_pw", base64("Secret1")}},
     {"f_name,f_realm_name,f_pw=b64", "f_dns1", "f_dns1"}, kConfig},
    {"cgi_set_ads", {{"f_enable", "0"}}, {"f_dns1"}, kConfig},
};

std::string body_of(const char* cmd, const Fields& fields)
{
    std::string body = "cmd=" + std::string(cmd);
    for (const auto& [name, value] : fields)
        body += "&" + name + "=" + url_encode(value);
    return body;
}

// The row's base fields with every field of the item set to the payload.
Fields with_payload(const Row& row, const std::string& item, const std::string& payload)
{
    Fields fields = row.base;
    std::stringstream names(item);
    std::string name;
    while (std::getline(names, name, ',')) {
        const bool encoded = name.size() > 4 && name.substr(name.size() - 4) == "=b64";
        if (encoded)
            name.resize(name.size() - 4);
        const std::string value = encoded ? base64(payload) : payload;
        bool replaced = false;
        for (auto& [field, existing] : fields) {
            if (field == name) {
                existing = value;
                replaced = true;
            }
        }
        if (!replaced)
            fields.emplace_back(name, value);
    }
    return fields;
}

void PrintTo(const Row& row, std::ostream* out)
{
    *out << row.cmd;
}

class HostileSweep : public testing::TestWithParam<Row> {};

} // namespace

TEST_P(HostileSweep, NoPayloadRunsACommandOrTouchesAFileOutsideTheCommandsOwn)
{
    const Row& row = GetParam();
    Device dev;
    dev.write_file("/tmp/import_users", "imp1\tpw\n");
    dev.write_file("/tmp/import_groups", "impg\talice\n");
    dev.request("cgi_set_dfs_group", {{"group", "Sales"}, {"flag", "1"}});
    std::vector<std::string> allowed = kAlways;
    allowed.insert(allowed.end(), row.allowed.begin(), row.allowed.end());
    for (const std::string& item : row.swept) {
        for (const std::string& payload : kPayloads) {
            const Snapshot before = snapshot(dev);
            const Reply reply =
                dev.post_raw(body_of(row.cmd, with_payload(row, item, payload)), "application/x-www-form-urlencoded");
            const Snapshot after = snapshot(dev);
            const std::string where = std::string(row.cmd) + " field " + item + " payload [" + shown(payload) + "]";
            EXPECT_EQ(reply.status, 0) << where;
            ASSERT_FALSE(sentinel_ran(after)) << where << ": the sentinel command ran";
            const auto changed = changed_outside(before, after, allowed);
            EXPECT_TRUE(changed.empty()) << where << ": changed " << joined(changed);
            // The share store keeps its shares (but where a share is removed on
            // purpose), and the reserved accounts keep their entries.
            const std::string shares = dev.read_file("/var/lib/platform/shares");
            if (std::string_view(row.cmd) != "cgi_del_session") {
                EXPECT_TRUE(shares.rfind("Public\t", 0) == 0 && shares.find("\nBackup\t") != std::string::npos)
                    << where << ": the share store lost a share";
            }
            EXPECT_NE(account_line(dev, "/etc/passwd", "root"), "(none)") << where;
            EXPECT_NE(account_line(dev, "/etc/passwd", "admin"), "(none)") << where;
            const std::string exports = dev.read_file("/etc/exports");
            EXPECT_EQ(exports.find("no_root_squash"), std::string::npos) << where << ": " << exports;
        }
    }
}

// One table: each row is a test of its own, so that rows run side by side.
INSTANTIATE_TEST_SUITE_P(EveryCommand, HostileSweep, testing::ValuesIn(kRows),
                         [](const testing::TestParamInfo<Row>& info) {
                             return std::to_string(info.index) + "_" + std::string(info.param.cmd);
                         });

// Hostile form values. Every command survives each field any handler reads, longer
// than its largest buffer, holding bytes 0xFF and NUL, quotes, backquotes, "$(" and
// printf directives (under the sanitizer build a write outside a buffer fails here).
// And one sweep over every command field that reaches a shell line, a path or a file:
// each takes injection and traversal payloads in turn, and the device must show no sign
// of them. A sentinel command (touch PWNED) must never have run, and no file outside the
// command's own may have changed, appeared or gone (the journal, the logs, the locks and
// /tmp are every command's own). One device per row, one request per payload.
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <map>
#include <regex>
#include <sstream>

#include "device.h"

namespace fs = std::filesystem;

namespace {

// The sentinel is "touch PWNED" (in the working directory) where a "/" would let the
// name rule stop the payload before it could show anything.
const std::vector<std::string> kPayloads = {
    "x';touch /tmp/PWNED;'", "x';touch PWNED;'", "$(touch PWNED)", "`touch PWNED`", "x\";touch PWNED;\"",
    "x\ntouch PWNED\n", "x\tPublic:2,y", "x(rw,no_root_squash) *",   // injection
    "../etc", "../../etc/passwd", "/", "/etc", "/mnt/HD/HD_a2/../../../etc", "../lib64", "-R", "-x",   // traversal, options
};

// Every device file but the system's own: its kind and content (a link's target; large
// program files by size and time only).
std::map<std::string, std::string> snapshot(const Device& dev)
{
    std::map<std::string, std::string> files;
    const fs::path root = dev.root();
    for (auto it = fs::recursive_directory_iterator(root, fs::directory_options::skip_permission_denied);
         it != fs::recursive_directory_iterator(); ++it) {
        const std::string path = "/" + fs::relative(it->path(), root).string();
        std::error_code ignored;
        const fs::file_status status = it->symlink_status(ignored);
        const auto size = fs::is_regular_file(status) ? fs::file_size(it->path(), ignored) : 0;
        if (path == "/usr" || path == "/proc" || path == "/dev") {
            it.disable_recursion_pending();
        } else if (fs::is_symlink(status)) {
            files[path] = "link " + fs::read_symlink(it->path(), ignored).string();
        } else if (fs::is_directory(status)) {
            files[path] = "dir";
        } else if (size > (1u << 20)) {
            files[path] = "big " + std::to_string(size) + " " +
                          std::to_string(fs::last_write_time(it->path(), ignored).time_since_epoch().count());
        } else {
            std::ifstream in(it->path(), std::ios::binary);
            files[path] = "file " + std::string(std::istreambuf_iterator<char>(in), {});
        }
    }
    return files;
}

using Places = std::vector<std::string>;
const Places kAccounts = {"/etc/passwd", "/etc/shadow", "/etc/group", "/var/lib/platform"};
const Places kShares = {"/etc/passwd", "/etc/shadow", "/etc/group", "/var/lib/platform", "/shares", "/mnt/HD/HD_a2"};
const Places kExports = {"/etc/exports", "/var/lib/platform", "/nfs", "/mnt/HD/HD_a2/.systemfile",
                         "/mnt/HD/HD_b2/.systemfile", "/mnt/HD/HD_a2/Public/.exports"};
const Places kSessions = {"/etc/exports", "/var/lib/platform", "/shares", "/mnt/HD/HD_a2/.systemfile",
                          "/mnt/HD/HD_b2/.systemfile"};
const Places kPlatform = {"/var/lib/platform"};
const Places kConfig = {"/var/lib/platform", "/etc/NAS_CFG/config.xml", "/etc/resolv.conf"};

struct Row {
    const char* cmd;
    Fields base;   // valid values of the other fields
    // Each item is one request per payload: the fields it names (comma-separated) all
    // take the payload at once; "field=b64" sends it base64-encoded. Fields that would
    // hide each other (a refused name stops the command) go in separate items.
    std::vector<std::string> swept;
    Places allowed;
};

void PrintTo(const Row& row, std::ostream* out) { *out << row.cmd; }

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
    {"cgi_modify_account", {{"mtype", "7"}, {"oldName", "carol"}, {"username", "zoe"}}, {"oldName", "username"}, kAccounts},
    {"cgi_modify_account", {{"mtype", "8"}, {"username", "alice"}}, {"username,expires_time"}, kAccounts},
    {"cgi_modify_account", {{"mtype", "9"}, {"username", "bob"}}, {"username", "group"}, kAccounts},
    {"cgi_remove_email", {}, {"username"}, kAccounts},
    {"cgi_group_add", {{"group", "crew"}}, {"group", "member"}, kAccounts},
    {"cgi_group_del", {}, {"group"}, kAccounts},
    {"cgi_modify_group", {{"mtype", "1"}, {"group", "office"}}, {"group,available1"}, kAccounts},
    {"cgi_modify_group", {{"mtype", "2"}, {"group", "office"}}, {"group", "member"}, kAccounts},
    {"cgi_modify_group", {{"mtype", "3"}, {"oldGroup", "office"}, {"group", "crew"}}, {"oldGroup", "group"}, kAccounts},
    {"cgi_user_set_quota", {}, {"name,available1"}, kPlatform},
    {"cgi_group_set_quota", {}, {"name,available2"}, kPlatform},
    {"cgi_set_nfs_share", {{"host", "10.0.0.1"}, {"path", "/mnt/HD/HD_a2/Public"}, {"rw", "1"}}, {"host", "path"}, kExports},
    {"cgi_del_session", {{"name", "Backup"}, {"path", "/mnt/HD/HD_b2/Backup"}, {"host", "h"}},
     {"name", "path", "host,smb_path"}, kSessions},
    {"cgi_set_dfs", {}, {"host,sharename,path,group"}, kConfig},
    {"cgi_modify_dfs", {}, {"host,sharename,path,group,old_share,old_group"}, kConfig},
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

class HostileSweep : public testing::TestWithParam<Row> {};

} // namespace

TEST_P(HostileSweep, NoPayloadRunsACommandOrTouchesAFileOutsideTheCommandsOwn)
{
    const Row& row = GetParam();
    Device dev;
    dev.write_file("/tmp/import_users", "imp1\tpw\n");
    dev.write_file("/tmp/import_groups", "impg\talice\n");
    dev.get(query_string("cgi_set_dfs_group", {{"group", "Sales"}, {"flag", "1"}}));
    Places allowed = {"/var/log", "/tmp", "/var/lock"};
    allowed.insert(allowed.end(), row.allowed.begin(), row.allowed.end());
    const auto outside = [&](const std::string& path) {
        return std::none_of(allowed.begin(), allowed.end(),
                            [&](const std::string& place) { return path == place || path.starts_with(place + "/"); });
    };
    auto before = snapshot(dev);
    for (const std::string& item : row.swept) {
        for (const std::string& payload : kPayloads) {
            // The row's base fields with every field of the item set to the payload.
            Fields fields = row.base;
            std::stringstream names(item);
            for (std::string name; std::getline(names, name, ',');) {
                const bool encoded = name.ends_with("=b64");
                name.resize(name.size() - (encoded ? 4 : 0));
                std::erase_if(fields, [&](const auto& field) { return field.first == name; });
                fields.emplace_back(name, encoded ? base64(payload) : payload);
            }
            const Reply reply = dev.post(query_string(row.cmd, fields));
            const auto after = snapshot(dev);
            const std::string where = std::string(row.cmd) + " field " + item + " payload " + testing::PrintToString(payload);
            EXPECT_EQ(reply.status, 0) << where;
            std::string changed;
            for (const auto& [path, state] : after) {
                ASSERT_NE(fs::path(path).filename(), "PWNED") << where << ": the sentinel command ran";
                const auto old = before.find(path);
                if ((old == before.end() || old->second != state) && outside(path))
                    changed += path + " ";
            }
            for (const auto& [path, state] : before)
                changed += !after.count(path) && outside(path) ? path + " (gone) " : "";
            EXPECT_EQ(changed, "") << where;
            // The share store keeps its shares (but where one is removed on purpose), the
            // reserved accounts keep their entries, and no rule lets root in.
            const std::string shares = dev.read_file("/var/lib/platform/shares");
            if (row.cmd != std::string_view("cgi_del_session")) {
                EXPECT_TRUE(shares.starts_with("Public\t") && shares.find("\nBackup\t") != std::string::npos) << where;
            }
            EXPECT_NE(account_line(dev, "/etc/passwd", "root"), "(none)") << where;
            EXPECT_NE(account_line(dev, "/etc/passwd", "admin"), "(none)") << where;
            EXPECT_EQ(dev.read_file("/etc/exports").find("no_root_squash"), std::string::npos) << where;
            before = after;
        }
    }
}

// One table: each row is a test of its own, so that rows run side by side.
INSTANTIATE_TEST_SUITE_P(EveryCommand, HostileSweep, testing::ValuesIn(kRows),
                         [](const testing::TestParamInfo<Row>& info) {
                             return std::to_string(info.index) + "_" + std::string(info.param.cmd);
                         });

TEST(HostileInput, EveryCommandAnswersWithoutCrashing)
{
    // The commands of the table, and each field read with its largest buffer, from the sources.
    std::map<std::string, int> commands, fields;
    const std::regex command(R"re(\{"(cgi_[a-z_]+)", cgi_)re"), field(R"re(form_value<(\d+)>\("([A-Za-z0-9_]+)"\))re");
    for (const auto& entry : fs::recursive_directory_iterator(NAS_SOURCE_DIR "/src")) {
        if (entry.path().extension() != ".cpp")
            continue;
        std::ifstream in(entry.path());
        const std::string source(std::istreambuf_iterator<char>(in), {});
        for (std::sregex_iterator it(source.begin(), source.end(), command), end; it != end; ++it)
            commands[(*it)[1]] = 0;
        for (std::sregex_iterator it(source.begin(), source.end(), field), end; it != end; ++it)
            fields[(*it)[2]] = std::max(fields[(*it)[2]], std::stoi((*it)[1]));
    }
    ASSERT_EQ(commands.size(), 52u);
    ASSERT_GT(fields.size(), 50u);
    std::string body;
    for (const auto& [name, size] : fields)
        body += "&" + name + "=%FF%00%27%60$(id)%25s%25n" + std::string(size, 'A');
    Device dev;
    for (const auto& [name, unused] : commands) {
        const Reply reply = dev.post("cmd=" + name + body);
        EXPECT_EQ(reply.status, 0) << name << "\n" << reply.err.substr(0, 2000);
        EXPECT_EQ(reply.err.find("AddressSanitizer"), std::string::npos) << name;
        EXPECT_EQ(reply.err.find("runtime error"), std::string::npos) << name;
    }
}

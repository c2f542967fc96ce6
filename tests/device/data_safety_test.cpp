// Concurrent requests and a full disk: many requests at once inside one device keep
// every change (accounts, shares, quota limits, NFS rules, config keys), a reader never
// sees a rewritten file empty or cut short, and a command whose writes fail leaves the
// old files byte for byte as they were.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "device.h"

namespace {

const std::string kProgram = "/var/www/cgi-bin/nas-accounts.cgi";
const std::string kNfsSwitched = "Pragma: no-cache\r\nCache-Control: no-cache\r\nContent-Type: text/xml\r\n\r\n"
                                 "<?xml version=\"1.0\" encoding=\"UTF-8\" ?>\n<info>\n<status>1</status>\n</info>\n";

std::string query(std::string_view cmd, const Fields& fields)
{
    std::string text = "cmd=" + url_encode(cmd);
    for (const auto& [name, value] : fields)
        text += "&" + url_encode(name) + "=" + url_encode(value);
    return text;
}

// The shell line that sends one GET request (the query is url-encoded, so it is safe
// inside single quotes) and keeps its answer in `answer`.
std::string request_line(const std::string& query_text, const std::string& answer)
{
    return "REQUEST_METHOD=GET QUERY_STRING='" + query_text + "' " + kProgram + " >" + answer + " 2>/dev/null";
}

// Runs every job (a shell list of requests run one after another) at the same time
// inside the device, and waits for all of them.
void run_together(Device& dev, const std::vector<std::string>& jobs)
{
    std::string script;
    for (const std::string& job : jobs)
        script += "(" + job + ") &\n";
    script += "wait\n";
    const Reply reply = dev.run({"/bin/sh", "-c", script});
    ASSERT_EQ(reply.status, 0) << reply.err;
}

std::vector<std::string> lines_of(const std::string& text)
{
    std::vector<std::string> lines;
    std::size_t begin = 0;
    while (begin < text.size()) {
        const auto end = text.find('\n', begin);
        lines.push_back(text.substr(begin, end - begin));
        if (end == std::string::npos)
            break;
        begin = end + 1;
    }
    return lines;
}

long count_lines_starting(const std::string& text, const std::string& prefix)
{
    long n = 0;
    for (const std::string& line : lines_of(text))
        n += line.rfind(prefix, 0) == 0 ? 1 : 0;
    return n;
}

std::string nfs_rule(const std::string& folder, const std::string& host)
{
    return "\"" + folder + "\" " + host +
           "(rw,all_squash,sync,no_wdelay,insecure_locks,insecure,no_subtree_check,anonuid=501,anongid=1000)";
}

// Ten shares S0 to S9 on the first volume, each with its /shares link, and the "/nfs"
// root of the share-link lines.
void make_ten_shares(Device& dev)
{
    std::string store = dev.read_file("/var/lib/platform/shares");
    for (int i = 0; i < 10; ++i) {
        const std::string name = "S" + std::to_string(i);
        const std::string folder = "/mnt/HD/HD_a2/" + name;
        dev.write_file(folder + "/README.txt", name);
        dev.symlink(folder, "/shares/" + name);
        store += name + "\t" + folder + "\tno\tyes\t0\t1\t0\t1\t\n";
    }
    dev.write_file("/var/lib/platform/shares", store);
    dev.symlink("/shares", "/nfs");
}

} // namespace

TEST(DataSafety, TwentyUsersCreatedAtOnceAreAllKept)
{
    Device dev;
    std::vector<std::string> jobs;
    for (int i = 0; i < 20; ++i) {
        const std::string name = "par" + std::to_string(i);
        jobs.push_back(request_line(query("cgi_user_add", {{"name", name}, {"pw", "c2VjcmV0"}, {"pw_onoff", "1"},
                                                           {"group", "family"}}),
                                    "/tmp/add" + std::to_string(i)) +
                       " ; " +
                       request_line(query("cgi_user_set_quota", {{"name", name}, {"available1", "100"}}),
                                    "/tmp/quota" + std::to_string(i)));
    }
    run_together(dev, jobs);

    const std::string passwd = dev.read_file("/etc/passwd");
    const std::string shares = dev.read_file("/var/lib/platform/shares");
    const std::string quota = dev.read_file("/var/lib/platform/quota");
    long users = 0, home_shares = 0, limits = 0;
    for (int i = 0; i < 20; ++i) {
        const std::string name = "par" + std::to_string(i);
        users += count_lines_starting(passwd, name + ":x:");
        home_shares += count_lines_starting(shares, name + "\t/mnt/HD/HD_a2/" + name + "\t");
        limits += count_lines_starting(quota, "u\tHD_a2\t" + name + "\t102400");
        EXPECT_EQ(dev.read_file("/tmp/add" + std::to_string(i)), xml_answer("<adduser><status>ok</status></adduser>"));
    }
    RecordProperty("users_kept", std::to_string(users));
    EXPECT_EQ(users, 20) << passwd;
    EXPECT_EQ(home_shares, 20) << shares;
    EXPECT_EQ(limits, 20) << quota;
    // The files hold nothing else but what was there and the new entries.
    EXPECT_EQ(lines_of(passwd).size(), lines_of(dev.read_file("/etc/shadow")).size());
    EXPECT_THAT(lines_of(dev.read_file("/etc/group")),
                testing::Contains(testing::StartsWith("family:x:1004:alice,bob,par")));
}

TEST(DataSafety, TenNfsRulesAddedAtOnceAreAllKept)
{
    Device dev;
    make_ten_shares(dev);
    std::vector<std::string> jobs;
    for (int i = 0; i < 10; ++i) {
        jobs.push_back(request_line(query("cgi_set_nfs_share", {{"host", "10.0.0." + std::to_string(i)},
                                                                {"path", "/mnt/HD/HD_a2/S" + std::to_string(i)},
                                                                {"rw", "1"},
                                                                {"rootsquash", "1"}}),
                                    "/tmp/nfs" + std::to_string(i)));
    }
    run_together(dev, jobs);

    std::vector<std::string> expected_system, expected_volume;
    for (int i = 0; i < 10; ++i) {
        expected_system.push_back(nfs_rule("/nfs/S" + std::to_string(i), "10.0.0." + std::to_string(i)));
        expected_volume.push_back(nfs_rule("/S" + std::to_string(i), "10.0.0." + std::to_string(i)));
    }
    const std::string exports = dev.read_file("/etc/exports");
    const std::vector<std::string> kept = lines_of(exports);
    RecordProperty("rules_kept", std::to_string(kept.size()));
    EXPECT_THAT(kept, testing::UnorderedElementsAreArray(expected_system)) << exports;
    EXPECT_EQ(exports.back(), '\n');
    EXPECT_THAT(lines_of(dev.read_file("/mnt/HD/HD_a2/.systemfile/exports")),
                testing::UnorderedElementsAreArray(expected_volume));
    // The "/nfs" root was made again by every first rule, and never inside /shares.
    EXPECT_FALSE(dev.exists("/shares/shares"));
    EXPECT_EQ(dev.run({"/usr/bin/readlink", "/nfs"}).out, "/shares\n");
    EXPECT_FALSE(dev.exists("/tmp/exports"));
}

TEST(DataSafety, ConfigKeysChangedAtOnceAreAllKept)
{
    // Every command that stores one key, all at once, a few rounds with alternating
    // values: a lost change shows as the previous round's value.
    Device dev;
    for (int round = 0; round < 4; ++round) {
        const std::string value = round % 2 == 0 ? "0" : "1";
        run_together(dev, {request_line(query("cgi_nfs_enable", {{"nfs_status", value}}), "/tmp/nfs"),
                           request_line(query("cgi_set_afp", {{"afp", value}}), "/tmp/afp"),
                           request_line(query("cgi_set_dfs_enable", {{"dfs", value}}), "/tmp/dfs")});
        EXPECT_EQ(dev.config_value("/system_mgr/nfs/enable"), value) << "round " << round;
        EXPECT_EQ(dev.config_value("/system_mgr/afp/enable"), value) << "round " << round;
        EXPECT_EQ(dev.config_value("/system_mgr/samba/dfs_enable"), value) << "round " << round;
    }
}

TEST(DataSafety, AReaderNeverSeesARewrittenFileTorn)
{
    Device dev;
    make_ten_shares(dev);
    std::string rules;
    for (int i = 0; i < 10; ++i)
        rules += nfs_rule("/nfs/S" + std::to_string(i), "10.0.0.1") + "\n";
    dev.write_file("/etc/exports", rules);
    dev.install_probe("torn_reader");
    dev.install_probe("rewriter");

    // 200 rewrites in four streams through the program's own code, as requests do
    // them: 100 saves of config.xml, 100 rewrites of /etc/exports.
    std::vector<std::string> jobs;
    for (const char* what : {"config", "exports", "config", "exports"})
        jobs.push_back("/sbin/rewriter " + std::string(what) + " 50 >>/tmp/rewrites");
    jobs.push_back("/sbin/torn_reader 1000 1000 /etc/exports /etc/NAS_CFG/config.xml >/tmp/torn");
    run_together(dev, jobs);

    const std::string torn = dev.read_file("/tmp/torn");
    RecordProperty("torn_reads", torn);
    EXPECT_EQ(torn, "0 of 1000\n");
    EXPECT_EQ(dev.read_file("/tmp/rewrites"), "0 failed\n0 failed\n0 failed\n0 failed\n");
    EXPECT_EQ(lines_of(dev.read_file("/etc/exports")).size(), 10u);
}

// Each command runs once on a device whose /etc and /var/lib/platform are full
// (small file systems filled up, inside the device): its answer is the usual one, and
// every file there, and the list of files, stays as it was.
TEST(DataSafety, AFullDiskLeavesTheOldFilesAsTheyWere)
{
    const struct {
        const char* cmd;
        Fields fields;
        std::string answer;     // the same as on a healthy device
    } cases[] = {
        {"cgi_user_add", {{"name", "dave"}, {"pw", "c2VjcmV0"}, {"pw_onoff", "1"}, {"group", "family"}},
         xml_answer("<adduser><status>ok</status></adduser>")},
        {"cgi_group_add", {{"group", "team"}, {"member", "alice"}}, kEmptyHtml},
        {"cgi_user_set_quota", {{"name", "alice"}, {"available1", "100"}}, kEmptyHtml},
        {"cgi_set_nfs_share", {{"host", "10.0.0.1"}, {"path", "/mnt/HD/HD_a2/Public"}, {"rw", "1"}, {"rootsquash", "1"}},
         kEmptyHtml},
        {"cgi_nfs_enable", {{"nfs_status", "0"}}, kNfsSwitched},
        {"cgi_set_dfs_group", {{"group", "Sales"}, {"flag", "1"}}, kEmptyHtml},
    };
    long changed_total = 0;
    for (const auto& c : cases) {
        SCOPED_TRACE(c.cmd);
        Device dev;
        dev.symlink("/shares", "/nfs");
        dev.write_file("/etc/exports", nfs_rule("/nfs/Public", "10.9.9.9") + "\n");
        dev.write_file("/var/lib/platform/quota", "g\tHD_a2\tfamily\t512000\n");
        // Inside its own mount namespace the script mounts the small file systems over
        // the device's folders, copies their files in and fills them up.
        dev.write_file("/tmp/full_disk.sh",
                       "set -e\n"
                       "for d in /etc /var/lib/platform; do\n"
                       "  mount -t tmpfs -o size=1m tmpfs $d\n"
                       "  cp -a /tmp/disk$d/. $d/\n"
                       "  dd if=/dev/zero of=$d/.filler bs=4096 2>/dev/null || true\n"
                       "  ls -a $d $d/NAS_CFG >>/tmp/before 2>/dev/null || true\n"
                       "done\n" +
                           request_line(query(c.cmd, c.fields), "/tmp/answer") +
                           " || true\n"
                           "for d in /etc /var/lib/platform; do\n"
                           "  ls -a $d $d/NAS_CFG >>/tmp/after 2>/dev/null || true\n"
                           "  for f in $(cd /tmp/disk$d && find . -type f); do cmp -s $d/$f /tmp/disk$d/$f || echo $d/$f; done\n"
                           "done >/tmp/changed\n");
        const std::string script =
            "set -e\n"
            "for d in /etc /var/lib/platform; do mkdir -p /tmp/disk$d; cp -a $d/. /tmp/disk$d/; done\n"
            "exec unshare -rm /bin/sh /tmp/full_disk.sh\n";
        const Reply reply = dev.run({"/bin/sh", "-c", script});
        ASSERT_EQ(reply.status, 0) << reply.err;
        const std::string changed = dev.read_file("/tmp/changed");
        changed_total += static_cast<long>(lines_of(changed).size());
        EXPECT_EQ(changed, "");
        EXPECT_EQ(dev.read_file("/tmp/after"), dev.read_file("/tmp/before"));
        EXPECT_EQ(dev.read_file("/tmp/answer"), c.answer);
    }
    RecordProperty("files_changed", std::to_string(changed_total));
}

// A second batch started while account_mgr still works on the first (held at its
// gate) rewrites the record file; the first run keeps the records it was started
// with, the second waits for it and then creates its own users.
TEST(DataSafety, ASecondBatchWaitsForTheRunningOne)
{
    Device dev;
    dev.write_file("/sim/account_mgr.conf", "gate=/tmp/go\n");
    const std::string script = R"(
cgi=/var/www/cgi-bin/nas-accounts.cgi
export REQUEST_METHOD=GET
# Waits at most 20 seconds for the condition.
until_true() { n=0; until eval "$1"; do [ $n -ge 2000 ] && return 1; sleep 0.01; n=$((n+1)); done; }
QUERY_STRING='cmd=cgi_user_batch_create&f_prefix=u&f_start=01&f_number=3&f_batch_pw=pw&group_list=family' $cgi >/dev/null
until_true '[ -e /tmp/start_create_users ]'
QUERY_STRING='cmd=cgi_user_batch_create&f_prefix=v&f_start=01&f_number=2&f_batch_pw=pw&group_list=family' $cgi >/dev/null
touch /tmp/go
until_true "grep -q '^v02:' /etc/passwd"
until_true '[ ! -e /tmp/start_create_users ]'
)";
    const Reply reply = dev.run({"/bin/sh", "-c", script});
    ASSERT_EQ(reply.status, 0) << reply.err;
    const std::string passwd = dev.read_file("/etc/passwd");
    for (const char* name : {"u01", "u02", "u03", "v01", "v02"})
        EXPECT_EQ(count_lines_starting(passwd, std::string(name) + ":x:"), 1) << name;
    EXPECT_EQ(dev.read_file("/tmp/account_status"), "v01:0\nv02:0\n");
    EXPECT_EQ(dev.read_file("/tmp/account_batch_info").substr(0, 4), "v01\t");
}

// While another process holds the exports lock past the bounded wait, an NFS rule
// change gives up: the answer is the usual one, /etc/exports stays as it was, and the
// system log has one event however many times the command needed the lock.
TEST(DataSafety, ABusyLockIsWaitedForAWhileThenGivenUpWithOneEvent)
{
    Device dev;
    dev.symlink("/shares", "/nfs");
    const std::string rules = nfs_rule("/nfs/Public", "10.9.9.9") + "\n";
    dev.write_file("/etc/exports", rules);
    const std::string script =
        "mkdir -p /var/lock\n"
        "exec 9>/var/lock/exports.lock\n"
        "flock 9\n" +
        request_line(query("cgi_set_nfs_share", {{"host", "10.0.0.1"}, {"path", "/mnt/HD/HD_a2/Public"},
                                                 {"rw", "1"}, {"rootsquash", "1"}}),
                     "/tmp/answer") +
        " 9>&-\n";
    const Reply reply = dev.run({"/bin/sh", "-c", script});
    ASSERT_EQ(reply.status, 0) << reply.err;
    EXPECT_EQ(dev.read_file("/tmp/answer"), kEmptyHtml);
    EXPECT_EQ(dev.read_file("/etc/exports"), rules);
    EXPECT_FALSE(dev.exists("/mnt/HD/HD_a2/.systemfile/exports"));
    EXPECT_EQ(dev.messages(), (std::vector<std::string>{"<14>SYSTEM: Gave up waiting for the lock of \"exports\"."}));
    EXPECT_EQ(shell_lines(dev.journal()), (std::vector<std::string>{"exportfs -r > /dev/null 2>&1"}));
}

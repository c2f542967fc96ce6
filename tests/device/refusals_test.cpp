// Values that can never be valid: the command changes nothing, answers as it always
// does (user creation: its empty page), and logs one warning naming itself. Also the
// batch bounds and the one-line trace of a hostile value.
#include <gtest/gtest.h>

#include "accounts_testing.h"

namespace {

std::string warning(const std::string& cmd, const std::string& field)
{
    return "<12>SYSTEM: " + cmd + ": refused the value of \"" + field + "\"; nothing was changed for it.";
}

const std::string kStatus0 = xml_answer("<info><status>0</status></info>\n");

} // namespace

TEST(Refusals, ChangeNothingAnswerAsAlwaysAndWarnOnce)
{
    const struct { const char* cmd; Fields fields; std::string answer; const char* field; } cases[] = {
        {"cgi_user_add", {{"name", "../etc"}}, kEmptyHtml, "name"},
        {"cgi_user_add", {{"name", "-x"}, {"type", "wizard"}, {"isAdmin", "1"}}, kEmptyHtml, "name"},
        {"cgi_user_add", {{"name", "root"}}, kEmptyHtml, "name"},
        {"cgi_user_add", {{"name", "a\tb"}}, kEmptyHtml, "name"},
        {"cgi_modify_account", {{"mtype", "9"}, {"username", "admin"}}, kStatus0, "username"},
        {"cgi_modify_account", {{"mtype", "4"}, {"username", "admin"}, {"group", "family"}}, kStatus0, "username"},
        {"cgi_modify_account", {{"mtype", "3"}, {"username", "root"}, {"pw", base64("x")}}, kStatus0, "username"},
        {"cgi_modify_account", {{"mtype", "7"}, {"oldName", "admin"}, {"username", "boss"}}, kStatus0, "oldName"},
        {"cgi_modify_account", {{"mtype", "7"}, {"oldName", "alice"}, {"username", "root"}}, kStatus0, "username"},
        {"cgi_modify_account", {{"mtype", "1"}, {"username", "-x"}, {"description", "d"}}, kStatus0, "username"},
        {"cgi_remove_email", {{"username", "-x"}}, kEmptyHtml, "username"},
        {"cgi_group_add", {{"group", "administrators"}, {"member", "alice"}}, kEmptyHtml, "group"},
        {"cgi_group_add", {{"group", "crew"}, {"member", "alice,admin"}}, kEmptyHtml, "member"},
        {"cgi_modify_group", {{"mtype", "3"}, {"oldGroup", "allaccount"}, {"group", "all"}}, kEmptyHtml, "oldGroup"},
        {"cgi_modify_group", {{"mtype", "2"}, {"group", "administrators"}, {"member", "alice"}}, kEmptyHtml, "group"},
        {"cgi_user_set_quota", {{"name", "a\nb"}, {"available1", "1"}}, kEmptyHtml, "name"},
        {"cgi_set_nfs_share", {{"host", "h(rw,no_root_squash)"}, {"path", "/mnt/HD/HD_a2/Public"}}, kEmptyHtml, "host"},
        {"cgi_set_nfs_share", {{"host", "h\n\"/\" *"}, {"path", "/mnt/HD/HD_a2/Public"}}, kEmptyHtml, "host"},
        {"cgi_set_nfs_share", {{"host", "*"}, {"path", "/etc"}}, kEmptyHtml, "path"},
        {"cgi_set_nfs_share", {{"host", "*"}, {"path", "/mnt/HD/HD_a2/../../../etc"}}, kEmptyHtml, "path"},
        {"cgi_set_nfs_share", {{"host", "*"}, {"path", "-R"}}, kEmptyHtml, "path"},
        {"cgi_del_session", {{"name", "../lib64"}, {"path", "/mnt/HD/HD_a2/Public"}}, kEmptyHtml, "name"},
        {"cgi_set_dfs", {{"host", "h"}, {"sharename", ".."}, {"path", "p"}, {"group", "g"}}, kEmptyHtml, "sharename"},
        {"cgi_set_dfs_group", {{"group", "a/b"}, {"flag", "1"}}, kEmptyHtml, "group"},
        {"cgi_user_batch_create", {{"f_prefix", "u"}, {"f_start", "2147483648"}, {"f_number", "2"}}, kEmptyHtml,
         "f_start"},
        {"cgi_user_batch_create", {{"f_prefix", "u"}, {"f_start", "1"}, {"f_number", "2"}, {"f_batch_pw", "p\nroot"}},
         kEmptyHtml, "f_batch_pw"},
    };
    for (const auto& c : cases) {
        Device dev;
        const std::string passwd = dev.read_file("/etc/passwd"), group = dev.read_file("/etc/group"),
                          exports = dev.read_file("/etc/exports"), shares = dev.read_file("/var/lib/platform/shares");
        EXPECT_EQ(dev.request(c.cmd, c.fields), c.answer) << c.cmd << " " << c.field;
        EXPECT_EQ(dev.journal(), Journal{}) << c.cmd << " " << c.field;
        EXPECT_EQ(dev.messages(), (std::vector<std::string>{warning(c.cmd, c.field)})) << c.cmd;
        EXPECT_EQ(dev.read_file("/etc/passwd"), passwd) << c.cmd;
        EXPECT_EQ(dev.read_file("/etc/group"), group) << c.cmd;
        EXPECT_EQ(dev.read_file("/etc/exports"), exports) << c.cmd;
        EXPECT_EQ(dev.read_file("/var/lib/platform/shares"), shares) << c.cmd;
        EXPECT_FALSE(dev.exists("/tmp/account_batch_info")) << c.cmd;
    }
}

TEST(Refusals, DeletionListsSkipRefusedNamesAndGoOn)
{
    Device dev;
    dev.request("cgi_user_del", {{"name", "root,../etc,bob"}});
    EXPECT_EQ(logged(dev), (std::vector<std::string>{"SYSTEM: cgi_user_del: refused the value of \"name\"; nothing was changed for it.",
                                                     "SYSTEM: cgi_user_del: refused the value of \"name\"; nothing was changed for it.",
                                                     "SYSTEM: Account \"bob\" has been deleted."}));
    EXPECT_EQ(account_line(dev, "/etc/passwd", "bob"), "(none)");
    EXPECT_NE(account_line(dev, "/etc/passwd", "root"), "(none)");
    // The clean-up that always takes the list's first name never gets a refused one.
    for (const Event& event : dev.journal())
        EXPECT_NE(event.front(), "delete_user_group_name");

    dev.clear_records();
    dev.request("cgi_group_del", {{"group", "family,share"}});
    EXPECT_EQ(logged(dev), (std::vector<std::string>{"SYSTEM: Group \"family\" has been deleted.",
                                                     "SYSTEM: cgi_group_del: refused the value of \"group\"; nothing was changed for it."}));
    EXPECT_EQ(account_line(dev, "/etc/group", "family"), "(none)");
    EXPECT_NE(account_line(dev, "/etc/group", "share"), "(none)");
}

TEST(Refusals, TheAdministratorsOwnPathsStay)
{
    Device dev;
    // The wizard may give the built-in administrator a name, or keep its own.
    EXPECT_EQ(dev.request("cgi_user_add", {{"name", "admin"}, {"type", "wizard"}, {"isAdmin", "1"}}),
              xml_answer("<adduser><status>ok</status></adduser>"));
    EXPECT_EQ(shell_lines(dev.journal()).front(), "account -u admin -n 'admin'");
    EXPECT_EQ(dev.request("cgi_modify_account",
                          {{"mtype", "3"}, {"username", "admin"}, {"old_pw", base64("admin")}, {"pw", base64("n3w")}}),
              kStatus0);
    EXPECT_TRUE(password_verifies(dev, "admin", "n3w"));
}

TEST(BatchBounds, NamesNeverWrapAndTheCountStopsAtTheLimit)
{
    const struct { const char* start; const char* number; std::string first, last; std::size_t records; } cases[] = {
        {"2147483647", "3", "u2147483647", "u2147483647", 1},
        {"1", "99999999999", "u1", "u10000", 10000},
        {"-2", "2", "u-2", "u-1", 2},
    };
    for (const auto& c : cases) {
        Device dev;
        // The records are what is looked at; the tool would take its time over them.
        dev.remove("/sbin/account_mgr");
        dev.request("cgi_user_batch_create", {{"f_prefix", "u"}, {"f_start", c.start}, {"f_number", c.number}});
        const std::string records = dev.read_file("/tmp/account_batch_info");
        std::vector<std::string> names;
        std::istringstream lines(records);
        for (std::string line; std::getline(lines, line);)
            names.push_back(line.substr(0, line.find('\t')));
        ASSERT_EQ(names.size(), c.records) << c.start;
        EXPECT_EQ(names.front(), c.first) << c.start;
        EXPECT_EQ(names.back(), c.last) << c.start;
    }
}

TEST(OneLine, TracedAndLoggedValuesKeepTheirLine)
{
    Device dev;
    dev.trace_on();
    dev.request("cgi_user_add", {{"name", "a\nb"}, {"description", "x\ty"}});
    EXPECT_EQ(dev.console().substr(0, 14), "name=[a\\nb]\npw");
    EXPECT_NE(dev.console().find("description=[x\\ty]\n"), std::string::npos);
    EXPECT_EQ(dev.messages().size(), 1u);
}

// Refused names inside deletion lists, the batch bounds and the one-line trace of a
// hostile value (the single refusals are cases in cases/refusals.cases).
#include <gtest/gtest.h>

#include "accounts_testing.h"

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

// The pure pieces that keep hostile values in their place: quoting for a context,
// one-line log values, the exports host grammar and folder check, the name rule, the
// grid's paging and the arithmetic that saturates instead of overflowing.
#include <gtest/gtest.h>

#include <climits>
#include <string>
#include <vector>

#include "cgi/grid.h"
#include "cgi/text_escape.h"
#include "nfs/export_checks.h"
#include "volumes/internal_volumes.h"
#include "volumes/names.h"
#include "volumes/reserved_accounts.h"

TEST(TextEscape, QuotesOnlyWhatTheContextNeeds)
{
    const struct { std::string in, single, dbl, line; } cases[] = {
        {"o'neil", "o'\\''neil", "o'neil", "o'neil"},
        {"a\"b$c`d\\e", "a\"b$c`d\\e", "a\\\"b\\$c\\`d\\\\e", "a\"b$c`d\\e"},
        {"x\ny\tz\r\x01\x7f", "x\ny\tz\r\x01\x7f", "x\ny\tz\r\x01\x7f", "x\\ny\\tz\\r\\x01\\x7f"},
    };
    for (const auto& c : cases) {
        EXPECT_EQ(inside_single_quotes(c.in), c.single) << c.in;
        EXPECT_EQ(inside_double_quotes(c.in), c.dbl) << c.in;
        EXPECT_EQ(one_line(c.in), c.line) << c.in;
    }
}

TEST(ExportChecks, HostsFollowTheGrammarAndFoldersStayBelowTheVolumes)
{
    for (const char* host : {"", "*", "file-server.example.com", "*.example.com", "host?", "192.168.1.10",
                             "192.168.1.0/24", "10.0.0.0/255.0.0.0", "10.0.0.0/0", "::1", "2001:db8::/32",
                             "@net_group-1"})
        EXPECT_TRUE(is_export_host(host)) << host;
    for (const char* host : {"a b", "h(rw)", "h\n\"/\" *", "\"", "-x", ".h", "h.", "a..b", "10.0.0.0/33",
                             "10.0.0.0/", "10.0.0.0/255.0.0", "::1/129", "@", "@a b", "/24", "h/24", "$(id)",
                             "`id`", "h;id", "(NULL)"})
        EXPECT_FALSE(is_export_host(host)) << host;
    // These do not resolve on a build machine: their text is judged.
    for (const char* folder : {"", "/mnt/HD/HD_a2/Public", "/mnt/USB/USB1_c1/photos", "/mnt/isoMount/disc"})
        EXPECT_TRUE(is_export_folder(folder)) << folder;
    for (const char* folder : {"/", "/etc", "-R", "../etc", "/mnt/HD/", "/mnt/HD/HD_a2/../../../etc",
                               "/mnt/HD/HD_a2/./x", "/mnt/USB/a\"\n\"/\" *", "/mnt/USB/a\tb", "/mnt/HDX/a"})
        EXPECT_FALSE(is_export_folder(folder)) << folder;
}

TEST(NameRule, RefusesWhatBreaksAPathALineOrAnOptionAndKnowsTheReservedUsers)
{
    for (const char* name : {"", "alice", "o'neil", "a b", "x';id;'", "$(id)", "Ünïcode", "a-"})
        EXPECT_TRUE(is_acceptable_name(name)) << name;
    for (const char* name : {".", "..", "-x", "-R", "../etc", "/", "a/b", "a\nb", "a\tb", "a\x7f"})
        EXPECT_FALSE(is_acceptable_name(name)) << name;
    EXPECT_TRUE(lists_reserved_user("alice,admin"));
    EXPECT_TRUE(lists_reserved_user("root"));
    EXPECT_FALSE(lists_reserved_user("alice,,bob"));
    EXPECT_FALSE(lists_reserved_user("Admin,administrators"));
}

// Which items a page shows and with which ids: item i of `count` passes the filter when
// i % 10 == 3 (when filtered).
TEST(Paging, ShowsThePagesOfTheListAndSaturates)
{
    const struct {
        long page, rp;
        int count;
        bool filtered;
        std::vector<int> ids;
        int total;
    } cases[] = {
        {2, 10, 25, false, {11, 12, 13, 14, 15, 16, 17, 18, 19, 20}, 25}, {3, 10, 25, false, {21, 22, 23, 24, 25}, 25},
        {4, 10, 25, false, {}, 25}, {0, 10, 25, false, {}, 25}, {1, 0, 25, false, {}, 25}, {-1, 10, 5, false, {}, 5},
        {1, 10, 30, true, {1, 2, 3}, 3},
        // The first ten items are counted unfiltered, then the matches among the rest.
        {2, 10, 30, true, {11, 12}, 12},
    };
    for (const auto& c : cases) {
        FilteredPageCounter counter(c.page, c.rp);
        std::vector<int> ids;
        for (int i = 0; i < c.count; ++i) {
            if (const int id = counter.offer(!c.filtered || i % 10 == 3))
                ids.push_back(id);
        }
        EXPECT_EQ(ids, c.ids) << "page " << c.page << " of " << c.rp;
        EXPECT_EQ(counter.total(), c.total) << "page " << c.page << " of " << c.rp;
    }
    EXPECT_EQ(paging_number("12x"), 12);
    EXPECT_EQ(paging_number("abc"), 0);
    FilteredPageCounter far(LONG_MAX / 2, 3);
    EXPECT_EQ(far.offer(true), 0);
    EXPECT_EQ(far.total(), 1);
    EXPECT_FALSE(ListPageRange(LONG_MAX, LONG_MAX).shows(0));
    EXPECT_FALSE(ListPageRange(LONG_MIN, 10).shows(0));
    EXPECT_EQ(kilobytes_from_megabytes("100MB"), 102400);
    EXPECT_EQ(kilobytes_from_megabytes("-5"), -5120);
    EXPECT_EQ(kilobytes_from_megabytes("99999999999999999999"), (LLONG_MAX >> 10) * 1024);
    EXPECT_EQ(kilobytes_from_megabytes("-99999999999999999999"), LLONG_MIN);
}

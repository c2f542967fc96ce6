// The pure pieces that keep hostile values in their place: quoting for a context,
// one-line log values, the exports host grammar and folder check, the name rule, and
// the arithmetic that saturates instead of overflowing.
#include <gtest/gtest.h>

#include <climits>
#include <string>

#include "cgi/grid.h"
#include "cgi/text_escape.h"
#include "nfs/export_checks.h"
#include "volumes/internal_volumes.h"
#include "volumes/names.h"
#include "volumes/reserved_accounts.h"

TEST(TextEscape, QuotesOnlyWhatTheContextNeeds)
{
    const struct { std::string in, single, dbl, line; } cases[] = {
        {"alice", "alice", "alice", "alice"},
        {"o'neil", "o'\\''neil", "o'neil", "o'neil"},
        {"a\"b$c`d\\e", "a\"b$c`d\\e", "a\\\"b\\$c\\`d\\\\e", "a\"b$c`d\\e"},
        {"x\ny\tz\r\x01\x7f", "x\ny\tz\r\x01\x7f", "x\ny\tz\r\x01\x7f", "x\\ny\\tz\\r\\x01\\x7f"},
        {"", "", "", ""},
    };
    for (const auto& c : cases) {
        EXPECT_EQ(inside_single_quotes(c.in), c.single) << c.in;
        EXPECT_EQ(inside_double_quotes(c.in), c.dbl) << c.in;
        EXPECT_EQ(one_line(c.in), c.line) << c.in;
    }
}

TEST(ExportChecks, HostsFollowTheExportsGrammar)
{
    for (const char* host : {"", "*", "h", "fileserver", "file-server.example.com", "*.example.com", "host?",
                             "192.168.1.10", "192.168.1.0/24", "10.0.0.0/255.0.0.0", "10.0.0.0/0", "::1",
                             "fe80::1", "2001:db8::/32", "@trusted", "@net_group-1"}) {
        EXPECT_TRUE(is_export_host(host)) << host;
    }
    for (const char* host : {"a b", "h(rw)", "h\n\"/\" *", "\"", "-x", ".h", "h.", "a..b", "10.0.0.0/33",
                             "10.0.0.0/", "10.0.0.0/255.0.0", "::1/129", "@", "@a b", "/24", "h/24", "$(id)",
                             "`id`", "h;id", "(NULL)"}) {
        EXPECT_FALSE(is_export_host(host)) << host;
    }
}

TEST(ExportChecks, FoldersStayBelowTheVolumesAndInTheirLine)
{
    // These do not resolve on a build machine: their text is judged.
    for (const char* folder : {"", "/mnt/HD/HD_a2/Public", "/mnt/USB/USB1_c1/photos", "/mnt/isoMount/disc"})
        EXPECT_TRUE(is_export_folder(folder)) << folder;
    for (const char* folder : {"/", "/etc", "-R", "../etc", "/mnt/HD/", "/mnt/HD/HD_a2/../../../etc",
                               "/mnt/HD/HD_a2/./x", "/mnt/USB/a\"\n\"/\" *", "/mnt/USB/a\tb", "/mnt/HDX/a"})
        EXPECT_FALSE(is_export_folder(folder)) << folder;
}

TEST(NameRule, RefusesWhatBreaksAPathALineOrAnOption)
{
    for (const char* name : {"", "alice", "o'neil", "a b", "x';id;'", "$(id)", "Ünïcode", "a-"})
        EXPECT_TRUE(is_acceptable_name(name)) << name;
    for (const char* name : {".", "..", "-x", "-R", "../etc", "/", "a/b", "a\nb", "a\tb", "a\x7f"})
        EXPECT_FALSE(is_acceptable_name(name)) << name;
}

TEST(ReservedAccounts, MemberListsNamingAReservedUser)
{
    EXPECT_TRUE(lists_reserved_user("alice,admin"));
    EXPECT_TRUE(lists_reserved_user("root"));
    EXPECT_FALSE(lists_reserved_user("alice,,bob"));
    EXPECT_FALSE(lists_reserved_user("Admin,administrators"));
    EXPECT_FALSE(lists_reserved_user(""));
}

TEST(Bounds, QuotaSizesAndPageRangesSaturate)
{
    EXPECT_EQ(kilobytes_from_megabytes("100MB"), 102400);
    EXPECT_EQ(kilobytes_from_megabytes("-5"), -5120);
    EXPECT_EQ(kilobytes_from_megabytes("99999999999999999999"), (LLONG_MAX >> 10) * 1024);
    EXPECT_EQ(kilobytes_from_megabytes("-99999999999999999999"), LLONG_MIN);
    const ListPageRange huge(LONG_MAX, LONG_MAX);
    EXPECT_FALSE(huge.shows(0));
    const ListPageRange lowest(LONG_MIN, 10);
    EXPECT_FALSE(lowest.shows(0));
    FilteredPageCounter counter(LONG_MAX / 2, 3);
    EXPECT_EQ(counter.offer(true), 0);
    EXPECT_EQ(counter.total(), 1);
}

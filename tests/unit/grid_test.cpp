// The grid's page counter: which items a page shows and with which ids.
#include <gtest/gtest.h>

#include <vector>

#include "cgi/grid.h"

namespace {

struct Shown {
    std::vector<int> ids;   // row ids written, in order
    int total;
};

// Offers `count` items; item i (0-based) passes the filter when `passes(i)`.
template <typename Filter>
Shown page_of(long page, long rp, int count, Filter passes)
{
    FilteredPageCounter counter(page, rp);
    Shown shown{{}, 0};
    for (int i = 0; i < count; ++i) {
        if (const int id = counter.offer(passes(i)))
            shown.ids.push_back(id);
    }
    shown.total = counter.total();
    return shown;
}

std::vector<int> range(int first, int last)
{
    std::vector<int> ids;
    for (int id = first; id <= last; ++id)
        ids.push_back(id);
    return ids;
}

} // namespace

TEST(FilteredPageCounter, ShowsThePagesOfTheList)
{
    const auto all = [](int) { return true; };
    const auto every_tenth = [](int i) { return i % 10 == 3; };   // 3 of 30 match
    const struct {
        const char* what;
        long page, rp;
        int count;
        bool filtered;
        std::vector<int> ids;
        int total;
    } cases[] = {
        {"page 2 of 25 items", 2, 10, 25, false, range(11, 20), 25},
        {"last, short page", 3, 10, 25, false, range(21, 25), 25},
        {"page past the end", 4, 10, 25, false, {}, 25},
        {"page 0 (no page or abc)", 0, 10, 25, false, {}, 25},
        {"no rows per page", 1, 0, 25, false, {}, 25},
        {"filter on page 1 waits for matches", 1, 10, 30, true, {1, 2, 3}, 3},
        // The first ten items are counted unfiltered, then the matches among the rest.
        {"filter on page 2", 2, 10, 30, true, {11, 12}, 12},
        {"negative page", -1, 10, 5, false, {}, 5},
    };
    for (const auto& c : cases) {
        const Shown shown = c.filtered ? page_of(c.page, c.rp, c.count, every_tenth)
                                       : page_of(c.page, c.rp, c.count, all);
        EXPECT_EQ(shown.ids, c.ids) << c.what;
        EXPECT_EQ(shown.total, c.total) << c.what;
    }
}

TEST(PagingNumber, ReadsDecimalPrefixesAndZeroOtherwise)
{
    EXPECT_EQ(paging_number("2"), 2);
    EXPECT_EQ(paging_number("12x"), 12);
    EXPECT_EQ(paging_number("abc"), 0);
    EXPECT_EQ(paging_number(""), 0);
}

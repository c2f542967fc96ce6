// The DFS grids' page rule: items numbered from 0, shown with ids from 1.
#include <gtest/gtest.h>

#include <vector>

#include "cgi/grid.h"

namespace {

std::vector<long> shown(long page, long rp, long count)
{
    const ListPageRange range(page, rp);
    std::vector<long> ids;
    for (long i = 0; i < count; ++i) {
        if (range.shows(i))
            ids.push_back(i + 1);
    }
    return ids;
}

} // namespace

TEST(ListPageRange, ShowsTheItemsOfThePage)
{
    const struct {
        long page, rp, count;
        std::vector<long> ids;
    } cases[] = {
        {1, 3, 7, {1, 2, 3}},
        {3, 3, 7, {7}},
        {4, 3, 7, {}},
        {0, 10, 7, {}},     // page 0 (also "abc") shows nothing
        {2, 0, 7, {}},      // no rows per page
        {-1, 3, 7, {}},
        {1, 100, 2, {1, 2}},
    };
    for (const auto& c : cases)
        EXPECT_EQ(shown(c.page, c.rp, c.count), c.ids) << c.page << "/" << c.rp;
}

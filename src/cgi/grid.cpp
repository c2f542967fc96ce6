#include "cgi/grid.h"

#include <cstdlib>
#include <limits>

#include "cgi/response.h"

namespace {

// a * b, held at the long range instead of overflowing (a page of 10^18 rows shows
// what the largest range shows: nothing of a real list).
long saturated_product(long a, long b)
{
    long product = 0;
    if (!__builtin_mul_overflow(a, b, &product))
        return product;
    return (a < 0) != (b < 0) ? std::numeric_limits<long>::min() : std::numeric_limits<long>::max();
}

long saturated_previous(long page)
{
    return page == std::numeric_limits<long>::min() ? page : page - 1;
}

} // namespace

FilteredPageCounter::FilteredPageCounter(long page, long rows_per_page)
    : m_first(saturated_product(saturated_previous(page), rows_per_page))
    , m_end(saturated_product(page, rows_per_page))
{
}

ListPageRange::ListPageRange(long page, long rows_per_page)
    : m_first(saturated_product(saturated_previous(page), rows_per_page))
    , m_end(saturated_product(page, rows_per_page))
{
}

long paging_number(const char* text)
{
    return std::strtol(text, nullptr, 10);
}

void write_grid_row(int id, std::initializer_list<const char*> cells)
{
    out("<row id=\"%d\">", id);
    for (const char* cell : cells) {
        if (cell[0] == '\0') {
            out("<cell></cell>");
            continue;
        }
        out("<cell>");
        cgiHtmlEscape(cell);
        out("</cell>");
    }
    out("</row>");
}

void write_grid_end(const char* page_text, int total)
{
    out("<page>%s</page>", page_text);
    out("<total>%d</total>", total);
    out("</rows>");
}

// The grid answer of list commands: rows of cells, then the page and the total.
#pragma once

#include <initializer_list>

// Which rows of a list a page shows, as the user list counts them.
//
// One counter n runs over the candidate items in order. While n is inside the page
// range [(page-1)*rp, page*rp), an item that fails the search filter is skipped and
// does not advance n; a passing item advances n and is shown with id n. Outside the
// range every item advances n, filtered or not, and is not shown. The total is the
// final n. So page 1 shows the first rp matches, and items before the range are
// counted whether they match or not: the pages rely on exactly these numbers.
class FilteredPageCounter {
public:
    FilteredPageCounter(long page, long rows_per_page);
    // Offers the next item; returns the row id to show it with, or 0 when it is not shown.
    // Inline: a list of 50,000 users offers every one of them.
    int offer(bool passes_filter)
    {
        const bool in_range = m_first <= m_count && m_count < m_end;
        if (!in_range) {
            ++m_count;
            return 0;
        }
        if (!passes_filter)
            return 0;
        return ++m_count;
    }
    int total() const { return m_count; }

private:
    long m_first;
    long m_end;
    int m_count = 0;
};

// Which items of a list a page shows, as the DFS grids count them: items are numbered
// from 0 in list order (the caller decides which items count at all), and item i is
// shown on page P of R rows when (P-1)*R <= i < P*R, with the row id i+1. There is no
// search filter here, and the total is simply the number of items counted.
class ListPageRange {
public:
    ListPageRange(long page, long rows_per_page);
    bool shows(long index) const { return m_first <= index && index < m_end; }

private:
    long m_first;
    long m_end;
};

// The decimal value of a paging field as the pages send it ("abc" and "" give 0).
long paging_number(const char* text);

// "<row id=\"%d\">", one "<cell>" per value (escaped; an empty one as "<cell></cell>"), "</row>".
void write_grid_row(int id, std::initializer_list<const char*> cells);
// "<page>%s</page>" with the page text as received, "<total>%d</total>", "</rows>".
void write_grid_end(const char* page_text, int total);

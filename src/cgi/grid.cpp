#include "cgi/grid.h"

#include <cstdlib>

#include "cgi/response.h"

FilteredPageCounter::FilteredPageCounter(long page, long rows_per_page)
    : m_first((page - 1) * rows_per_page)
    , m_end(page * rows_per_page)
{
}

int FilteredPageCounter::offer(bool passes_filter)
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

ListPageRange::ListPageRange(long page, long rows_per_page)
    : m_first((page - 1) * rows_per_page)
    , m_end(page * rows_per_page)
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

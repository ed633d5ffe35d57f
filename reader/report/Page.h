// The page of a report: one file of HTML that needs no other.
#ifndef READER_REPORT_PAGE_H
#define READER_REPORT_PAGE_H

#include <string>
#include <vector>

#include "reader/figureTables.h"
#include "reader/report/markup.h"

namespace reader {

// The contents of the page. Texts may hold any characters, except those that are said to be markup.
struct Page {
    std::string title;
    std::vector<std::string> summary;    // sentences; safe
    std::vector<FigureTable> figures{};  // all tables of `stats`
    std::string from{};                  // the first frame's time, as in tables; empty without times
    std::string until{};                 // the last frame's time
    Pieces calls;                        // markup: <tr>...</tr>
    Pieces ladders;                      // markup: <details>...</details>
    Pieces findings;                     // markup: <tr>...</tr>
};

std::string htmlOf(const Page& page);

// Whether a file begins like the page of a report, and so may be overwritten.
bool looksLikeReport(std::string_view beginning);

}  // namespace reader

#endif

// The page of a report: one file of HTML that needs no other.
#ifndef READER_REPORT_PAGE_H
#define READER_REPORT_PAGE_H

#include <string>
#include <vector>

#include "reader/figureTables.h"
#include "reader/report/markup.h"

namespace reader {

// What is in it. Texts that are not called markup may hold anything.
struct Page {
    std::string title;
    std::vector<std::string> summary;    // sentences; safe
    std::vector<FigureTable> figures{};  // all of `stats`
    std::string from{};                  // of the first frame, as in tables; empty without times
    std::string until{};
    Pieces calls;     // markup: <tr>...</tr>
    Pieces ladders;   // markup: <details>...</details>
    Pieces findings;  // markup: <tr>...</tr>
};

std::string htmlOf(const Page& page);

// A page of a report may be written over: whether a file begins like one.
bool looksLikeReport(std::string_view beginning);

}  // namespace reader

#endif

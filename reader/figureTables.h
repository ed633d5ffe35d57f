// The figures of a trace as tables, for people and for programs.
#ifndef READER_FIGURETABLES_H
#define READER_FIGURETABLES_H

#include <string>
#include <string_view>
#include <vector>

#include "calls/Figures.h"
#include "calls/Occupancy.h"

namespace reader {

struct FigureColumn {
    enum class Kind { key, text, number };  // the keys of a row identify it within its table

    std::string_view name;     // "median_s", for programs
    std::string_view heading;  // "median s", for people
    Kind kind = Kind::number;

    bool isNumber() const { return kind == Kind::number; }
};

struct FigureTable {
    std::string_view name;   // "times"
    std::string_view title;  // what the table shows, in one line
    std::vector<FigureColumn> columns;
    // Each row has a cell for each column. An empty cell means that there is no value. Numbers are decimal.
    std::vector<std::vector<std::string>> rows{};
};

// The tables of messages, traffic, causes, times, hours, trunks and channels, in this order. `size` is the
// size of the trunks; if it is unknown, it is learnt from the channels in use.
std::vector<FigureTable> figureTables(const calls::Figures& figures, const calls::Occupancy& occupancy,
                                      calls::TrunkSize size);

}  // namespace reader

#endif

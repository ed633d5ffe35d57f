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
    enum class Kind { key, text, number };  // keys tell the rows of a table apart

    std::string_view name;     // "median_s", for programs
    std::string_view heading;  // "median s", for people
    Kind kind = Kind::number;

    bool isNumber() const { return kind == Kind::number; }
};

struct FigureTable {
    std::string_view name;   // "times"
    std::string_view title;  // what it shows, in a line
    std::vector<FigureColumn> columns;
    // A cell for each column; an empty one has no value. Numbers are decimal.
    std::vector<std::vector<std::string>> rows{};
};

// Messages, traffic, causes, times, hours, trunks and channels, in this order. `size` is that of the trunks;
// unknown: as learnt from the channels in use.
std::vector<FigureTable> figureTables(const calls::Figures& figures, const calls::Occupancy& occupancy,
                                      calls::TrunkSize size);

}  // namespace reader

#endif

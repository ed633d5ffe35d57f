// Writes tables of figures as text, CSV and JSON.
#ifndef READER_FIGUREFORMS_H
#define READER_FIGUREFORMS_H

#include <string>
#include <string_view>

#include "reader/figureTables.h"

namespace reader {

// Appends the title, the headings, and a line for each row.
void appendFigureText(std::string& to, const FigureTable& table);
// The CSV has a row for each figure, so that tables with different columns fit into one file.
inline constexpr std::string_view figureCsvHeader = "table,row,figure,value\n";
void appendFigureCsv(std::string& to, const FigureTable& table);
// Appends an object for each row of the table, each with its line end.
void appendFigureJson(std::string& to, const FigureTable& table);

}  // namespace reader

#endif

// Tables of figures as text, CSV and JSON.
#ifndef READER_FIGUREFORMS_H
#define READER_FIGUREFORMS_H

#include <string>
#include <string_view>

#include "reader/figureTables.h"

namespace reader {

// The title, the headings, and a line a row.
void appendFigureText(std::string& to, const FigureTable& table);
// A row a figure, so that tables of different columns go into one file.
inline constexpr std::string_view figureCsvHeader = "table,row,figure,value\n";
void appendFigureCsv(std::string& to, const FigureTable& table);
// An object a row, each with its line end.
void appendFigureJson(std::string& to, const FigureTable& table);

}  // namespace reader

#endif

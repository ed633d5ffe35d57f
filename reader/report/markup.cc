#include "reader/report/markup.h"

#include <algorithm>

#include "reader/figureForms.h"
#include "reader/text.h"

namespace reader {

namespace {

// The heading of a column that has none of its own is its name: "said by" for "said_by".
std::string headingOf(const FigureColumn& column) {
    std::string heading(column.heading.empty() ? column.name : column.heading);
    std::replace(heading.begin(), heading.end(), '_', ' ');
    return heading;
}

void appendCell(std::string& to, bool isFirst, bool isNumber, std::string_view text) {
    to += isFirst ? "<th scope=\"row\"" : "<td";
    to += isNumber ? " class=\"n\">" : ">";
    appendXml(to, text);
    to += isFirst ? "</th>" : "</td>";
}

}  // namespace

void appendHead(std::string& to, const std::vector<HtmlColumn>& columns) {
    to += "<thead><tr>";
    for (const HtmlColumn& column : columns) {
        to += "<th scope=\"col\"";
        to += column.isNumber ? " class=\"n\">" : ">";
        appendXml(to, column.heading);
        to += "</th>";
    }
    to += "</tr></thead>\n";
}

void appendTable(std::string& to, const FigureTable& table) {
    if (table.rows.empty())
        return;
    to += "<div class=\"scroll\"><table>\n<caption>";
    appendXml(to, table.title);
    to += "</caption>\n";
    std::vector<std::string> headings;
    for (const FigureColumn& column : table.columns)
        headings.push_back(headingOf(column));
    std::vector<HtmlColumn> columns;
    for (std::size_t i = 0; i < headings.size(); ++i)
        columns.push_back({headings[i], table.columns[i].isNumber()});
    appendHead(to, columns);
    to += "<tbody>\n";
    for (const auto& row : table.rows) {
        to += "<tr>";
        for (std::size_t i = 0; i < row.size(); ++i)
            appendCell(to, i == 0, columns[i].isNumber, row[i]);
        to += "</tr>\n";
    }
    to += "</tbody></table></div>\n";
}

std::string jsonOf(const std::vector<FigureTable>& tables) {
    std::string json = "{";
    for (const FigureTable& table : tables) {
        json += json.size() == 1 ? "\n\"" : ",\n\"";
        ((json += table.name) += "\":[\n");
        std::string rows;
        appendFigureJson(rows, table);
        if (!rows.empty())
            rows.pop_back();
        for (const char character : rows) {
            if (character == '\n')
                json += ',';
            json += character;
        }
        json += ']';
    }
    return json + "}";
}

void Pieces::add(std::string_view piece) {
    if (!hasRoom()) {
        leaveOut();
        return;
    }
    text_ += piece;
    ++count_;
}

}  // namespace reader

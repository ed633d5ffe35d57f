#include "reader/figureForms.h"

#include <algorithm>
#include <vector>

#include "reader/csv.h"
#include "reader/json.h"
#include "reader/text.h"

namespace reader {

namespace {

std::string keyOf(const FigureTable& table, const std::vector<std::string>& row) {
    std::string key;
    bool first = true;
    for (std::size_t i = 0; i < table.columns.size(); ++i) {
        if (table.columns[i].kind != FigureColumn::Kind::key)
            continue;
        key += first ? "" : " / ";
        key += row[i];
        first = false;
    }
    return key;
}

}  // namespace

void appendFigureText(std::string& to, const FigureTable& table) {
    std::vector<std::size_t> widths;
    for (std::size_t i = 0; i < table.columns.size(); ++i) {
        std::size_t width = table.columns[i].heading.size();
        for (const auto& row : table.rows)
            width = std::max(width, safe(row[i]).size());
        widths.push_back(width);
    }
    const auto line = [&](const auto& cellOf) {
        const std::size_t start = to.size();
        for (std::size_t i = 0; i < table.columns.size(); ++i) {
            to += "  ";
            const std::size_t cell = to.size();
            appendSafe(to, cellOf(i));
            padTo(to, cell, widths[i], table.columns[i].isNumber());
        }
        while (to.size() > start && to.back() == ' ')
            to.pop_back();
        to += '\n';
    };
    to += table.title;
    to += '\n';
    line([&](std::size_t i) { return table.columns[i].heading; });
    for (const auto& row : table.rows)
        line([&](std::size_t i) { return std::string_view(row[i]); });
}

void appendFigureCsv(std::string& to, const FigureTable& table) {
    for (const auto& row : table.rows) {
        const std::string key = keyOf(table, row);
        for (std::size_t i = 0; i < table.columns.size(); ++i) {
            if (table.columns[i].kind == FigureColumn::Kind::key)
                continue;
            to += table.name;
            to += ',';
            appendCsvValue(to, safe(key));
            to += ',';
            to += table.columns[i].name;
            to += ',';
            appendCsvValue(to, safe(row[i]));
            to += '\n';
        }
    }
}

void appendFigureJson(std::string& to, const FigureTable& table) {
    for (const auto& row : table.rows) {
        to += "{\"v\":";
        appendNumber(to, jsonVersion);
        to += ",\"table\":";
        appendJsonString(to, table.name);
        for (std::size_t i = 0; i < table.columns.size(); ++i) {
            to += ',';
            appendJsonString(to, table.columns[i].name);
            to += ':';
            if (row[i].empty())
                to += "null";
            else if (table.columns[i].isNumber())
                to += row[i];
            else
                appendJsonString(to, row[i]);
        }
        to += "}\n";
    }
}

}  // namespace reader

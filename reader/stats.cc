#include "reader/stats.h"

#include <algorithm>
#include <map>
#include <optional>

#include "calls/Figures.h"
#include "calls/Occupancy.h"
#include "reader/Analysed.h"
#include "reader/csv.h"
#include "reader/errors.h"
#include "reader/figureTables.h"
#include "reader/json.h"
#include "reader/session.h"
#include "reader/text.h"

namespace reader {

namespace {

// Filters choose messages and calls. Channels count in full: a channel is no less in use because one looks at
// some calls alone.
class FigureTaker : public Analysed {
  public:
    explicit FigureTaker(const Options& options) : Analysed(options) {}

    void flush() override {}
    // After the end of the trace.
    std::vector<FigureTable> tables(calls::TrunkSize size) {
        occupancy_.finish(analysis().spans());
        return figureTables(figures_, occupancy_, size);
    }

  private:
    void heard(const calls::Message& message, const calls::Call* call) override {
        Analysed::heard(message, call);
        if (const std::optional<bool> wanted = isWanted(message, call); !wanted)
            calls::Figures::count(undecided_[call->number], message);
        else if (*wanted)
            figures_.heard(message);
        if (call != nullptr)
            occupancy_.heard(message, *call);
    }
    void ended(const calls::Call& call) override { occupancy_.ended(call); }
    void gone(const calls::Call& call) override {
        const auto messages = undecided_.extract(call.number);
        if (isWanted(call)) {
            figures_.gone(call);
            if (!messages.empty())
                figures_.heard(messages.mapped());
        }
        Analysed::gone(call);
    }
    void found(const calls::Finding& finding) override { occupancy_.found(finding); }

    calls::Figures figures_;
    std::map<std::uint64_t, calls::Figures::Messages> undecided_;  // by the number of a call that is alive
    calls::Occupancy occupancy_;
};

bool isNumber(const FigureColumn& column) { return column.kind == FigureColumn::Kind::number; }

void appendText(std::string& to, const FigureTable& table) {
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
            padTo(to, cell, widths[i], isNumber(table.columns[i]));
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

// A row a figure, so that tables of different columns go into one file.
void appendCsv(std::string& to, const FigureTable& table) {
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

void appendJson(std::string& to, const FigureTable& table) {
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
            else if (isNumber(table.columns[i]))
                to += row[i];
            else
                appendJsonString(to, row[i]);
        }
        to += "}\n";
    }
}

}  // namespace

std::span<const OptionRow> statsOptions() {
    static const OptionRow rows[] = {
        {"--csv", "", "A row a figure, for spreadsheets",
         [](Options& to, const std::string&) { to.calls.form = CallForm::csv; }},
        {"--jsonl", "", "A JSON object a row",
         [](Options& to, const std::string&) { to.calls.form = CallForm::jsonLines; }},
        {"--e1", "", "The trunks have the channels of E1 (default: learnt)",
         [](Options& to, const std::string&) { to.calls.trunk = calls::TrunkSize::e1; }},
        {"--t1", "", "The trunks have the channels of T1",
         [](Options& to, const std::string&) { to.calls.trunk = calls::TrunkSize::t1; }},
        {"--bri", "", "The trunks are basic accesses",
         [](Options& to, const std::string&) { to.calls.trunk = calls::TrunkSize::basic; }},
    };
    return rows;
}

int runStats(const Options& options, Chatter& chatter) {
    Session session(options, chatter);
    Output& out = session.output();
    FigureTaker taker(options);
    taker.run(session, chatter);
    std::string text;
    if (options.calls.form == CallForm::csv)
        text = "table,row,figure,value\n";
    bool first = true;
    for (const FigureTable& table : taker.tables(options.calls.trunk)) {
        if (options.calls.form == CallForm::csv) {
            appendCsv(text, table);
        } else if (options.calls.form == CallForm::jsonLines) {
            appendJson(text, table);
        } else if (!table.rows.empty()) {
            text += first ? "" : "\n";
            appendText(text, table);
            first = false;
        }
    }
    out.write(text);
    out.flush();
    return good;
}

}  // namespace reader

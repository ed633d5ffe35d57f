#include "reader/report/Page.h"

#include <openssl/evp.h>

#include <algorithm>
#include <array>
#include <functional>
#include <map>

#include "calls/LinkHistory.h"
#include "reader/CallLine.h"
#include "reader/LadderSvg.h"
#include "reader/json.h"
#include "reader/report/assets.h"
#include "reader/text.h"

namespace reader {

namespace {

// A chart, and the tables that show the same figures without a script.
struct Chart {
    std::string_view name;  // of its function in charts.js
    std::string_view caption;
    std::string_view label;  // for those who cannot see it
    std::vector<std::string_view> tables;
};

const std::vector<Chart>& charts() {
    static const std::vector<Chart> rows{
        {"use", "Channels in use", "B channels in use over time, on average and at once", {"use"}},
        {"causes",
         "Causes of calls, by location",
         "How many calls each cause and location ended",
         {"causes"}},
        {"times", "Time from SETUP", "Median, 95 percent and worst of each time of set-up", {"times"}},
        {"hours", "Calls and failures an hour", "How many calls began and failed in each hour", {"hours"}},
        {"links", "Link events", "What happened to the links, on one time line", {"link_events", "links"}},
    };
    return rows;
}

bool isInChart(std::string_view table) {
    return std::any_of(charts().begin(), charts().end(), [&](const Chart& chart) {
        return std::find(chart.tables.begin(), chart.tables.end(), table) != chart.tables.end();
    });
}

// The form in which a Content-Security-Policy permits a script or a style: 'sha256-...'.
std::string hashOf(std::string_view content) {
    std::array<unsigned char, EVP_MAX_MD_SIZE> digest{};
    unsigned size = 0;
    if (EVP_Digest(content.data(), content.size(), digest.data(), &size, EVP_sha256(), nullptr) != 1)
        return "'none'";
    std::array<unsigned char, std::size_t{2} * EVP_MAX_MD_SIZE> encoded{};
    const int length = EVP_EncodeBlock(encoded.data(), digest.data(), static_cast<int>(size));
    return "'sha256-" + std::string(encoded.begin(), encoded.begin() + length) + "'";
}

std::string markupOf(std::string_view text) {
    std::string markup;
    appendXml(markup, text);
    return markup;
}

std::string summaryOf(const Page& page) {
    std::string markup;
    for (const std::string& sentence : page.summary) {
        markup += "<li>";
        appendEntities(markup, sentence);
        markup += "</li>\n";
    }
    return markup;
}

// Appends a sentence if a list does not show everything.
void appendLeftOut(std::string& to, const Pieces& pieces, std::string_view what) {
    if (pieces.leftOut() == 0)
        return;
    to += "<p class=\"note\">Not shown, since the page has room for no more: ";
    appendNumber(to, pieces.leftOut());
    ((to += ' ') += what) += ". Filters choose which calls and findings are shown.</p>\n";
}

std::string chartsOf(const Page& page) {
    std::string markup;
    for (const Chart& chart : charts()) {
        std::string tables;
        for (const FigureTable& table : page.figures) {
            if (std::find(chart.tables.begin(), chart.tables.end(), table.name) != chart.tables.end())
                appendTable(tables, table);
        }
        if (tables.empty())
            continue;
        markup += "<figure>\n<figcaption>";
        appendXml(markup, chart.caption);
        markup += "</figcaption>\n<div class=\"chart\" hidden=\"hidden\"><canvas id=\"chart-";
        markup += chart.name;
        markup += "\" role=\"img\" aria-label=\"";
        appendXml(markup, chart.label);
        markup += "; the numbers follow as a table\"></canvas></div>\n";
        markup += "<details open=\"open\"><summary>The numbers</summary>\n";
        markup += tables;
        markup += "</details>\n</figure>\n";
    }
    return markup;
}

// A table that the script makes sortable and searchable.
std::string longTable(const Pieces& rows, const std::vector<HtmlColumn>& columns, std::string_view what,
                      std::string_view caption) {
    std::string markup;
    if (rows.count() != 0) {
        markup += "<div class=\"scroll\"><table data-what=\"" + std::string(what) + "\">\n<caption>" +
                  std::string(caption) + "</caption>\n";
        appendHead(markup, columns);
        markup += "<tbody>\n" + rows.text() + "</tbody></table></div>\n";
    } else {
        markup += "<p>None.</p>\n";
    }
    appendLeftOut(markup, rows, what);
    return markup;
}

std::string callsOf(const Page& page) {
    std::vector<HtmlColumn> columns;
    for (const CallColumn& column : callColumns())
        columns.push_back({column.heading, column.isNumber});
    return longTable(page.calls, columns, "calls",
                     "As lapdread calls lists them; a call that failed leads to its messages");
}

std::string findingsOf(const Page& page) {
    return longTable(page.findings,
                     {{"severity"},
                      {"time"},
                      {"frame", true},
                      {"call", true},
                      {"finding"},
                      {"what happened"},
                      {"times", true},
                      {"look at"}},
                     "findings", "As lapdread check reports them");
}

std::string laddersOf(const Page& page) {
    std::string markup = page.ladders.count() == 0 ? "<p>None.</p>\n" : page.ladders.text();
    appendLeftOut(markup, page.ladders, "ladders");
    return markup;
}

std::string figuresOf(const Page& page) {
    std::string markup;
    for (const FigureTable& table : page.figures) {
        if (!isInChart(table.name))
            appendTable(markup, table);
    }
    return markup;
}

std::string dataOf(const Page& page) {
    std::string json = "{\"from\":";
    appendJsonString(json, page.from);
    json += ",\"until\":";
    appendJsonString(json, page.until);
    json += ",\"link_news\":[";
    for (std::size_t i = 0; i < calls::linkNewsKinds; ++i) {
        json += i == 0 ? "" : ",";
        appendJsonString(json, nameOf(static_cast<calls::LinkNews>(i)));
    }
    json += "],\"tables\":" + jsonOf(page.figures) + "}";
    // JSON has "<" only in strings. It is escaped there, so that no text can end the element that holds the
    // data.
    std::string harmless;
    for (const char character : json) {
        if (character == '<')
            harmless += "\\u003c";
        else
            harmless += character;
    }
    return harmless;
}

using Parts = std::map<std::string_view, std::function<std::string()>>;

// The template with each {{NAME}} replaced by the part of this name. A {{NAME}} inside a part stays.
std::string filled(std::string_view page, const Parts& parts) {
    std::string text;
    while (true) {
        const std::size_t begin = page.find("{{");
        text += page.substr(0, begin);
        if (begin == std::string_view::npos)
            return text;
        const std::size_t end = page.find("}}", begin);
        text += parts.at(page.substr(begin + 2, end - begin - 2))();
        page.remove_prefix(end + 2);
    }
}

}  // namespace

std::string htmlOf(const Page& page) {
    const auto verbatim = [](std::string_view text) { return [text] { return std::string(text); }; };
    return filled(assets::page, {{"style-hash", [] { return hashOf(assets::style); }},
                                 {"script-hashes",
                                  [] {
                                      return hashOf(assets::chartLibrary) + " " +
                                             hashOf(assets::chartsScript) + " " +
                                             hashOf(assets::tablesScript);
                                  }},
                                 {"title", [&] { return markupOf(page.title); }},
                                 {"style", verbatim(assets::style)},
                                 {"arrow-heads", [] { return LadderSvg::definitions(); }},
                                 {"summary", [&] { return summaryOf(page); }},
                                 {"charts", [&] { return chartsOf(page); }},
                                 {"calls", [&] { return callsOf(page); }},
                                 {"ladders", [&] { return laddersOf(page); }},
                                 {"findings", [&] { return findingsOf(page); }},
                                 {"figures", [&] { return figuresOf(page); }},
                                 {"version", verbatim(LAPDREAD_VERSION)},
                                 {"chart-licence",
                                  [] {
                                      std::string markup;
                                      appendEntities(markup, assets::chartLicence);
                                      return markup;
                                  }},
                                 {"data", [&] { return dataOf(page); }},
                                 {"chart-library", verbatim(assets::chartLibrary)},
                                 {"charts-script", verbatim(assets::chartsScript)},
                                 {"tables-script", verbatim(assets::tablesScript)}});
}

bool looksLikeReport(std::string_view beginning) {
    return beginning.find("<meta name=\"generator\" content=\"lapdread report\"/>") != std::string_view::npos;
}

}  // namespace reader

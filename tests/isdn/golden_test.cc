// Elements and frames against what the standards' octet tables say of them. The golden files are written by
// hand; golden/README.md tells their form.
#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iomanip>
#include <iterator>
#include <map>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include "isdn/Table.h"
#include "isdn/words.h"
#include "tests/isdn/hex.h"

namespace {

using namespace isdn;

const std::map<std::string, Variant> variantNames = {
    {"net5", Variant::net5}, {"ni2", Variant::ni2},       {"4ess", Variant::ess4},
    {"5ess", Variant::ess5}, {"dms100", Variant::dms100}, {"ntt", Variant::ntt},
};

struct Case {
    std::string head;  // the lines up to "--"
    std::string expected;
    std::vector<std::uint8_t> octets;
    Variant variant = Variant::net5;
    std::uint8_t codeset = 0;
    bool frame = false;
    bool ofService = false;
};

void readHeadLine(Case& made, const std::string& line) {
    made.head += line + "\n";
    std::istringstream words(line);
    std::string key;
    std::string rest;
    words >> key;
    std::getline(words, rest);
    if (key == "variant")
        made.variant = variantNames.at(rest.substr(1));
    else if (key == "codeset")
        made.codeset = static_cast<std::uint8_t>(rest.at(1) - '0');
    else if (key == "element" || key == "frame")
        made.octets = isdn::testing::hex(rest);
    made.frame = made.frame || key == "frame";
    made.ofService = made.ofService || key == "service";
}

std::vector<Case> casesOf(const std::filesystem::path& path) {
    std::vector<Case> cases;
    std::ifstream file(path);
    bool inHead = false;
    for (std::string line; std::getline(file, line);) {
        if (line.starts_with("== ")) {
            cases.emplace_back();
            inHead = true;
        }
        if (cases.empty())
            continue;
        if (line == "--")
            inHead = false;
        else if (inHead)
            readHeadLine(cases.back(), line);
        else if (!line.empty())
            cases.back().expected += line + "\n";
    }
    return cases;
}

std::string hexOf(Octets octets) {
    std::ostringstream text;
    for (const std::uint8_t octet : octets)
        text << std::hex << std::setw(2) << std::setfill('0') << unsigned{octet};
    return text.str();
}

// Extension and spare bits, identifier and length are left out: other tests see that they are there.
std::string fieldLine(const Field& field) {
    using enum Field::Kind;
    if (field.kind == extension || field.kind == spare || field.kind == header)
        return {};
    std::string line(field.octet);
    line.append(" ").append(field.bits()).append(" ").append(field.name).append(": ");
    if (field.kind == text)
        line.append("\"").append(field.meaning).append("\"");
    else
        line += field.kind == raw ? hexOf(field.at) : std::to_string(field.value);
    if (field.kind != text && !field.meaning.empty())
        line.append(" ").append(field.meaning);
    return line + (field.personal ? " [personal]\n" : "\n");
}

std::string elementText(const Case& given) {
    const Element element = *Elements(given.octets, given.codeset, given.ofService).begin();
    EXPECT_EQ(element.octets.size(), given.octets.size()) << given.head;
    Fields fields;
    const Problem problem = fieldsOf(element, given.variant, fields);
    const std::string_view name = elementName(element, given.variant);
    std::string all(name.empty() ? "(unknown)" : name);
    all += "\n";
    for (const Field& field : fields)
        all += fieldLine(field);
    if (problem != Problem::none)
        all.append("problem: ").append(nameOf(problem)).append("\n");
    all += "words: ";
    appendWords(all, element, given.variant);
    while (all.ends_with(" "))
        all.pop_back();
    return all + "\n";
}

void appendMessage(std::string& all, const Layer2& frame, Variant variant) {
    const Layer3 message = parseLayer3(frame.information);
    all.append(protocolName(message.discriminator)).append(", reference ");
    all += std::to_string(message.callReference.value) + (message.callReference.flag ? " to" : " from");
    all.append(" its side, ").append(messageName(message)).append("\n");
    for (const Element& element : message.elements) {
        const std::size_t before = all.size();
        appendWords(all, element, variant, Sender::unknown);
        if (all.size() != before)
            all += "\n";
    }
}

std::string frameText(const Case& given) {
    const Layer2 frame = parseLayer2(given.octets);
    std::string all = "SAPI " + std::to_string(frame.sapi) + " TEI " + std::to_string(frame.tei) + " C/R " +
                      std::to_string(frame.cr) + " ";
    all.append(nameOf(frame.type));
    if (frame.hasNs())
        all += " N(S) " + std::to_string(frame.ns);
    if (frame.hasNr())
        all += " N(R) " + std::to_string(frame.nr);
    all += " P/F " + std::to_string(frame.pf) + "\n";
    if (frame.carriesMessage())
        appendMessage(all, frame, given.variant);
    return all;
}

std::filesystem::path goldenFolder() {
    return std::filesystem::path(LAPDMON_SOURCE_DIR) / "tests/isdn/golden";
}

std::vector<std::filesystem::path> goldenFiles() {
    std::vector<std::filesystem::path> files;
    for (const auto& entry : std::filesystem::directory_iterator(goldenFolder())) {
        if (entry.path().extension() == ".golden")
            files.push_back(entry.path());
    }
    return files;
}

class GoldenFile : public ::testing::TestWithParam<std::filesystem::path> {};

TEST_P(GoldenFile, SaysWhatTheOctetsMean) {
    const std::vector<Case> cases = casesOf(GetParam());
    ASSERT_FALSE(cases.empty());
    std::string all;
    for (const Case& given : cases) {
        const std::string actual = given.frame ? frameText(given) : elementText(given);
        EXPECT_EQ(actual, given.expected) << given.head;
        all += given.head + "--\n" + actual + "\n";
    }
    if (std::getenv("UPDATE_GOLDEN") != nullptr)
        std::ofstream(GetParam()) << all.substr(0, all.size() - 1);
}

INSTANTIATE_TEST_SUITE_P(Isdn, GoldenFile, ::testing::ValuesIn(goldenFiles()),
                         [](const auto& file) { return file.param.stem().string(); });

// A table without a case contains something that nobody has checked.
TEST(Golden, HasACaseForEachTable) {
    std::set<const ElementTable*> seen;
    for (const auto& path : goldenFiles()) {
        for (const Case& given : casesOf(path)) {
            if (!given.frame)
                seen.insert(elementTable(given.codeset, given.octets.at(0), given.variant, given.ofService));
        }
    }
    for (const auto& [name, variant] : variantNames) {
        for (unsigned key = 0; key < 2U * 8U * 256U; ++key) {
            const auto* const table =
                elementTable(static_cast<std::uint8_t>(key / 256 % 8), static_cast<std::uint8_t>(key % 256),
                             variant, key >= 2048);
            if (table != nullptr) {
                EXPECT_TRUE(seen.contains(table)) << table->name << " on " << name;
            }
        }
    }
}

}  // namespace

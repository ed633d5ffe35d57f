// The table of message types in docs/internals/object-layer.md is the code's own. UPDATE_GOLDEN=1 writes it.
#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <sstream>

#include "tests/vela/families.h"

namespace {

template <typename T>
std::string textOf(const T& value) {
    std::ostringstream out;
    out << value;
    return out.str();
}

// "Parms [Parm, Val]": a list of bodies names their fields too.
template <typename FieldType>
std::string labelOf(const FieldType& field);

template <typename BodyType>
std::string labelsOf() {
    std::string text;
    const auto add = [&text](const std::string& label) { text += (text.empty() ? "" : ", ") + label; };
    BodyType body;
    std::apply([&](const auto&... field) { (add(labelOf(field)), ...); }, body.fields());
    return text;
}

template <typename FieldType>
std::string labelOf(const FieldType& field) {
    std::string text = field.label();
    if constexpr (requires { field.value()[0].fields(); }) {
        using Entry = std::remove_cvref_t<decltype(field.value()[0])>;
        if constexpr (!std::is_same_v<Entry, vela::CompAttr_t>)
            text += " [" + labelsOf<Entry>() + "]";
    }
    return text;
}

std::string codeOf(unsigned int code) {
    std::ostringstream out;
    out << code;
    if (code >= 0x800000)
        out << " (0x" << std::hex << std::uppercase << code << ")";
    return out.str();
}

template <typename BodyType>
std::string rowOf() {
    const std::string labels = labelsOf<BodyType>();
    const unsigned int* const reply = replyCode<BodyType>();
    return "| " + codeOf(BodyType::code) + " | `" + nameOf<BodyType>() + "` | " +
           (labels.empty() ? "none" : labels) + " | " + (reply == nullptr ? "" : codeOf(*reply) + " ") +
           "|\n";
}

std::string tables() {
    std::string text;
    forEachFamily([&]<typename Table>(const char*, const char* title) {
        text += std::string("\n### ") + title + "\n\n| Code | Body | Fields | Reply |\n|---|---|---|---|\n";
        Table::forEach([&]<typename BodyType>() { text += rowOf<BodyType>(); });
    });
    return text + "\n";
}

TEST(MessageTypes, StandInTheDocumentAsTheyStandInTheCode) {
    const std::string path = LAPDMON_SOURCE_DIR "/docs/internals/object-layer.md";
    const std::string begin = "<!-- message types: written by tests/vela/message_types_test.cc -->\n";
    const std::string end = "<!-- end of the message types -->\n";
    std::string document = textOf(std::ifstream(path).rdbuf());
    const std::size_t from = document.find(begin), to = document.find(end);
    ASSERT_NE(from, std::string::npos);
    ASSERT_NE(to, std::string::npos);
    const std::size_t start = from + begin.size();
    const std::string written = document.substr(start, to - start);
    if (std::getenv("UPDATE_GOLDEN") != nullptr)
        std::ofstream(path) << document.replace(start, to - start, tables());
    EXPECT_EQ(written, tables());
}

}  // namespace

#include "fleet/metrics/Exposition.h"

#include <array>
#include <charconv>

namespace fleet {

namespace {

void appendEscaped(std::string_view value, std::string& to) {
    for (const char c : value) {
        if (c == '\n') {
            to += "\\n";
            continue;
        }
        if (c == '"' || c == '\\')
            to += '\\';
        to += c;
    }
}

}  // namespace

void Exposition::family(std::string_view name, Type type, std::string_view help) {
    name_ = name;
    text_.append("# HELP ").append(name).append(" ").append(help).append("\n# TYPE ").append(name);
    text_ += type == Type::counter ? " counter\n" : " gauge\n";
}

void Exposition::sample(Labels labels, double value) {
    std::array<char, 32> digits{};
    const auto written = std::to_chars(digits.data(), digits.data() + digits.size(), value);
    add(labels, {digits.data(), static_cast<std::size_t>(written.ptr - digits.data())});
}

void Exposition::add(Labels labels, std::string_view value) {
    text_ += name_;
    char before = '{';
    for (const auto& [label, text] : labels) {
        text_ += before;
        text_.append(label).append("=\"");
        appendEscaped(text, text_);
        text_ += '"';
        before = ',';
    }
    text_ += before == '{' ? " " : "} ";
    text_.append(value).append("\n");
}

}  // namespace fleet

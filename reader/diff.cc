#include "reader/diff.h"

#include <algorithm>
#include <filesystem>
#include <map>
#include <optional>
#include <set>
#include <utility>

#include "reader/Analysed.h"
#include "reader/Comparison.h"
#include "reader/errors.h"
#include "reader/inputs.h"
#include "reader/json.h"
#include "reader/session.h"
#include "reader/text.h"

namespace reader {

namespace {

constexpr std::size_t mostMessages = 50'000;

// A file, or one call in a file: "day.pcapng#3" is the call that `lapdread calls day.pcapng` numbers 3. With
// a store, the name of a D channel stands for the file; "#3" alone means those that --trunk and --site
// choose.
struct Operand {
    std::string name;
    std::optional<std::uint64_t> call;
    Options options;  // that read it, and nothing else

    std::string shown() const { return name.empty() ? inputNames(options).front() : name; }
};

Operand operandOf(const std::string& word, const Options& options) {
    const bool isFile = options.input.store.empty();
    const std::size_t mark = word.rfind('#');
    std::uint64_t number = 0;
    Operand operand{word, std::nullopt, options};
    if (mark != std::string::npos && readNumber(std::string_view(word).substr(mark + 1), number) &&
        !(isFile && std::filesystem::exists(word)))
        operand = {word.substr(0, mark), number, options};
    operand.options.words.clear();
    operand.options.input.files.clear();
    if (isFile)
        operand.options.input.files = {operand.name};
    else if (!operand.name.empty())
        operand.options.input.trunk = operand.name;
    return operand;
}

std::vector<std::string> wordsOf(const Options& options) {
    if (options.input.store.empty())
        return inputFiles(options);
    std::vector<std::string> words = options.input.files;
    words.insert(words.end(), options.words.begin(), options.words.end());
    return words;
}

class MessageTaker : public Analysed {
  public:
    explicit MessageTaker(const Operand& operand)
        : Analysed(operand.options), also_(operand.options.compareAlso), operand_(operand) {}

    void flush() override {}
    // The messages to compare, those of a call together, in the order in which the calls began. How the calls
    // of a trunk mingle differs from day to day, and says nothing. Called after the end of the trace.
    std::vector<ComparedMessage> messages() {
        std::map<std::uint64_t, std::size_t> begun;  // by call: where its first message stands
        std::vector<std::pair<std::size_t, std::size_t>> order;
        for (std::size_t i = 0; i < messages_.size(); ++i) {
            if (!unwanted_.contains(calls_[i]))
                order.emplace_back(calls_[i] == 0 ? i : begun.try_emplace(calls_[i], i).first->second, i);
        }
        std::sort(order.begin(), order.end());
        std::vector<ComparedMessage> wanted;
        wanted.reserve(order.size());
        for (const auto& [first, i] : order)
            wanted.push_back(std::move(messages_[i]));
        return wanted;
    }

  private:
    void heard(const calls::Message& message, const calls::Call* call) override {
        Analysed::heard(message, call);
        const std::optional<bool> wanted = isWanted(message, call);
        const bool isOther = operand_.call && (call == nullptr || call->number != *operand_.call);
        if (isOther || !wanted.value_or(true))
            return;
        if (messages_.size() >= mostMessages)
            throw UsageError(operand_.shown() + " holds more than " + std::to_string(mostMessages) +
                             " messages; filters choose some");
        if (messages_.empty())
            first_ = message.at;
        messages_.push_back(comparedMessage(message, first_, also_));
        calls_.push_back(call == nullptr ? 0 : call->number);
        if (!wanted)
            undecided_.insert(call->number);
    }
    void gone(const calls::Call& call) override {
        if (undecided_.erase(call.number) != 0 && !isWanted(call))
            unwanted_.insert(call.number);
        Analysed::gone(call);
    }

    const CompareAlso& also_;
    const Operand& operand_;
    std::vector<ComparedMessage> messages_;
    std::vector<std::uint64_t> calls_;   // by message: the number of its call, or 0
    std::set<std::uint64_t> undecided_;  // calls that are alive; only their end tells whether they are wanted
    std::set<std::uint64_t> unwanted_;   // calls that turned out not to be wanted
    std::int64_t first_ = 0;
};

std::vector<ComparedMessage> messagesOf(const Operand& operand, Chatter& chatter) {
    Session session(operand.options, chatter);
    MessageTaker taker(operand);
    taker.run(session, chatter);
    std::vector<ComparedMessage> messages = taker.messages();
    if (operand.call && messages.empty())
        throw UsageError(operand.shown() + " has no message of a call " + std::to_string(*operand.call));
    return messages;
}

std::string headOf(const Operand& operand, std::size_t messages) {
    std::string words = safe(operand.shown());
    if (operand.call)
        words += ", call " + std::to_string(*operand.call);
    return words + ": " + std::to_string(messages) + (messages == 1 ? " message" : " messages");
}

std::string valueOr(const std::string& value) { return value.empty() ? "absent" : safe(value); }

void appendText(std::string& to, const Difference& difference, const Difference* before) {
    const bool isSame = before != nullptr && before->frameA == difference.frameA &&
                        before->frameB == difference.frameB && before->kind != Difference::Kind::message;
    const std::string name = safe(difference.message) + " " + difference.direction;
    if (difference.kind == Difference::Kind::message) {
        const bool isA = difference.frameA != 0;
        to += std::string("only in ") + (isA ? "A" : "B") + ": " + name + " (frame " +
              std::to_string(isA ? difference.frameA : difference.frameB) + ")\n";
        return;
    }
    if (!isSame)
        to += name + " (frame " + std::to_string(difference.frameA) + " in A, " +
              std::to_string(difference.frameB) + " in B)\n";
    to += "    ";
    if (difference.kind == Difference::Kind::element) {
        const bool isA = !difference.a.empty();
        const std::string& words = isA ? difference.a : difference.b;
        to += std::string("only in ") + (isA ? "A" : "B") + ": " + safe(difference.element) +
              (words == difference.element ? "" : ": " + safe(words)) + "\n";
        return;
    }
    if (difference.kind == Difference::Kind::time)
        to += "time since the first message";
    else if (difference.element.empty())
        to += difference.field;
    else
        to += safe(difference.element) + ", " + difference.field;
    to += ": " + valueOr(difference.a) + " in A, " + valueOr(difference.b) + " in B\n";
}

void appendJson(std::string& to, const Difference& difference) {
    constexpr std::string_view kinds[] = {"message", "element", "field", "time"};
    const auto put = [&](std::string_view key, std::string_view value) {
        to += ',';
        appendJsonString(to, key);
        to += ':';
        if (value.empty())
            to += "null";
        else
            appendJsonString(to, value);
    };
    const auto putFrame = [&](std::string_view key, std::uint64_t frame) {
        to += ',';
        appendJsonString(to, key);
        to += ':' + (frame == 0 ? std::string("null") : std::to_string(frame));
    };
    to += "{\"v\":";
    appendNumber(to, jsonVersion);
    put("difference", kinds[static_cast<std::size_t>(difference.kind)]);
    put("message", difference.message);
    put("dir", difference.direction);
    putFrame("frame_a", difference.frameA);
    putFrame("frame_b", difference.frameB);
    put("element", difference.element);
    put("field", difference.field);
    put("a", difference.a);
    put("b", difference.b);
    to += "}\n";
}

std::string summaryOf(const Comparison& comparison) {
    return std::to_string(comparison.alike) + " alike, " + std::to_string(comparison.differ) + " differ, " +
           std::to_string(comparison.onlyA) + " only in A, " + std::to_string(comparison.onlyB) +
           " only in B\n";
}

}  // namespace

std::span<const OptionRow> diffOptions() {
    static const OptionRow rows[] = {
        {"--with", "reference,channel,time",
         "Compare call references and TEIs, numbers of channels, or times as well",
         [](Options& to, const std::string& value) {
             for (const std::string& word : splitAtCommas(value))
                 to.compareAlso.*chosen<bool CompareAlso::*>(word, {{"reference", &CompareAlso::references},
                                                                    {"channel", &CompareAlso::channels},
                                                                    {"time", &CompareAlso::times}}) = true;
         }},
        {"--jsonl", "", "A JSON object a difference",
         [](Options& to, const std::string&) { to.calls.form = CallForm::jsonLines; }},
        {"--fail-on-difference", "", "Exit status 3 if there is a difference",
         [](Options& to, const std::string&) { to.failOnDifference = true; }},
    };
    return rows;
}

int runDiff(const Options& options, Chatter& chatter) {
    const std::vector<std::string> words = wordsOf(options);
    const bool isPipeTwice = words.size() == 2 && words[0] == "-" && words[1] == "-";
    if (words.size() != 2 || options.input.follow || isPipeTwice)
        throw UsageError(options.input.store.empty()
                             ? "diff takes two files, or calls of files: lapdread diff A#3 B#7"
                             : "diff takes two D channels of a store, or calls of them: lapdread diff "
                               "--store URL pri1#3 pri2#7");
    const Operand a = operandOf(words[0], options), b = operandOf(words[1], options);
    const std::vector<ComparedMessage> messagesA = messagesOf(a, chatter);
    const std::vector<ComparedMessage> messagesB = messagesOf(b, chatter);
    const Comparison comparison = compare(messagesA, messagesB, options.compareAlso);
    const bool isText = options.calls.form == CallForm::text;
    std::string text;
    if (isText)
        text = "A  " + headOf(a, messagesA.size()) + "\nB  " + headOf(b, messagesB.size()) + "\n\n";
    const Difference* before = nullptr;
    for (const Difference& difference : comparison.differences) {
        if (isText)
            appendText(text, difference, before);
        else
            appendJson(text, difference);
        before = &difference;
    }
    if (isText)
        text += summaryOf(comparison);
    Options outputs = a.options;
    if (options.input.store.empty())
        outputs.input.files = {a.name, b.name};
    Session session(outputs, chatter);
    session.output().write(text);
    session.output().flush();
    return options.failOnDifference && !comparison.same() ? found : good;
}

}  // namespace reader

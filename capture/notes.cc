#include "capture/notes.h"

#include <algorithm>
#include <array>
#include <charconv>

namespace capture {

namespace {

using Kind = Item::Kind;

// How the note of an item begins, and what follows these words.
struct Wording {
    Kind kind;
    std::string_view words;
    enum class Rest { nothing, count, variant, text } rest;
};

// clang-format off
constexpr std::array wordings{
    Wording{Kind::lost,      "Frames Lost: ",     Wording::Rest::count},
    Wording{Kind::notQueued, "Enqueue Failed",    Wording::Rest::nothing},
    Wording{Kind::notTaken,  "Get iemsg failed",  Wording::Rest::nothing},
    Wording{Kind::dropped,   "packets dropped: ", Wording::Rest::count},
    Wording{Kind::run,       "head ",             Wording::Rest::variant},
    Wording{Kind::restart,   "restart",           Wording::Rest::nothing},
    Wording{Kind::replaced,  "replaced",          Wording::Rest::nothing},
    Wording{Kind::cut,       "cut: ",             Wording::Rest::text},
    Wording{Kind::mixed,     "mixed: ",           Wording::Rest::text},
    Wording{Kind::unproved,  "unproved: ",        Wording::Rest::text},
    Wording{Kind::damaged,   "damaged: ",         Wording::Rest::text},
};
// clang-format on
constexpr std::string_view oversized = "Oversized frame";
constexpr std::string_view ticksWord = "ticks ";
constexpr std::string_view writtenWord = "written ";
constexpr std::string_view description = "KV9 D channel";
constexpr std::string_view variantWord = ", variant ";
// Seconds around 1970 whose nanoseconds fit into 64 bits; those of the year 2199 do.
constexpr std::int64_t inReach = 7'258'118'399;
constexpr std::string_view noVariant = "of no known variant";

// Takes `words` off the front.
bool takes(std::string_view& text, std::string_view words) {
    if (!text.starts_with(words))
        return false;
    text.remove_prefix(words.size());
    return true;
}

template <typename Number>
bool takesNumber(std::string_view& text, Number& number) {
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    if (error != std::errc())
        return false;
    text.remove_prefix(static_cast<std::size_t>(end - text.data()));
    return true;
}

bool readRest(Wording::Rest rest, std::string_view text, Note& note) {
    switch (rest) {
        case Wording::Rest::count:
            return takesNumber(text, note.item.count) && text.empty();
        case Wording::Rest::variant:
            note.variant = variantNamed(text);
            return note.variant != Variant::unknown || text == noVariant;
        case Wording::Rest::text:
            note.item.text = text;
            return true;
        case Wording::Rest::nothing:
            break;
    }
    return text.empty();
}

bool readItem(std::string_view text, Note& note) {
    return std::any_of(wordings.begin(), wordings.end(), [&](const Wording& wording) {
        std::string_view rest = text;
        if (!takes(rest, wording.words) || !readRest(wording.rest, rest, note))
            return false;
        note.kind = Note::Kind::item;
        note.item.kind = wording.kind;
        return true;
    });
}

bool readFrame(std::string_view text, Note& note) {
    std::uint32_t ticks = 0;
    std::int64_t written = 0;
    if (takes(text, ticksWord)) {
        if (!takesNumber(text, ticks) || !(text.empty() || takes(text, " ")))
            return false;
        note.ticks = ticks;
    }
    if (takes(text, writtenWord)) {
        if (!takesNumber(text, written) || written < -inReach || inReach < written)
            return false;
        note.written = written;
    }
    note.kind = Note::Kind::frame;
    return text.empty() && (note.ticks || note.written);
}

}  // namespace

std::string noteOfFrame(const Frame& frame) {
    std::string note;
    if (frame.ticks)
        note += std::string(ticksWord) + std::to_string(*frame.ticks);
    if (frame.written)
        note += (note.empty() ? "" : " ") + std::string(writtenWord) + std::to_string(*frame.written);
    return note.empty() ? note : std::string(notePrefix) + note;
}

std::string noteOf(const Item& item) {
    if (item.kind == Kind::oversized)
        return std::string(notePrefix) + std::string(oversized);
    const auto* const wording = std::find_if(wordings.begin(), wordings.end(),
                                             [&](const Wording& known) { return known.kind == item.kind; });
    if (wording == wordings.end())
        return std::string(item.text);  // a comment of the capture's author
    std::string note = std::string(notePrefix) + std::string(wording->words);
    if (wording->rest == Wording::Rest::count)
        note += std::to_string(item.count);
    if (wording->rest == Wording::Rest::text)
        note += item.text;
    if (wording->rest == Wording::Rest::variant) {
        const Variant variant =
            item.frame.interface != nullptr ? item.frame.interface->variant : Variant::unknown;
        note += variant == Variant::unknown ? noVariant : variantName(variant);
    }
    return note;
}

Note noteIn(std::string_view comment) {
    Note note;
    note.item.kind = Kind::comment;
    note.item.text = comment;
    std::string_view text = comment;
    if (!takes(text, notePrefix))
        return note;
    Note read;
    if (text == oversized) {
        note.kind = Note::Kind::oversized;
        return note;
    }
    return readFrame(text, read) || readItem(text, read = {}) ? read : note;
}

std::string descriptionOf(Variant variant) {
    return std::string(description) +
           (variant == Variant::unknown ? "" : std::string(variantWord) + std::string(variantName(variant)));
}

Variant variantIn(std::string_view text) {
    const std::size_t at = text.rfind(variantWord);
    return at == std::string_view::npos ? Variant::unknown
                                        : variantNamed(text.substr(at + variantWord.size()));
}

}  // namespace capture

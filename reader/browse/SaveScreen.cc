#include "reader/browse/SaveScreen.h"

#include <array>
#include <filesystem>

#include "reader/LadderText.h"
#include "reader/text.h"

namespace reader::browse {

namespace {

constexpr std::array hints{
    KeyHint{"Enter", "save", "Writes the file."},
    KeyHint{"Tab", "path or redact",
            "Goes from the file's name to the question whether to redact, and back."},
    KeyHint{"Space", "yes or no", "Answers the question."},
    KeyHint{"Esc", "cancel", "Writes nothing."},
};

std::string countOf(std::size_t count, std::string_view what) {
    return std::to_string(count) + " " + std::string(what) + (count == 1 ? "" : "s");
}

}  // namespace

SaveScreen::SaveScreen(Desk& desk, const Marked& otherwise)
    : Screen(desk), chosen_(desk.marked().empty() ? otherwise : desk.marked()) {
    frames_ = chosen_.frames;
    for (const std::uint64_t call : chosen_.calls) {
        for (const CallFrame& frame : trace().framesOf(call))
            frames_.insert(frame.frame);
    }
    std::string path = "frames.pcapng";
    if (chosen_.calls.size() == 1 && chosen_.frames.empty())
        path = "call-" + std::to_string(*chosen_.calls.begin()) + ".pcapng";
    else if (!chosen_.calls.empty())
        path = "calls.pcapng";
    path_.set(path);
}

std::span<const KeyHint> SaveScreen::keys() const { return hints; }

void SaveScreen::draw(Canvas& canvas, const Area& area) {
    std::string what = countOf(frames_.size(), "frame");
    if (!chosen_.calls.empty())
        what += " of " + countOf(chosen_.calls.size(), "call");
    what += frames_.size() == 1 ? " goes" : " go";
    what += " into a pcapng file, which Wireshark opens.";
    const auto width = static_cast<std::size_t>(area.width);
    int y = area.y;
    for (const std::string& line : wrapped({what}, width))
        canvas.put(area.x, y++, line);
    ++y;
    constexpr std::string_view label = "File:   ";
    const auto room = static_cast<std::size_t>(std::max(area.width - static_cast<int>(label.size()) - 1, 1));
    std::string path = path_.text();
    if (path.size() > room)
        path = path.substr(path.size() - room);
    const int x = canvas.put(area.x, y, label, {Ink::title, isOnPath_});
    canvas.put(x, y++, path + (isOnPath_ ? "_" : ""), {Ink::plain, false, isOnPath_});
    canvas.put(area.x, y, "Redact: ", {Ink::title, !isOnPath_});
    canvas.put(x, y++, redacted_ ? "yes" : "no ", {Ink::plain, false, !isOnPath_});
    ++y;
    const std::string_view meaning =
        redacted_ ? "Numbers, names and user data are replaced by pseudonyms, as `lapdread redact` does it."
                  : "Numbers, names and user data stay as they are.";
    for (const std::string& line : wrapped({std::string(meaning)}, width))
        canvas.put(area.x, y++, line);
    for (const std::string& line : wrapped({complaint_}, width))
        canvas.put(area.x, y++, line, {Ink::error, true});
}

bool SaveScreen::press(const Key& key) {
    switch (key.code) {
        case Key::Code::tab:
        case Key::Code::backTab:
        case Key::Code::up:
        case Key::Code::down:
            isOnPath_ = !isOnPath_;
            return true;
        case Key::Code::escape:
            desk().close();
            return true;
        case Key::Code::enter:
            save();
            return true;
        default:
            break;
    }
    if (!isOnPath_) {
        if (key.is(U' ') || key.is(U'y') || key.is(U'n'))
            redacted_ = key.is(U' ') ? !redacted_ : key.is(U'y');
        return true;
    }
    if (path_.press(key)) {
        mayReplace_ = false;
        complaint_.clear();
    }
    return true;
}

void SaveScreen::save() {
    if (frames_.empty()) {
        complaint_ = "None of these frames is in memory any more.";
        return;
    }
    if (path_.text().empty()) {
        complaint_ = "The file needs a name.";
        return;
    }
    std::error_code ignored;
    if (std::filesystem::exists(path_.text(), ignored) && !mayReplace_) {
        complaint_ = safe(path_.text()) + " exists. Press Enter again to write over it.";
        mayReplace_ = true;
        return;
    }
    desk().save({path_.text(), frames_, redacted_});
    desk().close();
}

}  // namespace reader::browse

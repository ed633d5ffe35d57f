#include "Stage.h"

#include <clocale>
#include <map>
#include <sstream>
#include <stdexcept>

namespace reader::browse::testing {

namespace {

const std::map<std::string, Key, std::less<>> names{
    {"Up", {Key::Code::up}},       {"Down", {Key::Code::down}},    {"Left", {Key::Code::left}},
    {"Right", {Key::Code::right}}, {"PgUp", {Key::Code::pageUp}},  {"PgDn", {Key::Code::pageDown}},
    {"Home", {Key::Code::home}},   {"End", {Key::Code::end}},      {"Enter", {Key::Code::enter}},
    {"Esc", {Key::Code::escape}},  {"Tab", {Key::Code::tab}},      {"BTab", {Key::Code::backTab}},
    {"F1", {Key::Code::help}},     {"BS", {Key::Code::backspace}}, {"Space", {Key::Code::character, U' '}},
};

std::string inTree(const std::string& file) {
    return file.starts_with('/') ? file : LAPDMON_SOURCE_DIR "/" + file;
}

}  // namespace

Stage::Stage(const std::string& file, bool utf8, Options options)
    : options_(std::move(options)),
      // Whatever is put is taken at once, on this thread.
      queue_([this] {
          while (auto update = queue_.take())
              browser_->apply(std::move(*update));
      }) {
    std::setlocale(LC_CTYPE, "C.UTF-8");
    useTimeZone("UTC");
    options_.input.files = {inTree(file)};
    Browser::Settings settings;
    settings.source = file;
    settings.utf8 = utf8;
    settings.mostItems = options_.browse.frames;
    settings.save = [this](const FrameStore&, const SaveOrder& order) { saved_.push_back(order); };
    browser_ = std::make_unique<Browser>(std::move(settings));
    collector_ = std::make_unique<Collector>(options_, queue_);
    Session session(options_, quiet_);
    collector_->run(session, quiet_);
    collector_->finish("");
    settle();
    drawn(80, 24);
}

void Stage::settle() {
    while (browser_->work(Screen::Clock::now())) {
    }
}

void Stage::press(const Key& key) {
    browser_->press(key);
    settle();
    // Cursors learn the size of the screen when it is drawn.
    drawn(80, 24);
}

void Stage::press(std::string_view words) {
    std::istringstream stream{std::string(words)};
    for (std::string word; stream >> word;) {
        if (const auto named = names.find(word); named != names.end()) {
            press(named->second);
            continue;
        }
        for (const char letter : word)
            press(Key{Key::Code::character, static_cast<char32_t>(letter)});
    }
}

Canvas Stage::drawn(int width, int height) {
    Canvas canvas(width, height);
    browser_->draw(canvas);
    return canvas;
}

std::string Stage::screen(int width, int height) {
    const Canvas canvas = drawn(width, height);
    std::string text;
    for (int y = 0; y < height; ++y)
        text += canvas.line(y) + "\n";
    return text;
}

}  // namespace reader::browse::testing

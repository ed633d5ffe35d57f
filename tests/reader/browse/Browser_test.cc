// What keys, the mouse and news do, apart from what is drawn.
#include "reader/browse/Browser.h"

#include <gtest/gtest.h>

#include <fstream>
#include <random>
#include <string_view>

#include "Stage.h"

namespace reader::browse {
namespace {

using testing::Stage;

constexpr char net5[] = "examples/net5.pcap";

TEST(Browser, QGoesBackAndEndsTheProgramOnTheFirstScreen) {
    Stage stage(net5);
    stage.press("Enter Enter q q");
    EXPECT_FALSE(stage.browser().isDone());
    EXPECT_EQ(stage.line(1), "Calls: 6");
    stage.press("q");
    EXPECT_TRUE(stage.browser().isDone());
}

TEST(Browser, CapitalQEndsTheProgramFromAnywhere) {
    Stage stage(net5);
    stage.press("Enter Enter Q");
    EXPECT_TRUE(stage.browser().isDone());
}

TEST(Browser, EscapeGoesBackAndNeverEndsTheProgram) {
    Stage stage(net5);
    stage.press("Enter Enter Esc");
    EXPECT_EQ(stage.line(1), "Ladder of call 1");
    stage.press("Esc Esc Esc");
    EXPECT_EQ(stage.line(1), "Calls: 6");
    EXPECT_FALSE(stage.browser().isDone());
}

TEST(Browser, EscapeTakesTheFilterAway) {
    Stage stage(net5);
    stage.press("/busy Enter");
    EXPECT_EQ(stage.line(1), "Calls: 1 of 6   /busy");
    stage.press("Esc");
    EXPECT_EQ(stage.line(1), "Calls: 6");
}

TEST(Browser, LettersAreTextWhileAFilterIsTyped) {
    Stage stage(net5);
    stage.press("/qjk?Q");
    EXPECT_FALSE(stage.browser().isDone());
    EXPECT_EQ(stage.line(1), "Calls: 0 of 6   /qjk?Q_");
    stage.press("BS BS");
    EXPECT_EQ(stage.line(1), "Calls: 0 of 6   /qjk_");
}

TEST(Browser, TabGoesRoundTheScreensInBothDirections) {
    Stage stage(net5);
    stage.press("Tab");
    EXPECT_TRUE(stage.line(1).starts_with("Findings:"));
    stage.press("Tab");
    EXPECT_EQ(stage.line(1), "1 D channel");
    stage.press("BTab BTab");
    EXPECT_EQ(stage.line(1), "Calls: 6");
}

TEST(Browser, AClickOnANameAboveShowsThatScreen) {
    Stage stage(net5);
    stage.screen();
    stage.press(Key{Key::Code::click, 0, 2, 0});
    EXPECT_EQ(stage.line(1), "1 D channel");
    stage.press(Key{Key::Code::click, 0, 18, 0});
    EXPECT_TRUE(stage.line(1).starts_with("Findings:"));
}

TEST(Browser, AClickMovesTheCursorAndTwoOpen) {
    Stage stage(net5);
    stage.screen();
    stage.press(Key{Key::Code::click, 0, 10, 6});  // the fourth call
    EXPECT_EQ(stage.line(6).substr(0, 7), ">     4");
    stage.press(Key{Key::Code::doubleClick, 0, 10, 6});
    EXPECT_EQ(stage.line(1), "Ladder of call 4");
    stage.press(Key{Key::Code::doubleClick, 0, 10, 6});
    EXPECT_TRUE(stage.line(1).starts_with("Frame "));
}

TEST(Browser, AClickBelowTheListDoesNoHarm) {
    Stage stage(net5);
    for (const char* const keys : {"1", "2", "3", "2 Enter", "Enter", "Esc Esc Space Space c"}) {
        stage.press(keys);
        for (int y = 0; y < 30; ++y)
            stage.press(Key{Key::Code::click, 0, 5, y});
    }
    EXPECT_FALSE(stage.browser().isDone());
}

// The calls of a trace that grows.
class Growing : public ::testing::Test {
  protected:
    Growing() : browser_({}) { grow(1, 30); }

    void grow(std::uint64_t from, std::uint64_t to) {
        Update update;
        for (std::uint64_t number = from; number <= to; ++number) {
            calls::Call call;
            call.number = number;
            update.calls.emplace(number, call);
        }
        browser_.apply(std::move(update));
        while (browser_.work(Screen::Clock::time_point::max())) {
        }
    }
    // The number of the call that the cursor is on.
    std::string current() {
        Canvas canvas(80, 24);
        browser_.draw(canvas);
        for (int y = 0; y < canvas.height(); ++y) {
            if (canvas.line(y).starts_with('>'))
                return canvas.line(y).substr(2, 5);
        }
        return "none";
    }

    Browser browser_;
};

TEST_F(Growing, TheCursorStaysOnItsCallWhenCallsCome) {
    current();
    browser_.press({Key::Code::down});
    EXPECT_EQ(current(), "    2");
    grow(31, 60);
    EXPECT_EQ(current(), "    2");
}

TEST_F(Growing, AtTheEndTheCursorGoesOnToCallsThatCome) {
    current();
    browser_.press({Key::Code::end});
    EXPECT_EQ(current(), "   30");
    grow(31, 60);
    EXPECT_EQ(current(), "   60");
    browser_.press({Key::Code::up});
    EXPECT_EQ(current(), "   59");
    grow(61, 90);
    EXPECT_EQ(current(), "   59");
}

TEST(Browser, WhatIsShownOfAFrameCommandsNoTerminal) {
    // A SETUP whose display text clears the screen and sets the title.
    Stage stage("tests/reader/browse/evil.hex");
    for (const char* const keys : {"", "Enter", "Enter", "Down Down Down End", "3", "1", "w"}) {
        stage.press(keys);
        const Canvas canvas = stage.drawn(80, 24);
        for (int y = 0; y < canvas.height(); ++y) {
            for (int x = 0; x < canvas.width(); ++x) {
                const char32_t character = canvas.at(x, y).character;
                ASSERT_TRUE(character >= U' ' && character <= U'~') << keys << ": " << x << ", " << y;
            }
        }
    }
    stage.press("Esc 2 Enter");
    EXPECT_NE(stage.screen().find("\\x1b[2J"), std::string::npos) << stage.screen();
}

TEST(Browser, EveryScreenCanBeDrawnOnATerminalOfAnySize) {
    for (const char* const keys : {"1", "2", "3", "Enter", "Enter Enter", "Space Space c", "w", "?", "/x"}) {
        Stage stage(net5);
        stage.press(keys);
        for (const int width : {1, 2, 3, 10, 39, 40, 79, 200}) {
            for (const int height : {1, 2, 3, 4, 5, 12, 60})
                stage.screen(width, height);
        }
    }
}

TEST(Browser, SurvivesAnyKeysAtAnyMoment) {
    constexpr std::string_view letters = "jkgG123/sSpacwuvlnpa?q !x4";
    constexpr int codes = static_cast<int>(Key::Code::wheelDown) + 1;
    for (const char* const file :
         {net5, "tests/reader/browse/evil.hex", "tests/reader/data/night/restart-storm.hex"}) {
        Stage stage(file);
        std::mt19937 random(4711);
        for (int i = 0; i < 1500; ++i) {
            Key key{static_cast<Key::Code>(random() % codes)};
            if (key.code == Key::Code::character)
                key.character = static_cast<char32_t>(letters[random() % letters.size()]);
            key.x = static_cast<int>(random() % 90);
            key.y = static_cast<int>(random() % 30);
            stage.browser().press(key);
            stage.drawn(1 + static_cast<int>(random() % 100), 1 + static_cast<int>(random() % 40));
        }
    }
}

TEST(Browser, FramesThatAreLetGoAreSaidToBeGone) {
    Options options;
    options.browse.frames = 20;
    Stage stage(net5, false, options);
    // Whole pages go; this one is small.
    EXPECT_NE(stage.line(0).find("102 frames"), std::string::npos);
    Update update;
    auto page = std::make_shared<Page>();
    for (std::uint64_t number = 103; number <= 800; ++number) {
        capture::Item item;
        Seen seen;
        seen.item = &item;
        seen.number = number;
        page->add(seen, nullptr, "");
    }
    update.page = page;
    update.state = Update::State::live;
    stage.browser().apply(std::move(update));
    EXPECT_NE(stage.line(0).find("live, 800 frames, the first 102 gone"), std::string::npos) << stage.line(0);
    // Calls go with their last frame.
    stage.press("Home");
    EXPECT_EQ(stage.line(1), "Calls: 0");
    EXPECT_EQ(stage.line(23), "what came before frame 103 is not in memory any more: --frames N keeps more");
    EXPECT_EQ(stage.drawn(50, 24).line(0), " Trunk [Calls] Findings  800, 102 gone");
}

TEST(Browser, ALadderSaysHowManyOfItsMessagesAreGone) {
    // A call that outlives very many polls.
    const std::string path = ::testing::TempDir() + "long-call.hex";
    std::ofstream file(path);
    file << "RX 2026-11-21T11:00:00Z 02010000080200010504038090a31803a98381\n"
            "TX 2026-11-21T11:00:01Z 000100020802800102"
            "1803a98381\n"
            "TX 2026-11-21T11:00:02Z 0001020208028001"
            "07\n";
    for (int i = 0; i < 1200; ++i)
        file << "RX 2026-11-21T11:00:03Z 02010105\n";
    file << "RX 2026-11-21T11:00:09Z 0201020608020001450802"
            "8090\n";
    file.close();
    Options options;
    options.browse.frames = 20;
    Stage stage(path, false, options);
    stage.press("Enter");
    const std::string screen = stage.screen();
    EXPECT_NE(screen.find("| messages before this,  |"), std::string::npos) << screen;
    EXPECT_NE(screen.find("| more: 3                |"), std::string::npos) << screen;
    EXPECT_NE(screen.find("DISCONNECT"), std::string::npos) << screen;
    EXPECT_EQ(screen.find("SETUP"), std::string::npos) << screen;
}

TEST(Browser, CallsThatWereLetGoAreCounted) {
    Browser browser({});
    Update update;
    update.callsDropped = 7;
    browser.apply(std::move(update));
    Canvas canvas(80, 24);
    browser.draw(canvas);
    EXPECT_EQ(canvas.line(1), "Calls: 0, let go before their end, since too many were alive: 7");
}

TEST(Browser, FiltersOfTheCommandLineChooseCallsAndFindings) {
    Options options;
    options.filters = {{"failed", "", false}};
    Stage stage(net5, false, options);
    const std::string failed = stage.line(1);
    EXPECT_NE(failed, "Calls: 6");
    options.filters = {{"number", "4021", false}};
    Stage byNumber(net5, false, options);
    EXPECT_EQ(byNumber.line(1), "Calls: 2");
}

TEST(Browser, ALaddersMessagesAreThoseOfTheCommandLine) {
    Stage stage("tests/reader/data/traps/segments.hex");
    stage.press("Enter");
    EXPECT_EQ(stage.screen().find("not in memory"), std::string::npos);
}

}  // namespace
}  // namespace reader::browse

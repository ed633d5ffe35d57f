#include "app/guarded.h"

#include <gtest/gtest.h>

#include <stdexcept>

#include "tests/app/channels.h"

namespace app {
namespace {

struct Foreign {};

TEST(Guarded, SaysNothingOfABodyThatReturns) {
    const testing::Screen screen;
    bool ran = false;
    guarded(749, [&] { ran = true; });
    EXPECT_TRUE(ran);
    EXPECT_EQ(screen.text(), "");
}

TEST(Guarded, ReportsALayersExceptionByItsOwnWordsAndThrowsItOn) {
    const testing::Screen screen;
    EXPECT_THROW(guarded(749, [] { throw vela::Exception("the board is on fire"); }), vela::Exception);
    EXPECT_EQ(screen.text(), "vela Exception caught\nthe board is on fire\n");
}

TEST(Guarded, ReportsADerivedExceptionByItsOwnWords) {
    struct Derived : vela::Exception {
        void toStream(std::ostream* out) const override { *out << "derived " << 1001; }
    };
    const testing::Screen screen;
    EXPECT_THROW(guarded(100, [] { throw Derived(); }), Derived);
    EXPECT_EQ(screen.text(), "vela Exception caught\nderived 1001\n");
}

TEST(Guarded, ReportsAThrownMessageAndDoesNotThrowItOn) {
    const testing::Screen screen;
    guarded(749, [] {
        auto msg = std::make_unique<vela::Msg>(2U);
        msg->setMsgType(0x1A);
        msg->setTrans(10001);
        msg->setSrcAddr(vela::CompDesc_t(5, 1, 2, 3, 4));
        msg->setTgtAddr(vela::CompDesc_t(10, 6, 7, 8, 9));
        throw msg.release();  // NOLINT(cert-err*): that is what is caught
    });
    EXPECT_EQ(screen.text(),
              "message caught\n"
              "{MsgType: 0x1a Source: {Node 0x4 Board 0x1 Processor 0x2 Component 0x3 Instance 0x5}"
              " Target: {Node 0x9 Board 0x6 Processor 0x7 Component 0x8 Instance 0xa}"
              " Size: 2 Trans: 10001 Body: {ByteData {0 0 }}}\n");
}

TEST(Guarded, ReportsAnythingElseByItsPlaceAndThrowsItOn) {
    for (const int place : {100, 215, 749}) {
        const testing::Screen screen;
        EXPECT_THROW(guarded(place, [] { throw std::runtime_error("private"); }), std::runtime_error);
        EXPECT_THROW(guarded(place, [] { throw Foreign(); }), Foreign);
        const std::string report = "general Exception caught in lapdmon(" + std::to_string(place) + ")\n";
        EXPECT_EQ(screen.text(), report + report);
    }
}

}  // namespace
}  // namespace app

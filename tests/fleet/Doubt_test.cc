#include "fleet/ship/Doubt.h"

#include <gtest/gtest.h>

#include "Recordings.h"

namespace {

using namespace std::chrono_literals;
using fleet::Doubt;

class DoubtTest : public testing::Test {
  protected:
    Doubt doubt() const { return {folder_.file("server"), 30s}; }

    fleet_tests::Folder folder_;
    Doubt::Clock::time_point now_{1h};
};

TEST_F(DoubtTest, TheFirstServerEverIsTrusted) {
    Doubt doubt = this->doubt();
    doubt.connectedTo("A", now_);
    EXPECT_FALSE(doubt.exists());
    EXPECT_FALSE(doubt.isCalm(now_ + 1h));
}

TEST_F(DoubtTest, AnotherProcessIsDoubtedUntilItIsOver) {
    Doubt doubt = this->doubt();
    doubt.connectedTo("A", now_);
    doubt.connectedTo("B", now_);
    EXPECT_TRUE(doubt.exists());
    EXPECT_FALSE(doubt.isCalm(now_ + 29s));
    EXPECT_TRUE(doubt.isCalm(now_ + 30s));
    doubt.end();
    EXPECT_FALSE(doubt.exists());
    doubt.connectedTo("B", now_);
    doubt.connectedTo("", now_);
    doubt.connectedTo("B", now_);
    EXPECT_FALSE(doubt.exists());
}

TEST_F(DoubtTest, EachTroubleBeginsTheCalmAnew) {
    Doubt doubt = this->doubt();
    doubt.raise(now_);
    doubt.raise(now_ + 20s);
    EXPECT_FALSE(doubt.isCalm(now_ + 49s));
    EXPECT_TRUE(doubt.isCalm(now_ + 50s));
}

TEST_F(DoubtTest, AShipperThatIsStartedAnewKnowsTheServer) {
    doubt().connectedTo("A", now_);
    Doubt second = doubt();
    second.connectedTo("A", now_);
    EXPECT_FALSE(second.exists());
    second.connectedTo("B", now_);
    EXPECT_TRUE(second.exists());
    Doubt third = doubt();
    third.connectedTo("B", now_);
    EXPECT_TRUE(third.exists()) << "the second one has not gone back";
    third.end();
    Doubt fourth = doubt();
    fourth.connectedTo("B", now_);
    EXPECT_FALSE(fourth.exists());
}

TEST_F(DoubtTest, AFileThatCannotBeWrittenMeansThatEachShipperTrustsItsFirstServer) {
    Doubt doubt("/no/such/folder/server", 30s);
    doubt.connectedTo("A", now_);
    EXPECT_FALSE(doubt.exists());
    doubt.connectedTo("B", now_);
    EXPECT_TRUE(doubt.exists());
}

}  // namespace

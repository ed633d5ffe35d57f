#include "hostsvc/KSSleep.h"

#include <gmock/gmock.h>

#include "tests/support/test_system.h"

namespace {

using testing::ElementsAre;

TEST(KSSleep, SecondsGoToTheLongSleep) {
    SleeplessSystem system;
    ks_sleep(6);
    EXPECT_THAT(system.sleeps(), ElementsAre(6));
    EXPECT_THAT(system.naps(), testing::IsEmpty());
}

TEST(KSSleep, MillisecondsAndMicrosecondsGoToTheShortOne) {
    SleeplessSystem system;
    ks_sleep_ms(15);
    ks_sleep_us(2500001);
    ks_sleep_us(0);
    EXPECT_THAT(system.naps(), ElementsAre(15000, 2500001, 0));
}

TEST(KSSleep, AShortSleepIsSplitIntoSecondsAndMicroseconds) {
    class Split : public KSSystem {
      public:
        Split() { ks_useSystem(this); }
        ~Split() override { ks_useSystem(nullptr); }
        int waitFor(timeval timeout) override {
            seconds = timeout.tv_sec;
            microseconds = timeout.tv_usec;
            return 0;
        }
        long seconds = 0;
        long microseconds = 0;
    } system;
    ks_sleep_us(3000007);
    EXPECT_EQ(system.seconds, 3);
    EXPECT_EQ(system.microseconds, 7);
}

TEST(KSSleep, MillisecondsWrapAtThirtyTwoBitsOfMicroseconds) {
    SleeplessSystem system;
    ks_sleep_ms(4294967);
    ks_sleep_ms(4294968);
    EXPECT_THAT(system.naps(), ElementsAre(4294967000, 704));
}

TEST(KSSleep, ASignalEndsAShortSleepAndIsReported) {
    SleeplessSystem system;
    system.napResult = -1;
    testing::internal::CaptureStderr();
    ks_sleep_us(1000);
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "*** sleep_us interupted by signal ***\n");
    EXPECT_THAT(system.naps(), ElementsAre(1000));
}

TEST(KSSleep, TheSystemItselfSleepsWithoutAWord) {
    testing::internal::CaptureStderr();
    ks_sleep_us(1);
    ks_sleep_ms(0);
    ks_sleep(0);
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
}

}  // namespace

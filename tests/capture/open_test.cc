#include "capture/open.h"

#include <gtest/gtest.h>

namespace {

using capture::trunkOf;

TEST(TrunkOf, IsTheFileNameWithoutItsFolderAndEnding) {
    EXPECT_EQ(trunkOf("pri1.log"), "pri1");
    EXPECT_EQ(trunkOf("/var/log/site.a/pri1.log"), "pri1");
    EXPECT_EQ(trunkOf("a.b.pcap"), "a.b");
    EXPECT_EQ(trunkOf("pri1"), "pri1");
    EXPECT_EQ(trunkOf("day.1"), "day");
    EXPECT_EQ(trunkOf(".log"), ".log");
    EXPECT_EQ(trunkOf(".log.1"), ".log");
    EXPECT_EQ(trunkOf("pri1."), "pri1");
    EXPECT_EQ(trunkOf(""), "");
}

TEST(TrunkOf, IsWithoutTheTimeAtWhichARecordingBegan) {
    EXPECT_EQ(trunkOf("pri1.20261121T112533Z.pcapng"), "pri1");
    EXPECT_EQ(trunkOf("pri1.20261121T112533Z.2.pcapng.part"), "pri1");
}

// A rotated log is one of the same D channel: calls go on from one file to the next.
TEST(TrunkOf, IsWithoutTheNumberOfARotatedFile) {
    EXPECT_EQ(trunkOf("pri1.log.1"), "pri1");
    EXPECT_EQ(trunkOf("logs/pri1.log.12"), "pri1");
    EXPECT_EQ(trunkOf("pri1.log.20261121"), "pri1");
    EXPECT_EQ(trunkOf("pri1.log-20261121"), "pri1");
    EXPECT_EQ(trunkOf("pri1.log."), "pri1.log");
    EXPECT_EQ(trunkOf("pri1.log.1a"), "pri1.log");
}

}  // namespace

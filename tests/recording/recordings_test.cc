#include "recording/recordings.h"

#include <gtest/gtest.h>

namespace recording {
namespace {

using Paths = std::vector<std::string>;

TEST(PutInOrder, ReadsTheSecondRecordingOfASecondAfterTheFirst) {
    Paths paths{"pri1.20261121T112533Z.10.log", "pri1.20261121T112533Z.2.log", "pri1.20261121T112533Z.log",
                "pri1.20261121T112532Z.log"};
    putInOrder(paths);
    EXPECT_EQ(paths, (Paths{"pri1.20261121T112532Z.log", "pri1.20261121T112533Z.log",
                            "pri1.20261121T112533Z.2.log", "pri1.20261121T112533Z.10.log"}));
}

TEST(PutInOrder, LeavesOtherPathsAndTheTurnsOfTrunksWhereTheyAre) {
    Paths paths{"z.log",
                "/new/a.20261122T000000Z.kept.pcapng",
                "b.20261121T000000Z.pcapng",
                "-",
                "/old/a.20261121T235959Z.kept.pcapng",
                "a.log",
                "b.20261120T000000Z.pcapng.part"};
    putInOrder(paths);
    EXPECT_EQ(paths,
              (Paths{"z.log", "/old/a.20261121T235959Z.kept.pcapng", "b.20261120T000000Z.pcapng.part", "-",
                     "/new/a.20261122T000000Z.kept.pcapng", "a.log", "b.20261121T000000Z.pcapng"}));
}

}  // namespace
}  // namespace recording

#include "hostsvc/msg_t.h"

#include <gtest/gtest.h>

#include <cstdlib>

namespace {

using testing::internal::CaptureStdout;
using testing::internal::GetCapturedStdout;

TEST(MsgT, PrintingShowsEachWordOnALineOfItsOwn) {
    const msg_t m{4294967295U, 1002, -1, 1004, nullptr, nullptr};
    CaptureStdout();
    print_msg("sent", m);
    EXPECT_EQ(GetCapturedStdout(),
              "----------------\n"
              "** sent **\n"
              "   type = 4294967295\n"
              "   tran = 1002\n"
              "   size = -1\n"
              "ex_size = 1004\n"
              "----------------\n");
}

TEST(MsgT, OctetsAreWidenedWithTheirSign) {
    CaptureStdout();
    byte_print_msg("\x01\x7f\x80\xff", 5);
    EXPECT_EQ(GetCapturedStdout(), "0x1 0x7f 0xffffff80 0xffffffff 0x0 \n");
    CaptureStdout();
    byte_print_msg("", 0);
    EXPECT_EQ(GetCapturedStdout(), "\n");
}

TEST(MsgT, FreeingLeavesThePointersAsTheyAre) {
    msg_t m;
    free_msg(m);
    m.data = static_cast<char*>(std::calloc(1, 1));
    const char* const before = m.data;
    free_msg(m);
    EXPECT_EQ(static_cast<const void*>(m.data), static_cast<const void*>(before));
    EXPECT_EQ(m.ex_data, nullptr);
}

}  // namespace

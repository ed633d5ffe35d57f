#include "hostsvc/KSHost.h"

#include <gmock/gmock.h>

#include "norv/norv.h"
#include "tests/support/fake_norv.h"

namespace {

using testing::ElementsAre;

TEST(KSHost, StartUpMakesTheTransportReadyAndReturnsItsStatus) {
    fake_norv::reset();
    EXPECT_EQ(KSHostInit(), 0U);
    fake_norv::fail(fake_norv::Op::setInterface);
    EXPECT_EQ(KSHostInit(), NVSTATUS_ERROR);
    EXPECT_THAT(fake_norv::texts(), ElementsAre("nvDrvSetInterface(0, 0)", "nvDrvSetInterface(0, 0)"));
}

TEST(KSHost, ShutDownCallsNothing) {
    fake_norv::reset();
    KSHostCleanup();
    EXPECT_THAT(fake_norv::texts(), ElementsAre());
}

}  // namespace

#include "hostsvc/KSTransportChoice.h"

#include <gtest/gtest.h>

#include <cstdlib>

#include "hostsvc/KSException.h"
#include "tests/support/fake_norv.h"

namespace {

struct Case {
    const char* says;
    const char* hostName;
    const char* remoteNorv;
    const char* host;
    const char* chosen;  // null: this machine
};

constexpr Case cases[] = {
    {"nothing is named", nullptr, nullptr, nullptr, nullptr},
    {"nothing is named, this machine is", nullptr, nullptr, "alpha", nullptr},
    {"REMOTE_NORV alone is another machine", nullptr, "relay", nullptr, "relay"},
    {"REMOTE_NORV names this machine", nullptr, "alpha", "alpha", nullptr},
    {"HOST is a prefix of REMOTE_NORV", nullptr, "alphabet", "alpha", nullptr},
    {"REMOTE_NORV is a prefix of HOST", nullptr, "alpha", "alphabet", "alpha"},
    {"REMOTE_NORV is another machine", nullptr, "beta", "alpha", "beta"},
    {"an empty HOST is a prefix of everything", nullptr, "beta", "", nullptr},
    {"the argument comes first", "gamma", "beta", nullptr, "gamma"},
    {"the argument names this machine", "alpha:7000", "beta", "alpha", nullptr},
    {"the argument is another machine", "gamma", "alpha", "alpha", "gamma"},
};

TEST(KSTransportChoice, AQueueIsRemoteWhenAHostIsNamedThatDoesNotBeginWithThisOne) {
    for (const Case& each : cases) {
        SCOPED_TRACE(each.says);
        EXPECT_STREQ(ks_chooseHost(each.hostName, each.remoteNorv, each.host), each.chosen);
    }
}

class KSTransportOpening : public testing::Test {
  protected:
    KSTransportOpening() {
        fake_norv::reset();
        unsetenv("HOST");
        unsetenv("REMOTE_NORV");
    }
    ~KSTransportOpening() override {
        unsetenv("HOST");
        unsetenv("REMOTE_NORV");
    }
};

TEST_F(KSTransportOpening, TheEnvironmentIsAskedForTheHost) {
    setenv("REMOTE_NORV", "127.0.0.1:1", 1);  // where nobody listens
    EXPECT_THROW(ks_openTransport({}, 0, 0, nullptr), KSResource_CreationError);
    EXPECT_EQ(fake_norv::count(fake_norv::Op::open), 0U);
    setenv("HOST", "127.0.0.1", 1);
    EXPECT_NE(ks_openTransport({}, 0, 0, nullptr), nullptr);
    EXPECT_EQ(fake_norv::count(fake_norv::Op::open), 1U);
}

TEST_F(KSTransportOpening, AHostThatIsGivenComesBeforeTheEnvironment) {
    EXPECT_NE(ks_openTransport({}, 0, 0, nullptr), nullptr);
    EXPECT_THROW(ks_openTransport({}, 0, 0, "127.0.0.1:1"), KSResource_CreationError);
}

}  // namespace

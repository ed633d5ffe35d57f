// A network of the test's own, beside the process's one.
#include "softboard/network.h"

#include <gtest/gtest.h>
#include <pthread.h>

#include "softboard/codes.h"
#include "softboard/wire.h"

namespace softboard {
namespace {

const Address ccs{1, 1, 1, 0x15, 0};

// While one lives, the system refuses every new thread: no address space is large enough for its stack.
class NoThreads {
  public:
    NoThreads() {
        pthread_getattr_default_np(&before_);
        pthread_attr_t huge;
        pthread_attr_init(&huge);
        pthread_attr_setstacksize(&huge, size_t{1} << 47);
        EXPECT_EQ(pthread_setattr_default_np(&huge), 0);
        pthread_attr_destroy(&huge);
    }
    ~NoThreads() {
        pthread_setattr_default_np(&before_);
        pthread_attr_destroy(&before_);
    }
    NoThreads(const NoThreads&) = delete;
    NoThreads& operator=(const NoThreads&) = delete;

  private:
    pthread_attr_t before_{};
};

// Writes a command and returns the reply's type.
uint32_t ask(Network& network, uint32_t queue, const Address& from, uint32_t type, const Octets& body) {
    NvMsg32Bit* command = network.buffers().allocate(static_cast<uint32_t>(body.size()));
    store({0, type, from, ccs, body}, *command);
    network.write(queue, command);
    const NvMsg32Bit* reply = network.read(queue);
    const uint32_t replyType = reply->type;
    network.buffers().free("nvMsgFree", reply);
    return replyType;
}

TEST(NetworkTest, WithoutAThreadToPlayThemFramesStayAwayAndTheBoardAnswersAllTheSame) {
    Network network(oneChannel({{true, 0, {0x00, 0x01, 0x7f}}}));
    const uint32_t queue = network.openQueue();
    NvCompDesc host{};
    network.bindQueue(queue, host);
    const Address from = addressOf(host);
    const NoThreads noThreads;
    testing::internal::CaptureStderr();
    EXPECT_EQ(ask(network, queue, from, msgDetectEvt, BodyWriter().address(from).u32(2).u32(0).take()), 23U);
    EXPECT_EQ(ask(network, queue, from, msgSetParm, {10, 0, 0, 0, 1, 0, 0, 0}), 9U);
    EXPECT_EQ(ask(network, queue, from, msgComtest, {}), 3U);
    const std::string said = testing::internal::GetCapturedStderr();
    EXPECT_EQ(said.find("softboard: no thread to play frames: "), 0U) << said;
    EXPECT_EQ(said.find('\n'), said.size() - 1) << said;
    network.unbindQueue(queue, host);
    network.closeQueue(queue);
    EXPECT_EQ(network.balance(), "buffers outstanding 0, queues open 0");
}

}  // namespace
}  // namespace softboard

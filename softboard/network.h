// The message network of one process: the host's queues and buffers, the boards, and the playing thread,
// which sends the frames as events.
#ifndef SOFTBOARD_NETWORK_H
#define SOFTBOARD_NETWORK_H

#include <atomic>
#include <map>
#include <mutex>
#include <thread>

#include "softboard/board.h"
#include "softboard/buffers.h"
#include "softboard/journal.h"
#include "softboard/misbehaviour.h"
#include "softboard/queues.h"
#include "softboard/scenario.h"

namespace softboard {

// Any thread may call any public function. One lock guards queues and boards together, so that the journal
// has one order of messages.
class Network {
  public:
    explicit Network(const Scenario& scenario);
    ~Network();
    Network(const Network&) = delete;
    Network& operator=(const Network&) = delete;

    // Replaces the boards by those of the scenario and empties the journal. The host's queues and buffers
    // stay.
    void reset(const Scenario& scenario);

    // The buffer belongs to the host. Null when there is no memory or a fault makes the call fail.
    NvMsg32Bit* allocate(uint32_t size);
    // openQueue returns a handle and bindQueue NVSTATUS_OK; both return NVSTATUS_ERROR when a fault makes the
    // call fail. bindQueue sets `host` to the queue's new address.
    uint32_t openQueue();
    uint32_t bindQueue(uint32_t handle, NvCompDesc& host);
    void unbindQueue(uint32_t handle, const NvCompDesc& host);
    void closeQueue(uint32_t handle);
    // Waits until a message arrives and gives its buffer to the host. Null when the queue is closed.
    NvMsg32Bit* read(uint32_t handle);
    // Takes the buffer from the host and delivers the message: to a host queue, or to a board, which answers
    // before this function returns.
    void write(uint32_t handle, NvMsg32Bit* msg);
    // For tests: delivers the message to a host queue as if a board had sent it. Returns false when no queue
    // has its target address or there is no memory.
    bool inject(const Message& message);

    Buffers& buffers() { return buffers_; }
    Journal& journal() { return journal_; }
    size_t openQueues() const;
    // "buffers outstanding N, queues open M".
    std::string balance() const;

    // Whether the library leaves the offset at 0 after a body's first field (the fault offset-stays-0).
    bool leavesOffset() const { return leavesOffset_; }
    // Replaces the faults. Their counts begin at 1 again.
    void setFaults(const std::vector<Fault>& faults);

    // Ends the playing thread and waits for it. Call it before the process ends.
    void shutDown();

  private:
    // A frame waits while this many messages wait unread in a queue that it is for.
    static constexpr size_t mostWaiting = 64;

    // All but play() are called with lock_ held. (The constructor calls setUp before any other thread knows
    // the object.) play() is the body of the playing thread.
    void setUp(const Scenario& scenario);
    void toBoard(const Message& command);
    bool toHost(const Message& message);
    void forget(const Address& host);
    void updatePlayers();
    void startPlaying();
    Component* nextPlaying();
    void setFaultsLocked(const std::vector<Fault>& faults);
    void answer(Board& board, const Message& command);
    bool heard(const Component& component) const;
    void playNext(Component& component, Player::Time now);
    void play();

    Buffers buffers_;
    Journal journal_;
    mutable std::mutex lock_;
    std::condition_variable changed_;  // wakes the playing thread: it must look again for the next frame
    Queues queues_;
    std::map<uint8_t, Board> boards_;
    Misbehaviour misbehaviour_;
    std::atomic<bool> leavesOffset_ = false;
    bool ending_ = false;
    bool threadless_ = false;  // the system refused a playing thread; it is not asked again
    std::thread player_;
};

}  // namespace softboard

#endif

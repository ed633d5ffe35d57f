// The message network of one process: the host's queues and buffers, the boards, and the thread that plays.
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

// Safe from any thread. One lock guards queues and boards, so that the journal has one order.
class Network {
  public:
    explicit Network(const Scenario& scenario);
    ~Network();
    Network(const Network&) = delete;
    Network& operator=(const Network&) = delete;

    // Other boards from now on, and an empty journal; queues and buffers stay.
    void reset(const Scenario& scenario);

    // Null when there is no memory, or a fault has it so.
    NvMsg32Bit* allocate(uint32_t size);
    // NVSTATUS_ERROR when a fault has it so; likewise bindQueue.
    uint32_t openQueue();
    uint32_t bindQueue(uint32_t handle, NvCompDesc& host);
    void unbindQueue(uint32_t handle, const NvCompDesc& host);
    void closeQueue(uint32_t handle);
    // Waits for a message; null when the queue is closed.
    NvMsg32Bit* read(uint32_t handle);
    // Takes the buffer over.
    void write(uint32_t handle, NvMsg32Bit* msg);
    // A message of nobody's, for tests: goes to its target as if a board had sent it.
    bool inject(const Message& message);

    Buffers& buffers() { return buffers_; }
    Journal& journal() { return journal_; }
    size_t openQueues() const;
    // "buffers outstanding N, queues open M".
    std::string balance() const;

    // Whether a body's first field leaves the offset at 0.
    bool leavesOffset() const { return leavesOffset_; }
    // Other faults from now on; what they count begins at 1.
    void setFaults(const std::vector<Fault>& faults);

    // Ends the playing thread; called before the process ends.
    void shutDown();

  private:
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
    std::condition_variable changed_;  // something the playing thread looks at
    Queues queues_;
    std::map<uint8_t, Board> boards_;
    Misbehaviour misbehaviour_;
    std::atomic<bool> leavesOffset_ = false;
    bool ending_ = false;
    bool threadless_ = false;  // the system refused one
    std::thread player_;
};

}  // namespace softboard

#endif

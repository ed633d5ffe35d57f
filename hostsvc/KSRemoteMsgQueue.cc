#include "hostsvc/KSRemoteMsgQueue.h"

#include <netinet/tcp.h>
#include <sys/socket.h>

#include <array>
#include <atomic>
#include <cerrno>
#include <cstring>
#include <iostream>
#include <system_error>
#include <thread>

#include "hostsvc/KSByteOrder.h"
#include "hostsvc/KSException.h"
#include "hostsvc/KSHeaderBlock.h"
#include "hostsvc/KSSleep.h"

namespace {

// The relay protocol's frames.
constexpr std::uint32_t messageFrame = 1001;
constexpr std::uint32_t openedFrame = 1002;
constexpr std::uint32_t openFrame = 1003;
constexpr std::uint32_t closeFrame = 2000;
constexpr std::uint32_t closedFrame = 2001;

constexpr unsigned answerMs = 5000;  // how long the relay may take to open or close a queue
constexpr unsigned pollMs = 10;
constexpr unsigned pauseSeconds = 6;

template <std::size_t N>
msg_t frameOf(std::uint32_t type, std::array<std::uint32_t, N>& words) {
    return {type, 0, sizeof words, 0, reinterpret_cast<char*>(words.data()), nullptr};
}

// The exception does not tell the reason, so the standard error stream does.
[[noreturn]] void cannotOpen(const std::string& hostName, const std::string& reason) {
    std::cerr << "Cannot open a remote message queue on " + hostName + ": " + reason + "\n" << std::flush;
    throw KSResource_CreationError();
}

// Ends the connection when the relay does not answer in time, so that the thread that reads it wakes. A
// thread of its own watches the time.
class Patience {
  public:
    explicit Patience(const sock& connection)
        : watcher_([this, &connection] {
              if (answered_.tryLock(answerMs, pollMs))
                  return;
              isOver_ = true;
              connection.shutdown(SHUT_RDWR);
          }) {}
    Patience(const Patience&) = delete;
    Patience& operator=(const Patience&) = delete;
    ~Patience() {
        answered_.unlock();
        watcher_.join();
    }

    // Whether the relay did not answer in time.
    bool isOver() const { return isOver_; }

  private:
    struct HeldMutex : KSMutex {
        HeldMutex() { lock(); }
    } answered_;
    std::atomic<bool> isOver_ = false;
    std::thread watcher_;
};

}  // namespace

class KSRemoteMsgQueue::ReceivedFrame {
  public:
    explicit ReceivedFrame(sock& connection)
        : result_(connection.get_msg(frame_)), ended_(connection.failed()) {}
    ReceivedFrame(const ReceivedFrame&) = delete;
    ReceivedFrame& operator=(const ReceivedFrame&) = delete;
    ~ReceivedFrame() { free_msg(frame_); }

    bool good() const { return result_ == 0 && frame_.type != closeFrame; }
    bool is(std::uint32_t type) const { return result_ == 0 && frame_.type == type; }
    // Whether the header has come and the rest has not. (A frame that is too large but whole is not broken
    // off.)
    bool brokenOff() const { return result_ != 0 && ended_ && frame_.data != nullptr; }
    const msg_t& operator*() const { return frame_; }

  private:
    msg_t frame_;
    long result_;
    bool ended_;
};

KSRemoteMsgQueue::KSRemoteMsgQueue(NvCompDesc desc, unsigned a, unsigned b, const char* hostName)
    : hostName_(hostName), connection_(hostName, port) {
    if (connection_.failed())
        cannotOpen(hostName_, connection_.descriptor() < 0 ? std::strerror(errno) : "the name is unknown");
    if (connection_.connect() < 0)
        cannotOpen(hostName_, std::strerror(errno));
    keepAlive();
    handshake_.lock();
    open(desc, a, b);
}

KSRemoteMsgQueue::~KSRemoteMsgQueue() {
    KSRemoteMsgQueue::close();
    const std::lock_guard readerHasLeft(reading_);
}

// Sends small frames at once, because somebody waits for them, and notices a relay's machine that has
// disappeared or does not read any more.
void KSRemoteMsgQueue::keepAlive() const {
    const struct {
        int level, option, value;
    } options[] = {{IPPROTO_TCP, TCP_NODELAY, 1},   {SOL_SOCKET, SO_KEEPALIVE, 1},
                   {IPPROTO_TCP, TCP_KEEPIDLE, 30}, {IPPROTO_TCP, TCP_KEEPINTVL, 10},
                   {IPPROTO_TCP, TCP_KEEPCNT, 3},   {IPPROTO_TCP, TCP_USER_TIMEOUT, 60000}};
    for (const auto& each : options)
        setsockopt(connection_.descriptor(), each.level, each.option, &each.value, sizeof each.value);
}

void KSRemoteMsgQueue::open(NvCompDesc desc, unsigned a, unsigned b) try {
    std::array<std::uint32_t, 7> request{desc.node, desc.board, desc.processor, desc.component, desc.instance,
                                         a,         b};
    KS_htonU32(request.data(), request.data(), sizeof request);
    const Patience patience(connection_);
    const bool sent = sendFrame(frameOf(openFrame, request)) == 0;
    const ReceivedFrame reply(connection_);
    std::array<std::uint32_t, 5> address{};
    if (!sent || !reply.is(openedFrame) || (*reply).size < static_cast<int>(sizeof address))
        cannotOpen(hostName_, patience.isOver() ? "the relay does not answer" : "refused by the relay");
    KS_ntohU32(address.data(), (*reply).data, sizeof address);
    const auto octet = [&](std::size_t word) { return static_cast<std::uint8_t>(address[word]); };
    hostDesc = {static_cast<std::uint16_t>(address[4]), octet(1), 0, octet(2), octet(3), octet(0), 0};
} catch (const std::system_error& error) {  // the system has no thread for Patience
    cannotOpen(hostName_, error.what());
}

long KSRemoteMsgQueue::sendFrame(const msg_t& frame) {
    const std::lock_guard lock(writing_);
    return connection_.snd_msg(frame);
}

std::uint32_t KSRemoteMsgQueue::msgWrite(NvMsg32Bit* msg) {
    KSHeaderBlock block = ks_headerBlock(*msg);
    msg_t frame = frameOf(messageFrame, block);
    frame.ex_size = static_cast<std::int32_t>(msg->size);
    frame.ex_data = reinterpret_cast<char*>(msg) + NVMSG_HEADER_SIZE;
    if (sendFrame(frame) != 0)
        return NVSTATUS_ERROR;
    nvMsgFree(msg);
    return NVSTATUS_OK;
}

void KSRemoteMsgQueue::freeUnsent(NvMsg32Bit* msg) { nvMsgFree(msg); }

std::uint32_t KSRemoteMsgQueue::msgRead(NvMsg32Bit** out) {
    const std::lock_guard lock(reading_);
    const ReceivedFrame frame(connection_);
    if (frame.is(closedFrame)) {
        acknowledged();
        return NVSTATUS_ERROR;
    }
    if (frame.good()) {
        retryBudget_ = retryBudget;
        return takeMessage(*frame, out);
    }
    failed(frame.brokenOff(), out);
    return NVSTATUS_ERROR;
}

void KSRemoteMsgQueue::acknowledged() {
    closing_ |= closeAcknowledged;
    handshake_.unlock();
}

std::uint32_t KSRemoteMsgQueue::takeMessage(const msg_t& frame, NvMsg32Bit** out) {
    NvMsg32Bit* msg = nullptr;
    nvMsgAllocate(static_cast<std::uint32_t>(frame.ex_size), &msg);
    *out = msg;
    if (msg == nullptr)
        return NVSTATUS_ERROR;
    ks_fillHeader(*msg, frame.data, frame.size);
    std::memcpy(reinterpret_cast<char*>(msg) + NVMSG_HEADER_SIZE, frame.ex_data,
                static_cast<std::size_t>(frame.ex_size));
    return NVSTATUS_OK;
}

void KSRemoteMsgQueue::failed(bool withinFrame, NvMsg32Bit** out) {
    std::cerr << "Error communicating with remote message queue on " + hostName_ + "\n" << std::flush;
    if (withinFrame) {
        *out = nullptr;
        if ((closing_ & closeAsked) == 0)
            ks_sleep(pauseSeconds);
    }
    if (--retryBudget_ <= 0)
        throw KSRemoteService_ComFailure(hostName_.c_str(), port);
}

// Reads the connection until the relay's acknowledgement or the connection's end. The reader thread may have
// been cancelled already and not read any more; then this function reads in its place.
void KSRemoteMsgQueue::readToAcknowledgement() {
    const std::lock_guard lock(reading_);
    while ((closing_ & closeAcknowledged) == 0) {
        const ReceivedFrame frame(connection_);
        if (frame.is(closedFrame) || connection_.failed())
            acknowledged();
    }
}

void KSRemoteMsgQueue::awaitAcknowledgement() {
    std::thread other;
    try {
        other = std::thread([this] { readToAcknowledgement(); });
    } catch (const std::system_error&) {  // no thread: only the reader thread can see the acknowledgement
    }
    handshake_.tryLock(answerMs, pollMs);
    connection_.shutdown(SHUT_RDWR);
    if (other.joinable())
        other.join();
}

// If the close request cannot be sent, there is nothing to wait for.
void KSRemoteMsgQueue::wakeReader() {
    if ((closing_.fetch_or(closeAsked) & closeAsked) != 0)
        return;
    msg_t request;
    request.type = closeFrame;
    if (sendFrame(request) == 0)
        awaitAcknowledgement();
    else
        connection_.shutdown(SHUT_RDWR);
}

void KSRemoteMsgQueue::close() { KSRemoteMsgQueue::wakeReader(); }

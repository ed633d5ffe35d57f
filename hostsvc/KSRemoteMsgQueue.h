// A queue in another machine, which is reached through a relay on that machine.
#ifndef HOSTSVC_KSREMOTEMSGQUEUE_H
#define HOSTSVC_KSREMOTEMSGQUEUE_H

#include <atomic>
#include <cstdint>
#include <mutex>
#include <string>

#include "hostsvc/KSAbstractMsgQueue.h"
#include "hostsvc/KSMutex.h"
#include "hostsvc/KSRemoteService_ComFailure.h"
#include "hostsvc/sock.h"

// Messages travel over one TCP connection to the relay. The relay opens a queue of its transport library for
// the connection. A connection that is lost is not made again.
class KSRemoteMsgQueue : public KSAbstractMsgQueue {
  public:
    static constexpr int port = 6554;
    static constexpr int retryBudget = 10;

    // Connects to the relay on hostName and asks it to open a queue. hostName may end with a colon and a
    // port; without one it is `port`. desc, a and b are passed to the relay. Throws
    // KSResource_CreationError when there is no relay, when it refuses, or when it has not answered within
    // five seconds.
    KSRemoteMsgQueue(NvCompDesc desc, unsigned a, unsigned b, const char* hostName);
    // Waits until no thread is in msgRead any more.
    ~KSRemoteMsgQueue() override;

    // Reports each failure on the standard error stream. A failure in the middle of a frame pauses for six
    // seconds, so that the relay can recover. Throws KSRemoteService_ComFailure when retryBudget reads in a
    // row have failed.
    std::uint32_t msgRead(NvMsg32Bit** out) override;
    // The caller keeps a message that could not be sent, and frees it with freeUnsent.
    std::uint32_t msgWrite(NvMsg32Bit* msg) override;
    void freeUnsent(NvMsg32Bit* msg) override;
    // Both do the same, the first time one of them is called: ask the relay to close the queue, wait up to
    // five seconds for its acknowledgement or the end of the connection, and end the connection. Messages
    // that arrive meanwhile may be dropped.
    void wakeReader() override;
    void close() override;

  private:
    class ReceivedFrame;

    // closeAsked: this end has asked the relay to close. closeAcknowledged: the relay has closed, or the
    // connection has ended. A relay may acknowledge what nobody has asked for.
    enum Closing : unsigned { closeAsked = 1, closeAcknowledged = 2 };

    void open(NvCompDesc desc, unsigned a, unsigned b);
    void keepAlive() const;
    long sendFrame(const msg_t& frame);
    void acknowledged();
    std::uint32_t takeMessage(const msg_t& frame, NvMsg32Bit** out);
    void failed(bool withinFrame, NvMsg32Bit** out);
    void awaitAcknowledgement();
    void readToAcknowledgement();

    std::string hostName_;
    sock connection_;
    int retryBudget_ = retryBudget;  // reads that may still fail; used by the reading thread only
    KSMutex handshake_;              // a signal: locked until the relay has acknowledged the close
    std::mutex reading_;             // held by the thread that reads the connection
    std::mutex writing_;             // held by the thread that writes to the connection
    std::atomic<unsigned> closing_{0};
};

#endif

// A queue in another machine, behind a relay there.
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

// Messages travel over one TCP connection to the relay, which has opened a queue of the transport library for
// it. A connection that is lost stays lost.
class KSRemoteMsgQueue : public KSAbstractMsgQueue {
  public:
    static constexpr int Port = 6554;
    static constexpr int RetryBudget = 10;

    // Connects to the relay on hostName (a port behind a colon comes before Port) and has a queue opened: a
    // and b are the queue's own arguments, for the relay to use. Throws KSResource_CreationError when there
    // is no relay, or it refuses, or it has not answered within five seconds.
    KSRemoteMsgQueue(NvCompDesc desc, unsigned a, unsigned b, const char* hostName);
    // Waits until a reader has left msgRead.
    ~KSRemoteMsgQueue() override;

    // Throws KSRemoteService_ComFailure when RetryBudget reads in a row have failed. Each one is reported on
    // the standard error stream. A failure within a frame takes six seconds, so that a relay can recover.
    std::uint32_t msgRead(NvMsg32Bit** out) override;
    // A message that could not be sent stays the caller's.
    std::uint32_t msgWrite(NvMsg32Bit* msg) override;
    void freeUnsent(NvMsg32Bit* msg) override;
    // Asks the relay to close, waits up to five seconds for its word that it has (or for the end of the
    // connection), and ends the connection, once. Messages that come meanwhile may be dropped.
    void wakeReader() override;
    void close() override;

  private:
    class ReceivedFrame;

    void open(NvCompDesc desc, unsigned a, unsigned b);
    void keepAlive() const;
    long sendFrame(const msg_t& frame);
    void closed();
    std::uint32_t takeMessage(const msg_t& frame, NvMsg32Bit** out);
    void failed(bool withinFrame, NvMsg32Bit** out);
    void awaitClosed();
    void lookForClosed();

    std::string hostName_;
    sock connection_;
    int retryBudget_ = RetryBudget;  // the reader's
    KSMutex handshake_;              // held until the relay has closed
    std::mutex reading_;             // who reads the connection
    std::mutex writing_;
    std::atomic<bool> closing_{false};
    bool closed_ = false;  // with reading_
};

#endif

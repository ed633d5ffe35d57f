// A TCP/IPv4 socket that reads and writes whole blocks and whole frames.
#ifndef HOSTSVC_SOCK_H
#define HOSTSVC_SOCK_H

#include <netinet/in.h>

#include <atomic>
#include <cstdint>

#include "hostsvc/msg_t.h"

// Nothing throws: what fails returns a negative result or sets the error flag, which stays set and makes
// every later frame fail. One thread may read while another writes, and any thread may shut it down.
class sock {
  public:
    sock() = default;
    explicit sock(int fd);  // takes fd over
    sock(int fd, const sockaddr_in& addr);
    sock(unsigned long addr, int port);  // sock_make
    // A host name or an address in digits and dots, in front of a colon and a port if it is not `port`. With
    // several colons the host ends at the first, and the last one gives the port. A name that cannot be
    // looked up sets the error flag, and there is no socket.
    sock(const char* host, int port);
    sock(const sock&) = delete;
    sock& operator=(const sock&) = delete;
    ~sock();

    // Makes the socket. addr in network order, port in host order.
    void sock_make(unsigned long addr, int port);

    // Drops what was not sent and resets the connection.
    int close();
    int shutdown(int how) const;
    int bind() const;  // to the stored address
    int listen(int backlog) const;
    int accept(sockaddr_in& peer) const;  // the new descriptor, the caller's
    int accept() const;
    int connect();  // to the stored address

    // Waits for readability ('r'), writability ('w') or an exceptional condition ('e'); for ever when both
    // times are -1. 1 when it is so, or when it could not be asked; 0 when the time is over. Another mode is
    // 1 at once.
    int ready(char mode, long sec, long usec) const;
    int ready(long sec, long usec) const { return ready('r', sec, usec); }

    // 0 once everything is through. A length below 1 is returned. When the peer has closed, reading returns
    // how much is missing, writing 0.
    long readblock(void* buf, long len);
    long writeblock(const void* buf, long len);

    // 0 once the frame is sent. One with a part below 0 or above msg_t::Largest is -1, and nothing is
    // written.
    long snd_msg(const msg_t& m);
    // 0 once a frame has been received: the parts are the caller's, to be given back with free_msg, whatever
    // the result; where there are none the pointers are null. A part above msg_t::Largest is read all the
    // same, so that the next frame is found, and the result is -1. A negative size, or no memory for a part,
    // is said on the standard error stream, and the result is -1; the parts are not read, and the next call
    // takes what follows for a frame. A part above ten times msg_t::Largest is treated likewise and sets the
    // error flag too.
    long get_msg(msg_t& m);

    bool failed() const { return error_.load() != 0; }
    int descriptor() const { return descriptor_; }  // 0: none
    const sockaddr_in& address() const { return address_; }

  private:
    long transferred(long count);
    bool allocateParts(msg_t& m);

    sockaddr_in address_{};
    std::atomic<std::int32_t> error_{0};
    std::int32_t descriptor_ = 0;
};

#endif

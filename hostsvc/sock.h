// A TCP/IPv4 socket that reads and writes whole blocks and whole frames of the relay protocol.
#ifndef HOSTSVC_SOCK_H
#define HOSTSVC_SOCK_H

#include <netinet/in.h>

#include <atomic>
#include <cstdint>

#include "hostsvc/msg_t.h"

// No function throws. A function that fails returns a negative result or sets the error flag. The flag stays
// set, and then every later frame fails. One thread may read while another writes, and any thread may shut
// the socket down.
class sock {
  public:
    sock() = default;
    explicit sock(int fd);                  // owns the descriptor
    sock(int fd, const sockaddr_in& addr);  // owns the descriptor
    sock(unsigned long addr, int port);     // calls sock_make
    // host is a name or an address in digits and dots; a colon and a port may follow, which replaces `port`.
    // If there are several colons, the host ends at the first, and the port follows the last. If the name
    // cannot be looked up, sets the error flag and makes no socket.
    sock(const char* host, int port);
    sock(const sock&) = delete;
    sock& operator=(const sock&) = delete;
    ~sock();

    // Makes the socket and stores the address. addr is in network order, port in host order.
    void sock_make(unsigned long addr, int port);

    // Resets the connection: data that has not been sent yet is dropped.
    int close();
    int shutdown(int how) const;
    int bind() const;  // to the stored address
    int listen(int backlog) const;
    int accept(sockaddr_in& peer) const;  // returns the new descriptor, which the caller owns
    int accept() const;
    int connect();  // to the stored address

    // Waits until the socket can be read ('r') or written ('w'), or has an exceptional condition ('e');
    // without limit if both times are -1. Returns 1 when that is so, or when the system cannot tell, and 0
    // when the time is over. For any other mode returns 1 at once.
    int ready(char mode, long sec, long usec) const;
    int ready(long sec, long usec) const { return ready('r', sec, usec); }

    // Return 0 for success, a negative number for an error, and a length below 1 as it is. If the peer has
    // closed, reading returns how many octets are missing; if the system takes no octet, writing returns 0.
    long readblock(void* buf, long len);
    long writeblock(const void* buf, long len);

    // Returns 0 when the frame has been sent. Returns -1 and sends nothing if the size of a part is below 0
    // or above msg_t::largest.
    long snd_msg(const msg_t& m);
    // Receives a frame. Returns 0 for a good frame and -1 otherwise. In both cases the caller owns the parts
    // and frees them with free_msg; a part that is missing is a null pointer.
    //
    // A part above msg_t::largest is read, so that the next frame is found, and the result is -1. If a size
    // is negative or there is no memory for a part, this is reported on the standard error stream, and the
    // result is -1; the parts are not read, so the next call takes them for a frame. A part above ten times
    // msg_t::largest is treated like that as well, and the error flag is set.
    long get_msg(msg_t& m);

    bool failed() const { return error_.load() != 0; }
    int descriptor() const { return descriptor_; }  // 0: no socket
    const sockaddr_in& address() const { return address_; }

  private:
    long transferred(long count);
    bool allocateParts(msg_t& m);

    sockaddr_in address_{};
    std::atomic<std::int32_t> error_{0};
    std::int32_t descriptor_ = 0;
};

#endif

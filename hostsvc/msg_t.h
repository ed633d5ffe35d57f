// One frame of the relay protocol, in memory.
#ifndef HOSTSVC_MSG_T_H
#define HOSTSVC_MSG_T_H

#include <cstddef>
#include <cstdint>

// A frame that is sent points at its sender's own parts. One that sock::get_msg received owns both: heap
// blocks with a zero octet behind the part, given back with free_msg.
struct msg_t {
    std::uint32_t type = 0;
    std::uint32_t tran = 0;  // carried, not interpreted
    std::int32_t size = 0;   // of the data part, octets
    std::int32_t ex_size = 0;
    char* data = nullptr;
    char* ex_data = nullptr;

    static constexpr std::int32_t Largest = 102400;  // of each part
    static constexpr int HeaderSize = 20;            // on the wire
};

// The header is converted in one piece.
static_assert(offsetof(msg_t, data) == 16);

// Frees the parts that are there; the pointers stay as they are.
void free_msg(msg_t& m);

// Debugging aids: the frame's words in lines of their own, and octets in hexadecimal, each widened with its
// sign, both on the standard output.
void print_msg(const char* title, const msg_t& m);
void byte_print_msg(const char* buf, int n);

#endif

// A frame of the relay protocol in memory.
#ifndef HOSTSVC_MSG_T_H
#define HOSTSVC_MSG_T_H

#include <cstddef>
#include <cstdint>

// The pointers of a frame that is sent refer to memory of the sender. A frame that sock::get_msg has received
// owns its two parts: blocks on the heap, each with a zero octet after the part. free_msg frees them.
struct msg_t {
    std::uint32_t type = 0;
    std::uint32_t tran = 0;  // transaction; sock only passes it on
    std::int32_t size = 0;   // of the data part, octets
    std::int32_t ex_size = 0;
    char* data = nullptr;
    char* ex_data = nullptr;

    static constexpr std::int32_t largest = 102400;  // of each part
    static constexpr int headerSize = 20;            // on the wire
};

// The code that converts the header to network order relies on this layout.
static_assert(offsetof(msg_t, data) == 16);

// Frees the parts that are not null. Leaves the pointers unchanged.
void free_msg(msg_t& m);

// For debugging. Both write to the standard output: the words of a frame, a line each; and octets in
// hexadecimal, each sign-extended.
void print_msg(const char* title, const msg_t& m);
void byte_print_msg(const char* buf, int n);

#endif

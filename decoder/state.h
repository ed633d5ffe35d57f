// The decoder's global variables. Those about a frame exist once in each thread, so that several threads may
// decode at the same time, each for a trunk of its own variant. Those about the log exist once in the
// program: whoever opens the log sets them before another thread writes.
#ifndef DECODER_STATE_H
#define DECODER_STATE_H

#include <cstdio>

namespace decoder {

inline constinit thread_local int flag = 0;  // 0: lines are indented (transmitted frames), 1: they are not
inline constinit thread_local int bit_field = 0;  // the octet masked to the field being shown
inline constinit thread_local int ielength = 0;   // octets that the element still announces; can be below 0
inline constinit thread_local int msglen = 0;     // octets of the frame being decoded
inline constinit thread_local int swit = 0;       // switch variant of the trunk, see trunks.h

inline bool file_output = false;  // a log is written
inline std::FILE* ofp = nullptr;  // the log, owned by whoever opened it

}  // namespace decoder

#endif

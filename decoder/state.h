// The decoder's program-wide words. Only one thread decodes at a time: whoever decodes, or composes lines,
// holds off the others (the trace application does so with its queue's mutex), so they are plain variables.
#ifndef DECODER_STATE_H
#define DECODER_STATE_H

#include <cstdio>

namespace decoder {

inline int flag = 0;              // 0: every line is indented (transmitted frames), 1: none is (received)
inline bool file_output = false;  // a log is written
inline std::FILE* ofp = nullptr;  // the log, owned by whoever opened it
inline int bit_field = 0;         // the octet masked to the field being shown
inline int ielength = 0;          // octets that the current element still announces; may go below zero
inline int msglen = 0;            // octets of the frame being decoded
inline int swit = 0;              // switch variant of the trunk, see trunks.h

}  // namespace decoder

#endif

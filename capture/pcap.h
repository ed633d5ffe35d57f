// Reads captures in the pcap form, in either order of octets, with micro- or nanoseconds.
#ifndef CAPTURE_PCAP_H
#define CAPTURE_PCAP_H

#include "capture/Form.h"

namespace capture {

Form::Match isPcap(std::string_view beginning, bool isAll);
std::unique_ptr<Parser> readPcap(const Context& context);

inline constexpr Form pcapForm{"pcap", isPcap, readPcap};

}  // namespace capture

#endif

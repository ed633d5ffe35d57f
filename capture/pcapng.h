// Reads captures in the pcapng form.
#ifndef CAPTURE_PCAPNG_H
#define CAPTURE_PCAPNG_H

#include "capture/Form.h"

namespace capture {

Form::Match isPcapng(std::string_view beginning, bool isAll);
std::unique_ptr<Parser> readPcapng(const Context& context);

inline constexpr Form pcapngForm{"pcapng", isPcapng, readPcapng};

}  // namespace capture

#endif

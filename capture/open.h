// An input of any form.
#ifndef CAPTURE_OPEN_H
#define CAPTURE_OPEN_H

#include <memory>
#include <span>
#include <string>

#include "capture/Form.h"

namespace capture {

// The forms that this layer reads: pcap, pcapng, hex lines, bracketed dumps.
std::span<const Form> forms();

// Reads `path` ("-" is the standard input) in the form that its beginning shows, the first that fits; which
// one is found out as next() is called. A followed content that is replaced is read anew, after an item that
// says so. Throws BadInput when it cannot be opened; next() throws it when no form fits.
std::unique_ptr<Reader> openReader(const std::string& path, const ReadOptions& options,
                                   std::span<const Form> known);

// The D channel that a file name stands for: the name without its folder, up to the time at which the file
// was begun ("trunk1.20261121T112533.log" is "trunk1"), or else without its ending ("day.log" is "day").
std::string trunkOf(std::string_view path);

}  // namespace capture

#endif

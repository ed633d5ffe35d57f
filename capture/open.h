// Opens an input of any form.
#ifndef CAPTURE_OPEN_H
#define CAPTURE_OPEN_H

#include <memory>
#include <span>
#include <string>

#include "capture/Form.h"

namespace capture {

// The forms that this layer reads: pcap, pcapng, hex lines, bracketed dumps.
std::span<const Form> forms();

// Opens `path` ("-" is the standard input) to be read in the first of the known forms that its beginning
// fits. The form is recognised during the first calls of next(). When a file that is followed is emptied or
// replaced, the reader gives an item that says so, and reads the new content from its beginning. Throws
// BadInput if the file cannot be opened; next() throws it if no form fits.
std::unique_ptr<Reader> openReader(const std::string& path, const ReadOptions& options,
                                   std::span<const Form> known);

// The name of the D channel that a file name stands for. It is the file name without its folder, up to the
// time at which the file was begun ("trunk1.20261121T112533.log" gives "trunk1"), or else without its ending
// and the number of a rotated file ("day.log" and "day.log.2" give "day").
std::string trunkOf(std::string_view path);

}  // namespace capture

#endif

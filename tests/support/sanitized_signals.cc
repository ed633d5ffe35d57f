// Linked into every program that is built with the thread sanitizer.
//
// That library calls a signal's handler only at certain places, and keeps the signal until then. What it
// keeps it in is made when a thread first makes a call that can wait. In g++ 12 a signal that comes just
// while it is made is lost: the thread makes a second one, and forgets the one that the signal is in. A
// program that is told to end by that signal then runs for ever. So the main thread, to which the system
// gives signals, makes such a call before anyone can have sent one.
#include <poll.h>

namespace {

[[gnu::constructor]] void waitForNothing() { poll(nullptr, 0, 0); }

}  // namespace

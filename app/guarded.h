// The edge of a thread or a callback: reports every exception on the screen.
#ifndef APP_GUARDED_H
#define APP_GUARDED_H

#include <iostream>
#include <memory>

#include "vela/Exception.h"
#include "vela/Msg.h"

namespace app {

// The place of the guarded body that this thread runs or has run last; 0 if there was none.
inline thread_local int guardedPlace = 0;

// Runs the body. Reports an exception that leaves the body and throws it on, also the unwinding of a
// cancelled thread. A thrown message is reported and not thrown on. `place` is the number in the report of a
// foreign exception; it tells the three edges of the program apart.
template <typename Body>
void guarded(int place, Body body) {
    guardedPlace = place;
    try {
        body();
    } catch (const vela::Exception& exception) {
        std::cout << "vela Exception caught" << std::endl << exception << std::endl;
        throw;
    } catch (vela::Msg* thrown) {  // NOLINT(cert-err*): messages are thrown by pointer
        const std::unique_ptr<vela::Msg> msg(thrown);
        std::cout << "message caught" << std::endl << *msg << std::endl;
    } catch (...) {
        std::cout << "general Exception caught in lapdmon(" << place << ")" << std::endl;
        throw;
    }
}

}  // namespace app

#endif

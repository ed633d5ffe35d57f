// The edge of a thread or a callback: every exception is reported on the screen.
#ifndef APP_GUARDED_H
#define APP_GUARDED_H

#include <iostream>
#include <memory>

#include "vela/Exception.h"
#include "vela/Msg.h"

namespace app {

// The place whose body this thread runs, or ran last; 0 for none.
inline thread_local int guardedPlace = 0;

// Runs the body. What escapes is reported and thrown on, the unwinding of a cancelled thread included; a
// thrown message is reported and ends there. `place` is the number that the report of a foreign exception
// carries; it tells the three edges of the program apart.
template <typename Body>
void guarded(int place, Body body) {
    guardedPlace = place;
    try {
        body();
    } catch (const vela::Exception& exception) {
        std::cout << "vela Exception caught" << std::endl << exception << std::endl;
        throw;
    } catch (vela::Msg* thrown) {  // NOLINT(cert-err*): a message is thrown by pointer
        const std::unique_ptr<vela::Msg> msg(thrown);
        std::cout << "message caught" << std::endl << *msg << std::endl;
    } catch (...) {
        std::cout << "general Exception caught in lapdmon(" << place << ")" << std::endl;
        throw;
    }
}

}  // namespace app

#endif

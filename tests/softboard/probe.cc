// A small program on the transport, for the launcher's tests: says what D channel 1 of board 1 is and the
// first frames on it. Its arguments are echoed.
#include <cstdlib>
#include <iostream>

#include "softboard/codes.h"
#include "softboard/hex.h"
#include "softboard/wire.h"
#include "tests/softboard/host.h"

using namespace softboard;

int main(int argc, char** argv) {
    const Address ccs{1, 1, 1, ccsType, 0};
    nvDrvSetInterface(0, 0);
    for (int i = 1; i < argc; ++i) {
        std::cout << "argument " << argv[i] << '\n';
    }
    Host host;
    const Message protocol = host.ask(msgGetParm, ccs, BodyWriter().u32(protocolParameter).take());
    std::cout << "protocol " << unsigned{protocol.body.at(4)} << '\n';
    host.ask(msgDetectEvt, ccs, BodyWriter().address(host.address()).u32(layer2TraceEvents).u32(0).take());
    host.ask(msgSetParm, ccs, BodyWriter().u32(traceParameter).u32(1).take());
    for (int i = 0; i < 2; ++i) {
        std::cout << "event " << hex(host.read().body) << '\n';
    }
    return 7;
}

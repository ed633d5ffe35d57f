// Lists the components of board 1, reads the protocol type of D channel 1 and prints the next frames on it:
//     softboard -- build/dev/bin/vela-example
#include <iostream>
#include <memory>

#include "vela/Board.h"
#include "vela/CCS.h"
#include "vela/vela.h"

vela::Semaphore frames(1000, 0);

void onFrame(vela::CCS*, unsigned int, vela::CCS::EvtL2Trace_t* raw) {
    const std::unique_ptr<vela::CCS::EvtL2Trace_t> record(raw);  // the callback must delete it
    std::cout << (record->Direction == 1 ? "sent " : "received ") << record->List->length() << " octets\n";
    frames.post();
}

int main() try {
    vela::velaInit();
    vela::Board board(1, nullptr);
    for (const auto& component : board.resourceMgr().findAll())
        std::cout << component << "\n";

    vela::CCS ccs(board.findInst(0x15, 0xFF, 1).getTgtDesc(), board.getMsgQueue());
    vela::CCS::MsgGetParmCmplt_t protocol;
    ccs.GetParm(7, &protocol);
    std::cout << "protocol type " << protocol.Val << "\n";

    ccs.asyncRegisterEvtGroup(2, vela::Handler::of<&onFrame>(), vela::EvtCallback::onDispatchingThread);
    ccs.DetectEvt(2, 0, nullptr);
    ccs.SetParm(10, 1, nullptr);
    for (int i = 0; i < 5; ++i)
        frames.wait();
    ccs.CancelEvt(2, nullptr);
    ccs.SetParm(10, 0, nullptr);
    vela::velaCleanup();
} catch (const vela::Exception& exception) {
    std::cerr << exception << "\n";
    return 1;
}

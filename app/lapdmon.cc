#include "app/lapdmon.h"

#include <cerrno>
#include <chrono>
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <memory>
#include <string>
#include <string_view>
#include <utility>

#include "app/Arrivals.h"
#include "app/Log.h"
#include "app/arguments.h"
#include "app/banner.h"
#include "app/display.h"
#include "app/guarded.h"
#include "app/operator.h"
#include "app/protocol.h"
#include "app/unhandled.h"
#include "decoder/lines.h"
#include "vela/Board.h"
#include "vela/TSCComponent.h"
#include "vela/vela.h"

namespace app {

std::unique_ptr<vela::CCS> ccs;

namespace {

// The board's codes.
constexpr unsigned char TscType = 0x12;
constexpr unsigned char TscProcessor = 1;
constexpr unsigned char CcsType = 0x15;
constexpr unsigned char AnyProcessor = 0xFF;
constexpr unsigned int ProtocolTypeParm = 7;
constexpr unsigned int L2TraceParm = 10;

constexpr unsigned int QueueDepth = 50;
// For what has arrived to be shown when nothing more can.
constexpr std::chrono::seconds ShowingLimit{5};
constexpr int MainPlace = 749;  // what main's report of a foreign exception carries

void openLog() {
    if (!decoder::file_output)
        return;
    decoder::ofp = traceLog.open(log_file_name.data());
    if (decoder::ofp == nullptr) {
        const char* const why = errno == EWOULDBLOCK ? "another trace writes to it" : std::strerror(errno);
        std::cerr << "lapdmon: cannot open " + std::string(log_file_name.data()) + ": " + why + "\n"
                  << std::flush;
        std::exit(EXIT_FAILURE);
    }
    decoder::writeLog = [](std::string_view entry) { traceLog.write(entry); };
}

void closeLog() {
    const WritingOut writingOut;
    decoder::ofp = nullptr;
    traceLog.close();
}

vela::TSCComponent findTsc(vela::Board& board) {
    vela::TSCComponent tsc(board.findComp(TscType, TscProcessor));
    std::cout << "TSC Component Information" << tsc.getTgtDesc() << std::endl;
    return tsc;
}

std::unique_ptr<vela::CCS> openCcs(const vela::Instance& instance) {
    auto opened = std::make_unique<TracedCcs>(instance.getTgtDesc(), nullptr);
    std::cout << "CCS instance Number" << opened->getTgtDesc() << std::endl;
    return opened;
}

// Sets the variant that frames are decoded by; false for a type that nobody knows how to decode.
bool setProtocol(unsigned int type) {
    std::cout << "CCS protocol type is " << type << std::endl;
    const Protocol* const protocol = protocolOf(type);
    if (protocol == nullptr) {
        std::cerr << "Unknow Protocol -- I don't know how to interprete. "
                  << "Program is terminating!" << std::endl;
        return false;
    }
    trunkVariant = protocol->variant;
    std::cout << protocol->screenLine << std::endl;
    decoder::text(protocol->logLine);
    decoder::flushLines();
    return true;
}

// What nobody registered for is reported as ever, but on the reader thread: while nobody reads the standard
// error stream, messages stay with the transport, and no threads pile up.
void reportInTurn(vela::CCS& reporting) {
    const vela::Handler asEver(vela::Handler::MsgFunction{nullptr});
    reporting.asyncUnregisteredMsgType(asEver, vela::EvtCallback::OnDispatchingThread);
    reporting.asyncUnregisteredEvtGroup(asEver, vela::EvtCallback::OnDispatchingThread);
}

// Once the board reports events, the instance is quit's to switch off and to destroy.
void startTrace(std::unique_ptr<vela::CCS> opened) {
    opened->SetParm(L2TraceParm, 1, nullptr);
    reportInTurn(*opened);
    opened->asyncRegisterEvtGroup(vela::CCS::L2TraceGroup, vela::Handler::of<&HANDLE_L2Trace_events>(), 0);
    opened->DetectEvt(vela::CCS::L2TraceGroup, 0, nullptr);
    ccs = std::move(opened);
    static_cast<void>(std::atexit(quit));
    watchSignals();
    Process.start(nullptr);
    ccs->getMsgQueue()->connectionLost([](vela::MsgQueue*) { boardLost(); });
}

// The exit status.
int untilEnded() {
    if (awaitQuit() == Ending::Asked)
        return EXIT_SUCCESS;
    std::cerr << "lapdmon: the board cannot be reached any more, the trace ends\n" << std::flush;
    arrivals.awaitNone(ShowingLimit);
    return EXIT_FAILURE;
}

// The exit status.
int trace(int argc, char** argv) {
    vela::MsgQueue::DefaultDepth = QueueDepth;
    parseArgs(argc, argv);
    openLog();
    telvar_header();
    vela::velaInit();

    vela::Board board(static_cast<unsigned int>(boardnumber), nullptr);
    const vela::TSCComponent tsc = findTsc(board);
    const vela::Instance instance =
        board.findInst(CcsType, AnyProcessor, static_cast<unsigned short>(INST_NUM));
    std::unique_ptr<vela::CCS> opened = openCcs(instance);
    vela::StdResource::MsgGetParmCmplt_t reply;
    opened->GetParm(ProtocolTypeParm, &reply);
    if (!setProtocol(reply.Val))
        return EXIT_FAILURE;  // nothing has been switched on yet
    startTrace(std::move(opened));
    return untilEnded();
}

// Whether every frame is in the log. Says how many found no thread or no memory; the log says of itself what
// it could not write.
bool isWhole() {
    const unsigned long lost = arrivals.lost();
    if (lost != 0)
        std::cerr << "lapdmon: frames lost for want of threads or memory: " + std::to_string(lost) + "\n"
                  << std::flush;
    return lost == 0 && traceLog.complete();
}

// One step of the shutdown, which goes on whatever happens.
template <typename Step>
void attempt(Step step) {
    try {
        guarded(MainPlace, step);
    } catch (...) {  // reported
    }
}

}  // namespace

void quit() {
    if (ccs == nullptr)
        return;
    shutdownBegins();
    std::cout << "One moment. Program Exiting" << std::endl;
    // The board first, so that no callback waits for the queue when the display thread goes; the log last.
    attempt([] { ccs->CancelEvt(vela::CCS::L2TraceGroup, nullptr); });
    attempt([] { ccs->SetParm(L2TraceParm, 0, nullptr); });
    attempt([] {
        const WritingOut writingOut;
        arrivals.end();
        Process.cancel();
        Process.join();
    });
    attempt([] { ccs.reset(); });
    attempt(discardQueued);
    attempt(closeLog);
}

int runTrace(int argc, char** argv) {
    closeLogWhenUnhandled();
    int status = EXIT_SUCCESS;
    try {
        guarded(MainPlace, [&] { status = trace(argc, argv); });
    } catch (...) {  // reported
        status = EXIT_FAILURE;
    }
    quit();           // now, while the status can still say what became of the log
    discardQueued();  // of a start that failed
    closeLog();
    return isWhole() ? status : EXIT_FAILURE;
}

}  // namespace app

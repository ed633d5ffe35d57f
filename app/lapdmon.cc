#include "app/lapdmon.h"

#include <array>
#include <cerrno>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <memory>
#include <mutex>
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
constexpr unsigned int PollMs = 10;
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
    const std::lock_guard guard(queueGuard);
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

// Once the board reports events, the instance is quit's to switch off and to destroy.
void startTrace(std::unique_ptr<vela::CCS> opened) {
    opened->SetParm(L2TraceParm, 1, nullptr);
    opened->asyncRegisterEvtGroup(vela::CCS::L2TraceGroup, vela::Handler::of<&HANDLE_L2Trace_events>(), 0,
                                  arrivals);
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

// Frames that arrived and that the end did not wait for.
std::uint64_t givenUp = 0;

// One line on the standard error stream for each reason that frames were lost for. False when there was one.
// The log says of itself what it could not write.
bool noneLost() {
    const std::array reasons{
        std::pair{arrivals->lostForWantOfMeans(), "for want of threads or memory"},
        std::pair{arrivals->losses().noRoom, "because too many waited for the log"},
        std::pair{givenUp, "because the end did not wait for the log"},
    };
    bool none = true;
    for (const auto& [frames, why] : reasons) {
        if (frames == 0)
            continue;
        std::cerr << "lapdmon: frames lost " + std::string(why) + ": " + std::to_string(frames) + "\n"
                  << std::flush;
        none = false;
    }
    return none;
}

// Whether every frame is in the log.
bool isWhole() { return noneLost() && traceLog.complete(); }

// One step of the shutdown, which goes on whatever happens.
template <typename Step>
void attempt(Step step) {
    try {
        guarded(MainPlace, step);
    } catch (...) {  // reported
    }
}

// What has arrived is written for as long as the log takes it, unless a signal gives that up: the display
// thread ends only then.
void writeOut() {
    const WritingOut writingOut;
    arrivals->close();
    Process.cancel();
    Process.join();
}

// What is left when nobody writes any more is missing at the end of the log, with what was lost last.
void giveUpRest() {
    givenUp = arrivals->discardWaiting();
    while (arrivals->pending() != 0)  // deliveries that have begun end at once
        vela::sleep_ms(PollMs);
    const Discarded queued = discardQueued();
    givenUp += queued.records + arrivals->unwritten();  // one may have gone with a display thread that failed
    if (const std::uint64_t missing = givenUp + queued.missing + arrivals->missing(); missing != 0)
        traceLog.framesMissing(missing);
}

}  // namespace

// The board first, so that nothing more arrives; then the log, whole, before anything that a stream or a
// board can hold up.
void quit() {
    if (ccs == nullptr)
        return;
    shutdownBegins();
    std::cout << "One moment. Program Exiting" << std::endl;
    attempt([] { ccs->CancelEvt(vela::CCS::L2TraceGroup, nullptr); });
    attempt([] { ccs->SetParm(L2TraceParm, 0, nullptr); });
    attempt(writeOut);
    attempt(giveUpRest);
    attempt(closeLog);
    attempt([] { ccs.reset(); });
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

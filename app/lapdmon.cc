#include "app/lapdmon.h"

#include <array>
#include <cerrno>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <memory>
#include <mutex>
#include <optional>
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

// Numbers that the board knows.
constexpr unsigned char tscType = 0x12;
constexpr unsigned char tscProcessor = 1;
constexpr unsigned char ccsType = 0x15;
constexpr unsigned char anyProcessor = 0xFF;
constexpr unsigned int protocolTypeParm = 7;
constexpr unsigned int l2TraceParm = 10;

constexpr unsigned int queueDepth = 50;
constexpr unsigned int pollMs = 10;
constexpr int mainPlace = 749;  // the number in main's report of a foreign exception

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
    vela::TSCComponent tsc(board.findComp(tscType, tscProcessor));
    std::cout << "TSC Component Information" << tsc.getTgtDesc() << std::endl;
    return tsc;
}

std::unique_ptr<vela::CCS> openCcs(const vela::Instance& instance) {
    auto opened = std::make_unique<TracedCcs>(instance.getTgtDesc(), nullptr);
    std::cout << "CCS instance Number" << opened->getTgtDesc() << std::endl;
    return opened;
}

// Finds the CCS instance of the D channel. The screen shows only the board's reply when there is none, so the
// standard error stream says what that means.
vela::Instance findDChannel(vela::Board& board) {
    try {
        return board.findInst(ccsType, anyProcessor, static_cast<unsigned short>(INST_NUM));
    } catch (const vela::Addressable::UnexpectedMsg&) {
        std::cerr << "lapdmon: board " + std::to_string(boardnumber) + " found no D channel " +
                         std::to_string(INST_NUM) + "\n"
                  << std::flush;
        throw;
    }
}

// Tells the board to trace and to report what it traces.
void switchOn(vela::CCS& opened) {
    opened.SetParm(l2TraceParm, 1, nullptr);
    opened.asyncRegisterEvtGroup(vela::CCS::l2TraceGroup, vela::Handler::of<&HANDLE_L2Trace_events>(), 0,
                                 arrivals);
    opened.DetectEvt(vela::CCS::l2TraceGroup, 0, nullptr);
}

template <typename Step>
void withoutReport(Step step) {
    try {
        step();
    } catch (...) {  // the caller has a failure to report that matters more
    }
}

// Switches the trace on. Once the board reports events, quit() switches the trace off and destroys the
// instance. If the board does not get that far, startTrace switches off what may be on, because a request
// that fails may have taken effect. Signals are watched from the start, so that none of them leaves the trace
// on.
void startTrace(std::unique_ptr<vela::CCS> opened) {
    watchSignals();
    try {
        switchOn(*opened);
    } catch (...) {
        withoutReport([&] { opened->CancelEvt(vela::CCS::l2TraceGroup, nullptr); });
        withoutReport([&] { opened->SetParm(l2TraceParm, 0, nullptr); });
        throw;
    }
    ccs = std::move(opened);
    static_cast<void>(std::atexit(quit));
    Process.start(nullptr);
    ccs->getMsgQueue()->connectionLost([](vela::MsgQueue*) { boardLost(); });
}

// Waits until the trace is to end. Returns the exit status.
int untilEnded() {
    if (awaitQuit() == Ending::asked)
        return EXIT_SUCCESS;
    std::cerr << "lapdmon: the board cannot be reached any more, the trace ends\n" << std::flush;
    return EXIT_FAILURE;
}

// Starts the trace and waits until it is to end. Returns the exit status.
int trace(int argc, char** argv) {
    vela::MsgQueue::DefaultDepth = queueDepth;
    parseArgs(argc, argv);
    openLog();
    telvar_header();
    vela::velaInit();

    vela::Board board(static_cast<unsigned int>(boardnumber), nullptr);
    const vela::TSCComponent tsc = findTsc(board);
    const vela::Instance instance = findDChannel(board);
    std::unique_ptr<vela::CCS> opened = openCcs(instance);
    vela::StdResource::MsgGetParmCmplt_t reply;
    opened->GetParm(protocolTypeParm, &reply);
    const std::optional<int> variant = reportProtocol(reply.Val);
    if (!variant)
        return EXIT_FAILURE;  // nothing has been switched on yet
    trunkVariant = *variant;
    startTrace(std::move(opened));
    return untilEnded();
}

// How many frames arrived and were not written because the shutdown was hurried.
std::uint64_t givenUp = 0;

// Writes a line to the standard error stream for each reason for which frames were lost. Returns false when
// there was one. The log itself reports the frames that it could not write.
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

// Runs one step of the shutdown. The next step runs whatever happens in this one.
template <typename Step>
void attempt(Step step) {
    try {
        guarded(mainPlace, step);
    } catch (...) {  // reported
    }
}

// Lets the display thread write every frame that has arrived, as long as the log takes them, and then ends
// that thread. A signal can end the writing before.
void writeOut() {
    const WritingOut writingOut;
    arrivals->close();
    Process.cancel();
    Process.join();
}

// Counts the frames that are left when nobody writes any more, and says at the end of the log how many are
// missing, together with those that were lost last.
void giveUpRest() {
    givenUp = arrivals->discardWaiting();
    while (arrivals->pending() != 0)  // deliveries that have begun end at once
        vela::sleep_ms(pollMs);
    const Discarded queued = discardQueued();
    givenUp += queued.records + arrivals->unwritten();  // one may have gone with a display thread that failed
    if (const std::uint64_t missing = givenUp + queued.missing + arrivals->untold(); missing != 0)
        traceLog.framesMissing(missing);
}

}  // namespace

// First the board stops sending, so that nothing more arrives. Then the log is completed and closed, before
// anything that a stream or the board can delay.
void quit() {
    if (ccs == nullptr)
        return;
    shutdownBegins();
    std::cout << "One moment. Program Exiting" << std::endl;
    attempt([] { ccs->CancelEvt(vela::CCS::l2TraceGroup, nullptr); });
    attempt([] { ccs->SetParm(l2TraceParm, 0, nullptr); });
    attempt(writeOut);
    attempt(giveUpRest);
    attempt(closeLog);
    attempt([] { ccs.reset(); });
}

int runTrace(int argc, char** argv) {
    closeLogWhenUnhandled();
    int status = EXIT_SUCCESS;
    try {
        guarded(mainPlace, [&] { status = trace(argc, argv); });
    } catch (...) {  // reported
        status = EXIT_FAILURE;
    }
    quit();           // now, because its outcome decides the exit status
    discardQueued();  // in case the start has failed
    closeLog();
    vela::velaCleanup();
    return isWhole() ? status : EXIT_FAILURE;
}

}  // namespace app

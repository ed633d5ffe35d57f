// Loaded into a program that runs on the software board (LD_PRELOAD): lets soak.py switch the board's faults
// while the program runs, and ask what is held. FAULT_SWITCH is the number of a descriptor that takes lines
// and answers each:
//
//     faults event-label=3 silent    from now on these and no others: "ok"
//     held                           message buffers not freed, those that wait in a queue among them
//     taken                          trace events of the first D channel that the program has read
//     settle                         the board forgets its journal, free memory goes back to the system: "ok"
//     used                           kB of allocated memory
#include <dlfcn.h>
#include <malloc.h>
#include <unistd.h>

#include <atomic>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <sstream>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "norv/norv.h"
#include "softboard/faults.h"
#include "softboard/softboard.h"

namespace {

std::atomic<unsigned long> taken = 0;

bool isTraceEvent(const NvMsg32Bit& msg) {
    constexpr std::uint32_t evtDetected = 32;
    constexpr std::uint32_t traceGroup = 2;
    constexpr std::uint8_t ccs = 0x15;
    std::uint32_t group = 0;
    if (msg.type != evtDetected || msg.size < sizeof group)
        return false;
    std::memcpy(&group, &msg + 1, sizeof group);
    return group == traceGroup && msg.sourceInstance == 1 && msg.sourceComponent == ccs;
}

std::string answerTo(const std::string& line) {
    std::istringstream words(line);
    std::string word;
    words >> word;
    if (word == "held")
        return std::to_string(softboard::outstanding());
    if (word == "taken")
        return std::to_string(taken);
    if (word == "settle") {
        softboard::clearJournal();
        malloc_trim(0);
        return "ok";
    }
    if (word == "used") {
        const auto memory = mallinfo2();
        return std::to_string((memory.uordblks + memory.hblkhd) / 1024);
    }
    std::vector<softboard::Fault> faults;
    while (words >> word)
        faults.push_back(softboard::parseFault(word));
    softboard::setFaults(faults);
    return "ok";
}

// Until the other end is closed.
void serve(int descriptor) {
    std::string line;
    char octet = 0;
    while (read(descriptor, &octet, 1) == 1) {
        if (octet != '\n') {
            line += octet;
            continue;
        }
        const std::string answer = answerTo(std::exchange(line, {})) + "\n";
        if (write(descriptor, answer.data(), answer.size()) < 0)
            return;
    }
}

// Takes no signals: they are the program's.
void startToServe(int descriptor) {
    sigset_t all{};
    sigset_t before{};
    sigfillset(&all);
    pthread_sigmask(SIG_SETMASK, &all, &before);
    std::thread(serve, descriptor).detach();
    pthread_sigmask(SIG_SETMASK, &before, nullptr);
}

const struct Switch {
    Switch() {
        if (const char* const descriptor = std::getenv("FAULT_SWITCH"); descriptor != nullptr)
            startToServe(static_cast<int>(std::strtol(descriptor, nullptr, 10)));
    }
} theSwitch;

}  // namespace

// Stands before the library's.
extern "C" __attribute__((visibility("default"))) uint32_t nvMsgRead(uint32_t queue, uint32_t zero,
                                                                     NvMsg32Bit** msg) {
    static const auto real = reinterpret_cast<decltype(&nvMsgRead)>(dlsym(RTLD_NEXT, "nvMsgRead"));
    const uint32_t status = real(queue, zero, msg);
    if (status == NVSTATUS_OK && *msg != nullptr && isTraceEvent(**msg))
        ++taken;
    return status;
}

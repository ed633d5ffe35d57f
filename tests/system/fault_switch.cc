// Loaded into a program that runs on the software board (LD_PRELOAD): lets soak.py switch the board's faults
// while the program runs, and ask what is held. FAULT_SWITCH is the number of a descriptor that takes lines
// and answers each:
//
//     faults event-label=3 silent    from now on these and no others: "ok"
//     held                           message buffers not freed, those that wait in a queue among them
//     settle                         the board forgets its journal, free memory goes back to the system: "ok"
//     used                           kB of allocated memory
#include <malloc.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <memory>
#include <sstream>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#include "softboard/faults.h"
#include "softboard/softboard.h"

namespace {

std::string answerTo(const std::string& line) {
    std::istringstream words(line);
    std::string word;
    words >> word;
    if (word == "held")
        return std::to_string(softboard::outstanding());
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

const struct Switch {
    Switch() {
        if (const char* const descriptor = std::getenv("FAULT_SWITCH"); descriptor != nullptr)
            std::thread(serve, static_cast<int>(std::strtol(descriptor, nullptr, 10))).detach();
    }
} theSwitch;

}  // namespace

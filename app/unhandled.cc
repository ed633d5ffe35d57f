#include "app/unhandled.h"

#include <cxxabi.h>
#include <unistd.h>

#include <atomic>
#include <cstdlib>
#include <exception>
#include <iostream>
#include <memory>
#include <sstream>
#include <string>

#include "app/Log.h"
#include "app/display.h"
#include "app/guarded.h"
#include "app/standard_streams.h"
#include "decoder/state.h"

namespace app {

namespace {

constexpr unsigned int patienceMs = 1000;
constexpr unsigned int pollMs = 10;

std::string typeOfException() {
    const std::type_info* const type = abi::__cxa_current_exception_type();
    if (type == nullptr)
        return "no exception";
    char* const plain = abi::__cxa_demangle(type->name(), nullptr, nullptr, nullptr);
    std::string name = plain == nullptr ? type->name() : plain;
    std::free(plain);  // NOLINT(*-no-malloc): allocated by the library
    return name;
}

std::string whatIsWrong() {
    std::ostringstream text;
    text << typeOfException();
    try {
        if (const std::exception_ptr thrown = std::current_exception(); thrown != nullptr)
            std::rethrow_exception(thrown);
    } catch (const vela::Exception& exception) {
        text << ": " << exception;
    } catch (const std::exception& exception) {
        text << ": " << exception.what();
    } catch (...) {  // the name of its type is reported
    }
    return text.str();
}

std::string place() {
    return guardedPlace == 0 ? "in a thread of the layers below"
                             : "in lapdmon(" + std::to_string(guardedPlace) + ")";
}

// Closes the log, unless another thread holds it for too long.
void closeInTime() {
    if (!queueGuard.tryLock(patienceMs, pollMs))
        return;
    decoder::ofp = nullptr;  // the display thread may go on until the process ends
    traceLog.close();
    queueGuard.unlock();
}

// Memory that is freed before the last report, because the process may end for want of memory.
constexpr std::size_t reserveSize = 65536;
std::atomic<char*> reserve = nullptr;

void sayWhatAndWhere() {
    try {
        std::cerr << "lapdmon: the trace ends, nobody handled " + whatIsWrong() + " " + place() + "\n"
                  << std::flush;
    } catch (...) {
        std::cerr << "lapdmon: the trace ends, nobody handled an exception\n" << std::flush;
    }
}

[[noreturn]] void endUnhandled() {
    std::unique_ptr<char[]>(reserve.exchange(nullptr)).reset();
    try {
        closeInTime();
    } catch (...) {  // the report is more important
    }
    endStandardStreams();  // from here on words need no memory and no other thread
    sayWhatAndWhere();
    _exit(EXIT_FAILURE);
}

}  // namespace

void closeLogWhenUnhandled() {
    if (reserve == nullptr)
        reserve = std::make_unique<char[]>(reserveSize).release();
    std::set_terminate(endUnhandled);
}

}  // namespace app

#include "bench/road/traced.h"

#include <dlfcn.h>
#include <sys/mman.h>
#include <unistd.h>

#include <array>
#include <cstdlib>

#include "app/lapdmon.h"
#include "bench/road/stamps.h"
#include "norv/norv.h"

namespace {

constexpr std::uint32_t evtDetected = 32;

bench::Stamps* stamps = nullptr;

}  // namespace

// The program calls this function instead of the library's, which this one calls.
uint32_t nvMsgRead(uint32_t queue, uint32_t zero, NvMsg32Bit** msg) {
    static const auto real = reinterpret_cast<decltype(&nvMsgRead)>(dlsym(RTLD_NEXT, "nvMsgRead"));
    const uint32_t status = real(queue, zero, msg);
    if (status == NVSTATUS_OK && stamps != nullptr && (*msg)->type == evtDetected) {
        while (stamps->tooFarAhead())
            usleep(100);
        stamps->add(bench::nowNs());
    }
    return status;
}

namespace bench {

int runTraced(int stampsDescriptor, char* log) {
    void* const shared =
        mmap(nullptr, sizeof(Stamps), PROT_READ | PROT_WRITE, MAP_SHARED, stampsDescriptor, 0);
    if (shared == MAP_FAILED)
        return EXIT_FAILURE;
    stamps = static_cast<Stamps*>(shared);
    std::array<char, 8> program{"lapdmon"};
    std::array<char, 4> board{"-b1"};
    std::array<char, 3> file{"-f"};
    std::array<char*, 5> arguments{program.data(), board.data(), file.data(), log, nullptr};
    return app::runTrace(4, arguments.data());
}

}  // namespace bench

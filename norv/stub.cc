// A libnorv.so to link with where the board's package is not installed. It is never to be loaded: whatever is
// called says so and ends the process.
#include <unistd.h>

#include <cstdlib>
#include <string_view>

#include "norv/norv.h"

namespace {

[[noreturn]] uint32_t refuse() {
    constexpr std::string_view line =
        "libnorv.so: this is the library to link with; put the folder of the board's own into "
        "LD_LIBRARY_PATH\n";
    static_cast<void>(!write(STDERR_FILENO, line.data(), line.size()));
    std::abort();
}

}  // namespace

uint32_t nvDrvSetInterface(uint32_t /*unused*/, uint32_t /*unused*/) { refuse(); }
uint32_t nvMsgAllocate(uint32_t /*size*/, NvMsg32Bit** /*msg*/) { refuse(); }
uint32_t nvMsgReallocate(uint32_t /*size*/, NvMsg32Bit** /*msg*/) { refuse(); }
uint32_t nvMsgFree(NvMsg32Bit* /*msg*/) { refuse(); }
uint32_t nvMsgFieldGet(NvMsg32Bit* /*msg*/, uint32_t /*index*/, void* /*value*/) { refuse(); }
uint32_t nvMsgFieldPut(NvMsg32Bit* /*msg*/, uint32_t /*index*/, void* /*value*/) { refuse(); }
uint32_t nvMsgVarFieldGet(NvMsg32Bit* /*msg*/, uint32_t /*count*/, uint32_t* /*offset*/, ...) { refuse(); }
uint32_t nvMsgVarFieldPut(NvMsg32Bit* /*msg*/, uint32_t /*count*/, uint32_t* /*offset*/, ...) { refuse(); }
uint32_t nvQueueOpen() { refuse(); }
uint32_t nvQueueBind(uint32_t /*queue*/, NvCompDesc* /*host*/) { refuse(); }
uint32_t nvQueueUnbind(uint32_t /*queue*/, NvCompDesc /*host*/) { refuse(); }
uint32_t nvQueueClose(uint32_t /*queue*/) { refuse(); }
uint32_t nvMsgRead(uint32_t /*queue*/, uint32_t /*zero*/, NvMsg32Bit** /*msg*/) { refuse(); }
uint32_t nvMsgWrite(uint32_t /*queue*/, NvMsg32Bit* /*msg*/, uint32_t /*zero*/) { refuse(); }

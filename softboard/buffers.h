// The message buffers that the library has given out. Safe from any thread.
#ifndef SOFTBOARD_BUFFERS_H
#define SOFTBOARD_BUFFERS_H

#include <condition_variable>
#include <cstddef>
#include <cstdint>
#include <deque>
#include <memory>
#include <mutex>
#include <unordered_map>

#include "softboard/abi.h"

namespace softboard {

// Every call names the transport function it serves, for the report when a buffer is misused: a pointer that
// never was a buffer, one that was freed, or one that was handed over with nvMsgWrite.
class Buffers {
  public:
    static constexpr uint32_t largestBody = 1U << 24;

    // Null when there is no memory, or the body would be too large. The host owns the buffer.
    NvMsg32Bit* allocate(uint32_t size);
    // Null, and the old buffer stays, when there is no memory.
    NvMsg32Bit* reallocate(const char* function, NvMsg32Bit* msg, uint32_t size);
    void free(const char* function, const NvMsg32Bit* msg);

    // The host's buffer becomes the library's and the other way round.
    void takeOver(const char* function, const NvMsg32Bit* msg);
    void handOut(const NvMsg32Bit* msg);
    // Ends a buffer that the library owns.
    void release(const NvMsg32Bit* msg);

    // Octets of body that may be touched through the host's buffer.
    uint32_t bodySize(const char* function, const NvMsg32Bit* msg) const;

    // Buffers not freed yet, whoever owns them.
    size_t outstanding() const;
    // False when `limit` has passed first.
    bool waitForOutstanding(size_t count, std::chrono::milliseconds limit) const;

  private:
    struct Entry {
        std::unique_ptr<std::byte[]> memory;
        uint32_t size = 0;
        bool host = true;
    };
    using Entries = std::unordered_map<const NvMsg32Bit*, Entry>;

    Entries::const_iterator findHosts(const char* function, const NvMsg32Bit* msg) const;
    void retire(Entries::const_iterator entry);

    mutable std::mutex lock_;
    mutable std::condition_variable fewer_;
    Entries live_;
    // Freed of late: kept for a while, overwritten, so that use after free shows and is told from a foreign
    // pointer.
    std::deque<std::pair<const NvMsg32Bit*, std::unique_ptr<std::byte[]>>> freed_;
};

}  // namespace softboard

#endif

// The message buffers of the library, and who owns each: the host or the library.
//
// Any thread may call any function; the class has a lock of its own.
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

// A function that takes a pointer from the host checks it. If the pointer never was a buffer, or was freed,
// or was handed over with nvMsgWrite, the process ends with a report (misuse.h). `function` is the name of
// the transport function that the host called; the report names it.
class Buffers {
  public:
    static constexpr uint32_t largestBody = 1U << 24;

    // Makes a buffer that the host owns. Returns null when there is no memory or `size` (octets of body) is
    // above largestBody.
    NvMsg32Bit* allocate(uint32_t size);
    // Replaces the host's buffer by one of the new size with the same header and body. Returns null, and
    // keeps the old buffer, when there is no memory.
    NvMsg32Bit* reallocate(const char* function, NvMsg32Bit* msg, uint32_t size);
    void free(const char* function, const NvMsg32Bit* msg);

    // takeOver makes the library the owner of the host's buffer; handOut makes the host the owner again.
    void takeOver(const char* function, const NvMsg32Bit* msg);
    void handOut(const NvMsg32Bit* msg);
    // Frees a buffer that the library owns.
    void release(const NvMsg32Bit* msg);

    // The octets of body that the host may read and write through its buffer.
    uint32_t bodySize(const char* function, const NvMsg32Bit* msg) const;

    // How many buffers are not freed yet, those of the host and of the library together.
    size_t outstanding() const;
    // Waits until outstanding() is `count`. Returns false when `limit` has passed before.
    bool waitForOutstanding(size_t count, std::chrono::milliseconds limit) const;

  private:
    struct Entry {
        std::unique_ptr<std::byte[]> memory;
        uint32_t size = 0;
        bool host = true;  // the host owns it, not the library
    };
    using Entries = std::unordered_map<const NvMsg32Bit*, Entry>;

    Entries::const_iterator findHosts(const char* function, const NvMsg32Bit* msg) const;
    void retire(Entries::const_iterator entry);

    mutable std::mutex lock_;
    mutable std::condition_variable fewer_;
    Entries live_;
    // The buffers that were freed last. Their memory is overwritten and kept, so that a host that uses a
    // freed buffer is found out, and its pointer is told from one that never was a buffer.
    std::deque<std::pair<const NvMsg32Bit*, std::unique_ptr<std::byte[]>>> freed_;
};

}  // namespace softboard

#endif

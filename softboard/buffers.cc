#include "softboard/buffers.h"

#include <algorithm>
#include <cstring>
#include <new>

#include "softboard/misuse.h"

namespace softboard {

namespace {

constexpr size_t remembered = 256;   // freed buffers that are kept
constexpr size_t fewBuckets = 4096;  // a table of this size is not worth shrinking
constexpr auto freedOctet = std::byte{0xdd};

// The address sanitizer itself keeps freed memory for a while and reports who touches it. Then the memory is
// freed at once, so that the sanitizer can do so.
#if defined(__SANITIZE_ADDRESS__)
constexpr bool keepsMemory = false;
#else
constexpr bool keepsMemory = true;
#endif

size_t bufferSize(uint32_t size) { return size_t{size} + NVMSG_OVERHEAD; }

}  // namespace

NvMsg32Bit* Buffers::allocate(uint32_t size) {
    if (size > largestBody) {
        return nullptr;
    }
    std::unique_ptr<std::byte[]> memory(new (std::nothrow) std::byte[bufferSize(size)]());
    if (!memory) {
        return nullptr;
    }
    auto* msg = reinterpret_cast<NvMsg32Bit*>(memory.get());
    msg->size = size;
    const std::lock_guard guard(lock_);
    std::erase_if(freed_, [msg](const auto& freed) { return freed.first == msg; });
    live_[msg] = {std::move(memory), size, true};
    return msg;
}

NvMsg32Bit* Buffers::reallocate(const char* function, NvMsg32Bit* msg, uint32_t size) {
    const uint32_t kept = std::min(bodySize(function, msg), size);
    NvMsg32Bit* larger = allocate(size);
    if (larger == nullptr) {
        return nullptr;
    }
    std::memcpy(larger, msg, NVMSG_HEADER_SIZE + size_t{kept});
    larger->size = size;
    free(function, msg);
    return larger;
}

void Buffers::free(const char* function, const NvMsg32Bit* msg) {
    const std::lock_guard guard(lock_);
    retire(findHosts(function, msg));
}

void Buffers::takeOver(const char* function, const NvMsg32Bit* msg) {
    const std::lock_guard guard(lock_);
    const auto entry = findHosts(function, msg);
    if (msg->size > entry->second.size) {
        misuse(function, "the header says " + std::to_string(msg->size) +
                             " octets of body, the buffer holds " + std::to_string(entry->second.size));
    }
    live_[msg].host = false;
}

void Buffers::handOut(const NvMsg32Bit* msg) {
    const std::lock_guard guard(lock_);
    live_[msg].host = true;
}

void Buffers::release(const NvMsg32Bit* msg) {
    const std::lock_guard guard(lock_);
    retire(live_.find(msg));
}

uint32_t Buffers::bodySize(const char* function, const NvMsg32Bit* msg) const {
    const std::lock_guard guard(lock_);
    return std::min(findHosts(function, msg)->second.size, msg->size);
}

size_t Buffers::outstanding() const {
    const std::lock_guard guard(lock_);
    return live_.size();
}

bool Buffers::waitForOutstanding(size_t count, std::chrono::milliseconds limit) const {
    std::unique_lock guard(lock_);
    return fewer_.wait_for(guard, limit, [&] { return live_.size() == count; });
}

Buffers::Entries::const_iterator Buffers::findHosts(const char* function, const NvMsg32Bit* msg) const {
    const auto entry = live_.find(msg);
    if (entry == live_.end()) {
        const bool was =
            std::any_of(freed_.begin(), freed_.end(), [msg](const auto& f) { return f.first == msg; });
        misuse(function, msg == nullptr ? "a null pointer instead of a message buffer"
                         : was          ? "the message buffer was freed before"
                                        : "the pointer is not a message buffer");
    }
    if (!entry->second.host) {
        misuse(function, "the message buffer was handed over with nvMsgWrite");
    }
    return entry;
}

void Buffers::retire(Entries::const_iterator entry) {
    auto node = live_.extract(entry);
    auto& memory = node.mapped().memory;
    if (keepsMemory) {
        std::fill_n(memory.get(), bufferSize(node.mapped().size), freedOctet);
    } else {
        memory.reset();
    }
    freed_.emplace_back(node.key(), std::move(memory));
    if (freed_.size() > remembered) {
        freed_.pop_front();
    }
    if (live_.bucket_count() > fewBuckets && live_.size() < live_.bucket_count() / 64) {
        live_.rehash(0);  // a backlog has been freed: give the memory of its large table back
    }
    fewer_.notify_all();
}

}  // namespace softboard

// Loaded into a program (LD_PRELOAD): its threads from the number FEW_FROM to the number FEW_TO are refused,
// as by a system that has no more. The same with FEW_NODES_FROM and FEW_NODES_TO for memory that the program
// asks for without an exception, which is that of the nodes of its queue.
#include <dlfcn.h>
#include <pthread.h>

#include <atomic>
#include <cerrno>
#include <cstddef>
#include <cstdlib>
#include <new>

namespace {

std::atomic<int> made = 0;
std::atomic<int> nodes = 0;

int numberFrom(const char* variable) {
    const char* const text = std::getenv(variable);
    return text == nullptr ? 0 : static_cast<int>(std::strtol(text, nullptr, 10));
}

}  // namespace

void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
    const int number = ++nodes;
    if (numberFrom("FEW_NODES_FROM") <= number && number <= numberFrom("FEW_NODES_TO"))
        return nullptr;
    try {
        return operator new(size);
    } catch (...) {
        return nullptr;
    }
}

extern "C" int pthread_create(pthread_t* thread, const pthread_attr_t* attributes, void* (*entry)(void*),
                              void* argument) {
    static const auto real = reinterpret_cast<decltype(&pthread_create)>(dlsym(RTLD_NEXT, "pthread_create"));
    const int number = ++made;
    if (numberFrom("FEW_FROM") <= number && number <= numberFrom("FEW_TO"))
        return EAGAIN;
    return real(thread, attributes, entry, argument);
}

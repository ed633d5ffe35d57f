// Loaded into a program (LD_PRELOAD): its threads from the number FEW_FROM to the number FEW_TO on are
// refused, as by a system that has no more.
#include <dlfcn.h>
#include <pthread.h>

#include <atomic>
#include <cerrno>
#include <cstdlib>

namespace {

std::atomic<int> made = 0;

int numberFrom(const char* variable) {
    const char* const text = std::getenv(variable);
    return text == nullptr ? 0 : static_cast<int>(std::strtol(text, nullptr, 10));
}

}  // namespace

extern "C" int pthread_create(pthread_t* thread, const pthread_attr_t* attributes, void* (*entry)(void*),
                              void* argument) {
    static const auto real = reinterpret_cast<decltype(&pthread_create)>(dlsym(RTLD_NEXT, "pthread_create"));
    const int number = ++made;
    if (numberFrom("FEW_FROM") <= number && number <= numberFrom("FEW_TO"))
        return EAGAIN;
    return real(thread, attributes, entry, argument);
}

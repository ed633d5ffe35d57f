#include "hostsvc/hostnames.h"

#include <netdb.h>

#include <array>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <vector>

int is_dn(const char* name) {
    for (; *name != '\0'; ++name) {
        if (static_cast<signed char>(*name) > '9')
            return 1;
    }
    return 0;
}

void dntoip(char* dst, const char* name) {
    constexpr std::size_t textSize = 16;
    *dst = '\0';
    hostent host{};
    hostent* found = nullptr;
    int why = 0;
    std::vector<char> room(1024);
    while (gethostbyname_r(name, &host, room.data(), room.size(), &found, &why) == ERANGE)
        room.resize(2 * room.size());
    if (found == nullptr || found->h_addr_list[0] == nullptr)
        return;
    std::array<unsigned char, 4> octets{};
    std::memcpy(octets.data(), found->h_addr_list[0], octets.size());
    static_cast<void>(
        std::snprintf(dst, textSize, "%u.%u.%u.%u", octets[0], octets[1], octets[2], octets[3]));
}

int stn(const char* text) {
    if (std::strpbrk(text, "xX") == nullptr)
        return static_cast<int>(std::strtol(text, nullptr, 10));
    const bool negative = *text == '-';
    unsigned value = 0;
    if (std::sscanf(negative ? text + 1 : text, "0x%x", &value) != 1)  // NOLINT(cert-err34-c)
        value = 0;
    return static_cast<int>(negative ? 0 - value : value);
}

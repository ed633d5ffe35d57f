#include "fleet/subjects.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cstdint>
#include <vector>

#include "capture/hex_digits.h"

namespace fleet {

namespace {

constexpr std::string_view prefix = "lapd.";
constexpr std::string_view deadPrefix = "lapd-dead.";
constexpr std::size_t longestName = 64;

bool isPlain(char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == '-' || c == '_';
}

std::string escaped(std::string_view name) {
    constexpr std::string_view digits = "0123456789ABCDEF";
    std::string text;
    for (const char c : name) {
        const auto octet = static_cast<unsigned char>(c);
        if (isPlain(c))
            text += c;
        else
            text += {'%', digits[octet >> 4U], digits[octet & 15U]};
    }
    return text;
}

std::string unescaped(std::string_view text) {
    std::string name;
    for (std::size_t at = 0; at < text.size(); ++at) {
        if (text[at] != '%') {
            name += text[at];
            continue;
        }
        const bool isWhole = at + 2 < text.size();
        const int high = isWhole ? capture::hexValue(text[at + 1]) : -1;
        const int low = isWhole ? capture::hexValue(text[at + 2]) : -1;
        if (high < 0 || low < 0)
            throw BadSubject("a \"%\" without two hexadecimal digits");
        name += static_cast<char>(high * 16 + low);
        at += 2;
    }
    return name;
}

// A name has one form only, so that two subjects are never one D channel.
std::string nameIn(std::string_view text) {
    std::string name = unescaped(text);
    if (!isName(name))
        throw BadSubject("a name that is empty, too long, or has characters that names must not have");
    if (escaped(name) != text)
        throw BadSubject("a name that is not written as shippers write it");
    return name;
}

std::vector<std::string_view> split(std::string_view text) {
    std::vector<std::string_view> parts;
    for (;;) {
        const std::size_t dot = text.find('.');
        parts.push_back(text.substr(0, dot));
        if (dot == std::string_view::npos)
            return parts;
        text.remove_prefix(dot + 1);
    }
}

unsigned partitionIn(std::string_view text) {
    unsigned partition = partitions;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), partition);
    if (error != std::errc() || partition >= partitions || std::to_string(partition) != text)
        throw BadSubject("a partition that is no number from 0 to 63");
    return partition;
}

std::uint64_t fnv1a(std::string_view text) {
    std::uint64_t hash = 0xcbf29ce484222325;
    for (const char c : text) {
        hash ^= static_cast<unsigned char>(c);
        hash *= 0x100000001b3;
    }
    return hash;
}

}  // namespace

bool isName(std::string_view text) {
    constexpr auto isPrintable = [](char c) { return c >= ' ' && c <= '~'; };
    return !text.empty() && text.size() <= longestName && std::ranges::all_of(text, isPrintable);
}

std::string toText(const Address& address) {
    return escaped(address.site) + "/" + escaped(address.host) + "/" + escaped(address.board) + "/" +
           escaped(address.dChannel);
}

unsigned partitionOf(const Address& address, std::string_view group) {
    const std::string text = group.empty() ? toText(address) : escaped(address.site) + "/" + escaped(group);
    const std::uint64_t hash = fnv1a(text);
    return static_cast<unsigned>((hash ^ hash >> 32U) % partitions);
}

std::string toText(const Subject& subject) {
    const Address& address = subject.address;
    std::string text = std::string(prefix) + std::to_string(subject.partition);
    for (const std::string* name : {&address.site, &address.host, &address.board, &address.dChannel})
        text += "." + escaped(*name);
    return text;
}

Subject subjectIn(std::string_view text) {
    const std::vector<std::string_view> parts = split(text);
    if (parts.size() != 6 || !text.starts_with(prefix))
        throw BadSubject("not \"lapd\" and five parts behind it");
    return {partitionIn(parts[1]), {nameIn(parts[2]), nameIn(parts[3]), nameIn(parts[4]), nameIn(parts[5])}};
}

std::string subjectsOf(unsigned partition) { return std::string(prefix) + std::to_string(partition) + ".>"; }

std::string deadSubjectOf(std::string_view subject) {
    return std::string(deadPrefix) +
           std::string(subject.starts_with(prefix) ? subject.substr(prefix.size()) : subject);
}

}  // namespace fleet

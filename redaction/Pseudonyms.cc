#include "redaction/Pseudonyms.h"

#include <openssl/evp.h>
#include <openssl/params.h>

#include <algorithm>
#include <array>
#include <cstring>
#include <string_view>
#include <utility>

namespace redaction {

namespace {

// Sets of octets. An octet is replaced by one of the same set. Pseudonyms depend on these numbers, so do not
// change them.
enum class Alphabet : std::uint8_t {
    digits,
    capitals,
    small,
    marks,
    controls,
    high,
    upperBits,
    lowerBits,
    none
};

constexpr std::size_t largest = 128;  // the most symbols that an alphabet has

struct Symbols {
    std::array<Alphabet, 256> alphabetOf{};
    std::array<std::uint8_t, 256> placeOf{};
    std::array<std::array<std::uint8_t, largest>, 6> octetsOf{};
    std::array<std::uint8_t, 6> sizes{};
};

constexpr Alphabet alphabetOf(unsigned octet) {
    if (octet == '*' || octet == '#')
        return Alphabet::none;
    if (octet >= '0' && octet <= '9')
        return Alphabet::digits;
    if (octet >= 'A' && octet <= 'Z')
        return Alphabet::capitals;
    if (octet >= 'a' && octet <= 'z')
        return Alphabet::small;
    if (octet >= 0x80)
        return Alphabet::high;
    return octet < 0x20 || octet == 0x7F ? Alphabet::controls : Alphabet::marks;
}

consteval Symbols makeSymbols() {
    Symbols made;
    for (unsigned octet = 0; octet < 256; ++octet) {
        const Alphabet alphabet = alphabetOf(octet);
        made.alphabetOf[octet] = alphabet;
        if (alphabet == Alphabet::none)
            continue;
        const auto index = static_cast<std::size_t>(alphabet);
        made.placeOf[octet] = made.sizes[index];
        made.octetsOf[index][made.sizes[index]++] = static_cast<std::uint8_t>(octet);
    }
    return made;
}

constexpr Symbols symbols = makeSymbols();

// HMAC with SHA-512 (FIPS 198-1).
class Mac {
  public:
    using Digest = std::array<std::uint8_t, 64>;

    explicit Mac(std::span<const std::uint8_t> key) {
        char digest[] = "SHA512";
        const OSSL_PARAM parameters[] = {OSSL_PARAM_construct_utf8_string("digest", digest, 0),
                                         OSSL_PARAM_construct_end()};
        algorithm_.reset(EVP_MAC_fetch(nullptr, "HMAC", nullptr));
        context_.reset(algorithm_ == nullptr ? nullptr : EVP_MAC_CTX_new(algorithm_.get()));
        if (context_ == nullptr || EVP_MAC_init(context_.get(), key.data(), key.size(), parameters) != 1)
            throw KeyError("this host's libcrypto has no HMAC with SHA-512");
    }

    Digest of(std::string_view text) {
        Digest digest{};
        std::size_t size = 0;
        const bool done =
            EVP_MAC_init(context_.get(), nullptr, 0, nullptr) == 1 &&
            EVP_MAC_update(context_.get(), reinterpret_cast<const unsigned char*>(text.data()),  // NOLINT
                           text.size()) == 1 &&
            EVP_MAC_final(context_.get(), digest.data(), &size, digest.size()) == 1;
        if (!done || size != digest.size())
            throw KeyError("libcrypto failed to make a pseudonym");
        return digest;
    }

  private:
    struct Free {
        void operator()(EVP_MAC* algorithm) const { EVP_MAC_free(algorithm); }
        void operator()(EVP_MAC_CTX* context) const { EVP_MAC_CTX_free(context); }
    };
    std::unique_ptr<EVP_MAC, Free> algorithm_;
    std::unique_ptr<EVP_MAC_CTX, Free> context_;
};

// Numbers of 16 bits that look random, taken from digests of one text.
class Draws {
  public:
    Draws(Mac& mac, Alphabet alphabet, std::string_view before)
        : mac_(mac), text_{static_cast<char>(alphabet), '\0'} {
        text_ += before;
    }
    std::size_t below(std::size_t limit) {
        if (at_ == digest_.size()) {
            digest_ = mac_.of(text_);
            ++text_[1];  // the next digest is another one
            at_ = 0;
        }
        const std::size_t upper = digest_[at_++];
        const std::size_t lower = digest_[at_++];
        return (upper * 256 + lower) % limit;
    }

  private:
    Mac& mac_;
    std::string text_;
    Mac::Digest digest_{};
    std::size_t at_ = digest_.size();
};

class KeyedPseudonyms final : public Pseudonyms {
  public:
    KeyedPseudonyms(const Key& key, Direction direction)
        : mac_(key.secret), kept_(key.manner.keepPrefix), direction_(direction) {}

    void replaceCharacters(std::span<std::uint8_t> octets, std::string& before, Characters kind) override {
        for (std::uint8_t& octet : octets) {
            const std::uint8_t original = replaceCharacter(octet, before, kind);
            before += static_cast<char>(original);
        }
    }

    // Replaces half an octet at a time, because an octet of user data may hold two digits.
    void replaceOctets(std::span<std::uint8_t> octets) override {
        std::string before;
        for (std::uint8_t& octet : octets) {
            const auto [upper, upperOriginal] =
                substitute(Alphabet::upperBits, 16, static_cast<std::uint8_t>(octet >> 4U), before);
            before += static_cast<char>(upperOriginal);
            const auto [lower, lowerOriginal] =
                substitute(Alphabet::lowerBits, 16, static_cast<std::uint8_t>(octet & 15U), before);
            before.back() = static_cast<char>(upperOriginal << 4U | lowerOriginal);
            octet = static_cast<std::uint8_t>(upper << 4U | lower);
        }
    }

  private:
    // Returns what the character is without pseudonym.
    std::uint8_t replaceCharacter(std::uint8_t& octet, std::string_view before, Characters kind) {
        const Alphabet alphabet = symbols.alphabetOf[octet];
        if (alphabet == Alphabet::none)
            return octet;
        std::string_view context = before;
        if (alphabet == Alphabet::digits) {
            const std::size_t last = before.find_last_not_of("0123456789");
            context = before.substr(last == std::string_view::npos ? 0 : last + 1);
            if (kind == Characters::number && context.size() < kept_)
                return octet;
        }
        const auto index = static_cast<std::size_t>(alphabet);
        const auto& octets = symbols.octetsOf[index];
        const auto [other, original] =
            substitute(alphabet, symbols.sizes[index], symbols.placeOf[octet], context);
        octet = octets[other];
        return octets[original];
    }

    // Returns the replacement of a symbol, and the symbol without pseudonym. Sattolo's algorithm makes a
    // cycle of all symbols, so every symbol is replaced by another one.
    std::pair<std::uint8_t, std::uint8_t> substitute(Alphabet alphabet, std::size_t size, std::uint8_t symbol,
                                                     std::string_view before) {
        std::array<std::uint8_t, largest> cycle{};
        for (std::size_t i = 0; i < size; ++i)
            cycle[i] = static_cast<std::uint8_t>(i);
        Draws draws(mac_, alphabet, before);
        for (std::size_t i = size - 1; i > 0; --i)
            std::swap(cycle[i], cycle[draws.below(i)]);
        if (direction_ == Direction::redact)
            return {cycle[symbol], symbol};
        const auto* const found =
            std::find(cycle.begin(), cycle.begin() + static_cast<std::ptrdiff_t>(size), symbol);
        const auto original = static_cast<std::uint8_t>(found - cycle.begin());
        return {original, original};
    }

    Mac mac_;
    std::size_t kept_;
    Direction direction_;
};

}  // namespace

std::unique_ptr<Pseudonyms> makePseudonyms(const Key& key, Direction direction) {
    return std::make_unique<KeyedPseudonyms>(key, direction);
}

std::string checkOf(const Key& key) {
    constexpr std::string_view digits = "0123456789abcdef";
    constexpr std::size_t octets = 8;
    // No pseudonym is made of a text that begins like this.
    const std::string text =
        "check " + std::to_string(key.manner.keepPrefix) + (key.manner.blankShort ? "s" : "");
    const Mac::Digest digest = Mac(key.secret).of(text);
    std::string check;
    for (const std::uint8_t octet : std::span(digest).first(octets))
        check += {digits[octet >> 4U], digits[octet & 15U]};
    return check;
}

}  // namespace redaction

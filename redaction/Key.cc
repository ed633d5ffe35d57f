#include "redaction/Key.h"

#include <fcntl.h>
#include <openssl/rand.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <charconv>
#include <cstring>
#include <sstream>
#include <string_view>

namespace redaction {

namespace {

constexpr std::string_view title = "lapdread key 1\n";
constexpr std::string_view prefixWord = "keep-prefix ";
constexpr std::string_view shortWord = "blank-short ";
constexpr std::size_t longestFile = 200;

class Descriptor {
  public:
    explicit Descriptor(int descriptor) : descriptor_(descriptor) {}
    ~Descriptor() {
        if (descriptor_ >= 0)
            close(descriptor_);
    }
    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;
    int get() const { return descriptor_; }

  private:
    int descriptor_;
};

[[noreturn]] void fail(const std::string& path, const char* does) {
    throw KeyError(std::string("cannot ") + does + " " + path + ": " + std::strerror(errno));
}

std::string hexOf(const std::array<std::uint8_t, 32>& secret) {
    constexpr std::string_view digits = "0123456789abcdef";
    std::string text;
    for (const std::uint8_t octet : secret)
        text += {digits[octet >> 4U], digits[octet & 15U]};
    return text;
}

std::string textOf(const Key& key) {
    return std::string(title) + std::string(prefixWord) + std::to_string(key.manner.keepPrefix) + "\n" +
           std::string(shortWord) + (key.manner.blankShort ? "yes" : "no") + "\n" + hexOf(key.secret) + "\n";
}

bool readSecret(std::string_view text, Key& key) {
    if (text.size() != 2 * key.secret.size())
        return false;
    for (std::size_t i = 0; i < key.secret.size(); ++i) {
        const char* const at = text.data() + 2 * i;
        if (std::from_chars(at, at + 2, key.secret[i], 16).ptr != at + 2)
            return false;
    }
    return true;
}

// Reads exactly the form that writeKey writes.
std::optional<Key> parse(const std::string& text) {
    std::istringstream lines(text);
    std::string line;
    std::string secret;
    Key key;
    std::getline(lines, line);
    std::string word;
    lines >> word >> key.manner.keepPrefix >> word >> word >> secret;
    key.manner.blankShort = word == "yes";
    const bool isKey = readSecret(secret, key) && key.manner.keepPrefix <= Manner::mostKept;
    return isKey && textOf(key) == text ? std::optional(key) : std::nullopt;
}

}  // namespace

Key randomKey(const Manner& manner) {
    Key key{.secret = {}, .manner = manner};
    if (RAND_bytes(key.secret.data(), static_cast<int>(key.secret.size())) != 1)
        throw KeyError("the system gives no random numbers for a key");
    return key;
}

std::optional<Key> readKey(const std::string& path) {
    // Without O_NONBLOCK, opening a FIFO would wait for a writer.
    const Descriptor file(open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
    if (file.get() < 0 && errno == ENOENT)
        return std::nullopt;
    struct stat about {};
    if (file.get() < 0 || fstat(file.get(), &about) != 0)
        fail(path, "read the key");
    if (!S_ISREG(about.st_mode))
        throw KeyError(path + " is no key file");
    if ((about.st_mode & (S_IRWXG | S_IRWXO)) != 0)
        throw KeyError("others may read or write the key " + path + ": chmod 600 it, or make another one");
    std::string text(longestFile, '\0');
    const ssize_t size = read(file.get(), text.data(), text.size());
    if (size < 0)
        fail(path, "read the key");
    text.resize(static_cast<std::size_t>(size));
    const std::optional<Key> key = parse(text);
    if (!key)
        throw KeyError(path + " is no key file");
    return key;
}

void writeKey(const std::string& path, const Key& key) {
    const Descriptor file(
        open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, S_IRUSR | S_IWUSR));
    if (file.get() < 0)
        fail(path, "make the key");
    const std::string text = textOf(key);
    if (write(file.get(), text.data(), text.size()) == static_cast<ssize_t>(text.size()) &&
        fsync(file.get()) == 0)
        return;
    const int reason = errno;
    unlink(path.c_str());  // do not leave half a key
    errno = reason;
    fail(path, "write the key");
}

}  // namespace redaction

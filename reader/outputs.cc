#include "reader/outputs.h"

#include <sys/stat.h>

#include <algorithm>
#include <fstream>

#include "reader/errors.h"

namespace reader {

namespace {

constexpr std::size_t beginningSize = 4096;

std::string beginningOf(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    std::string beginning(beginningSize, '\0');
    file.read(beginning.data(), static_cast<std::streamsize>(beginning.size()));
    beginning.resize(static_cast<std::size_t>(file.gcount()));
    return beginning;
}

}  // namespace

void checkOutput(const std::string& path, std::span<const std::string> inputs, std::string_view form,
                 bool (*looksRight)(std::string_view beginning)) {
    struct stat out {};
    if (stat(path.c_str(), &out) != 0 || !S_ISREG(out.st_mode))
        return;
    for (const std::string& input : inputs) {
        struct stat in {};
        if (stat(input.c_str(), &in) == 0 && in.st_dev == out.st_dev && in.st_ino == out.st_ino)
            throw FileError(path + " is read and cannot be written at the same time");
    }
    const std::string beginning = beginningOf(path);
    if (out.st_size > 0 && !looksRight(beginning))
        throw FileError(path + " is not written over: it is not empty and does not look like " +
                        std::string(form));
}

}  // namespace reader

#include "reader/outputs.h"

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <fstream>

#include "reader/errors.h"

namespace reader {

namespace {

constexpr std::size_t beginningSize = 4096;

}  // namespace

std::string beginningOf(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    std::string beginning(beginningSize, '\0');
    file.read(beginning.data(), static_cast<std::streamsize>(beginning.size()));
    beginning.resize(static_cast<std::size_t>(file.gcount()));
    return beginning;
}

namespace {

void refuseInput(const struct stat& out, const std::string& name, std::span<const std::string> inputs) {
    for (const std::string& input : inputs) {
        struct stat in {};
        const int failed = input == "-" ? fstat(STDIN_FILENO, &in) : stat(input.c_str(), &in);
        if (failed == 0 && in.st_dev == out.st_dev && in.st_ino == out.st_ino)
            throw FileError(name + " is read and cannot be written at the same time");
    }
}

}  // namespace

bool checkOutput(const std::string& path, std::span<const std::string> inputs, std::string_view form,
                 bool (*looksRight)(std::string_view beginning)) {
    struct stat out {};
    if (stat(path.c_str(), &out) != 0)
        return true;
    if (!S_ISREG(out.st_mode))
        return false;
    refuseInput(out, path, inputs);
    const std::string beginning = beginningOf(path);
    if (out.st_size > 0 && !looksRight(beginning))
        throw FileError(path + " is not written over: it is not empty and does not look like " +
                        std::string(form));
    return true;
}

void checkNoInput(int descriptor, const std::string& name, std::span<const std::string> inputs) {
    struct stat out {};
    if (fstat(descriptor, &out) == 0 && S_ISREG(out.st_mode))
        refuseInput(out, name, inputs);
}

}  // namespace reader

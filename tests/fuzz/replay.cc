// Runs a fuzz target on each file of a corpus: replay FOLDER.
#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>

#include "tests/fuzz/fuzz.h"

namespace {

namespace fs = std::filesystem;

std::vector<fs::path> filesIn(const fs::path& folder) {
    std::vector<fs::path> files(fs::directory_iterator(folder), fs::directory_iterator{});
    std::sort(files.begin(), files.end());
    return files;
}

void run(const fs::path& path) {
    std::ifstream file(path, std::ios::binary);
    const fuzz::Octets octets{std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
    fuzz::require(file.good() || file.eof(), "a file that can be read");
    // The last file named is the one that failed.
    (void)std::fprintf(stderr, "%s\n", path.filename().c_str());
    LLVMFuzzerTestOneInput(octets.data(), octets.size());
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 2) {
        (void)std::fprintf(stderr, "usage: %s FOLDER\n", argv[0]);
        return EXIT_FAILURE;
    }
    const std::vector<fs::path> files = filesIn(argv[1]);
    std::for_each(files.begin(), files.end(), run);
    (void)std::printf("%zu inputs\n", files.size());
    return files.empty() ? EXIT_FAILURE : EXIT_SUCCESS;
}

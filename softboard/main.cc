#include <filesystem>
#include <iostream>

#include "softboard/command_line.h"
#include "softboard/launch.h"

int main(int argc, char** argv) {
    try {
        const auto commandLine = softboard::parseCommandLine({argv + 1, argv + argc});
        if (!commandLine.told.empty()) {
            std::cout << commandLine.told;
            return 0;
        }
        const auto self = std::filesystem::read_symlink("/proc/self/exe");
        return softboard::launch(self, softboard::scenarioOf(commandLine), commandLine.program);
    } catch (const std::exception& error) {
        std::cerr << "softboard: " << error.what() << '\n';
        return 2;
    }
}

#include "app/arguments.h"

#include <algorithm>
#include <cctype>
#include <climits>
#include <cstdlib>
#include <iostream>
#include <string_view>

#include "decoder/state.h"

namespace app {

namespace {

constexpr std::string_view defaultLogFile = "lapdmon.log";
constexpr std::string_view blanks = " \t\n\v\f\r";

void readNumber(const char* text, int& setting) {
    char* end = nullptr;
    const long value = std::strtol(text, &end, 10);
    if (end != text)
        setting = static_cast<int>(std::clamp<long>(value, INT_MIN, INT_MAX));
}

// Sets the name of the log to the first word of the text. If there is no word, leaves the name unchanged.
void readFileName(std::string_view text) {
    text.remove_prefix(std::min(text.find_first_not_of(blanks), text.size()));
    const std::string_view name = text.substr(0, text.find_first_of(blanks));
    if (name.empty())
        return;
    const std::size_t length = std::min(name.size(), log_file_name.size() - 1);
    *std::copy_n(name.begin(), length, log_file_name.begin()) = '\0';
}

[[noreturn]] void showUsage() {
    std::cout << "syntax: lapdmon -b# [-f xxxx] [-d#]" << std::endl
              << "   -b#      - board number, required" << std::endl
              << "   -d#      - D-Channel number, optional, default is 1" << std::endl
              << "   -f name  - Enable logging to file, optional " << std::endl
              << "   -h       - this message\n"
              << std::endl;
    std::exit(EXIT_SUCCESS);
}

}  // namespace

bool readArgs(int argc, char** argv) {
    INST_NUM = 1;
    readFileName(defaultLogFile);
    decoder::file_output = true;
    int status = 0;

    for (int i = 1; i < argc && argv[i][0] == '-'; ++i) {
        const char* const word = argv[i];
        switch (std::tolower(static_cast<unsigned char>(word[1]))) {
            case '?':
            case 'h':
                status = -1;
                break;
            case 'b':
                readNumber(word + 2, boardnumber);
                if (status == 0)
                    status = 1;
                break;
            case 'd':
            case 'i':
                readNumber(word + 2, INST_NUM);
                break;
            case 'f':
                // The name begins one character after the letter. In "-f name" that is the next word, which
                // ends the options unless it begins with "-". In "-fxname" the x is skipped.
                if (word[2] != '\0')
                    readFileName(word + 3);
                else if (i + 1 < argc)
                    readFileName(argv[i + 1]);
                break;
            default:
                std::cout << "Unknown Option" << std::endl;
                status = -1;
        }
    }
    return status == 1;
}

void parseArgs(int argc, char** argv) {
    if (!readArgs(argc, argv))
        showUsage();
    std::cout << "filename: " << log_file_name.data() << std::endl;
}

}  // namespace app

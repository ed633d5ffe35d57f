#include "app/banner.h"

#include <iostream>

#include "decoder/lines.h"
#include "decoder/log_lines.h"

namespace app {

void telvar_header() {
    std::cout << "\n"
              << decoder::logTitle << std::endl
              << decoder::logNotice << std::endl
              << decoder::logVersion << std::endl;
    decoder::text("\n", decoder::logTitle, "\n", decoder::logNotice, "\n", decoder::logVersion, "\n");
    decoder::flushLines();
}

}  // namespace app

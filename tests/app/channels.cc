#include "tests/app/channels.h"

#include <regex>

std::string app::testing::dated(const std::string& text) {
    static const std::regex date(
        "(Mon|Tue|Wed|Thu|Fri|Sat|Sun) (Jan|Feb|Mar|Apr|May|Jun|Jul|Aug|Sep|Oct|Nov|Dec) "
        "[ 123][0-9] [0-2][0-9]:[0-5][0-9]:[0-6][0-9] [0-9]{4}");
    return std::regex_replace(text, date, "DATE");
}

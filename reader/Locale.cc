#include "reader/Locale.h"

#include <cstdlib>

#include "reader/text.h"

namespace reader {

bool localeHasUtf8() {
    for (const char* const name : {"LC_ALL", "LC_CTYPE", "LANG"}) {
        const char* const value = std::getenv(name);
        if (value == nullptr || *value == '\0')
            continue;
        const std::string locale = plainName(value);
        return locale.find("utf8") != std::string::npos;
    }
    return false;
}

}  // namespace reader

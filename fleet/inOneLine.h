// One line of an error text.
#ifndef FLEET_INONELINE_H
#define FLEET_INONELINE_H

#include <algorithm>
#include <string>

namespace fleet {

// Removes the line ends of an error text of PostgreSQL or libpq, because our messages have one line each.
inline std::string inOneLine(std::string text) {
    std::replace(text.begin(), text.end(), '\n', ' ');
    while (text.ends_with(' '))
        text.pop_back();
    return text;
}

}  // namespace fleet

#endif

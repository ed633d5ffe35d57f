// Finds out which characters the user's terminal can show.
#ifndef READER_LOCALE_H
#define READER_LOCALE_H

namespace reader {

// Whether the locale's name says UTF-8. The name is the first of LC_ALL, LC_CTYPE and LANG that is set
// (POSIX, 8.2).
bool localeHasUtf8();

}  // namespace reader

#endif

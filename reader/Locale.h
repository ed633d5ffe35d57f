// What the environment says of characters.
#ifndef READER_LOCALE_H
#define READER_LOCALE_H

namespace reader {

// The locale's name says UTF-8: LC_ALL, LC_CTYPE or LANG, the first of these that is set (POSIX, 8.2).
bool localeHasUtf8();

}  // namespace reader

#endif

// The transport's interface with its symbols exported. All other symbols of the library are hidden.
#ifndef SOFTBOARD_ABI_H
#define SOFTBOARD_ABI_H

#pragma GCC visibility push(default)
#include "norv/norv.h"
#pragma GCC visibility pop

#endif

// The transport's interface, exported: the library is built with everything else hidden.
#ifndef SOFTBOARD_ABI_H
#define SOFTBOARD_ABI_H

#pragma GCC visibility push(default)
#include "norv/norv.h"
#pragma GCC visibility pop

#endif

// The interface through which findings are reported.
#ifndef CALLS_FINDINGSINK_H
#define CALLS_FINDINGSINK_H

#include "calls/Finding.h"

namespace calls {

class FindingSink {
  public:
    FindingSink() = default;
    FindingSink(const FindingSink&) = delete;
    FindingSink& operator=(const FindingSink&) = delete;
    virtual ~FindingSink() = default;
    virtual void report(Finding finding) = 0;
};

}  // namespace calls

#endif

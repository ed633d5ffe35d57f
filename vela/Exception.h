// The base class of the layer's exceptions. They are thrown by value and printed with operator<<.
#ifndef VELA_EXCEPTION_H
#define VELA_EXCEPTION_H

#include "vela/virtualObject.h"

namespace vela {

class Exception : public virtualObject {
  public:
    // `name` must be a string literal: the exception keeps the pointer.
    explicit Exception(const char* name = "Exception") : name_(name) {}

    void toStream(std::ostream* out) const override;  // writes the name

  private:
    const char* name_;
};

}  // namespace vela

#endif

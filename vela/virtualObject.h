// The base class of everything in the object layer that can be printed.
#ifndef VELA_VIRTUALOBJECT_H
#define VELA_VIRTUALOBJECT_H

#include <iosfwd>

namespace vela {

class virtualObject {
  public:
    // Writes the object as text. This class writes nothing.
    virtual void toStream(std::ostream* out) const;
    virtual ~virtualObject() = default;

  protected:
    virtualObject() = default;
    virtualObject(const virtualObject&) = default;
    virtualObject& operator=(const virtualObject&) = default;
};

std::ostream& operator<<(std::ostream& out, const virtualObject& object);

}  // namespace vela

#endif

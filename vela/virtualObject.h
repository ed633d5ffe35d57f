// The root of the object layer: everything in it can be printed.
#ifndef VELA_VIRTUALOBJECT_H
#define VELA_VIRTUALOBJECT_H

#include <iosfwd>

namespace vela {

class virtualObject {
  public:
    // Writes the object's print form; the root has none.
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

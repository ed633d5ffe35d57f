// A value before which a descriptor word says how many elements it has, and of which type.
#ifndef VELA_DESCRIBED_H
#define VELA_DESCRIBED_H

#include <algorithm>

#include "vela/field.h"

namespace vela {

// The descriptor word. The Described field after it reads from it what it holds.
template <Label name>
struct Descriptor32 : U32<name> {
    using U32<name>::operator=;
    static constexpr bool announces = true;
};

// The elements that the descriptor announces. In memory each is a number of 32 bits, whatever its width on
// the wire. If the list is shorter than announced, it grows with zeros. If it is longer, it keeps its length,
// and only the announced elements are sent or read.
template <Label name>
class Described : public Field<staticList<unsigned int>, name> {
  public:
    using Field<staticList<unsigned int>, name>::operator=;

    unsigned int byteSize(unsigned int descriptorWord) const {
        return descriptorCount(descriptorWord) * elementSize(descriptorType(descriptorWord));
    }
    void print(std::ostream* out) const { *out << this->value(); }

    template <Move move>
    void transfer(FieldMover<move>& mover, Msg*, unsigned int descriptorWord) {
        const unsigned int count = descriptorCount(descriptorWord);
        const WireType type = descriptorType(descriptorWord);
        grow(count);
        switch (elementSize(type)) {
            case 1:
                return moveAs<unsigned char>(mover, count, type);
            case 2:
                return moveAs<unsigned short>(mover, count, type);
            default:
                return moveAs<unsigned int>(mover, count, type);
        }
    }

  private:
    void grow(unsigned int count) {
        staticList<unsigned int>& numbers = this->value();
        const unsigned int held = numbers.length();
        if (held >= count)
            return;
        numbers.realloc(count);
        std::fill(numbers.begin() + held, numbers.end(), 0U);  // the storage may hold older elements
    }

    // Moves the elements in the width that they have on the wire.
    template <typename Element, Move move>
    void moveAs(FieldMover<move>& mover, unsigned int count, WireType type) {
        unsigned int* const numbers = this->value().begin();
        staticList<Element> elements(count);
        if constexpr (move == Move::put)
            std::transform(numbers, numbers + count, elements.begin(),
                           [](unsigned int number) { return static_cast<Element>(number); });
        mover.array(elements.begin(), count, type);
        if constexpr (move == Move::get)
            std::copy(elements.begin(), elements.end(), numbers);
    }
};

}  // namespace vela

#endif

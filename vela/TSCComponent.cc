#include "vela/TSCComponent.h"

#include <algorithm>

#include <ostream>

namespace vela {

namespace rows {

namespace {

// The value's elements in the width that they have on the wire.
template <typename Element, Move direction>
void moveAs(FieldMover<direction>& mover, staticList<unsigned int>& numbers, unsigned int count,
            WireType type) {
    staticList<Element> elements(count);
    if (direction == Move::Put)
        std::transform(numbers.begin(), numbers.begin() + count, elements.begin(),
                       [](unsigned int number) { return static_cast<Element>(number); });
    mover.array(elements.begin(), count, type);
    if (direction == Move::Get)
        std::copy(elements.begin(), elements.end(), numbers.begin());
}

template <Move direction>
unsigned int moveValue(staticList<unsigned int>& numbers, std::uint32_t fieldDef, Msg* msg,
                       unsigned int offset) {
    FieldMover<direction> mover(msg->getNvMsgRef(), offset);
    const unsigned int count = descriptorCount(fieldDef);
    const WireType type = descriptorType(fieldDef);
    switch (elementSize(type)) {
        case 1:
            moveAs<unsigned char>(mover, numbers, count, type);
            break;
        case 2:
            moveAs<unsigned short>(mover, numbers, count, type);
            break;
        default:
            moveAs<unsigned int>(mover, numbers, count, type);
    }
    return mover.offset();
}

}  // namespace

ParmFieldDefVal_t::ParmFieldDefVal_t(unsigned int& parm, unsigned int& fieldDef,
                                     staticList<unsigned int>& val)
    : Body(parm, fieldDef) {
    Val.bind(val);
}

unsigned int ParmFieldDefVal_t::writeMsg(Msg* msg, unsigned int offset) {
    const unsigned int count = descriptorCount(FieldDef);
    if (const unsigned int held = Val->length(); held < count) {
        Val->realloc(count);
        std::fill(Val->begin() + held, Val->end(), 0U);  // not what the list held before it shrank
    }
    return moveValue<Move::Put>(Val, FieldDef, msg, Body::writeMsg(msg, offset));
}

unsigned int ParmFieldDefVal_t::readMsg(Msg* msg, unsigned int offset) {
    offset = Body::readMsg(msg, offset);
    Val->realloc(descriptorCount(FieldDef));
    return moveValue<Move::Get>(Val, FieldDef, msg, offset);
}

unsigned int ParmFieldDefVal_t::GetByteSize() const {
    return Body::GetByteSize() + descriptorCount(FieldDef) * elementSize(descriptorType(FieldDef));
}

void ParmFieldDefVal_t::toStream(std::ostream* out) const {
    *out << "{Parm " << Parm << " FieldDef " << FieldDef << " Val " << Val.value() << "}";
}

}  // namespace rows

MsgBody* TSCComponent::MsgBodyLookup(unsigned int msgType) {
    MsgBody* const body = Bodies::make(msgType);
    return body != nullptr ? body : Component::MsgBodyLookup(msgType);
}

}  // namespace vela

#include "vela/CompDesc.h"

#include <ostream>

#include "vela/Msg.h"
#include "vela/wire.h"

namespace vela {

namespace {

template <typename T, WireType type>
struct FieldRef {
    static constexpr WireType wire = type;
    T& field;
    T& value() const { return field; }
};
using Octet = FieldRef<unsigned char, WireType::unsigned8>;

template <Move move>
unsigned int transfer(CompDesc_t& address, Msg* msg, unsigned int offset) {
    FieldMover<move> mover(msg->getNvMsgRef(), offset);
    const FieldRef<unsigned short, WireType::unsigned16> instance{address.Instance};
    const Octet board{address.Board}, processor{address.Processor};
    const Octet component{address.Component}, node{address.Node};
    mover.scalars(instance);
    mover.scalars(board, processor, component, node);
    return mover.offset();
}

}  // namespace

CompDesc_t::CompDesc_t(const NvCompDesc& address)
    : CompDesc_t(address.instance, address.board, address.processor, address.component, address.node) {}

NvCompDesc CompDesc_t::getNvCompDesc() const {
    return {.instance = Instance,
            .board = Board,
            .unused3 = 0,
            .processor = Processor,
            .component = Component,
            .node = Node,
            .unused7 = 0};
}

bool CompDesc_t::operator==(const CompDesc_t& other) const {
    return Node == other.Node && Board == other.Board && Processor == other.Processor &&
           Component == other.Component && Instance == other.Instance;
}

unsigned int CompDesc_t::writeMsg(Msg* msg, unsigned int offset) {
    return transfer<Move::put>(*this, msg, offset);
}

unsigned int CompDesc_t::readMsg(Msg* msg, unsigned int offset) {
    return transfer<Move::get>(*this, msg, offset);
}

void CompDesc_t::toStream(std::ostream* out) const {
    *out << "{Node " << +Node << " Board " << +Board << " Processor " << +Processor << " Component "
         << +Component << " Instance " << Instance << "}";
}

}  // namespace vela

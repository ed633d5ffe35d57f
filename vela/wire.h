// Moves fields into and out of a message's payload. This is the only place that does.
//
// The transport library moves a field as a descriptor word says: bits 11 to 18 are the number of elements
// less one, bits 19 to 23 the element type, and all other bits are 0.
#ifndef VELA_WIRE_H
#define VELA_WIRE_H

#include <algorithm>
#include <cstdint>
#include <tuple>

#include "norv/norv.h"

namespace vela {

enum class WireType : std::uint32_t {
    signed8 = 0,
    signed16 = 1,
    word32 = 2,
    signed32 = 3,
    unsigned8 = 4,
    unsigned16 = 5,
    value32 = 6,
    unsigned32 = 7,
    text8 = 10,
    field32 = 17,
};

inline constexpr unsigned int maxChunk = 255;  // elements that one descriptor can announce

constexpr std::uint32_t descriptor(WireType type, unsigned int count = 1) {
    return ((count - 1) << 11) | (static_cast<std::uint32_t>(type) << 19);
}
constexpr unsigned int descriptorCount(std::uint32_t word) { return ((word & 0x7F800) >> 11) + 1; }
constexpr WireType descriptorType(std::uint32_t word) {
    return static_cast<WireType>((word & 0xF80000) >> 19);
}

constexpr unsigned int elementSize(WireType type) {
    switch (type) {
        case WireType::signed8:
        case WireType::unsigned8:
        case WireType::text8:
            return 1;
        case WireType::signed16:
        case WireType::unsigned16:
            return 2;
        default:
            return 4;
    }
}

enum class Move { put, get };

// Moves the fields of one body and keeps the offset. Reading never goes outside the payload: a field that is
// missing, in whole or in part, becomes 0, and the offset advances past it.
template <Move move>
class FieldMover {
  public:
    FieldMover(NvMsg32Bit* raw, unsigned int offset) : raw_(raw), offset_(offset) {}

    unsigned int offset() const { return offset_; }
    // The octets of payload that are left.
    unsigned int rest() const { return raw_->size > offset_ ? raw_->size - offset_ : 0; }

    // Moves several numbers in one transport call.
    template <typename... Fields>
    void scalars(Fields&... fields) {
        constexpr unsigned int size = (elementSize(Fields::wire) + ...);
        if (move == Move::put || rest() >= size)
            call(size, sizeof...(Fields), std::tuple_cat(pair(descriptor(Fields::wire), &fields.value())...));
        else
            (scalarIfThere(fields), ...);
    }

    // Moves an array in chunks of at most 255 elements, the incomplete chunk first. Reading takes no more
    // elements than the payload holds.
    template <typename T>
    void array(T* elements, unsigned int count, WireType type) {
        if (move == Move::get)
            count = std::min(count, rest() / elementSize(type));
        for (unsigned int at = 0; at < count;) {
            const unsigned int odd = at == 0 ? count % maxChunk : 0;
            const unsigned int chunk = odd != 0 ? odd : maxChunk;
            call(chunk * elementSize(type), 1, pair(descriptor(type, chunk), elements + at));
            at += chunk;
        }
    }

    // Moves a body within this one, by its own writeMsg or readMsg.
    template <typename Message, typename NestedBody>
    void nested(Message* msg, NestedBody& body) {
        offset_ = move == Move::put ? body.writeMsg(msg, offset_) : body.readMsg(msg, offset_);
        first_ = false;
    }

  private:
    template <typename T>
    static std::tuple<std::uint32_t, void*> pair(std::uint32_t word, T* storage) {
        return {word, storage};
    }

    template <typename Field>
    void scalarIfThere(Field& field) {
        if (rest() >= elementSize(Field::wire)) {
            call(elementSize(Field::wire), 1, pair(descriptor(Field::wire), &field.value()));
        } else {
            field.value() = {};
            offset_ += elementSize(Field::wire);
        }
    }

    template <typename Pairs>
    void call(unsigned int size, std::uint32_t count, Pairs pairs) {
        std::apply([&](auto... words) { transfer(raw_, count, &offset_, words...); }, pairs);
        // Some releases of the library leave the offset at 0 after the first field of a body. Then it is
        // advanced here.
        if (first_ && offset_ == 0)
            offset_ = size;
        first_ = false;
    }

    static constexpr auto transfer = move == Move::put ? nvMsgVarFieldPut : nvMsgVarFieldGet;

    NvMsg32Bit* raw_;
    unsigned int offset_;
    bool first_ = true;
};

}  // namespace vela

#endif

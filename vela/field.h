// The fields of which message bodies are declared.
//
// A field has a value of its own and a pointer to the value that it uses: its own, or a variable of the
// caller to which it is bound. Reading and writing use the pointer. A copy of a field always uses a value of
// its own.
//
// Each kind of field knows how it is moved, how many octets it takes and how it prints. A body only handles
// its fields one after another. The label is part of the type, so that a declaration reads `U32<"Parm">
// Parm;`.
#ifndef VELA_FIELD_H
#define VELA_FIELD_H

#include <algorithm>
#include <array>
#include <concepts>
#include <cstddef>
#include <limits>
#include <ostream>
#include <type_traits>

#include "vela/list.h"
#include "vela/wire.h"

namespace vela {

class Msg;

template <std::size_t n>
struct Label {
    char text[n];
    constexpr Label(const char (&literal)[n]) { std::copy_n(literal, n, text); }  // implicit, for U32<"Parm">
};

template <typename T, Label name>
class Field {
  public:
    using Value = T;

    Field() = default;
    Field(const Field& other) : own_(*other.used_) {}
    Field& operator=(const Field& other) {
        if (this != &other)
            *used_ = *other.used_;
        return *this;
    }
    Field& operator=(const T& value) {
        *used_ = value;
        return *this;
    }
    ~Field() = default;

    // From now on the field reads into and writes from the caller's variable, which must outlive the field.
    void bind(T& variable) { used_ = &variable; }

    T& value() { return *used_; }
    const T& value() const { return *used_; }
    operator T&() { return *used_; }
    operator const T&() const { return *used_; }
    T* operator->() { return used_; }
    const T* operator->() const { return used_; }

    static constexpr const char* label() { return name.text; }

  private:
    T own_{};
    T* used_ = &own_;
};

// A number. Consecutive numbers are moved in one transport call.
template <typename T, WireType type, Label name>
class Scalar : public Field<T, name> {
  public:
    using Field<T, name>::operator=;
    static constexpr WireType wire = type;

    unsigned int byteSize() const { return elementSize(type); }
    void print(std::ostream* out) const { *out << +this->value(); }
};

template <Label name>
using U8 = Scalar<unsigned char, WireType::unsigned8, name>;
template <Label name>
using U16 = Scalar<unsigned short, WireType::unsigned16, name>;
template <Label name>
using U32 = Scalar<unsigned int, WireType::unsigned32, name>;
template <Label name>
using S32 = Scalar<int, WireType::signed32, name>;
template <Label name>
using Value32 = Scalar<unsigned int, WireType::value32, name>;

// The number of elements of the next list in the body. It is set from the list's length when the body is
// written.
template <typename Number>
struct CountOf : Number {
    using Number::operator=;
    static constexpr bool announces = true;

    // Throws Exception when the number is too large for the field.
    void count(unsigned int elements) {
        if (elements > std::numeric_limits<typename Number::Value>::max())
            throw Exception("a list is longer than its count can say");
        *this = static_cast<typename Number::Value>(elements);
    }
};
template <Label name>
using Count32 = CountOf<U32<name>>;
template <Label name>
using Count16 = CountOf<U16<name>>;
template <Label name>
using Count8 = CountOf<U8<name>>;

template <typename T>
concept ScalarField = requires {
    T::wire;
}
&&!requires { T::isArray; };
// A field whose value the next field depends on. It is handed to that field.
template <typename T>
concept AnnouncingField = requires {
    T::announces;
};
template <typename T>
concept CountField = ScalarField<T> && requires(T& field) {
    []<typename N>(CountOf<N>&) {}(field);
};

// A body within the body, for example an address.
template <typename NestedBody, Label name>
class Nested : public Field<NestedBody, name> {
  public:
    using Field<NestedBody, name>::operator=;
    static constexpr const char* absent = "NULL";  // printed when the message does not have the field

    unsigned int byteSize() const { return this->value().GetByteSize(); }
    void print(std::ostream* out) const { *out << this->value(); }

    template <Move move>
    void transfer(FieldMover<move>& mover, Msg* msg, unsigned int) {
        mover.nested(msg, this->value());
    }
};

// A list of numbers. The count before it says how many there are.
template <typename T, WireType type, Label name>
class Array : public Field<staticList<T>, name> {
  public:
    using Field<staticList<T>, name>::operator=;
    static constexpr bool isArray = true;

    unsigned int length() const { return this->value().length(); }
    unsigned int byteSize() const { return length() * elementSize(type); }
    void print(std::ostream* out) const { *out << this->value(); }

    template <Move move>
    void transfer(FieldMover<move>& mover, Msg*, unsigned int announced) {
        staticList<T>& elements = this->value();
        if constexpr (move == Move::get)
            elements.realloc(std::min(announced, mover.rest() / elementSize(type)));
        mover.array(elements.begin(), elements.length(), type);
    }
};

// A list of numbers without a count: it is all that is left of the payload.
template <typename T, WireType type, Label name>
class Rest : public Array<T, type, name> {
  public:
    using Array<T, type, name>::operator=;

    template <Move move>
    void transfer(FieldMover<move>& mover, Msg* msg, unsigned int) {
        Array<T, type, name>::transfer(mover, msg, mover.rest());
    }
};

template <Label name>
using RestBytes = Rest<unsigned char, WireType::unsigned8, name>;

// Always n octets.
template <unsigned int n, Label name>
class FixedOctets : public Field<std::array<unsigned char, n>, name> {
  public:
    using Field<std::array<unsigned char, n>, name>::operator=;

    unsigned int byteSize() const { return n; }
    void print(std::ostream* out) const { printList(out, this->value().begin(), this->value().end()); }

    template <Move move>
    void transfer(FieldMover<move>& mover, Msg*, unsigned int) {
        if constexpr (move == Move::get)
            this->value().fill(0);
        mover.array(this->value().data(), n, WireType::unsigned8);
    }
};

// A list of bodies. The count before it says how many there are.
template <typename Element, Label name>
class ListOf : public Field<staticList<Element>, name> {
  public:
    using Field<staticList<Element>, name>::operator=;
    static constexpr bool isArray = true;

    unsigned int length() const { return this->value().length(); }
    unsigned int byteSize() const {
        unsigned int size = 0;
        for (const Element& element : this->value())
            size += element.GetByteSize();
        return size;
    }
    void print(std::ostream* out) const { *out << this->value(); }

    template <Move move>
    void transfer(FieldMover<move>& mover, Msg* msg, unsigned int announced) {
        if constexpr (move == Move::get)
            get(mover, msg, announced);
        else
            put(mover, msg);
    }

  protected:
    void put(FieldMover<Move::put>& mover, Msg* msg) {
        for (Element& element : this->value())
            mover.nested(msg, element);
    }
    // Reads one entry, and replaces what it held before.
    static void getOne(FieldMover<Move::get>& mover, Msg* msg, Element& element) {
        element = Element();
        mover.nested(msg, element);
    }

  private:
    // No entry is smaller than an empty one. Octets after the last whole entry are not read.
    void get(FieldMover<Move::get>& mover, Msg* msg, unsigned int announced) {
        staticList<Element>& elements = this->value();
        const unsigned int least = Element().GetByteSize();
        elements.realloc(std::min(announced, mover.rest() / least));
        unsigned int n = 0;
        for (; n < elements.length() && mover.rest() >= least; ++n)
            this->getOne(mover, msg, elements[n]);
        elements.realloc(n);
    }
};

// A list of bodies to the end of the payload. After reading, the list has as many entries as there were
// octets; those after the last body are empty.
template <typename Element, Label name>
class RestOf : public ListOf<Element, name> {
  public:
    using ListOf<Element, name>::operator=;

    template <Move move>
    void transfer(FieldMover<move>& mover, Msg* msg, unsigned int) {
        if constexpr (move == Move::get)
            get(mover, msg);
        else
            this->put(mover, msg);
    }

  private:
    void get(FieldMover<Move::get>& mover, Msg* msg) {
        this->value().realloc(mover.rest());
        for (Element& element : this->value()) {
            if (mover.rest() > 0)
                this->getOne(mover, msg, element);
            else
                element = Element();
        }
    }
};

}  // namespace vela

#endif

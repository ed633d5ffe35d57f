// Bodies filled with values that can be recognised: 1001, 1002, ... through the whole body; in one octet 101,
// 102, ...; in a list of octets letters.
#ifndef TESTS_VELA_FILL_H
#define TESTS_VELA_FILL_H

#include <array>
#include <concepts>

#include "vela/CCS.h"
#include "vela/CompDesc.h"
#include "vela/StdResource.h"
#include "vela/TSCComponent.h"

class Filler {
  public:
    using Parm = vela::TSCComponent::Std_MsgSetxParms_t::Parms_t;

    void fill(unsigned int& value) { value = next_++; }
    void fill(int& value) { value = -static_cast<int>(next_++); }
    void fill(unsigned short& value) { value = static_cast<unsigned short>(next_++); }
    void fill(unsigned char& value) { value = static_cast<unsigned char>(next_++ - 900); }
    void fill(vela::CompDesc_t& address) {
        fill(address.Instance);
        for (unsigned char* octet : {&address.Board, &address.Processor, &address.Component, &address.Node})
            fill(*octet);
    }
    template <std::size_t n>
    void fill(std::array<unsigned char, n>& octets) {
        for (unsigned char& octet : octets)
            octet = letter();
    }
    void fill(vela::staticList<unsigned char>& octets) {
        octets.realloc(3);
        for (unsigned char& octet : octets)
            octet = letter();
    }
    void fill(vela::staticList<unsigned int>& numbers) {
        numbers.realloc(3);
        for (unsigned int& number : numbers)
            fill(number);
    }
    template <typename Element>
    void fill(vela::staticList<Element>& elements) {
        elements.realloc(2);
        for (Element& element : elements)
            fill(element);
    }
    // Eight signed octets, then two numbers.
    void fill(vela::staticList<Parm>& parms) {
        parms.realloc(2);
        fill(parms[0], 0x3800, 8, 900);
        fill(parms[1], 0x380800, 2, 0);
    }
    // One with a length and a value, and one of a single octet.
    void fill(vela::staticList<vela::CCS::ieMessage_t::IEPubData_t>& elements) {
        elements.realloc(2);
        fill(elements[0].IEId.value());
        fill(elements[0].Value.value());
        elements[0].Length = 3;
        elements[1].IEId = 161;
    }
    template <std::derived_from<vela::MsgBody> BodyType>
    void fill(BodyType& body) {
        std::apply([this](auto&... field) { (fillField(field), ...); }, body.fields());
        if constexpr (std::same_as<BodyType, vela::StdResource::MsgError_t>)
            body.ErrorMsg = vela::StdResource::MsgSetParm_t::code;  // one that has data
    }

  private:
    template <typename FieldType>
    void fillField(FieldType& field) {
        if constexpr (!vela::CountField<FieldType>)
            fill(field.value());
    }
    void fill(Parm& parm, unsigned int fieldDef, unsigned int count, unsigned int less) {
        fill(parm.Parm.value());
        parm.FieldDef = fieldDef;
        parm.Val->realloc(count);
        for (unsigned int& number : parm.Val.value())
            number = next_++ - less;
    }
    unsigned char letter() { return static_cast<unsigned char>('a' + (next_++ - 1001) % 26); }

    unsigned int next_ = 1001;
};

#endif

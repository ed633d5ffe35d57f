// A frame taken apart on each trunk: each of its bits has one field, and every view of it stays within it.
#include "isdn/Field.h"
#include "isdn/values.h"
#include "isdn/words.h"
#include "tests/fuzz/fuzz.h"
#include "tests/isdn/coverage.h"

namespace {

using namespace isdn;

constexpr Variant variants[] = {Variant::net5, Variant::ni2,    Variant::ess4,
                                Variant::ess5, Variant::dms100, Variant::ntt};

bool within(Octets part, Octets whole) {
    return part.empty() ||
           (part.data() >= whole.data() && part.data() + part.size() <= whole.data() + whole.size());
}

void takeValues(const Element& element) {
    if (const auto number = partyNumber(element))
        fuzz::require(within(number->digitOctets, element.octets), "digits are the element's");
    if (const auto found = cause(element))
        fuzz::require(within(found->diagnostics, element.octets), "diagnostics are the element's");
    (void)channelId(element);
    (void)callState(element);
    (void)progress(element);
    (void)restartClass(element);
    (void)changeStatus(element);
    (void)segmentHeader(element);
}

// The fields of a message and of its elements, in their order.
void addMessage(const Layer3& message, Variant variant, Fields& fields) {
    fieldsOf(message, fields);
    std::string line;
    for (const Element& element : message.elements) {
        Fields own;
        fieldsOf(element, variant, own);
        fuzz::require(isdn::testing::bitsCovered(own, element.octets) == element.octets.size() * 8,
                      "each bit of an element has a field");
        takeValues(element);
    }
    appendWords(line, message, variant, Sender::network);
}

void takeApart(Octets octets, Variant variant) {
    Fields fields;
    const Layer2 frame = parseLayer2(octets);
    fieldsOf(frame, fields);
    const std::size_t message = frame.carriesMessage() ? frame.information.size() : 0;
    fuzz::require(isdn::testing::bitsCovered(fields, octets) == (octets.size() - message) * 8,
                  "each bit of a link header has a field");
    std::string line;
    if (frame.carriesTeiMessage())
        appendWords(line, parseTeiMessage(frame.information));
    if (frame.type == FrameType::FRMR)
        appendWords(line, parseFrameReject(frame.information));
    if (frame.carriesMessage()) {
        const Layer3 layer3 = parseLayer3(frame.information);
        std::size_t counted = layer3.header.size() + layer3.raw.size();
        for (const Element& element : layer3.elements)
            counted += element.octets.size();
        fuzz::require(counted == frame.information.size(), "each octet of a message has its place");
        Fields own;
        addMessage(layer3, variant, own);
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const fuzz::Octets octets(data, data + size);
    for (const Variant variant : variants)
        takeApart(octets, variant);
    return 0;
}

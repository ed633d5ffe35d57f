// The contents of a facility: its fields cover each bit of them once, in order, on each trunk.
#include "isdn/facility.h"
#include "tests/fuzz/fuzz.h"

namespace {

constexpr isdn::Variant variants[] = {isdn::Variant::net5, isdn::Variant::ni2};

void requireEachBitOnce(const isdn::Fields& fields, isdn::Octets contents) {
    const std::uint8_t* at = contents.data();
    int bit = 8;
    for (const isdn::Field& field : fields) {
        fuzz::require(field.at.data() == at && !field.at.empty(), "fields stand side by side");
        fuzz::require(field.high == bit && field.low <= field.high, "bits stand side by side");
        bit = field.low - 1;
        if (bit == 0) {
            at += field.at.size();
            bit = 8;
        }
    }
    fuzz::require(at == contents.data() + contents.size() && bit == 8, "each bit has a field");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const fuzz::Octets contents(data, data + size);
    for (const isdn::Variant variant : variants) {
        isdn::Fields fields;
        isdn::facilityFields(contents, variant, fields);
        requireEachBitOnce(fields, contents);
        std::string line;
        isdn::Facility(contents, variant).appendWords(line);
    }
    return 0;
}

// Collects the parts of a plan. Internal to redaction/.
#ifndef REDACTION_PLANBUILDER_H
#define REDACTION_PLANBUILDER_H

#include <algorithm>
#include <utility>

#include "isdn/Variant.h"
#include "isdn/octets.h"
#include "redaction/plan.h"

namespace redaction {

inline constexpr std::uint8_t extensionBit = 0x80;
inline constexpr std::uint8_t allBits = 0xFF;

class PlanBuilder {
  public:
    // Places of parts are counted from the beginning of `whole`.
    PlanBuilder(isdn::Octets whole, isdn::Variant variant) : whole_(whole), variant_(variant) {}

    isdn::Variant variant() const { return variant_; }
    std::size_t placeOf(isdn::Octets octets) const {
        return static_cast<std::size_t>(octets.data() - whole_.data());
    }
    std::size_t endOf(isdn::Octets octets) const { return placeOf(octets) + octets.size(); }

    // Adds a part. Its octets must be octets of `whole` that come after those of the part before.
    void add(isdn::Octets octets, Treatment treatment, std::uint8_t keptBits = 0, std::uint8_t setBits = 0) {
        if (!octets.empty())
            plan_.push_back({placeOf(octets), octets.size(), treatment, keptBits, setBits});
    }
    void blank(isdn::Octets octets, std::uint8_t keptBits = 0, std::uint8_t setBits = 0) {
        add(octets, Treatment::blank, keptBits, setBits);
    }
    // Removes the parts that begin at these octets or after them.
    void dropFrom(isdn::Octets octets) {
        std::erase_if(plan_, [at = placeOf(octets)](const Part& part) { return part.at >= at; });
    }

    Plan finish() && { return std::move(plan_); }

  private:
    isdn::Octets whole_;
    isdn::Variant variant_;
    Plan plan_;
};

// All but the first `count` octets.
inline isdn::Octets behind(isdn::Octets octets, std::size_t count) {
    return octets.subspan(std::min(octets.size(), count));
}

// Adds the parts of an element of a message. `dialled` is the element of the message that holds the digits
// that the caller dials.
void planElement(const isdn::Element& element, const isdn::Layer3& message, const isdn::Element& dialled,
                 PlanBuilder& to);
// Adds the parts of the contents of FACILITY and EXTENDED FACILITY.
void planFacility(isdn::Octets contents, PlanBuilder& to);

// Whether digits may follow an element whose length is too short. They may if the element identifies a person
// or a network, or if no table knows it.
bool mayBeFollowedByDigits(const isdn::Element& element, isdn::Variant variant);

}  // namespace redaction

#endif

// The parts of a plan while it is made. For the sources of this folder alone.
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
    // `whole` is what the parts' places count from.
    PlanBuilder(isdn::Octets whole, isdn::Variant variant) : whole_(whole), variant_(variant) {}

    isdn::Variant variant() const { return variant_; }
    std::size_t placeOf(isdn::Octets octets) const {
        return static_cast<std::size_t>(octets.data() - whole_.data());
    }
    std::size_t endOf(isdn::Octets octets) const { return placeOf(octets) + octets.size(); }

    // Octets of `whole`, behind those of the part before.
    void add(isdn::Octets octets, Treatment treatment, std::uint8_t keptBits = 0, std::uint8_t setBits = 0) {
        if (!octets.empty())
            plan_.push_back({placeOf(octets), octets.size(), treatment, keptBits, setBits});
    }
    void blank(isdn::Octets octets, std::uint8_t keptBits = 0, std::uint8_t setBits = 0) {
        add(octets, Treatment::blank, keptBits, setBits);
    }
    // Takes back what was said of these octets and all that follow them.
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

// The same of an element; `dialled` is that of the message which holds digits as the caller dials them.
void planElement(const isdn::Element& element, const isdn::Layer3& message, const isdn::Element& dialled,
                 PlanBuilder& to);
// Of the contents of FACILITY and EXTENDED FACILITY.
void planFacility(isdn::Octets contents, PlanBuilder& to);

// Whether digits may follow an element whose length is too short: it names a person, or a network, or nobody
// knows it.
bool mayBeFollowedByDigits(const isdn::Element& element, isdn::Variant variant);

}  // namespace redaction

#endif

#include "isdn/facility_numbers.h"
#include "isdn/facility_types.h"

namespace isdn::facility {
namespace {

// Advice of charge. EN 300 182-1 clause 6.

constexpr BerType currencyText{Kind::text};
constexpr BerName multiplierNames[] = {{0, "x 0.001"}, {1, "x 0.01"}, {2, "x 0.1"}, {3, "x 1"},
                                       {4, "x 10"},    {5, "x 100"},  {6, "x 1000"}};
constexpr BerType multiplier = enumerated(multiplierNames);
constexpr BerMember amountMembers[] = {instead(1, "amount", integerType, Words::valueAlone),
                                       instead(2, "multiplier", multiplier, Words::valueAlone)};
constexpr BerType amount = sequence(amountMembers);
constexpr BerMember currencyMembers[] = {instead(1, "currency", currencyText, Words::valueAlone),
                                         instead(2, "amount of currency", amount, Words::valueAlone)};
constexpr BerType recordedCurrency = sequence(currencyMembers);
constexpr BerMember unitsMembers[] = {plain("units", integerType), plain("units not available", nothing),
                                      plain("type of unit", integerType)};
constexpr BerType recordedUnits = sequence(unitsMembers);
constexpr BerMember unitsListMembers[] = {plain("recorded units", recordedUnits, Words::valueAlone)};
constexpr BerType unitsList = list(unitsListMembers);

constexpr BerName chargeKindNames[] = {{0, "subtotal"}, {1, "total"}};
constexpr BerType chargeKind = enumerated(chargeKindNames);
constexpr BerName billingNames[] = {{0, "normal charging"},      {1, "reverse charging"},
                                    {2, "credit card charging"}, {3, "call forwarding unconditional"},
                                    {4, "call forwarding busy"}, {5, "call forwarding no reply"},
                                    {6, "call deflection"},      {7, "call transfer"}};
constexpr BerType billing = enumerated(billingNames);

constexpr BerMember duringCurrencyMembers[] = {
    instead(1, "recorded currency", recordedCurrency, Words::valueAlone),
    instead(2, "kind of charge", chargeKind, Words::valueAlone), instead(3, "billing", billing)};
constexpr BerType duringCurrency = sequence(duringCurrencyMembers);
constexpr BerMember duringUnitsMembers[] = {instead(1, "recorded units", unitsList, Words::valueAlone),
                                            instead(2, "kind of charge", chargeKind, Words::valueAlone),
                                            instead(3, "billing", billing)};
constexpr BerType duringUnits = sequence(duringUnitsMembers);
constexpr BerMember aocDuringCurrencyMembers[] = {plain("no charge available", nothing),
                                                  plain("charge", duringCurrency, Words::valueAlone),
                                                  instead(1, "free of charge", nothing)};
constexpr BerMember aocDuringUnitsMembers[] = {plain("no charge available", nothing),
                                               plain("charge", duringUnits, Words::valueAlone),
                                               instead(1, "free of charge", nothing)};

constexpr BerMember associationMembers[] = {around(0, "charge number", party),
                                            plain("charge identifier", integerType)};
constexpr BerType association = choice(associationMembers);
constexpr BerMember chargedCurrencyMembers[] = {
    instead(1, "recorded currency", recordedCurrency, Words::valueAlone), instead(2, "billing", billing)};
constexpr BerType chargedCurrency = sequence(chargedCurrencyMembers);
constexpr BerMember chargedUnitsMembers[] = {instead(1, "recorded units", unitsList, Words::valueAlone),
                                             instead(2, "billing", billing)};
constexpr BerType chargedUnits = sequence(chargedUnitsMembers);
constexpr BerMember endCurrencyMembers[] = {instead(1, "free of charge", nothing),
                                            plain("charge", chargedCurrency, Words::valueAlone),
                                            plain("charging association", association)};
constexpr BerMember endUnitsMembers[] = {instead(1, "free of charge", nothing),
                                         plain("charge", chargedUnits, Words::valueAlone),
                                         plain("charging association", association)};
constexpr BerType endCurrency = sequence(endCurrencyMembers);
constexpr BerType endUnits = sequence(endUnitsMembers);
constexpr BerMember aocEndCurrencyMembers[] = {plain("no charge available", nothing),
                                               plain("charge", endCurrency, Words::valueAlone)};
constexpr BerMember aocEndUnitsMembers[] = {plain("no charge available", nothing),
                                            plain("charge", endUnits, Words::valueAlone)};

constexpr BerName scaleNames[] = {{0, "x 0.01 s"}, {1, "x 0.1 s"}, {2, "x 1 s"}, {3, "x 10 s"},
                                  {4, "x 1 min"},  {5, "x 1 h"},   {6, "x 24 h"}};
constexpr BerType scale = enumerated(scaleNames);
constexpr BerMember timeMembers[] = {instead(1, "time", integerType, Words::valueAlone),
                                     instead(2, "scale", scale, Words::valueAlone)};
constexpr BerType timeUnit = sequence(timeMembers);
constexpr BerName chargingNames[] = {{0, "continuous charging"}, {1, "step function"}};
constexpr BerType charging = enumerated(chargingNames);
constexpr BerName volumeNames[] = {{0, "octet"}, {1, "segment"}, {2, "message"}};
constexpr BerType volume = enumerated(volumeNames);
constexpr BerMember durationMembers[] = {instead(1, "currency", currencyText, Words::valueAlone),
                                         instead(2, "amount of currency", amount, Words::valueAlone),
                                         instead(3, "charging", charging, Words::valueAlone),
                                         instead(4, "each", timeUnit), instead(5, "granularity", timeUnit)};
constexpr BerType duration = sequence(durationMembers);
constexpr BerType flatRate = sequence(currencyMembers);
constexpr BerMember volumeMembers[] = {instead(1, "currency", currencyText, Words::valueAlone),
                                       instead(2, "amount of currency", amount, Words::valueAlone),
                                       instead(3, "each", volume)};
constexpr BerType volumeRate = sequence(volumeMembers);
constexpr BerName itemNames[] = {{0, "basic communication"},
                                 {1, "call attempt"},
                                 {2, "call set-up"},
                                 {3, "user-to-user information"},
                                 {4, "supplementary service"}};
constexpr BerType item = enumerated(itemNames);
constexpr BerMember rateMembers[] = {plain("charged item", item, Words::valueAlone),
                                     instead(1, "duration", duration),
                                     instead(2, "flat rate", flatRate),
                                     instead(3, "volume", volumeRate),
                                     plain("special charging code", integerType),
                                     instead(4, "free of charge", nothing),
                                     instead(5, "currency not available", nothing)};
constexpr BerType rate = sequence(rateMembers);
constexpr BerMember ratesMembers[] = {plain("rate", rate, Words::valueAlone)};
constexpr BerType rates = list(ratesMembers);
constexpr BerMember aocSetUpMembers[] = {plain("no charge available", nothing),
                                         plain("rates", rates, Words::valueAlone)};
constexpr BerMember specialMembers[] = {plain("no charge available", nothing),
                                        plain("special charging code", integerType)};
constexpr BerName caseNames[] = {{0, "at set-up"}, {1, "during the call"}, {2, "at the end of the call"}};

}  // namespace

const BerType chargingRequest = enumerated(caseNames);
const BerType aocSetUp = choice(aocSetUpMembers);
const BerType aocSetUpSpecial = choice(specialMembers);
const BerType aocDuringCurrency = choice(aocDuringCurrencyMembers);
const BerType aocDuringUnits = choice(aocDuringUnitsMembers);
const BerType aocEndCurrency = choice(aocEndCurrencyMembers);
const BerType aocEndUnits = choice(aocEndUnitsMembers);

}  // namespace isdn::facility

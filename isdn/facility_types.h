// What the arguments and results of known operations consist of.
#ifndef ISDN_FACILITY_TYPES_H
#define ISDN_FACILITY_TYPES_H

#include "isdn/ber_types.h"

namespace isdn::facility {

// A BOOLEAN, and an INTEGER; the operation's name says what the number counts.
extern const BerType truth, number;

// Advice of charge (EN 300 182-1).
extern const BerType chargingRequest, aocSetUp, aocSetUpSpecial, aocDuringCurrency, aocDuringUnits,
    aocEndCurrency, aocEndUnits;

// Diversion (EN 300 207-1), explicit call transfer (EN 300 369-1).
extern const BerType activation, deactivation, diversionInformation, callDeflection, callRerouteing, leg1,
    leg2, transferInform, subaddress;

// Private networks: names (ECMA-164), call transfer (ECMA-178), path replacement (ECMA-176), diversion
// (ECMA-174), messages that wait (ECMA-242).
extern const BerType nameArgument, transferActive, transferComplete, transferUpdate, transferInitiate,
    transferIdentity, privateLeg1, privateLeg2, privateLeg3, messageWaiting;

// The network facility extension, and what a receiver does with an operation that it does not know
// (ECMA-165).
extern const BerType networkExtension, interpretation;

}  // namespace isdn::facility

#endif

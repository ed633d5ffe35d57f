// D-channel frames that were recorded on real trunks: four separate excerpts.
#ifndef TESTS_CALLS_RECORDED_H
#define TESTS_CALLS_RECORDED_H

#include <cstdint>
#include <string_view>
#include <vector>

#include "tests/calls/Script.h"

namespace calls::testing {

// A frame a line: 1 for transmitted and 0 for received, ticks of 4 ms, octets.

// A European primary rate, seen from the user: one call, then keep-alives.
inline constexpr std::string_view europeanPrimary =
    "1 1095 000190900802009305a1040288901803a1838170058034303231\n"
    "0 1097 00010192\n"
    "0 1104 0201909208028093021803a9838f\n"
    "1 1105 02010192\n"
    "0 1119 0201929208028093011e028281\n"
    "1 1120 02010194\n"
    "0 1121 0201949208028093071e02828129060c05120a211c\n"
    "1 1122 00019296080200930f\n"
    "0 1123 00010194\n"
    "0 3684 02010195\n"
    "1 3685 02010197\n"
    "1 6219 00010197\n"
    "0 6220 00010195\n";

// A North American primary rate, seen from the user: one complete call.
inline constexpr std::string_view northAmericanCall =
    "0 6470 020101a5\n"
    "1 6480 020101b9\n"
    "0 6490 020101a5\n"
    "1 6500 020101b9\n"
    "1 6510 0001a4b80802003e0504038090a21803a983856c0c2180383031383032333030307008c133373339313230\n"
    "0 6520 000101a6\n"
    "0 6530 0201b8a60802803e021803a98385\n"
    "1 6540 020101ba\n"
    "0 6550 0201baa60802803e011e028288\n"
    "1 6560 020101bc\n"
    "0 6570 0201bca60802803e07\n"
    "1 6580 020101be\n"
    "1 6590 0001a6be0802003e0f\n"
    "0 6600 000101a8\n"
    "1 6610 0001a8be0802003e4508028a90\n"
    "0 6620 000101aa\n"
    "0 6630 0201beaa0802803e4d\n"
    "1 6640 020101c0\n"
    "1 6650 0001aac00802003e5a\n"
    "0 6660 000101ac\n"
    "0 6670 020101ad\n"
    "1 6680 020101c1\n"
    "0 6690 020101ad\n"
    "1 6700 020101c1\n";

// Six messages of a European primary rate as they came from the line. Every N(S) is 0.
inline constexpr std::string_view europeanReceived =
    "0 8543 0201000008021ba87b70028133\n"
    "0 8553 02010000080203780504038090a31803a9839e6c0c00813439353734313435303170088037313333343833\n"
    "0 8563 020100000802ba8d071e0282821e02828829060d0911111c1b4c0200c3\n"
    "0 8573 0201000008023a9205a104038090a31803a98393700ba034393539363032343234\n"
    "0 8583 "
    "02010000080229e30504038090a31803a9839d6c0c218134393537343134383137700ca13839363437383436393237740700018f"
    "32323339\n"
    "0 8593 "
    "02010000080211ef05a104038090a31803a183986c0c2181393236373139383538387008c1373939393039317d029181\n";

// A National ISDN basic access, seen from the user: TEIs 67 and 68, a broadcast SETUP, no end.
inline constexpr std::string_view nationalBasic =
    "1 13020 00890103\n"
    "0 13030 00890103\n"
    "0 13040 02ff0308011405040288901801893401403b0281816c08a1383335383636327008c138333538363631\n"
    "1 13050 0087020208019401180189\n"
    "0 13060 028702040801147b952a1b809402603d8b07383335383636328d0b2054656c746f6e65203220\n"
    "1 13070 0087040408019407\n";

inline constexpr std::string_view recorded[] = {europeanPrimary, northAmericanCall, europeanReceived,
                                                nationalBasic};

std::vector<ScriptFrame> recordedFrames(std::string_view excerpt);

}  // namespace calls::testing

#endif

// Options of the commands that show channels: which channels the trunks have.
#ifndef READER_TRUNK_ROWS_H
#define READER_TRUNK_ROWS_H

#include "reader/OptionRow.h"

namespace reader {

inline constexpr OptionRow e1Row{
    "--e1", "", "The trunks have the channels of E1 (default: learnt)",
    [](Options& to, const std::string&) { to.calls.trunk = calls::TrunkSize::e1; }, "trunk"};
inline constexpr OptionRow t1Row{
    "--t1", "", "The trunks have the channels of T1",
    [](Options& to, const std::string&) { to.calls.trunk = calls::TrunkSize::t1; }, "trunk"};
inline constexpr OptionRow basicRow{
    "--bri", "", "The trunks are basic accesses",
    [](Options& to, const std::string&) { to.calls.trunk = calls::TrunkSize::basic; }, "trunk"};

}  // namespace reader

#endif

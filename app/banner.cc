#include "app/banner.h"

#include <iostream>

#include "decoder/lines.h"

namespace app {

namespace {

constexpr char Title[] = "\nOrvane KV9 ISDN Trace Utility";
constexpr char Notice[] = "Records the D-channel signalling of one trunk, decoded.";
constexpr char VersionRecord[] = "Version 1.00-Build-04 lapdmon";

}  // namespace

void telvar_header() {
    std::cout << Title << std::endl << Notice << std::endl << VersionRecord << std::endl;
    decoder::text(Title, "\n", Notice, "\n", VersionRecord, "\n");
    decoder::flushLines();
}

}  // namespace app

// The lines of a log that belong to no frame: its head, and what the recorder says between frames.
#ifndef DECODER_LOG_LINES_H
#define DECODER_LOG_LINES_H

#include <array>
#include <string_view>

namespace decoder {

// The head: an empty line, these three, and the line of the trunk's variant once it is known.
inline constexpr char logTitle[] = "Orvane KV9 ISDN Trace Utility";
inline constexpr char logNotice[] = "Records the D-channel signalling of one trunk, decoded.";
inline constexpr char logVersion[] = "Version 1.00-Build-04 lapdmon";

struct VariantLine {
    int variant;  // swit
    std::string_view line;
};

inline constexpr std::array variantLines{
    VariantLine{1, "4ESS Switch \n"}, VariantLine{2, "5ESS Switch \n"}, VariantLine{3, "DMS100 Switch \n"},
    VariantLine{4, "NTT Switch \n"},  VariantLine{7, "NET5 Switch \n"}, VariantLine{10, "NI2 Switch \n"},
};

// Empty for a variant that has none.
constexpr std::string_view variantLine(int variant) {
    for (const VariantLine& known : variantLines) {
        if (known.variant == variant)
            return known.line;
    }
    return "";
}

// Lines for a record that could not be queued, and for one that could not be taken out of the queue; and the
// beginning of "Frames Lost: N \n", which stands where N frames are missing for any reason.
inline constexpr char enqueueFailed[] = "Enqueue Failed \n";
inline constexpr char getFailed[] = "Get iemsg failed \n";
inline constexpr char framesLost[] = "Frames Lost: ";

}  // namespace decoder

#endif

// Explains every octet of a frame or of an element: its bits, their field, its value and meaning, and the
// clause of the standard.
#ifndef READER_EXPLAIN_H
#define READER_EXPLAIN_H

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "isdn/Field.h"
#include "reader/OptionRow.h"
#include "reader/Pipeline.h"

namespace reader {

// Composes a paragraph for each frame.
class ExplainComposer : public Composer {
  public:
    explicit ExplainComposer(bool colors) : colors_(colors) {}

    void compose(const Seen& seen, std::string& text, Piece& piece) override;

    // Appends the rows of a frame that has no time and no direction.
    void explainFrame(std::span<const std::uint8_t> octets, isdn::Variant variant, std::string& text) const;
    void explainElement(std::span<const std::uint8_t> octets, isdn::Variant variant, std::string& text) const;

  private:
    bool colors_;
    TimeText times_;
};

// Reads octets from hexadecimal digits. Blanks, colons, dashes and commas may separate parts, and each part
// may begin with "0x". Returns nothing for any other text. Throws UsageError for a part with half an octet.
std::optional<std::vector<std::uint8_t>> readHex(std::string_view text);

// Whether octets look like an element: the second one is the number of octets that follow.
bool looksLikeElement(std::span<const std::uint8_t> octets);

std::span<const OptionRow> explainOptions();
int runExplain(const Options& options, Chatter& chatter);

}  // namespace reader

#endif

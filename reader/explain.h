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
    void explainFrame(std::span<const std::uint8_t> octets, isdn::Variant variant, std::string& text);
    void explainElement(std::span<const std::uint8_t> octets, isdn::Variant variant, std::string& text);

  private:
    void putRows(std::string& text);
    void putRow(std::string& text, const isdn::Field& field);
    void putElement(std::string& text, const isdn::Element& element, isdn::Variant variant);
    void putMessage(std::string& text, const isdn::Layer3& message, isdn::Variant variant);
    void putHeading(std::string& text, std::string_view words);
    void putProblem(std::string& text, isdn::Problem problem);
    void putContents(std::string& text, std::span<const std::uint8_t> octets, isdn::Variant variant);

    bool colors_;
    TimeText times_;
    isdn::Fields fields_;
    const std::uint8_t* begin_ = nullptr;  // the octet from which positions are counted
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

// Writes one JSON object a line: a frame, or what the recorder says between frames. docs/user/jsonl.md
// describes the form.
#ifndef READER_JSON_H
#define READER_JSON_H

#include <string>
#include <string_view>

#include "isdn/Field.h"
#include "reader/Pipeline.h"

namespace reader {

// The version of the form, the value of "v". Increase it when a key is removed or gets another meaning, and
// not when a key is added.
inline constexpr int jsonVersion = 1;

// Appends a JSON string. The encoding of a frame's text is not known, so an octet that is not ASCII becomes
// the character of that number (ISO 8859-1). So the line is valid whatever the octets are.
void appendJsonString(std::string& to, std::string_view text);

class JsonComposer : public Composer {
  public:
    void compose(const Seen& seen, std::string& text, Piece& piece) override;

  private:
    void putFrame(std::string& text, const Seen& seen);
    void putMessage(std::string& text, const Seen& seen);
    void putElement(std::string& text, const isdn::Element& element, isdn::Variant variant);

    TimeText times_;
    isdn::Fields fields_;
};

}  // namespace reader

#endif

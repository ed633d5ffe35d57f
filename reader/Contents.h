// Takes a frame apart and tells a visitor its parts one by one: headings, fields, and what is wrong.
#ifndef READER_CONTENTS_H
#define READER_CONTENTS_H

#include <string>
#include <string_view>

#include "isdn/Field.h"
#include "isdn/Layer3.h"

namespace reader {

class ContentsVisitor {
  public:
    ContentsVisitor() = default;
    ContentsVisitor(const ContentsVisitor&) = delete;
    ContentsVisitor& operator=(const ContentsVisitor&) = delete;
    virtual ~ContentsVisitor() = default;

    // The link header, the message or an element begins: "I", "SETUP", "CAUSE, codeset 5".
    virtual void heading(std::string_view words) = 0;
    // A field of the part. Its views are valid only during the call.
    virtual void field(const isdn::Field& field) = 0;
    // Something is wrong with the part whose fields came before.
    virtual void problem(isdn::Problem problem) = 0;
};

// A frame from its address field on.
void visitFrame(isdn::Octets octets, isdn::Variant variant, ContentsVisitor& visitor);
void visitMessage(const isdn::Layer3& message, isdn::Variant variant, ContentsVisitor& visitor);
// Elements as they stand in a message, each beginning with its identifier.
void visitElements(const isdn::Elements& elements, isdn::Variant variant, ContentsVisitor& visitor);

}  // namespace reader

#endif

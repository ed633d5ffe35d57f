#include "reader/Contents.h"

#include "isdn/Layer2.h"

namespace reader {

namespace {

void visit(const isdn::Fields& fields, isdn::Problem problem, ContentsVisitor& visitor) {
    for (const isdn::Field& field : fields)
        visitor.field(field);
    if (problem != isdn::Problem::none)
        visitor.problem(problem);
}

}  // namespace

void visitMessage(const isdn::Layer3& message, isdn::Variant variant, ContentsVisitor& visitor) {
    visitor.heading(message.hasType ? isdn::messageName(message) : isdn::protocolName(message.discriminator));
    isdn::Fields fields;
    const isdn::Problem problem = isdn::fieldsOf(message, fields);
    visit(fields, problem, visitor);
    visitElements(message.elements, variant, visitor);
}

void visitElements(const isdn::Elements& elements, isdn::Variant variant, ContentsVisitor& visitor) {
    isdn::Fields fields;
    for (const isdn::Element& element : elements) {
        std::string heading(isdn::elementName(element, variant));
        if (heading.empty())
            heading = "unknown element";
        if (element.codeset != 0)
            heading += ", codeset " + std::to_string(element.codeset);
        visitor.heading(heading);
        fields.clear();
        const isdn::Problem problem = isdn::fieldsOf(element, variant, fields);
        visit(fields, problem, visitor);
    }
}

void visitFrame(isdn::Octets octets, isdn::Variant variant, ContentsVisitor& visitor) {
    const isdn::Layer2 link = isdn::parseLayer2(octets);
    visitor.heading(isdn::nameOf(link.type));
    isdn::Fields fields;
    const isdn::Problem problem = isdn::fieldsOf(link, fields);
    visit(fields, problem, visitor);
    if (link.carriesMessage())
        visitMessage(isdn::parseLayer3(link.information), variant, visitor);
}

}  // namespace reader

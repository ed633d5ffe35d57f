// A layer-3 message: its header and its elements (Q.931 4.1 to 4.5). Everything in it is a view of the frame.
#ifndef ISDN_LAYER3_H
#define ISDN_LAYER3_H

#include <cstddef>
#include <cstdint>
#include <iterator>
#include <string_view>

#include "isdn/octets.h"

namespace isdn {

inline constexpr std::uint8_t callControl = 0x08;  // protocol discriminator of Q.931
// protocol discriminator of SERVICE on North American trunks
inline constexpr std::uint8_t maintenance = 0x03;
inline constexpr std::uint8_t maintenanceOfNetwork = 0x43;  // the same on other North American trunks

constexpr bool isMaintenance(std::uint8_t discriminator) {
    return discriminator == maintenance || discriminator == maintenanceOfNetwork;
}

// A call reference (Q.931 4.3). Length 0 is the dummy reference; value 0 of any length is the global one.
struct CallReference {
    Octets octets;            // the value's octets, flag included
    std::uint64_t value = 0;  // without the flag; of more than eight octets the last eight
    std::uint8_t length = 0;  // octets announced, 0 to 15
    bool flag = false;        // set in messages to the side that chose the value

    bool dummy() const { return length == 0; }
    bool global() const { return length != 0 && value == 0; }
};

// One element of a message.
struct Element {
    Octets octets;             // all of it that is in the message, identifier and length included
    Octets contents;           // what follows the length octet; empty for a single-octet element
    std::uint8_t id = 0;       // the identifier octet as coded
    std::uint8_t codeset = 0;  // 0 to 7
    bool ofService = false;    // of a SERVICE message, where some identifiers mean another thing
    Problem problem = Problem::none;

    // Elements of one octet carry their value in the identifier (Q.931 4.5.1). They exist in every codeset.
    bool singleOctet() const { return (id & 0x80U) != 0; }
    // 0x9X in any codeset: the elements that follow, or the next one, are of another codeset (Q.931 4.5.2
    // to 4.5.4).
    bool shift() const { return (id & 0xF0U) == 0x90U; }
};

// The elements of a message in their order, shifts included. They are found during the walk: `for (const
// Element& e : elements)`. Nothing is allocated. Every octet belongs to exactly one element.
class Elements {
  public:
    class Iterator {
      public:
        using value_type = Element;
        using difference_type = std::ptrdiff_t;
        using iterator_concept = std::input_iterator_tag;

        Iterator(Octets rest, std::uint8_t codeset, bool ofService)
            : rest_(rest), locked_(codeset), next_(codeset), ofService_(ofService) {
            take();
        }
        const Element& operator*() const { return element_; }
        const Element* operator->() const { return &element_; }
        Iterator& operator++() {
            take();
            return *this;
        }
        void operator++(int) { take(); }
        bool operator==(std::default_sentinel_t) const { return element_.octets.empty(); }

      private:
        void take();

        Element element_;
        Octets rest_;
        std::uint8_t locked_;  // the codeset after the last locking shift
        std::uint8_t next_;    // the codeset of the next element
        bool ofService_;
    };

    Elements() = default;
    explicit Elements(Octets octets, std::uint8_t codeset = 0, bool ofService = false)
        : octets_(octets), codeset_(codeset), ofService_(ofService) {}

    Iterator begin() const { return {octets_, codeset_, ofService_}; }
    std::default_sentinel_t end() const { return {}; }
    Octets octets() const { return octets_; }

    // The first element with this identifier in this codeset, or an element without octets if there is none.
    Element find(std::uint8_t id, std::uint8_t codeset = 0) const;

  private:
    Octets octets_;
    std::uint8_t codeset_ = 0;
    bool ofService_ = false;
};

// A message of the call control of Q.931, or of maintenance. In a message of another protocol only the
// discriminator is read: hasCallReference and hasType are false, and everything after it is in `raw`.
struct Layer3 {
    Octets octets;
    Octets header;  // discriminator, call reference, message type
    Octets raw;     // octets outside elements: a segment's piece, another protocol, or after a damaged header
    Elements elements;
    CallReference callReference;
    Problem problem = Problem::none;
    std::uint8_t discriminator = 0;
    std::uint8_t type =
        0;  // the message type octet; of a national message (escape 00) the octet behind the escape
    bool hasCallReference = false;
    bool hasType = false;
    bool national = false;  // the type was announced by the escape 00 (Q.931 4.4)
};

// `information` is what follows the link header of an I or UI frame of SAPI 0, or a message put together from
// segments. Nothing is allocated.
Layer3 parseLayer3(Octets information);

// "SETUP", "SERVICE ACKNOWLEDGE", ...; empty for an unknown type. In the words of Q.931, in capitals.
std::string_view messageName(std::uint8_t discriminator, std::uint8_t type);
inline std::string_view messageName(const Layer3& message) {
    return message.hasType && !message.national ? messageName(message.discriminator, message.type)
                                                : std::string_view();
}

// "call control", "maintenance"; empty for an unknown discriminator.
std::string_view protocolName(std::uint8_t discriminator);

namespace message {
inline constexpr std::uint8_t alerting = 0x01, callProceeding = 0x02, progress = 0x03, setup = 0x05,
                              connect = 0x07, setupAcknowledge = 0x0D, connectAcknowledge = 0x0F,
                              userInformation = 0x20, suspendReject = 0x21, resumeReject = 0x22, hold = 0x24,
                              suspend = 0x25, resume = 0x26, holdAcknowledge = 0x28,
                              suspendAcknowledge = 0x2D, resumeAcknowledge = 0x2E, holdReject = 0x30,
                              retrieve = 0x31, retrieveAcknowledge = 0x33, retrieveReject = 0x37,
                              disconnect = 0x45, restart = 0x46, release = 0x4D, restartAcknowledge = 0x4E,
                              releaseComplete = 0x5A, segment = 0x60, facility = 0x62, registration = 0x64,
                              notify = 0x6E, statusEnquiry = 0x75, congestionControl = 0x79,
                              information = 0x7B, status = 0x7D;
inline constexpr std::uint8_t serviceAcknowledge = 0x07, service = 0x0F;  // of the maintenance discriminators
}  // namespace message

namespace element {
inline constexpr std::uint8_t segmentedMessage = 0x00, changeStatus = 0x01, bearerCapability = 0x04,
                              cause = 0x08, extendedFacility = 0x0D, callIdentity = 0x10, callState = 0x14,
                              channelIdentification = 0x18, facility = 0x1C, progressIndicator = 0x1E,
                              networkFacilities = 0x20, notificationIndicator = 0x27, display = 0x28,
                              dateTime = 0x29, keypad = 0x2C, signal = 0x34, connectedNumber = 0x4C,
                              connectedSubaddress = 0x4D, callingNumber = 0x6C, callingSubaddress = 0x6D,
                              calledNumber = 0x70, calledSubaddress = 0x71, originalCalledNumber = 0x73,
                              redirectingNumber = 0x74, redirectionNumber = 0x76, transitNetwork = 0x78,
                              restartIndicator = 0x79, lowLayerCompatibility = 0x7C,
                              highLayerCompatibility = 0x7D, userUser = 0x7E, moreData = 0xA0,
                              sendingComplete = 0xA1;
}  // namespace element

}  // namespace isdn

#endif

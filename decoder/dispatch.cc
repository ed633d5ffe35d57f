#include "decoder/dispatch.h"

#include <array>
#include <cstddef>
#include <string_view>
#include <utility>

#include "decoder/elements.h"
#include "decoder/layer3.h"
#include "decoder/trunks.h"

namespace decoder {

namespace {

struct MessageRow {
    unsigned char code;
    std::string_view name;
};

struct ElementRow {
    unsigned char code;
    ElementDecoder decode;
};

// Makes a table in which each row is at the index that is its code. Two rows with the same code do not
// compile.
template <typename Row, std::size_t N>
consteval std::array<Row, 256> byCode(const Row (&rows)[N]) {
    std::array<Row, 256> table{};
    std::array<bool, 256> taken{};
    for (const Row& row : rows) {
        if (std::exchange(taken[row.code], true))
            throw "the code has a row already";
        table[row.code] = row;
    }
    return table;
}

// clang-format off

using enum FrameKind;

// Each unnumbered frame has two rows, with the poll/final bit clear and set. Supervisory frames are only
// those with exactly these first octets.
constexpr FrameName frameRows[] = {
    {0x01, supervisory, "Receive Ready"},
    {0x05, supervisory, "Receive Not Ready"},
    {0x09, supervisory, "Reject"},
    {0x03, unnumberedInformation, "Unnumbered Information"},
    {0x13, unnumberedInformation, "Unnumbered Information"},
    {0x0F, unnumbered, "Disconnected Mode"},
    {0x1F, unnumbered, "Disconnected Mode"},
    {0x43, unnumbered, "Disconnect"},
    {0x53, unnumbered, "Disconnect"},
    {0x63, unnumbered, "Unnumbered Acknowledgment"},
    {0x73, unnumbered, "Unnumbered Acknowledgment"},
    {0x6F, unnumbered, "Set Asynchronous Balanced Mode"},
    {0x7F, unnumbered, "Set Asynchronous Balanced Mode"},
    {0x87, unnumbered, "Frame Reject"},
    {0x97, unnumbered, "Frame Reject"},
    {0xAF, unnumbered, "Exchange Identification"},
    {0xBF, unnumbered, "Exchange Identification"},
};

constexpr MessageRow messageRows[] = {
    {0x01, "ALERTING"},
    {0x02, "CALL PROCEEDING"},
    {0x03, "CALL PROGRESS"},
    {0x05, "SETUP"},
    {0x07, "CALL CONNECT"},
    {0x0D, "SETUP_ACK"},
    {0x0F, "CALL CONNECT ACKNOWLEDGE"},
    {0x20, "USER INFORMATION"},
    {0x45, "CALL DISCONNECT"},
    {0x46, "RESTART"},
    {0x4D, "RELEASE"},
    {0x4E, "RESTART ACKNOWLEDGE"},
    {0x5A, "RELEASE COMPLETE"},
    {0x62, "CALL FACILITY"},
    {0x64, "REGISTER"},
    {0x6A, "CALL FACILITY ACKNOWLEDGE"},
    {0x6E, "NOTIFY"},
    {0x72, "CALL FACILITY REJECT"},
    {0x75, "STATUS EQUIRY"},
    {0x79, "CONGESTION CONTROL"},
    {0x7B, "INFORMATION"},
    {0x7D, "STATUS"},
};

constexpr MessageRow maintenanceRows[] = {
    {0x07, "SERVICE ACKNOWLEDGE"},
    {0x0F, "SERVICE"},
};

// The identifier 01 is CHANGE STATUS on some trunks and ADVICE OF CHARGE on NTT. On NI2 it is neither:
// nothing is shown, and the element's length and content are taken as further identifiers.
void changeStatusOrAdvice(unsigned char id, RingBuffer* rb) {
    if (on(att4ess | ess5 | net5 | dms100))
        changestatus(id, rb);
    else if (on(ntt))
        AdviceOfCharge(id, rb);
}

// Shows nothing and takes only the identifier. The element's length and content are taken as further
// identifiers.
void identifierOnly(unsigned char, RingBuffer*) {}

constexpr ElementRow elementRows[] = {
    {0x01, changeStatusOrAdvice},
    {0x03, BlockChanId},
    {0x04, bearer_capability},
    {0x08, fun_cause},
    {0x0C, connected_number},
    {0x10, callidentity},
    {0x14, callstate},
    {0x18, channel_identification},
    {0x1C, facility},
    {0x1E, progress_indicator},
    {0x20, network_specific_fac},
    {0x21, callidentity},
    {0x24, terminal_capabilities},
    {0x27, notification_indicator},
    {0x28, display},
    {0x29, datetime},
    {0x32, information_req},
    {0x34, signal_fun},
    {0x39, feature_indication},
    {0x3A, identifierOnly},
    {0x3B, identifierOnly},
    {0x6C, calling_party_num},
    {0x6D, calling_party_subaddress},
    {0x70, called_party_num},
    {0x71, called_party_subaddress},
    {0x73, original_called_num},
    {0x74, redirecting_number},
    {0x78, transit_network_selection},
    {0x79, restart_indicator},
    {0x7A, user_to_user_facility},
    {0x7B, identifierOnly},
    {0x7C, low_layer_compat},
    {0x7D, high_layer_compat},
    {0x7E, useruser},
    {0x96, [](unsigned char id, RingBuffer*) { codeset6(id); }},
    {0x97, [](unsigned char id, RingBuffer*) { codeset7(id); }},
    {0x98, non_locking_shift},
    {0x9E, non_locking_shift},
    {0xA0, [](unsigned char id, RingBuffer*) { moredata(id); }},
    {0xA1, [](unsigned char id, RingBuffer*) { sending_complete(id); }},
    {0xB0, [](unsigned char id, RingBuffer*) { congestion_level(id); }},
};

// clang-format on

constexpr auto frames = byCode(frameRows);
constexpr auto messages = byCode(messageRows);
constexpr auto maintenanceMessages = byCode(maintenanceRows);
constexpr auto elements = byCode(elementRows);

}  // namespace

const FrameName& frameName(unsigned char control) { return frames[control]; }

std::string_view messageName(unsigned char type) { return messages[type].name; }

std::string_view maintenanceMessageName(unsigned char type) { return maintenanceMessages[type].name; }

ElementDecoder elementDecoder(unsigned char id) { return elements[id].decode; }

}  // namespace decoder

#include "softboard/message_text.h"

#include <algorithm>
#include <array>
#include <span>

#include "softboard/codes.h"
#include "softboard/hex.h"
#include "softboard/wire.h"

namespace softboard {

namespace {

enum class Kind { number, address, attributes, octets };

struct Field {
    const char* label = nullptr;
    Kind kind = Kind::number;
};

struct Row {
    uint32_t type;
    const char* name;
    std::array<Field, 5> fields{};  // up to the first field without a label
};

constexpr auto number = Kind::number;
constexpr auto address = Kind::address;
constexpr auto attributes = Kind::attributes;
constexpr auto octets = Kind::octets;

// clang-format off
const Row rows[] = {
    {msgError, "Error", {{{"ErrorMsg", number}, {"ErrorCode", number}, {"Data", octets}}}},
    {msgAck, "Ack"},
    {msgComtest, "Comtest"},
    {msgComtestCmplt, "ComtestCmplt"},
    {msgInit, "Init"},
    {msgInitCmplt, "InitCmplt"},
    {msgExit, "Exit"},
    {msgExitCmplt, "ExitCmplt"},
    {msgSetParm, "SetParm", {{{"Parm", number}, {"Val", number}}}},
    {msgSetParmCmplt, "SetParmCmplt"},
    {msgGetParm, "GetParm", {{{"Num", number}}}},
    {msgGetParmCmplt, "GetParmCmplt", {{{"Num", number}, {"Val", number}, {"TextSize", number}, {"Text", octets}}}},
    {msgDetectEvt, "DetectEvt", {{{"RetAddr", address}, {"EvtType", number}, {"EvtGroup", number}}}},
    {msgDetectEvtCmplt, "DetectEvtCmplt"},
    {msgDetectxEvts, "DetectxEvts", {{{"RetAddr", address}, {"Count", number}, {"List", octets}}}},
    {msgDetectxEvtsCmplt, "DetectxEvtsCmplt"},
    {msgCancelEvt, "CancelEvt", {{{"Type", number}}}},
    {msgCancelEvtCmplt, "CancelEvtCmplt"},
    {msgCancelxEvts, "CancelxEvts", {{{"Count", number}, {"EvtTypeList", octets}}}},
    {msgCancelxEvtsCmplt, "CancelxEvtsCmplt"},
    {msgCancelAllEvts, "CancelAllEvts"},
    {msgEvtDetected, "EvtDetected", {{{"EvtGroup", number}, {"Direction", number}, {"Timestamp", number},
                                      {"Length", number}, {"List", octets}}}},
    {ieMessage, "ieMessage", {{{"Data", octets}}}},
    {resultComplete, "ResultComplete"},
    {componentResult, "ComponentResult", {{{"desc", address}}}},
    {compAttrInfo, "CompAttrInfo", {{{"theInstance", address}, {"count", number}, {"attroffset", number}}}},
    {compAttrInfoResult, "CompAttrInfoResult", {{{"theComponent", address}, {"attrs", attributes}}}},
    {compFindAll, "CompFindAll", {{{"startDesc", address}, {"endDesc", address}, {"attr", attributes}}}},
    {compMultipleResult, "CompMultipleResult", {{{"count", number}, {"nextComponent", address}, {"comps", octets}}}},
    {compFind, "CompFind", {{{"CompStart", address}, {"attr", attributes}}}},
    {compInstAllocate, "CompInstAllocate", {{{"CompStart", address}, {"ClustDesc", address}, {"attr", attributes}}}},
    {compInstFree, "CompInstFree", {{{"desc", address}}}},
    {compUse, "CompUse", {{{"Count", number}, {"List", octets}}}},
    {compUnuse, "CompUnuse", {{{"Count", number}, {"List", octets}}}},
};
// clang-format on

const Row* rowOf(uint32_t type) {
    const auto* row =
        std::find_if(std::begin(rows), std::end(rows), [type](const Row& r) { return r.type == type; });
    return row == std::end(rows) ? nullptr : row;
}

// Reads a count, and then a key and a value for each attribute.
std::string attributesText(BodyReader& body) {
    std::string text;
    for (uint32_t left = body.u32(); left > 0 && body.ok() && body.left() > 0; --left) {
        const uint32_t key = body.u32();
        const auto value = static_cast<int32_t>(body.u32());
        text += (text.empty() ? "" : " ") + std::to_string(key) + "=" + std::to_string(value);
    }
    return "[" + text + "]";
}

std::string fieldText(BodyReader& body, Kind kind) {
    switch (kind) {
        case Kind::number:
            return std::to_string(body.u32());
        case Kind::address:
            return toString(body.address());
        case Kind::attributes:
            return attributesText(body);
        default:
            return hex(body.rest());
    }
}

}  // namespace

std::string messageName(const Message& message) {
    if (message.type == msgError && message.body.empty()) {
        return "Wake";
    }
    const Row* row = rowOf(message.type);
    return row == nullptr ? "?" : row->name;
}

std::string bodyText(const Message& message) {
    BodyReader body(message.body);
    std::string text;
    const auto add = [&text](const std::string& part) { text += (text.empty() ? "" : " ") + part; };
    if (const Row* row = rowOf(message.type); row != nullptr && body.left() > 0) {
        for (const Field& field : row->fields) {
            if (field.label == nullptr || (field.kind == Kind::octets && body.left() == 0)) {
                break;
            }
            const std::string value = fieldText(body, field.kind);
            add(body.ok() ? field.label + (" " + value) : "...");
            if (!body.ok()) {
                break;
            }
        }
    }
    if (body.left() > 0) {
        add("+" + hex(body.rest()));
    }
    return "{" + text + "}";
}

}  // namespace softboard

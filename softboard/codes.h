// The message types, component types and numbers that the board knows.
#ifndef SOFTBOARD_CODES_H
#define SOFTBOARD_CODES_H

#include <cstddef>
#include <cstdint>

namespace softboard {

enum MessageType : uint32_t {
    msgError = 0,
    msgAck = 1,
    msgComtest = 2,
    msgComtestCmplt = 3,
    msgInit = 4,
    msgInitCmplt = 5,
    msgExit = 6,
    msgExitCmplt = 7,
    msgSetParm = 8,
    msgSetParmCmplt = 9,
    msgGetParm = 18,
    msgGetParmCmplt = 19,
    msgDetectEvt = 22,
    msgDetectEvtCmplt = 23,
    msgDetectxEvts = 24,
    msgDetectxEvtsCmplt = 25,
    msgCancelEvt = 26,
    msgCancelEvtCmplt = 27,
    msgCancelxEvts = 28,
    msgCancelxEvtsCmplt = 29,
    msgCancelAllEvts = 30,
    msgEvtDetected = 32,
    ieMessage = 5376,
    resultComplete = 8388608,
    componentResult = 8388615,
    compAttrInfoResult = 8388614,
    compAttrInfo = 8388666,
    compFind = 8388669,
    compInstAllocate = 8388670,
    compInstFree = 8388673,
    compUse = 8388697,
    compUnuse = 8388698,
    compFindAll = 8388706,
    compMultipleResult = 8388707,
};

// ErrorCode of an error reply.
enum class ErrorCode : uint32_t {
    unknownCommand = 1,
    unknownParameter = 2,
    valueRefused = 3,
    nothingFound = 4,
    noSuchComponent = 5,
    bodyTooShort = 6,
};

constexpr uint8_t tscType = 0x12;
constexpr uint8_t ccsType = 0x15;
constexpr uint8_t anyNumber = 255;         // in a search
constexpr uint32_t componentTypeKey = 0;   // of a search's attributes
constexpr size_t mostFound = 8;            // components in one reply to a search for all
constexpr uint32_t protocolParameter = 7;  // the trunk's protocol type
constexpr uint32_t traceParameter = 10;    // 1: layer-2 trace on
constexpr uint32_t layer2TraceEvents = 2;  // event group
constexpr uint32_t ticksPerSecond = 250;   // the board's clock
constexpr uint32_t millisecondsPerTick = 4;

}  // namespace softboard

#endif

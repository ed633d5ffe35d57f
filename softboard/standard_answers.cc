// The commands that every component instance answers: communication test, parameters, event subscriptions.
#include "softboard/answers.h"

namespace softboard {

namespace {

// The last field of the error reply to a parameter command.
Octets parameterData(uint32_t number, uint32_t value) { return BodyWriter().u32(number).u32(value).take(); }

// Returns the parameter. If the component has none of this number, refuses the request and returns null.
Parameter* findParameter(Request& request, uint32_t number, uint32_t value) {
    auto& parameters = request.component->parameters;
    const auto found = parameters.find(number);
    if (!request.body.ok()) {
        request.refuse(ErrorCode::bodyTooShort, parameterData(number, value));
    } else if (found == parameters.end()) {
        request.refuse(ErrorCode::unknownParameter, parameterData(number, value));
    } else {
        return &found->second;
    }
    return nullptr;
}

void setParm(Request& request) {
    const uint32_t number = request.body.u32();
    const uint32_t value = request.body.u32();
    Parameter* parameter = findParameter(request, number, value);
    if (parameter == nullptr) {
        return;
    }
    if (!parameter->settable || value > parameter->largest) {
        request.refuse(ErrorCode::valueRefused, parameterData(number, value));
        return;
    }
    parameter->value = value;
}

void getParm(Request& request) {
    const uint32_t number = request.body.u32();
    const Parameter* parameter = findParameter(request, number, 0);
    if (parameter == nullptr) {
        return;
    }
    const std::string& text = parameter->text;
    request.reply.u32(number).u32(parameter->value).u32(static_cast<uint32_t>(text.size()));
    request.reply.octets({reinterpret_cast<const uint8_t*>(text.data()), text.size()});
}

void detectEvt(Request& request) {
    const Address returnTo = request.body.address();
    const uint32_t event = request.body.u32();
    request.body.u32();  // EvtGroup is ignored: EvtType alone says which events are subscribed to
    if (!request.body.ok()) {
        request.refuse(ErrorCode::bodyTooShort);
        return;
    }
    request.component->subscribe(event, returnTo);
}

void detectxEvts(Request& request) {
    const Address returnTo = request.body.address();
    for (uint32_t left = request.body.u32(); left > 0 && request.body.ok(); --left) {
        const uint32_t event = request.body.u32();
        request.body.u32();
        if (request.body.ok()) {
            request.component->subscribe(event, returnTo);
        }
    }
    if (!request.body.ok()) {
        request.refuse(ErrorCode::bodyTooShort);
    }
}

// The command names no return address: it ends the subscription of the queue that sends it.
void cancelEvt(Request& request) {
    const uint32_t event = request.body.u32();
    if (!request.body.ok()) {
        request.refuse(ErrorCode::bodyTooShort);
        return;
    }
    request.component->cancel(event, request.from);
}

void cancelxEvts(Request& request) {
    for (uint32_t left = request.body.u32(); left > 0 && request.body.ok(); --left) {
        const uint32_t event = request.body.u32();
        if (request.body.ok()) {
            request.component->cancel(event, request.from);
        }
    }
    if (!request.body.ok()) {
        request.refuse(ErrorCode::bodyTooShort);
    }
}

void cancelAllEvts(Request& request) { request.component->forget(request.from); }

constexpr Answer answers[] = {
    {msgError, {}, At::both, acknowledge},
    {msgAck, {}, At::both, acknowledge},
    {msgComtest, msgComtestCmplt, At::both, acknowledge},
    {msgInit, msgInitCmplt, At::component, acknowledge},
    {msgExit, msgExitCmplt, At::component, acknowledge},
    {msgSetParm, msgSetParmCmplt, At::component, setParm},
    {msgGetParm, msgGetParmCmplt, At::component, getParm},
    {msgDetectEvt, msgDetectEvtCmplt, At::component, detectEvt},
    {msgDetectxEvts, msgDetectxEvtsCmplt, At::component, detectxEvts},
    {msgCancelEvt, msgCancelEvtCmplt, At::component, cancelEvt},
    {msgCancelxEvts, msgCancelxEvtsCmplt, At::component, cancelxEvts},
    {msgCancelAllEvts, {}, At::component, cancelAllEvts},
    {ieMessage, {}, At::component, acknowledge},
};

}  // namespace

void acknowledge(Request& /*request*/) {}

std::span<const Answer> standardAnswers() { return answers; }

}  // namespace softboard

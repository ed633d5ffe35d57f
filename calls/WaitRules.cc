#include "calls/WaitRules.h"

namespace calls {

namespace {

namespace type = isdn::message;

std::bitset<128> typesOf(std::initializer_list<std::uint8_t> list) {
    std::bitset<128> types;
    for (const std::uint8_t each : list)
        types.set(each);
    return types;
}

}  // namespace

// clang-format off
const std::vector<Waits::Rule>& Waits::rules() {
    using T = Timers;
    using enum capture::Role;
    const auto clearing = typesOf({type::disconnect, type::release, type::releaseComplete});
    const auto goesOn = typesOf({type::callProceeding, type::alerting, type::connect});
    static const std::vector<Rule> rows{
        {.ask = type::setup, .asker = unknown,
         .answers = goesOn | clearing | typesOf({type::setupAcknowledge, type::progress}),
         .isRepeated = true, .timer = "T303", .user = &T::t303, .network = &T::t303,
         .finding = &findings::setupUnanswered, .repetition = &findings::setupRepeated},
        {.ask = type::setupAcknowledge, .asker = unknown, .answers = goesOn, .sameSideAnswers = true,
         .progressStops = true, .digitsRestart = true,
         .timer = "T304", .user = &T::t304User, .network = &T::t304Network,
         .finding = &findings::overlapTimeout},
        {.ask = type::callProceeding, .asker = unknown, .answers = typesOf({type::alerting, type::connect}),
         .sameSideAnswers = true, .progressStops = true,
         .timer = "T310", .user = &T::t310User, .network = &T::t310Network,
         .finding = &findings::proceedingUnanswered},
        // Clearing a call that nobody answers is normal. Only a wait beyond the timer is worth a note.
        {.ask = type::alerting, .asker = unknown, .answers = typesOf({type::connect}),
         .sameSideAnswers = true, .waitingSideGivesUp = false,
         .timer = "T301", .user = &T::t301, .network = &T::t301,
         .finding = &findings::alertingUnanswered},
        {.ask = type::connect, .asker = user, .answers = typesOf({type::connectAcknowledge}),
         .timer = "T313", .user = &T::t313, .network = &T::t313,
         .finding = &findings::connectNotAcknowledged},
        // The standard leaves the answer to the user: it is missed only if this user has given it before.
        {.ask = type::connect, .asker = network, .answers = typesOf({type::connectAcknowledge}),
         .waitingSideGivesUp = false,
         .timer = "T313", .user = &T::t313, .network = &T::t313,
         .finding = &findings::connectNeverAcknowledged},
        {.ask = type::disconnect, .asker = unknown, .answers = clearing, .clearingAnswers = false,
         .timer = "T305", .user = &T::t305, .network = &T::t305,
         .finding = &findings::disconnectUnanswered},
        {.ask = type::release, .asker = unknown, .answers = typesOf({type::release, type::releaseComplete}),
         .clearingAnswers = false, .isRepeated = true,
         .timer = "T308", .user = &T::t308, .network = &T::t308,
         .finding = &findings::releaseUnanswered, .repetition = &findings::releaseRepeated},
        {.ask = type::statusEnquiry, .asker = unknown, .answers = typesOf({type::status}),
         .isRepeated = true, .timer = "T322", .user = &T::t322, .network = &T::t322,
         .finding = &findings::statusEnquiryUnanswered},
        {.ask = type::suspend, .asker = unknown,
         .answers = typesOf({type::suspendAcknowledge, type::suspendReject}),
         .timer = "T319", .user = &T::t319, .network = &T::t319, .finding = &findings::suspendUnanswered},
        {.ask = type::resume, .asker = unknown,
         .answers = typesOf({type::resumeAcknowledge, type::resumeReject}),
         .timer = "T318", .user = &T::t318, .network = &T::t318, .finding = &findings::resumeUnanswered},
    };
    return rows;
}
// clang-format on

}  // namespace calls

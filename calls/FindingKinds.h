// The table of findings. A new one is a row here, and its name in `kinds` below.
#ifndef CALLS_FINDINGKINDS_H
#define CALLS_FINDINGKINDS_H

#include "calls/Finding.h"

namespace calls::findings {

// clang-format off
inline constexpr FindingKind sameRole{"same-role", Severity::error, "Q.921 3.3.2",
    "both ends send commands with the same C/R value: both are configured as the user side, or both as the network side",
    "the role (user or network) in the configuration of one end"};
inline constexpr FindingKind lineLooped{"line-looped", Severity::error, "Q.921 3.3.2",
    "every frame that comes in is a copy of one that went out",
    "a loop on the line: a test loop left on, or a plug"};
inline constexpr FindingKind linkFlap{"link-flap", Severity::error, "Q.921 5.5",
    "the link was set up again without having been released",
    "the line (slips, alarms), the clock source, and which side sent the SABME"};
inline constexpr FindingKind sabmeUnanswered{"sabme-unanswered", Severity::error, "Q.921 5.5.1.3",
    "SABME was repeated as often as allowed and nobody answered",
    "whether the other end is there and its D channel is on this time slot"};
inline constexpr FindingKind linkRefused{"link-refused", Severity::warning, "Q.921 5.5.1.2",
    "the other end answered SABME with DM: it does not want the link",
    "the state of the D channel at the other end"};
inline constexpr FindingKind frameRejected{"frame-rejected", Severity::error, "Q.921 5.8.5",
    "a frame was rejected with FRMR",
    "the field of FRMR, which says what was wrong with the frame"};
inline constexpr FindingKind nsGapLine{"ns-gap-line", Severity::warning, "Q.921 5.8.1",
    "a frame was lost on the line: the receiver asked for it again",
    "error counters and clocks of the line"};
inline constexpr FindingKind nsGapRecorder{"ns-gap-recorder", Severity::warning, "Q.921 5.6.2",
    "the recorder missed a frame that the receiver has acknowledged",
    "the recorder: its log may name the loss"};
inline constexpr FindingKind nsGapUnknown{"ns-gap-unknown", Severity::note, "Q.921 5.6.2",
    "a frame is missing, and the trace does not tell who lost it",
    "the frames around it"};
inline constexpr FindingKind nrInvalid{"nr-invalid", Severity::error, "Q.921 5.8.4",
    "a frame acknowledges what was never sent",
    "whether the other end was restarted, or frames before it are missing"};
inline constexpr FindingKind framesLost{"frames-lost", Severity::warning, "Q.921 5.6.2",
    "the recorder says that frames are missing here",
    "the disk and the load of the recorder"};
inline constexpr FindingKind retransmissions{"retransmissions", Severity::warning, "Q.921 5.6.4",
    "more than one frame in a hundred was sent again within an hour",
    "clocks and slips of the line"};
inline constexpr FindingKind keepAliveMissing{"keep-alive-missing", Severity::warning, "Q.921 5.10",
    "the link was polled regularly, and then nothing was sent for three periods",
    "whether recording stopped, or the link went down without a word"};
inline constexpr FindingKind pollUnanswered{"poll-unanswered", Severity::warning, "Q.921 5.6.7",
    "a poll was repeated as often as allowed and nobody answered it",
    "the other end, and the line towards us"};
inline constexpr FindingKind windowStalled{"window-stalled", Severity::warning, "Q.921 5.6.1",
    "as many frames as allowed wait for an acknowledgement longer than T200",
    "the load of the receiver"};
inline constexpr FindingKind receiverNotReady{"receiver-not-ready", Severity::warning, "Q.921 5.6.5",
    "one side has been not ready to receive for more than 10 s",
    "the load of that side"};
inline constexpr FindingKind oneDirectionSilent{"one-direction-silent", Severity::error, "Q.921 5.6.7",
    "frames that demand an answer got none, again and again",
    "the cable pair or the time slot of the silent direction"};
inline constexpr FindingKind directionAbsent{"direction-absent", Severity::note, "Q.921 3.3.2",
    "all frames of the trace go in one direction",
    "whether the recorder hears both"};
inline constexpr FindingKind teiDenied{"tei-denied", Severity::warning, "Q.921 5.3.2",
    "a request for a TEI was denied",
    "how many terminals are there, and whether the TEI is taken"};
inline constexpr FindingKind teiRemoved{"tei-removed", Severity::note, "Q.921 5.3.4",
    "a TEI was removed",
    "the terminal that had it"};
inline constexpr FindingKind teiDoubled{"tei-doubled", Severity::warning, "Q.921 5.3.3",
    "two terminals use one TEI",
    "terminals with a fixed TEI"};
inline constexpr FindingKind teiAssigned{"tei-assigned", Severity::note, "Q.921 5.3.2",
    "a TEI was assigned automatically on a primary rate",
    "the configuration: a primary rate has a fixed TEI, mostly 0"};
inline constexpr FindingKind roleContradicted{"role-contradicted", Severity::warning, "Q.921 3.3.2",
    "a frame contradicts what is known about which side is the user",
    "whether two trunks are in one file, or a direction is recorded the wrong way round"};
inline constexpr FindingKind boardRestarted{"board-restarted", Severity::note, "",
    "the board's clock fell: the board was restarted, or another trace begins",
    "what the recorder did then; open calls are uncertain"};
inline constexpr FindingKind setupUnanswered{"setup-unanswered", Severity::error, "Q.931 5.1.1, T303",
    "SETUP and its repetition were not answered",
    "the other end's call control: its layer 2 acknowledged the frame"};
inline constexpr FindingKind setupRepeated{"setup-repeated", Severity::note, "Q.931 5.1.1, T303",
    "SETUP was repeated, since no answer had come",
    "the load of the other end"};
inline constexpr FindingKind overlapTimeout{"overlap-timeout", Severity::warning, "Q.931 5.1.3, T302, T304",
    "overlap sending ended because no further digit came",
    "the dial plan: how many digits the network expects"};
inline constexpr FindingKind waitsForDigits{"waits-for-digits", Severity::note, "Q.931 5.1.3, T302",
    "the answer came 10 to 15 s after the last digit: the other end waited for more of them",
    "send SENDING COMPLETE, or tell the other end the length of the number"};
inline constexpr FindingKind proceedingUnanswered{"proceeding-unanswered", Severity::warning, "Q.931 5.1.7, T310",
    "CALL PROCEEDING was followed by nothing",
    "the network beyond the other end"};
inline constexpr FindingKind alertingUnanswered{"alerting-unanswered", Severity::note, "Q.931 5.1.8, T301",
    "ALERTING was followed by nothing for longer than T301",
    "whether somebody is meant to answer: a waiting queue may let a call ring that long"};
inline constexpr FindingKind connectNotAcknowledged{"connect-not-acknowledged", Severity::warning, "Q.931 5.2.8, T313",
    "the network did not acknowledge the user's CONNECT",
    "the network side: the call may be cleared, or stay one-way"};
inline constexpr FindingKind connectNeverAcknowledged{"connect-acknowledge-missing", Severity::note, "Q.931 5.1.8",
    "the user did not acknowledge the network's CONNECT, although it has acknowledged others",
    "the user side; the standard leaves the answer to it"};
inline constexpr FindingKind disconnectUnanswered{"disconnect-unanswered", Severity::error, "Q.931 5.3.3, T305",
    "DISCONNECT was not answered",
    "the other end: the channel may stay seized there"};
inline constexpr FindingKind releaseUnanswered{"release-unanswered", Severity::error, "Q.931 5.3.3, T308",
    "RELEASE and its repetition were not answered",
    "the other end: the channel may be put into maintenance"};
inline constexpr FindingKind releaseRepeated{"release-repeated", Severity::note, "Q.931 5.3.3, T308",
    "RELEASE was repeated, since no answer had come",
    "the load of the other end"};
inline constexpr FindingKind suspendUnanswered{"suspend-unanswered", Severity::warning, "Q.931 5.6.2, T319",
    "SUSPEND was not answered",
    "the network's call control: whether it offers to suspend calls"};
inline constexpr FindingKind resumeUnanswered{"resume-unanswered", Severity::warning, "Q.931 5.6.4, T318",
    "RESUME was not answered",
    "the network's call control: whether it still has the suspended call"};
inline constexpr FindingKind statusEnquiryUnanswered{"status-enquiry-unanswered", Severity::warning, "Q.931 5.8.10, T322",
    "STATUS ENQUIRY was not answered",
    "the call control of the other end"};
inline constexpr FindingKind statusIncompatible{"status-incompatible", Severity::warning, "Q.931 5.8.11",
    "STATUS names a state that does not fit the call",
    "which message one side has not seen"};
inline constexpr FindingKind statusUnasked{"status-unasked", Severity::note, "Q.931 5.8.11",
    "STATUS with cause 30 came without an enquiry",
    "the frames before it"};
inline constexpr FindingKind protocolError{"protocol-error", Severity::warning, "Q.931 5.8",
    "one side says that it cannot accept a message or an element",
    "the message or the element that the diagnostic names"};
inline constexpr FindingKind elementIgnored{"element-ignored", Severity::note, "Q.931 5.8.7",
    "one side says that it has ignored a message or an element",
    "the message or the element that the diagnostic names"};
inline constexpr FindingKind referenceInUse{"reference-in-use", Severity::error, "Q.931 4.3, 5.8.3.2",
    "a call reference was used for a new call while the old one was alive",
    "the side that chose the reference"};
inline constexpr FindingKind unknownReference{"unknown-reference", Severity::warning, "Q.931 5.8.3.2",
    "a message belongs to no call that the receiver knows",
    "which side has forgotten the call"};
inline constexpr FindingKind elementAbsent{"element-absent", Severity::warning, "Q.931 5.8.6.1",
    "a message lacks an element that it must have",
    "the side that sent it"};
inline constexpr FindingKind elementDamaged{"element-damaged", Severity::warning, "Q.931 5.8.7.2",
    "an element is truncated or too short",
    "the side that sent it"};
inline constexpr FindingKind elementRepeated{"element-repeated", Severity::note, "Q.931 5.8.5.2",
    "an element stands twice in a message; the first one counts",
    "the side that sent it"};
inline constexpr FindingKind segmentsUnfinished{"segments-unfinished", Severity::warning, "Q.931 annex H, T314",
    "the rest of a segmented message never came",
    "whether a frame is missing"};
inline constexpr FindingKind restartUnacknowledged{"restart-unacknowledged", Severity::error, "Q.931 5.5.1, T316",
    "RESTART and its repetition were not acknowledged",
    "the other end: its channels may stay out of service"};
inline constexpr FindingKind restartStorm{"restart-storm", Severity::warning, "Q.931 5.5",
    "a channel was restarted again and again",
    "why the sender thinks that the channel hangs"};
inline constexpr FindingKind restartPartly{"restart-partly", Severity::note, "Q.931 5.5.2",
    "RESTART ACKNOWLEDGE lists fewer channels than RESTART",
    "the channels that are missing in it"};
inline constexpr FindingKind serviceUnacknowledged{"service-unacknowledged", Severity::warning, "national maintenance",
    "SERVICE and its repetition were not acknowledged, although the other end has acknowledged others",
    "the state of the channel at both ends"};
inline constexpr FindingKind serviceChannelSeized{"channel-out-of-service", Severity::warning, "national maintenance",
    "a call took a channel that was out of service",
    "the state of the channel at both ends"};
inline constexpr FindingKind channelChanged{"channel-not-as-demanded", Severity::error, "Q.931 5.1.2",
    "the answer names another channel although SETUP demanded its own",
    "the numbering of channels at both ends"};
inline constexpr FindingKind doubleSeizure{"double-seizure", Severity::error, "Q.931 5.1.2",
    "two calls were given one channel",
    "which side still held the first call"};
inline constexpr FindingKind glare{"glare", Severity::note, "Q.931 5.7",
    "both sides took one channel at the same moment",
    "that the two ends hunt for channels from opposite ends"};
inline constexpr FindingKind glarePersists{"glare-persists", Severity::warning, "Q.931 5.7",
    "both sides took one channel at the same moment, and both calls went on",
    "which call has speech"};
inline constexpr FindingKind glareProne{"glare-prone", Severity::note, "Q.931 5.7",
    "both ends look for free channels in the same order",
    "set one end to hunt downwards"};
inline constexpr FindingKind stuckChannel{"stuck-channel", Severity::error, "Q.931 5.5",
    "a channel is not free at one end although no call holds it",
    "restart or unblock the channel"};
inline constexpr FindingKind channelRefused{"channel-refused-idle", Severity::warning, "Q.850 34, 44, 82",
    "a channel was refused although the trace shows it idle",
    "the numbering of channels and interfaces, and channels blocked by hand"};
inline constexpr FindingKind massClear{"mass-clear", Severity::error, "Q.931 5.8.9",
    "three calls or more ended within a second, with the link",
    "the link's events at that time"};
inline constexpr FindingKind interfaceMismatch{"interface-mismatch", Severity::warning, "Q.931 4.5.13",
    "the two ends name different interfaces",
    "the interface numbers of the NFAS group"};
inline constexpr FindingKind timer102{"timer-102", Severity::warning, "Q.850 102",
    "a call was cleared because a timer ran out",
    "the timer that the diagnostic names"};
inline constexpr FindingKind sameDuration{"same-duration", Severity::note, "",
    "five of the last 30 answered calls lasted equally long, to 0.5 s, and 10 s at least",
    "a timer somewhere on the way: session refresh, registration, NAT"};
inline constexpr FindingKind causeBurst{"cause-burst", Severity::warning, "Q.850",
    "one cause came again and again",
    "what the calls have in common: prefix, channel, bearer"};
inline constexpr FindingKind broadcastUnanswered{"broadcast-unanswered", Severity::note, "Q.931 5.2, T312",
    "a SETUP to all terminals was answered by none",
    "whether a terminal is there that accepts this bearer and number"};
inline constexpr FindingKind changeover{"changeover", Severity::note, "T1.607",
    "the calls of a group went on over another D channel",
    "why the first one was left"};
inline constexpr FindingKind cannotBeTold{"cannot-be-told", Severity::note, "",
    "an answer is missing, and the trace does not tell whether it was sent",
    "the reason that the sentence names"};
// clang-format on

inline constexpr const FindingKind* kinds[] = {
    &sameRole,
    &lineLooped,
    &linkFlap,
    &sabmeUnanswered,
    &linkRefused,
    &frameRejected,
    &nsGapLine,
    &nsGapRecorder,
    &nsGapUnknown,
    &nrInvalid,
    &framesLost,
    &retransmissions,
    &keepAliveMissing,
    &pollUnanswered,
    &windowStalled,
    &receiverNotReady,
    &oneDirectionSilent,
    &directionAbsent,
    &teiDenied,
    &teiRemoved,
    &teiDoubled,
    &teiAssigned,
    &roleContradicted,
    &boardRestarted,
    &setupUnanswered,
    &setupRepeated,
    &overlapTimeout,
    &waitsForDigits,
    &proceedingUnanswered,
    &alertingUnanswered,
    &connectNotAcknowledged,
    &connectNeverAcknowledged,
    &disconnectUnanswered,
    &releaseUnanswered,
    &releaseRepeated,
    &suspendUnanswered,
    &resumeUnanswered,
    &statusEnquiryUnanswered,
    &statusIncompatible,
    &statusUnasked,
    &protocolError,
    &elementIgnored,
    &referenceInUse,
    &unknownReference,
    &elementAbsent,
    &elementDamaged,
    &elementRepeated,
    &segmentsUnfinished,
    &restartUnacknowledged,
    &restartStorm,
    &restartPartly,
    &serviceUnacknowledged,
    &serviceChannelSeized,
    &channelChanged,
    &doubleSeizure,
    &glare,
    &glarePersists,
    &glareProne,
    &stuckChannel,
    &channelRefused,
    &massClear,
    &interfaceMismatch,
    &timer102,
    &sameDuration,
    &causeBurst,
    &broadcastUnanswered,
    &changeover,
    &cannotBeTold,
};

}  // namespace calls::findings

#endif

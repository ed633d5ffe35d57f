#include "fleet/NatsPublisher.h"

#include <algorithm>
#include <charconv>
#include <nlohmann/json.hpp>
#include <utility>

#include "fleet/NatsHandles.h"

namespace fleet {

namespace {

using nlohmann::json;

// The server's codes of errors: no room for a message in a stream, or on the disk.
constexpr int noRoomCodes[] = {10047, 10023, 10077};

struct InboxName {
    natsInbox* name = nullptr;
    InboxName() { require(natsInbox_Create(&name), "make an inbox"); }
    ~InboxName() { natsInbox_Destroy(name); }
    InboxName(const InboxName&) = delete;
    InboxName& operator=(const InboxName&) = delete;
};

// What the server says when a stream has as much as its rules allow. Other refusals come from a server that
// has trouble with its disk or with itself.
constexpr std::string_view limitReached = "maximum ";

std::uint64_t tokenOf(std::string_view inbox) {
    const std::string_view digits = inbox.substr(inbox.rfind('.') + 1);
    std::uint64_t token = 0;
    std::from_chars(digits.data(), digits.data() + digits.size(), token);
    return token;
}

void readError(const json& error, NatsPublisher::Answer& answer) {
    answer.error = error.value("description", "no reason given");
    answer.isAtLimit = answer.error.starts_with(limitReached);
    const int code = error.value("err_code", 0);
    answer.isFull = std::find(std::begin(noRoomCodes), std::end(noRoomCodes), code) != std::end(noRoomCodes);
}

// The stream's answer: {"stream":"LAPD","seq":5,"duplicate":true} or {"error":{...}}.
void readAnswer(std::string_view text, NatsPublisher::Answer& answer) {
    try {
        const json all = json::parse(text);
        if (const auto error = all.find("error"); error != all.end()) {
            readError(*error, answer);
            return;
        }
        const json& sequence = all.at("seq");
        answer.isKept = sequence.is_number_unsigned();
        answer.sequence = answer.isKept ? sequence.get<std::uint64_t>() : 0;
        answer.isDuplicate = all.value("duplicate", false);
    } catch (const json::exception&) {
        answer.error = "the answer is not one of a stream";
    }
}

}  // namespace

struct NatsPublisher::Inbox {
    InboxName prefix;
    OwnedSubscription answers;
};

NatsPublisher::NatsPublisher(NatsConnection& connection)
    : connection_(connection), inbox_(std::make_unique<Inbox>()) {
    natsSubscription* answers = nullptr;
    const std::string subject = std::string(inbox_->prefix.name) + ".*";
    require(natsConnection_SubscribeSync(&answers, connection.handles().connection.get(), subject.c_str()),
            "wait for answers");
    inbox_->answers.reset(answers);
    constexpr int noLimit = -1;
    require(natsSubscription_SetPendingLimits(answers, noLimit, noLimit), "wait for answers");
}

NatsPublisher::~NatsPublisher() = default;

void NatsPublisher::send(const std::string& subject, std::string_view text, const std::string& id,
                         std::uint64_t token) {
    const std::string reply = std::string(inbox_->prefix.name) + "." + std::to_string(token);
    const OwnedMessage message = makeMessage(subject, reply, text, id, {});
    subjects_.try_emplace(subject, false);
    require(natsConnection_PublishMsg(connection_.handles().connection.get(), message.get()),
            "publish to " + subject);
}

std::optional<NatsPublisher::Answer> NatsPublisher::answer(std::chrono::milliseconds wait) {
    natsMsg* got = nullptr;
    const natsStatus status = natsSubscription_NextMsg(&got, inbox_->answers.get(), wait.count());
    if (status == NATS_TIMEOUT)
        return refused();
    Answer answer;
    if (status == NATS_NO_RESPONDERS) {
        answer.error = "no stream takes the subject, or none is reachable";
        return answer;
    }
    require(status, "get an answer from NATS");
    const OwnedMessage message(got);
    answer.token = tokenOf(natsMsg_GetSubject(got));
    readAnswer({natsMsg_GetData(got), static_cast<std::size_t>(natsMsg_GetDataLength(got))}, answer);
    return answer;
}

// The server answers nothing to a message that it does not permit. The connection knows the newest refusal,
// which may be about something else: 'Permissions Violation for Publish to "lapd.17.london.h1.0.1"'. The
// library cuts long texts off.
std::optional<NatsPublisher::Answer> NatsPublisher::refused() {
    const std::string refusal = connection_.refusal();
    const std::size_t quote = refusal.find('"');
    if (quote == refusal.npos)
        return std::nullopt;
    const std::string_view subject =
        std::string_view(refusal).substr(quote + 1, refusal.find('"', quote + 1) - quote - 1);
    const auto found = subjects_.lower_bound(subject);
    if (found == subjects_.end() || !found->first.starts_with(subject) || std::exchange(found->second, true))
        return std::nullopt;
    Answer answer;
    answer.error = refusal;
    return answer;
}

}  // namespace fleet

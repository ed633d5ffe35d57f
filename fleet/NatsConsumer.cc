#include "fleet/NatsConsumer.h"

#include "fleet/NatsHandles.h"

namespace fleet {

namespace {

using OwnedConsumerInfo = NatsOwned<jsConsumerInfo, jsConsumerInfo_Destroy>;

// Gives the messages of the library's list back to it at the end.
struct MessageList {
    natsMsgList list{};
    MessageList() = default;
    ~MessageList() { natsMsgList_Destroy(&list); }
    MessageList(const MessageList&) = delete;
    MessageList& operator=(const MessageList&) = delete;
};

void makeConsumer(NatsConnection& connection, const ConsumerRules& rules) {
    jsConsumerConfig wanted;
    jsConsumerConfig_Init(&wanted);
    wanted.Durable = rules.durable.c_str();
    wanted.FilterSubject = rules.filter.c_str();
    wanted.AckPolicy = js_AckExplicit;
    wanted.DeliverPolicy = js_DeliverAll;
    wanted.AckWait = std::chrono::nanoseconds(rules.forAcknowledging).count();
    wanted.MaxAckPending = rules.mostUnacknowledged;
    wanted.MaxDeliver = -1;  // for ever
    jsConsumerInfo* made = nullptr;
    jsErrCode error{};
    const natsStatus status = js_AddConsumer(&made, connection.handles().jetStream.get(),
                                             rules.stream.c_str(), &wanted, nullptr, &error);
    const OwnedConsumerInfo owned(made);
    requireAnswer(connection, status, "make the consumer " + rules.durable + " of the stream " + rules.stream,
                  error);
}

}  // namespace

struct NatsMessage::Handle {
    OwnedMessage message;
    OwnedMetaData data;
};

NatsMessage::NatsMessage(std::unique_ptr<Handle> handle) : handle_(std::move(handle)) {}
NatsMessage::~NatsMessage() = default;
NatsMessage::NatsMessage(NatsMessage&&) noexcept = default;
NatsMessage& NatsMessage::operator=(NatsMessage&&) noexcept = default;

std::string_view NatsMessage::subject() const { return natsMsg_GetSubject(handle_->message.get()); }

std::string_view NatsMessage::text() const {
    const natsMsg* message = handle_->message.get();
    const char* data = natsMsg_GetData(message);
    return data == nullptr ? std::string_view()
                           : std::string_view(data, static_cast<std::size_t>(natsMsg_GetDataLength(message)));
}

std::string NatsMessage::id() const {
    const char* value = nullptr;
    const natsStatus status = natsMsgHeader_Get(handle_->message.get(), "Nats-Msg-Id", &value);
    return status == NATS_OK && value != nullptr ? std::string(value) : std::string();
}

std::uint64_t NatsMessage::sequence() const { return handle_->data->Sequence.Stream; }
std::uint64_t NatsMessage::deliveries() const { return handle_->data->NumDelivered; }

std::chrono::nanoseconds NatsMessage::storedAt() const {
    return std::chrono::nanoseconds(handle_->data->Timestamp);
}

void NatsMessage::acknowledge() {
    jsErrCode error{};
    require(natsMsg_AckSync(handle_->message.get(), nullptr, &error), "acknowledge a message", error);
}

void NatsMessage::acknowledgeLater() {
    require(natsMsg_Ack(handle_->message.get(), nullptr), "acknowledge a message");
}

void NatsMessage::deliverAgain(std::chrono::milliseconds delay) {
    require(natsMsg_NakWithDelay(handle_->message.get(), std::chrono::nanoseconds(delay).count(), nullptr),
            "give a message back");
}

void NatsMessage::keepWaiting() {
    require(natsMsg_InProgress(handle_->message.get(), nullptr), "ask for more time");
}

void NatsMessage::giveUp() { require(natsMsg_Term(handle_->message.get(), nullptr), "give a message up"); }

struct NatsConsumer::Handle {
    NatsConnection* connection = nullptr;
    ConsumerRules rules;
    OwnedSubscription subscription;
};

NatsConsumer::NatsConsumer(NatsConnection& connection, const ConsumerRules& rules)
    : handle_(std::make_unique<Handle>()) {
    jsCtx* const jetStream = connection.handles().jetStream.get();
    handle_->connection = &connection;
    handle_->rules = rules;
    makeConsumer(connection, rules);
    // A subscription that is bound to an existing consumer does not delete the consumer at its end.
    jsSubOptions bound;
    jsSubOptions_Init(&bound);
    bound.Stream = rules.stream.c_str();
    bound.Consumer = rules.durable.c_str();
    natsSubscription* made = nullptr;
    jsErrCode error{};
    const natsStatus status = js_PullSubscribe(&made, jetStream, rules.filter.c_str(), rules.durable.c_str(),
                                               nullptr, &bound, &error);
    handle_->subscription.reset(made);
    requireAnswer(connection, status, "use the consumer " + rules.durable, error);
}

NatsConsumer::~NatsConsumer() = default;

std::vector<NatsMessage> NatsConsumer::fetch(std::size_t most, std::chrono::milliseconds wait) {
    MessageList got;
    jsErrCode error{};
    const natsStatus status = natsSubscription_Fetch(&got.list, handle_->subscription.get(),
                                                     static_cast<int>(most), wait.count(), &error);
    std::vector<NatsMessage> messages;
    if (status == NATS_TIMEOUT)
        return messages;
    require(status, "fetch messages", error);
    for (natsMsg*& each : std::span(got.list.Msgs, static_cast<std::size_t>(got.list.Count))) {
        auto handle = std::make_unique<NatsMessage::Handle>();
        handle->message.reset(std::exchange(each, nullptr));
        jsMsgMetaData* data = nullptr;
        require(natsMsg_GetMetaData(&data, handle->message.get()), "read a message's place in the stream");
        handle->data.reset(data);
        messages.emplace_back(std::move(handle));
    }
    return messages;
}

std::optional<std::uint64_t> NatsConsumer::waiting() {
    jsConsumerInfo* info = nullptr;
    jsErrCode error{};
    const natsStatus status =
        js_GetConsumerInfo(&info, handle_->connection->handles().jetStream.get(),
                           handle_->rules.stream.c_str(), handle_->rules.durable.c_str(), nullptr, &error);
    const OwnedConsumerInfo owned(info);
    if (error == JSConsumerNotFoundErr)
        return std::nullopt;
    requireAnswer(*handle_->connection, status, "ask about a consumer", error);
    return info->NumPending;
}

bool deleteConsumer(NatsConnection& connection, const std::string& stream, const std::string& durable) {
    jsErrCode error{};
    const natsStatus status = js_DeleteConsumer(connection.handles().jetStream.get(), stream.c_str(),
                                                durable.c_str(), nullptr, &error);
    if (error == JSConsumerNotFoundErr)
        return false;
    requireAnswer(connection, status, "delete the consumer " + durable + " of the stream " + stream, error);
    return true;
}

}  // namespace fleet

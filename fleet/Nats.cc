#include "fleet/Nats.h"

#include <array>

#include "fleet/NatsHandles.h"

namespace fleet {

namespace {

using Reason = NatsError::Reason;

Reason reasonOf(natsStatus status, int jetStreamError) {
    switch (status) {
        case NATS_NO_SERVER:
        case NATS_IO_ERROR:
        case NATS_CONNECTION_CLOSED:
        case NATS_CONNECTION_DISCONNECTED:
        case NATS_NO_RESPONDERS:
            return Reason::unreachable;
        case NATS_CONNECTION_AUTH_FAILED:
        case NATS_NOT_PERMITTED:
        case NATS_SSL_ERROR:
        case NATS_SECURE_CONNECTION_WANTED:
        case NATS_SECURE_CONNECTION_REQUIRED:
            return Reason::refused;
        case NATS_INSUFFICIENT_BUFFER:
            return Reason::full;
        case NATS_TIMEOUT:
            return Reason::timeout;
        default:
            break;
    }
    return jetStreamError == JSInsufficientResourcesErr ? Reason::full : Reason::other;
}

// What the library says of the error that it has just returned; may be empty. Its text begins with a place in
// its source: "(conn.c:2088): ".
std::string detailOf(natsStatus status) {
    natsStatus last = NATS_OK;
    const char* const said = nats_GetLastError(&last);
    if (last != status || said == nullptr)
        return "";
    const std::string_view text = said;
    const std::size_t place = text.starts_with('(') ? text.find("): ") : text.npos;
    return std::string(place == text.npos ? text : text.substr(place + 3));
}

// Without this function the library writes errors that no call returns to the standard error stream. The
// program notices such errors anyway, by answers that do not come.
void ignoreError(natsConnection*, natsSubscription*, natsStatus, void*) {}

void useTls(natsOptions* to, const NatsOptions& options) {
    require(natsOptions_SetSecure(to, true), "use TLS");
    require(natsOptions_LoadCATrustedCertificates(to, options.authority.c_str()),
            "read the certificates in " + options.authority);
    if (!options.certificate.empty())
        require(natsOptions_LoadCertificatesChain(to, options.certificate.c_str(), options.key.c_str()),
                "read " + options.certificate + " and " + options.key);
}

OwnedOptions libraryOptions(const NatsOptions& options) {
    natsOptions* made = nullptr;
    require(natsOptions_Create(&made), "set up NATS");
    OwnedOptions to(made);
    std::vector<const char*> servers;
    for (const std::string& server : options.servers)
        servers.push_back(server.c_str());
    require(natsOptions_SetServers(made, servers.data(), static_cast<int>(servers.size())),
            "use the servers' addresses");
    constexpr int forEver = -1;
    constexpr int betweenAttempts = 500;  // milliseconds; the library adds up to as much again
    for (const natsStatus status :
         {natsOptions_SetName(made, options.name.c_str()),
          natsOptions_SetTimeout(made, options.timeout.count()), natsOptions_SetMaxReconnect(made, forEver),
          natsOptions_SetReconnectWait(made, betweenAttempts),
          natsOptions_SetReconnectJitter(made, betweenAttempts, betweenAttempts),
          natsOptions_SetErrorHandler(made, ignoreError, nullptr)})
        require(status, "set up NATS");
    if (!options.authority.empty())
        useTls(made, options);
    return to;
}

}  // namespace

void require(natsStatus status, const std::string& wanted, int jetStreamError) {
    if (status == NATS_OK)
        return;
    std::string what = "cannot " + wanted + ": " + natsStatus_GetText(status);
    const std::string detail = jetStreamError == JSStreamNotFoundErr
                                   ? "there is no such stream; lapdship streams makes it"
                                   : detailOf(status);
    if (!detail.empty() && detail != natsStatus_GetText(status))
        what += " (" + detail + ")";
    throw NatsError(reasonOf(status, jetStreamError), what);
}

void requireAnswer(const NatsConnection& connection, natsStatus status, const std::string& wanted,
                   int jetStreamError) {
    const std::string refusal = status == NATS_TIMEOUT ? connection.refusal() : std::string();
    if (!refusal.empty())
        throw NatsError(Reason::refused, "cannot " + wanted + ": " + refusal);
    require(status, wanted, jetStreamError);
}

OwnedMessage makeMessage(const std::string& subject, const std::string& reply, std::string_view text,
                         const std::string& id, NatsConnection::Headers headers) {
    natsMsg* made = nullptr;
    require(natsMsg_Create(&made, subject.c_str(), reply.empty() ? nullptr : reply.c_str(), text.data(),
                           static_cast<int>(text.size())),
            "make a message to " + subject);
    OwnedMessage message(made);
    if (!id.empty())
        require(natsMsgHeader_Set(made, "Nats-Msg-Id", id.c_str()), "name a message");
    for (const auto& [key, value] : headers)
        require(natsMsgHeader_Set(made, key.c_str(), value.c_str()), "write a header");
    return message;
}

namespace {

// A server that refuses a certificate closes the connection, in TLS 1.3 after the client has taken it to be
// made. So the client only sees it end, in one way or another.
bool mayBeRefusal(natsStatus status) {
    return status == NATS_PROTOCOL_ERROR || status == NATS_IO_ERROR || status == NATS_CONNECTION_CLOSED;
}

void connect(natsConnection*& connection, const NatsOptions& options) {
    const OwnedOptions to = libraryOptions(options);
    const natsStatus status = natsConnection_Connect(&connection, to.get());
    try {
        require(status, "connect to NATS");
    } catch (const NatsError& error) {
        if (options.authority.empty() || !mayBeRefusal(status))
            throw;
        throw NatsError(error.reason, std::string(error.what()) +
                                          "; perhaps the server refuses the certificate: its log says why");
    }
}

}  // namespace

NatsConnection::NatsConnection(const NatsOptions& options) : handles_(std::make_unique<Handles>()) {
    natsConnection* connection = nullptr;
    connect(connection, options);
    handles_->connection.reset(connection);
    jsOptions rules;
    jsOptions_Init(&rules);
    rules.Wait = options.timeout.count();
    jsCtx* jetStream = nullptr;
    require(natsConnection_JetStream(&jetStream, connection, &rules), "use JetStream");
    handles_->jetStream.reset(jetStream);
}

NatsConnection::~NatsConnection() = default;

bool NatsConnection::isConnected() const {
    return natsConnection_Status(handles_->connection.get()) == NATS_CONN_STATUS_CONNECTED;
}

std::string NatsConnection::server() const {
    std::array<char, 300> url{};
    const bool isKnown =
        natsConnection_GetConnectedUrl(handles_->connection.get(), url.data(), url.size()) == NATS_OK;
    return isKnown ? std::string(url.data()) : std::string();
}

std::string NatsConnection::serverProcess() const {
    std::array<char, 300> id{};
    const bool isKnown =
        natsConnection_GetConnectedServerId(handles_->connection.get(), id.data(), id.size()) == NATS_OK;
    return isKnown ? std::string(id.data()) : std::string();
}

std::string NatsConnection::refusal() const {
    const char* said = nullptr;
    const natsStatus last = natsConnection_GetLastError(handles_->connection.get(), &said);
    return last == NATS_NOT_PERMITTED && said != nullptr ? std::string(said) : std::string();
}

void NatsConnection::publish(const std::string& subject, std::string_view text, const std::string& id,
                             Headers headers) {
    const OwnedMessage message = makeMessage(subject, "", text, id, headers);
    jsErrCode error{};
    const natsStatus status =
        js_PublishMsg(nullptr, handles_->jetStream.get(), message.get(), nullptr, &error);
    requireAnswer(*this, status, "publish to " + subject, error);
}

}  // namespace fleet

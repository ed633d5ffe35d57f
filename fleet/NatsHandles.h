// Owners of the NATS library's objects. Internal to the sources that call the library.
#ifndef FLEET_NATSHANDLES_H
#define FLEET_NATSHANDLES_H

#include <nats/nats.h>

#include <memory>
#include <string>

#include "fleet/Nats.h"

namespace fleet {

template <auto destroy>
struct NatsDeleter {
    template <class Object>
    void operator()(Object* object) const {
        destroy(object);
    }
};

template <class Object, auto destroy>
using NatsOwned = std::unique_ptr<Object, NatsDeleter<destroy>>;

using OwnedOptions = NatsOwned<natsOptions, natsOptions_Destroy>;
using OwnedConnection = NatsOwned<natsConnection, natsConnection_Destroy>;
using OwnedJetStream = NatsOwned<jsCtx, jsCtx_Destroy>;
using OwnedSubscription = NatsOwned<natsSubscription, natsSubscription_Destroy>;
using OwnedMessage = NatsOwned<natsMsg, natsMsg_Destroy>;
using OwnedMetaData = NatsOwned<jsMsgMetaData, jsMsgMetaData_Destroy>;

struct NatsConnection::Handles {
    OwnedConnection connection;
    OwnedJetStream jetStream;
};

// Throws NatsError unless the status is good. `wanted` says what was tried, for the error's text: "connect to
// NATS".
void require(natsStatus status, const std::string& wanted, int jetStreamError = 0);

// The same for a request that the server answers. If no answer has come because the server does not permit
// the request, the error says so.
void requireAnswer(const NatsConnection& connection, natsStatus status, const std::string& wanted,
                   int jetStreamError = 0);

// Makes a message that can be sent. Throws NatsError.
OwnedMessage makeMessage(const std::string& subject, const std::string& reply, std::string_view text,
                         const std::string& id, NatsConnection::Headers headers);

}  // namespace fleet

#endif

#include "calls/CallTable.h"

#include <algorithm>
#include <utility>

#include "calls/Life.h"

namespace calls {

namespace {

namespace element = isdn::element;
namespace type = isdn::message;

bool initiates(const isdn::Layer3& layer3) {
    return !layer3.callReference.flag &&
           (layer3.type == type::setup || layer3.type == type::resume || layer3.type == type::registration);
}

bool hasReferenceOfItsOwn(const isdn::Layer3& layer3) {
    return layer3.discriminator == isdn::callControl && layer3.hasCallReference && layer3.hasType &&
           !layer3.callReference.dummy() && !layer3.callReference.global();
}

CallKey keyOf(const Message& message) {
    const bool toOrigin = message.layer3.callReference.flag;
    return {message.layer3.callReference.value, message.layer2.tei,
            toOrigin ? other(message.from()) : message.from()};
}

std::vector<std::uint8_t> copyOf(isdn::Octets octets) { return {octets.begin(), octets.end()}; }

std::vector<std::uint8_t> identityIn(const Message& message) {
    return copyOf(message.layer3.elements.find(element::callIdentity).contents);
}

}  // namespace

CallTable::CallTable(const Timers& timers, CallNumbers& numbers, CallObserver& observer)
    : timers_(timers), numbers_(numbers), observer_(observer) {}

CallTable::~CallTable() = default;

Call* CallTable::take(const Message& message) {
    advance(message.at);
    if (!hasReferenceOfItsOwn(message.layer3))
        return nullptr;
    const CallKey key = keyOf(message);
    Life* const life = initiates(message.layer3) ? &beginOrRepeat(message, key) : belongsTo(message, key);
    if (life == nullptr) {
        observer_.stray(message);
        return nullptr;
    }
    hear(*life, message);
    return &life->call;
}

const Call* CallTable::callOf(const Message& message) const {
    if (!hasReferenceOfItsOwn(message.layer3))
        return nullptr;
    const CallKey key = keyOf(message);
    if (const Life* const life = find(key); life != nullptr)
        return &life->call;
    const Life* const offered = find({key.value, isdn::groupTei, key.origin});
    return offered != nullptr && offered->joined.test(key.tei) ? &offered->call : nullptr;
}

Life* CallTable::find(const CallKey& key) const {
    const auto found = lives_.find(key);
    return found == lives_.end() ? nullptr : found->second.get();
}

// A terminal that answers a broadcast SETUP joins its call. From then on the call's messages pass between
// that terminal and the network.
Life* CallTable::findBroadcast(const Message& message, const CallKey& key) const {
    Life* const life = find({key.value, isdn::groupTei, key.origin});
    const std::uint8_t tei = message.layer2.tei;
    if (life == nullptr || life->joined.test(tei))
        return life;
    const bool answers = message.from() != key.origin && message.at - life->lastSetup <= timers_.t312;
    if (!answers)
        return nullptr;
    life->joined.set(tei);
    return life;
}

Life& CallTable::beginOrRepeat(const Message& message, const CallKey& key) {
    Life* const old = find(key);
    if (old == nullptr)
        return begin(message, key);
    if (repeats(*old, message)) {
        old->lastSetup = message.at;
        old->call.setupRepeated = true;
        if (old->call.broadcast)
            awaitTerminals(*old);
        return *old;
    }
    if (old->ended) {
        forget(*old);
        return begin(message, key);
    }
    // Keep the old call until the observer has been told that the new one replaces it.
    end(*old, EndedBy::replaced, momentOf(message), nullptr);
    const std::unique_ptr<Life> kept = std::move(lives_.find(key)->second);
    inOrder_.erase(kept->call.number);
    lives_.erase(key);
    Life& life = begin(message, key);
    observer_.replaced(kept->call, life.call, message);
    observer_.gone(kept->call);
    return life;
}

// A SETUP is a repetition if nothing has answered the first one and all octets are the same.
bool CallTable::repeats(const Life& life, const Message& message) const {
    return message.layer3.type == type::setup && !life.answered && !life.ended &&
           message.at - life.lastSetup <= 2 * timers_.t303 &&
           std::equal(life.setup.begin(), life.setup.end(), message.layer3.octets.begin(),
                      message.layer3.octets.end());
}

Life& CallTable::begin(const Message& message, const CallKey& key) {
    if (lives_.size() >= mostAlive)
        dropOldest();
    auto life = std::make_unique<Life>();
    life->key = key;
    Call& call = life->call;
    call.number = ++numbers_.last;
    call.group = message.group;
    call.file = message.frame->place.file;
    if (message.frame->interface != nullptr)
        call.dChannel = message.frame->interface->name;
    call.begin = momentOf(message);
    call.tei = key.tei;
    call.reference = key.value;
    call.referenceLength = message.layer3.callReference.length;
    call.origin = key.origin;
    call.originRole = key.origin == message.from() ? message.senderRole() : opposite(message.senderRole());
    const std::uint8_t messageType = message.layer3.type;
    call.beforeTrace = !initiates(message.layer3);
    call.kind = messageType == type::registration ? Kind::signalling : Kind::call;
    if (messageType == type::setup) {
        life->setup = copyOf(message.layer3.octets);
        life->lastSetup = message.at;
        call.broadcast = key.tei == isdn::groupTei;
        if (call.broadcast)
            awaitTerminals(*life);
    }
    if (messageType == type::resume)
        joinSuspended(*life, message);
    inOrder_.emplace(call.number, key);
    return *(lives_[key] = std::move(life));
}

void CallTable::joinSuspended(Life& life, const Message& message) {
    life.identity = identityIn(message);
    std::erase_if(suspended_, [&](const Suspended& each) { return message.at - each.at > timers_.t307; });
    const auto found = std::find_if(suspended_.begin(), suspended_.end(),
                                    [&](const Suspended& each) { return each.identity == life.identity; });
    if (found == suspended_.end())
        return;
    life.call.resumes = found->call;
    suspended_.erase(found);
}

// Finds the call of a message that begins none. A message that comes long after the end of its call, and only
// ends a call or asks for its state, belongs to no call. Any other message shows a call whose beginning is
// not in the trace.
Life* CallTable::belongsTo(const Message& message, const CallKey& key) {
    if (Life* const life = find(key); life != nullptr)
        return life;
    if (Life* const life = findBroadcast(message, key); life != nullptr)
        return life;
    const std::uint8_t messageType = message.layer3.type;
    const bool onlyEndsOrAsks = messageType == type::release || messageType == type::releaseComplete ||
                                messageType == type::disconnect || messageType == type::status ||
                                messageType == type::statusEnquiry;
    if (const auto old = remembered_.find(key); onlyEndsOrAsks && old != remembered_.end()) {
        // Its SETUP may be among what the recorder has missed.
        const auto lost = lostAt_.find(key.tei);
        if (lost == lostAt_.end() || lost->second < old->second)
            return nullptr;
    }
    return &begin(message, key);
}

void CallTable::hear(Life& life, const Message& message) {
    const bool hadEnded = life.ended;
    noteHeard(life);
    learn(life, message);
    if (!hadEnded && message.layer3.type == type::suspend)
        life.identity = identityIn(message);
    if (life.call.broadcast && !life.winner && message.layer3.type == type::connectAcknowledge &&
        message.from() == life.call.origin) {
        life.winner = message.layer2.tei;
        life.call.tei = message.layer2.tei;
    }
    observer_.heard(life.call, message);
    if (!hadEnded)
        endIfLast(life, message);
}

// The new deadline replaces the older ones of this life.
void CallTable::schedule(Life& life, std::int64_t at) {
    deadlines_.emplace(at, std::pair(life.key, ++life.generation));
}

// Terminals may join for T312 from the last SETUP on.
void CallTable::awaitTerminals(Life& life) { schedule(life, life.lastSetup + timers_.t312 + timers_.slack); }

void CallTable::forget(Life& life) {
    const CallKey key = life.key;
    remember(key, life.call.end.at);
    observer_.gone(life.call);
    inOrder_.erase(life.call.number);
    lives_.erase(key);
}

void CallTable::remember(const CallKey& key, std::int64_t at) {
    const auto [entry, isNew] = remembered_.insert_or_assign(key, at);
    if (!isNew)
        return;
    rememberedInOrder_.push_back(key);
    if (rememberedInOrder_.size() <= mostRemembered)
        return;
    remembered_.erase(rememberedInOrder_.front());
    rememberedInOrder_.pop_front();
}

void CallTable::dropOldest() {
    ++dropped_;
    Life& life = *find(inOrder_.begin()->second);
    if (!life.ended) {
        life.call.uncertain = true;
        conclude(life, EndedBy::open, life.call.end);
        observer_.ended(life.call, nullptr);
    }
    forget(life);
}

void CallTable::noteHeard(Life& life) {
    if (std::exchange(life.heardSinceLoss, true))
        return;
    constexpr std::size_t few = 64;
    if (heardSinceLoss_.size() > 2 * lives_.size() + few)
        std::erase_if(heardSinceLoss_, [&](std::uint64_t number) { return !inOrder_.contains(number); });
    heardSinceLoss_.push_back(life.call.number);
}

void CallTable::framesLost(std::uint8_t tei) {
    lostAt_[tei] = now_;
    std::erase_if(heardSinceLoss_, [&](std::uint64_t number) {
        const auto key = inOrder_.find(number);
        if (key == inOrder_.end())
            return true;
        Life& life = *find(key->second);
        if (life.call.tei != tei && !life.call.broadcast)
            return false;
        life.heardSinceLoss = false;
        if (!life.ended) {
            life.call.lack = Lack::frames;
            life.call.incomplete = true;
        }
        return true;
    });
}

void CallTable::advance(std::int64_t at) {
    now_ = at;
    while (!deadlines_.empty() && deadlines_.begin()->first <= at) {
        const auto [key, generation] = deadlines_.begin()->second;
        deadlines_.erase(deadlines_.begin());
        Life* const life = find(key);
        if (life != nullptr && life->generation == generation)
            due(*life, at);
    }
    endLostLinks(at);
}

// The deadline of a life has come. A call that has ended is forgotten, because no late message is expected
// any more; a call that was offered to all terminals can be joined by none any more.
void CallTable::due(Life& life, std::int64_t at) {
    if (life.ended) {
        forget(life);
        return;
    }
    Moment moment = life.call.end;
    moment.at = std::min(at, life.lastSetup + timers_.t312);
    endIfAllTerminalsLeft(life, moment, nullptr);
}

void CallTable::linkDown(std::uint8_t tei, std::int64_t at) { downSince_.try_emplace(tei, at); }

void CallTable::linkUp(std::uint8_t tei) { downSince_.erase(tei); }

void CallTable::boardRestarted() {
    for (const auto& [key, life] : lives_) {
        if (!life->ended) {
            life->call.lack = Lack::board;
            life->call.incomplete = true;
            life->call.uncertain = true;
        }
    }
}

std::vector<const Call*> CallTable::open() const {
    std::vector<const Call*> calls;
    for (const auto& [number, key] : inOrder_) {
        if (const Life* const life = find(key); !life->ended)
            calls.push_back(&life->call);
    }
    return calls;
}

}  // namespace calls

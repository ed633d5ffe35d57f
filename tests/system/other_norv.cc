// A transport library of a few lines under the name of the board's, with one board whose answers are told by
// the environment. It is also a release that leaves the offset at 0 after a body's first field.
//
// OTHER_TALK names a file for what the library does, a line each. OTHER_SCRIPT holds words:
//
//     no-memory    there are no message buffers       silent=26    message type 26 is not answered
//     no-queue     there are no queues                error=26     message type 26 is answered with an error
//     short        before the frame come events that end within their fields
//     exits        SIGUSR1 makes a thread of the library's leave the process with exit(5)
//     flood        300 events come before the answer to a subscription
//     stuck-close  closing the last queue never ends
//     interrupt=8  the process gets SIGINT when message type 8 is heard for the first time
#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <condition_variable>
#include <csignal>
#include <cstdarg>
#include <cstdlib>
#include <cstring>
#include <deque>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "norv/norv.h"
#include "tests/support/body_fields.h"

namespace {

using body_fields::Field;
using Octets = std::vector<unsigned char>;

enum : std::uint32_t {
    error = 0,
    getParm = 18,
    detectEvt = 22,
    evtDetected = 32,
    compFind = 8388669,
    componentResult = 8388615
};
constexpr std::uint32_t protocolType = 3;
constexpr std::uint32_t oversizedFrame = 300;

std::string variable(const char* name) {
    const char* const value = std::getenv(name);
    return value == nullptr ? "" : value;
}

bool told(const std::string& word) {
    return (" " + variable("OTHER_SCRIPT") + " ").find(" " + word + " ") != std::string::npos;
}

void talk(const std::string& line) {
    static const int file = open(variable("OTHER_TALK").c_str(), O_WRONLY | O_APPEND | O_CLOEXEC);
    const std::string text = line + "\n";
    if (file >= 0)
        static_cast<void>(!write(file, text.data(), text.size()));
}

// Before the program has any other thread, so that all of them leave the signal to this one.
__attribute__((constructor)) void waitForTheSignalToExit() {
    if (!told("exits"))
        return;
    sigset_t signals{};
    sigemptyset(&signals);
    sigaddset(&signals, SIGUSR1);
    pthread_sigmask(SIG_BLOCK, &signals, nullptr);
    std::thread([signals] {
        int number = 0;
        sigwait(&signals, &number);
        std::exit(5);
    }).detach();
}

NvMsg32Bit* allocate(std::size_t size) {
    auto* const msg = static_cast<NvMsg32Bit*>(std::calloc(1, size + NVMSG_OVERHEAD));
    if (msg != nullptr)
        msg->size = static_cast<std::uint32_t>(size);
    return msg;
}

unsigned char* bodyOf(NvMsg32Bit* msg) { return reinterpret_cast<unsigned char*>(msg) + NVMSG_HEADER_SIZE; }

struct Queue {
    std::deque<NvMsg32Bit*> waiting;
    bool open = true;
};

// Never destroyed, because threads may still wait for a message when the process exits.
template <typename Shared>
Shared& forEver() {
    return *std::make_unique<Shared>().release();
}

std::mutex& lock = forEver<std::mutex>();
std::condition_variable& changed = forEver<std::condition_variable>();
using Queues = std::map<std::uint32_t, std::shared_ptr<Queue>>;
Queues& queues = forEver<Queues>();  // by handle, which is also the host's instance number

void deliver(std::uint32_t handle, NvMsg32Bit* msg) {
    const auto found = queues.find(handle);
    if (found == queues.end()) {
        std::free(msg);
        return;
    }
    found->second->waiting.push_back(msg);
    changed.notify_all();
}

Octets numbers(std::initializer_list<std::uint32_t> values) {
    Octets octets(values.size() * 4);
    std::memcpy(octets.data(), values.begin(), octets.size());
    return octets;
}

// From whom the command went to whom it came from.
void reply(const NvMsg32Bit& to, std::uint32_t type, const Octets& body) {
    NvMsg32Bit* const msg = allocate(body.size());
    msg->transaction = to.transaction;
    msg->type = type;
    msg->sourceInstance = to.targetInstance;
    msg->sourceBoard = to.targetBoard;
    msg->sourceProcessor = to.targetProcessor;
    msg->sourceComponent = to.targetComponent;
    msg->sourceNode = to.targetNode;
    msg->targetInstance = to.sourceInstance;
    std::copy(body.begin(), body.end(), bodyOf(msg));
    deliver(to.sourceInstance, msg);
}

void sendEvents(const NvMsg32Bit& subscriber) {
    Octets frame = numbers({2, 1, 250, 3});
    frame.insert(frame.end(), {0x00, 0x01, 0x7F});
    if (told("short")) {
        for (const std::size_t size : {4U, 8U, 11U, 12U, 16U, 17U})
            reply(subscriber, evtDetected,
                  Octets(frame.begin(), frame.begin() + static_cast<std::ptrdiff_t>(size)));
    }
    reply(subscriber, evtDetected, frame);
    reply(subscriber, evtDetected, numbers({2, 0, 500, oversizedFrame}));
}

void answer(NvMsg32Bit& command) {
    talk("heard " + std::to_string(command.type));
    if (static bool interrupted = false; told("interrupt=" + std::to_string(command.type)) && !interrupted) {
        interrupted = true;
        kill(getpid(), SIGINT);
    }
    if (told("silent=" + std::to_string(command.type)))
        return;
    if (command.type == detectEvt && told("flood")) {
        for (int i = 0; i < 300; ++i)
            reply(command, evtDetected, numbers({2, 0, 500, 0}));
    }
    if (told("error=" + std::to_string(command.type))) {
        reply(command, error, numbers({command.type, 1001}));
        return;
    }
    switch (command.type) {
        case compFind: {
            Octets found(bodyOf(&command),
                         bodyOf(&command) + 6);  // instance, board, processor, component, node
            found[3] = 1;
            found[4] = found[0] == 0 ? 0x12 : 0x15;
            reply(command, componentResult, found);
            break;
        }
        case getParm:
            reply(command, getParm + 1, numbers({7, protocolType, 0}));
            break;
        case detectEvt:
            reply(command, detectEvt + 1, {});
            sendEvents(command);
            break;
        default:
            reply(command, command.type + 1, {});
    }
}

template <typename Move>
std::uint32_t moveFields(NvMsg32Bit* msg, std::uint32_t count, std::uint32_t* offset, std::va_list arguments,
                         Move move) {
    std::uint32_t at = *offset;
    for (const Field& field : body_fields::fieldsOf(count, arguments)) {
        std::invoke(move, field, bodyOf(msg) + at);
        at += static_cast<std::uint32_t>(field.size());
    }
    if (*offset != 0)
        *offset = at;
    return NVSTATUS_OK;
}

}  // namespace

extern "C" {

uint32_t nvDrvSetInterface(uint32_t, uint32_t) {
    talk("the other library");
    return NVSTATUS_OK;
}

uint32_t nvMsgAllocate(uint32_t size, NvMsg32Bit** msg) {
    if (told("no-memory"))
        return NVSTATUS_ERROR;
    *msg = allocate(size);
    return NVSTATUS_OK;
}

uint32_t nvMsgReallocate(uint32_t size, NvMsg32Bit** msg) {
    void* const moved = std::realloc(*msg, std::size_t{size} + NVMSG_OVERHEAD);
    if (moved == nullptr)
        return NVSTATUS_ERROR;
    *msg = static_cast<NvMsg32Bit*>(moved);
    (*msg)->size = size;
    return NVSTATUS_OK;
}

uint32_t nvMsgFree(NvMsg32Bit* msg) {
    std::free(msg);
    return NVSTATUS_OK;
}

uint32_t nvMsgFieldGet(NvMsg32Bit*, uint32_t, void*) { return NVSTATUS_ERROR; }
uint32_t nvMsgFieldPut(NvMsg32Bit*, uint32_t, void*) { return NVSTATUS_ERROR; }

uint32_t nvMsgVarFieldGet(NvMsg32Bit* msg, uint32_t count, uint32_t* offset, ...) {
    std::va_list arguments;
    va_start(arguments, offset);
    const uint32_t status = moveFields(msg, count, offset, arguments, &Field::get);
    va_end(arguments);
    return status;
}

uint32_t nvMsgVarFieldPut(NvMsg32Bit* msg, uint32_t count, uint32_t* offset, ...) {
    std::va_list arguments;
    va_start(arguments, offset);
    const uint32_t status = moveFields(msg, count, offset, arguments, &Field::put);
    va_end(arguments);
    return status;
}

uint32_t nvQueueOpen() {
    if (told("no-queue"))
        return NVSTATUS_ERROR;
    const std::lock_guard guard(lock);
    static uint32_t last = 1000;
    queues[++last] = std::make_shared<Queue>();
    return last;
}

uint32_t nvQueueBind(uint32_t queue, NvCompDesc* host) {
    *host = {static_cast<uint16_t>(queue), 0, 0, 0, 0, 0, 0};
    return NVSTATUS_OK;
}

uint32_t nvQueueUnbind(uint32_t, NvCompDesc) { return NVSTATUS_OK; }

uint32_t nvQueueClose(uint32_t queue) {
    const std::lock_guard guard(lock);
    const auto found = queues.find(queue);
    if (found == queues.end())
        return NVSTATUS_ERROR;
    found->second->open = false;
    for (NvMsg32Bit* const msg : found->second->waiting)
        std::free(msg);
    found->second->waiting.clear();
    queues.erase(found);
    changed.notify_all();
    if (told("stuck-close") && queues.empty()) {
        talk("the last queue");
        while (true)
            pause();
    }
    return NVSTATUS_OK;
}

uint32_t nvMsgRead(uint32_t queue, uint32_t, NvMsg32Bit** msg) {
    std::unique_lock guard(lock);
    const auto found = queues.find(queue);
    if (found == queues.end())
        return NVSTATUS_ERROR;
    const std::shared_ptr<Queue> own = found->second;
    changed.wait(guard, [&] { return !own->open || !own->waiting.empty(); });
    if (!own->open)
        return NVSTATUS_ERROR;
    *msg = own->waiting.front();
    own->waiting.pop_front();
    return NVSTATUS_OK;
}

uint32_t nvMsgWrite(uint32_t, NvMsg32Bit* msg, uint32_t) {
    const std::lock_guard guard(lock);
    if (queues.contains(msg->targetInstance) && msg->targetBoard == 0) {
        deliver(msg->targetInstance, msg);
        return NVSTATUS_OK;
    }
    answer(*msg);
    std::free(msg);
    return NVSTATUS_OK;
}

}  // extern "C"

#include "softboard/process.h"
#include "softboard/softboard.h"

namespace softboard {

void reset(const Scenario& scenario) { network().reset(scenario); }

void setFaults(const std::vector<Fault>& faults) { network().setFaults(faults); }

std::string journal() { return network().journal().text(); }

std::string heard() { return network().journal().heard(); }

void clearJournal() { network().journal().clear(); }

bool waitForMessages(uint32_t type, size_t count, std::chrono::milliseconds limit) {
    return network().journal().waitFor(type, count, limit);
}

size_t outstanding() { return network().buffers().outstanding(); }

bool waitForOutstanding(size_t count, std::chrono::milliseconds limit) {
    return network().buffers().waitForOutstanding(count, limit);
}

size_t openQueues() { return network().openQueues(); }

std::string balance() { return network().balance(); }

bool send(uint32_t type, const NvCompDesc& source, const NvCompDesc& target, const std::vector<uint8_t>& body,
          uint32_t transaction) {
    return network().inject({transaction << 8, type, addressOf(source), addressOf(target), body});
}

}  // namespace softboard

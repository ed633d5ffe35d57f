#include "hostsvc/KSLocalMsgQueue.h"

#include <sys/resource.h>

#include <utility>

#include "hostsvc/KSException.h"
#include "hostsvc/KSMsgRef.h"
#include "hostsvc/KSSystem.h"

namespace {

// The transport library may keep a descriptor for each queue. The limit is not raised beyond the hard limit.
void allowMoreOpenFiles() {
    constexpr rlim_t more = 60;
    rlimit limit{};
    if (getrlimit(RLIMIT_NOFILE, &limit) != 0)
        return;
    limit.rlim_cur = limit.rlim_max - limit.rlim_cur < more ? limit.rlim_max : limit.rlim_cur + more;
    setrlimit(RLIMIT_NOFILE, &limit);
}

// Calls `attempt`, and if that fails, once more with a higher limit of open files.
template <typename Attempt>
std::uint32_t persistently(Attempt attempt) {
    std::uint32_t result = attempt();
    if (result == NVSTATUS_ERROR) {
        allowMoreOpenFiles();
        result = attempt();
    }
    return result;
}

}  // namespace

KSLocalMsgQueue::KSLocalMsgQueue(NvCompDesc /*desc*/, unsigned /*a*/, unsigned /*b*/)
    : handle_(persistently(nvQueueOpen)) {
    if (handle_ == NVSTATUS_ERROR)
        throw KSResource_CreationError();
    if (persistently([this] { return nvQueueBind(handle_, &hostDesc); }) == NVSTATUS_ERROR) {
        nvQueueClose(handle_);
        throw KSResource_CreationError();
    }
}

KSLocalMsgQueue::~KSLocalMsgQueue() { KSLocalMsgQueue::close(); }

void KSLocalMsgQueue::close() {
    if (std::exchange(closed_, true))
        return;
    constexpr const char* function = "virtual KSLocalMsgQueue::~KSLocalMsgQueue()";
    KSLocalMsgQueue::wakeReader();
    if (nvQueueUnbind(handle_, hostDesc) == NVSTATUS_ERROR)
        ks_assertionFailed("nvQueueUnbind(hostQ,hostDesc)!=NVSTATUS_ERROR", "KSLocalMsgQueue", 98, function);
    if (nvQueueClose(handle_) == NVSTATUS_ERROR)
        ks_assertionFailed("nvQueueClose(hostQ)!=NVSTATUS_ERROR", "KSLocalMsgQueue", 100, function);
}

std::uint32_t KSLocalMsgQueue::msgRead(NvMsg32Bit** out) { return nvMsgRead(handle_, 0, out); }

std::uint32_t KSLocalMsgQueue::msgWrite(NvMsg32Bit* msg) { return nvMsgWrite(handle_, msg, 0); }

void KSLocalMsgQueue::wakeReader() {
    if (woken_)
        return;
    try {
        KSMsgRef toItself(0U);
        toItself.setSrcAddr(hostDesc);
        toItself.setTgtAddr(hostDesc);
        nvMsgWrite(handle_, toItself.getMsgRef(), 0);
        woken_ = true;
    } catch (const KSMsgRef::AllocationError&) {
    }
}

#include "hostsvc/KSMsgRef.h"

#include <cstring>

#include "hostsvc/KSSystem.h"

std::uint32_t KSHostInit() { return nvDrvSetInterface(0, 0); }

void KSHostCleanup() {}

KSMsgRef::KSMsgRef(unsigned size) {
    nvMsgAllocate(size, &msg_);
    if (msg_ == nullptr)
        throw AllocationError(size);
}

void KSMsgRef::checkValid() const {
    if (msg_ == nullptr)
        ks_assertionFailed("__null", "KSMsgRef", 58, "void KSMsgRef::checkValid() const");
}

KSMsgRef KSMsgRef::clone() const {
    const unsigned size = getSize();
    const KSMsgRef copy(size);
    std::memcpy(static_cast<void*>(copy.msg_), msg_, std::size_t{size} + NVMSG_OVERHEAD);
    return copy;
}

std::uint32_t KSMsgRef::free() {
    const std::uint32_t status = nvMsgFree(valid());
    msg_ = nullptr;
    return status;
}

void KSMsgRef::realloc(unsigned size) {
    if (msg_ == nullptr) {
        *this = KSMsgRef(size);
        return;
    }
    NvMsg32Bit* resized = msg_;  // a copy: a call that fails may change it, and msg_ must stay
    if (nvMsgReallocate(size, &resized) != 0)
        throw AllocationError(size);
    msg_ = resized;
}

unsigned KSMsgRef::getMsgType() const { return valid()->type; }

unsigned KSMsgRef::getSize() const { return valid()->size; }

unsigned KSMsgRef::getTrans() const { return valid()->transaction >> 8; }

NvCompDesc KSMsgRef::getSrcAddr() const {
    const NvMsg32Bit& header = *valid();
    return {header.sourceInstance,  header.sourceBoard, 0, header.sourceProcessor,
            header.sourceComponent, header.sourceNode,  0};
}

NvCompDesc KSMsgRef::getTgtAddr() const {
    const NvMsg32Bit& header = *valid();
    return {header.targetInstance,  header.targetBoard, 0, header.targetProcessor,
            header.targetComponent, header.targetNode,  0};
}

void KSMsgRef::setMsgType(unsigned type) { valid()->type = type; }

void KSMsgRef::setTrans(unsigned trans) {
    NvMsg32Bit& header = *valid();
    header.transaction = (trans << 8) | (header.transaction & 0xFFU);
}

void KSMsgRef::setSrcAddr(NvCompDesc address) {
    NvMsg32Bit& header = *valid();
    header.sourceInstance = address.instance;
    header.sourceBoard = address.board;
    header.sourceProcessor = address.processor;
    header.sourceComponent = address.component;
    header.sourceNode = address.node;
}

void KSMsgRef::setTgtAddr(NvCompDesc address) {
    NvMsg32Bit& header = *valid();
    header.targetInstance = address.instance;
    header.targetBoard = address.board;
    header.targetProcessor = address.processor;
    header.targetComponent = address.component;
    header.targetNode = address.node;
}

std::uint32_t KSMsgRef::fieldGet(unsigned index, void* out) const {
    return nvMsgFieldGet(valid(), index, out);
}

std::uint32_t KSMsgRef::fieldPut(unsigned index, void* in) { return nvMsgFieldPut(valid(), index, in); }

// Start-up of the transport library, its addresses, and handles to its message buffers.
#ifndef HOSTSVC_KSMSGREF_H
#define HOSTSVC_KSMSGREF_H

#include <cstdint>

#include "hostsvc/KSException.h"
#include "norv/norv.h"

// Starts the host services. Call it once, before any queue is made. Returns the transport library's status, 0
// for success.
std::uint32_t KSHostInit();

// Ends the host services. Call it once, at the end.
void KSHostCleanup();

// Whether two addresses are equal, apart from their two unused octets.
inline bool descComp(NvCompDesc a, NvCompDesc b) {
    return a.instance == b.instance && a.board == b.board && a.processor == b.processor &&
           a.component == b.component && a.node == b.node;
}

// A handle does not own the buffer and does not count references. Copies refer to the same buffer, and the
// owner of the message calls free() once. Using an empty handle, except for getMsgRef, assignment and
// realloc, ends the process through a failed assertion.
class KSMsgRef {
  public:
    class AllocationError : public virtual KSException {
      public:
        explicit AllocationError(unsigned size) : size_(size) {}
        unsigned size() const { return size_; }  // octets of body that were asked for

      private:
        unsigned size_;
    };

    KSMsgRef() = default;
    explicit KSMsgRef(unsigned size);  // a new buffer for a body of size octets; throws AllocationError
    explicit KSMsgRef(NvMsg32Bit* msg) : msg_(msg) {}
    KSMsgRef(const KSMsgRef&) = default;
    KSMsgRef& operator=(const KSMsgRef&) = default;
    virtual ~KSMsgRef() = default;

    NvMsg32Bit* getMsgRef() const { return msg_; }  // null when empty
    void checkValid() const;

    // Makes a new buffer with the same header, body and library's octets after the body. The caller owns it.
    // Throws AllocationError.
    KSMsgRef clone() const;
    // Gives the buffer back to the library and returns its status. Only this handle becomes empty; copies
    // must not be used any more.
    std::uint32_t free();
    // Changes the size of the body, or makes a buffer if the handle is empty. Throws AllocationError, and
    // then leaves the handle as it was.
    void realloc(unsigned size);

    unsigned getMsgType() const;
    unsigned getSize() const;   // of the body, octets
    unsigned getTrans() const;  // 24 bits
    NvCompDesc getSrcAddr() const;
    NvCompDesc getTgtAddr() const;

    void setMsgType(unsigned type);
    void setTrans(unsigned trans);  // the low 24 bits; keeps the octet for the library's own use
    void setSrcAddr(NvCompDesc address);
    void setTgtAddr(NvCompDesc address);

    // Reads or writes one fixed field, which is named by its index. Returns the library's status.
    std::uint32_t fieldGet(unsigned index, void* out) const;
    std::uint32_t fieldPut(unsigned index, void* in);

  private:
    NvMsg32Bit* valid() const {
        checkValid();
        return msg_;
    }

    NvMsg32Bit* msg_ = nullptr;
};

#endif

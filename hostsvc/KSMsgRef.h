// A handle over one message buffer of the transport library.
#ifndef HOSTSVC_KSMSGREF_H
#define HOSTSVC_KSMSGREF_H

#include <cstdint>

#include "hostsvc/KSException.h"
#include "norv/norv.h"

// Owns nothing and counts nothing: copies share the buffer, and whoever ends the message's life calls free()
// once. Every access to an empty handle except getMsgRef, assignment and realloc ends the process through a
// failed assertion.
class KSMsgRef {
  public:
    class AllocationError : public virtual KSException {
      public:
        explicit AllocationError(unsigned size) : size_(size) {}
        unsigned size() const { return size_; }  // octets of body that could not be had

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

    // A buffer of its own with the same header, body and the library's octets after it. Throws
    // AllocationError.
    KSMsgRef clone() const;
    // Back to the library, whose status it returns; this handle alone becomes empty.
    std::uint32_t free();
    // Changes the body's size, or makes a buffer where the handle is empty. Throws AllocationError, and then
    // keeps what it had.
    void realloc(unsigned size);

    unsigned getMsgType() const;
    unsigned getSize() const;   // of the body, octets
    unsigned getTrans() const;  // 24 bits
    NvCompDesc getSrcAddr() const;
    NvCompDesc getTgtAddr() const;

    void setMsgType(unsigned type);
    void setTrans(unsigned trans);  // its low 24 bits; the header's low octet is the library's
    void setSrcAddr(NvCompDesc address);
    void setTgtAddr(NvCompDesc address);

    // One fixed field, by index; the library's status.
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

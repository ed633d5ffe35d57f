// The body of a message of unknown type: its octets.
#ifndef VELA_MSGDEFAULT_H
#define VELA_MSGDEFAULT_H

#include "vela/MsgBody.h"
#include "vela/list.h"

namespace vela {

class MsgDefault_t : public MsgBody {
  public:
    MsgDefault_t() = default;
    // Binds the body to the caller's list, which it reads into and writes from.
    explicit MsgDefault_t(staticList<unsigned char>& bytes) : used_(&bytes) {}
    MsgDefault_t(const MsgDefault_t& other) : MsgBody(other), own_(*other.used_) {}
    MsgDefault_t& operator=(const MsgDefault_t& other) {
        if (this != &other)
            *used_ = *other.used_;
        return *this;
    }
    ~MsgDefault_t() override = default;

    staticList<unsigned char>& bytes() { return *used_; }

    unsigned int writeMsg(Msg* msg, unsigned int offset) override;
    unsigned int readMsg(Msg* msg, unsigned int offset) override;
    unsigned int GetByteSize() const override { return used_->length(); }
    // Writes "{ByteData {", each octet as a number in the stream's base followed by a blank, and "}}".
    void toStream(std::ostream* out) const override;

  private:
    staticList<unsigned char> own_;
    staticList<unsigned char>* used_ = &own_;
};

}  // namespace vela

#endif

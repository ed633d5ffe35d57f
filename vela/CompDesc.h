// The address of one component instance.
#ifndef VELA_COMPDESC_H
#define VELA_COMPDESC_H

#include "norv/norv.h"
#include "vela/MsgBody.h"

namespace vela {

class CompDesc_t : public MsgBody {
  public:
    static constexpr unsigned char anyComponent = 255;

    CompDesc_t() = default;
    CompDesc_t(unsigned short instance, unsigned char board, unsigned char processor, unsigned char component,
               unsigned char node)
        : Instance(instance), Board(board), Processor(processor), Component(component), Node(node) {}
    explicit CompDesc_t(const NvCompDesc& address);

    NvCompDesc getNvCompDesc() const;

    bool operator==(const CompDesc_t& other) const;

    unsigned int writeMsg(Msg* msg, unsigned int offset) override;
    unsigned int readMsg(Msg* msg, unsigned int offset) override;
    unsigned int GetByteSize() const override { return 6; }
    // Writes "{Node 4 Board 1 Processor 2 Component 3 Instance 5}", with numbers in the stream's base.
    void toStream(std::ostream* out) const override;

    unsigned short Instance = 0;  // within the component
    unsigned char Board = 0;
    unsigned char Processor = 0;
    unsigned char Component = 0;
    unsigned char Node = 0;  // 0 for components of a board; the library chooses that of a host queue
};

}  // namespace vela

#endif

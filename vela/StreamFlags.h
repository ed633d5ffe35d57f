// Restores the format flags of a stream at the end of a scope.
#ifndef VELA_STREAMFLAGS_H
#define VELA_STREAMFLAGS_H

#include <ostream>

namespace vela {

class StreamFlags {
  public:
    explicit StreamFlags(std::ostream& stream) : stream_(stream), flags_(stream.flags()) {}
    ~StreamFlags() { stream_.flags(flags_); }
    StreamFlags(const StreamFlags&) = delete;
    StreamFlags& operator=(const StreamFlags&) = delete;

  private:
    std::ostream& stream_;
    std::ios_base::fmtflags flags_;
};

}  // namespace vela

#endif

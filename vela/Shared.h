// An object with a count of holders. The last holder to detach deletes the object.
#ifndef VELA_SHARED_H
#define VELA_SHARED_H

#include <atomic>

namespace vela {

class Shared {
  public:
    void attach() { ++holders_; }
    void detach() {
        if (--holders_ == 0)
            delete this;
    }
    Shared(const Shared&) = delete;
    Shared& operator=(const Shared&) = delete;

  protected:
    Shared() = default;
    virtual ~Shared() = default;

  private:
    std::atomic<unsigned int> holders_{0};
};

}  // namespace vela

#endif

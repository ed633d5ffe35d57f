// An object with a count of holders. The last holder to detach deletes the object.
#ifndef VELA_SHARED_H
#define VELA_SHARED_H

#include <atomic>
#include <utility>

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

// Holds such an object, or none: attaches it, and detaches it at the end.
template <typename T>
class Attached {
  public:
    Attached() = default;
    explicit Attached(T* object) : object_(object) {
        if (object_ != nullptr)
            object_->attach();
    }
    Attached(Attached&& other) noexcept : object_(std::exchange(other.object_, nullptr)) {}
    Attached& operator=(Attached&& other) noexcept {
        std::swap(object_, other.object_);
        return *this;
    }
    ~Attached() {
        if (object_ != nullptr)
            object_->detach();
    }

    T* get() const { return object_; }
    T* operator->() const { return object_; }

  private:
    T* object_ = nullptr;
};

}  // namespace vela

#endif

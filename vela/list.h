// The base class of the containers, and an array whose size changes rarely.
//
// The containers have no locks: the owner of a container that threads share must lock it.
#ifndef VELA_LIST_H
#define VELA_LIST_H

#include <algorithm>
#include <memory>
#include <new>
#include <ostream>
#include <type_traits>
#include <utility>

#include "vela/Exception.h"

namespace vela {

// The index in an OutOfBoundsError about a key that is not in the container.
inline constexpr unsigned int noIndex = 0xFFFFFFFFU;

// Prints one element of a list: an object by its toStream, anything else with <<.
template <typename T>
void printElement(std::ostream* out, const T& element) {
    if constexpr (std::is_pointer_v<T>)
        *out << static_cast<const void*>(element);
    else
        *out << element;
}

// Prints "{", the elements with a blank between them, and "}". Octets are printed as characters.
template <typename Iterator>
void printList(std::ostream* out, Iterator begin, Iterator end) {
    *out << "{";
    for (Iterator at = begin; at != end; ++at) {
        if (at != begin)
            *out << " ";
        printElement(out, *at);
    }
    *out << "}";
}

template <typename T>
class list : public virtualObject {
  public:
    class AllocationError : public Exception {
      public:
        explicit AllocationError(unsigned int size) : Exception("list::AllocationError"), size_(size) {}
        unsigned int size() const { return size_; }
        void toStream(std::ostream* out) const override {
            *out << "list::AllocationError(ReqSize: " << size_ << ")";
        }

      private:
        unsigned int size_;
    };

    class OutOfBoundsError : public Exception {
      public:
        explicit OutOfBoundsError(unsigned int index) : Exception("list::OutOfBoundsError"), index_(index) {}
        unsigned int index() const { return index_; }
        void toStream(std::ostream* out) const override {
            *out << "list::OutOfBoundsError(Index: " << index_ << ")";
        }

      private:
        unsigned int index_;
    };

    unsigned int length() const { return length_; }

  protected:
    unsigned int length_ = 0;
};

// An array. It keeps its storage as long as its length is between half its capacity and its capacity.
template <typename T>
class staticList : public list<T> {
  public:
    using typename list<T>::AllocationError;

    staticList() = default;
    explicit staticList(unsigned int size) { realloc(size); }
    staticList(std::initializer_list<T> elements) {
        realloc(static_cast<unsigned int>(elements.size()));
        std::copy(elements.begin(), elements.end(), begin());
    }
    staticList(const staticList& other) : list<T>() { *this = other; }
    staticList(staticList&& other) noexcept
        : list<T>(), array_(std::move(other.array_)), capacity_(std::exchange(other.capacity_, 0)) {
        length_ = std::exchange(other.length_, 0);
    }
    ~staticList() override = default;

    staticList& operator=(const staticList& other) {
        if (this != &other) {
            realloc(other.length_);
            std::copy(other.begin(), other.end(), begin());
        }
        return *this;
    }
    staticList& operator=(staticList&& other) noexcept {
        array_ = std::move(other.array_);
        capacity_ = std::exchange(other.capacity_, 0);
        length_ = std::exchange(other.length_, 0);
        return *this;
    }

    unsigned int capacity() const { return capacity_; }

    // Changes the length and keeps the elements that still fit. The elements move only when `size` is not
    // between half the capacity and the capacity. Throws AllocationError when there is no memory.
    void realloc(unsigned int size) {
        const bool fits = array_ != nullptr && capacity_ / 2 <= size && size <= capacity_;
        if (size != capacity_ && !fits)
            reallocateExactly(size);
        length_ = size;
    }

    // Does not check the index.
    T& operator[](unsigned int i) { return array_[i]; }
    const T& operator[](unsigned int i) const { return array_[i]; }
    T& element(unsigned int i) { return array_[i]; }
    const T& element(unsigned int i) const { return array_[i]; }

    T* begin() { return array_.get(); }
    T* end() { return array_.get() + length_; }
    const T* begin() const { return array_.get(); }
    const T* end() const { return array_.get() + length_; }

    bool operator==(const staticList& other) const {
        return std::equal(begin(), end(), other.begin(), other.end());
    }

    void toStream(std::ostream* out) const override { printList(out, begin(), end()); }

  private:
    using list<T>::length_;

    void reallocateExactly(unsigned int size) {
        std::unique_ptr<T[]> grown(new (std::nothrow) T[size]());
        if (grown == nullptr)
            throw AllocationError(size);
        std::move(begin(), begin() + std::min(length_, size), grown.get());
        array_ = std::move(grown);
        capacity_ = size;
    }

    std::unique_ptr<T[]> array_;
    unsigned int capacity_ = 0;
};

}  // namespace vela

#endif

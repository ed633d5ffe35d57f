// A doubly linked list with a cursor, and a list of keys and values.
#ifndef VELA_LINKEDLIST_H
#define VELA_LINKEDLIST_H

#include <memory>
#include <ostream>
#include <utility>

#include "vela/list.h"

namespace vela {

template <typename T>
struct link {
    T value;
    std::unique_ptr<link> next;
    link* previous = nullptr;
};

// The cursor remembers the last link that was read, so that reading the elements in order costs one step
// each.
template <typename T>
class linkedList : public list<T> {
  public:
    using typename list<T>::OutOfBoundsError;

    linkedList() = default;
    linkedList(const linkedList& other) : list<T>() {
        for (const link<T>* at = other.head_.get(); at != nullptr; at = at->next.get())
            append(at->value);
    }
    linkedList(linkedList&& other) noexcept { swap(other); }
    linkedList& operator=(linkedList other) noexcept {
        swap(other);
        return *this;
    }
    ~linkedList() override { clear(); }

    // Inserts the value before element i; i = length appends it. Throws OutOfBoundsError when i is larger.
    void insert(unsigned int i, T value) {
        if (i > length_)
            throw OutOfBoundsError(i);
        auto fresh = std::make_unique<link<T>>(link<T>{std::move(value), nullptr, nullptr});
        link<T>* const before = i == length_ ? nullptr : walkTo(i);
        fresh->previous = before == nullptr ? tail_ : before->previous;
        (before == nullptr ? tail_ : before->previous) = fresh.get();
        std::unique_ptr<link<T>>& owner = fresh->previous == nullptr ? head_ : fresh->previous->next;
        fresh->next = std::move(owner);
        owner = std::move(fresh);
        cursor_ = owner.get();
        cursorIndex_ = i;
        ++length_;
    }
    void append(T value) { insert(length_, std::move(value)); }

    // Returns element i and moves the cursor to it. Throws OutOfBoundsError.
    T& element(unsigned int i) { return walkTo(checked(i))->value; }
    T& operator[](unsigned int i) { return element(i); }

    // Returns element i without moving the cursor. Throws OutOfBoundsError.
    const T& value(unsigned int i) const {
        const link<T>* at = head_.get();
        for (unsigned int left = checked(i); left > 0; --left)
            at = at->next.get();
        return at->value;
    }

    // Removes element i and returns it. Throws OutOfBoundsError.
    T remove(unsigned int i) {
        link<T>* const gone = walkTo(checked(i));
        std::unique_ptr<link<T>>& owner = gone->previous == nullptr ? head_ : gone->previous->next;
        const std::unique_ptr<link<T>> held = std::move(owner);
        owner = std::move(held->next);
        (owner == nullptr ? tail_ : owner->previous) = held->previous;
        cursor_ = head_.get();
        cursorIndex_ = 0;
        --length_;
        return std::move(held->value);
    }

    // Writes "{", the elements with a blank between them, and "}".
    void toStream(std::ostream* out) const override {
        *out << "{";
        for (const link<T>* at = head_.get(); at != nullptr; at = at->next.get()) {
            if (at != head_.get())
                *out << " ";
            printElement(out, at->value);
        }
        *out << "}";
    }

  private:
    using list<T>::length_;

    unsigned int checked(unsigned int i) const {
        if (i >= length_)
            throw OutOfBoundsError(i);
        return i;
    }

    link<T>* walkTo(unsigned int i) {
        if (i == 0 || cursor_ == nullptr) {
            cursor_ = head_.get();
            cursorIndex_ = 0;
        }
        for (; cursorIndex_ < i; ++cursorIndex_)
            cursor_ = cursor_->next.get();
        for (; cursorIndex_ > i; --cursorIndex_)
            cursor_ = cursor_->previous;
        return cursor_;
    }

    // Deletes one link at a time, because deleting the head would delete the others recursively.
    void clear() {
        while (head_ != nullptr)
            head_ = std::move(head_->next);
    }

    void swap(linkedList& other) noexcept {
        std::swap(head_, other.head_);
        std::swap(cursor_, other.cursor_);
        std::swap(tail_, other.tail_);
        std::swap(cursorIndex_, other.cursorIndex_);
        std::swap(length_, other.length_);
    }

    std::unique_ptr<link<T>> head_;
    link<T>* cursor_ = nullptr;
    link<T>* tail_ = nullptr;
    unsigned int cursorIndex_ = 0;
};

template <typename K, typename V>
struct keyLink {
    V value;
    K key;
};

template <typename K, typename V>
std::ostream& operator<<(std::ostream& out, const keyLink<K, V>& entry) {
    out << "{Key: ";
    printElement(&out, entry.key);
    out << " Value: ";
    printElement(&out, entry.value);
    return out << "}";
}

// A list of keys and values. The newest entry of a key hides the older ones until it is removed.
template <typename K, typename V>
class keyedList : public virtualObject {
  public:
    using OutOfBoundsError = typename list<keyLink<K, V>>::OutOfBoundsError;

    unsigned int length() const { return entries_.length(); }

    void set(K key, V value) { entries_.insert(0, keyLink<K, V>{std::move(value), std::move(key)}); }

    // Null when the key is not present.
    V* find(const K& key) {
        const unsigned int i = indexOf(key);
        return i == noIndex ? nullptr : &entries_.element(i).value;
    }

    // Both throw OutOfBoundsError, with noIndex, when the key is not present.
    V& element(const K& key) { return entries_.element(indexOf(key)).value; }
    V& operator[](const K& key) { return element(key); }
    void unset(const K& key) { entries_.remove(indexOf(key)); }

    void toStream(std::ostream* out) const override { entries_.toStream(out); }

  private:
    unsigned int indexOf(const K& key) {
        for (unsigned int i = 0; i < entries_.length(); ++i) {
            if (entries_.element(i).key == key)
                return i;
        }
        return noIndex;
    }

    linkedList<keyLink<K, V>> entries_;
};

}  // namespace vela

#endif

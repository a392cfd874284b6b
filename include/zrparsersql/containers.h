#pragma once

#include <cstddef>
#include <cstdint>
#include <exception>
#include <utility>
#include <vector>

#include "zrparsersql/export.h"
#include "zrparsersql/wide_string.h"

// Raised where the head, the tail or a position of a container is asked for that is not there.
class ZR_SHARED_DECLARATION CInvalidArgException : public std::exception {
 public:
    const char* what() const noexcept override { return "invalid argument"; }
};

// A place in a CList or in one of the maps. The empty position (compare with nullptr, or test it) stands
// behind the last element.
struct POSITION {
    std::uintptr_t value = 0;

    POSITION() = default;
    POSITION(std::nullptr_t) {}
    explicit POSITION(std::uintptr_t place) : value(place) {}
    explicit operator bool() const { return value != 0; }
    bool operator==(const POSITION&) const = default;
};

// A list that grows at its tail. A list of pointers does not own what they point to: the list's owner deletes
// the objects before it empties the list. Neither copied, so that no two lists seem to own the same objects,
// nor guarded against use from several threads.
//
// Positions stay good while elements are appended. References to elements hold until the next AddTail or
// removal.
template <class T>
class CList {
 public:
    CList() = default;
    // The number is a hint from an older allocator and is not used.
    explicit CList(int /*blockSize*/) {}
    CList(CList&&) noexcept = default;
    CList& operator=(CList&&) noexcept = default;
    CList(const CList&) = delete;
    CList& operator=(const CList&) = delete;

    POSITION AddTail(T element) {
        elements_.push_back(std::move(element));
        return POSITION(elements_.size());
    }
    int GetCount() const { return static_cast<int>(elements_.size()); }
    bool IsEmpty() const { return elements_.empty(); }
    void RemoveAll() { elements_.clear(); }

    // Raise CInvalidArgException when the list is empty.
    T& GetHead() { return const_cast<T&>(std::as_const(*this).GetHead()); }
    const T& GetHead() const {
        if (elements_.empty()) throw CInvalidArgException();
        return elements_.front();
    }
    T& GetTail() { return const_cast<T&>(std::as_const(*this).GetTail()); }
    const T& GetTail() const {
        if (elements_.empty()) throw CInvalidArgException();
        return elements_.back();
    }

    // for (POSITION at = list.GetHeadPosition(); at;) use(list.GetNext(at));
    POSITION GetHeadPosition() const { return POSITION(elements_.empty() ? 0 : 1); }
    // The element at a position, which moves on to the next one. Raises CInvalidArgException at the empty
    // position.
    T& GetNext(POSITION& at) { return const_cast<T&>(std::as_const(*this).GetNext(at)); }
    const T& GetNext(POSITION& at) const {
        const T& element = GetAt(at);
        at.value = at.value < elements_.size() ? at.value + 1 : 0;
        return element;
    }
    T& GetAt(POSITION at) { return const_cast<T&>(std::as_const(*this).GetAt(at)); }
    const T& GetAt(POSITION at) const {
        if (at.value == 0 || at.value > elements_.size()) throw CInvalidArgException();
        return elements_[at.value - 1];
    }
    void SetAt(POSITION at, T element) { GetAt(at) = std::move(element); }
    // Removes one element; positions of later elements then name the element behind theirs.
    void RemoveAt(POSITION at) {
        GetAt(at);
        elements_.erase(elements_.begin() + static_cast<std::ptrdiff_t>(at.value - 1));
    }

    auto begin() { return elements_.begin(); }
    auto end() { return elements_.end(); }
    auto begin() const { return elements_.begin(); }
    auto end() const { return elements_.end(); }

 private:
    std::vector<T> elements_;
};

namespace zr {

// Hash map from text, exact in case, to a value. Iterates in the order in which keys came in, so that runs
// repeat; callers need not and should not build on an order. Pointers in it are not owned. References to
// values hold until their own key is removed. Neither copied nor guarded against use from several threads.
template <class Value>
class StringMap {
 public:
    struct Entry {
        const CString key;
        Value value;
    };

    StringMap() = default;
    // The number is a hint from an older allocator and is not used.
    explicit StringMap(int /*blockSize*/) {}
    StringMap(StringMap&& other) noexcept { swap(other); }
    StringMap& operator=(StringMap&& other) noexcept {
        StringMap emptied;
        swap(other);
        other.swap(emptied);
        return *this;
    }
    StringMap(const StringMap&) = delete;
    StringMap& operator=(const StringMap&) = delete;
    ~StringMap() { RemoveAll(); }

    int GetCount() const { return static_cast<int>(count_); }
    bool IsEmpty() const { return count_ == 0; }

    // Enters a value or replaces the one that stands; what a replaced pointer points to is the caller's to
    // free.
    void SetAt(const CString& key, Value value) { (*this)[key] = std::move(value); }
    // The value of a key, made with its default when there is none.
    Value& operator[](const CString& key) {
        const std::size_t hash = key.Hash();
        if (Node* node = find(key, hash)) return node->entry.value;
        return insert(key, hash)->entry.value;
    }
    // Answers whether the key stands, and if so fills the value.
    bool Lookup(std::u16string_view key, Value& value) const {
        const Value* found = Find(key);
        if (found) value = *found;
        return found != nullptr;
    }
    // The value in place, or null. A null pointer kept as a value is a found one.
    Value* Find(std::u16string_view key) { return const_cast<Value*>(std::as_const(*this).Find(key)); }
    const Value* Find(std::u16string_view key) const {
        const Node* node = count_ ? find(key, CString::hash(key)) : nullptr;
        return node ? &node->entry.value : nullptr;
    }
    bool Contains(std::u16string_view key) const { return Find(key) != nullptr; }
    bool RemoveKey(std::u16string_view key);
    void RemoveAll();

    // for (POSITION at = map.GetStartPosition(); at;) map.GetNextAssoc(at, key, value);
    POSITION GetStartPosition() const { return position(first_); }
    void GetNextAssoc(POSITION& at, CString& key, Value& value) const {
        if (!at) throw CInvalidArgException();
        const Node* node = reinterpret_cast<const Node*>(at.value);
        key = node->entry.key;
        value = node->entry.value;
        at = position(node->next);
    }

 private:
    struct Node {
        Entry entry;
        std::size_t hash;
        Node* next = nullptr;      // in order of entry
        Node* previous = nullptr;  // in order of entry
        Node* chain = nullptr;     // in the bucket
    };
    // Up to this many entries are compared one by one, by hash first, without buckets.
    static constexpr std::size_t kLinearLimit = 8;

    template <class EntryType, class NodeType>
    class Iterator {
     public:
        Iterator() = default;
        explicit Iterator(NodeType* node) : node_(node) {}
        EntryType& operator*() const { return node_->entry; }
        EntryType* operator->() const { return &node_->entry; }
        Iterator& operator++() {
            node_ = node_->next;
            return *this;
        }
        bool operator==(const Iterator&) const = default;

     private:
        NodeType* node_ = nullptr;
    };

 public:
    // Entries as {key, value}. The entry an iterator stands at may not be removed before it has moved on.
    auto begin() { return Iterator<Entry, Node>(first_); }
    auto end() { return Iterator<Entry, Node>(nullptr); }
    auto begin() const { return Iterator<const Entry, const Node>(first_); }
    auto end() const { return Iterator<const Entry, const Node>(nullptr); }

 private:
    static POSITION position(const Node* node) { return POSITION(reinterpret_cast<std::uintptr_t>(node)); }

    Node* find(std::u16string_view key, std::size_t hash) const {
        if (buckets_.empty()) {
            for (Node* node = first_; node; node = node->next)
                if (node->hash == hash && node->entry.key.View() == key) return node;
            return nullptr;
        }
        for (Node* node = buckets_[hash & (buckets_.size() - 1)]; node; node = node->chain)
            if (node->hash == hash && node->entry.key.View() == key) return node;
        return nullptr;
    }
    void putInBucket(Node* node) {
        Node*& head = buckets_[node->hash & (buckets_.size() - 1)];
        node->chain = head;
        head = node;
    }
    Node* insert(const CString& key, std::size_t hash) {
        if (count_ >= kLinearLimit && count_ >= buckets_.size())
            rebuild(buckets_.empty() ? kLinearLimit * 4 : buckets_.size() * 2);
        Node* node = new Node{{key, Value()}, hash, nullptr, last_, nullptr};
        (last_ ? last_->next : first_) = node;
        last_ = node;
        ++count_;
        if (!buckets_.empty()) putInBucket(node);
        return node;
    }
    void rebuild(std::size_t bucketCount) {
        buckets_.assign(bucketCount, nullptr);
        for (Node* node = first_; node; node = node->next) putInBucket(node);
    }
    void swap(StringMap& other) noexcept {
        std::swap(first_, other.first_);
        std::swap(last_, other.last_);
        std::swap(count_, other.count_);
        buckets_.swap(other.buckets_);
    }

    Node* first_ = nullptr;
    Node* last_ = nullptr;
    std::size_t count_ = 0;
    std::vector<Node*> buckets_;  // empty, or a power of two
};

template <class Value>
bool StringMap<Value>::RemoveKey(std::u16string_view key) {
    Node* node = find(key, CString::hash(key));
    if (!node) return false;
    if (!buckets_.empty()) {
        Node** link = &buckets_[node->hash & (buckets_.size() - 1)];
        while (*link != node) link = &(*link)->chain;
        *link = node->chain;
    }
    (node->previous ? node->previous->next : first_) = node->next;
    (node->next ? node->next->previous : last_) = node->previous;
    --count_;
    delete node;
    return true;
}

template <class Value>
void StringMap<Value>::RemoveAll() {
    for (Node* node = first_; node;) {
        Node* next = node->next;
        delete node;
        node = next;
    }
    first_ = last_ = nullptr;
    count_ = 0;
    buckets_.clear();
}

}  // namespace zr

template <class Object>
using CMapStringToOb = zr::StringMap<Object*>;
using CMapStringToString = zr::StringMap<CString>;
using CMapStringToPtr = zr::StringMap<void*>;

// cimple::Array<T>: the reference-counted, copy-on-write array stored in
// instance slots (an 8-byte handle; the all-zero handle is the empty array).
// Copies share elements until one of them is changed.
#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <initializer_list>
#include <new>
#include <utility>

namespace cimple {

struct Instance;
void ref(const Instance* instance);
void unref(Instance* instance);

// How an element is copied into and released from an array.  Instance
// pointers in a reference array hold one reference each.
template <class T>
struct Array_Element {
  static void copy(T* dst, const T& src) { new (dst) T(src); }
  static void destroy(T* p) { p->~T(); }
};

template <>
struct Array_Element<Instance*> {
  static void copy(Instance** dst, Instance* src) {
    *dst = src;
    if (src) ref(src);
  }
  static void destroy(Instance** p) {
    if (*p) unref(*p);
  }
};

template <class T>
class Array {
 public:
  Array() noexcept : rep_(nullptr) {}
  Array(std::initializer_list<T> values) : rep_(nullptr) {
    reserve(static_cast<uint32_t>(values.size()));
    for (const T& v : values) append(v);
  }
  Array(const T* values, size_t n) : rep_(nullptr) {
    reserve(static_cast<uint32_t>(n));
    for (size_t i = 0; i < n; ++i) append(values[i]);
  }
  Array(const Array& other) noexcept : rep_(other.rep_) {
    if (rep_) rep_->refs.fetch_add(1, std::memory_order_relaxed);
  }
  Array(Array&& other) noexcept : rep_(other.rep_) { other.rep_ = nullptr; }
  Array& operator=(const Array& other) noexcept {
    if (other.rep_) other.rep_->refs.fetch_add(1, std::memory_order_relaxed);
    release();
    rep_ = other.rep_;
    return *this;
  }
  Array& operator=(Array&& other) noexcept {
    if (this != &other) {
      release();
      rep_ = other.rep_;
      other.rep_ = nullptr;
    }
    return *this;
  }
  ~Array() { release(); }

  size_t size() const noexcept { return rep_ ? rep_->size : 0; }
  bool empty() const noexcept { return size() == 0; }
  const T& operator[](size_t i) const noexcept { return elements()[i]; }
  const T* data() const noexcept { return rep_ ? elements() : nullptr; }
  const T* begin() const noexcept { return data(); }
  const T* end() const noexcept { return data() + size(); }

  void append(const T& value) {
    T copy_of_value(value);  // value may live inside this array
    detach(size() + 1);
    Array_Element<T>::copy(elements() + rep_->size, copy_of_value);
    ++rep_->size;
  }
  void set(size_t i, const T& value) {
    T copy_of_value(value);
    detach(size());
    Array_Element<T>::destroy(elements() + i);
    Array_Element<T>::copy(elements() + i, copy_of_value);
  }
  void remove(size_t i) {
    detach(size());
    T* e = elements();
    Array_Element<T>::destroy(e + i);
    for (size_t k = i; k + 1 < rep_->size; ++k) {
      Array_Element<T>::copy(e + k, e[k + 1]);
      Array_Element<T>::destroy(e + k + 1);
    }
    --rep_->size;
  }
  void clear() noexcept { release(); }
  void reserve(uint32_t n) {
    if (n) detach(n);
  }

  // A new, unshared array with copies of the elements.
  Array deep_copy() const {
    Array result;
    result.reserve(static_cast<uint32_t>(size()));
    for (size_t i = 0; i < size(); ++i) result.append((*this)[i]);
    return result;
  }

  friend bool operator==(const Array& a, const Array& b) {
    if (a.size() != b.size()) return false;
    for (size_t i = 0; i < a.size(); ++i)
      if (!(a[i] == b[i])) return false;
    return true;
  }

 private:
  struct Rep {
    std::atomic<uint32_t> refs;
    uint32_t size;
    uint32_t capacity;
  };
  static constexpr size_t kHeader = (sizeof(Rep) + alignof(T) + 7) / 8 * 8;
  static constexpr size_t kMinCapacity = 4;

  T* elements() const noexcept {
    return reinterpret_cast<T*>(reinterpret_cast<char*>(rep_) + kHeader);
  }

  // Makes this array the sole owner of a representation with room for at
  // least `min_capacity` elements.
  void detach(size_t min_capacity) {
    if (rep_ && rep_->refs.load(std::memory_order_acquire) == 1 && rep_->capacity >= min_capacity) return;
    size_t capacity = rep_ ? rep_->capacity : 0;
    if (capacity < min_capacity) {
      size_t doubled = capacity * 2;
      capacity = min_capacity > doubled ? min_capacity : doubled;
    }
    if (capacity < kMinCapacity) capacity = kMinCapacity;
    void* mem = std::malloc(kHeader + sizeof(T) * capacity);
    if (mem == nullptr) throw std::bad_alloc();
    Rep* fresh = new (mem) Rep;
    fresh->refs.store(1, std::memory_order_relaxed);
    fresh->size = 0;
    fresh->capacity = static_cast<uint32_t>(capacity);
    T* dst = reinterpret_cast<T*>(static_cast<char*>(mem) + kHeader);
    if (rep_) {
      for (uint32_t i = 0; i < rep_->size; ++i) Array_Element<T>::copy(dst + i, elements()[i]);
      fresh->size = rep_->size;
    }
    release();
    rep_ = fresh;
  }

  void release() noexcept {
    if (rep_ && rep_->refs.fetch_sub(1, std::memory_order_acq_rel) == 1) {
      for (uint32_t i = 0; i < rep_->size; ++i) Array_Element<T>::destroy(elements() + i);
      rep_->~Rep();
      std::free(rep_);
    }
    rep_ = nullptr;
  }

  Rep* rep_;
};

}  // namespace cimple

#include "framework/String.h"

#include <cstdlib>
#include <cctype>
#include <cstring>
#include <new>

namespace cimple {

struct String::Rep {
  std::atomic<uint32_t> refs;
  uint32_t size;
  char data[1];

  static Rep* make(const char* s, size_t n) {
    void* mem = std::malloc(offsetof(Rep, data) + n + 1);
    if (mem == nullptr) throw std::bad_alloc();
    Rep* rep = new (mem) Rep;
    rep->refs.store(1, std::memory_order_relaxed);
    rep->size = static_cast<uint32_t>(n);
    if (n) std::memcpy(rep->data, s, n);
    rep->data[n] = '\0';
    return rep;
  }
};

String::String(const char* s) : String(s, s ? std::strlen(s) : 0) {}

String::String(const char* s, size_t n) : rep_(n ? Rep::make(s, n) : nullptr) {}

String::String(const String& other) noexcept : rep_(other.rep_) {
  if (rep_) rep_->refs.fetch_add(1, std::memory_order_relaxed);
}

String& String::operator=(const String& other) noexcept {
  if (other.rep_) other.rep_->refs.fetch_add(1, std::memory_order_relaxed);
  release();
  rep_ = other.rep_;
  return *this;
}

String& String::operator=(String&& other) noexcept {
  if (this != &other) {
    release();
    rep_ = other.rep_;
    other.rep_ = nullptr;
  }
  return *this;
}

void String::release() noexcept {
  if (rep_ && rep_->refs.fetch_sub(1, std::memory_order_acq_rel) == 1) {
    rep_->~Rep();
    std::free(rep_);
  }
  rep_ = nullptr;
}

const char* String::c_str() const noexcept { return rep_ ? rep_->data : ""; }

size_t String::size() const noexcept { return rep_ ? rep_->size : 0; }

void String::append(std::string_view s) {
  if (s.empty()) return;
  std::string joined(view());
  joined.append(s);
  *this = String(joined);
}

bool String::equal_nocase(std::string_view other) const noexcept {
  return cimple::equal_nocase(view(), other);
}

bool equal_nocase(std::string_view a, std::string_view b) noexcept {
  if (a.size() != b.size()) return false;
  for (size_t i = 0; i < a.size(); ++i) {
    unsigned char x = static_cast<unsigned char>(a[i]);
    unsigned char y = static_cast<unsigned char>(b[i]);
    if (x != y && std::tolower(x) != std::tolower(y)) return false;
  }
  return true;
}

}  // namespace cimple

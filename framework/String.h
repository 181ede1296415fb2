// cimple::String: the reference-counted, shared character string stored in
// instance slots.  An 8-byte handle; the all-zero handle is the empty string,
// so zeroed instance memory already holds valid empty strings.
#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace cimple {

class String {
 public:
  String() noexcept : rep_(nullptr) {}
  String(const char* s);  // NOLINT: implicit on purpose, like std::string
  String(const char* s, size_t n);
  String(std::string_view s) : String(s.data(), s.size()) {}
  String(const std::string& s) : String(s.data(), s.size()) {}
  String(const String& other) noexcept;
  String(String&& other) noexcept : rep_(other.rep_) { other.rep_ = nullptr; }
  String& operator=(const String& other) noexcept;
  String& operator=(String&& other) noexcept;
  ~String() { release(); }

  const char* c_str() const noexcept;
  size_t size() const noexcept;
  bool empty() const noexcept { return size() == 0; }
  std::string_view view() const noexcept { return {c_str(), size()}; }
  std::string str() const { return std::string(view()); }

  void clear() noexcept { release(); }
  // Starts loading the text into the cache, for a loop that reads it soon:
  // its first two lines, which hold most texts (names, identifiers).
  void prefetch() const noexcept {
    if (rep_ == nullptr) return;
    __builtin_prefetch(rep_);
    __builtin_prefetch(reinterpret_cast<const char*>(rep_) + 64);
  }
  void append(std::string_view s);

  friend bool operator==(const String& a, const String& b) noexcept { return a.view() == b.view(); }
  friend bool operator==(const String& a, const char* b) noexcept { return a.view() == std::string_view(b); }
  // Case-insensitive (ASCII) comparison, as CIM names compare.
  bool equal_nocase(std::string_view other) const noexcept;

 private:
  struct Rep;
  void release() noexcept;
  Rep* rep_;
};

static_assert(sizeof(String) == 8, "a String is an 8-byte handle");

// Case-insensitive ASCII equality of two names.
bool equal_nocase(std::string_view a, std::string_view b) noexcept;

}  // namespace cimple

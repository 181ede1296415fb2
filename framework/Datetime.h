// cimple::Datetime: a reference-counted CIM datetime (timestamp or interval)
// with its two 25-character text forms and strict parsing.  An 8-byte handle;
// the all-zero handle is the zero interval "00000000000000.000000:000".
#pragma once

#include <cstdint>
#include <string>

namespace cimple {

class Datetime {
 public:
  Datetime() noexcept : rep_(nullptr) {}
  Datetime(const Datetime& other) noexcept;
  Datetime(Datetime&& other) noexcept : rep_(other.rep_) { other.rep_ = nullptr; }
  Datetime& operator=(const Datetime& other) noexcept;
  Datetime& operator=(Datetime&& other) noexcept;
  ~Datetime() { release(); }

  // The current local time, with the local UTC offset.
  static Datetime now();
  // A timestamp of `usec` microseconds since the epoch, shown with the given
  // UTC offset in minutes.
  static Datetime timestamp(uint64_t usec, int32_t utc_offset_minutes);
  // An interval of `usec` microseconds.
  static Datetime interval(uint64_t usec);

  // Parses the 25-character CIM text.  On failure answers false and leaves
  // this value unchanged.
  bool set(const char* text);

  // The CIM text (25 characters); when `readable`, the form used in dumps and
  // log lines ("%04d/%02d/%02d %02d:%02d:%02d.%06d%c%03d" or
  // "%08u %02u %02u %02u.%06u:000").
  std::string ascii(bool readable = false) const;

  uint64_t usec() const noexcept;
  int32_t utc_offset() const noexcept;
  bool is_interval() const noexcept;
  bool is_timestamp() const noexcept { return !is_interval(); }

  friend bool operator==(const Datetime& a, const Datetime& b) noexcept {
    return a.usec() == b.usec() && a.utc_offset() == b.utc_offset() &&
           a.is_interval() == b.is_interval();
  }

 private:
  struct Rep;
  Datetime(uint64_t usec, int32_t offset, bool interval);
  void release() noexcept;
  Rep* rep_;
};

static_assert(sizeof(Datetime) == 8, "a Datetime is an 8-byte handle");

}  // namespace cimple

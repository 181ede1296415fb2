#include "framework/Datetime.h"

#include <sys/time.h>

#include <atomic>
#include <cstdio>
#include <cstring>
#include <ctime>

namespace cimple {

struct Datetime::Rep {
  std::atomic<uint32_t> refs{1};
  uint64_t usec;
  int32_t utc_offset;
  bool interval;
};

namespace {

constexpr uint64_t kUsecPerSec = 1000000ull;
constexpr size_t kTextLength = 25;

// Reads `n` decimal digits at `s`; false if any is not a digit.
bool digits(const char* s, int n, uint32_t* out) {
  uint32_t v = 0;
  for (int i = 0; i < n; ++i) {
    if (s[i] < '0' || s[i] > '9') return false;
    v = v * 10 + static_cast<uint32_t>(s[i] - '0');
  }
  *out = v;
  return true;
}

}  // namespace

Datetime::Datetime(uint64_t usec, int32_t offset, bool interval) : rep_(new Rep) {
  rep_->usec = usec;
  rep_->utc_offset = offset;
  rep_->interval = interval;
}

Datetime::Datetime(const Datetime& other) noexcept : rep_(other.rep_) {
  if (rep_) rep_->refs.fetch_add(1, std::memory_order_relaxed);
}

Datetime& Datetime::operator=(const Datetime& other) noexcept {
  if (other.rep_) other.rep_->refs.fetch_add(1, std::memory_order_relaxed);
  release();
  rep_ = other.rep_;
  return *this;
}

Datetime& Datetime::operator=(Datetime&& other) noexcept {
  if (this != &other) {
    release();
    rep_ = other.rep_;
    other.rep_ = nullptr;
  }
  return *this;
}

void Datetime::release() noexcept {
  if (rep_ && rep_->refs.fetch_sub(1, std::memory_order_acq_rel) == 1) delete rep_;
  rep_ = nullptr;
}

Datetime Datetime::now() {
  struct timeval tv;
  gettimeofday(&tv, nullptr);
  struct tm local;
  time_t secs = tv.tv_sec;
  localtime_r(&secs, &local);
  uint64_t usec = static_cast<uint64_t>(tv.tv_sec) * kUsecPerSec + static_cast<uint64_t>(tv.tv_usec);
  return Datetime(usec, static_cast<int32_t>(local.tm_gmtoff / 60), false);
}

Datetime Datetime::timestamp(uint64_t usec, int32_t utc_offset_minutes) {
  return Datetime(usec, utc_offset_minutes, false);
}

Datetime Datetime::interval(uint64_t usec) { return Datetime(usec, 0, true); }

uint64_t Datetime::usec() const noexcept { return rep_ ? rep_->usec : 0; }
int32_t Datetime::utc_offset() const noexcept { return rep_ ? rep_->utc_offset : 0; }
bool Datetime::is_interval() const noexcept { return rep_ ? rep_->interval : true; }

bool Datetime::set(const char* text) {
  if (text == nullptr || std::strlen(text) != kTextLength || text[14] != '.') return false;
  uint32_t usec;
  if (!digits(text + 15, 6, &usec)) return false;

  if (text[21] == ':') {
    uint32_t days, hours, minutes, seconds;
    if (!digits(text, 8, &days) || !digits(text + 8, 2, &hours) ||
        !digits(text + 10, 2, &minutes) || !digits(text + 12, 2, &seconds) ||
        std::strncmp(text + 22, "000", 3) != 0)
      return false;
    if (hours > 23 || minutes > 59 || seconds > 59) return false;
    uint64_t total = ((uint64_t{days} * 24 + hours) * 60 + minutes) * 60 + seconds;
    *this = Datetime(total * kUsecPerSec + usec, 0, true);
    return true;
  }

  if (text[21] != '+' && text[21] != '-') return false;
  uint32_t year, month, day, hour, minute, second, offset;
  if (!digits(text, 4, &year) || !digits(text + 4, 2, &month) || !digits(text + 6, 2, &day) ||
      !digits(text + 8, 2, &hour) || !digits(text + 10, 2, &minute) ||
      !digits(text + 12, 2, &second) || !digits(text + 22, 3, &offset))
    return false;
  if (month < 1 || month > 12 || day < 1 || day > 31 || hour > 23 || minute > 59 || second > 60)
    return false;
  struct tm local = {};
  local.tm_year = static_cast<int>(year) - 1900;
  local.tm_mon = static_cast<int>(month) - 1;
  local.tm_mday = static_cast<int>(day);
  local.tm_hour = static_cast<int>(hour);
  local.tm_min = static_cast<int>(minute);
  local.tm_sec = static_cast<int>(second);
  local.tm_isdst = -1;
  time_t secs = mktime(&local);
  // Times before the epoch cannot be held in the unsigned microsecond count.
  if (secs < 0) secs = 0;
  int32_t signed_offset = text[21] == '-' ? -static_cast<int32_t>(offset) : static_cast<int32_t>(offset);
  *this = Datetime(static_cast<uint64_t>(secs) * kUsecPerSec + usec, signed_offset, false);
  return true;
}

std::string Datetime::ascii(bool readable) const {
  char buf[64];
  const uint64_t total = usec();
  const unsigned micro = static_cast<unsigned>(total % kUsecPerSec);
  if (is_interval()) {
    uint64_t secs = total / kUsecPerSec;
    unsigned seconds = static_cast<unsigned>(secs % 60);
    unsigned minutes = static_cast<unsigned>((secs / 60) % 60);
    unsigned hours = static_cast<unsigned>((secs / 3600) % 24);
    // Eight digits of days: larger intervals are clamped rather than widened.
    uint64_t days64 = secs / 86400;
    unsigned days = static_cast<unsigned>(days64 > 99999999 ? 99999999 : days64);
    std::snprintf(buf, sizeof buf, readable ? "%08u %02u %02u %02u.%06u:000" : "%08u%02u%02u%02u.%06u:000",
                  days, hours, minutes, seconds, micro);
    return buf;
  }
  time_t secs = static_cast<time_t>(total / kUsecPerSec);
  struct tm local;
  localtime_r(&secs, &local);
  int32_t offset = utc_offset();
  char sign = offset >= 0 ? '+' : '-';
  int magnitude = offset >= 0 ? offset : -offset;
  if (magnitude > 999) magnitude = 999;
  std::snprintf(buf, sizeof buf,
                readable ? "%04d/%02d/%02d %02d:%02d:%02d.%06d%c%03d" : "%04d%02d%02d%02d%02d%02d.%06d%c%03d",
                (local.tm_year + 1900) % 10000, local.tm_mon + 1, local.tm_mday, local.tm_hour, local.tm_min,
                local.tm_sec, static_cast<int>(micro), sign, magnitude);
  return buf;
}

}  // namespace cimple

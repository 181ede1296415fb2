#include "agent/NrvConfigFile.h"

#include <sys/stat.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>

#include "logging/NRV_SystemPaths.h"
#include "logging/Log.h"

namespace cimple {

namespace {

struct FileCloser {
  void operator()(std::FILE* f) const { std::fclose(f); }
};
using File = std::unique_ptr<std::FILE, FileCloser>;

constexpr int kMaxLines = 1000;
constexpr size_t kLineBuffer = 1024;        // 1023 characters and the NUL
constexpr size_t kWebLaunchBuffer = 257;    // 255 characters, the line feed, the NUL
constexpr size_t kWebLaunchMaxLine = 255;

constexpr const char* kCacheTimeoutKey = "NRV_PROVIDER_CACHE_TIMEOUT";
constexpr const char* kRefreshAdapterKey = "NRV_PROVIDER_REFRESH_ADAPTERDATA";
constexpr const char* kRefreshSANKey = "NRV_PROVIDER_REFRESH_SANDATA";

enum Key_Bit : unsigned { kCacheTimeoutBit = 1, kRefreshAdapterBit = 2, kRefreshSANBit = 4 };

bool is_blank(char c) { return c == ' ' || c == '\t' || c == '\n' || c == '\r' || c == '\v' || c == '\f'; }

std::string trim(const std::string& text) {
  size_t begin = 0, end = text.size();
  while (begin < end && is_blank(text[begin])) ++begin;
  while (end > begin && is_blank(text[end - 1])) --end;
  return text.substr(begin, end - begin);
}

// "TRUE" -> 1, "FALSE" -> 0, anything else -1 (case matters).
int parse_flag(const std::string& value) {
  if (value == "TRUE") return 1;
  if (value == "FALSE") return 0;
  return -1;
}

// Leading decimal digits as a number; no digits give 0.  A value too large
// for 32 bits is reported as out of range rather than wrapped.
int64_t parse_decimal(const std::string& value) {
  errno = 0;
  long long n = std::strtoll(value.c_str(), nullptr, 10);
  if (errno == ERANGE) return -1;
  return n;
}

const char* flag_text(bool value) { return value ? "TRUE" : "FALSE"; }

}  // namespace

NrvConfigFile::~NrvConfigFile() { write(); }

void NrvConfigFile::read(const std::string& path) {
  std::lock_guard<std::recursive_mutex> lock(m_Mutex);
  m_Path = path;
  struct stat st;
  if (::stat(path.c_str(), &st) != 0) return;  // no file: the defaults stand
  File file(std::fopen(path.c_str(), "r"));
  if (!file) {
    NRV_LOG(NRV_ERR, "Unable to open provider config setting file - %s", path.c_str());
    return;
  }
  unsigned taken = 0;
  char buffer[kLineBuffer];
  for (int n = 0; n < kMaxLines && std::fgets(buffer, sizeof buffer, file.get()) != nullptr; ++n)
    applyLine(trim(buffer), taken);
}

void NrvConfigFile::applyLine(const std::string& line, unsigned& taken) {
  if (line.empty() || line[0] == '#') return;
  const size_t eq = line.find('=');
  if (eq == std::string::npos) return;
  const std::string key = trim(line.substr(0, eq));
  const std::string value = trim(line.substr(eq + 1));

  if (key == kCacheTimeoutKey) {
    if (taken & kCacheTimeoutBit) return;
    const int64_t minutes = parse_decimal(value);
    if (minutes >= kNrvMinCacheTimeout && minutes <= kNrvMaxCacheTimeout) {
      m_CacheTimeout = static_cast<int32_t>(minutes);
      taken |= kCacheTimeoutBit;
    }
    return;
  }
  const bool adapter = key == kRefreshAdapterKey;
  if (!adapter && key != kRefreshSANKey) return;
  const unsigned bit = adapter ? kRefreshAdapterBit : kRefreshSANBit;
  const int flag = parse_flag(value);
  if ((taken & bit) || flag < 0) return;
  (adapter ? m_bRefreshAdapterData : m_bRefreshSANData) = flag == 1;
  taken |= bit;
}

void NrvConfigFile::write() {
  std::lock_guard<std::recursive_mutex> lock(m_Mutex);
  if (m_Path.empty()) return;
  File file(std::fopen(m_Path.c_str(), "w"));
  if (!file) return;
  const char* rule = "##################################################";
  std::fprintf(file.get(), "%s\n# Norvane HBA CIM Provider Configuration Settings #\n%s\n", rule, rule);
  std::fprintf(file.get(), "%s = %d\n", kCacheTimeoutKey, m_CacheTimeout);
  std::fprintf(file.get(), "%s = %s\n", kRefreshAdapterKey, flag_text(m_bRefreshAdapterData));
  std::fprintf(file.get(), "%s = %s\n", kRefreshSANKey, flag_text(m_bRefreshSANData));
}

int NrvConfigFile::setCacheTimeout(int64_t minutes) {
  if (minutes < kNrvMinCacheTimeout || minutes > kNrvMaxCacheTimeout) return -1;
  std::lock_guard<std::recursive_mutex> lock(m_Mutex);
  m_CacheTimeout = static_cast<int32_t>(minutes);
  return 0;
}

int NrvConfigFile::setRefreshAdapterData(int64_t value) {
  if (value != 0 && value != 1) return -1;
  std::lock_guard<std::recursive_mutex> lock(m_Mutex);
  m_bRefreshAdapterData = value == 1;
  return 0;
}

int NrvConfigFile::setRefreshSANData(int64_t value) {
  if (value != 0 && value != 1) return -1;
  std::lock_guard<std::recursive_mutex> lock(m_Mutex);
  m_bRefreshSANData = value == 1;
  return 0;
}

int32_t NrvConfigFile::getCacheTimeout() const {
  std::lock_guard<std::recursive_mutex> lock(m_Mutex);
  return m_CacheTimeout;
}

bool NrvConfigFile::getRefreshAdapterData() const {
  std::lock_guard<std::recursive_mutex> lock(m_Mutex);
  return m_bRefreshAdapterData;
}

bool NrvConfigFile::getRefreshSANData() const {
  std::lock_guard<std::recursive_mutex> lock(m_Mutex);
  return m_bRefreshSANData;
}

NrvConfigFile::Settings NrvConfigFile::settings() const {
  std::lock_guard<std::recursive_mutex> lock(m_Mutex);
  return {m_CacheTimeout, m_bRefreshAdapterData, m_bRefreshSANData};
}

std::string NrvConfigFile::path() const {
  std::lock_guard<std::recursive_mutex> lock(m_Mutex);
  return m_Path;
}

std::string NrvConfigFile::readWebLaunchAddress() {
  const std::string path = system_path(kNrvWebLaunchFile);
  File file(std::fopen(path.c_str(), "r"));
  if (!file) {
    NRV_LOG(NRV_INFO, "WebLaunch config file '%s' not found.", path.c_str());
    return {};
  }
  char buffer[kWebLaunchBuffer];
  while (std::fgets(buffer, sizeof buffer, file.get()) != nullptr) {
    size_t length = std::strlen(buffer);
    const bool terminated = length > 0 && buffer[length - 1] == '\n';
    if (terminated) buffer[--length] = '\0';
    // A line that does not fit ends the reading with nothing found.
    if (length > kWebLaunchMaxLine || (!terminated && !std::feof(file.get()))) return {};
    const char* text = buffer;
    while (*text != '\0' && is_blank(*text)) ++text;
    if (*text == '\0' || *text == '#') continue;
    return text;
  }
  return {};
}

}  // namespace cimple

#include "agent/NrvConfigFile.h"

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <string_view>

#include "logging/NRV_FileRewrite.h"
#include "logging/NRV_RegularFile.h"
#include "logging/NRV_SystemPaths.h"
#include "logging/Log.h"

namespace cimple {

namespace {

// Far beyond any hand-written settings file, small enough to hold in memory.
constexpr size_t kConfigFileMax = 1 << 20;
constexpr size_t kWebLaunchFileMax = 64 << 10;
constexpr size_t kMaxLine = 1023;
constexpr size_t kWebLaunchMaxLine = 255;

constexpr const char* kCacheTimeoutKey = "NRV_PROVIDER_CACHE_TIMEOUT";
constexpr const char* kRefreshAdapterKey = "NRV_PROVIDER_REFRESH_ADAPTERDATA";
constexpr const char* kRefreshSANKey = "NRV_PROVIDER_REFRESH_SANDATA";

enum Key_Bit : unsigned { kCacheTimeoutBit = 1, kRefreshAdapterBit = 2, kRefreshSANBit = 4 };

bool is_blank(char c) { return c == ' ' || c == '\t' || c == '\n' || c == '\r' || c == '\v' || c == '\f'; }

std::string_view trim_front(std::string_view text) {
  while (!text.empty() && is_blank(text.front())) text.remove_prefix(1);
  return text;
}

std::string trim(std::string_view text) {
  text = trim_front(text);
  while (!text.empty() && is_blank(text.back())) text.remove_suffix(1);
  return std::string(text);
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
  // A FIFO or device here would stall the agent's construction, and with it
  // every provider load: only a regular file is read.
  const File_Text file = read_regular_file(path, kConfigFileMax);
  if (file.status == File_Status::Missing) return;  // no file: the defaults stand
  if (!file.ok()) {
    NRV_LOG(NRV_ERR, "Unable to open provider config setting file - %s", path.c_str());
    return;
  }
  unsigned taken = 0;
  for (std::string_view line : split_lines(file.text)) {
    // Read in pieces, the tail of a long comment would count as a setting:
    // a line longer than any setting line is skipped whole.
    if (line.size() > kMaxLine) continue;
    applyLine(trim(line), taken);
  }
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

std::string NrvConfigFile::text() const {
  std::lock_guard<std::recursive_mutex> lock(m_Mutex);
  const std::string rule(50, '#');
  std::string text = rule + "\n# Norvane HBA CIM Provider Configuration Settings #\n" + rule + "\n";
  text += std::string(kCacheTimeoutKey) + " = " + std::to_string(m_CacheTimeout) + "\n";
  text += std::string(kRefreshAdapterKey) + " = " + flag_text(m_bRefreshAdapterData) + "\n";
  text += std::string(kRefreshSANKey) + " = " + flag_text(m_bRefreshSANData) + "\n";
  return text;
}

bool NrvConfigFile::write() {
  std::lock_guard<std::recursive_mutex> lock(m_Mutex);
  if (m_Path.empty()) return true;
  const Rewrite_Result result = rewrite_file(m_Path, text());
  if (result.ok()) return true;
  NRV_LOG(NRV_ERR, "Unable to write provider config setting file - %s: %s", m_Path.c_str(),
          rewrite_failure_text(result).c_str());
  return false;
}

NrvConfigFile::Change NrvConfigFile::change(int (NrvConfigFile::*setter)(int64_t), int64_t value) {
  std::lock_guard<std::recursive_mutex> lock(m_Mutex);
  const Settings old = settings();
  if ((this->*setter)(value) != 0) return Change::OutOfRange;
  if (write()) return Change::Saved;
  m_CacheTimeout = old.cacheTimeout;
  m_bRefreshAdapterData = old.refreshAdapterData;
  m_bRefreshSANData = old.refreshSANData;
  return Change::NotSaved;
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
  const File_Text file = read_regular_file(path, kWebLaunchFileMax);
  if (file.status == File_Status::Missing) {
    NRV_LOG(NRV_INFO, "WebLaunch config file '%s' not found.", path.c_str());
    return {};
  }
  if (!file.ok()) {
    NRV_LOG(NRV_ERR, "Unable to read WebLaunch config file '%s': %s", path.c_str(),
            file_status_text(file.status, file.error).c_str());
    return {};
  }
  for (std::string_view line : split_lines(file.text)) {
    // A line that does not fit ends the reading with nothing found.
    if (line.size() > kWebLaunchMaxLine) return {};
    const std::string_view text = trim_front(line);
    if (text.empty() || text.front() == '#') continue;
    return std::string(text);
  }
  return {};
}

}  // namespace cimple

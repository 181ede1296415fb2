#include "logging/NRV_LogDataFile.h"

#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <optional>
#include <vector>

#include "logging/NRV_SystemPaths.h"
#include "logging/CLogger.h"

namespace cimple {

namespace {

struct FileCloser {
  void operator()(std::FILE* f) const { std::fclose(f); }
};
using File = std::unique_ptr<std::FILE, FileCloser>;

// Longest first line ("mode,level,enabled") and trace path that are read.
constexpr int kSettingsLineMax = 19;
constexpr int kTracePathMax = 255;

// The comma-separated fields of the first line, in order.  A negative value
// is always invalid; max < 0 means no upper bound.  A bounded field reports
// the offending value (as unsigned, so a negative one shows as huge).
struct SettingField {
  const char* name;
  long long max;
};
constexpr SettingField kSettingFields[] = {
    {"Mode", kNrvMaxLogMode}, {"Level", NRV_DBG}, {"Enabled", -1}};
constexpr size_t kSettingCount = sizeof kSettingFields / sizeof kSettingFields[0];

// The decimal value of one comma-separated field; nullopt when the field is
// absent or holds no number.
std::optional<long long> field_value(const std::vector<std::string>& fields, size_t i) {
  if (i >= fields.size()) return std::nullopt;
  const char* text = fields[i].c_str();
  char* end = nullptr;
  errno = 0;
  long long value = std::strtoll(text, &end, 10);
  if (end == text || errno == ERANGE) return std::nullopt;
  return value;
}

std::vector<std::string> split_commas(const std::string& line) {
  std::vector<std::string> fields;
  size_t start = 0;
  for (;;) {
    size_t comma = line.find(',', start);
    fields.push_back(line.substr(start, comma - start));
    if (comma == std::string::npos) return fields;
    start = comma + 1;
  }
}

// Removes the last occurrence of `c`, if any.
void erase_last(std::string& text, char c) {
  size_t at = text.rfind(c);
  if (at != std::string::npos) text.erase(at, 1);
}

// Discards the rest of a line that did not fit the buffer, so the next read
// starts on the following line.
void skip_rest_of_line(std::FILE* f, const char* read) {
  size_t n = std::strlen(read);
  if (n > 0 && read[n - 1] == '\n') return;
  int c;
  while ((c = std::fgetc(f)) != EOF && c != '\n') {
  }
}

}  // namespace

std::string nrv_fault_data_file() { return system_path(kNrvFaultDataFile); }

NRV_LogDataFile::NRV_LogDataFile(CLogger& logger) : m_Logger(logger) {}

void NRV_LogDataFile::setReadOnlyRootProbe(ReadOnlyRootProbe probe) {
  std::lock_guard<std::mutex> lock(m_Mutex);
  m_ReadOnlyRoot = std::move(probe);
  m_bDumpPathKnown = false;
}

std::string NRV_LogDataFile::computePath() {
  const bool read_only = m_ReadOnlyRoot && m_ReadOnlyRoot();
  m_DumpPath = system_path(read_only ? kNrvReadOnlyRootDumpFile : kNrvDumpFile);
  m_bDumpPathKnown = true;
  return m_DumpPath;
}

std::string NRV_LogDataFile::pathLocked() {
  return m_bDumpPathKnown ? m_DumpPath : computePath();
}

std::string NRV_LogDataFile::path() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  return pathLocked();
}

void NRV_LogDataFile::write() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  File f(std::fopen(pathLocked().c_str(), "w"));
  if (!f) {
    NRV_LOG_TO(m_Logger, NRV_ERR, "Unable to open dump file\n");
    return;
  }
  std::fprintf(f.get(), "%d,%d,%d\n", m_Logger.getMode(), m_Logger.getLevel(),
               m_Logger.isEnabled() ? 1 : 0);
  std::fputs(m_Logger.tracePath().c_str(), f.get());
}

bool NRV_LogDataFile::checkAccessLocked() {
  if (::access(pathLocked().c_str(), R_OK) == 0) return true;
  const int error = errno;
  NRV_LOG_TO(m_Logger, NRV_CRIT, "File access failed with %s", std::strerror(error));
  return false;
}

bool NRV_LogDataFile::checkAccess() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  return checkAccessLocked();
}

// Nothing is applied until every value has been read and checked, so a bad
// file leaves the previous settings in force.
void NRV_LogDataFile::read() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  if (!checkAccessLocked()) computePath();
  const std::string path = m_DumpPath;
  File f(std::fopen(path.c_str(), "r"));
  if (!f) {
    NRV_LOG_TO(m_Logger, NRV_ERR, "Unable to open config data file - %s", path.c_str());
    return;
  }

  char line[kTracePathMax + 1];
  if (std::fgets(line, kSettingsLineMax + 1, f.get()) == nullptr) return;
  skip_rest_of_line(f.get(), line);
  const std::vector<std::string> fields = split_commas(line);

  long long values[kSettingCount];
  for (size_t i = 0; i < kSettingCount; ++i) {
    const SettingField& field = kSettingFields[i];
    const std::optional<long long> value = field_value(fields, i);
    if (!value) {
      NRV_LOG_TO(m_Logger, NRV_ERR, "Unable to read Log %s from config data file - %s",
                 field.name, path.c_str());
      return;
    }
    if (*value < 0 || (field.max >= 0 && *value > field.max)) {
      if (field.max >= 0)
        NRV_LOG_TO(m_Logger, NRV_ERR, "Invalid value for Log %s from config data file -%s-%u",
                   field.name, path.c_str(), static_cast<unsigned>(*value));
      else
        NRV_LOG_TO(m_Logger, NRV_ERR, "Invalid value for Log %s from config data file - %s",
                   field.name, path.c_str());
      return;
    }
    values[i] = *value;
  }
  const long long mode = values[0], level = values[1], enabled = values[2];

  const auto log_mode = static_cast<int32_t>(mode);
  if (nrv_mode_writes_file(log_mode)) {
    if (std::fgets(line, kTracePathMax + 1, f.get()) == nullptr) return;
    std::string trace_path = line;
    erase_last(trace_path, '\r');
    erase_last(trace_path, '\n');
    if (m_Logger.setTracePath(trace_path) != 0) return;
  }

  m_Logger.setEnabledValue(enabled > 0 ? 1 : 0);
  if (level > 0 && level != m_Logger.getLevel()) m_Logger.setLevel(static_cast<int32_t>(level));
  m_Logger.setMode(log_mode);
}

bool NRV_LogDataFile::applyDefaultIfMissing() {
  if (checkAccess()) {
    NRV_LOG_TO(m_Logger, NRV_CRIT, " Continuing logs in Norvane log provider. ");
    return false;
  }
  const std::string fault_file = nrv_fault_data_file();
  NRV_LOG_TO(m_Logger, NRV_CRIT, " Please see the default log: %s", fault_file.c_str());
  m_Logger.setErrorsOnly();
  m_Logger.enable();
  m_Logger.setModeQuietly(NRV_MODE_FILE);
  if (m_Logger.setTracePath(fault_file) != 0)
    NRV_LOG_TO(m_Logger, NRV_ERR, "validateAndSetPath() failed");
  return true;
}

}  // namespace cimple

#include "logging/NRV_LogDataFile.h"

#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <optional>
#include <string_view>
#include <vector>

#include "logging/NRV_FileRewrite.h"
#include "logging/NRV_RegularFile.h"
#include "logging/NRV_SystemPaths.h"
#include "logging/CLogger.h"

namespace cimple {

namespace {

// Longest first line ("mode,level,enabled") that is read; more of it is
// ignored.  Anything larger than a few lines is not this file.
constexpr size_t kSettingsLineMax = 19;
constexpr size_t kDataFileMax = 4096;

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

std::vector<std::string> split_commas(std::string_view line) {
  std::vector<std::string> fields;
  for (;;) {
    const size_t comma = line.find(',');
    fields.emplace_back(line.substr(0, comma));
    if (comma == std::string_view::npos) return fields;
    line.remove_prefix(comma + 1);
  }
}

// Removes the last occurrence of `c`, if any.
void erase_last(std::string& text, char c) {
  size_t at = text.rfind(c);
  if (at != std::string::npos) text.erase(at, 1);
}

}  // namespace

std::string nrv_fault_data_file() { return system_path(kNrvFaultDataFile); }

NRV_LogDataFile::NRV_LogDataFile(CLogger& logger) : m_Logger(logger) {}

void NRV_LogDataFile::setReadOnlyRootProbe(ReadOnlyRootProbe probe) {
  std::lock_guard<std::mutex> lock(m_Mutex);
  m_ReadOnlyRoot = std::move(probe);
  m_bDumpPathKnown = false;
}

void NRV_LogDataFile::release() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  m_ReadOnlyRoot = nullptr;
  std::string().swap(m_DumpPath);
  m_bDumpPathKnown = false;
  m_bRejected = false;
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

bool NRV_LogDataFile::write() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  return writeLocked();
}

bool NRV_LogDataFile::writeLocked() {
  const std::string content = std::to_string(m_Logger.getMode()) + "," + std::to_string(m_Logger.getLevel()) +
                              "," + (m_Logger.isEnabled() ? "1" : "0") + "\n" + m_Logger.tracePath();
  if (!rewrite_file(pathLocked(), content).ok()) {
    NRV_LOG_TO(m_Logger, NRV_ERR, "Unable to open dump file\n");
    return false;
  }
  m_bRejected = false;  // the file now holds what this module wrote
  return true;
}

bool NRV_LogDataFile::writeUnlessRejected() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  return m_bRejected || writeLocked();
}

bool NRV_LogDataFile::rejected() {
  std::lock_guard<std::mutex> lock(m_Mutex);
  return m_bRejected;
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
  m_bRejected = !readLocked();
}

bool NRV_LogDataFile::readLocked() {
  if (!checkAccessLocked()) computePath();
  const std::string path = m_DumpPath;
  // A FIFO or a device here must not stall the provider load: only a
  // regular file of a few lines is read.
  const File_Text file = read_regular_file(path, kDataFileMax);
  if (!file.ok()) {
    NRV_LOG_TO(m_Logger, NRV_ERR, "Unable to open config data file - %s", path.c_str());
    return file.status == File_Status::Missing;
  }

  const std::vector<std::string_view> lines = split_lines(file.text);
  if (lines.empty()) return true;  // an empty file holds nothing to keep
  const std::vector<std::string> fields = split_commas(lines[0].substr(0, kSettingsLineMax));

  long long values[kSettingCount];
  for (size_t i = 0; i < kSettingCount; ++i) {
    const SettingField& field = kSettingFields[i];
    const std::optional<long long> value = field_value(fields, i);
    if (!value) {
      NRV_LOG_TO(m_Logger, NRV_ERR, "Unable to read Log %s from config data file - %s",
                 field.name, path.c_str());
      return false;
    }
    if (*value < 0 || (field.max >= 0 && *value > field.max)) {
      if (field.max >= 0)
        NRV_LOG_TO(m_Logger, NRV_ERR, "Invalid value for Log %s from config data file -%s-%u",
                   field.name, path.c_str(), static_cast<unsigned>(*value));
      else
        NRV_LOG_TO(m_Logger, NRV_ERR, "Invalid value for Log %s from config data file - %s",
                   field.name, path.c_str());
      return false;
    }
    values[i] = *value;
  }
  const long long mode = values[0], level = values[1], enabled = values[2];

  const auto log_mode = static_cast<int32_t>(mode);
  if (nrv_mode_writes_file(log_mode)) {
    if (lines.size() < 2) return false;
    std::string trace_path(lines[1]);
    erase_last(trace_path, '\r');
    // A cut path would name some other file: a path that does not fit is refused.
    if (trace_path.size() > kNrvTracePathMax) {
      NRV_LOG_TO(m_Logger, NRV_ERR, "Trace path too long in config data file - %s", path.c_str());
      return false;
    }
    if (m_Logger.setTracePath(trace_path) != 0) return false;
  }

  m_Logger.setEnabledValue(enabled > 0 ? 1 : 0);
  if (level > 0 && level != m_Logger.getLevel()) m_Logger.setLevel(static_cast<int32_t>(level));
  m_Logger.setMode(log_mode);
  return true;
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

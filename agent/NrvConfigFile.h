// NrvConfigFile: the three cache settings of the provider (cache timeout,
// adapter refresh, SAN refresh), read once from the provider configuration
// file when the agent starts, saved whenever one is changed and again when
// the agent ends; plus the reader of the one-line WebLaunch file.
//
// Contract: every operation is safe from any thread (one recursive mutex
// guards the settings).  Reading never fails to the caller: a missing,
// unreadable, non-regular or garbled file leaves the defaults or the values
// read so far (logged unless the file is missing).  Writing replaces the file
// whole or not at all, skips a file that already holds the settings, and
// logs and answers false when it cannot (a missing directory included).
// The destructor writes the file back to the path last given to read().
#pragma once

#include <cstdint>
#include <mutex>
#include <string>

namespace cimple {

inline constexpr const char* kNrvConfigFile = "/etc/norvane_tavo_provider.conf";
inline constexpr const char* kNrvWebLaunchFile = "/etc/nrv_smis.conf";

inline constexpr int32_t kNrvDefaultCacheTimeout = 10;  // minutes
inline constexpr int32_t kNrvMinCacheTimeout = 1;
inline constexpr int32_t kNrvMaxCacheTimeout = 30;

class NrvConfigFile {
 public:
  // The three settings taken together under the mutex.
  struct Settings {
    int32_t cacheTimeout;
    bool refreshAdapterData;
    bool refreshSANData;
  };

  NrvConfigFile() = default;
  NrvConfigFile(const NrvConfigFile&) = delete;
  NrvConfigFile& operator=(const NrvConfigFile&) = delete;
  ~NrvConfigFile();

  // Stores `path` (already relocated) and applies the settings it holds.
  void read(const std::string& path);
  // Rewrites the file at the stored path from the current settings; false
  // (logged) when it could not be written.  True when no path was read.
  bool write();
  // The file's content for the current settings (six lines).
  std::string text() const;

  // Sets one setting with `setter` (one of the three below) and saves the
  // file at once, so the change survives however the agent ends.  When the
  // file cannot be written the old value is put back.
  enum class Change { Saved, OutOfRange, NotSaved };
  Change change(int (NrvConfigFile::*setter)(int64_t), int64_t value);

  // Each answers 0, or -1 and changes nothing when the value is out of range
  // (timeout 1..30 minutes, refresh flags 0 or 1).
  int setCacheTimeout(int64_t minutes);
  int setRefreshAdapterData(int64_t value);
  int setRefreshSANData(int64_t value);

  int32_t getCacheTimeout() const;
  bool getRefreshAdapterData() const;
  bool getRefreshSANData() const;
  Settings settings() const;
  std::string path() const;

  // The WebLaunch address: the first line of the WebLaunch file that is not
  // blank or a comment, leading white space removed; empty when there is none.
  static std::string readWebLaunchAddress();

 private:
  // Applies one "KEY = value" line; `taken` remembers which keys were set.
  void applyLine(const std::string& line, unsigned& taken);

  mutable std::recursive_mutex m_Mutex;
  bool m_bRefreshAdapterData = false;
  bool m_bRefreshSANData = true;
  int32_t m_CacheTimeout = kNrvDefaultCacheTimeout;
  std::string m_Path;
};

}  // namespace cimple

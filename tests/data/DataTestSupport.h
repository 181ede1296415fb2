// Helpers of the data set tests: what a site file says the data set must hold,
// a sink that captures log messages, site copies with faults, and running one
// test of this executable in a child process against another site or library
// directory (the simulator reads its site, and the dynamic loader its search
// path, once per process).
#pragma once

#include <stdint.h>

#include <mutex>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

#include "logging/NRV_LoggerInterface.h"

namespace nrv_data_test {

// ---- Expectations read from a site file -------------------------------------
struct Lun {
  std::string targetWwpn, targetWwnn;  // 16 upper-case hex digits
  uint32_t lun = 0;
  uint32_t type = 0;
  std::string vendor, product, revision, serial;
  uint64_t blocks = 0;
  uint32_t blockSize = 512;
};

struct Function {
  std::string kind;  // "nic", "iscsi", "fcoe"
  std::string model, serial, manufacturer;
  uint32_t pciFunction = 0;
  uint32_t index = 0;      // position in the library's enumeration
  std::string identifier;  // 16 upper-case hex digits
  std::string mac;         // as the site writes it
  std::string wwnn;        // FCoE: 16 upper-case hex digits
  std::string ifname, ipv4;
  std::string driverName, driverVersion;
  std::string initiatorName;
  std::vector<Lun> luns;
};

// Functions in the order the management library enumerates them.
std::vector<Function> functionsOf(const nlohmann::json& site);
nlohmann::json readSite(const std::string& path);
// The site the test environment names ($NRV_SITE).
std::string environmentSite();
// "10:00:00:90:fa:5c:2e:12" -> "10000090FA5C2E12".
std::string plainHex(const std::string& text);
// A field padded with blanks, without them.
std::string trimmed(const std::string& text);

// Writes `site` to a fresh temporary file and returns its path.
std::string writeSite(const nlohmann::json& site);
// Appends one fault rule to the site.
void addFault(nlohmann::json& site, nlohmann::json rule);

// Runs the (disabled) test `test` of this executable in a child process with
// NRV_SITE = `site` and, unless empty, LD_LIBRARY_PATH = `libraryPath`.
// Returns the child's exit status (0 = passed), -1 when it could not run.
int runInChild(const std::string& test, const std::string& site, const std::string& libraryPath);
// A simulator library directory below the build tree ("sim-nosym-HBA_...").
std::string simulatorDir(const std::string& name);

// ---- Log capture ----------------------------------------------------------------
// Registers itself with the process logger, and enables logging, for its lifetime.
class LogCapture : public cimple::NRV_LoggerInterface {
 public:
  LogCapture();
  ~LogCapture() override;

  void log(int level, const char* file, unsigned line, const char* message) override;
  void start() override {}
  void stop() override {}
  void clear() override {}

  // Messages equal to `text` (at `level` unless -1).
  int count(const std::string& text, int level = -1) const;
  // Messages beginning with `prefix`.
  int countPrefix(const std::string& prefix, int level = -1) const;
  // Source file name recorded with the first message equal to `text`.
  std::string fileOf(const std::string& text) const;

 private:
  struct Entry {
    int level;
    std::string file;
    std::string message;
  };
  mutable std::mutex m_Mutex;
  std::vector<Entry> m_Entries;
};

}  // namespace nrv_data_test

// Helpers shared by the logger tests: a private system root so the module's
// fixed files land in a scratch directory, and a sink that remembers what it
// was given.
#pragma once

#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <mutex>
#include <sstream>
#include <string>
#include <vector>

#include "logging/NRV_LoggerInterface.h"

namespace cimple::test {

// Points NRV_SYSROOT at a fresh directory (below the one the test environment
// provides, else below /tmp) holding etc, var/log and the fault-data folder;
// restores the variable and removes the directory afterwards.
class ScopedSysroot {
 public:
  ScopedSysroot() {
    const char* outer = std::getenv("NRV_SYSROOT");
    if (outer != nullptr && *outer != '\0') m_Saved = outer;
    std::filesystem::path base =
        m_Saved.empty() ? std::filesystem::temp_directory_path() : std::filesystem::path(m_Saved);
    std::filesystem::create_directories(base);
    std::string pattern = (base / "logging-XXXXXX").string();
    char* made = ::mkdtemp(pattern.data());
    m_Root = made != nullptr ? std::string(made) : pattern;
    for (const char* dir : {"etc", "var/log", "opt/kelvar/platform/log"})
      std::filesystem::create_directories(m_Root / dir);
    ::setenv("NRV_SYSROOT", m_Root.c_str(), 1);
  }
  ScopedSysroot(const ScopedSysroot&) = delete;
  ScopedSysroot& operator=(const ScopedSysroot&) = delete;
  ~ScopedSysroot() {
    if (m_Saved.empty())
      ::unsetenv("NRV_SYSROOT");
    else
      ::setenv("NRV_SYSROOT", m_Saved.c_str(), 1);
    std::error_code ignored;
    std::filesystem::remove_all(m_Root, ignored);
  }

  // `fixed` ("/etc/x") below this root.
  std::string under(const std::string& fixed) const { return m_Root.string() + fixed; }
  const std::filesystem::path& root() const { return m_Root; }

 private:
  std::string m_Saved;
  std::filesystem::path m_Root;
};

inline std::string read_text(const std::string& path) {
  std::ifstream in(path, std::ios::binary);
  std::ostringstream text;
  text << in.rdbuf();
  return text.str();
}

inline void write_text(const std::string& path, const std::string& text) {
  std::ofstream(path, std::ios::binary | std::ios::trunc) << text;
}

inline std::vector<std::string> split_lines(const std::string& text) {
  std::vector<std::string> lines;
  std::istringstream in(text);
  for (std::string line; std::getline(in, line);) lines.push_back(line);
  return lines;
}

// Remembers every message and counts the mode and clear notifications.
class CapturingSink : public NRV_LoggerInterface {
 public:
  struct Entry {
    int level;
    std::string file;
    unsigned line;
    std::string message;
  };

  void log(int level, const char* file, unsigned line, const char* message) override {
    std::lock_guard<std::mutex> lock(m_Mutex);
    m_Entries.push_back({level, file, line, message != nullptr ? message : ""});
  }
  void start() override { ++m_Starts; }
  void stop() override { ++m_Stops; }
  void clear() override { ++m_Clears; }

  std::vector<Entry> entries() const {
    std::lock_guard<std::mutex> lock(m_Mutex);
    return m_Entries;
  }
  std::vector<std::string> messages() const {
    std::vector<std::string> out;
    for (const Entry& e : entries()) out.push_back(e.message);
    return out;
  }
  int starts() const { return m_Starts; }
  int stops() const { return m_Stops; }
  int clears() const { return m_Clears; }

 private:
  mutable std::mutex m_Mutex;
  std::vector<Entry> m_Entries;
  int m_Starts = 0;
  int m_Stops = 0;
  int m_Clears = 0;
};

}  // namespace cimple::test

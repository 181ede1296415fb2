// What may stand at a settings file's path instead of a regular file (a FIFO,
// a device, a directory), made on demand, and a guard that ends a test
// process which hangs instead of letting the whole suite wait for ever.
#pragma once

#include <sys/stat.h>
#include <unistd.h>

#include <chrono>
#include <condition_variable>
#include <cstdio>
#include <filesystem>
#include <mutex>
#include <string>
#include <thread>

namespace nrv_test {

enum class Special_Kind { Fifo, Device, Directory };

struct Special_Case {
  const char* name;
  Special_Kind kind;
};

inline constexpr Special_Case kSpecialFiles[] = {
    {"FIFO", Special_Kind::Fifo},
    {"/dev/zero", Special_Kind::Device},  // through a symbolic link
    {"directory", Special_Kind::Directory},
};

// Replaces whatever is at `path` with the special file; true when made.
inline bool make_special(const std::string& path, Special_Kind kind) {
  std::error_code ignored;
  std::filesystem::remove_all(path, ignored);
  switch (kind) {
    case Special_Kind::Fifo:
      return ::mkfifo(path.c_str(), 0644) == 0;
    case Special_Kind::Device:
      return ::symlink("/dev/zero", path.c_str()) == 0;
    case Special_Kind::Directory:
      return ::mkdir(path.c_str(), 0755) == 0;
  }
  return false;
}

// The special file is still there, untouched by the code under test.
inline bool is_special(const std::string& path, Special_Kind kind) {
  struct stat st;
  if (::lstat(path.c_str(), &st) != 0) return false;
  switch (kind) {
    case Special_Kind::Fifo:
      return S_ISFIFO(st.st_mode);
    case Special_Kind::Device:
      return S_ISLNK(st.st_mode);
    case Special_Kind::Directory:
      return S_ISDIR(st.st_mode);
  }
  return false;
}

// Ends the process with status 1 and a message when it is still alive after
// `limit`: a call that blocks would otherwise hang the test run.
class Hang_Guard {
 public:
  explicit Hang_Guard(std::string what, std::chrono::seconds limit = std::chrono::seconds(20))
      : m_What(std::move(what)), m_Thread([this, limit] {
          std::unique_lock<std::mutex> lock(m_Mutex);
          if (!m_Cond.wait_for(lock, limit, [this] { return m_Done; })) {
            std::fprintf(stderr, "HANG: %s did not return\n", m_What.c_str());
            std::fflush(stderr);
            ::_exit(1);
          }
        }) {}
  ~Hang_Guard() {
    {
      std::lock_guard<std::mutex> lock(m_Mutex);
      m_Done = true;
    }
    m_Cond.notify_all();
    m_Thread.join();
  }
  Hang_Guard(const Hang_Guard&) = delete;
  Hang_Guard& operator=(const Hang_Guard&) = delete;

 private:
  std::string m_What;
  std::mutex m_Mutex;
  std::condition_variable m_Cond;
  bool m_Done = false;
  std::thread m_Thread;
};

}  // namespace nrv_test

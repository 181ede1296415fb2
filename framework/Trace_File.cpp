#include "framework/Trace_File.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cctype>
#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <mutex>
#include <string>

#include "framework/Datetime.h"

namespace cimple {

namespace {

const char* const kLevelNames[] = {"FATAL", "ERR", "WARN", "INFO", "DBG"};

// Constant-initialised, so it is usable from any static initialiser or
// destructor of the module, and closed when the module is unloaded.
struct Trace_Target {
  std::once_flag configured;
  bool enabled = false;
  int level = -1;
  int lock_fd = -1;
  FILE* out = nullptr;
  std::mutex mutex;

  ~Trace_Target() {
    std::lock_guard<std::mutex> guard(mutex);
    enabled = false;
    if (out) std::fclose(out);
    if (lock_fd >= 0) close(lock_fd);
    out = nullptr;
    lock_fd = -1;
  }
};

constinit Trace_Target g_target;

std::string trim_right(std::string s) {
  while (!s.empty() && std::isspace(static_cast<unsigned char>(s.back()))) s.pop_back();
  return s;
}

// The level named by the first "LOG_LEVEL = NAME" line, or -1.
int read_level(const std::string& rc_path) {
  std::ifstream in(rc_path);
  std::string line;
  while (std::getline(in, line)) {
    if (line.empty() || line[0] == '#') continue;
    line = trim_right(line);
    if (line.empty()) continue;
    static const char kKey[] = "LOG_LEVEL";
    if (line.compare(0, sizeof(kKey) - 1, kKey) != 0) continue;
    size_t p = sizeof(kKey) - 1;
    while (p < line.size() && std::isspace(static_cast<unsigned char>(line[p]))) ++p;
    if (p >= line.size() || line[p] != '=') continue;
    ++p;
    while (p < line.size() && std::isspace(static_cast<unsigned char>(line[p]))) ++p;
    std::string name = line.substr(p);
    for (int level = 0; level < 5; ++level)
      if (strcasecmp(name.c_str(), kLevelNames[level]) == 0) return level;
    return -1;
  }
  return -1;
}

void configure(Trace_Target& target) {
  const char* home = std::getenv("CIMPLE_HOME");
  if (home == nullptr) return;
  target.level = read_level(std::string(home) + "/.cimple" + "rc");
  if (target.level < 0) return;
  std::string dir = std::string(home) + "/.cimple";
  mkdir(dir.c_str(), 0777);
  target.lock_fd = open((dir + "/messages.lock").c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0600);
  if (target.lock_fd < 0) return;
  target.out = std::fopen((dir + "/messages").c_str(), "ae");
  target.enabled = target.out != nullptr;
}

Trace_Target& target() {
  std::call_once(g_target.configured, [] { configure(g_target); });
  return g_target;
}

int lock_file(int fd, short type) {
  struct flock lock {};
  lock.l_type = type;
  lock.l_whence = SEEK_SET;
  int rc;
  while ((rc = fcntl(fd, F_SETLKW, &lock)) == -1 && errno == EINTR) {
  }
  return rc;
}

}  // namespace

const char* log_level_name(Log_Level level) {
  return level >= LL_FATAL && level <= LL_DBG ? kLevelNames[level] : "DBG";
}

void trace_log(Log_Level level, const char* file, int line, const char* format, ...) {
  Trace_Target& t = target();
  if (!t.enabled || level > t.level) return;

  char message[4096];
  va_list ap;
  va_start(ap, format);
  std::vsnprintf(message, sizeof(message), format, ap);
  va_end(ap);

  std::string stamp = Datetime::now().ascii(true);
  size_t dot = stamp.find('.');
  if (dot != std::string::npos) stamp.resize(dot);

  std::lock_guard<std::mutex> guard(t.mutex);
  if (!t.enabled || lock_file(t.lock_fd, F_WRLCK) != 0) return;
  std::fprintf(t.out, "%s %s: %s(%d): ", stamp.c_str(), log_level_name(level), file, line);
  size_t n = std::strlen(message);
  std::fputs(message, t.out);
  if (n == 0 || message[n - 1] != '\n') std::fputc('\n', t.out);
  std::fflush(t.out);
  lock_file(t.lock_fd, F_UNLCK);
}

}  // namespace cimple

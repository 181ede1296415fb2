#include "logging/NRV_FileRewrite.h"

#include <fcntl.h>
#include <signal.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <climits>
#include <cstdlib>
#include <cstring>

#include "logging/NRV_RegularFile.h"

namespace cimple {

namespace {

Rewrite_Result failure(Rewrite_Status status, const char* step, int error) {
  Rewrite_Result r;
  r.status = status;
  r.step = step;
  r.error = error;
  return r;
}

// SIGXFSZ would end the whole CIMOM when a write crosses the file-size limit.
// Blocked on this thread while writing, the signal stays pending here (the
// kernel sends it to the writing thread) and the write answers EFBIG; the
// pending signal is then taken so it never fires.
class File_Size_Signal_Guard {
 public:
  File_Size_Signal_Guard() {
    sigemptyset(&m_Set);
    sigaddset(&m_Set, SIGXFSZ);
    pthread_sigmask(SIG_BLOCK, &m_Set, &m_Old);
  }
  ~File_Size_Signal_Guard() {
    if (m_bRaised) {
      const struct timespec none = {0, 0};
      while (sigtimedwait(&m_Set, nullptr, &none) < 0 && errno == EINTR) {
      }
    }
    pthread_sigmask(SIG_SETMASK, &m_Old, nullptr);
  }
  File_Size_Signal_Guard(const File_Size_Signal_Guard&) = delete;
  File_Size_Signal_Guard& operator=(const File_Size_Signal_Guard&) = delete;
  // A write answered EFBIG: the signal is pending unless it was already blocked
  // by the caller before (then it is the caller's to handle).
  void raised() { m_bRaised = !sigismember(&m_Old, SIGXFSZ); }

 private:
  sigset_t m_Set;
  sigset_t m_Old;
  bool m_bRaised = false;
};

int write_all(int fd, std::string_view content, File_Size_Signal_Guard& guard) {
  while (!content.empty()) {
    const ssize_t n = ::write(fd, content.data(), content.size());
    if (n < 0) {
      if (errno == EINTR) continue;
      if (errno == EFBIG) guard.raised();
      return errno;
    }
    content.remove_prefix(static_cast<size_t>(n));
  }
  return 0;
}

// The file that is really written: the target of a symbolic link.
bool resolve_target(const std::string& path, std::string& target, int& error) {
  struct stat st;
  if (::lstat(path.c_str(), &st) != 0 || !S_ISLNK(st.st_mode)) {
    target = path;
    return true;
  }
  char resolved[PATH_MAX];
  if (::realpath(path.c_str(), resolved) == nullptr) {
    error = errno;
    return false;
  }
  target = resolved;
  return true;
}

}  // namespace

Rewrite_Result rewrite_file(const std::string& path, std::string_view content) {
  std::string target;
  int error = 0;
  if (!resolve_target(path, target, error)) return failure(Rewrite_Status::Failed, "resolve", error);

  mode_t mode = 0644;
  struct stat st;
  if (::stat(target.c_str(), &st) == 0) {
    if (!S_ISREG(st.st_mode)) return failure(Rewrite_Status::NotRegular, "examine", 0);
    mode = st.st_mode & 07777;
    // One byte more than the content shows a longer file as different.
    const File_Text old = read_regular_file(target, content.size() + 1);
    if (old.ok() && old.text == content) {
      Rewrite_Result unchanged;
      unchanged.status = Rewrite_Status::Unchanged;
      return unchanged;
    }
  } else if (errno != ENOENT) {
    return failure(errno == ENOTDIR ? Rewrite_Status::MissingDirectory : Rewrite_Status::Failed, "examine",
                   errno);
  }

  std::string temporary = target + ".XXXXXX";
  const int fd = ::mkostemp(temporary.data(), O_CLOEXEC);
  if (fd < 0) {
    const int e = errno;
    return failure(e == ENOENT || e == ENOTDIR ? Rewrite_Status::MissingDirectory : Rewrite_Status::Failed,
                   "create", e);
  }

  const char* step = nullptr;
  auto check = [&](bool done, const char* name) {
    if (step == nullptr && !done) {
      step = name;
      error = errno;
    }
  };
  {
    File_Size_Signal_Guard guard;
    errno = write_all(fd, content, guard);
    check(errno == 0, "write");
  }
  check(step != nullptr || ::fchmod(fd, mode) == 0, "chmod");
  check(step != nullptr || ::fsync(fd) == 0, "sync");
  // The close is checked too: a network file system may report a failed
  // write only here.
  check(::close(fd) == 0, "close");
  check(step != nullptr || ::rename(temporary.c_str(), target.c_str()) == 0, "rename");
  if (step != nullptr) {
    ::unlink(temporary.c_str());
    return failure(Rewrite_Status::Failed, step, error);
  }
  Rewrite_Result written;
  written.status = Rewrite_Status::Written;
  return written;
}

std::string rewrite_failure_text(const Rewrite_Result& result) {
  switch (result.status) {
    case Rewrite_Status::Written:
    case Rewrite_Status::Unchanged:
      return "ok";
    case Rewrite_Status::MissingDirectory:
      return "missing directory";
    case Rewrite_Status::NotRegular:
      return "not a regular file";
    case Rewrite_Status::Failed:
      break;
  }
  return std::string(result.step) + ": " + std::strerror(result.error);
}

}  // namespace cimple

#include "logging/NRV_RegularFile.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <utility>

namespace cimple {

Regular_File::Regular_File(Regular_File&& other) noexcept
    : m_Fd(std::exchange(other.m_Fd, -1)), m_Status(other.m_Status), m_Error(other.m_Error) {}

Regular_File& Regular_File::operator=(Regular_File&& other) noexcept {
  if (this != &other) {
    if (m_Fd >= 0) ::close(m_Fd);
    m_Fd = std::exchange(other.m_Fd, -1);
    m_Status = other.m_Status;
    m_Error = other.m_Error;
  }
  return *this;
}

Regular_File::~Regular_File() {
  if (m_Fd >= 0) ::close(m_Fd);
}

Regular_File Regular_File::open(const std::string& path) {
  Regular_File file;
  const int fd = ::open(path.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC | O_NOCTTY);
  if (fd < 0) {
    file.m_Error = errno;
    file.m_Status = (errno == ENOENT || errno == ENOTDIR) ? File_Status::Missing : File_Status::Failed;
    return file;
  }
  struct stat st;
  if (::fstat(fd, &st) != 0) {
    file.m_Error = errno;
    ::close(fd);
    return file;
  }
  if (!S_ISREG(st.st_mode)) {
    file.m_Status = File_Status::NotRegular;
    ::close(fd);
    return file;
  }
  file.m_Fd = fd;
  file.m_Status = File_Status::Ok;
  return file;
}

long Regular_File::read(char* buffer, size_t size) {
  for (;;) {
    const ssize_t n = ::read(m_Fd, buffer, size);
    if (n >= 0) return static_cast<long>(n);
    if (errno != EINTR) return -1;
  }
}

File_Text read_regular_file(const std::string& path, size_t max_bytes) {
  File_Text result;
  Regular_File file = Regular_File::open(path);
  result.status = file.status();
  result.error = file.error();
  if (!file.ok()) return result;
  char chunk[4096];
  for (;;) {
    const long n = file.read(chunk, sizeof chunk);
    if (n < 0) {
      result.status = File_Status::Failed;
      result.error = errno;
      result.text.clear();
      return result;
    }
    if (n == 0) return result;
    // The file may grow while it is read: the bound holds for what is read.
    if (result.text.size() + static_cast<size_t>(n) > max_bytes) {
      result.status = File_Status::TooLarge;
      result.text.clear();
      return result;
    }
    result.text.append(chunk, static_cast<size_t>(n));
  }
}

std::string file_status_text(File_Status status, int error) {
  switch (status) {
    case File_Status::Ok:
      return "ok";
    case File_Status::Missing:
      return "no such file or directory";
    case File_Status::NotRegular:
      return "not a regular file";
    case File_Status::TooLarge:
      return "file too large";
    case File_Status::Failed:
      break;
  }
  return error != 0 ? std::strerror(error) : "unknown error";
}

std::vector<std::string_view> split_lines(std::string_view text) {
  std::vector<std::string_view> lines;
  while (!text.empty()) {
    const size_t end = text.find('\n');
    lines.push_back(text.substr(0, end));
    if (end == std::string_view::npos) break;
    text.remove_prefix(end + 1);
  }
  return lines;
}

}  // namespace cimple

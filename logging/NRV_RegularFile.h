// Reading the module's small system files (settings, WebLaunch address, the
// system log) without ever blocking: only regular files are accepted, and a
// whole-file read is bounded in size.
//
// Contract: nothing here logs or throws; every failure comes back as a value
// with its errno so the caller can report it in its own words.  A FIFO, a
// device or a directory at the path is refused before anything is read, so a
// caller holding locks never waits on another process.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace cimple {

enum class File_Status {
  Ok,
  Missing,     // nothing at the path (ENOENT, or a missing directory on the way)
  NotRegular,  // a FIFO, device, socket or directory
  TooLarge,    // more bytes than the caller's bound
  Failed,      // any other open or read error (see `error`)
};

// An open read-only descriptor of a regular file; closed with the object.
class Regular_File {
 public:
  Regular_File() = default;
  Regular_File(Regular_File&& other) noexcept;
  Regular_File& operator=(Regular_File&& other) noexcept;
  Regular_File(const Regular_File&) = delete;
  Regular_File& operator=(const Regular_File&) = delete;
  ~Regular_File();

  // Opens `path` with O_NONBLOCK (so a FIFO cannot stall the open) and keeps
  // it only when fstat says it is a regular file.
  static Regular_File open(const std::string& path);

  File_Status status() const { return m_Status; }
  int error() const { return m_Error; }  // errno of the failure, 0 when Ok
  bool ok() const { return m_Status == File_Status::Ok; }
  int fd() const { return m_Fd; }

  // Up to `size` bytes from the current offset; 0 at the end, -1 on error
  // (EINTR retried).
  long read(char* buffer, size_t size);

 private:
  int m_Fd = -1;
  File_Status m_Status = File_Status::Failed;
  int m_Error = 0;
};

struct File_Text {
  File_Status status = File_Status::Failed;
  int error = 0;
  std::string text;  // the whole file when status is Ok
  bool ok() const { return status == File_Status::Ok; }
};

// The whole of the regular file at `path`, at most `max_bytes` long.
File_Text read_regular_file(const std::string& path, size_t max_bytes);

// A short reason for a failed status, for log messages ("not a regular file").
std::string file_status_text(File_Status status, int error);

// The lines of `text` without their line feeds; a last line without one is
// still a line.  The views point into `text`.
std::vector<std::string_view> split_lines(std::string_view text);

}  // namespace cimple

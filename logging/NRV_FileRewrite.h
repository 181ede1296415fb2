// Rewriting one of the module's small settings files so that it is either
// wholly old or wholly new: the content goes to a temporary file beside it,
// every write, the sync and the close are checked, and only then is the
// temporary renamed over the old file.
//
// Contract: nothing here logs or throws; the outcome comes back as a value.
// A failed rewrite leaves the old file as it was and no temporary behind.  A
// file that already holds exactly `content` is not touched.  Only a regular
// file (or nothing) at the path is replaced; a symbolic link is followed and
// its target rewritten.  Exceeding the file-size limit reports EFBIG instead
// of killing the process with SIGXFSZ.  Safe from any thread.
#pragma once

#include <string>
#include <string_view>

namespace cimple {

enum class Rewrite_Status {
  Written,
  Unchanged,         // the file already held the content
  MissingDirectory,  // the folder that should hold the file does not exist
  NotRegular,        // a directory, FIFO or device is at the path
  Failed,            // a step failed; see `step` and `error`
};

struct Rewrite_Result {
  Rewrite_Status status = Rewrite_Status::Failed;
  int error = 0;              // errno of the failed step
  const char* step = "";      // "create", "write", "sync", "close", "rename", ...
  bool ok() const { return status == Rewrite_Status::Written || status == Rewrite_Status::Unchanged; }
};

Rewrite_Result rewrite_file(const std::string& path, std::string_view content);

// The reason of a failed rewrite for a log message ("write: File too large").
std::string rewrite_failure_text(const Rewrite_Result& result);

}  // namespace cimple

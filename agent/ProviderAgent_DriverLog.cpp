// The driver-log readers: the lines of the system log that name a driver,
// newest first, into that driver's bounded holder.
#include <algorithm>
#include <string>
#include <string_view>
#include <vector>

#include "agent/ProviderAgent.h"
#include "logging/Log.h"
#include "logging/NRV_RegularFile.h"
#include "logging/NRV_SystemPaths.h"

namespace cimple {

namespace {

// No syslog line is this long; a longer one is not kept.
constexpr size_t kMaxLogLine = 64 << 10;

// The newest `wanted` lines of `file` that contain `tag`, newest first.  The
// system log may be huge: the file is read in chunks, and the lines go into
// a ring of `wanted` strings whose storage is reused, so only as many lines
// as the holder can still take are ever kept.
std::vector<std::string> newest_lines(Regular_File& file, std::string_view tag, size_t wanted) {
  if (wanted == 0) return {};
  std::vector<std::string> ring(wanted);
  size_t matched = 0;
  std::string line;
  bool overlong = false;
  auto end_line = [&] {
    if (!overlong && line.find(tag) != std::string::npos) ring[matched++ % wanted].assign(line);
    line.clear();
    overlong = false;
  };
  char chunk[16 << 10];
  for (long n; (n = file.read(chunk, sizeof chunk)) > 0;) {
    std::string_view rest(chunk, static_cast<size_t>(n));
    for (;;) {
      const size_t feed = rest.find('\n');
      const std::string_view piece = rest.substr(0, feed);
      if (!overlong && line.size() + piece.size() <= kMaxLogLine)
        line.append(piece);
      else
        overlong = true;
      if (feed == std::string_view::npos) break;
      end_line();
      rest.remove_prefix(feed + 1);
    }
  }
  if (!line.empty()) end_line();
  std::vector<std::string> newest;
  for (size_t i = 0; i < std::min(matched, wanted); ++i) newest.push_back(std::move(ring[(matched - 1 - i) % wanted]));
  return newest;
}

}  // namespace

void ProviderAgent::readDriverEvents(const char* tag, DeviceLog& holder) {
  NRV_LOG(NRV_DBG, "Reading Events for %s", tag);
  // Only a regular file: a FIFO in its place must not stall the caller,
  // which holds m_DataMutex.
  Regular_File messages = Regular_File::open(system_path(kNrvSystemLogFile));
  if (messages.ok()) {
    const size_t room = holder.size() < static_cast<size_t>(holder.maxCount())
                            ? static_cast<size_t>(holder.maxCount()) - holder.size()
                            : 0;
    for (const std::string& line : newest_lines(messages, tag, room))
      if (holder.add(line) != 0) break;  // full
  }
  NRV_LOG(NRV_DBG, "Finished reading Events for %s", tag);
}

void ProviderAgent::logFCDriverEvents() {
  readDriverEvents("nvfc", m_FCDriverLog);
  NRV_LOG(NRV_DBG, "Logging of FCoE-FC Driver Log Ends");
}

void ProviderAgent::logNICDriverEvents() {
  readDriverEvents("nvnic", m_NICDriverLog);
  NRV_LOG(NRV_DBG, "Logging of TAVO - NIC Driver Log Ends");
}

void ProviderAgent::logISCSIDriverEvents() {
  readDriverEvents("nviscsi", m_ISCSIDriverLog);
  NRV_LOG(NRV_DBG, "Logging of TAVO - iSCSI Driver Log Ends");
}

}  // namespace cimple

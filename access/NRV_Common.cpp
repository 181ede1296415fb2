// Text forms of names and addresses, version parsing and system queries.
#include "access/NRV_Common.h"

#include <arpa/inet.h>
#include <netdb.h>
#include <sys/socket.h>
#include <sys/statvfs.h>

#include <atomic>
#include <cctype>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <iterator>
#include <new>

#include "logging/NRV_SystemPaths.h"
#include "logging/Log.h"

namespace cimple {
namespace {

int hexValue(char c) {
  if (c >= '0' && c <= '9') return c - '0';
  if (c >= 'a' && c <= 'f') return c - 'a' + 10;
  if (c >= 'A' && c <= 'F') return c - 'A' + 10;
  return -1;
}

bool isHex(char c) { return hexValue(c) >= 0; }

// Writes `count` bytes as upper-case digit pairs, with `separator` between
// pairs unless it is 0.  `out` must hold 2 * count (+ count - 1) + 1 bytes.
char* writeHex(const uint8_t* bytes, size_t count, char separator, char* out) {
  static const char kDigits[] = "0123456789ABCDEF";
  char* p = out;
  for (size_t i = 0; i < count; ++i) {
    if (i > 0 && separator) *p++ = separator;
    *p++ = kDigits[bytes[i] >> 4];
    *p++ = kDigits[bytes[i] & 0x0F];
  }
  *p = '\0';
  return out;
}

}  // namespace

// ---- World-wide names ----------------------------------------------------------

int string2HBAName(HBA_NAME* out, const char* text) {
  if (out == nullptr || text == nullptr || strnlen(text, 17) != 16) {
    NRV_LOG(NRV_ERR, "INVALID WWN");
    return 0;
  }
  HBA_NAME name{};
  for (int i = 0; i < 8; ++i) {
    const int hi = hexValue(text[2 * i]);
    const int lo = hexValue(text[2 * i + 1]);
    if (hi < 0 || lo < 0) {
      NRV_LOG(NRV_ERR, "INVALID WWN");
      return 0;
    }
    name.wwn[i] = static_cast<HBA_UINT8>(hi << 4 | lo);
  }
  *out = name;
  return 1;
}

int str2HBAName(HBA_NAME* out, const char* text) {
  NRV_LOG(NRV_DBG, "Entering NRV_MethodWrapper::str2HBAName");
  if (out == nullptr || text == nullptr || strnlen(text, 24) != 23) {
    NRV_LOG(NRV_ERR, "INVALID HBA Name");
    return 1;
  }
  for (int p = 0; p < 23; ++p) {
    const bool separatorPlace = p % 3 == 2;
    const bool ok = separatorPlace ? (text[p] == ':' || text[p] == ' ') : isHex(text[p]);
    if (!ok) {
      NRV_LOG(NRV_ERR, "INVALID HBA Name");
      return 1;
    }
  }
  NRV_LOG(NRV_DBG, "wwpn:( %s ) ", text);
  HBA_NAME name{};
  for (int i = 0; i < 8; ++i)
    name.wwn[i] = static_cast<HBA_UINT8>(hexValue(text[3 * i]) << 4 | hexValue(text[3 * i + 1]));
  const HBA_UINT8* b = name.wwn;
  NRV_LOG(NRV_DBG, "After tokenizing wwpn:( %2x %2x %2x %2x %2x %2x %2x %2x )", b[0], b[1], b[2],
          b[3], b[4], b[5], b[6], b[7]);
  *out = name;
  return 0;
}

int Id2HBAName(char* out, const char* deviceId) {
  if (out == nullptr || deviceId == nullptr) {
    NRV_LOG(NRV_ERR, "Null pointer argument in one of the arguments");
    return 1;
  }
  NRV_LOG(NRV_DBG, "Entering NRV_MethodWrapper::Id2HBAName");
  NRV_LOG(NRV_DBG, "DeviceID is:: %s", deviceId);
  const char* in = deviceId[0] == '"' ? deviceId + 1 : deviceId;
  // Sixteen characters are consumed; a shorter identifier would be read past
  // its end, so it is refused.
  if (strnlen(in, 16) < 16) {
    out[0] = '\0';
    NRV_LOG(NRV_ERR, "INVALID HBA Name");
    return 1;
  }
  for (int p = 0; p < 23; ++p) out[p] = (p % 3 == 2) ? ':' : *in++;
  out[23] = '\0';
  NRV_LOG(NRV_DBG, "HBA Name is:: %s", out);
  return 0;
}

bool deviceIdToHBAName(const char* deviceId, HBA_NAME& name, const char* id2Failed, const char* strFailed,
                       int level) {
  char colon[kHbaNameColonSize] = {};
  if (Id2HBAName(colon, deviceId) != 0) {
    NRV_LOG(level, "%s", id2Failed);
    return false;
  }
  if (str2HBAName(&name, colon) != 0) {
    NRV_LOG(level, "%s", strFailed);
    return false;
  }
  return true;
}

char* HBAName2string(const HBA_NAME& name, char* out) {
  return out ? writeHex(name.wwn, 8, 0, out) : nullptr;
}

char* HBAName2Id(const HBA_NAME& name, char* out) {
  return out ? writeHex(name.wwn, 8, ':', out) : nullptr;
}

char* bytes16ToString(const uint8_t* bytes, char* out) {
  return out && bytes ? writeHex(bytes, 16, 0, out) : out;
}

char* descriptor2string(uint32_t length, const uint8_t* bytes, char* out) {
  if (out == nullptr) return nullptr;
  if (bytes == nullptr || (length != 8 && length != 12 && length != 16)) {
    out[0] = '\0';
    NRV_LOG(NRV_ERR, "INVALID Descriptor");
    return out;
  }
  return writeHex(bytes, length, 0, out);
}

// ---- MAC addresses ----------------------------------------------------------------

int MAC2String(const uint8_t* mac, std::string& out) {
  if (mac == nullptr) return 1;
  char text[18];
  const int n = std::snprintf(text, sizeof text, "%02x-%02x-%02x-%02x-%02x-%02x", mac[0], mac[1],
                              mac[2], mac[3], mac[4], mac[5]);
  if (n != 17) return 1;
  out += text;
  return 0;
}

uint32_t MAC2HBAName(char* out, const char* mac) {
  if (out == nullptr || mac == nullptr || strnlen(mac, 18) != 17) return kNrvFailure;
  for (int p = 0; p < 17; ++p) {
    const bool ok = (p % 3 == 2) ? mac[p] == '-' : isHex(mac[p]);
    if (!ok) return kNrvFailure;
  }
  for (int p = 0; p < 17; ++p) out[p] = (p % 3 == 2) ? ':' : mac[p];
  std::memcpy(out + 17, ":00:00", 7);
  return 0;
}

size_t removeSeptr(char* text) {
  if (text == nullptr) return 0;
  const size_t length = strnlen(text, 18);
  if (length != 17) return std::strlen(text);
  size_t w = 0;
  for (size_t r = 0; r < 17; ++r)
    if (r % 3 != 2) text[w++] = text[r];
  text[w] = '\0';
  return w;
}

// ---- IP addresses ----------------------------------------------------------------

int ipAddr2IpInfo(const char* text, RM_IP_ADDRESS* out) {
  NRV_LOG(NRV_DBG, "Entering NRV_MethodWrapper ipAddr2IpInfo");
  if (out == nullptr || text == nullptr) {
    NRV_LOG(NRV_ERR, "NRV_HostAddrStrToIPAddr returned false");
    return 1;
  }
  std::memset(out->address, 0, sizeof out->address);
  addrinfo hints{};
  hints.ai_flags = AI_ALL | AI_ADDRCONFIG;  // 0x30
  hints.ai_socktype = SOCK_STREAM;
  addrinfo* result = nullptr;
  const int rc = getaddrinfo(text, nullptr, &hints, &result);
  if (rc != 0) {
    NRV_LOG(NRV_CRIT, "getaddrinfo fails with %s", gai_strerror(rc));
    NRV_LOG(NRV_ERR, "NRV_HostAddrStrToIPAddr returned false");
    return 1;
  }
  int status = 0;
  if (result->ai_family == AF_INET) {
    const auto* sin = reinterpret_cast<const sockaddr_in*>(result->ai_addr);
    std::memcpy(out->address, &sin->sin_addr, 4);
    out->flags &= static_cast<HBA_UINT8>(~RM_IP_FLAG_IPV6);
  } else if (result->ai_family == AF_INET6) {
    const auto* sin6 = reinterpret_cast<const sockaddr_in6*>(result->ai_addr);
    std::memcpy(out->address, &sin6->sin6_addr, 16);
    // Without the flag the record would be read back as an IPv4 address.
    out->flags |= RM_IP_FLAG_IPV6;
  } else {
    NRV_LOG(NRV_ERR, "NRV_HostAddrStrToIPAddr returned false");
    status = 1;
  }
  freeaddrinfo(result);
  return status;
}

int ipInfo2String(const RM_IP_ADDRESS& address, std::string& out) {
  if (address.flags & RM_IP_FLAG_IPV6) {
    char text[INET6_ADDRSTRLEN] = {};
    inet_ntop(AF_INET6, address.address, text, sizeof text);
    out = text;
  } else {
    char text[16];
    std::snprintf(text, sizeof text, "%d.%d.%d.%d", address.address[0], address.address[1],
                  address.address[2], address.address[3]);
    out = text;
  }
  return 0;
}

int joinDecimal(const uint8_t* bytes, char* out, const char* separator, int count, int limit) {
  if (out == nullptr || limit < 0) return 1;
  out[0] = '\0';
  if (bytes == nullptr) return count > 0 ? 1 : 0;
  const char* sep = separator ? separator : "";
  size_t used = 0;
  for (int i = 0; i < count; ++i) {
    char piece[16];
    const int n = std::snprintf(piece, sizeof piece, "%s%d", i ? sep : "",
                                static_cast<int>(static_cast<int8_t>(bytes[i])));
    if (n < 0 || used + static_cast<size_t>(n) > static_cast<size_t>(limit)) {
      out[used] = '\0';
      return 1;
    }
    std::memcpy(out + used, piece, static_cast<size_t>(n));
    used += static_cast<size_t>(n);
  }
  out[used] = '\0';
  return 0;
}

int parseDottedVersion(const char* text, uint16_t* major, uint16_t* minor, uint16_t* revision,
                       uint16_t* build) {
  NRV_LOG(NRV_DBG, "%s", text ? text : "");
  uint16_t* parts[4] = {major, minor, revision, build};
  const char* p = text ? text : "";
  for (int i = 0; i < 4 && *p; ++i) {
    const char* end = std::strchr(p, '.');
    const std::string piece = end ? std::string(p, end) : std::string(p);
    if (!piece.empty() && parts[i] != nullptr)
      *parts[i] = static_cast<uint16_t>(std::strtoul(piece.c_str(), nullptr, 10));
    if (end == nullptr) break;
    p = end + 1;
  }
  NRV_LOG(NRV_DBG, "%d, %d, %d, %d", major ? *major : 0, minor ? *minor : 0,
          revision ? *revision : 0, build ? *build : 0);
  return 0;
}

// ---- System information -------------------------------------------------------------

uint32_t getOSInformation(std::string& osName, std::string& osDistribution) {
  NRV_LOG(NRV_DBG, "Inside  getOSInformation");
  osName = "Unknown";
  osDistribution = "Unknown";
  NRV_LOG(NRV_DBG, "Under _LINUX -- getting the os name and version");
  FILE* version = std::fopen(system_path("/proc/version").c_str(), "r");
  if (version == nullptr) return kNrvFailure;
  char line[256] = {};
  if (std::fgets(line, sizeof line, version) != nullptr) {
    line[std::strcspn(line, "\n")] = '\0';
    osName = line;
  }
  std::fclose(version);

  NRV_LOG(NRV_DBG, "Under _LINUX -- Getting the OS Distribution Name");
  std::ifstream issue(system_path("/etc/issue"), std::ios::binary);
  if (!issue) {
    NRV_LOG(NRV_DBG, "Unable to open the /etc/issue file to get OSDistribution Name");
    return kNrvFailure;
  }
  try {
    osDistribution.assign(std::istreambuf_iterator<char>(issue), std::istreambuf_iterator<char>());
  } catch (const std::bad_alloc&) {
    osDistribution = "Unknown";
    NRV_LOG(NRV_ERR, "Unable to allocate the memory to store OSDistributionName");
    return kNrvFailure;
  }
  return 0;
}

bool IsReadOnlyFS() {
  static std::atomic<bool> tested{false};
  static std::atomic<bool> readOnly{false};
  NRV_LOG(NRV_DBG, " Inside IsReadOnlyFS()");
  if (!tested.load(std::memory_order_acquire)) {
    struct statvfs info {};
    if (statvfs(system_path("/").c_str(), &info) == 0) {
      // Concurrent first callers store the same answer.
      readOnly.store((info.f_flag & ST_RDONLY) != 0, std::memory_order_relaxed);
      tested.store(true, std::memory_order_release);
    }
  }
  return readOnly.load(std::memory_order_relaxed);
}

}  // namespace cimple

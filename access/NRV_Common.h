// The module's common text and system utilities: world-wide-name and MAC text
// forms, IP address conversion, version parsing, operating-system information
// and the read-only root test.
//
// Contract: stateless apart from the read-only-root answer (process-wide,
// thread-safe).  Every writer takes a caller buffer of the size its comment
// states and never writes past it; every reader refuses malformed text
// without reading past its terminator.  Utilities returning a status answer
// 0 for success and kNrvFailure (0x8001) for failure.
#pragma once

#include <stddef.h>
#include <stdint.h>

#include <string>

#include "access/RM_Types.h"

namespace cimple {

inline constexpr uint32_t kNrvFailure = 0x8001;
inline constexpr uint32_t kNrvNotFound = 0x8000;

// Buffer sizes (terminator included) of the text forms.
inline constexpr size_t kHbaNamePlainSize = 17;   // 16 hex digits
inline constexpr size_t kHbaNameColonSize = 24;   // "20:00:...:55"
inline constexpr size_t kHexBytes16Size = 33;     // 16 bytes, 32 digits
inline constexpr size_t kMacColonHbaNameSize = 24;

// ---- World-wide names ----------------------------------------------------------
// Exactly 16 hex digits -> 8 bytes.  1 on success; 0 (and "INVALID WWN") else.
int string2HBAName(HBA_NAME* out, const char* text);

// The 23-character colon (or space) form -> 8 bytes.  0 on success; 1 (and
// "INVALID HBA Name") for a null, wrongly sized or malformed text.
int str2HBAName(HBA_NAME* out, const char* text);

// Device identifier text (16 hex digits, optionally after a double quote) ->
// colon form into `out` (kHbaNameColonSize bytes).  0 on success; 1 for a
// null argument or an identifier shorter than 16 characters.
int Id2HBAName(char* out, const char* deviceId);

// A device identifier text to its name through the colon form (Id2HBAName,
// then str2HBAName), as the catalogue builders name adapters.  False when a
// step fails; that step's failure is logged at `level` as `id2Failed` or
// `strFailed`.
bool deviceIdToHBAName(const char* deviceId, HBA_NAME& name, const char* id2Failed, const char* strFailed,
                       int level = 3 /* NRV_ERR */);

// Plain and colon forms of a name; `out` of kHbaNamePlainSize /
// kHbaNameColonSize bytes.  A null `out` writes nothing and returns null.
char* HBAName2string(const HBA_NAME& name, char* out);
char* HBAName2Id(const HBA_NAME& name, char* out);

// 16 bytes as 32 upper-case digits; `out` of kHexBytes16Size bytes.
char* bytes16ToString(const uint8_t* bytes, char* out);

// A descriptor of `length` bytes (8, 12 or 16) in plain form; any other length
// leaves `out` empty and logs "INVALID Descriptor".  `out` of kHexBytes16Size.
char* descriptor2string(uint32_t length, const uint8_t* bytes, char* out);

// ---- MAC addresses ----------------------------------------------------------------
// Appends "xx-xx-xx-xx-xx-xx" (lower case).  0, or 1 when formatting fails.
int MAC2String(const uint8_t* mac, std::string& out);

// "02-11-22-33-44-55" -> "02:11:22:33:44:55:00:00" into `out`
// (kMacColonHbaNameSize bytes).  0, or kNrvFailure for a malformed MAC text.
uint32_t MAC2HBAName(char* out, const char* mac);

// Removes the separators of a 17-character MAC text in place and returns the
// new length (12).  Any other text is left as it is; its length is returned.
size_t removeSeptr(char* text);

// ---- IP addresses ----------------------------------------------------------------
// Resolves `text` into the address of `out` (IPv4 in the first 4 bytes, or 16
// bytes of IPv6 with the IPv6 flag set).  0, or 1 when it does not resolve.
int ipAddr2IpInfo(const char* text, RM_IP_ADDRESS* out);

// Dotted IPv4 or standard IPv6 text of `address` into `out`.  Returns 0.
int ipInfo2String(const RM_IP_ADDRESS& address, std::string& out);

// The first `count` bytes as signed decimals joined by `separator` into `out`,
// which holds limit + 1 bytes.  0 when all fit; 1 when a piece did not fit
// (the text holds the pieces that did).
int joinDecimal(const uint8_t* bytes, char* out, const char* separator, int count, int limit);

// "a.b.c.d" -> up to four numbers; missing ones keep their values.  Returns 0.
int parseDottedVersion(const char* text, uint16_t* major, uint16_t* minor, uint16_t* revision,
                       uint16_t* build);

// ---- System information -------------------------------------------------------------
// First line of "/proc/version" and the whole of "/etc/issue" (both through
// system_path).  0, or kNrvFailure with "Unknown" where a file could not be read.
uint32_t getOSInformation(std::string& osName, std::string& osDistribution);

// Whether "/" is mounted read-only; asked of statvfs until it first answers.
bool IsReadOnlyFS();

}  // namespace cimple

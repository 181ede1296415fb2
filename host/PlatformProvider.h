// PlatformProvider: the host's stand-in for the platform's own instrumentation — the
// KVLD_ComputerSystem and KVLD_Chassis instances of namespace "root/kvlhost" and the
// platform's registered profiles (PG_RegisteredProfile, such as its Base Server profile) of
// "root/pg_interop", read from a JSON file.
//
// File format: {"KVLD_ComputerSystem": [ {Prop: value, ...}, ... ], "KVLD_Chassis": [ ... ],
// "PG_RegisteredProfile": [ ... ]}.
// A value is a JSON string, boolean or number (numbers become uint32 when they fit, else
// sint64 or real64), an array of those, or {"type": "uint16", "value": ...} for an exact CIM
// type ("uint16[]" for arrays, "datetime", ...). Keys are CreationClassName+Name (computer
// system), CreationClassName+Tag (chassis) and InstanceID (profiles).
#ifndef NRV_HOST_PLATFORMPROVIDER_H
#define NRV_HOST_PLATFORMPROVIDER_H

#include <optional>
#include <string>
#include <vector>

#include "host/Request.h"

namespace nrv::host {

inline constexpr const char* kPlatformNameSpace = "root/kvlhost";
inline constexpr const char* kInteropNameSpace = "root/pg_interop";

class PlatformProvider {
 public:
  // No file: no instances. A file that cannot be read or parsed: no instances and loadError().
  explicit PlatformProvider(const std::optional<std::string>& jsonPath);
  // The path from the environment variable NRV_HOST_PLATFORM.
  static std::optional<std::string> pathFromEnvironment();

  // Requests for a platform class in the platform namespace.
  bool serves(const PathData& path) const;
  // Read operations answer from the file; everything else is CMPI_RC_ERR_NOT_SUPPORTED.
  Outcome serve(const Request& request) const;

  const std::string& loadError() const { return error_; }
  const std::vector<InstanceData>& instances() const { return instances_; }

 private:
  std::vector<InstanceData> instances_;
  std::string error_;
};

}  // namespace nrv::host

#endif  // NRV_HOST_PLATFORMPROVIDER_H

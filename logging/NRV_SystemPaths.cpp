#include "logging/NRV_SystemPaths.h"

#include <cstdlib>

namespace cimple {

std::string system_path(const char* fixed_path) {
  // Ignored in a set-user-ID or capability-raised process, where whoever
  // started it must not redirect the module's files.
  const char* root = secure_getenv(kSysrootVariable);
  if (root == nullptr || *root == '\0') return fixed_path;
  std::string path(root);
  while (!path.empty() && path.back() == '/') path.pop_back();
  if (fixed_path[0] != '/') path += '/';
  return path + fixed_path;
}

}  // namespace cimple

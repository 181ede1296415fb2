#include "logging/NRV_SystemPaths.h"

#include <cstdlib>

namespace cimple {

std::string system_path(const char* fixed_path) {
  const char* root = std::getenv(kSysrootVariable);
  if (root == nullptr || *root == '\0') return fixed_path;
  std::string path(root);
  while (!path.empty() && path.back() == '/') path.pop_back();
  if (fixed_path[0] != '/') path += '/';
  return path + fixed_path;
}

}  // namespace cimple

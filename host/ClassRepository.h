// ClassRepository: the classes a CIMOM's repository holds for a module — superclass, whether
// an association, keys with their types, and the namespaces each class is declared in — read
// from the repository.json the build writes beside the module's registration.
//
// Format: {"classes": [{"name": "C", "superclass": "B" | null, "association": bool,
//           "keys": [{"name": "K", "type": "string" | "uint16" | ... | "ref", "class": "R"}],
//           "namespaces": ["root/x", ...]}, ...]}
// Contract: read() never throws; a malformed file yields an error text. Names compare
// case-insensitively. A class's superclass must be listed before it. The repository must
// outlive the KeySchema it hands out and stay where it was when it handed it out.
#ifndef NRV_HOST_CLASSREPOSITORY_H
#define NRV_HOST_CLASSREPOSITORY_H

#include <memory>
#include <string>
#include <unordered_map>
#include <variant>
#include <vector>

#include "host/PathText.h"

namespace nrv::host {

struct ClassDecl {
  std::string name;
  const ClassDecl* superclass = nullptr;
  bool association = false;
  std::vector<KeyDecl> keys;
  std::vector<std::string> namespaces;
};

class ClassRepository {
 public:
  static std::variant<ClassRepository, std::string> read(const std::string& path);

  const ClassDecl* find(const std::string& className) const;
  bool declaredIn(const std::string& className, const std::string& nameSpace) const;
  // `className` is `ancestor` or derives from it.
  bool isA(const std::string& className, const std::string& ancestor) const;
  // The key declarations parsePath checks object paths against.
  KeySchema keySchema() const;

 private:
  ClassRepository() = default;

  // Stable addresses: superclass links point into it.
  std::vector<std::unique_ptr<ClassDecl>> classes_;
  std::unordered_map<std::string, const ClassDecl*> byName_;  // lower-case name
};

}  // namespace nrv::host

#endif  // NRV_HOST_CLASSREPOSITORY_H

// Registration: a module's SFCB provider registration file, read as SFCB reads it — which
// classes have a provider, of which MI types, in which namespaces.
//
// Format: entries "[Class]" followed by "key: value" lines (provider, location, type,
// namespace; type and namespace take blank-separated lists); '#' starts a comment line.
// Contract: read()/parse() never throw; a malformed file yields an error text. Class and
// namespace names compare case-insensitively.
#ifndef NRV_HOST_REGISTRATION_H
#define NRV_HOST_REGISTRATION_H

#include <string>
#include <string_view>
#include <variant>
#include <vector>

namespace nrv::host {

struct RegisteredClass {
  std::string className;
  std::string provider;
  std::string location;
  std::vector<std::string> types;       // "instance", "method", "association", ...
  std::vector<std::string> namespaces;
};

class Registration {
 public:
  static std::variant<Registration, std::string> read(const std::string& path);
  static std::variant<Registration, std::string> parse(std::string_view text);

  const std::vector<RegisteredClass>& entries() const { return entries_; }
  const RegisteredClass* find(const std::string& className) const;
  // The class has a provider in the namespace.
  bool serves(const std::string& className, const std::string& nameSpace) const;
  // Some class has a provider in the namespace.
  bool knowsNamespace(const std::string& nameSpace) const;
  // The classes with a provider of `type` in the namespace, in file order.
  std::vector<std::string> classesIn(const std::string& nameSpace, const std::string& type) const;

 private:
  std::vector<RegisteredClass> entries_;
};

}  // namespace nrv::host

#endif  // NRV_HOST_REGISTRATION_H

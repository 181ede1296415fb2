// ModuleLoader: opens a provider module the way a CIMOM does (dlopen of the file) and finds its
// MI factories by name, listing the exported factory symbols from the module's ELF dynamic
// symbol table.
//
// Contract: the module stays loaded for the loader's lifetime; whoever called factories must
// have cleaned up their MIs before the loader is destroyed (dlclose). The module stays mapped
// after dlclose (RTLD_NODELETE), as long-running CIMOMs keep providers; NRV_HOST_UNLOAD_MODULE
// set in the environment makes dlclose really unmap it.
#ifndef NRV_HOST_MODULELOADER_H
#define NRV_HOST_MODULELOADER_H

#include <memory>
#include <optional>
#include <string>
#include <unordered_map>
#include <variant>
#include <vector>

namespace nrv::host {

// X-macro: MI kind and the factory-name suffix "<Provider>_Create_<suffix>".
#define NRV_HOST_MI_KINDS(X)          \
  X(Instance, "InstanceMI")           \
  X(Method, "MethodMI")               \
  X(Association, "AssociationMI")     \
  X(Indication, "IndicationMI")

enum class MiKind {
#define NRV_HOST_MI_ENUM(kind, suffix) kind,
  NRV_HOST_MI_KINDS(NRV_HOST_MI_ENUM)
#undef NRV_HOST_MI_ENUM
};

const char* miKindSuffix(MiKind kind);

class ModuleLoader {
 public:
  // Error text (dlerror) when the module cannot be opened.
  static std::variant<std::unique_ptr<ModuleLoader>, std::string> open(const std::string& path);

  ModuleLoader(const ModuleLoader&) = delete;
  ModuleLoader& operator=(const ModuleLoader&) = delete;
  ~ModuleLoader();

  const std::string& path() const { return path_; }

  // Every exported "..._Create_<Kind>MI" function of the module.
  const std::vector<std::string>& factorySymbols() const { return factories_; }
  void* symbol(const std::string& name) const;
  // Keeps the module mapped after the loader's dlclose: for threads of the module that are
  // still running when the host lets go of it.
  void pin() const;

  // The factory that serves `className`: "<Class>_Provider_Create_<Kind>MI", else the alias
  // "<Class>_Create_<Kind>MI"; class names match case-insensitively. nullopt when neither
  // resolves.
  std::optional<std::string> factoryFor(const std::string& className, MiKind kind) const;
  // Classes (spelled as exported) that have a factory of this kind.
  std::vector<std::string> classesWith(MiKind kind) const;

 private:
  ModuleLoader(std::string path, void* handle, std::vector<std::string> factories);

  std::string path_;
  void* handle_;
  std::vector<std::string> factories_;
  std::unordered_map<std::string, std::string> byLowerName_;  // lower-case -> exported spelling
};

// Exported function names of an ELF shared object (empty when it cannot be read).
std::vector<std::string> exportedFunctions(const std::string& path);

}  // namespace nrv::host

#endif  // NRV_HOST_MODULELOADER_H

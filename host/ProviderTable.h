// ProviderTable: the MIs a CIMOM holds for one module — created on first use through the
// module's factory, one per provider and kind, and cleaned up (terminating) at shutdown.
//
// Contract: the ModuleLoader and the broker must outlive the table. MI pointers stay valid
// until cleanupAll(). Safe to use from several threads; factories are called one at a time.
#ifndef NRV_HOST_PROVIDERTABLE_H
#define NRV_HOST_PROVIDERTABLE_H

#include <mutex>
#include <string>
#include <variant>
#include <vector>

#include "cmpift.h"
#include "host/ModuleLoader.h"
#include "host/Request.h"

namespace nrv::host {

struct LoadedMi {
  std::string factory;   // the factory symbol that made it
  std::string provider;  // "<Class>_Provider" or the alias prefix
  MiKind kind;
  void* mi;              // CMPIInstanceMI*, CMPIMethodMI*, ... by kind
};

struct CleanupRecord {
  std::string factory;
  CMPIrc rc;
};

class ProviderTable {
 public:
  ProviderTable(const ModuleLoader& module, const CMPIBroker* broker);
  ProviderTable(const ProviderTable&) = delete;
  ProviderTable& operator=(const ProviderTable&) = delete;

  // The MI serving `className` for `kind`, created on first use; a failure Outcome when the
  // module has no such factory or the factory answers no MI.
  std::variant<void*, Outcome> mi(const std::string& className, MiKind kind,
                                  const NamedData& context);

  std::vector<LoadedMi> loaded() const;

  // Calls every MI's cleanup with terminating=true, newest first, and forgets them. With
  // `oncePerMiType`, as SFCB does for a provider library: only the first MI loaded of each
  // kind, instance, association, method then indication.
  std::vector<CleanupRecord> cleanupAll(const NamedData& context, bool oncePerMiType = false);

 private:
  const ModuleLoader& module_;
  const CMPIBroker* broker_;
  // Recursive: a factory's load may up-call into a class whose MI is not made yet.
  mutable std::recursive_mutex mu_;
  std::vector<LoadedMi> mis_;
};

}  // namespace nrv::host

#endif  // NRV_HOST_PROVIDERTABLE_H

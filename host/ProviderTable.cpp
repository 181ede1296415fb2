// ProviderTable: factory calls, the MI cache and terminating cleanup.
#include "host/ProviderTable.h"

#include <strings.h>

#include <algorithm>
#include <optional>

#include "host/EncObjects.h"

namespace nrv::host {

namespace {

// Calls a factory through the signature of its kind.
template <typename MI>
void* createAs(void* symbol, const CMPIBroker* mb, const CMPIContext* ctx, CMPIStatus* st) {
  using Factory = MI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);
  return reinterpret_cast<Factory>(symbol)(mb, ctx, st);
}

void* callFactory(MiKind kind, void* symbol, const CMPIBroker* mb, const CMPIContext* ctx,
                  CMPIStatus* st) {
  switch (kind) {
    case MiKind::Instance: return createAs<CMPIInstanceMI>(symbol, mb, ctx, st);
    case MiKind::Method: return createAs<CMPIMethodMI>(symbol, mb, ctx, st);
    case MiKind::Association: return createAs<CMPIAssociationMI>(symbol, mb, ctx, st);
    case MiKind::Indication: return createAs<CMPIIndicationMI>(symbol, mb, ctx, st);
  }
  return nullptr;
}

// Calls the MI's cleanup through its own table type; nullopt when the table has none.
template <typename MI>
std::optional<CMPIrc> cleanupAs(void* mi, const CMPIContext* ctx) {
  auto* typed = static_cast<MI*>(mi);
  if (typed->ft->cleanup == nullptr) return std::nullopt;
  return typed->ft->cleanup(typed, ctx, 1).rc;
}

std::optional<CMPIrc> callCleanup(const LoadedMi& m, const CMPIContext* ctx) {
  switch (m.kind) {
    case MiKind::Instance: return cleanupAs<CMPIInstanceMI>(m.mi, ctx);
    case MiKind::Method: return cleanupAs<CMPIMethodMI>(m.mi, ctx);
    case MiKind::Association: return cleanupAs<CMPIAssociationMI>(m.mi, ctx);
    case MiKind::Indication: return cleanupAs<CMPIIndicationMI>(m.mi, ctx);
  }
  return std::nullopt;
}

// All MI structs are { hdl, ft }: a null table means an unusable MI.
bool hasTable(void* mi) { return static_cast<CMPIInstanceMI*>(mi)->ft != nullptr; }

}  // namespace

ProviderTable::ProviderTable(const ModuleLoader& module, const CMPIBroker* broker)
    : module_(module), broker_(broker) {}

std::variant<void*, Outcome> ProviderTable::mi(const std::string& className, MiKind kind,
                                               const NamedData& context) {
  auto factory = module_.factoryFor(className, kind);
  if (!factory) {
    const bool anyKind = module_.factoryFor(className, MiKind::Instance) ||
                         module_.factoryFor(className, MiKind::Method) ||
                         module_.factoryFor(className, MiKind::Association);
    return Outcome::failure(anyKind ? CMPI_RC_ERR_NOT_SUPPORTED : CMPI_RC_ERR_INVALID_CLASS,
                            std::string("no ") + miKindSuffix(kind) + " provider for class " +
                                className);
  }
  std::lock_guard<std::recursive_mutex> lock(mu_);
  for (const auto& m : mis_) {
    if (m.factory == *factory && m.kind == kind) return m.mi;
  }
  void* fn = module_.symbol(*factory);
  if (fn == nullptr) return Outcome::failure(CMPI_RC_ERR_FAILED, "cannot resolve " + *factory);
  ArenaScope scope;
  CMPIContext* ctx = makeContext(broker_, context);
  CMPIStatus st{CMPI_RC_OK, nullptr};
  void* made = callFactory(kind, fn, broker_, ctx, &st);
  if (made == nullptr || !hasTable(made)) {
    std::string message = *factory + " returned no MI";
    if (auto text = stringOf(st.msg); text && !text->empty()) message += ": " + *text;
    return Outcome::failure(st.rc == CMPI_RC_OK ? CMPI_RC_ERR_FAILED : st.rc, message);
  }
  const std::string tail = std::string("_Create_") + miKindSuffix(kind);
  mis_.push_back(LoadedMi{*factory, factory->substr(0, factory->size() - tail.size()), kind, made});
  return made;
}

std::vector<LoadedMi> ProviderTable::loaded() const {
  std::lock_guard<std::recursive_mutex> lock(mu_);
  return mis_;
}

std::vector<CleanupRecord> ProviderTable::cleanupAll(const NamedData& context,
                                                     bool oncePerMiType) {
  std::vector<LoadedMi> mis;
  {
    std::lock_guard<std::recursive_mutex> lock(mu_);
    mis.swap(mis_);
  }
  std::vector<const LoadedMi*> order;
  if (oncePerMiType) {
    for (MiKind kind : {MiKind::Instance, MiKind::Association, MiKind::Method, MiKind::Indication}) {
      auto first = std::find_if(mis.begin(), mis.end(), [&](const LoadedMi& m) { return m.kind == kind; });
      if (first != mis.end()) order.push_back(&*first);
    }
  } else {
    for (auto it = mis.rbegin(); it != mis.rend(); ++it) order.push_back(&*it);
  }
  std::vector<CleanupRecord> records;
  for (const LoadedMi* m : order) {
    ArenaScope scope;
    CMPIContext* ctx = makeContext(broker_, context);
    records.push_back({m->factory, callCleanup(*m, ctx).value_or(CMPI_RC_ERR_NOT_SUPPORTED)});
  }
  return records;
}

}  // namespace nrv::host

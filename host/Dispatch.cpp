// Dispatch: namespace and class checks, and provider selection per operation.
#include "host/Dispatch.h"

#include <algorithm>

namespace nrv::host {

namespace {

// What an operation needs of a provider, and what a CIMOM answers for a known class that has
// no such provider (an empty answer when unset).
struct OperationRule {
  const char* miType;
  bool fanOut;                     // subclasses' providers serve it too
  std::optional<CMPIrc> without;   // answer when no provider serves the class
};

OperationRule ruleFor(Operation op) {
  switch (op) {
    case Operation::EnumerateInstances:
    case Operation::EnumerateInstanceNames: return {"instance", true, std::nullopt};
    case Operation::GetInstance:
    case Operation::ModifyInstance:
    case Operation::DeleteInstance: return {"instance", false, CMPI_RC_ERR_NOT_FOUND};
    case Operation::CreateInstance:
    case Operation::ExecQuery: return {"instance", false, CMPI_RC_ERR_NOT_SUPPORTED};
    case Operation::InvokeMethod: return {"method", false, CMPI_RC_ERR_NOT_SUPPORTED};
    case Operation::Associators:
    case Operation::AssociatorNames:
    case Operation::References:
    case Operation::ReferenceNames: return {"association", true, std::nullopt};
  }
  return {"instance", false, CMPI_RC_ERR_NOT_SUPPORTED};
}

// The association class an association request is restricted to: -ac for associators,
// the result class for references (which names association classes there).
const std::optional<std::string>& associationFilter(const Request& r) {
  const bool refs = r.op == Operation::References || r.op == Operation::ReferenceNames;
  return refs ? r.resultClass : r.assocClass;
}

bool given(const std::optional<std::string>& s) { return s && !s->empty(); }

constexpr size_t kMaxFanouts = 4096;

}  // namespace

Dispatch::Dispatch(const ModuleLoader& module, const Registration* registration,
                   const ClassRepository* repository)
    : module_(module), registration_(registration), repository_(repository) {}

std::optional<Outcome> Dispatch::checkClass(const Request& r) const {
  const std::string& ns = r.path.nameSpace;
  const std::string& cls = r.path.className;
  const bool nsKnown = registration_->knowsNamespace(ns);
  if (!nsKnown) return Outcome::failure(CMPI_RC_ERR_INVALID_NAMESPACE, "no namespace " + ns);
  const bool declared = repository_ ? repository_->declaredIn(cls, ns)
                                    : registration_->serves(cls, ns);
  if (!declared) return Outcome::failure(CMPI_RC_ERR_INVALID_CLASS, "no class " + cls + " in " + ns);
  return std::nullopt;
}

std::vector<std::string> Dispatch::registered(const std::string& nameSpace,
                                              const std::string& type,
                                              const std::optional<std::string>& filter) const {
  Fanout key{nameSpace, type, filter};
  {
    std::lock_guard<std::mutex> lock(fanoutMu_);
    if (auto it = fanouts_.find(key); it != fanouts_.end()) return it->second;
  }
  std::vector<std::string> out;
  for (auto& cls : registration_->classesIn(nameSpace, type)) {
    const bool match = !given(filter) ||
                       (repository_ ? repository_->isA(cls, *filter) : sameName(cls, *filter));
    if (match) out.push_back(std::move(cls));
  }
  std::lock_guard<std::mutex> lock(fanoutMu_);
  if (fanouts_.size() >= kMaxFanouts) fanouts_.clear();  // names a client made up stay bounded
  fanouts_.emplace(std::move(key), out);
  return out;
}

std::variant<std::vector<std::string>, Outcome> Dispatch::targets(const Request& r) const {
  const bool association = isAssociationOperation(r.op);
  if (registration_ == nullptr) {
    if (!association) return std::vector<std::string>{r.path.className};
    if (given(associationFilter(r))) return std::vector<std::string>{*associationFilter(r)};
    return module_.classesWith(MiKind::Association);
  }
  if (auto failure = checkClass(r)) return std::move(*failure);
  const OperationRule rule = ruleFor(r.op);
  if (association) return registered(r.path.nameSpace, rule.miType, associationFilter(r));
  if (rule.fanOut) return registered(r.path.nameSpace, rule.miType, r.path.className);
  const RegisteredClass* entry = registration_->find(r.path.className);
  const bool served = registration_->serves(r.path.className, r.path.nameSpace) &&
                      std::any_of(entry->types.begin(), entry->types.end(),
                                  [&](const std::string& t) { return t == rule.miType; });
  if (served) return std::vector<std::string>{r.path.className};
  return Outcome::failure(*rule.without, "no " + std::string(rule.miType) + " provider for " +
                                             r.path.className + " in " + r.path.nameSpace);
}

}  // namespace nrv::host

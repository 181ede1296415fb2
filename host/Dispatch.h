// Dispatch: which of a module's providers a request goes to, decided as a CIMOM decides it
// from the module's registration and class repository — the namespace and the class must be
// known there, and an enumeration of a superclass fans out to the providers of its
// subclasses (SFCB's behaviour).
//
// Contract: the loader, registration and repository must outlive the Dispatch. Without a
// registration (a module built without one) every class is served in every namespace by the
// provider named like it; without a repository, requests are not fanned out to subclasses.
#ifndef NRV_HOST_DISPATCH_H
#define NRV_HOST_DISPATCH_H

#include <map>
#include <mutex>
#include <string>
#include <tuple>
#include <variant>
#include <vector>

#include "host/ClassRepository.h"
#include "host/ModuleLoader.h"
#include "host/Registration.h"
#include "host/Request.h"

namespace nrv::host {

class Dispatch {
 public:
  Dispatch(const ModuleLoader& module, const Registration* registration,
           const ClassRepository* repository);

  // The classes whose providers serve the request: the path's class, or for enumerations its
  // subclasses with a provider, or for association requests the association classes asked.
  // An empty list is an empty answer; a failure is the CIMOM's own answer.
  std::variant<std::vector<std::string>, Outcome> targets(const Request& request) const;
  // With a registration one failing provider fails the whole request, as in SFCB; without
  // one, association requests answer what the other providers found.
  bool registered() const { return registration_ != nullptr; }

 private:
  std::optional<Outcome> checkClass(const Request& request) const;
  // Registered classes of `type` in the namespace that are `filter` or derive from it (all of
  // them without a filter).
  std::vector<std::string> registered(const std::string& nameSpace, const std::string& type,
                                      const std::optional<std::string>& filter) const;

  const ModuleLoader& module_;
  const Registration* registration_;
  const ClassRepository* repository_;
  // registered() answers, by namespace, type and filter: registration and repository do not
  // change once loaded, and walking every class's ancestry is most of a small request's cost.
  using Fanout = std::tuple<std::string, std::string, std::optional<std::string>>;
  mutable std::mutex fanoutMu_;
  mutable std::map<Fanout, std::vector<std::string>> fanouts_;
};

}  // namespace nrv::host

#endif  // NRV_HOST_DISPATCH_H

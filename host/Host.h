// Host: a CIMOM stand-in for tests and the nrv-cim client. It loads a provider module as a
// CIMOM does, gives its MIs a real CMPI broker, serves the platform classes of "root/kvlhost"
// itself, and answers CIM operations with plain C++ results.
//
// Usage:
//   nrv::host::Host host;                               // NRV_MODULE or the default module
//   auto r = host.enumerateInstances("root/norvane", "NRVTAVO_Chip");
//   if (r.ok()) for (const auto& inst : r.instances) ...   // InstanceData: path + properties
//   auto p = nrv::host::parsePath("root/norvane:NRVTAVO_Chip.InstanceID=\"NRV:1\"");
//   host.getInstance(std::get<nrv::host::PathData>(p));
//   host.shutdown();                                    // MIs cleaned up, terminating
//
// Contract:
// - Every operation returns a Result: rc/message as the provider answered (CMPI_RC_OK on
//   success); instances for enumerate/get/associators/references; paths for the *Names
//   operations and createInstance; returnValue/outArgs for invokeMethod.
// - Operations may be called from several threads at once. Calls for one provider are
//   serialised by the provider itself, not by the host.
// - shutdown() (also run by the destructor) waits for running operations, refuses later ones
//   with CMPI_RC_ERR_FAILED "host is shut down" and calls every MI's cleanup with
//   terminating=true (newest first). The destructor then dlcloses the module (which stays
//   mapped unless NRV_HOST_UNLOAD_MODULE is set, and always while a thread it attached has not
//   detached) and frees the broker's objects; later broker calls from module threads are
//   refused, not crashed on. A module loaded again by a later Host keeps its global state.
//   With Cleanup::OncePerMiType, shutdown cleans up as SFCB does: only the first MI of each
//   kind (instance, association, method, indication) is cleaned up; the others are dropped.
// - A module that cannot be loaded is not fatal: loadError() says why, module classes answer
//   CMPI_RC_ERR_FAILED, the platform classes still work.
// - Like a CIMOM, the host routes by the module's registration and class repository, found
//   beside the module (share/<name>/<name>.reg and repository.json, see shareDirFor()) unless
//   Options say otherwise: a class asked for in a namespace it is not declared in is
//   CMPI_RC_ERR_INVALID_CLASS, an unknown namespace CMPI_RC_ERR_INVALID_NAMESPACE, and an
//   enumeration of a superclass reaches the providers of its subclasses (see Dispatch.h).
//   Without them every class is served in every namespace by the provider named like it.
// - Platform instances come from the JSON file named by NRV_HOST_PLATFORM (see
//   PlatformProvider.h) unless Options::platformFile says otherwise.
#ifndef NRV_HOST_HOST_H
#define NRV_HOST_HOST_H

#include <condition_variable>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

#include "cmpift.h"
#include "host/Broker.h"
#include "host/ClassRepository.h"
#include "host/Datum.h"
#include "host/Dispatch.h"
#include "host/ModuleLoader.h"
#include "host/PathText.h"
#include "host/PlatformProvider.h"
#include "host/ProviderTable.h"
#include "host/Registration.h"
#include "host/Request.h"

namespace nrv::host {

using HostInstance = InstanceData;

struct Result {
  CMPIrc rc = CMPI_RC_OK;
  std::string message;
  std::vector<HostInstance> instances;
  std::vector<PathData> paths;
  Datum returnValue;
  NamedData outArgs;

  bool ok() const { return rc == CMPI_RC_OK; }
  // "CMPI_RC_ERR_NOT_FOUND : message" (or just the code name without a message).
  std::string errorText() const;
};

// Filters of the association operations; unset means "any".
struct AssocFilter {
  std::optional<std::string> assocClass;   // associators/associatorNames only: -ac
  std::optional<std::string> resultClass;  // -rc
  std::optional<std::string> role;         // -r
  std::optional<std::string> resultRole;   // associators/associatorNames only: -rr
};

// The MI objects of one class, created through the module's factories (null when the module
// has no factory of that kind or the factory answered none).
struct ClassMis {
  CMPIInstanceMI* instance = nullptr;
  CMPIMethodMI* method = nullptr;
  CMPIAssociationMI* association = nullptr;
};

class Host : public Router {
 public:
  enum class Cleanup { EveryMi, OncePerMiType };
  struct Options {
    std::optional<std::string> platformFile = PlatformProvider::pathFromEnvironment();
    // The module's registration and class repository; unset: beside the module when there
    // (shareDirFor), an empty string: none.
    std::optional<std::string> registrationFile = std::nullopt;
    std::optional<std::string> repositoryFile = std::nullopt;
    Cleanup cleanup = Cleanup::EveryMi;
  };

  explicit Host(const std::string& modulePath = defaultModulePath());
  Host(const std::string& modulePath, Options options);
  Host(const Host&) = delete;
  Host& operator=(const Host&) = delete;
  ~Host() override;

  // $NRV_MODULE, else "build/lib/libnorvane_tavo_provider.so".
  static std::string defaultModulePath();
  // Where the build or the install put what a CIMOM reads beside DIR/lib<name>.so:
  // DIR/../share/<name> (build tree) or DIR/../../share/<name> (installed under lib/cmpi),
  // whichever exists; nullopt when neither does.
  static std::optional<std::string> shareDirFor(const std::string& modulePath);

  bool moduleLoaded() const { return module_ != nullptr; }
  const std::string& loadError() const { return loadError_; }
  // Why the registration or the repository could not be read (empty when they could, or
  // when there were none).
  const std::string& catalogError() const { return catalogError_; }
  const Registration* registration() const { return registration_.get(); }
  // The key schema of the module's classes, for parsePath (empty without a repository).
  KeySchema keySchema() const;

  Result enumerateInstances(const std::string& ns, const std::string& className,
                            PropertyList properties = std::nullopt);
  Result enumerateInstanceNames(const std::string& ns, const std::string& className);
  Result getInstance(const PathData& path, PropertyList properties = std::nullopt);
  // The instance's path gives namespace and class (keys optional).
  Result createInstance(const HostInstance& instance);
  Result modifyInstance(const HostInstance& instance, PropertyList properties = std::nullopt);
  Result deleteInstance(const PathData& path);
  Result invokeMethod(const PathData& path, const std::string& method, NamedData inArgs = {});
  Result associators(const PathData& path, const AssocFilter& filter = {},
                     PropertyList properties = std::nullopt);
  Result associatorNames(const PathData& path, const AssocFilter& filter = {});
  Result references(const PathData& path, const AssocFilter& filter = {},
                    PropertyList properties = std::nullopt);
  Result referenceNames(const PathData& path, const AssocFilter& filter = {});
  // Any request, with the default context entries filled in when it has none.
  Result execute(Request request);

  void shutdown();
  // Return codes of the cleanups shutdown() made (for tests).
  const std::vector<CleanupRecord>& cleanupRecords() const { return cleanups_; }

  // Factory symbols the module exports, and whether one resolves by dlsym.
  std::vector<std::string> factorySymbols() const;
  bool resolves(const std::string& symbol) const;
  // Creates (once) and returns the MIs serving a class.
  ClassMis mis(const std::string& className);
  std::vector<LoadedMi> loadedMis() const;

  const CMPIBroker* broker() const { return broker_->cmpi(); }
  Broker& brokerObject() { return *broker_; }
  const PlatformProvider& platform() const { return platform_; }

  // Router: where broker up-calls arrive.
  Outcome route(const Request& request) override;

 private:
  bool enter();
  void leave();

  std::unique_ptr<Broker> broker_;
  std::unique_ptr<ModuleLoader> module_;
  std::unique_ptr<ProviderTable> table_;
  std::unique_ptr<Registration> registration_;
  std::unique_ptr<ClassRepository> repository_;
  std::unique_ptr<Dispatch> dispatch_;
  std::string loadError_;
  std::string catalogError_;
  PlatformProvider platform_;
  Cleanup cleanup_;

  std::mutex gateMu_;
  std::condition_variable gateCv_;
  int inFlight_ = 0;
  bool shut_ = false;
  std::vector<CleanupRecord> cleanups_;
};

}  // namespace nrv::host

#endif  // NRV_HOST_HOST_H

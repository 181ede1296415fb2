// Broker: the host's CMPIBroker — up-calls routed back into the host, the encapsulated-object
// factory, OS services and memory services — handed to every MI factory of the module.
//
// Contract: the Router must outlive the Broker. Destroying the Broker frees every CMPI object
// still live that was made on its behalf, so MIs must have been cleaned up first. The broker
// can be used from any thread; up-calls run on the calling thread.
#ifndef NRV_HOST_BROKER_H
#define NRV_HOST_BROKER_H

#include <map>
#include <mutex>
#include <string>

#include "cmpift.h"
#include "host/Request.h"

namespace nrv::host {

class Router {
 public:
  virtual ~Router() = default;
  virtual Outcome route(const Request& request) = 0;
};

class Broker {
 public:
  explicit Broker(Router& router);
  Broker(const Broker&) = delete;
  Broker& operator=(const Broker&) = delete;
  ~Broker();

  const CMPIBroker* cmpi() const { return &broker_; }
  // The live Broker behind a handle, or nullptr for a foreign or destroyed one.
  static Broker* from(const CMPIBroker* mb);

  Router& router() { return router_; }

  // Class hierarchy for classPathIsA: equality (case-insensitive) plus registered parents.
  void addClassParent(const std::string& child, const std::string& parent);
  bool classIsA(const std::string& className, const std::string& ancestor) const;

  // Context entries every request carries unless the caller gives its own.
  static NamedData requestContext(const std::string& nameSpace);

 private:
  CMPIBroker broker_{};
  Router& router_;
  mutable std::mutex mu_;
  std::map<std::string, std::string> parents_;  // lower-case child -> parent
};

// Function tables of the broker (Broker.cpp, BrokerEnc.cpp, BrokerOs.cpp).
extern const CMPIBrokerFT kBrokerFT;
extern const CMPIBrokerEncFT kBrokerEncFT;
extern const CMPIBrokerExtFT kBrokerExtFT;
extern const CMPIBrokerMemFT kBrokerMemFT;

}  // namespace nrv::host

#endif  // NRV_HOST_BROKER_H

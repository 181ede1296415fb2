// Broker: the host's CMPIBroker — up-calls routed back into the host, the encapsulated-object
// factory, OS services and memory services — handed to every MI factory of the module.
//
// Contract: the Router must outlive the Broker. Destroying the Broker frees every CMPI object
// still live that was made on its behalf, so MIs must have been cleaned up first; it waits for
// up-calls in progress, and a module thread that calls the broker afterwards is refused with
// CMPI_RC_ERR_INVALID_HANDLE (the CMPIBroker handle itself is never freed). The broker can be
// used from any thread; up-calls run on the calling thread.
#ifndef NRV_HOST_BROKER_H
#define NRV_HOST_BROKER_H

#include <atomic>
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

class Broker;

// Keeps a live Broker from being destroyed while an up-call uses it.
class BrokerRef {
 public:
  BrokerRef() = default;
  explicit BrokerRef(Broker* broker) : broker_(broker) {}
  BrokerRef(BrokerRef&& other) noexcept : broker_(other.broker_) { other.broker_ = nullptr; }
  BrokerRef(const BrokerRef&) = delete;
  BrokerRef& operator=(const BrokerRef&) = delete;
  BrokerRef& operator=(BrokerRef&&) = delete;
  ~BrokerRef();

  explicit operator bool() const { return broker_ != nullptr; }
  Broker* operator->() const { return broker_; }
  Broker& operator*() const { return *broker_; }

 private:
  Broker* broker_ = nullptr;
};

class Broker {
 public:
  explicit Broker(Router& router);
  Broker(const Broker&) = delete;
  Broker& operator=(const Broker&) = delete;
  ~Broker();

  const CMPIBroker* cmpi() const { return broker_; }
  // Whether a handle belongs to a live Broker (false for foreign or destroyed ones).
  static bool isLive(const CMPIBroker* mb);
  // The live Broker behind a handle, held until the reference goes; empty when none.
  static BrokerRef acquire(const CMPIBroker* mb);

  // Threads attached through attachThread and not detached yet.
  int attachedThreads() const { return attached_.load(); }
  void noteAttach(int delta) { attached_ += delta; }

  Router& router() { return router_; }

  // Class hierarchy for classPathIsA: equality (case-insensitive) plus registered parents.
  void addClassParent(const std::string& child, const std::string& parent);
  bool classIsA(const std::string& className, const std::string& ancestor) const;

  // Context entries every request carries unless the caller gives its own.
  static NamedData requestContext(const std::string& nameSpace);

 private:
  friend class BrokerRef;
  CMPIBroker* broker_;  // from a pool that is never freed, see the contract
  Router& router_;
  int active_ = 0;      // BrokerRefs alive; guarded by the broker list's mutex
  std::atomic<int> attached_{0};
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

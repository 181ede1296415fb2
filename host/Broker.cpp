// Broker: construction, the class table and the up-call table (CMPIBrokerFT).
#include "host/Broker.h"

#include <pwd.h>
#include <unistd.h>

#include <algorithm>
#include <condition_variable>
#include <memory>
#include <set>
#include <vector>

#include "host/EncObjects.h"

namespace nrv::host {

namespace {

// Never destroyed: module threads may still look brokers up while the process exits.
struct BrokerList {
  std::mutex mu;
  std::condition_variable idle;
  std::set<const Broker*> live;
  std::vector<std::unique_ptr<CMPIBroker>> handles;  // every handle ever given out
};

BrokerList& brokers() {
  static BrokerList* list = new BrokerList();
  return *list;
}

// The platform classes the host serves itself, and their CIM ancestry.
constexpr const char* kDefaultParents[][2] = {
    {"KVLD_ComputerSystem", "CIM_ComputerSystem"},
    {"CIM_ComputerSystem", "CIM_System"},
    {"CIM_System", "CIM_EnabledLogicalElement"},
    {"CIM_EnabledLogicalElement", "CIM_LogicalElement"},
    {"CIM_LogicalElement", "CIM_ManagedSystemElement"},
    {"KVLD_Chassis", "CIM_Chassis"},
    {"CIM_Chassis", "CIM_PhysicalFrame"},
    {"CIM_PhysicalFrame", "CIM_PhysicalPackage"},
    {"CIM_PhysicalPackage", "CIM_PhysicalElement"},
    {"CIM_PhysicalElement", "CIM_ManagedSystemElement"},
    {"CIM_ManagedSystemElement", "CIM_ManagedElement"},
    {"PG_RegisteredProfile", "CIM_RegisteredProfile"},
    {"CIM_RegisteredProfile", "CIM_ManagedElement"},
};

std::string principal() {
  if (const char* p = std::getenv("NRV_HOST_PRINCIPAL"); p != nullptr && *p != '\0') return p;
  passwd pw{};
  passwd* found = nullptr;
  char buf[1024];
  if (getpwuid_r(geteuid(), &pw, buf, sizeof buf, &found) == 0 && found != nullptr) {
    return found->pw_name;
  }
  return "root";
}

void setFailure(CMPIStatus* rc, const Broker& broker, const Outcome& outcome) {
  if (rc == nullptr) return;
  rc->rc = outcome.rc;
  rc->msg = outcome.message.empty() ? nullptr : makeString(broker.cmpi(), outcome.message);
}

// Common part of every client up-call: check the handles, then route the request with the
// caller's context entries.
std::optional<Outcome> upcall(const CMPIBroker* mb, const CMPIContext* ctx,
                              const CMPIObjectPath* op, Request& request, CMPIStatus* rc) {
  BrokerRef broker = Broker::acquire(mb);
  if (!broker) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return std::nullopt;
  }
  auto path = pathOf(op);
  if (!path) {
    setStatus(rc, CMPI_RC_ERR_INVALID_PARAMETER);
    return std::nullopt;
  }
  request.path = std::move(*path);
  request.context = contextOf(ctx).value_or(Broker::requestContext(request.path.nameSpace));
  setNamed(request.context, CMPIInitNameSpace, Datum::string(request.path.nameSpace));
  Outcome outcome = broker->router().route(request);
  if (outcome.ok()) {
    setStatus(rc, CMPI_RC_OK);
  } else {
    setFailure(rc, *broker, outcome);
  }
  return outcome;
}

PropertyList propertyList(const char** props) {
  if (props == nullptr) return std::nullopt;
  std::vector<std::string> names;
  for (; *props != nullptr; ++props) names.emplace_back(*props);
  return names;
}

std::optional<std::string> optionalName(const char* s) {
  return s == nullptr ? std::nullopt : std::optional<std::string>(s);
}

CMPIEnumeration* enumerationUpcall(const CMPIBroker* mb, const CMPIContext* ctx,
                                   const CMPIObjectPath* op, Request& request, CMPIStatus* rc) {
  auto outcome = upcall(mb, ctx, op, request, rc);
  if (!outcome || !outcome->ok()) return nullptr;
  return makeEnumeration(mb, std::move(outcome->items));
}

// ---- thread attachment --------------------------------------------------------------------
CMPIContext* prepareAttachThread(const CMPIBroker* mb, const CMPIContext* ctx) {
  auto data = contextOf(ctx);
  if (!Broker::isLive(mb) || !data) return nullptr;
  // Outlives the request that prepares it; detachThread releases it.
  return makeContext(mb, std::move(*data), true, true);
}

CMPIStatus attachThread(const CMPIBroker* mb, const CMPIContext* ctx) {
  BrokerRef broker = Broker::acquire(mb);
  if (!broker) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  if (!contextOf(ctx)) return makeStatus(CMPI_RC_ERR_INVALID_PARAMETER);
  broker->noteAttach(1);
  attachThreadArena();
  return makeStatus(CMPI_RC_OK);
}

CMPIStatus detachThread(const CMPIBroker* mb, const CMPIContext* ctx) {
  BrokerRef broker = Broker::acquire(mb);
  if (!broker) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  auto* context = ObjectRegistry::instance().find<EncContext>(ctx);
  if (context == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_PARAMETER);
  if (context->prepared) ObjectRegistry::instance().release(ctx);
  if (!detachThreadArena()) return makeStatus(CMPI_RC_ERR_FAILED);
  broker->noteAttach(-1);
  return makeStatus(CMPI_RC_OK);
}

// The host has no indication consumers; an indication is accepted and dropped.
CMPIStatus deliverIndication(const CMPIBroker* mb, const CMPIContext*, const char* ns,
                             const CMPIInstance* ind) {
  if (!Broker::isLive(mb)) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  if (ns == nullptr || !instanceOf(ind)) return makeStatus(CMPI_RC_ERR_INVALID_PARAMETER);
  return makeStatus(CMPI_RC_OK);
}

// ---- client operations --------------------------------------------------------------------
CMPIEnumeration* enumNames(const CMPIBroker* mb, const CMPIContext* ctx,
                           const CMPIObjectPath* op, CMPIStatus* rc) {
  Request r;
  r.op = Operation::EnumerateInstanceNames;
  return enumerationUpcall(mb, ctx, op, r, rc);
}

CMPIEnumeration* enumInstances(const CMPIBroker* mb, const CMPIContext* ctx,
                               const CMPIObjectPath* op, const char** props, CMPIStatus* rc) {
  Request r;
  r.op = Operation::EnumerateInstances;
  r.properties = propertyList(props);
  return enumerationUpcall(mb, ctx, op, r, rc);
}

CMPIInstance* getInstance(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIObjectPath* op,
                          const char** props, CMPIStatus* rc) {
  Request r;
  r.op = Operation::GetInstance;
  r.properties = propertyList(props);
  auto outcome = upcall(mb, ctx, op, r, rc);
  if (!outcome || !outcome->ok()) return nullptr;
  for (const Datum& item : outcome->items) {
    if (item.type == CMPI_instance && !item.isNull) return makeInstance(mb, *item.instance());
  }
  setStatus(rc, CMPI_RC_ERR_NOT_FOUND);
  return nullptr;
}

CMPIObjectPath* createInstance(const CMPIBroker* mb, const CMPIContext* ctx,
                               const CMPIObjectPath* op, const CMPIInstance* inst,
                               CMPIStatus* rc) {
  auto instance = instanceOf(inst);
  if (!instance) {
    setStatus(rc, CMPI_RC_ERR_INVALID_PARAMETER);
    return nullptr;
  }
  Request r;
  r.op = Operation::CreateInstance;
  r.instance = std::move(*instance);
  auto outcome = upcall(mb, ctx, op, r, rc);
  if (!outcome || !outcome->ok()) return nullptr;
  for (const Datum& item : outcome->items) {
    if (item.type == CMPI_ref && !item.isNull) return makeObjectPath(mb, *item.path());
  }
  return makeObjectPath(mb, r.path);
}

CMPIStatus modifyInstance(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIObjectPath* op,
                          const CMPIInstance* inst, const char** props) {
  auto instance = instanceOf(inst);
  if (!instance) return makeStatus(CMPI_RC_ERR_INVALID_PARAMETER);
  Request r;
  r.op = Operation::ModifyInstance;
  r.instance = std::move(*instance);
  r.properties = propertyList(props);
  CMPIStatus st = makeStatus(CMPI_RC_OK);
  upcall(mb, ctx, op, r, &st);
  return st;
}

CMPIStatus deleteInstance(const CMPIBroker* mb, const CMPIContext* ctx,
                          const CMPIObjectPath* op) {
  Request r;
  r.op = Operation::DeleteInstance;
  CMPIStatus st = makeStatus(CMPI_RC_OK);
  upcall(mb, ctx, op, r, &st);
  return st;
}

CMPIEnumeration* execQuery(const CMPIBroker* mb, const CMPIContext* ctx,
                           const CMPIObjectPath* op, const char* query, const char* lang,
                           CMPIStatus* rc) {
  Request r;
  r.op = Operation::ExecQuery;
  r.query = query == nullptr ? "" : query;
  r.queryLanguage = lang == nullptr ? "" : lang;
  return enumerationUpcall(mb, ctx, op, r, rc);
}

CMPIEnumeration* associators(const CMPIBroker* mb, const CMPIContext* ctx,
                             const CMPIObjectPath* op, const char* assocClass,
                             const char* resultClass, const char* role, const char* resultRole,
                             const char** props, CMPIStatus* rc) {
  Request r;
  r.op = Operation::Associators;
  r.assocClass = optionalName(assocClass);
  r.resultClass = optionalName(resultClass);
  r.role = optionalName(role);
  r.resultRole = optionalName(resultRole);
  r.properties = propertyList(props);
  return enumerationUpcall(mb, ctx, op, r, rc);
}

CMPIEnumeration* associatorNames(const CMPIBroker* mb, const CMPIContext* ctx,
                                 const CMPIObjectPath* op, const char* assocClass,
                                 const char* resultClass, const char* role,
                                 const char* resultRole, CMPIStatus* rc) {
  Request r;
  r.op = Operation::AssociatorNames;
  r.assocClass = optionalName(assocClass);
  r.resultClass = optionalName(resultClass);
  r.role = optionalName(role);
  r.resultRole = optionalName(resultRole);
  return enumerationUpcall(mb, ctx, op, r, rc);
}

CMPIEnumeration* references(const CMPIBroker* mb, const CMPIContext* ctx,
                            const CMPIObjectPath* op, const char* resultClass, const char* role,
                            const char** props, CMPIStatus* rc) {
  Request r;
  r.op = Operation::References;
  r.resultClass = optionalName(resultClass);
  r.role = optionalName(role);
  r.properties = propertyList(props);
  return enumerationUpcall(mb, ctx, op, r, rc);
}

CMPIEnumeration* referenceNames(const CMPIBroker* mb, const CMPIContext* ctx,
                                const CMPIObjectPath* op, const char* resultClass,
                                const char* role, CMPIStatus* rc) {
  Request r;
  r.op = Operation::ReferenceNames;
  r.resultClass = optionalName(resultClass);
  r.role = optionalName(role);
  return enumerationUpcall(mb, ctx, op, r, rc);
}

CMPIData invokeMethod(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIObjectPath* op,
                      const char* method, const CMPIArgs* in, CMPIArgs* out, CMPIStatus* rc) {
  auto* outArgs = ObjectRegistry::instance().find<EncArgs>(out);
  auto inArgs = in == nullptr ? std::optional<NamedData>(NamedData{}) : argsOf(in);
  if (method == nullptr || !inArgs || (out != nullptr && outArgs == nullptr)) {
    setStatus(rc, !Broker::isLive(mb) ? CMPI_RC_ERR_INVALID_HANDLE
                                              : CMPI_RC_ERR_INVALID_PARAMETER);
    return badData();
  }
  Request r;
  r.op = Operation::InvokeMethod;
  r.method = method;
  r.inArgs = std::move(*inArgs);
  auto outcome = upcall(mb, ctx, op, r, rc);
  if (!outcome || !outcome->ok()) return badData();
  if (outArgs != nullptr) {
    for (auto& [name, value] : outcome->outArgs) setNamed(outArgs->data, name, value);
  }
  return datumToCmpi(mb, outcome->returnValue);
}

// Single-property access goes through getInstance and modifyInstance of the whole instance.
CMPIStatus setProperty(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIObjectPath* op,
                       const char* name, const CMPIValue* value, CMPIType type) {
  Datum d;
  if (name == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_PARAMETER);
  if (const CMPIrc conv = datumFromCmpi(value, type, d); conv != CMPI_RC_OK) {
    return makeStatus(conv);
  }
  Request r;
  r.op = Operation::ModifyInstance;
  r.properties = std::vector<std::string>{name};
  CMPIStatus st = makeStatus(CMPI_RC_OK);
  auto path = pathOf(op);
  if (path) {
    r.instance.path = *path;
    r.instance.properties.emplace_back(name, std::move(d));
  }
  upcall(mb, ctx, op, r, &st);
  return st;
}

CMPIData getProperty(const CMPIBroker* mb, const CMPIContext* ctx, const CMPIObjectPath* op,
                     const char* name, CMPIStatus* rc) {
  if (name == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_PARAMETER);
    return badData();
  }
  Request r;
  r.op = Operation::GetInstance;
  r.properties = std::vector<std::string>{name};
  auto outcome = upcall(mb, ctx, op, r, rc);
  if (!outcome || !outcome->ok()) return badData();
  for (const Datum& item : outcome->items) {
    if (item.type == CMPI_instance && !item.isNull) {
      return namedGet(mb, item.instance()->properties, name, rc);
    }
  }
  setStatus(rc, CMPI_RC_ERR_NOT_FOUND);
  return badData();
}

}  // namespace

const CMPIBrokerFT kBrokerFT = {
    CMPI_MB_BasicRead | CMPI_MB_BasicWrite | CMPI_MB_InstanceManipulation |
        CMPI_MB_AssociationTraversal | CMPI_MB_OSEncapsulationSupport |
        CMPI_MB_Supports_MemEnhancements,
    CMPIVersion200,
    "nrv-host",
    prepareAttachThread,
    attachThread,
    detachThread,
    deliverIndication,
    enumNames,
    getInstance,
    createInstance,
    modifyInstance,
    deleteInstance,
    execQuery,
    enumInstances,
    associators,
    associatorNames,
    references,
    referenceNames,
    invokeMethod,
    setProperty,
    getProperty,
};

Broker::Broker(Router& router) : router_(router) {
  BrokerList& list = brokers();
  std::lock_guard<std::mutex> lock(list.mu);
  list.handles.push_back(std::make_unique<CMPIBroker>());
  broker_ = list.handles.back().get();
  broker_->hdl = this;
  broker_->bft = &kBrokerFT;
  broker_->eft = &kBrokerEncFT;
  broker_->xft = &kBrokerExtFT;
  broker_->mft = &kBrokerMemFT;
  for (const auto& p : kDefaultParents) parents_[lowerName(p[0])] = p[1];
  list.live.insert(this);
}

Broker::~Broker() {
  {
    BrokerList& list = brokers();
    std::unique_lock<std::mutex> lock(list.mu);
    list.live.erase(this);
    list.idle.wait(lock, [this] { return active_ == 0; });
    broker_->hdl = nullptr;
  }
  ObjectRegistry::instance().freeOwner(broker_);
}

bool Broker::isLive(const CMPIBroker* mb) {
  if (mb == nullptr) return false;
  BrokerList& list = brokers();
  std::lock_guard<std::mutex> lock(list.mu);
  for (const Broker* b : list.live) {
    if (b->broker_ == mb) return true;
  }
  return false;
}

BrokerRef Broker::acquire(const CMPIBroker* mb) {
  if (mb == nullptr) return BrokerRef();
  BrokerList& list = brokers();
  std::lock_guard<std::mutex> lock(list.mu);
  for (const Broker* b : list.live) {
    if (b->broker_ == mb) {
      Broker* live = const_cast<Broker*>(b);
      ++live->active_;
      return BrokerRef(live);
    }
  }
  return BrokerRef();
}

BrokerRef::~BrokerRef() {
  if (broker_ == nullptr) return;
  BrokerList& list = brokers();
  std::lock_guard<std::mutex> lock(list.mu);
  if (--broker_->active_ == 0) list.idle.notify_all();
}

void Broker::addClassParent(const std::string& child, const std::string& parent) {
  std::lock_guard<std::mutex> lock(mu_);
  parents_[lowerName(child)] = parent;
}

bool Broker::classIsA(const std::string& className, const std::string& ancestor) const {
  std::lock_guard<std::mutex> lock(mu_);
  std::string current = lowerName(className);
  const std::string wanted = lowerName(ancestor);
  // Bounded walk: a cyclic table must not hang the broker.
  for (size_t depth = 0; depth <= parents_.size(); ++depth) {
    if (current == wanted) return true;
    auto it = parents_.find(current);
    if (it == parents_.end()) return false;
    current = lowerName(it->second);
  }
  return false;
}

NamedData Broker::requestContext(const std::string& nameSpace) {
  NamedData ctx;
  ctx.emplace_back(CMPIPrincipal, Datum::string(principal()));
  ctx.emplace_back(CMPIInitNameSpace, Datum::string(nameSpace));
  ctx.emplace_back(CMPIInvocationFlags, Datum::unsignedInt(CMPI_uint32, 0));
  ctx.emplace_back(CMPIRole, Datum::string(""));
  ctx.emplace_back(CMPIAcceptLanguage, Datum::string(""));
  ctx.emplace_back(CMPIContentLanguage, Datum::string(""));
  return ctx;
}

}  // namespace nrv::host

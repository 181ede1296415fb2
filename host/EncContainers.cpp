// EncContainers: the host broker's CMPIArgs, CMPIContext and CMPIResult.
#include "host/EncObjects.h"

namespace nrv::host {

namespace {

ObjectRegistry& registry() { return ObjectRegistry::instance(); }

// Args and contexts are both named value lists; one set of functions serves both tables.
template <typename T, typename H>
struct NamedList {
  static CMPIStatus release(H* h) {
    if (registry().find<T>(h) == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
    registry().release(h);
    return makeStatus(CMPI_RC_OK);
  }
  static CMPIData get(const H* h, const char* name, CMPIStatus* rc) {
    auto* o = registry().find<T>(h);
    if (o == nullptr) {
      setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
      return badData();
    }
    return namedGet(o->owner(), o->data, name, rc);
  }
  static CMPIData getAt(const H* h, CMPICount index, CMPIString** name, CMPIStatus* rc) {
    auto* o = registry().find<T>(h);
    if (o == nullptr) {
      setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
      return badData();
    }
    return namedAt(o->owner(), o->data, index, name, rc);
  }
  static CMPICount count(const H* h, CMPIStatus* rc) {
    auto* o = registry().find<T>(h);
    setStatus(rc, o == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_OK);
    return o == nullptr ? 0 : static_cast<CMPICount>(o->data.size());
  }
  static CMPIStatus add(const H* h, const char* name, const CMPIValue* value,
                        const CMPIType type) {
    auto* o = registry().find<T>(h);
    if (o == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
    if (name == nullptr || *name == '\0') return makeStatus(CMPI_RC_ERR_INVALID_PARAMETER);
    Datum d;
    const CMPIrc rc = datumFromCmpi(value, type, d);
    if (rc != CMPI_RC_OK) return makeStatus(rc);
    setNamed(o->data, name, std::move(d));
    return makeStatus(CMPI_RC_OK);
  }
};

using ArgsList = NamedList<EncArgs, CMPIArgs>;
using ContextList = NamedList<EncContext, CMPIContext>;

CMPIArgs* argsClone(const CMPIArgs* as, CMPIStatus* rc) {
  auto* o = registry().find<EncArgs>(as);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return nullptr;
  }
  setStatus(rc, CMPI_RC_OK);
  return makeArgs(o->owner(), o->data, true);
}

const CMPIArgsFT kArgsFT = {CMPIVersion200, ArgsList::release, argsClone,     ArgsList::add,
                            ArgsList::get,  ArgsList::getAt,   ArgsList::count};

CMPIContext* contextClone(const CMPIContext* ctx, CMPIStatus* rc) {
  auto* o = registry().find<EncContext>(ctx);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return nullptr;
  }
  setStatus(rc, CMPI_RC_OK);
  return makeContext(o->owner(), o->data, false, true);
}

const CMPIContextFT kContextFT = {CMPIVersion200,     ContextList::release, contextClone,
                                  ContextList::get,   ContextList::getAt,   ContextList::count,
                                  ContextList::add};

// ---- CMPIResult ---------------------------------------------------------------------------
CMPIStatus resultRelease(CMPIResult* r) {
  if (registry().find<EncResult>(r) == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  registry().release(r);
  return makeStatus(CMPI_RC_OK);
}

// A result belongs to one call; cloning it is not offered.
CMPIResult* resultClone(const CMPIResult* r, CMPIStatus* rc) {
  setStatus(rc, registry().find<EncResult>(r) == nullptr ? CMPI_RC_ERR_INVALID_HANDLE
                                                         : CMPI_RC_ERR_NOT_SUPPORTED);
  return nullptr;
}

CMPIStatus deliver(const CMPIResult* r, Datum item) {
  auto* o = registry().find<EncResult>(r);
  if (o == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  std::lock_guard<std::mutex> lock(o->sink->mu);
  o->sink->items.push_back(std::move(item));
  return makeStatus(CMPI_RC_OK);
}

CMPIStatus returnData(const CMPIResult* r, const CMPIValue* value, const CMPIType type) {
  if (registry().find<EncResult>(r) == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  Datum d;
  const CMPIrc rc = datumFromCmpi(value, type, d);
  if (rc != CMPI_RC_OK) return makeStatus(rc);
  return deliver(r, std::move(d));
}

CMPIStatus returnInstance(const CMPIResult* r, const CMPIInstance* inst) {
  if (registry().find<EncResult>(r) == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  auto data = sharedInstanceOf(inst);
  if (!data) return makeStatus(CMPI_RC_ERR_INVALID_PARAMETER);
  return deliver(r, Datum::embedded(std::move(data)));
}

CMPIStatus returnObjectPath(const CMPIResult* r, const CMPIObjectPath* op) {
  if (registry().find<EncResult>(r) == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  auto data = pathOf(op);
  if (!data) return makeStatus(CMPI_RC_ERR_INVALID_PARAMETER);
  return deliver(r, Datum::reference(std::move(*data)));
}

CMPIStatus returnDone(const CMPIResult* r) {
  auto* o = registry().find<EncResult>(r);
  if (o == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  std::lock_guard<std::mutex> lock(o->sink->mu);
  o->sink->done = true;
  return makeStatus(CMPI_RC_OK);
}

// The broker offers no extended errors (no CMPI_MB_Supports_Extended_Error).
CMPIStatus returnError(const CMPIResult* r, const CMPIError*) {
  return makeStatus(registry().find<EncResult>(r) == nullptr ? CMPI_RC_ERR_INVALID_HANDLE
                                                             : CMPI_RC_ERR_NOT_SUPPORTED);
}

const CMPIResultFT kResultFT = {CMPIVersion200, resultRelease,    resultClone, returnData,
                                returnInstance, returnObjectPath, returnDone,  returnError};

}  // namespace

EncArgs::EncArgs(const void* owner, NamedData d) : EncBase(owner, &kArgsFT), data(std::move(d)) {}

EncContext::EncContext(const void* owner, NamedData d, bool isPrepared)
    : EncBase(owner, &kContextFT), data(std::move(d)), prepared(isPrepared) {}

EncResult::EncResult(const void* owner, std::shared_ptr<ResultSink> s)
    : EncBase(owner, &kResultFT), sink(std::move(s)) {}

CMPIArgs* makeArgs(const void* owner, NamedData data, bool detached) {
  return registry().adopt(std::make_unique<EncArgs>(owner, std::move(data)), detached)->cmpi();
}

CMPIContext* makeContext(const void* owner, NamedData data, bool prepared, bool detached) {
  return registry()
      .adopt(std::make_unique<EncContext>(owner, std::move(data), prepared), detached)
      ->cmpi();
}

CMPIResult* makeResult(const void* owner, std::shared_ptr<ResultSink> sink) {
  return registry().adopt(std::make_unique<EncResult>(owner, std::move(sink)))->cmpi();
}

}  // namespace nrv::host

// EncPath: the host broker's CMPIObjectPath.
#include "host/EncObjects.h"
#include "host/PathText.h"

namespace nrv::host {

namespace {

ObjectRegistry& registry() { return ObjectRegistry::instance(); }

EncObjectPath* live(const CMPIObjectPath* op) { return registry().find<EncObjectPath>(op); }

CMPIStatus pathRelease(CMPIObjectPath* op) {
  if (live(op) == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  registry().release(op);
  return makeStatus(CMPI_RC_OK);
}

CMPIObjectPath* pathClone(const CMPIObjectPath* op, CMPIStatus* rc) {
  auto* o = live(op);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return nullptr;
  }
  setStatus(rc, CMPI_RC_OK);
  return makeObjectPath(o->owner(), o->data, true);
}

// The three text components share one setter and one getter.
using Component = std::string PathData::*;

CMPIStatus setComponent(const CMPIObjectPath* op, const char* value, Component field) {
  auto* o = live(op);
  if (o == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  if (value == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_PARAMETER);
  o->data.*field = value;
  return makeStatus(CMPI_RC_OK);
}

CMPIString* getComponent(const CMPIObjectPath* op, CMPIStatus* rc, Component field) {
  auto* o = live(op);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return nullptr;
  }
  setStatus(rc, CMPI_RC_OK);
  return makeString(o->owner(), o->data.*field);
}

CMPIStatus setNameSpace(const CMPIObjectPath* op, const char* ns) {
  return setComponent(op, ns, &PathData::nameSpace);
}
CMPIString* getNameSpace(const CMPIObjectPath* op, CMPIStatus* rc) {
  return getComponent(op, rc, &PathData::nameSpace);
}
CMPIStatus setHostname(const CMPIObjectPath* op, const char* hn) {
  return setComponent(op, hn, &PathData::host);
}
CMPIString* getHostname(const CMPIObjectPath* op, CMPIStatus* rc) {
  return getComponent(op, rc, &PathData::host);
}
CMPIStatus setClassName(const CMPIObjectPath* op, const char* cn) {
  return setComponent(op, cn, &PathData::className);
}
CMPIString* getClassName(const CMPIObjectPath* op, CMPIStatus* rc) {
  return getComponent(op, rc, &PathData::className);
}

CMPIStatus addKey(const CMPIObjectPath* op, const char* name, const CMPIValue* value,
                  const CMPIType type) {
  auto* o = live(op);
  if (o == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  if (name == nullptr || *name == '\0') return makeStatus(CMPI_RC_ERR_INVALID_PARAMETER);
  Datum d;
  const CMPIrc rc = datumFromCmpi(value, type, d);
  if (rc != CMPI_RC_OK) return makeStatus(rc);
  setNamed(o->data.keys, name, std::move(d));
  return makeStatus(CMPI_RC_OK);
}

CMPIData getKey(const CMPIObjectPath* op, const char* name, CMPIStatus* rc) {
  auto* o = live(op);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return badData();
  }
  return namedGet(o->owner(), o->data.keys, name, rc, CMPI_keyValue);
}

CMPIData getKeyAt(const CMPIObjectPath* op, CMPICount index, CMPIString** name,
                  CMPIStatus* rc) {
  auto* o = live(op);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return badData();
  }
  CMPIData d = namedAt(o->owner(), o->data.keys, index, name, rc);
  if ((d.state & CMPI_badValue) == 0) d.state = static_cast<CMPIValueState>(d.state | CMPI_keyValue);
  return d;
}

CMPICount getKeyCount(const CMPIObjectPath* op, CMPIStatus* rc) {
  auto* o = live(op);
  setStatus(rc, o == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_OK);
  return o == nullptr ? 0 : static_cast<CMPICount>(o->data.keys.size());
}

CMPIStatus copyFrom(const CMPIObjectPath* op, const CMPIObjectPath* src, bool withHost) {
  auto* o = live(op);
  if (o == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  auto* s = live(src);
  if (s == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_PARAMETER);
  o->data.nameSpace = s->data.nameSpace;
  if (withHost) o->data.host = s->data.host;
  return makeStatus(CMPI_RC_OK);
}

CMPIStatus setNameSpaceFromObjectPath(const CMPIObjectPath* op, const CMPIObjectPath* src) {
  return copyFrom(op, src, false);
}

CMPIStatus setHostAndNameSpaceFromObjectPath(const CMPIObjectPath* op,
                                             const CMPIObjectPath* src) {
  return copyFrom(op, src, true);
}

// The host keeps no class schema, so it knows no qualifiers.
CMPIData noQualifier(const CMPIObjectPath* op, CMPIStatus* rc) {
  setStatus(rc, live(op) == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_ERR_NOT_SUPPORTED);
  return badData();
}
CMPIData classQualifier(const CMPIObjectPath* op, const char*, CMPIStatus* rc) {
  return noQualifier(op, rc);
}
CMPIData propertyQualifier(const CMPIObjectPath* op, const char*, const char*, CMPIStatus* rc) {
  return noQualifier(op, rc);
}
CMPIData methodQualifier(const CMPIObjectPath* op, const char*, const char*, CMPIStatus* rc) {
  return noQualifier(op, rc);
}
CMPIData parameterQualifier(const CMPIObjectPath* op, const char*, const char*, const char*,
                            CMPIStatus* rc) {
  return noQualifier(op, rc);
}

CMPIString* pathToString(const CMPIObjectPath* op, CMPIStatus* rc) {
  auto* o = live(op);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return nullptr;
  }
  setStatus(rc, CMPI_RC_OK);
  return makeString(o->owner(), formatPath(o->data));
}

const CMPIObjectPathFT kObjectPathFT = {
    CMPIVersion200,  pathRelease,  pathClone,    setNameSpace,
    getNameSpace,    setHostname,  getHostname,  setClassName,
    getClassName,    addKey,       getKey,       getKeyAt,
    getKeyCount,     setNameSpaceFromObjectPath, setHostAndNameSpaceFromObjectPath,
    classQualifier,  propertyQualifier,          methodQualifier,
    parameterQualifier,            pathToString};

}  // namespace

EncObjectPath::EncObjectPath(const void* owner, PathData d)
    : EncBase(owner, &kObjectPathFT), data(std::move(d)) {}

CMPIObjectPath* makeObjectPath(const void* owner, PathData data, bool detached) {
  return registry()
      .adopt(std::make_unique<EncObjectPath>(owner, std::move(data)), detached)
      ->cmpi();
}

}  // namespace nrv::host

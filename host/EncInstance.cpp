// EncInstance: the host broker's CMPIInstance. The host keeps no class schema, so any property
// name and type is accepted; only a property filter narrows what setProperty keeps.
#include "host/EncObjects.h"

namespace nrv::host {

namespace {

ObjectRegistry& registry() { return ObjectRegistry::instance(); }

EncInstance* live(const CMPIInstance* inst) { return registry().find<EncInstance>(inst); }

CMPIStatus instRelease(CMPIInstance* inst) {
  if (live(inst) == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  registry().release(inst);
  return makeStatus(CMPI_RC_OK);
}

CMPIInstance* instClone(const CMPIInstance* inst, CMPIStatus* rc) {
  auto* o = live(inst);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return nullptr;
  }
  setStatus(rc, CMPI_RC_OK);
  return makeInstance(o->owner(), o->data(), true);
}

CMPIData instGet(const CMPIInstance* inst, const char* name, CMPIStatus* rc) {
  auto* o = live(inst);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return badData();
  }
  return namedGet(o->owner(), o->data().properties, name, rc);
}

CMPIData instGetAt(const CMPIInstance* inst, CMPICount index, CMPIString** name,
                   CMPIStatus* rc) {
  auto* o = live(inst);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return badData();
  }
  return namedAt(o->owner(), o->data().properties, index, name, rc);
}

CMPICount instCount(const CMPIInstance* inst, CMPIStatus* rc) {
  auto* o = live(inst);
  setStatus(rc, o == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_OK);
  return o == nullptr ? 0 : static_cast<CMPICount>(o->data().properties.size());
}

CMPIStatus instSet(const CMPIInstance* inst, const char* name, const CMPIValue* value,
                   CMPIType type) {
  auto* o = live(inst);
  if (o == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  if (name == nullptr || *name == '\0') return makeStatus(CMPI_RC_ERR_INVALID_PARAMETER);
  Datum d;
  const CMPIrc rc = datumFromCmpi(value, type, d);
  if (rc != CMPI_RC_OK) return makeStatus(rc);
  // A filtered-out property is silently dropped, as the filter promises the caller.
  if (!o->data().admits(name)) return makeStatus(CMPI_RC_OK);
  setNamed(o->edit().properties, name, std::move(d));
  return makeStatus(CMPI_RC_OK);
}

CMPIStatus instSetWithOrigin(const CMPIInstance* inst, const char* name, const CMPIValue* value,
                             const CMPIType type, const char*) {
  return instSet(inst, name, value, type);
}

// The instance path's keys follow the key properties set since the path was given.
PathData currentPath(const InstanceData& data) {
  PathData path = data.path;
  for (auto& [name, value] : path.keys) {
    if (const Datum* p = findNamed(data.properties, name); p != nullptr && !p->isNull) value = *p;
  }
  return path;
}

CMPIObjectPath* instPath(const CMPIInstance* inst, CMPIStatus* rc) {
  auto* o = live(inst);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return nullptr;
  }
  setStatus(rc, CMPI_RC_OK);
  return makeObjectPath(o->owner(), currentPath(o->data()));
}

CMPIStatus instSetPath(const CMPIInstance* inst, const CMPIObjectPath* op) {
  auto* o = live(inst);
  if (o == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  auto path = pathOf(op);
  if (!path) return makeStatus(CMPI_RC_ERR_INVALID_PARAMETER);
  o->edit().path = std::move(*path);
  return makeStatus(CMPI_RC_OK);
}

std::vector<std::string> nameList(const char** list) {
  std::vector<std::string> out;
  for (; list != nullptr && *list != nullptr; ++list) out.emplace_back(*list);
  return out;
}

CMPIStatus instSetFilter(const CMPIInstance* inst, const char** props, const char** keys) {
  auto* o = live(inst);
  if (o == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  InstanceData& edit = o->edit();
  if (props == nullptr) {
    edit.filter.reset();
    edit.filterKeys.clear();
    return makeStatus(CMPI_RC_OK);
  }
  edit.filter = nameList(props);
  edit.filterKeys = nameList(keys);
  NamedData kept;
  for (auto& entry : edit.properties) {
    if (edit.admits(entry.first)) kept.push_back(std::move(entry));
  }
  edit.properties = std::move(kept);
  return makeStatus(CMPI_RC_OK);
}

const CMPIInstanceFT kInstanceFT = {CMPIVersion200, instRelease, instClone,   instGet,
                                    instGetAt,      instCount,   instSet,     instPath,
                                    instSetFilter,  instSetPath, instSetWithOrigin};

}  // namespace

EncInstance::EncInstance(const void* owner, InstanceData d)
    : EncBase(owner, &kInstanceFT), data_(std::move(d)) {}

CMPIInstance* makeInstance(const void* owner, InstanceData data, bool detached) {
  return registry().adopt(std::make_unique<EncInstance>(owner, std::move(data)), detached)->cmpi();
}

}  // namespace nrv::host

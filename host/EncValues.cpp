// EncValues: CMPIString, CMPIDateTime, CMPIArray and CMPIEnumeration of the host broker.
#include "host/EncObjects.h"

namespace nrv::host {

namespace {

ObjectRegistry& registry() { return ObjectRegistry::instance(); }

template <typename T, typename H>
CMPIStatus releaseObject(H* handle) {
  if (registry().find<T>(handle) == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  registry().release(handle);
  return makeStatus(CMPI_RC_OK);
}

// ---- CMPIString ---------------------------------------------------------------------------
CMPIStatus stringRelease(CMPIString* s) { return releaseObject<EncString>(s); }

CMPIString* stringClone(const CMPIString* s, CMPIStatus* rc) {
  auto* o = registry().find<EncString>(s);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return nullptr;
  }
  setStatus(rc, CMPI_RC_OK);
  return makeString(o->owner(), o->text(), true);
}

const char* stringChars(const CMPIString* s, CMPIStatus* rc) {
  auto* o = registry().find<EncString>(s);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return nullptr;
  }
  setStatus(rc, CMPI_RC_OK);
  return o->text().c_str();
}

const CMPIStringFT kStringFT = {CMPIVersion200, stringRelease, stringClone, stringChars};

// ---- CMPIDateTime -------------------------------------------------------------------------
CMPIStatus dateTimeRelease(CMPIDateTime* d) { return releaseObject<EncDateTime>(d); }

CMPIDateTime* dateTimeClone(const CMPIDateTime* d, CMPIStatus* rc) {
  auto* o = registry().find<EncDateTime>(d);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return nullptr;
  }
  setStatus(rc, CMPI_RC_OK);
  return makeDateTime(o->owner(), o->value, true);
}

CMPIUint64 dateTimeBinary(const CMPIDateTime* d, CMPIStatus* rc) {
  auto* o = registry().find<EncDateTime>(d);
  setStatus(rc, o == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_OK);
  return o == nullptr ? 0 : o->value.micros;
}

CMPIString* dateTimeString(const CMPIDateTime* d, CMPIStatus* rc) {
  auto* o = registry().find<EncDateTime>(d);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return nullptr;
  }
  setStatus(rc, CMPI_RC_OK);
  return makeString(o->owner(), o->value.text());
}

CMPIBoolean dateTimeIsInterval(const CMPIDateTime* d, CMPIStatus* rc) {
  auto* o = registry().find<EncDateTime>(d);
  setStatus(rc, o == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_OK);
  return (o != nullptr && o->value.interval) ? 1 : 0;
}

const CMPIDateTimeFT kDateTimeFT = {CMPIVersion200, dateTimeRelease, dateTimeClone,
                                    dateTimeBinary, dateTimeString, dateTimeIsInterval};

// ---- CMPIArray ----------------------------------------------------------------------------
CMPIStatus arrayRelease(CMPIArray* a) { return releaseObject<EncArray>(a); }

CMPIArray* arrayClone(const CMPIArray* a, CMPIStatus* rc) {
  auto* o = registry().find<EncArray>(a);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return nullptr;
  }
  setStatus(rc, CMPI_RC_OK);
  return makeArray(o->owner(), o->data(), true);
}

CMPICount arraySize(const CMPIArray* a, CMPIStatus* rc) {
  auto* o = registry().find<EncArray>(a);
  setStatus(rc, o == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_OK);
  return o == nullptr ? 0 : static_cast<CMPICount>(o->data().elements.size());
}

CMPIType arrayType(const CMPIArray* a, CMPIStatus* rc) {
  auto* o = registry().find<EncArray>(a);
  setStatus(rc, o == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_OK);
  return o == nullptr ? CMPIType(CMPI_null) : o->data().elementType;
}

CMPIData arrayGet(const CMPIArray* a, CMPICount index, CMPIStatus* rc) {
  auto* o = registry().find<EncArray>(a);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return badData();
  }
  if (index >= o->data().elements.size()) {
    setStatus(rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
    return badData();
  }
  if (!o->elementsLive()) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return badData();
  }
  setStatus(rc, CMPI_RC_OK);
  return datumToCmpi(o->owner(), o->data().elements[index]);
}

CMPIStatus arraySet(const CMPIArray* a, CMPICount index, const CMPIValue* value, CMPIType type) {
  auto* o = registry().find<EncArray>(a);
  if (o == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  if (index >= o->data().elements.size()) return makeStatus(CMPI_RC_ERR_NO_SUCH_PROPERTY);
  const CMPIType stored = type == CMPI_chars ? CMPIType(CMPI_string) : type;
  if ((type & CMPI_ARRAY) != 0 || stored != o->data().elementType) {
    return makeStatus(CMPI_RC_ERR_TYPE_MISMATCH);
  }
  Datum d;
  const CMPIrc rc = datumFromCmpi(value, type, d);
  if (rc != CMPI_RC_OK) return makeStatus(rc);
  o->edit().elements[index] = std::move(d);
  // Handles are only tracked once an object has been set: arrays of plain values need none.
  const bool object = (type & CMPI_ENC) != 0 && type != CMPI_chars && value != nullptr;
  if (object || index < o->setHandles.size()) {
    o->setHandles.resize(o->data().elements.size());
    o->setHandles[index] = object ? value->inst : nullptr;
  }
  return makeStatus(CMPI_RC_OK);
}

const CMPIArrayFT kArrayFT = {CMPIVersion200, arrayRelease, arrayClone, arraySize,
                              arrayType,      arrayGet,     arraySet};

// ---- CMPIEnumeration ----------------------------------------------------------------------
CMPIStatus enumRelease(CMPIEnumeration* e) { return releaseObject<EncEnumeration>(e); }

CMPIEnumeration* enumClone(const CMPIEnumeration* e, CMPIStatus* rc) {
  auto* o = registry().find<EncEnumeration>(e);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return nullptr;
  }
  setStatus(rc, CMPI_RC_OK);
  auto* copy = makeEnumeration(o->owner(), o->items, true);
  registry().find<EncEnumeration>(copy)->next = o->next;
  return copy;
}

CMPIData enumNext(const CMPIEnumeration* e, CMPIStatus* rc) {
  auto* o = registry().find<EncEnumeration>(e);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return badData();
  }
  if (o->next >= o->items.size()) {
    setStatus(rc, CMPI_RC_NO_MORE_ELEMENTS);
    return badData();
  }
  setStatus(rc, CMPI_RC_OK);
  return datumToCmpi(o->owner(), o->items[o->next++]);
}

CMPIBoolean enumHasNext(const CMPIEnumeration* e, CMPIStatus* rc) {
  auto* o = registry().find<EncEnumeration>(e);
  setStatus(rc, o == nullptr ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_OK);
  return (o != nullptr && o->next < o->items.size()) ? 1 : 0;
}

CMPIArray* enumToArray(const CMPIEnumeration* e, CMPIStatus* rc) {
  auto* o = registry().find<EncEnumeration>(e);
  if (o == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
    return nullptr;
  }
  ArrayData data;
  data.elementType = o->items.empty() ? CMPIType(CMPI_instance) : o->items.front().type;
  data.elements = o->items;
  setStatus(rc, CMPI_RC_OK);
  return makeArray(o->owner(), std::move(data));
}

const CMPIEnumerationFT kEnumerationFT = {CMPIVersion200, enumRelease, enumClone,
                                          enumNext,       enumHasNext, enumToArray};

}  // namespace

EncString::EncString(const void* owner, std::string text)
    : EncBase(owner, &kStringFT), text_(std::move(text)) {
  // CMGetCharPtr reads the characters straight from hdl.
  cmpi_.hdl = const_cast<char*>(text_.c_str());
}

EncDateTime::EncDateTime(const void* owner, DateTimeValue v)
    : EncBase(owner, &kDateTimeFT), value(v) {}

EncArray::EncArray(const void* owner, ArrayData d) : EncBase(owner, &kArrayFT), data_(std::move(d)) {}

bool EncArray::elementsLive() const {
  for (const void* handle : setHandles) {
    if (handle != nullptr && !registry().contains(handle)) return false;
  }
  return true;
}

EncEnumeration::EncEnumeration(const void* owner, std::vector<Datum> i)
    : EncBase(owner, &kEnumerationFT), items(std::move(i)) {}

CMPIString* makeString(const void* owner, std::string text, bool detached) {
  return registry().adopt(std::make_unique<EncString>(owner, std::move(text)), detached)->cmpi();
}

CMPIDateTime* makeDateTime(const void* owner, DateTimeValue value, bool detached) {
  return registry().adopt(std::make_unique<EncDateTime>(owner, value), detached)->cmpi();
}

CMPIArray* makeArray(const void* owner, ArrayData data, bool detached) {
  return registry().adopt(std::make_unique<EncArray>(owner, std::move(data)), detached)->cmpi();
}

CMPIEnumeration* makeEnumeration(const void* owner, std::vector<Datum> items, bool detached) {
  return registry()
      .adopt(std::make_unique<EncEnumeration>(owner, std::move(items)), detached)
      ->cmpi();
}

}  // namespace nrv::host

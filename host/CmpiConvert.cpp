// CmpiConvert: CMPI values to Datums and back, snapshots of live objects, and the indexed
// name/value access shared by the instance, object path, args and context tables.
#include "host/EncObjects.h"

#include <cstring>

namespace nrv::host {

namespace {

ObjectRegistry& registry() { return ObjectRegistry::instance(); }

bool isScalarType(CMPIType t) {
  switch (t) {
    case CMPI_boolean: case CMPI_char16: case CMPI_real32: case CMPI_real64:
    case CMPI_uint8: case CMPI_uint16: case CMPI_uint32: case CMPI_uint64:
    case CMPI_sint8: case CMPI_sint16: case CMPI_sint32: case CMPI_sint64:
    case CMPI_ptr:
      return true;
    default:
      return false;
  }
}

// Copies only the bytes of the member `type` names: callers point at a variable of that
// width (and alignment), not at a whole CMPIValue.
void copyScalar(CMPIType type, const CMPIValue* from, CMPIValue& to) {
  std::size_t size = sizeof(CMPIValuePtr);
  switch (type) {
    case CMPI_boolean: case CMPI_uint8: case CMPI_sint8: size = 1; break;
    case CMPI_char16: case CMPI_uint16: case CMPI_sint16: size = 2; break;
    case CMPI_real32: case CMPI_uint32: case CMPI_sint32: size = 4; break;
    case CMPI_real64: case CMPI_uint64: case CMPI_sint64: size = 8; break;
    default: break;
  }
  std::memcpy(&to, from, size);
}

// The element type an array of `t` stores: C strings become CMPI strings.
CMPIType storedType(CMPIType t) { return t == CMPI_chars ? CMPIType(CMPI_string) : t; }

}  // namespace

CMPIrc datumFromCmpi(const CMPIValue* value, CMPIType type, Datum& out) {
  const bool isArray = (type & CMPI_ARRAY) != 0;
  const CMPIType base = static_cast<CMPIType>(type & ~CMPI_ARRAY);
  const bool knownBase = isScalarType(base) || base == CMPI_string || base == CMPI_chars ||
                         base == CMPI_ref || base == CMPI_instance || base == CMPI_dateTime;
  if (!knownBase || (isArray && base == CMPI_ptr)) return CMPI_RC_ERR_INVALID_DATA_TYPE;
  if (value == nullptr) {
    out = Datum::null(static_cast<CMPIType>(storedType(base) | (isArray ? CMPI_ARRAY : 0)));
    return CMPI_RC_OK;
  }
  if (isArray) {
    if (value->array == nullptr) {
      out = Datum::null(static_cast<CMPIType>(storedType(base) | CMPI_ARRAY));
      return CMPI_RC_OK;
    }
    auto* a = registry().find<EncArray>(value->array);
    if (a == nullptr) return CMPI_RC_ERR_INVALID_PARAMETER;
    if (a->data().elementType != storedType(base)) return CMPI_RC_ERR_TYPE_MISMATCH;
    if (!a->elementsLive()) return CMPI_RC_ERR_INVALID_HANDLE;
    out = Datum::sharedArray(a->share());
    return CMPI_RC_OK;
  }
  if (isScalarType(base)) {
    out = Datum::null(base);
    out.isNull = false;
    copyScalar(base, value, out.scalar);
    return CMPI_RC_OK;
  }
  switch (base) {
    case CMPI_chars:
      // As CIMOMs read it (and provider code writes it): the value pointer is the C string.
      out.setText(reinterpret_cast<const char*>(value));
      return CMPI_RC_OK;
    case CMPI_string: {
      if (value->string == nullptr) {
        out = Datum::null(CMPI_string);
        return CMPI_RC_OK;
      }
      auto* s = registry().find<EncString>(value->string);
      if (s == nullptr) return CMPI_RC_ERR_INVALID_PARAMETER;
      out = Datum::string(s->text());
      return CMPI_RC_OK;
    }
    case CMPI_dateTime: {
      if (value->dateTime == nullptr) {
        out = Datum::null(CMPI_dateTime);
        return CMPI_RC_OK;
      }
      auto* d = registry().find<EncDateTime>(value->dateTime);
      if (d == nullptr) return CMPI_RC_ERR_INVALID_PARAMETER;
      out = Datum::time(d->value);
      return CMPI_RC_OK;
    }
    case CMPI_ref: {
      if (value->ref == nullptr) {
        out = Datum::null(CMPI_ref);
        return CMPI_RC_OK;
      }
      auto* p = registry().find<EncObjectPath>(value->ref);
      if (p == nullptr) return CMPI_RC_ERR_INVALID_PARAMETER;
      out = Datum::reference(p->data);
      return CMPI_RC_OK;
    }
    case CMPI_instance: {
      if (value->inst == nullptr) {
        out = Datum::null(CMPI_instance);
        return CMPI_RC_OK;
      }
      auto* i = registry().find<EncInstance>(value->inst);
      if (i == nullptr) return CMPI_RC_ERR_INVALID_PARAMETER;
      out = Datum::embedded(i->share());
      return CMPI_RC_OK;
    }
    default:
      return CMPI_RC_ERR_INVALID_DATA_TYPE;
  }
}

CMPIData datumToCmpi(const void* owner, const Datum& datum) {
  CMPIData d{};
  d.type = datum.type;
  if (datum.isNull) {
    d.state = CMPI_nullValue;
    return d;
  }
  d.state = CMPI_goodValue;
  if (datum.isArray()) {
    d.value.array = makeArray(owner, *datum.array());
    return d;
  }
  switch (datum.type) {
    case CMPI_string: d.value.string = makeString(owner, datum.text); break;
    case CMPI_dateTime: d.value.dateTime = makeDateTime(owner, datum.dateTime()); break;
    case CMPI_ref: d.value.ref = makeObjectPath(owner, *datum.path()); break;
    case CMPI_instance: d.value.inst = makeInstance(owner, *datum.instance()); break;
    default: d.value = datum.scalar; break;
  }
  return d;
}

std::optional<std::string> stringOf(const CMPIString* s) {
  auto* o = registry().find<EncString>(s);
  if (o == nullptr) return std::nullopt;
  return o->text();
}

std::optional<PathData> pathOf(const CMPIObjectPath* op) {
  auto* o = registry().find<EncObjectPath>(op);
  if (o == nullptr) return std::nullopt;
  return o->data;
}

std::optional<InstanceData> instanceOf(const CMPIInstance* inst) {
  auto* o = registry().find<EncInstance>(inst);
  if (o == nullptr) return std::nullopt;
  return o->data();
}

std::shared_ptr<const InstanceData> sharedInstanceOf(const CMPIInstance* inst) {
  auto* o = registry().find<EncInstance>(inst);
  return o == nullptr ? nullptr : o->share();
}

std::optional<NamedData> argsOf(const CMPIArgs* args) {
  auto* o = registry().find<EncArgs>(args);
  if (o == nullptr) return std::nullopt;
  return o->data;
}

std::optional<NamedData> contextOf(const CMPIContext* ctx) {
  auto* o = registry().find<EncContext>(ctx);
  if (o == nullptr) return std::nullopt;
  return o->data;
}

CMPIData namedAt(const void* owner, const NamedData& list, CMPICount index, CMPIString** name,
                 CMPIStatus* rc) {
  if (index >= list.size()) {
    setStatus(rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
    if (name != nullptr) *name = nullptr;
    return badData(CMPI_notFound | CMPI_badValue);
  }
  if (name != nullptr) *name = makeString(owner, list[index].first);
  setStatus(rc, CMPI_RC_OK);
  return datumToCmpi(owner, list[index].second);
}

CMPIData namedGet(const void* owner, const NamedData& list, const char* name, CMPIStatus* rc,
                  CMPIValueState extraState) {
  if (name == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_PARAMETER);
    return badData();
  }
  const Datum* found = findNamed(list, name);
  if (found == nullptr) {
    setStatus(rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
    return badData(CMPI_notFound | CMPI_badValue);
  }
  setStatus(rc, CMPI_RC_OK);
  CMPIData d = datumToCmpi(owner, *found);
  d.state = static_cast<CMPIValueState>(d.state | extraState);
  return d;
}

}  // namespace nrv::host

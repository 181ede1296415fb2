// BrokerEnc: the broker's encapsulated-object services (CMPIBrokerEncFT) and memory services
// (CMPIBrokerMemFT).
#include <algorithm>
#include <cstdarg>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "host/Broker.h"
#include "host/EncObjects.h"
#include "host/PathText.h"

namespace nrv::host {

namespace {

ObjectRegistry& registry() { return ObjectRegistry::instance(); }

// Every factory first checks the broker handle.
bool validBroker(const CMPIBroker* mb, CMPIStatus* rc) {
  if (Broker::isLive(mb)) return true;
  setStatus(rc, CMPI_RC_ERR_INVALID_HANDLE);
  return false;
}

template <typename T>
T* refuse(CMPIStatus* rc, CMPIrc code) {
  setStatus(rc, code);
  return nullptr;
}

// Room for a typical instance's properties and keys, so that setting them moves none.
constexpr size_t kTypicalPropertyCount = 24;
constexpr size_t kTypicalKeyCount = 4;

CMPIInstance* newInstance(const CMPIBroker* mb, const CMPIObjectPath* op, CMPIStatus* rc) {
  if (!validBroker(mb, rc)) return nullptr;
  auto path = pathOf(op);
  if (!path) return refuse<CMPIInstance>(rc, CMPI_RC_ERR_INVALID_PARAMETER);
  InstanceData data;
  data.path = std::move(*path);
  data.properties.reserve(kTypicalPropertyCount);
  setStatus(rc, CMPI_RC_OK);
  return makeInstance(mb, std::move(data));
}

CMPIObjectPath* newObjectPath(const CMPIBroker* mb, const char* ns, const char* cn,
                              CMPIStatus* rc) {
  if (!validBroker(mb, rc)) return nullptr;
  if (cn == nullptr) return refuse<CMPIObjectPath>(rc, CMPI_RC_ERR_INVALID_PARAMETER);
  PathData data;
  data.nameSpace = ns == nullptr ? "" : ns;
  data.className = cn;
  data.keys.reserve(kTypicalKeyCount);
  setStatus(rc, CMPI_RC_OK);
  return makeObjectPath(mb, std::move(data));
}

CMPIArgs* newArgs(const CMPIBroker* mb, CMPIStatus* rc) {
  if (!validBroker(mb, rc)) return nullptr;
  setStatus(rc, CMPI_RC_OK);
  return makeArgs(mb, {});
}

CMPIString* newString(const CMPIBroker* mb, const char* data, CMPIStatus* rc) {
  if (!validBroker(mb, rc)) return nullptr;
  if (data == nullptr) return refuse<CMPIString>(rc, CMPI_RC_ERR_INVALID_PARAMETER);
  setStatus(rc, CMPI_RC_OK);
  return makeString(mb, data);
}

CMPIArray* newArray(const CMPIBroker* mb, CMPICount size, CMPIType type, CMPIStatus* rc) {
  if (!validBroker(mb, rc)) return nullptr;
  CMPIType element = static_cast<CMPIType>(type & ~CMPI_ARRAY);
  if (element == CMPI_chars) element = CMPI_string;
  Datum probe;
  if (element == CMPI_null || element == CMPI_ptr ||
      datumFromCmpi(nullptr, element, probe) != CMPI_RC_OK) {
    return refuse<CMPIArray>(rc, CMPI_RC_ERR_INVALID_DATA_TYPE);
  }
  ArrayData data;
  data.elementType = element;
  data.elements.assign(size, Datum::null(element));
  setStatus(rc, CMPI_RC_OK);
  return makeArray(mb, std::move(data));
}

CMPIDateTime* newDateTime(const CMPIBroker* mb, CMPIStatus* rc) {
  if (!validBroker(mb, rc)) return nullptr;
  setStatus(rc, CMPI_RC_OK);
  return makeDateTime(mb, DateTimeValue::now());
}

CMPIDateTime* newDateTimeFromBinary(const CMPIBroker* mb, CMPIUint64 binTime,
                                    CMPIBoolean interval, CMPIStatus* rc) {
  if (!validBroker(mb, rc)) return nullptr;
  DateTimeValue v;
  v.micros = binTime;
  v.interval = interval != 0;
  setStatus(rc, CMPI_RC_OK);
  return makeDateTime(mb, v);
}

CMPIDateTime* newDateTimeFromChars(const CMPIBroker* mb, const char* text, CMPIStatus* rc) {
  if (!validBroker(mb, rc)) return nullptr;
  if (text == nullptr) return refuse<CMPIDateTime>(rc, CMPI_RC_ERR_INVALID_PARAMETER);
  auto v = DateTimeValue::parse(text);
  if (!v) return refuse<CMPIDateTime>(rc, CMPI_RC_ERR_INVALID_PARAMETER);
  setStatus(rc, CMPI_RC_OK);
  return makeDateTime(mb, *v);
}

CMPISelectExp* newSelectExp(const CMPIBroker* mb, const char*, const char*, CMPIArray**,
                            CMPIStatus* rc) {
  if (!validBroker(mb, rc)) return nullptr;
  return refuse<CMPISelectExp>(rc, CMPI_RC_ERR_NOT_SUPPORTED);
}

CMPIBoolean classPathIsA(const CMPIBroker* mb, const CMPIObjectPath* op, const char* type,
                         CMPIStatus* rc) {
  BrokerRef broker = Broker::acquire(mb);
  auto path = pathOf(op);
  if (!broker || !path || type == nullptr) {
    setStatus(rc, !broker ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_ERR_INVALID_PARAMETER);
    return 0;
  }
  setStatus(rc, CMPI_RC_OK);
  return broker->classIsA(path->className, type) ? 1 : 0;
}

// X-macro: object kind and its CMPI type name (getType, isOfType).
#define NRV_HOST_KIND_NAMES(X)                                                      \
  X(String, "CMPIString") X(Array, "CMPIArray") X(DateTime, "CMPIDateTime")           \
  X(ObjectPath, "CMPIObjectPath") X(Instance, "CMPIInstance") X(Args, "CMPIArgs")     \
  X(Context, "CMPIContext") X(Enumeration, "CMPIEnumeration") X(Result, "CMPIResult") \
  X(SelectExp, "CMPISelectExp") X(Error, "CMPIError")

const char* kindName(EncKind kind) {
  switch (kind) {
#define NRV_HOST_KIND_CASE(k, text) \
  case EncKind::k:                  \
    return text;
    NRV_HOST_KIND_NAMES(NRV_HOST_KIND_CASE)
#undef NRV_HOST_KIND_CASE
    case EncKind::Memory:  // a block of the memory services is no CMPI object
      break;
  }
  return "CMPIUnknown";
}

std::string describe(EncObject& o) {
  switch (o.kind()) {
    case EncKind::String: return static_cast<EncString&>(o).text();
    case EncKind::DateTime: return static_cast<EncDateTime&>(o).value.text();
    case EncKind::ObjectPath: return formatPath(static_cast<EncObjectPath&>(o).data);
    case EncKind::Instance:
      return formatValue(Datum::embedded(static_cast<EncInstance&>(o).share()));
    case EncKind::Array: {
      auto& a = static_cast<EncArray&>(o).data();
      return formatValue(Datum::arrayOf(a.elementType, a.elements));
    }
    default: return kindName(o.kind());
  }
}

CMPIString* toString(const CMPIBroker* mb, const void* object, CMPIStatus* rc) {
  if (!validBroker(mb, rc)) return nullptr;
  EncObject* o = registry().findAny(object);
  if (o == nullptr) return refuse<CMPIString>(rc, CMPI_RC_ERR_INVALID_PARAMETER);
  std::string text = describe(*o);
  setStatus(rc, CMPI_RC_OK);
  return makeString(mb, std::move(text));
}

CMPIBoolean isOfType(const CMPIBroker* mb, const void* object, const char* type,
                     CMPIStatus* rc) {
  if (!validBroker(mb, rc)) return 0;
  EncObject* o = registry().findAny(object);
  if (o == nullptr || type == nullptr) {
    setStatus(rc, CMPI_RC_ERR_INVALID_PARAMETER);
    return 0;
  }
  setStatus(rc, CMPI_RC_OK);
  return std::string(kindName(o->kind())) == type ? 1 : 0;
}

CMPIString* getType(const CMPIBroker* mb, const void* object, CMPIStatus* rc) {
  if (!validBroker(mb, rc)) return nullptr;
  EncObject* o = registry().findAny(object);
  if (o == nullptr) return refuse<CMPIString>(rc, CMPI_RC_ERR_INVALID_PARAMETER);
  setStatus(rc, CMPI_RC_OK);
  return makeString(mb, kindName(o->kind()));
}

// Message inserts: "$0".."$9" in the default text replaced by the CMFmt* arguments.
std::string formatMessage(const char* defMsg, CMPICount count, va_list args) {
  std::vector<std::string> inserts;
  for (CMPICount i = 0; i < count && i < 10; ++i) {
    const int type = va_arg(args, int);
    char buf[64];
    switch (type) {
      case CMPI_sint32: std::snprintf(buf, sizeof buf, "%ld", va_arg(args, long)); break;
      case CMPI_uint32: std::snprintf(buf, sizeof buf, "%lu", va_arg(args, unsigned long)); break;
      case CMPI_sint64: std::snprintf(buf, sizeof buf, "%lld", va_arg(args, long long)); break;
      case CMPI_uint64:
        std::snprintf(buf, sizeof buf, "%llu", va_arg(args, unsigned long long));
        break;
      case CMPI_real64: std::snprintf(buf, sizeof buf, "%g", va_arg(args, double)); break;
      case CMPI_boolean: std::snprintf(buf, sizeof buf, "%s", va_arg(args, int) ? "true" : "false"); break;
      case CMPI_chars: {
        const char* s = va_arg(args, const char*);
        inserts.emplace_back(s == nullptr ? "" : s);
        continue;
      }
      case CMPI_string: {
        auto s = stringOf(va_arg(args, CMPIString*));
        inserts.push_back(s.value_or(""));
        continue;
      }
      default:
        // An unknown insert type makes the rest of the list unreadable.
        i = count;
        continue;
    }
    inserts.emplace_back(buf);
  }
  std::string out;
  for (const char* p = defMsg; p != nullptr && *p != '\0'; ++p) {
    if (*p == '$' && p[1] >= '0' && p[1] <= '9' &&
        static_cast<size_t>(p[1] - '0') < inserts.size()) {
      out += inserts[static_cast<size_t>(p[1] - '0')];
      ++p;
    } else {
      out += *p;
    }
  }
  return out;
}

CMPIString* getMessage(const CMPIBroker* mb, const char*, const char* defMsg, CMPIStatus* rc,
                       CMPICount count, ...) {
  if (!validBroker(mb, rc)) return nullptr;
  va_list args;
  va_start(args, count);
  std::string text = formatMessage(defMsg, count, args);
  va_end(args);
  setStatus(rc, CMPI_RC_OK);
  return makeString(mb, std::move(text));
}

CMPIString* getMessage2(const CMPIBroker* mb, const char*, const CMPIMsgFileHandle,
                        const char* defMsg, CMPIStatus* rc, CMPICount count, ...) {
  if (!validBroker(mb, rc)) return nullptr;
  va_list args;
  va_start(args, count);
  std::string text = formatMessage(defMsg, count, args);
  va_end(args);
  setStatus(rc, CMPI_RC_OK);
  return makeString(mb, std::move(text));
}

// Provider log and trace lines go to stderr only when NRV_HOST_LOG is set.
CMPIStatus emit(const CMPIBroker* mb, const char* kind, const char* id, const char* text,
                const CMPIString* string) {
  if (!Broker::isLive(mb)) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  if (std::getenv("NRV_HOST_LOG") != nullptr) {
    const std::string extra = string == nullptr ? "" : stringOf(string).value_or("");
    std::fprintf(stderr, "[%s] %s: %s%s\n", kind, id == nullptr ? "" : id,
                 text == nullptr ? "" : text, extra.c_str());
  }
  return makeStatus(CMPI_RC_OK);
}

CMPIStatus logMessage(const CMPIBroker* mb, int, const char* id, const char* text,
                      const CMPIString* string) {
  return emit(mb, "log", id, text, string);
}

CMPIStatus trace(const CMPIBroker* mb, CMPILevel, const char* component, const char* text,
                 const CMPIString* string) {
  return emit(mb, "trace", component, text, string);
}

CMPIError* newCMPIError(const CMPIBroker* mb, const char*, const char*, const char*,
                        const CMPIErrorSeverity, const CMPIErrorProbableCause, const CMPIrc,
                        CMPIStatus* rc) {
  if (!validBroker(mb, rc)) return nullptr;
  return refuse<CMPIError>(rc, CMPI_RC_ERR_NOT_SUPPORTED);
}

// No message files: the handle stays null and getMessage2 answers the default text.
CMPIStatus openMessageFile(const CMPIBroker* mb, const char*, CMPIMsgFileHandle* handle) {
  if (!Broker::isLive(mb)) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  if (handle == nullptr) return makeStatus(CMPI_RC_ERR_INVALID_PARAMETER);
  *handle = nullptr;
  return makeStatus(CMPI_RC_OK);
}

CMPIStatus closeMessageFile(const CMPIBroker* mb, const CMPIMsgFileHandle) {
  return makeStatus(!Broker::isLive(mb) ? CMPI_RC_ERR_INVALID_HANDLE : CMPI_RC_OK);
}

// ---- memory services ------------------------------------------------------------------------
CMPIGcStat* mark(const CMPIBroker* mb, CMPIStatus* rc) {
  if (!validBroker(mb, rc)) return nullptr;
  attachThreadArena();
  setStatus(rc, CMPI_RC_OK);
  return ObjectRegistry::currentArena();
}

CMPIStatus release(const CMPIBroker* mb, const CMPIGcStat* gc) {
  if (!Broker::isLive(mb)) return makeStatus(CMPI_RC_ERR_INVALID_HANDLE);
  if (gc == nullptr || gc != ObjectRegistry::currentArena()) {
    return makeStatus(CMPI_RC_ERR_INVALID_PARAMETER);
  }
  detachThreadArena();
  return makeStatus(CMPI_RC_OK);
}

// Zero-filled, like calloc, so no request sees another's leftovers.
void* allocate(const CMPIBroker* mb, size_t size) {
  if (!Broker::isLive(mb)) return nullptr;
  return registry().adopt(std::make_unique<EncMemory>(mb, size))->data();
}

void* cmpiMalloc(const CMPIBroker* mb, size_t size) { return allocate(mb, size); }

void* cmpiCalloc(const CMPIBroker* mb, size_t count, size_t size) {
  if (size != 0 && count > SIZE_MAX / size) return nullptr;
  return allocate(mb, count * size);
}

void cmpiFree(const CMPIBroker* mb, void* ptr) {
  if (Broker::isLive(mb) && registry().find<EncMemory>(ptr) != nullptr) registry().release(ptr);
}

void* cmpiRealloc(const CMPIBroker* mb, void* ptr, size_t size) {
  if (ptr == nullptr) return allocate(mb, size);
  EncMemory* old = Broker::isLive(mb) ? registry().find<EncMemory>(ptr) : nullptr;
  if (old == nullptr) return nullptr;
  void* grown = allocate(mb, size);
  if (grown == nullptr) return nullptr;
  std::memcpy(grown, old->data(), std::min(size, old->size()));
  registry().release(ptr);
  return grown;
}

char* cmpiStrDup(const CMPIBroker* mb, const char* str) {
  if (str == nullptr) return nullptr;
  const size_t n = std::strlen(str) + 1;
  auto* copy = static_cast<char*>(allocate(mb, n));
  if (copy != nullptr) std::memcpy(copy, str, n);
  return copy;
}

template <typename T, typename H>
void freeObject(const CMPIBroker* mb, H* handle) {
  if (Broker::isLive(mb) && registry().find<T>(handle) != nullptr) {
    registry().release(handle);
  }
}

void freeInstance(const CMPIBroker* mb, CMPIInstance* o) { freeObject<EncInstance>(mb, o); }
void freeObjectPath(const CMPIBroker* mb, CMPIObjectPath* o) { freeObject<EncObjectPath>(mb, o); }
void freeArgs(const CMPIBroker* mb, CMPIArgs* o) { freeObject<EncArgs>(mb, o); }
void freeString(const CMPIBroker* mb, CMPIString* o) { freeObject<EncString>(mb, o); }
void freeArray(const CMPIBroker* mb, CMPIArray* o) { freeObject<EncArray>(mb, o); }
void freeDateTime(const CMPIBroker* mb, CMPIDateTime* o) { freeObject<EncDateTime>(mb, o); }
void freeSelectExp(const CMPIBroker*, CMPISelectExp*) {}

}  // namespace

const CMPIBrokerEncFT kBrokerEncFT = {
    CMPIVersion200,      newInstance,  newObjectPath, newArgs,        newString,
    newArray,            newDateTime,  newDateTimeFromBinary,         newDateTimeFromChars,
    newSelectExp,        classPathIsA, toString,      isOfType,       getType,
    getMessage,          logMessage,   trace,         newCMPIError,   openMessageFile,
    closeMessageFile,    getMessage2,
};

const CMPIBrokerMemFT kBrokerMemFT = {
    CMPIVersion200, mark,          release,        cmpiMalloc, cmpiCalloc,
    cmpiRealloc,    cmpiStrDup,    cmpiFree,       freeInstance, freeObjectPath,
    freeArgs,       freeString,    freeArray,      freeDateTime, freeSelectExp,
};

}  // namespace nrv::host

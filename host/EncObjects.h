// EncObjects: the host broker's CMPI encapsulated objects (string, datetime, array, object path,
// instance, args, context, enumeration, result) and their constructors.
//
// Contract: every make*() registers the new object with the ObjectRegistry (current arena unless
// `detached`) and returns the CMPI handle; `owner` is the broker on whose behalf it is made and is
// only used to free leftovers at shutdown. All function-table entries validate their handles
// through the registry and answer CMPI status codes for bad calls.
#ifndef NRV_HOST_ENCOBJECTS_H
#define NRV_HOST_ENCOBJECTS_H

#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "cmpift.h"
#include "host/Datum.h"
#include "host/ObjectRegistry.h"

namespace nrv::host {

// Helpers shared by the function tables.
inline CMPIStatus makeStatus(CMPIrc rc) { return CMPIStatus{rc, nullptr}; }
inline void setStatus(CMPIStatus* st, CMPIrc rc) {
  if (st != nullptr) {
    st->rc = rc;
    st->msg = nullptr;
  }
}
inline CMPIData badData(CMPIValueState state = CMPI_badValue) {
  CMPIData d{};
  d.type = CMPI_null;
  d.state = state;
  return d;
}

// The data of an instance or array, shared copy-on-write with the values and results it was
// set or returned into: handing it out costs no copy, and its owner may still change it.
template <typename T>
class CopyOnWrite {
 public:
  explicit CopyOnWrite(T data) : data_(std::make_shared<T>(std::move(data))) {}
  const T& get() const { return *data_; }
  // The data to change, first unshared from every holder of a share().
  T& edit() {
    if (data_.use_count() > 1) data_ = std::make_shared<T>(*data_);
    return *data_;
  }
  std::shared_ptr<const T> share() const { return data_; }

 private:
  std::shared_ptr<T> data_;
};

template <typename CmpiT, typename FtT, EncKind K>
class EncBase : public EncObject {
 public:
  static constexpr EncKind kKind = K;
  EncKind kind() const override { return K; }
  const void* handle() const override { return &cmpi_; }
  CmpiT* cmpi() { return &cmpi_; }

 protected:
  EncBase(const void* owner, const FtT* ft) : EncObject(owner) {
    cmpi_.hdl = this;
    cmpi_.ft = ft;
  }
  CmpiT cmpi_{};
};

class EncString : public EncBase<CMPIString, CMPIStringFT, EncKind::String> {
 public:
  EncString(const void* owner, std::string text);
  const std::string& text() const { return text_; }

 private:
  const std::string text_;
};

class EncDateTime : public EncBase<CMPIDateTime, CMPIDateTimeFT, EncKind::DateTime> {
 public:
  EncDateTime(const void* owner, DateTimeValue value);
  const DateTimeValue value;
};

class EncArray : public EncBase<CMPIArray, CMPIArrayFT, EncKind::Array> {
 public:
  EncArray(const void* owner, ArrayData data);
  // False when an object set into an element has been released since. SFCB keeps the
  // element's handle, not a copy, in an array a provider made, so a provider that releases
  // an element after setting it leaves SFCB a dangling pointer; the host refuses such an
  // array where SFCB would crash.
  bool elementsLive() const;

  const ArrayData& data() const { return data_.get(); }
  ArrayData& edit() { return data_.edit(); }
  std::shared_ptr<const ArrayData> share() const { return data_.share(); }

  std::vector<const void*> setHandles;  // per element: the object set into it; empty until one is

 private:
  CopyOnWrite<ArrayData> data_;
};

class EncObjectPath : public EncBase<CMPIObjectPath, CMPIObjectPathFT, EncKind::ObjectPath> {
 public:
  EncObjectPath(const void* owner, PathData data);
  PathData data;
};

class EncInstance : public EncBase<CMPIInstance, CMPIInstanceFT, EncKind::Instance> {
 public:
  EncInstance(const void* owner, InstanceData data);
  const InstanceData& data() const { return data_.get(); }
  InstanceData& edit() { return data_.edit(); }
  std::shared_ptr<const InstanceData> share() const { return data_.share(); }

 private:
  CopyOnWrite<InstanceData> data_;
};

class EncArgs : public EncBase<CMPIArgs, CMPIArgsFT, EncKind::Args> {
 public:
  EncArgs(const void* owner, NamedData data);
  NamedData data;
};

class EncContext : public EncBase<CMPIContext, CMPIContextFT, EncKind::Context> {
 public:
  EncContext(const void* owner, NamedData data, bool prepared);
  NamedData data;
  // Made by prepareAttachThread: detachThread releases it.
  const bool prepared;
};

class EncEnumeration : public EncBase<CMPIEnumeration, CMPIEnumerationFT, EncKind::Enumeration> {
 public:
  EncEnumeration(const void* owner, std::vector<Datum> items);
  std::vector<Datum> items;
  std::size_t next = 0;
};

// What an MI delivered through a CMPIResult; shared between the result object and the caller.
struct ResultSink {
  std::mutex mu;
  std::vector<Datum> items;
  bool done = false;
};

class EncResult : public EncBase<CMPIResult, CMPIResultFT, EncKind::Result> {
 public:
  EncResult(const void* owner, std::shared_ptr<ResultSink> sink);
  const std::shared_ptr<ResultSink> sink;
};

// A block of the broker's memory services: its address is the handle, so cmpiFree and
// cmpiRealloc find it, and the arena frees it when the request ends.
class EncMemory : public EncObject {
 public:
  static constexpr EncKind kKind = EncKind::Memory;
  EncMemory(const void* owner, size_t size)
      : EncObject(owner), size_(size), bytes_(std::make_unique<char[]>(size == 0 ? 1 : size)) {}
  EncKind kind() const override { return kKind; }
  const void* handle() const override { return bytes_.get(); }
  char* data() { return bytes_.get(); }
  size_t size() const { return size_; }

 private:
  const size_t size_;
  const std::unique_ptr<char[]> bytes_;
};

// Constructors; see the contract above.
CMPIString* makeString(const void* owner, std::string text, bool detached = false);
CMPIDateTime* makeDateTime(const void* owner, DateTimeValue value, bool detached = false);
CMPIArray* makeArray(const void* owner, ArrayData data, bool detached = false);
CMPIObjectPath* makeObjectPath(const void* owner, PathData data, bool detached = false);
CMPIInstance* makeInstance(const void* owner, InstanceData data, bool detached = false);
CMPIArgs* makeArgs(const void* owner, NamedData data, bool detached = false);
CMPIContext* makeContext(const void* owner, NamedData data, bool prepared = false,
                         bool detached = false);
CMPIEnumeration* makeEnumeration(const void* owner, std::vector<Datum> items,
                                 bool detached = false);
CMPIResult* makeResult(const void* owner, std::shared_ptr<ResultSink> sink);

// Conversions between CMPI values and Datums. fromCmpi refuses dead handles and unsupported
// types; toCmpi makes fresh objects in the current arena for encapsulated values.
CMPIrc datumFromCmpi(const CMPIValue* value, CMPIType type, Datum& out);
CMPIData datumToCmpi(const void* owner, const Datum& datum);

// Snapshots of live objects (nullopt for dead or foreign handles).
std::optional<std::string> stringOf(const CMPIString* s);
std::optional<PathData> pathOf(const CMPIObjectPath* op);
std::optional<InstanceData> instanceOf(const CMPIInstance* inst);
// The instance's data shared as it stands (copy-on-write); nullptr when the handle is not live.
std::shared_ptr<const InstanceData> sharedInstanceOf(const CMPIInstance* inst);
std::optional<NamedData> argsOf(const CMPIArgs* args);
std::optional<NamedData> contextOf(const CMPIContext* ctx);

// Indexed access shared by instance, object path, args and context tables.
CMPIData namedAt(const void* owner, const NamedData& list, CMPICount index, CMPIString** name,
                 CMPIStatus* rc);
CMPIData namedGet(const void* owner, const NamedData& list, const char* name, CMPIStatus* rc,
                  CMPIValueState extraState = 0);

}  // namespace nrv::host

#endif  // NRV_HOST_ENCOBJECTS_H

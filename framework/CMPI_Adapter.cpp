#include "framework/CMPI_Adapter.h"

#include <cstdio>
#include <memory>
#include <mutex>
#include <unordered_map>

#include "framework/Trace_File.h"

namespace cimple {

namespace {

// Guards one record's adapter pointer and load count between factory calls
// and cleanups, which the CIMOM may run on different threads.  One lock per
// record, and recursive: a provider's load() may make broker calls that make
// the CIMOM create other providers (or this one's other MI objects) on the
// same thread, and a global lock held across load() would deadlock with
// calls running in other providers.
std::recursive_mutex& record_mutex(const CMPI_Static_Data* record) {
  static std::mutex table_mutex;
  static std::unordered_map<const CMPI_Static_Data*, std::unique_ptr<std::recursive_mutex>> table;
  std::lock_guard<std::mutex> lock(table_mutex);
  auto& entry = table[record];
  if (!entry) entry = std::make_unique<std::recursive_mutex>();
  return *entry;
}

struct Rc_Name {
  CMPIrc rc;
  const char* name;
};

const Rc_Name kRcNames[] = {
    {CMPI_RC_OK, "CMPI_RC_OK"},
    {CMPI_RC_ERR_FAILED, "CMPI_RC_ERR_FAILED"},
    {CMPI_RC_ERR_ACCESS_DENIED, "CMPI_RC_ERR_ACCESS_DENIED"},
    {CMPI_RC_ERR_INVALID_NAMESPACE, "CMPI_RC_ERR_INVALID_NAMESPACE"},
    {CMPI_RC_ERR_INVALID_PARAMETER, "CMPI_RC_ERR_INVALID_PARAMETER"},
    {CMPI_RC_ERR_INVALID_CLASS, "CMPI_RC_ERR_INVALID_CLASS"},
    {CMPI_RC_ERR_NOT_FOUND, "CMPI_RC_ERR_NOT_FOUND"},
    {CMPI_RC_ERR_NOT_SUPPORTED, "CMPI_RC_ERR_NOT_SUPPORTED"},
    {CMPI_RC_ERR_ALREADY_EXISTS, "CMPI_RC_ERR_ALREADY_EXISTS"},
    {CMPI_RC_ERR_NO_SUCH_PROPERTY, "CMPI_RC_ERR_NO_SUCH_PROPERTY"},
    {CMPI_RC_ERR_TYPE_MISMATCH, "CMPI_RC_ERR_TYPE_MISMATCH"},
    {CMPI_RC_ERR_INVALID_QUERY, "CMPI_RC_ERR_INVALID_QUERY"},
    {CMPI_RC_ERR_METHOD_NOT_FOUND, "CMPI_RC_ERR_METHOD_NOT_FOUND"},
    {CMPI_RC_DO_NOT_UNLOAD, "CMPI_RC_DO_NOT_UNLOAD"},
    {CMPI_RC_NEVER_UNLOAD, "CMPI_RC_NEVER_UNLOAD"},
    {CMPI_RC_ERR_INVALID_HANDLE, "CMPI_RC_ERR_INVALID_HANDLE"},
    {CMPI_RC_ERR_INVALID_DATA_TYPE, "CMPI_RC_ERR_INVALID_DATA_TYPE"},
    {CMPI_RC_ERROR_SYSTEM, "CMPI_RC_ERROR_SYSTEM"},
    {CMPI_RC_ERROR, "CMPI_RC_ERROR"},
};

void copy_name(char (&out)[256], const char* kind, const char* provider_name) {
  std::snprintf(out, sizeof(out), "%s%s", kind, provider_name ? provider_name : "");
}

const char* class_name_of(const CMPIObjectPath* path) {
  if (path == nullptr) return nullptr;
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  CMPIString* name = CMGetClassName(path, &rc);
  return (rc.rc == CMPI_RC_OK && name) ? CMGetCharsPtr(name, nullptr) : nullptr;
}

}  // namespace

const char* cmpi_rc_name(CMPIrc rc) {
  for (const Rc_Name& entry : kRcNames)
    if (entry.rc == rc) return entry.name;
  return "CMPI_RC_ERROR";
}

// --- adapter life ---------------------------------------------------------------

CMPI_Adapter::CMPI_Adapter(CMPI_Static_Data* record, const Provider_Registration* registration,
                           const CMPIBroker* broker, const CMPIContext* context, const char* provider_name)
    : record_(record), handle_(registration), broker_(broker) {
  handle_.create_provider();
  unload_allowed_ = true;
  // Known before load(): its up-calls convert what the CIMOM answers by it.
  meta_class_ = handle_.meta_class();
  repository_ = handle_.repository();
  CMPI_Thread_Context thread_context(broker, context, this);
  Thread_Context::push(&thread_context);
  CIMPLE_DBG("enter: %s()", "CMPI_Adapter");
  fill_tables(provider_name);
  load_count_ = 1;
  handle_.load();
  CIMPLE_DBG("return: %s()", "CMPI_Adapter");
  Thread_Context::pop();
}

CMPI_Adapter::~CMPI_Adapter() {
  CIMPLE_DBG("~CMPI_Adapter");
  if (record_ && record_->adapter == this) record_->adapter = nullptr;
  for (auto& [mc, provider] : module_providers_) {
    if (!provider) continue;
    provider->unload();
    provider->destroy_provider();
  }
  handle_.destroy_provider();
}

CMPI_Adapter::Route CMPI_Adapter::route(const Meta_Class* mc, const std::string& name_space) const {
  auto it = routes_.find({mc, name_space});
  return it == routes_.end() ? Route::Unknown : it->second;
}

void CMPI_Adapter::learn_route(const Meta_Class* mc, const std::string& name_space, Route route) {
  routes_[{mc, name_space}] = route;
}

Provider_Handle* CMPI_Adapter::module_provider(const Meta_Class* mc) {
  if (mc == nullptr) return nullptr;
  auto [it, fresh] = module_providers_.try_emplace(mc);
  if (fresh) {
    for (const Provider_Registration* r = cimple_module(); r; r = r->next) {
      if (r->meta_class != mc) continue;
      auto provider = std::make_unique<Provider_Handle>(r);
      if (provider->create_provider() != 0 || provider->provider() == nullptr) break;
      provider->load();  // a failed load still leaves the provider to answer, as in its own adapter
      it->second = std::move(provider);
      break;
    }
  }
  return it->second.get();
}

void CMPI_Adapter::fill_tables(const char* provider_name) {
  CMPI_Static_Data* r = record_;
  copy_name(r->instance_name, "instance", provider_name);
  copy_name(r->method_name, "method", provider_name);
  copy_name(r->indication_name, "indication", provider_name);
  copy_name(r->association_name, "association", provider_name);
  fill_instance_table(r->instance_ft, r->instance_name);
  fill_method_table(r->method_ft, r->method_name);
  fill_indication_table(r->indication_ft, r->indication_name);
  fill_association_table(r->association_ft, r->association_name);
  r->instance_mi = CMPIInstanceMI{r, &r->instance_ft};
  r->method_mi = CMPIMethodMI{r, &r->method_ft};
  r->indication_mi = CMPIIndicationMI{r, &r->indication_ft};
  r->association_mi = CMPIAssociationMI{r, &r->association_ft};
}

const Meta_Class* CMPI_Adapter::repository_class(const CMPIObjectPath* path) const {
  const char* name = class_name_of(path);
  if (name == nullptr) return nullptr;
  if (meta_class_ && equal_nocase(meta_class_->name, name)) return meta_class_;
  return repository_ ? find_meta_class(repository_, name) : nullptr;
}

const Meta_Class* CMPI_Adapter::served_class(const CMPIObjectPath* path) const {
  const Meta_Class* mc = repository_class(path);
  if (mc == nullptr || meta_class_ == nullptr) return nullptr;
  // A request for an ancestor class is answered with this provider's class.
  return is_subclass(mc, meta_class_) ? meta_class_ : nullptr;
}

void CMPI_Adapter::activate_filter(const std::string& name_space) { ++filters_[name_space]; }

void CMPI_Adapter::deactivate_filter(const std::string& name_space) { filters_.erase(name_space); }

CMPIStatus CMPI_Adapter::cleanup(CMPI_Static_Data* record, const CMPIContext* context, CMPIBoolean terminating,
                                 const char* function) {
  if (record == nullptr) return CMPIStatus{CMPI_RC_OK, nullptr};
  std::lock_guard<std::recursive_mutex> records(record_mutex(record));
  CMPI_Adapter* adapter = record->adapter;
  if (adapter == nullptr) return CMPIStatus{CMPI_RC_OK, nullptr};
  CMPIrc rc = CMPI_RC_OK;
  bool destroy = false;
  {
    CMPI_Thread_Context thread_context(adapter->broker_, context, adapter);
    Thread_Context::push(&thread_context);
    Auto_Mutex lock(adapter->mutex_);
    CIMPLE_DBG("enter: %s()", function);
    if (!terminating && !adapter->unload_allowed_) {
      CIMPLE_DBG("cleanup do not unload");
      rc = CMPI_RC_DO_NOT_UNLOAD;
    } else if (adapter->load_count_ == 1) {
      adapter->handle_.unload();
      CIMPLE_DBG("cleanup unload");
      destroy = true;
    } else {
      --adapter->load_count_;
      CIMPLE_DBG("cleanup decrement");
    }
    CIMPLE_DBG("return: %s(): %s", function, cmpi_rc_name(rc));
    Thread_Context::pop();
  }
  if (destroy) delete adapter;
  return CMPIStatus{rc, nullptr};
}

// --- call frame -------------------------------------------------------------------

CMPI_Call::CMPI_Call(const char* function, const void* mi_handle, const CMPIContext* context)
    : function_(function), cmpi_context_(context) {
  auto* record = static_cast<const CMPI_Static_Data*>(mi_handle);
  adapter_ = record ? record->adapter : nullptr;
  if (adapter_ == nullptr) return;
  thread_context_.emplace(adapter_->broker(), context, adapter_);
  Thread_Context::push(&*thread_context_);
  adapter_->mutex().lock();
  CIMPLE_DBG("enter: %s()", function_);
}

CMPI_Call::~CMPI_Call() {
  if (adapter_ == nullptr) return;
  adapter_->mutex().unlock();
  Thread_Context::pop();
}

CMPIStatus CMPI_Call::finish_result(int result, Result_Table defined) {
  CMPIrc rc = CMPI_RC_ERR_FAILED;
  for (const Result_Map& entry : defined)
    if (entry.result == result) rc = entry.rc;
  if (rc != CMPI_RC_ERR_FAILED) return finish(rc);
  const Provider_Registration* registration = adapter_ ? adapter_->handle().registration() : nullptr;
  char message[256];
  std::snprintf(message, sizeof(message), "%s: %s failed (provider result %d)",
                registration && registration->provider_name ? registration->provider_name : "provider", function_,
                result);
  CIMPLE_WARN("%s", message);
  return finish(rc, message);
}

CMPIStatus CMPI_Call::finish(CMPIrc rc, const char* message) {
  CIMPLE_DBG("return: %s(): %s", function_, cmpi_rc_name(rc));
  CMPIStatus status{rc, nullptr};
  if (message && broker()) status.msg = CMNewString(broker(), message, nullptr);
  return status;
}

}  // namespace cimple

// --- the factory entry ------------------------------------------------------------

extern "C" int cimple_cmpi_adapter(int, cimple::CMPI_Static_Data* record,
                                   const cimple::Provider_Registration* registration, const CMPIBroker* broker,
                                   const CMPIContext* context, const char* provider_name, char kind, void** mi) {
  using namespace cimple;
  CIMPLE_DBG("enter: %s()", "cimple_cmpi_adapter");
  // An unknown kind hands out no MI object, so it must not count one either:
  // no cleanup would ever balance it.
  const bool known_kind = kind == 'I' || kind == 'M' || kind == 'A' || kind == 'N';
  int result = 0;
  if (!known_kind) {
    result = 0;
  } else if (record == nullptr || registration == nullptr || registration->proc == nullptr ||
             registration->meta_class == nullptr || mi == nullptr) {
    result = -1;
  } else {
    std::lock_guard<std::recursive_mutex> records(cimple::record_mutex(record));
    if (record->adapter == nullptr)
      record->adapter = new CMPI_Adapter(record, registration, broker, context, provider_name);
    else
      record->adapter->add_load();
    switch (kind) {
      case 'I': *mi = &record->instance_mi; break;
      case 'M': *mi = &record->method_mi; break;
      case 'A': *mi = &record->association_mi; break;
      default: *mi = &record->indication_mi; break;
    }
  }
  CIMPLE_DBG("return: %s()", "cimple_cmpi_adapter");
  return result;
}

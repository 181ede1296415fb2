// cimple::CMPI_Adapter: binds one provider to the CIMOM through CMPI.  It
// owns the provider object (through its Provider_Handle), fills the four MI
// function tables of the provider's static record, and turns every CMPI call
// into provider operations inside one frame (thread context pushed, adapter
// mutex held, entry and return traced).
//
// Life: created by the first factory call of its provider (load count 1);
// every further factory call counts one more MI object; the cleanup of the
// last MI object unloads the provider and deletes the adapter, clearing the
// record so a later factory call starts afresh.  The broker must outlive it.
#pragma once

#include <map>
#include <memory>
#include <optional>
#include <span>
#include <string>

#include "cmpimacs.h"
#include "framework/CMPI_Static_Data.h"
#include "framework/CMPI_Thread_Context.h"
#include "framework/Mutex.h"
#include "framework/Provider_Handle.h"

namespace cimple {

class CMPI_Adapter {
 public:
  CMPI_Adapter(CMPI_Static_Data* record, const Provider_Registration* registration, const CMPIBroker* broker,
               const CMPIContext* context, const char* provider_name);
  CMPI_Adapter(const CMPI_Adapter&) = delete;
  CMPI_Adapter& operator=(const CMPI_Adapter&) = delete;
  ~CMPI_Adapter();

  const CMPIBroker* broker() const { return broker_; }
  const Meta_Class* meta_class() const { return meta_class_; }
  const Meta_Repository* repository() const { return repository_; }
  Provider_Handle& handle() { return handle_; }
  Mutex& mutex() { return mutex_; }
  CMPI_Static_Data* record() const { return record_; }

  int load_count() const { return load_count_; }
  void add_load() { ++load_count_; }
  bool unload_allowed() const { return unload_allowed_; }
  void set_unload_allowed(bool flag) { unload_allowed_ = flag; }

  // The class of `path` when this provider serves it (its own class or an
  // ancestor named by the CIMOM), else null.
  const Meta_Class* served_class(const CMPIObjectPath* path) const;
  // Any class of the module's repository named by `path`, else null.
  const Meta_Class* repository_class(const CMPIObjectPath* path) const;

  // The provider of class `mc` when the module serves it, else null: a
  // provider object of its own, created and loaded on first use and unloaded
  // when this adapter ends, so that an association reads its far ends
  // in-process rather than through the CIMOM.  Called under mutex().
  Provider_Handle* module_provider(const Meta_Class* mc);

  // Whether the CIMOM serves class `mc` in `name_space`, as the adapter has
  // learnt it from the first fetch of such an object through the broker: a
  // far end is read in-process only where the CIMOM would route its fetch to
  // the module, so both ways answer alike.
  enum class Route { Unknown, Module, Elsewhere };
  Route route(const Meta_Class* mc, const std::string& name_space) const;
  void learn_route(const Meta_Class* mc, const std::string& name_space, Route route);

  // Name spaces with active indication filters, with their counts.
  void activate_filter(const std::string& name_space);
  void deactivate_filter(const std::string& name_space);
  std::map<std::string, int> active_filters() const { return filters_; }

  // Cleanup of one MI object (all four tables share it).  May delete the
  // adapter; `record->adapter` is then null.
  static CMPIStatus cleanup(CMPI_Static_Data* record, const CMPIContext* context, CMPIBoolean terminating,
                            const char* function);

 private:
  void fill_tables(const char* provider_name);

  CMPI_Static_Data* record_;
  Provider_Handle handle_;
  const CMPIBroker* broker_;
  const Meta_Class* meta_class_ = nullptr;
  const Meta_Repository* repository_ = nullptr;
  int load_count_ = 0;
  bool unload_allowed_ = false;
  std::map<std::string, int> filters_;
  std::map<const Meta_Class*, std::unique_ptr<Provider_Handle>> module_providers_;  // null: not the module's
  std::map<std::pair<const Meta_Class*, std::string>, Route> routes_;
  Mutex mutex_;
};

// "CMPI_RC_OK", "CMPI_RC_ERR_FAILED", ...; "CMPI_RC_ERROR" for unknown codes.
const char* cmpi_rc_name(CMPIrc rc);

// One provider result an operation defines, and what it tells the CIMOM.
struct Result_Map {
  int result;
  CMPIrc rc;
};
using Result_Table = std::span<const Result_Map>;

// The frame of one CMPI call: the thread context is pushed and the adapter
// locked for the frame's life; finish() traces the return and builds the
// status.  adapter() is null when the MI object has no live adapter.
class CMPI_Call {
 public:
  CMPI_Call(const char* function, const void* mi_handle, const CMPIContext* context);
  CMPI_Call(const CMPI_Call&) = delete;
  CMPI_Call& operator=(const CMPI_Call&) = delete;
  ~CMPI_Call();

  CMPI_Adapter* adapter() const { return adapter_; }
  const CMPIBroker* broker() const { return adapter_ ? adapter_->broker() : nullptr; }
  const CMPIContext* context() const { return cmpi_context_; }
  CMPIStatus finish(CMPIrc rc, const char* message = nullptr);
  // The answer to a provider's result.  `defined` lists every result the
  // operation defines, its success included; anything else (-1 from a
  // provider that threw or ran nothing, a code of another operation) is a
  // failure, never a success.  A failure names the provider and the result.
  CMPIStatus finish_result(int result, Result_Table defined);

 private:
  const char* function_;
  CMPI_Adapter* adapter_ = nullptr;
  const CMPIContext* cmpi_context_;
  std::optional<CMPI_Thread_Context> thread_context_;
};

// Runs the work of one call.  Nothing may unwind into the CIMOM: an
// exception (an allocation failure) answers CMPI_RC_ERR_FAILED instead.
template <class Work>
CMPIStatus run(CMPI_Call& call, Work&& work) noexcept {
  try {
    return work();
  } catch (...) {
    return call.finish(CMPI_RC_ERR_FAILED);
  }
}

// The MI tables of each kind, in the CMPI standard's slot order.
void fill_instance_table(CMPIInstanceMIFT& table, const char* name);
void fill_method_table(CMPIMethodMIFT& table, const char* name);
void fill_association_table(CMPIAssociationMIFT& table, const char* name);
void fill_indication_table(CMPIIndicationMIFT& table, const char* name);

}  // namespace cimple

// The indication MI functions of the CMPI adapter.  No provider of the
// module produces indications; the table is complete so a CIMOM that asks
// for it gets well-defined answers.
#include "framework/CMPI_Adapter.h"
#include "framework/CMPI_Delivery.h"
#include "framework/Trace_File.h"

namespace cimple {

namespace {

const CMPIStatus kNoAdapter{CMPI_RC_ERR_FAILED, nullptr};

// Only a provider that produces indications answers 0; the module's answer
// -1 (no producer) is a failure like any result these tables lack.
constexpr Result_Map kEnableResults[] = {{ENABLE_INDICATIONS_OK, CMPI_RC_OK}};
constexpr Result_Map kDisableResults[] = {{DISABLE_INDICATIONS_OK, CMPI_RC_OK}};

// Called by a provider for each indication (which it hands over): delivers
// it to every name space with an active filter.
bool deliver_indication(Instance* indication, void* data) {
  Instance_Ptr owned(indication);
  auto* adapter = static_cast<CMPI_Adapter*>(data);
  if (indication == nullptr || adapter == nullptr) return false;
  auto* current = dynamic_cast<CMPI_Thread_Context*>(Thread_Context::top());
  const CMPIContext* context = current ? current->context() : nullptr;
  Auto_Mutex lock(adapter->mutex());
  for (const auto& [name_space, count] : adapter->active_filters()) {
    CMPI_Ptr<CMPIInstance> cmpi_instance;
    if (make_cmpi_instance(adapter->broker(), indication, name_space.c_str(), nullptr, nullptr, cmpi_instance) !=
        CMPI_RC_OK)
      return false;
    CBDeliverIndication(adapter->broker(), context, name_space.c_str(), cmpi_instance.get());
  }
  return true;
}

CMPIStatus indication_cleanup(CMPIIndicationMI* mi, const CMPIContext* ctx, CMPIBoolean terminating) {
  CIMPLE_DBG("indicationCleanup");
  return CMPI_Adapter::cleanup(mi ? static_cast<CMPI_Static_Data*>(mi->hdl) : nullptr, ctx, terminating, "cleanup");
}

CMPIStatus authorize_filter(CMPIIndicationMI*, const CMPIContext*, const CMPISelectExp*, const char*,
                            const CMPIObjectPath*, const char*) {
  return CMPIStatus{CMPI_RC_OK, nullptr};
}

CMPIStatus must_poll(CMPIIndicationMI*, const CMPIContext*, const CMPISelectExp*, const char*,
                     const CMPIObjectPath*) {
  return CMPIStatus{CMPI_RC_OK, nullptr};
}

CMPIStatus activate_filter(CMPIIndicationMI* mi, const CMPIContext* ctx, const CMPISelectExp*, const char*,
                           const CMPIObjectPath* path, CMPIBoolean) {
  CMPI_Call call("activateFilter", mi ? mi->hdl : nullptr, ctx);
  if (!call.adapter()) return kNoAdapter;
  return run(call, [&]() -> CMPIStatus {
    call.adapter()->activate_filter(name_space_of(path));
    return call.finish(CMPI_RC_OK);
  });
}

CMPIStatus deactivate_filter(CMPIIndicationMI* mi, const CMPIContext* ctx, const CMPISelectExp*, const char*,
                             const CMPIObjectPath* path, CMPIBoolean) {
  CMPI_Call call("deActivateFilter", mi ? mi->hdl : nullptr, ctx);
  if (!call.adapter()) return kNoAdapter;
  return run(call, [&]() -> CMPIStatus {
    call.adapter()->deactivate_filter(name_space_of(path));
    return call.finish(CMPI_RC_OK);
  });
}

CMPIStatus enable_indications(CMPIIndicationMI* mi, const CMPIContext* ctx) {
  CMPI_Call call("enableIndications", mi ? mi->hdl : nullptr, ctx);
  if (!call.adapter()) return kNoAdapter;
  return run(call, [&]() -> CMPIStatus {
    using Indication_Proc = bool (*)(Instance*, void*);
    Indication_Proc proc = deliver_indication;
    int result = call.adapter()->handle().enable_indications(reinterpret_cast<void*>(proc), call.adapter());
    return call.finish_result(result, kEnableResults);
  });
}

CMPIStatus disable_indications(CMPIIndicationMI* mi, const CMPIContext* ctx) {
  CMPI_Call call("disableIndications", mi ? mi->hdl : nullptr, ctx);
  if (!call.adapter()) return kNoAdapter;
  return run(call, [&]() -> CMPIStatus {
    int result = call.adapter()->handle().disable_indications();
    return call.finish_result(result, kDisableResults);
  });
}

}  // namespace

void fill_indication_table(CMPIIndicationMIFT& table, const char* name) {
  table = CMPIIndicationMIFT{CMPIVersion100,  CMPIVersion100,    name,
                             indication_cleanup, authorize_filter, must_poll,
                             activate_filter, deactivate_filter, enable_indications,
                             disable_indications};
}

}  // namespace cimple

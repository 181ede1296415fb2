// The instance and method MI functions of the CMPI adapter.
#include "framework/CMPI_Adapter.h"
#include "framework/CMPI_Delivery.h"

namespace cimple {

namespace {

const CMPIStatus kNoAdapter{CMPI_RC_ERR_FAILED, nullptr};

// The results each operation defines; any other result is a failure.
constexpr Result_Map kEnumResults[] = {{ENUM_INSTANCES_OK, CMPI_RC_OK},
                                       {ENUM_INSTANCES_FAILED, CMPI_RC_ERR_FAILED},
                                       {ENUM_INSTANCES_ACCESS_DENIED, CMPI_RC_ERR_ACCESS_DENIED}};
constexpr Result_Map kGetResults[] = {{GET_INSTANCE_OK, CMPI_RC_OK},
                                      {GET_INSTANCE_NOT_FOUND, CMPI_RC_ERR_NOT_FOUND},
                                      {GET_INSTANCE_INVALID_PARAMETER, CMPI_RC_ERR_INVALID_PARAMETER},
                                      {GET_INSTANCE_ACCESS_DENIED, CMPI_RC_ERR_ACCESS_DENIED}};
constexpr Result_Map kCreateResults[] = {{CREATE_INSTANCE_OK, CMPI_RC_OK},
                                         {CREATE_INSTANCE_DUPLICATE, CMPI_RC_ERR_ALREADY_EXISTS},
                                         {CREATE_INSTANCE_UNSUPPORTED, CMPI_RC_ERR_NOT_SUPPORTED},
                                         {CREATE_INSTANCE_INVALID_PARAMETER, CMPI_RC_ERR_INVALID_PARAMETER},
                                         {CREATE_INSTANCE_ACCESS_DENIED, CMPI_RC_ERR_ACCESS_DENIED}};
constexpr Result_Map kModifyResults[] = {{MODIFY_INSTANCE_OK, CMPI_RC_OK},
                                         {MODIFY_INSTANCE_NOT_FOUND, CMPI_RC_ERR_NOT_FOUND},
                                         {MODIFY_INSTANCE_UNSUPPORTED, CMPI_RC_ERR_NOT_SUPPORTED},
                                         {MODIFY_INSTANCE_INVALID_PARAMETER, CMPI_RC_ERR_INVALID_PARAMETER},
                                         {MODIFY_INSTANCE_ACCESS_DENIED, CMPI_RC_ERR_ACCESS_DENIED}};
constexpr Result_Map kDeleteResults[] = {{DELETE_INSTANCE_OK, CMPI_RC_OK},
                                         {DELETE_INSTANCE_NOT_FOUND, CMPI_RC_ERR_NOT_FOUND},
                                         {DELETE_INSTANCE_UNSUPPORTED, CMPI_RC_ERR_NOT_SUPPORTED},
                                         {DELETE_INSTANCE_ACCESS_DENIED, CMPI_RC_ERR_ACCESS_DENIED}};
constexpr Result_Map kInvokeResults[] = {{INVOKE_METHOD_OK, CMPI_RC_OK},
                                         {INVOKE_METHOD_UNSUPPORTED, CMPI_RC_ERR_NOT_SUPPORTED},
                                         {INVOKE_METHOD_ACCESS_DENIED, CMPI_RC_ERR_ACCESS_DENIED}};

CMPI_Env env_of(const CMPI_Call& call, const std::string& name_space) {
  return CMPI_Env{call.broker(), call.adapter()->repository(), name_space.c_str()};
}

CMPIStatus instance_cleanup(CMPIInstanceMI* mi, const CMPIContext* ctx, CMPIBoolean terminating) {
  return CMPI_Adapter::cleanup(mi ? static_cast<CMPI_Static_Data*>(mi->hdl) : nullptr, ctx, terminating, "cleanup");
}

// The key instance of the request path (class served by this provider).
CMPIrc request_model(const CMPI_Call& call, const CMPIObjectPath* path, const std::string& ns, Instance_Ptr& model) {
  const Meta_Class* mc = call.adapter()->served_class(path);
  if (mc == nullptr) return CMPI_RC_ERR_FAILED;
  Instance* instance = nullptr;
  CMPIrc rc = make_cimple_reference(env_of(call, ns), mc, path, instance);
  model.reset(instance);
  return rc;
}

// The model of a read request: the key instance of the path with the
// property list applied (keys kept: they identify what is wanted).
CMPIrc read_model(const CMPI_Call& call, const CMPIObjectPath* path, const std::string& ns,
                  const CMPIResult* rslt, const char** properties, Instance_Ptr& model) {
  if (CMPIrc rc = request_model(call, path, ns, model); rc != CMPI_RC_OK) return rc;
  if (rslt == nullptr) return CMPI_RC_ERR_INVALID_PARAMETER;
  if (apply_property_list(model.get(), properties, true) != 0) return CMPI_RC_ERR_INVALID_PARAMETER;
  return CMPI_RC_OK;
}

CMPIStatus enum_instance_names(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                               const CMPIObjectPath* path) {
  CMPI_Call call("enumInstanceNames", mi ? mi->hdl : nullptr, ctx);
  if (!call.adapter()) return kNoAdapter;
  return run(call, [&]() -> CMPIStatus {
    const std::string ns = name_space_of(path);
    Instance_Ptr model;
    if (CMPIrc rc = request_model(call, path, ns, model); rc != CMPI_RC_OK) return call.finish(rc);
    if (rslt == nullptr) return call.finish(CMPI_RC_ERR_INVALID_PARAMETER);
    set_null_flags(model.get(), false, true, 1);
    CMPI_Delivery delivery{call.broker(), ctx, rslt, ns.c_str(), nullptr};
    int result = call.adapter()->handle().enum_instances(model.get(), deliver_object_path, &delivery);
    if (result == ENUM_INSTANCES_OK) CMReturnDone(rslt);
    return call.finish_result(result, kEnumResults);
  });
}

CMPIStatus enum_instances(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                          const CMPIObjectPath* path, const char** properties) {
  CMPI_Call call("enumInstances", mi ? mi->hdl : nullptr, ctx);
  if (!call.adapter()) return kNoAdapter;
  return run(call, [&]() -> CMPIStatus {
    const std::string ns = name_space_of(path);
    Instance_Ptr model;
    if (CMPIrc rc = read_model(call, path, ns, rslt, properties, model); rc != CMPI_RC_OK) return call.finish(rc);
    CMPI_Delivery delivery{call.broker(), ctx, rslt, ns.c_str(), properties};
    int result = call.adapter()->handle().enum_instances(model.get(), deliver_instance, &delivery);
    if (result == ENUM_INSTANCES_OK) CMReturnDone(rslt);
    return call.finish_result(result, kEnumResults);
  });
}

CMPIStatus get_instance(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                        const CMPIObjectPath* path, const char** properties) {
  CMPI_Call call("getInstance", mi ? mi->hdl : nullptr, ctx);
  if (!call.adapter()) return kNoAdapter;
  return run(call, [&]() -> CMPIStatus {
    const std::string ns = name_space_of(path);
    const Meta_Class* mc = call.adapter()->served_class(path);
    if (mc == nullptr) return call.finish(CMPI_RC_ERR_FAILED);
    if (rslt == nullptr) return call.finish(CMPI_RC_ERR_INVALID_PARAMETER);
    int result = -1;
    CMPI_Ptr<CMPIInstance> out;
    CMPIrc rc = read_instance(env_of(call, ns), call.adapter()->handle(), mc, path, properties, result, out);
    if (rc != CMPI_RC_OK) return call.finish(rc);
    if (result != GET_INSTANCE_OK) return call.finish_result(result, kGetResults);
    CMReturnInstance(rslt, out.get());
    CMReturnDone(rslt);
    return call.finish(CMPI_RC_OK);
  });
}

CMPIStatus create_instance(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                           const CMPIObjectPath* path, const CMPIInstance* cmpi_instance) {
  CMPI_Call call("createInstance", mi ? mi->hdl : nullptr, ctx);
  if (!call.adapter()) return kNoAdapter;
  return run(call, [&]() -> CMPIStatus {
    const Meta_Class* mc = call.adapter()->served_class(path);
    if (mc == nullptr) return call.finish(CMPI_RC_ERR_FAILED);
    if (cmpi_instance == nullptr || rslt == nullptr) return call.finish(CMPI_RC_ERR_INVALID_PARAMETER);
    const std::string ns = name_space_of(path);
    Instance* converted = nullptr;
    CMPIrc rc = make_cimple_instance(env_of(call, ns), mc, path, cmpi_instance, converted);
    Instance_Ptr instance(converted);
    if (rc != CMPI_RC_OK) return call.finish(rc);
    int result = call.adapter()->handle().create_instance(instance.get());
    if (result == 0) {
      CMPI_Ptr<CMPIObjectPath> created;
      rc = make_cmpi_object_path(call.broker(), instance.get(), ns.c_str(), created);
      if (rc != CMPI_RC_OK) return call.finish(rc);
      CMReturnObjectPath(rslt, created.get());
      CMReturnDone(rslt);
      return call.finish(CMPI_RC_OK);
    }
    return call.finish_result(result, kCreateResults);
  });
}

CMPIStatus modify_instance(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                           const CMPIObjectPath* path, const CMPIInstance* cmpi_instance, const char** properties) {
  CMPI_Call call("modifyInstance", mi ? mi->hdl : nullptr, ctx);
  if (!call.adapter()) return kNoAdapter;
  return run(call, [&]() -> CMPIStatus {
    const Meta_Class* mc = call.adapter()->served_class(path);
    if (mc == nullptr) return call.finish(CMPI_RC_ERR_FAILED);
    if (cmpi_instance == nullptr || rslt == nullptr) return call.finish(CMPI_RC_ERR_INVALID_PARAMETER);
    const std::string ns = name_space_of(path);
    const CMPI_Env env = env_of(call, ns);
    Instance* converted = nullptr;
    CMPIrc rc = make_cimple_instance(env, mc, path, cmpi_instance, converted);
    Instance_Ptr instance(converted);
    if (rc != CMPI_RC_OK) return call.finish(rc);
    // The request path names the instance to change, whatever keys the
    // modified instance carries.
    CMPIObjectPath_Container keys(env, path);
    keys.convert(mc, FLAG_KEY, converted);
    Instance_Ptr model(clone(instance.get()));
    if (apply_property_list(model.get(), properties, true) != 0) return call.finish(CMPI_RC_ERR_INVALID_PARAMETER);
    int result = call.adapter()->handle().modify_instance(model.get(), instance.get());
    if (result == 0) {
      CMReturnObjectPath(rslt, path);
      CMReturnDone(rslt);
      return call.finish(CMPI_RC_OK);
    }
    return call.finish_result(result, kModifyResults);
  });
}

CMPIStatus delete_instance(CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                           const CMPIObjectPath* path) {
  CMPI_Call call("deleteInstance", mi ? mi->hdl : nullptr, ctx);
  if (!call.adapter()) return kNoAdapter;
  return run(call, [&]() -> CMPIStatus {
    const std::string ns = name_space_of(path);
    Instance_Ptr model;
    if (CMPIrc rc = request_model(call, path, ns, model); rc != CMPI_RC_OK) return call.finish(rc);
    int result = call.adapter()->handle().delete_instance(model.get());
    if (result == 0) {
      if (rslt) CMReturnDone(rslt);
      return call.finish(CMPI_RC_OK);
    }
    return call.finish_result(result, kDeleteResults);
  });
}

CMPIStatus exec_query(CMPIInstanceMI*, const CMPIContext*, const CMPIResult*, const CMPIObjectPath*, const char*,
                      const char*) {
  return CMPIStatus{CMPI_RC_ERR_NOT_SUPPORTED, nullptr};
}

// --- method MI ------------------------------------------------------------------

CMPIStatus method_cleanup(CMPIMethodMI* mi, const CMPIContext* ctx, CMPIBoolean terminating) {
  return CMPI_Adapter::cleanup(mi ? static_cast<CMPI_Static_Data*>(mi->hdl) : nullptr, ctx, terminating, "cleanup");
}

CMPIStatus invoke_method(CMPIMethodMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                         const CMPIObjectPath* path, const char* method, const CMPIArgs* in, CMPIArgs* out) {
  CMPI_Call call("invokeMethod", mi ? mi->hdl : nullptr, ctx);
  if (!call.adapter()) return kNoAdapter;
  return run(call, [&]() -> CMPIStatus {
    const Meta_Class* mc = call.adapter()->served_class(path);
    if (mc == nullptr) return call.finish(CMPI_RC_ERR_FAILED, "MetaClass not found");
    const Meta_Method* mm = method ? find_method(mc, method) : nullptr;
    if (mm == nullptr) return call.finish(CMPI_RC_ERR_METHOD_NOT_FOUND, method ? method : "");
    const std::string ns = name_space_of(path);
    const CMPI_Env env = env_of(call, ns);
    Instance* converted = nullptr;
    CMPIrc rc = make_cimple_reference(env, mc, path, converted);
    Instance_Ptr model(converted);
    if (rc != CMPI_RC_OK) return call.finish(rc, "CIMPLE reference creation failed");
    rc = make_cimple_method(env, mm, path, in, converted);
    Instance_Ptr record(converted);
    if (rc != CMPI_RC_OK) return call.finish(rc, "CIMPLE make_cimple_method function failed");
    // -1: the provider ran no method (none matched, or it threw); a zero
    // return value must not be reported for a method that never ran.
    int result = call.adapter()->handle().invoke_method(model.get(), record.get());
    if (result != INVOKE_METHOD_OK) return call.finish_result(result, kInvokeResults);
    CMPI_Ptr<CMPIArgs> scratch;
    if (out == nullptr) {
      scratch.reset(CMNewArgs(call.broker(), nullptr));
      out = scratch.get();
    }
    bool has_return_value = false;
    CMPI_Out_Value return_value;
    rc = make_method_outputs(env, record.get(), out, has_return_value, return_value);
    if (rc != CMPI_RC_OK) return call.finish(rc);
    if (rslt) {
      if (has_return_value) CMReturnData(rslt, &return_value.value, return_value.type);
      CMReturnDone(rslt);
    }
    return call.finish(CMPI_RC_OK);
  });
}

}  // namespace

void fill_instance_table(CMPIInstanceMIFT& table, const char* name) {
  table = CMPIInstanceMIFT{CMPIVersion100, CMPIVersion100, name, instance_cleanup, enum_instance_names,
                           enum_instances, get_instance, create_instance, modify_instance, delete_instance,
                           exec_query};
}

void fill_method_table(CMPIMethodMIFT& table, const char* name) {
  table = CMPIMethodMIFT{CMPIVersion100, CMPIVersion100, name, method_cleanup, invoke_method};
}

}  // namespace cimple

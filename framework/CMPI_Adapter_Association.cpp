// The association MI functions of the CMPI adapter.  They answer with the
// result objects only (no returnDone), as the association table requires.
#include "framework/CMPI_Adapter.h"
#include "framework/CMPI_Delivery.h"

namespace cimple {

namespace {

const CMPIStatus kNoAdapter{CMPI_RC_ERR_FAILED, nullptr};

const char* given(const char* s) { return s ? s : ""; }

// The source object of an association request as a key instance.  A source
// class the module does not know yields no model and an empty answer.
CMPIrc source_model(const CMPI_Call& call, const CMPIObjectPath* path, const std::string& ns, Instance_Ptr& model) {
  const Meta_Class* mc = call.adapter()->repository_class(path);
  if (mc == nullptr) return CMPI_RC_OK;
  Instance* instance = nullptr;
  CMPIrc rc = make_cimple_reference(CMPI_Env{call.broker(), call.adapter()->repository(), ns.c_str()}, mc, path,
                                    instance);
  model.reset(instance);
  return rc;
}

CMPIStatus association_cleanup(CMPIAssociationMI* mi, const CMPIContext* ctx, CMPIBoolean terminating) {
  return CMPI_Adapter::cleanup(mi ? static_cast<CMPI_Static_Data*>(mi->hdl) : nullptr, ctx, terminating, "cleanup");
}

// The results each operation defines; any other result is a failure.
constexpr Result_Map kAssociatorNamesResults[] = {
    {ENUM_ASSOCIATOR_NAMES_OK, CMPI_RC_OK},
    {ENUM_ASSOCIATOR_NAMES_UNSUPPORTED, CMPI_RC_ERR_NOT_SUPPORTED},
    {ENUM_ASSOCIATOR_NAMES_ACCESS_DENIED, CMPI_RC_ERR_ACCESS_DENIED}};
constexpr Result_Map kAssociatorsResults[] = {{ENUM_ASSOCIATORS_OK, CMPI_RC_OK},
                                              {ENUM_ASSOCIATORS_ACCESS_DENIED, CMPI_RC_ERR_ACCESS_DENIED}};
constexpr Result_Map kReferencesResults[] = {{ENUM_REFERENCES_OK, CMPI_RC_OK},
                                             {ENUM_REFERENCES_UNSUPPORTED, CMPI_RC_ERR_NOT_SUPPORTED},
                                             {ENUM_REFERENCES_ACCESS_DENIED, CMPI_RC_ERR_ACCESS_DENIED}};

CMPIStatus associator_names(CMPIAssociationMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                            const CMPIObjectPath* path, const char*, const char* result_class, const char* role,
                            const char* result_role) {
  CMPI_Call call("associatorNames", mi ? mi->hdl : nullptr, ctx);
  if (!call.adapter()) return kNoAdapter;
  return run(call, [&]() -> CMPIStatus {
    const std::string ns = name_space_of(path);
    Instance_Ptr source;
    if (CMPIrc rc = source_model(call, path, ns, source); rc != CMPI_RC_OK) return call.finish(rc);
    if (!source || rslt == nullptr) return call.finish(CMPI_RC_OK);
    CMPI_Delivery delivery{call.broker(), ctx, rslt, ns.c_str(), nullptr};
    delivery.own_name_space = true;
    int result = call.adapter()->handle().enum_associator_names(source.get(), given(result_class), given(role),
                                                                given(result_role), deliver_object_path, &delivery);
    return call.finish_result(result, kAssociatorNamesResults);
  });
}

CMPIStatus associators(CMPIAssociationMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                       const CMPIObjectPath* path, const char*, const char* result_class, const char* role,
                       const char* result_role, const char** properties) {
  CMPI_Call call("associators", mi ? mi->hdl : nullptr, ctx);
  if (!call.adapter()) return kNoAdapter;
  return run(call, [&]() -> CMPIStatus {
    const std::string ns = name_space_of(path);
    Instance_Ptr source;
    if (CMPIrc rc = source_model(call, path, ns, source); rc != CMPI_RC_OK) return call.finish(rc);
    if (!source || rslt == nullptr) return call.finish(CMPI_RC_OK);
    Provider_Handle& handle = call.adapter()->handle();
    CMPI_Delivery delivery{call.broker(), ctx, rslt, ns.c_str(), properties};
    delivery.own_name_space = true;
    int result = handle.enum_associators(source.get(), given(result_class), given(role), given(result_role),
                                         deliver_instance, &delivery);
    if (result != ENUM_ASSOCIATORS_UNSUPPORTED) return call.finish_result(result, kAssociatorsResults);
    // The provider knows only the far ends' keys: fetch each whole object
    // from the CIMOM, which routes to the far end's own provider.
    CMPI_Delivery fetch{call.broker(), ctx, rslt, ns.c_str(), properties};
    fetch.own_name_space = true;
    result = handle.enum_associator_names(source.get(), given(result_class), given(role), given(result_role),
                                          deliver_fetched_instance, &fetch);
    return call.finish_result(result, kAssociatorNamesResults);
  });
}

// The association model: an empty instance of the provider's class, its
// non-key properties null (names only) or all present (whole instances).
Instance_Ptr association_model(const CMPI_Adapter& adapter, bool names_only) {
  Instance_Ptr model(create(adapter.meta_class(), false));
  if (names_only) set_null_flags(model.get(), false, true, 1);
  return model;
}

CMPIStatus reference_names(CMPIAssociationMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                           const CMPIObjectPath* path, const char*, const char* role) {
  CMPI_Call call("referenceNames", mi ? mi->hdl : nullptr, ctx);
  if (!call.adapter()) return kNoAdapter;
  return run(call, [&]() -> CMPIStatus {
    const std::string ns = name_space_of(path);
    Instance_Ptr source;
    if (CMPIrc rc = source_model(call, path, ns, source); rc != CMPI_RC_OK) return call.finish(rc);
    if (!source || rslt == nullptr || !call.adapter()->meta_class()) return call.finish(CMPI_RC_OK);
    Instance_Ptr model = association_model(*call.adapter(), true);
    CMPI_Delivery delivery{call.broker(), ctx, rslt, ns.c_str(), nullptr};
    int result = call.adapter()->handle().enum_references(source.get(), model.get(), given(role), deliver_object_path,
                                                          &delivery);
    return call.finish_result(result, kReferencesResults);
  });
}

CMPIStatus references(CMPIAssociationMI* mi, const CMPIContext* ctx, const CMPIResult* rslt,
                      const CMPIObjectPath* path, const char*, const char* role, const char** properties) {
  CMPI_Call call("references", mi ? mi->hdl : nullptr, ctx);
  if (!call.adapter()) return kNoAdapter;
  return run(call, [&]() -> CMPIStatus {
    const std::string ns = name_space_of(path);
    Instance_Ptr source;
    if (CMPIrc rc = source_model(call, path, ns, source); rc != CMPI_RC_OK) return call.finish(rc);
    if (!source || rslt == nullptr || !call.adapter()->meta_class()) return call.finish(CMPI_RC_OK);
    Instance_Ptr model = association_model(*call.adapter(), false);
    CMPI_Delivery delivery{call.broker(), ctx, rslt, ns.c_str(), properties};
    delivery.apply_list = true;
    int result =
        call.adapter()->handle().enum_references(source.get(), model.get(), given(role), deliver_instance, &delivery);
    return call.finish_result(result, kReferencesResults);
  });
}

}  // namespace

void fill_association_table(CMPIAssociationMIFT& table, const char* name) {
  table = CMPIAssociationMIFT{CMPIVersion100, CMPIVersion100, name,      association_cleanup,
                              associators,    associator_names, references, reference_names};
}

}  // namespace cimple

// The association MI functions of the CMPI adapter.  They answer with the
// result objects only (no returnDone), as the association table requires.
#include "framework/Association_Walk.h"
#include "framework/CMPI_Adapter.h"
#include "framework/CMPI_Delivery.h"
#include "framework/Generic_Reads.h"

namespace cimple {

namespace {

const CMPIStatus kNoAdapter{CMPI_RC_ERR_FAILED, nullptr};

const char* given(const char* s) { return s ? s : ""; }

// The source object of an association request as a key instance.  A source
// class the module does not know, or that no reference of the provider's
// association can point at, yields no model and an empty answer: a CIMOM
// asks every association provider, and most have nothing to say.
CMPIrc source_model(const CMPI_Call& call, const CMPIObjectPath* path, const std::string& ns, Instance_Ptr& model) {
  const Meta_Class* mc = call.adapter()->repository_class(path);
  if (mc == nullptr) return CMPI_RC_OK;
  const Meta_Class* association = call.adapter()->meta_class();
  if (association != nullptr && (association->flags & FLAG_ASSOCIATION) && !may_refer_to(association, mc))
    return CMPI_RC_OK;
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

// The far ends of an associators request.  One the module serves is read
// in-process from its class's provider, as a getInstance of its path would
// read it, once the CIMOM has shown (by the first fetch of its class in its
// name space) that it routes such a fetch to the module; the others (the
// platform's, or where the CIMOM does not serve the class) are fetched.
struct Far_End_Reads {
  CMPI_Adapter* adapter;
  CMPI_Delivery delivery;
};

bool fetch_far_end(Far_End_Reads& reads, Instance* instance, int status, Provider_Handle* provider) {
  CMPI_Delivery& delivery = reads.delivery;
  const std::string ns = delivery.name_space_for(instance);
  const Meta_Class* mc = instance->meta_class;
  const bool fetched = deliver_fetched_instance(instance, status, &delivery);
  if (provider != nullptr && reads.adapter->route(mc, ns) == CMPI_Adapter::Route::Unknown) {
    if (fetched)
      reads.adapter->learn_route(mc, ns, CMPI_Adapter::Route::Module);
    else if (delivery.error == CMPI_RC_ERR_INVALID_CLASS || delivery.error == CMPI_RC_ERR_INVALID_NAMESPACE)
      reads.adapter->learn_route(mc, ns, CMPI_Adapter::Route::Elsewhere);
  }
  return fetched;
}

bool deliver_far_end(Instance* instance, int status, void* data) {
  auto& reads = *static_cast<Far_End_Reads*>(data);
  CMPI_Delivery& delivery = reads.delivery;
  if (instance == nullptr || delivery.error != CMPI_RC_OK || delivery.result == nullptr)
    return deliver_fetched_instance(instance, status, &delivery);  // releases and stops
  Provider_Handle* provider = generic_reads() ? nullptr : reads.adapter->module_provider(instance->meta_class);
  const std::string ns = delivery.name_space_for(instance);
  if (provider == nullptr || reads.adapter->route(instance->meta_class, ns) != CMPI_Adapter::Route::Module)
    return fetch_far_end(reads, instance, status, provider);
  Instance_Ptr owned(instance);
  CMPI_Ptr<CMPIObjectPath> path;
  CMPIrc rc = make_cmpi_object_path(delivery.broker, instance, ns.c_str(), path);
  int result = -1;
  CMPI_Ptr<CMPIInstance> far_end;
  if (rc == CMPI_RC_OK)
    rc = read_instance(CMPI_Env{delivery.broker, reads.adapter->repository(), ns.c_str()}, *provider,
                       instance->meta_class, path.get(), delivery.properties, result, far_end);
  if (rc == CMPI_RC_OK && result != GET_INSTANCE_OK) rc = CMPI_RC_ERR_NOT_FOUND;
  if (rc != CMPI_RC_OK) {
    delivery.error = rc;  // as a failed fetch: the walk stops
    return false;
  }
  CMReturnInstance(delivery.result, far_end.get());
  return true;
}

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
    // The provider knows only the far ends' keys: read each whole object
    // from its own provider.
    Far_End_Reads fetch{call.adapter(), CMPI_Delivery{call.broker(), ctx, rslt, ns.c_str(), properties}};
    fetch.delivery.own_name_space = true;
    result = handle.enum_associator_names(source.get(), given(result_class), given(role), given(result_role),
                                          deliver_far_end, &fetch);
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

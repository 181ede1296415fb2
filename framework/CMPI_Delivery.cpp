#include "framework/CMPI_Delivery.h"

#include "cmpimacs.h"

namespace cimple {

namespace {

CMPI_Delivery* begin(Instance* instance, void* data) {
  auto* delivery = static_cast<CMPI_Delivery*>(data);
  if (instance == nullptr) return nullptr;  // the closing call
  if (delivery->error != CMPI_RC_OK || delivery->result == nullptr) return nullptr;
  return delivery;
}

bool make_path(CMPI_Delivery* delivery, const Instance* instance, CMPI_Ptr<CMPIObjectPath>& path) {
  CMPIrc rc = make_cmpi_object_path(delivery->broker, instance, delivery->name_space_for(instance), path);
  if (rc != CMPI_RC_OK) delivery->error = rc;
  return rc == CMPI_RC_OK;
}

}  // namespace

bool deliver_object_path(Instance* instance, int, void* data) {
  Instance_Ptr owned(instance);
  CMPI_Delivery* delivery = begin(instance, data);
  if (delivery == nullptr) return false;
  CMPI_Ptr<CMPIObjectPath> path;
  if (!make_path(delivery, instance, path)) return false;
  CMReturnObjectPath(delivery->result, path.get());
  return true;
}

bool deliver_instance(Instance* instance, int, void* data) {
  Instance_Ptr owned(instance);
  CMPI_Delivery* delivery = begin(instance, data);
  if (delivery == nullptr) return false;
  CMPI_Ptr<CMPIObjectPath> path;
  if (!make_path(delivery, instance, path)) return false;
  // A shared instance (a catalogue's own) is read, never changed: from here
  // on the instance is whichever one `owned` holds.
  if (delivery->apply_list && delivery->properties) apply_property_list(writable(owned), delivery->properties, false);
  const Instance* delivered = owned.get();
  CMPI_Ptr<CMPIInstance> cmpi_instance;
  CMPIrc rc = make_cmpi_instance(delivery->broker, delivered, delivery->name_space_for(delivered), path.get(),
                                 delivery->properties, cmpi_instance);
  if (rc != CMPI_RC_OK) {
    delivery->error = rc;
    return false;
  }
  CMReturnInstance(delivery->result, cmpi_instance.get());
  return true;
}

bool deliver_fetched_instance(Instance* instance, int, void* data) {
  Instance_Ptr owned(instance);
  CMPI_Delivery* delivery = begin(instance, data);
  if (delivery == nullptr) return false;
  CMPI_Ptr<CMPIObjectPath> path;
  if (!make_path(delivery, instance, path)) return false;
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  CMPI_Ptr<CMPIInstance> fetched(CBGetInstance(delivery->broker, delivery->context, path.get(),
                                               const_cast<const char**>(delivery->properties), &rc));
  if (rc.rc != CMPI_RC_OK || !fetched) {
    delivery->error = rc.rc != CMPI_RC_OK ? rc.rc : CMPI_RC_ERR_NOT_FOUND;
    return false;
  }
  CMReturnInstance(delivery->result, fetched.get());
  return true;
}

CMPIrc read_instance(const CMPI_Env& env, Provider_Handle& handle, const Meta_Class* mc, const CMPIObjectPath* path,
                     const char* const* properties, int& result, CMPI_Ptr<CMPIInstance>& out) {
  result = -1;
  Instance* keys = nullptr;
  CMPIrc rc = make_cimple_reference(env, mc, path, keys);
  Instance_Ptr model(keys);
  if (rc != CMPI_RC_OK) return rc;
  // Keys kept: they say which instance is wanted.
  if (apply_property_list(model.get(), properties, true) != 0) return CMPI_RC_ERR_INVALID_PARAMETER;
  Instance* found = nullptr;
  result = handle.get_instance(model.get(), found);
  Instance_Ptr instance(found);
  if (result == GET_INSTANCE_OK && !instance) result = -1;  // a success without an instance answers nothing
  if (result != GET_INSTANCE_OK) return CMPI_RC_OK;
  CMPI_Ptr<CMPIObjectPath> out_path;
  rc = make_cmpi_object_path(env.broker, instance.get(), env.name_space, out_path);
  if (rc == CMPI_RC_OK)
    rc = make_cmpi_instance(env.broker, instance.get(), env.name_space, out_path.get(), properties, out);
  return rc;
}

std::string name_space_of(const CMPIObjectPath* path) {
  if (path == nullptr) return {};
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  CMPIString* ns = CMGetNameSpace(path, &rc);
  const char* chars = (rc.rc == CMPI_RC_OK && ns) ? CMGetCharsPtr(ns, nullptr) : nullptr;
  return chars ? chars : "";
}

}  // namespace cimple

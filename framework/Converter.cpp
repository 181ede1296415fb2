#include "framework/Converter.h"

#include <vector>

#include "framework/Trace_File.h"

namespace cimple {

namespace {

void take_name_space(const CMPIObjectPath* path, Instance* instance) {
  if (path == nullptr) return;
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  CMPIString* ns = CMGetNameSpace(path, &rc);
  const char* chars = (rc.rc == CMPI_RC_OK && ns) ? CMGetCharsPtr(ns, nullptr) : nullptr;
  instance->__name_space = String(chars ? chars : "");
}

// The key names of a class, null-terminated, for setPropertyFilter.
std::vector<const char*> key_names(const Meta_Class* mc) {
  std::vector<const char*> keys;
  for (size_t i = 0; i < mc->num_meta_features; ++i)
    if (mc->meta_features[i]->flags & FLAG_KEY) keys.push_back(mc->meta_features[i]->name);
  keys.push_back(nullptr);
  return keys;
}

}  // namespace

CMPIrc make_cimple_reference(const CMPI_Env& env, const Meta_Class* mc, const CMPIObjectPath* path,
                             Instance*& instance) {
  instance = nullptr;
  if (mc == nullptr) return CMPI_RC_ERR_INVALID_CLASS;
  if (path == nullptr) return CMPI_RC_ERR_INVALID_PARAMETER;
  CMPIObjectPath_Container container(env, path);
  container.convert(mc, FLAG_KEY, instance);
  take_name_space(path, instance);
  return CMPI_RC_OK;
}

CMPIrc make_cimple_instance(const CMPI_Env& env, const Meta_Class* mc, const CMPIObjectPath* path,
                            const CMPIInstance* cmpi_instance, Instance*& instance) {
  instance = nullptr;
  if (mc == nullptr) return CMPI_RC_ERR_INVALID_CLASS;
  if (cmpi_instance == nullptr) return CMPI_RC_ERR_INVALID_PARAMETER;
  CMPIInstance_Container container(env, cmpi_instance);
  container.convert(mc, 0, instance);
  if (path) {
    take_name_space(path, instance);
  } else {
    // The instance's own path belongs to the broker: not released here.
    take_name_space(CMGetObjectPath(cmpi_instance, nullptr), instance);
  }
  return CMPI_RC_OK;
}

CMPIrc make_cimple_method(const CMPI_Env& env, const Meta_Method* mm, const CMPIObjectPath* path,
                          const CMPIArgs* in, Instance*& record) {
  record = nullptr;
  if (mm == nullptr) return CMPI_RC_ERR_METHOD_NOT_FOUND;
  record = create(mm);
  set_null_flags(record, true, true, 1);
  if (in) {
    CMPIArgs_Container container(env, in);
    container.convert(reinterpret_cast<const Meta_Class*>(mm), FLAG_IN, record);
  }
  take_name_space(path, record);
  return CMPI_RC_OK;
}

CMPIrc make_method_outputs(const CMPI_Env& env, const Instance* record, const CMPIArgs* out,
                           bool& has_return_value, CMPI_Out_Value& return_value) {
  has_return_value = false;
  if (record == nullptr || out == nullptr) return CMPI_RC_ERR_INVALID_PARAMETER;
  CMPIArgs_Container container(env, out);
  if (container.convert(record, FLAG_OUT) != 0) return CMPI_RC_ERR_FAILED;
  has_return_value = container.has_return_value();
  if (has_return_value) return_value = std::move(container.return_value());
  return CMPI_RC_OK;
}

CMPIrc make_cmpi_object_path(const CMPIBroker* broker, const Instance* instance, const char* name_space,
                             CMPI_Ptr<CMPIObjectPath>& path) {
  path.reset();
  if (instance == nullptr) {
    CIMPLE_WARN("ignored null instance arg");
    return CMPI_RC_ERR_INVALID_PARAMETER;
  }
  if (name_space == nullptr) {
    CIMPLE_WARN("null namespace");
    return CMPI_RC_ERR_INVALID_NAMESPACE;
  }
  const char* class_name = instance->meta_class ? instance->meta_class->name : nullptr;
  if (class_name == nullptr) {
    CIMPLE_WARN("null classname");
    return CMPI_RC_ERR_INVALID_CLASS;
  }
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  path.reset(CMNewObjectPath(broker, name_space, class_name, &rc));
  if (!path || rc.rc != CMPI_RC_OK) {
    CIMPLE_WARN("CMNewObjectPath() failed");
    path.reset();
    return rc.rc != CMPI_RC_OK ? rc.rc : CMPI_RC_ERR_FAILED;
  }
  CMPIObjectPath_Container container(CMPI_Env{broker, nullptr, name_space}, path.get());
  if (container.convert(instance, FLAG_KEY) != 0) {
    CIMPLE_WARN("Container::convert() failed");
    path.reset();
    return CMPI_RC_ERR_FAILED;
  }
  return CMPI_RC_OK;
}

CMPIrc make_cmpi_instance(const CMPIBroker* broker, const Instance* instance, const char* name_space,
                          const CMPIObjectPath* path, const char* const* properties,
                          CMPI_Ptr<CMPIInstance>& cmpi_instance) {
  cmpi_instance.reset();
  if (instance == nullptr) {
    CIMPLE_WARN("ignored null instance arg");
    return CMPI_RC_ERR_INVALID_PARAMETER;
  }
  CMPI_Ptr<CMPIObjectPath> own_path;
  if (path == nullptr) {
    CIMPLE_WARN("No ObjectPath built before call to make_CMPI_instance");
    CMPIrc rc = make_cmpi_object_path(broker, instance, name_space, own_path);
    if (rc != CMPI_RC_OK) return rc;
    path = own_path.get();
  }
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  cmpi_instance.reset(CMNewInstance(broker, path, &rc));
  if (!cmpi_instance || rc.rc != CMPI_RC_OK) {
    CIMPLE_WARN("CMNewInstance() failed");
    cmpi_instance.reset();
    return rc.rc != CMPI_RC_OK ? rc.rc : CMPI_RC_ERR_FAILED;
  }
  if (properties) {
    std::vector<const char*> keys = key_names(instance->meta_class);
    CMSetPropertyFilter(cmpi_instance.get(), const_cast<const char**>(properties), keys.data());
  }
  CMPIInstance_Container container(CMPI_Env{broker, nullptr, name_space}, cmpi_instance.get());
  if (container.convert(instance, 0) != 0) {
    CIMPLE_WARN("Container::convert() failed");
    cmpi_instance.reset();
    return CMPI_RC_ERR_FAILED;
  }
  return CMPI_RC_OK;
}

int apply_property_list(Instance* instance, const char* const* properties, bool keep_keys) {
  if (instance == nullptr) return -1;
  if (properties == nullptr) {
    set_null_flags(instance, true, true, 0);
    return 0;
  }
  set_null_flags(instance, !keep_keys, true, 1);
  const Meta_Class* mc = instance->meta_class;
  for (const char* const* name = properties; *name; ++name) {
    const Meta_Feature* feature = find_feature(mc, *name, KIND_ANY);
    if (feature == nullptr) continue;
    if (feature->flags & FLAG_METHOD) return -1;
    if (feature->flags & FLAG_PROPERTY) {
      *null_flag(instance, reinterpret_cast<const Meta_Property*>(feature)) = 0;
    } else {
      // An empty instance marks a wanted reference; an embedded value has
      // no such marker and would go out as an empty instance.
      auto* mr = reinterpret_cast<const Meta_Reference*>(feature);
      if (!is_reference_array(mr) && !is_embedded(feature) && reference_of(instance, mr) == nullptr)
        reference_slot(instance, mr) = create(mr->meta_class, false);
    }
  }
  return 0;
}

}  // namespace cimple

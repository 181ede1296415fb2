#include "framework/Container.h"

#include "framework/Trace_File.h"

namespace cimple {

namespace {

// Methods and parameters share the feature table layout of classes, so a
// method-call record converts like an instance.
void make_all_null(Instance* instance) { set_null_flags(instance, true, true, 1); }

bool masked_out(const Meta_Feature* feature, uint32_t mask) { return mask != 0 && !(feature->flags & mask); }

bool feature_is_null(const Instance* instance, const Meta_Feature* feature) {
  if (feature->flags & FLAG_PROPERTY)
    return *null_flag(instance, reinterpret_cast<const Meta_Property*>(feature)) != 0;
  auto* mr = reinterpret_cast<const Meta_Reference*>(feature);
  return !is_reference_array(mr) && reference_of(instance, mr) == nullptr;
}

}  // namespace

int Container::set_chars(const char* name, const char* chars, uint32_t flags) {
  Value value;
  value.set(String(chars));
  return set_value(name, value, flags);
}

int Container::convert(const Meta_Class* mc, uint32_t mask, Instance*& instance) {
  if (instance == nullptr) {
    instance = create(mc, false);
    make_all_null(instance);
  }
  const size_t size = get_size();
  for (size_t i = 0; i < size; ++i) {
    std::string name;
    if (get_name(i, name) != 0) {
      CIMPLE_WARN("get_name() failed: class=%s, index=%u", mc->name, static_cast<unsigned>(i));
      continue;
    }
    const Meta_Feature* feature = find_feature(mc, name.c_str(), KIND_PROPERTY | KIND_REFERENCE);
    if (feature == nullptr) {
      CIMPLE_WARN("unknown feature: %s.%s", mc->name, name.c_str());
      continue;
    }
    if (masked_out(feature, mask)) continue;
    const int type = Value::feature_type(feature);
    if (type == Value::NONE) {
      CIMPLE_WARN("unexpected error: %s.%s", mc->name, name.c_str());
      continue;
    }
    Value value;
    if (get_value(i, type, feature, value) != 0 || value.set_feature(instance, feature) != 0)
      CIMPLE_WARN("conversion error: %s.%s", mc->name, name.c_str());
  }
  return 0;
}

int Container::convert(const Instance* instance, uint32_t mask) {
  if (instance == nullptr) {
    CIMPLE_WARN("ignored null instance arg");
    return -1;
  }
  const Meta_Class* mc = instance->meta_class;
  for (size_t i = 0; i < mc->num_meta_features; ++i) {
    const Meta_Feature* feature = mc->meta_features[i];
    if (feature->flags & FLAG_METHOD) continue;
    if (masked_out(feature, mask) || feature_is_null(instance, feature)) continue;
    if (const String* text = scalar_string(instance, feature)) {
      if (set_chars(feature->name, text->c_str(), feature->flags) != 0)
        CIMPLE_WARN("conversion error: %s.%s", mc->name, feature->name);
      continue;
    }
    Value value;
    if (value.get_feature(instance, feature) != 0) {
      CIMPLE_WARN("unexpected failure: %s.%s", mc->name, feature->name);
      continue;
    }
    if (set_value(feature->name, value, feature->flags) != 0)
      CIMPLE_WARN("conversion error: %s.%s", mc->name, feature->name);
  }
  return 0;
}

}  // namespace cimple

// Name tables of the meta-data, and the look-ups over classes and features.
#include <cctype>
#include <cstring>
#include <memory>
#include <mutex>
#include <string_view>
#include <unordered_map>

#include "framework/Instance.h"

namespace cimple {

const char* const flag_names[32] = {
    "Property",   "Reference",   "Method",     "Class",          "Abstract",     "Aggregate",
    "Aggregation", "Association", "Composition", "Counter",       "Delete",       "DN",
    "EmbeddedObject", "Exception", "Expensive", "Experimental",   "Gauge",        "IfDeleted",
    "In",         "Indication",  "Invisible",  "Key",            "Large",        "OctetString",
    "Out",        "Read",        "Required",   "Static",         "Terminal",     "Weak",
    "Write",      "EmbeddedInstance",
};

const char* const type_name[14] = {
    "boolean", "uint8", "sint8",  "uint16", "sint16", "uint32",  "sint32",
    "uint64",  "sint64", "real32", "real64", "char16", "string", "datetime",
};

const char* const type_name_with_instance[15] = {
    "boolean", "uint8",  "sint8",  "uint16", "sint16", "uint32",   "sint32",  "uint64",
    "sint64",  "real32", "real64", "char16", "string", "datetime", "instance",
};

const uint8_t type_size[14] = {1, 1, 1, 2, 2, 4, 4, 8, 8, 4, 8, 2, 8, 8};

namespace {

// Names are compared case-insensitively; the first characters are compared
// before the whole names because most candidates differ there.
bool same_name(const char* candidate, const char* name) {
  if (std::tolower(static_cast<unsigned char>(candidate[0])) != std::tolower(static_cast<unsigned char>(name[0])))
    return false;
  return strcasecmp(candidate, name) == 0;
}

struct Case_Blind_Hash {
  size_t operator()(std::string_view name) const {
    size_t hash = 14695981039346656037ull;
    for (unsigned char c : name) hash = (hash ^ static_cast<size_t>(std::tolower(c))) * 1099511628211ull;
    return hash;
  }
};

struct Case_Blind_Equal {
  bool operator()(std::string_view a, std::string_view b) const { return equal_nocase(a, b); }
};

// A repository's classes by name, built on its first look-up.  It records
// the table it was built from, so a repository at a reused address (one a
// test made on its stack) is indexed afresh.
struct Class_Index {
  const Meta_Class* const* built_from = nullptr;
  size_t count = 0;
  std::unordered_map<std::string_view, const Meta_Class*, Case_Blind_Hash, Case_Blind_Equal> by_name;
};

const Class_Index& class_index(const Meta_Repository* repository) {
  static std::mutex mu;
  static auto* indexes = new std::unordered_map<const Meta_Repository*, Class_Index>();  // lives to exit
  std::lock_guard<std::mutex> lock(mu);
  Class_Index& index = (*indexes)[repository];
  if (index.built_from != repository->meta_classes || index.count != repository->num_meta_classes) {
    index.by_name.clear();
    for (size_t i = 0; i < repository->num_meta_classes; ++i)
      index.by_name.emplace(repository->meta_classes[i]->name, repository->meta_classes[i]);  // the first wins
    index.built_from = repository->meta_classes;
    index.count = repository->num_meta_classes;
  }
  return index;
}

}  // namespace

const Meta_Feature* find_feature(const Meta_Class* mc, const char* name, uint32_t kinds) {
  if (mc == nullptr || name == nullptr || *name == '\0') return nullptr;
  for (size_t i = 0; i < mc->num_meta_features; ++i) {
    const Meta_Feature* mf = mc->meta_features[i];
    if ((mf->flags & kinds) && same_name(mf->name, name)) return mf;
  }
  return nullptr;
}

const Meta_Property* find_property(const Meta_Class* mc, const char* name) {
  return reinterpret_cast<const Meta_Property*>(find_feature(mc, name, KIND_PROPERTY));
}

const Meta_Reference* find_reference(const Meta_Class* mc, const char* name) {
  return reinterpret_cast<const Meta_Reference*>(find_feature(mc, name, KIND_REFERENCE));
}

const Meta_Method* find_method(const Meta_Class* mc, const char* name) {
  return reinterpret_cast<const Meta_Method*>(find_feature(mc, name, KIND_METHOD));
}

bool is_subclass(const Meta_Class* ancestor, const Meta_Class* mc) {
  for (const Meta_Class* p = mc; p; p = p->super_meta_class)
    if (p == ancestor) return true;
  return false;
}

const Meta_Class* find_meta_class(const Meta_Repository* repository, const char* name) {
  if (repository == nullptr || name == nullptr || *name == '\0') return nullptr;
  const Class_Index& index = class_index(repository);
  auto it = index.by_name.find(std::string_view(name));
  return it == index.by_name.end() ? nullptr : it->second;
}

}  // namespace cimple

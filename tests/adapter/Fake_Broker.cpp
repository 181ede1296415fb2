#include "tests/adapter/Fake_Broker.h"

#include <strings.h>

#include <atomic>
#include <cstring>
#include <set>

// The tables fill only the slots the adapter calls; the rest stay null.
#pragma GCC diagnostic ignored "-Wmissing-field-initializers"

namespace fake {

namespace {

std::atomic<int> g_live{0};

CMPIStatus ok() { return CMPIStatus{CMPI_RC_OK, nullptr}; }
CMPIStatus fail(CMPIrc rc) { return CMPIStatus{rc, nullptr}; }
void set_rc(CMPIStatus* rc, CMPIrc code) {
  if (rc) *rc = CMPIStatus{code, nullptr};
}

// Every fake object derives from this to be counted.
struct Counted {
  Counted() { ++g_live; }
  Counted(const Counted&) = delete;
  virtual ~Counted() { --g_live; }
};

struct FString : CMPIString, Counted {
  std::string text;
  explicit FString(const char* s);
};

// Strings the broker hands out from getters live as long as their parent.
struct Scratch {
  std::vector<std::unique_ptr<FString>> strings;
  CMPIString* keep(const std::string& s) {
    strings.push_back(std::make_unique<FString>(s.c_str()));
    return strings.back().get();
  }
};

CMPIData copy_data(const CMPIData& data);
void drop_data(CMPIData& data);

using Entries = std::vector<std::pair<std::string, CMPIData>>;

CMPIData* find_entry(Entries& entries, const char* name) {
  for (auto& [key, data] : entries)
    if (strcasecmp(key.c_str(), name) == 0) return &data;
  return nullptr;
}

void store(Entries& entries, const char* name, const CMPIValue* value, CMPIType type) {
  CMPIData data{type, CMPI_goodValue, {}};
  if (value == nullptr) data.state = CMPI_nullValue;
  else if (type != CMPI_chars) data.value = *value;  // chars may be shorter than a CMPIValue
  if (type == CMPI_chars) {  // the value pointer is the text, as CIMOMs read it; kept as a string
    data.type = CMPI_string;
    data.value.string = value ? new_string(reinterpret_cast<const char*>(value)) : nullptr;
  } else {
    data = copy_data(data);
  }
  if (CMPIData* old = find_entry(entries, name)) {
    drop_data(*old);
    *old = data;
  } else {
    entries.emplace_back(name, data);
  }
}

void drop_all(Entries& entries) {
  for (auto& [key, data] : entries) drop_data(data);
  entries.clear();
}

CMPIData not_found() { return CMPIData{CMPI_null, CMPI_notFound, {}}; }

CMPIData entry_at(Entries& entries, Scratch& scratch, CMPICount i, CMPIString** name, CMPIStatus* rc) {
  if (i >= entries.size()) {
    set_rc(rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
    return not_found();
  }
  if (name) *name = scratch.keep(entries[i].first);
  set_rc(rc, CMPI_RC_OK);
  return entries[i].second;
}

// --- strings ---------------------------------------------------------------------

CMPIStatus string_release(CMPIString* s) {
  delete static_cast<FString*>(s);
  return ok();
}
CMPIString* string_clone(const CMPIString* s, CMPIStatus* rc) {
  set_rc(rc, CMPI_RC_OK);
  return new FString(static_cast<const FString*>(s)->text.c_str());
}
const char* string_chars(const CMPIString* s, CMPIStatus* rc) {
  set_rc(rc, CMPI_RC_OK);
  return static_cast<const FString*>(s)->text.c_str();
}
const CMPIStringFT kStringFT = {100, string_release, string_clone, string_chars};

FString::FString(const char* s) : text(s ? s : "") {
  hdl = const_cast<char*>(text.c_str());
  ft = &kStringFT;
}

// --- datetimes -------------------------------------------------------------------

struct FDateTime : CMPIDateTime, Counted {
  std::string text;
  Scratch scratch;
};
CMPIStatus datetime_release(CMPIDateTime* d) {
  delete static_cast<FDateTime*>(d);
  return ok();
}
CMPIDateTime* datetime_clone(const CMPIDateTime* d, CMPIStatus* rc) {
  set_rc(rc, CMPI_RC_OK);
  return new_datetime(static_cast<const FDateTime*>(d)->text.c_str());
}
CMPIString* datetime_string(const CMPIDateTime* d, CMPIStatus* rc) {
  auto* f = const_cast<FDateTime*>(static_cast<const FDateTime*>(d));
  set_rc(rc, CMPI_RC_OK);
  return f->scratch.keep(f->text);
}
CMPIBoolean datetime_interval(const CMPIDateTime* d, CMPIStatus* rc) {
  set_rc(rc, CMPI_RC_OK);
  const std::string& t = static_cast<const FDateTime*>(d)->text;
  return t.size() == 25 && t[21] == ':';
}
const CMPIDateTimeFT kDateTimeFT = {100, datetime_release, datetime_clone, nullptr, datetime_string,
                                    datetime_interval};

// --- arrays ----------------------------------------------------------------------

struct FArray : CMPIArray, Counted {
  CMPIType type;
  std::vector<CMPIData> elements;
  ~FArray() override {
    for (CMPIData& e : elements) drop_data(e);
  }
};
CMPIStatus array_release(CMPIArray* a) {
  delete static_cast<FArray*>(a);
  return ok();
}
CMPIArray* array_clone(const CMPIArray* a, CMPIStatus* rc) {
  auto* src = static_cast<const FArray*>(a);
  auto* copy = static_cast<FArray*>(new_array(static_cast<CMPICount>(src->elements.size()), src->type));
  for (size_t i = 0; i < src->elements.size(); ++i) copy->elements[i] = copy_data(src->elements[i]);
  set_rc(rc, CMPI_RC_OK);
  return copy;
}
CMPICount array_size(const CMPIArray* a, CMPIStatus* rc) {
  set_rc(rc, CMPI_RC_OK);
  return static_cast<CMPICount>(static_cast<const FArray*>(a)->elements.size());
}
CMPIType array_type(const CMPIArray* a, CMPIStatus* rc) {
  set_rc(rc, CMPI_RC_OK);
  return static_cast<const FArray*>(a)->type;
}
CMPIData array_at(const CMPIArray* a, CMPICount i, CMPIStatus* rc) {
  auto* f = static_cast<const FArray*>(a);
  if (i >= f->elements.size()) {
    set_rc(rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
    return not_found();
  }
  set_rc(rc, CMPI_RC_OK);
  return f->elements[i];
}
CMPIStatus array_set(const CMPIArray* a, CMPICount i, const CMPIValue* value, CMPIType type) {
  auto* f = const_cast<FArray*>(static_cast<const FArray*>(a));
  if (i >= f->elements.size()) return fail(CMPI_RC_ERR_NO_SUCH_PROPERTY);
  if (type != f->type && !(type == CMPI_chars && f->type == CMPI_string)) return fail(CMPI_RC_ERR_TYPE_MISMATCH);
  Entries one;
  store(one, "e", value, type);
  drop_data(f->elements[i]);
  f->elements[i] = one[0].second;
  return ok();
}
const CMPIArrayFT kArrayFT = {100, array_release, array_clone, array_size, array_type, array_at, array_set};

// --- object paths ----------------------------------------------------------------

struct FPath : CMPIObjectPath, Counted {
  std::string ns, cn;
  Entries keys;
  Scratch scratch;
  ~FPath() override { drop_all(keys); }
};
FPath* as_path(const CMPIObjectPath* p) { return const_cast<FPath*>(static_cast<const FPath*>(p)); }
CMPIStatus path_release(CMPIObjectPath* p) {
  delete as_path(p);
  return ok();
}
CMPIObjectPath* path_clone(const CMPIObjectPath* p, CMPIStatus* rc) {
  FPath* src = as_path(p);
  auto* copy = as_path(new_path(src->ns.c_str(), src->cn.c_str()));
  for (auto& [name, data] : src->keys) copy->keys.emplace_back(name, copy_data(data));
  set_rc(rc, CMPI_RC_OK);
  return copy;
}
CMPIStatus path_set_ns(const CMPIObjectPath* p, const char* ns) {
  as_path(p)->ns = ns ? ns : "";
  return ok();
}
CMPIString* path_get_ns(const CMPIObjectPath* p, CMPIStatus* rc) {
  set_rc(rc, CMPI_RC_OK);
  return as_path(p)->scratch.keep(as_path(p)->ns);
}
CMPIString* path_get_cn(const CMPIObjectPath* p, CMPIStatus* rc) {
  set_rc(rc, CMPI_RC_OK);
  return as_path(p)->scratch.keep(as_path(p)->cn);
}
CMPIStatus path_add_key(const CMPIObjectPath* p, const char* name, const CMPIValue* value, CMPIType type) {
  store(as_path(p)->keys, name, value, type);
  return ok();
}
CMPIData path_get_key(const CMPIObjectPath* p, const char* name, CMPIStatus* rc) {
  CMPIData* d = find_entry(as_path(p)->keys, name);
  set_rc(rc, d ? CMPI_RC_OK : CMPI_RC_ERR_NO_SUCH_PROPERTY);
  return d ? *d : not_found();
}
CMPIData path_key_at(const CMPIObjectPath* p, CMPICount i, CMPIString** name, CMPIStatus* rc) {
  return entry_at(as_path(p)->keys, as_path(p)->scratch, i, name, rc);
}
CMPICount path_key_count(const CMPIObjectPath* p, CMPIStatus* rc) {
  set_rc(rc, CMPI_RC_OK);
  return static_cast<CMPICount>(as_path(p)->keys.size());
}
const CMPIObjectPathFT kPathFT = {100,          path_release, path_clone,   path_set_ns,    path_get_ns,
                                  nullptr,      nullptr,      nullptr,      path_get_cn,    path_add_key,
                                  path_get_key, path_key_at,  path_key_count};

// --- instances -------------------------------------------------------------------

struct FInstance : CMPIInstance, Counted {
  FPath* path = nullptr;  // owned
  Entries properties;
  bool filtered = false;
  std::set<std::string> wanted;  // lower-case names, keys included
  Scratch scratch;
  ~FInstance() override {
    drop_all(properties);
    if (path) path_release(path);
  }
};
FInstance* as_instance(const CMPIInstance* i) { return const_cast<FInstance*>(static_cast<const FInstance*>(i)); }
std::string lower(const char* s) {
  std::string r(s);
  for (char& c : r) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
  return r;
}
CMPIStatus instance_release(CMPIInstance* i) {
  delete as_instance(i);
  return ok();
}
CMPIInstance* instance_clone(const CMPIInstance* i, CMPIStatus* rc) {
  FInstance* src = as_instance(i);
  auto* copy = as_instance(new_instance(src->path));
  for (auto& [name, data] : src->properties) copy->properties.emplace_back(name, copy_data(data));
  copy->filtered = src->filtered;
  copy->wanted = src->wanted;
  set_rc(rc, CMPI_RC_OK);
  return copy;
}
CMPIData instance_get(const CMPIInstance* i, const char* name, CMPIStatus* rc) {
  CMPIData* d = find_entry(as_instance(i)->properties, name);
  set_rc(rc, d ? CMPI_RC_OK : CMPI_RC_ERR_NO_SUCH_PROPERTY);
  return d ? *d : not_found();
}
CMPIData instance_at(const CMPIInstance* i, CMPICount n, CMPIString** name, CMPIStatus* rc) {
  return entry_at(as_instance(i)->properties, as_instance(i)->scratch, n, name, rc);
}
CMPICount instance_count(const CMPIInstance* i, CMPIStatus* rc) {
  set_rc(rc, CMPI_RC_OK);
  return static_cast<CMPICount>(as_instance(i)->properties.size());
}
CMPIStatus instance_set(const CMPIInstance* i, const char* name, const CMPIValue* value, CMPIType type) {
  FInstance* f = as_instance(i);
  if (f->filtered && !f->wanted.count(lower(name))) return ok();  // filtered out, as a CIMOM does
  store(f->properties, name, value, type);
  return ok();
}
CMPIObjectPath* instance_path(const CMPIInstance* i, CMPIStatus* rc) {
  set_rc(rc, CMPI_RC_OK);
  return as_instance(i)->path;
}
CMPIStatus instance_filter(const CMPIInstance* i, const char** properties, const char** keys) {
  FInstance* f = as_instance(i);
  if (properties == nullptr) return ok();
  f->filtered = true;
  for (const char** p = properties; *p; ++p) f->wanted.insert(lower(*p));
  for (const char** k = keys; k && *k; ++k) f->wanted.insert(lower(*k));
  return ok();
}
const CMPIInstanceFT kInstanceFT = {100,          instance_release, instance_clone, instance_get,
                                    instance_at,  instance_count,   instance_set,   instance_path,
                                    instance_filter};

// --- arguments -------------------------------------------------------------------

struct FArgs : CMPIArgs, Counted {
  Entries args;
  Scratch scratch;
  ~FArgs() override { drop_all(args); }
};
FArgs* as_args(const CMPIArgs* a) { return const_cast<FArgs*>(static_cast<const FArgs*>(a)); }
CMPIStatus args_release(CMPIArgs* a) {
  delete as_args(a);
  return ok();
}
CMPIStatus args_add(const CMPIArgs* a, const char* name, const CMPIValue* value, CMPIType type) {
  store(as_args(a)->args, name, value, type);
  return ok();
}
CMPIData args_get(const CMPIArgs* a, const char* name, CMPIStatus* rc) {
  CMPIData* d = find_entry(as_args(a)->args, name);
  set_rc(rc, d ? CMPI_RC_OK : CMPI_RC_ERR_NO_SUCH_PROPERTY);
  return d ? *d : not_found();
}
CMPIData args_at(const CMPIArgs* a, CMPICount i, CMPIString** name, CMPIStatus* rc) {
  return entry_at(as_args(a)->args, as_args(a)->scratch, i, name, rc);
}
CMPICount args_count(const CMPIArgs* a, CMPIStatus* rc) {
  set_rc(rc, CMPI_RC_OK);
  return static_cast<CMPICount>(as_args(a)->args.size());
}
const CMPIArgsFT kArgsFT = {100, args_release, nullptr, args_add, args_get, args_at, args_count};

// --- contexts --------------------------------------------------------------------

struct FContext : CMPIContext, Counted {
  Entries entries;
  ~FContext() override { drop_all(entries); }
};
CMPIStatus context_release(CMPIContext* c) {
  delete static_cast<FContext*>(c);
  return ok();
}
CMPIData context_get(const CMPIContext* c, const char* name, CMPIStatus* rc) {
  auto* f = const_cast<FContext*>(static_cast<const FContext*>(c));
  CMPIData* d = find_entry(f->entries, name);
  set_rc(rc, d ? CMPI_RC_OK : CMPI_RC_ERR_NO_SUCH_PROPERTY);
  return d ? *d : not_found();
}
const CMPIContextFT kContextFT = {100, context_release, nullptr, context_get};

// --- enumerations ----------------------------------------------------------------

struct FEnumeration : CMPIEnumeration, Counted {
  std::vector<CMPIData> items;
  size_t next = 0;
  ~FEnumeration() override {
    for (CMPIData& d : items) drop_data(d);
  }
};
FEnumeration* as_enum(const CMPIEnumeration* e) {
  return const_cast<FEnumeration*>(static_cast<const FEnumeration*>(e));
}
CMPIStatus enum_release(CMPIEnumeration* e) {
  delete as_enum(e);
  return ok();
}
CMPIData enum_next(const CMPIEnumeration* e, CMPIStatus* rc) {
  FEnumeration* f = as_enum(e);
  if (f->next >= f->items.size()) {
    set_rc(rc, CMPI_RC_NO_MORE_ELEMENTS);
    return not_found();
  }
  set_rc(rc, CMPI_RC_OK);
  return f->items[f->next++];
}
CMPIBoolean enum_has_next(const CMPIEnumeration* e, CMPIStatus* rc) {
  set_rc(rc, CMPI_RC_OK);
  return as_enum(e)->next < as_enum(e)->items.size();
}
const CMPIEnumerationFT kEnumerationFT = {100, enum_release, nullptr, enum_next, enum_has_next};

// --- deep copies -----------------------------------------------------------------

CMPIData copy_data(const CMPIData& data) {
  CMPIData copy = data;
  if (data.state & CMPI_nullValue) return copy;
  if (data.type & CMPI_ARRAY) {
    if (data.value.array) copy.value.array = array_clone(data.value.array, nullptr);
  } else if (data.type == CMPI_string) {
    if (data.value.string) copy.value.string = string_clone(data.value.string, nullptr);
  } else if (data.type == CMPI_dateTime) {
    if (data.value.dateTime) copy.value.dateTime = datetime_clone(data.value.dateTime, nullptr);
  } else if (data.type == CMPI_ref) {
    if (data.value.ref) copy.value.ref = path_clone(data.value.ref, nullptr);
  } else if (data.type == CMPI_instance) {
    if (data.value.inst) copy.value.inst = instance_clone(data.value.inst, nullptr);
  }
  return copy;
}

void drop_data(CMPIData& data) {
  if (!(data.state & CMPI_nullValue)) {
    if (data.type & CMPI_ARRAY) {
      if (data.value.array) array_release(data.value.array);
    } else if (data.type == CMPI_string) {
      if (data.value.string) string_release(data.value.string);
    } else if (data.type == CMPI_dateTime) {
      if (data.value.dateTime) datetime_release(data.value.dateTime);
    } else if (data.type == CMPI_ref) {
      if (data.value.ref) path_release(data.value.ref);
    } else if (data.type == CMPI_instance) {
      if (data.value.inst) instance_release(data.value.inst);
    }
  }
  data.state = CMPI_nullValue;
}

}  // namespace

// --- public factories -------------------------------------------------------------

int live_objects() { return g_live.load(); }

CMPIString* new_string(const char* text) { return new FString(text); }

CMPIObjectPath* new_path(const char* name_space, const char* class_name) {
  auto* p = new FPath;
  p->hdl = p;
  p->ft = &kPathFT;
  p->ns = name_space ? name_space : "";
  p->cn = class_name ? class_name : "";
  return p;
}

CMPIInstance* new_instance(const CMPIObjectPath* path) {
  auto* i = new FInstance;
  i->hdl = i;
  i->ft = &kInstanceFT;
  i->path = path ? as_path(path_clone(path, nullptr)) : as_path(new_path("", ""));
  return i;
}

CMPIArgs* new_args() {
  auto* a = new FArgs;
  a->hdl = a;
  a->ft = &kArgsFT;
  return a;
}

CMPIArray* new_array(CMPICount size, CMPIType type) {
  auto* a = new FArray;
  a->hdl = a;
  a->ft = &kArrayFT;
  a->type = type == CMPI_chars ? CMPI_string : type;
  a->elements.assign(size, CMPIData{a->type, CMPI_nullValue, {}});
  return a;
}

CMPIDateTime* new_datetime(const char* text) {
  auto* d = new FDateTime;
  d->hdl = d;
  d->ft = &kDateTimeFT;
  d->text = text ? text : "";
  return d;
}

CMPIContext* new_context(const char* principal) {
  auto* c = new FContext;
  c->hdl = c;
  c->ft = &kContextFT;
  if (principal) {
    store(c->entries, CMPIPrincipal, reinterpret_cast<const CMPIValue*>(principal), CMPI_chars);
  }
  return c;
}

std::string text_of(const CMPIData& data) {
  if (data.state & (CMPI_nullValue | CMPI_notFound)) return "";
  if (data.type == CMPI_string && data.value.string) return static_cast<FString*>(data.value.string)->text;
  if (data.type == CMPI_chars && data.value.chars) return data.value.chars;
  return "";
}

void add_string_key(const CMPIObjectPath* path, const char* name, const char* value) {
  path_add_key(path, name, reinterpret_cast<const CMPIValue*>(value), CMPI_chars);
}

void set_string_property(const CMPIInstance* instance, const char* name, const char* value) {
  instance_set(instance, name, reinterpret_cast<const CMPIValue*>(value), CMPI_chars);
}

std::string class_of(const CMPIObjectPath* path) { return as_path(path)->cn; }
std::string name_space_of(const CMPIObjectPath* path) { return as_path(path)->ns; }
CMPIData property_of(const CMPIInstance* instance, const char* name) { return instance_get(instance, name, nullptr); }
CMPIData key_of(const CMPIObjectPath* path, const char* name) { return path_get_key(path, name, nullptr); }
CMPIData arg_of(const CMPIArgs* args, const char* name) { return args_get(args, name, nullptr); }
const CMPIObjectPath* path_of(const CMPIInstance* instance) { return as_instance(instance)->path; }

// --- results ------------------------------------------------------------------------

struct Result_Access {
  static Returned& of(const CMPIResult* r) { return static_cast<Result*>(r->hdl)->returned_; }
  static CMPIStatus return_data(const CMPIResult* r, const CMPIValue* value, CMPIType type) {
    Entries one;
    store(one, "d", value, type);
    of(r).data.push_back(one[0].second);
    return ok();
  }
  static CMPIStatus return_instance(const CMPIResult* r, const CMPIInstance* i) {
    if (i == nullptr) return fail(CMPI_RC_ERR_INVALID_PARAMETER);
    of(r).instances.push_back(instance_clone(i, nullptr));
    of(r).live_at_return.push_back(live_objects());
    return ok();
  }
  static CMPIStatus return_path(const CMPIResult* r, const CMPIObjectPath* p) {
    if (p == nullptr) return fail(CMPI_RC_ERR_INVALID_PARAMETER);
    of(r).paths.push_back(path_clone(p, nullptr));
    of(r).live_at_return.push_back(live_objects());
    return ok();
  }
  static CMPIStatus return_done(const CMPIResult* r) {
    ++of(r).done;
    return ok();
  }
};

namespace {
const CMPIResultFT kResultFT = {100,
                                nullptr,
                                nullptr,
                                Result_Access::return_data,
                                Result_Access::return_instance,
                                Result_Access::return_path,
                                Result_Access::return_done,
                                nullptr};
}  // namespace

Result::Result() : result_{this, &kResultFT} {}

Result::~Result() {
  for (CMPIInstance* i : returned_.instances) instance_release(i);
  for (CMPIObjectPath* p : returned_.paths) path_release(p);
  for (CMPIData& d : returned_.data) drop_data(d);
}

// --- broker ---------------------------------------------------------------------------

struct Broker_Access {
  static Broker& of(const CMPIBroker* b) { return *static_cast<Broker*>(b->hdl); }

  static CMPIContext* prepare(const CMPIBroker* b, const CMPIContext*) {
    Broker& broker = of(b);
    ++broker.prepared;
    broker.attach_contexts_.push_back(new_context("attached"));
    return broker.attach_contexts_.back();
  }
  static CMPIStatus attach(const CMPIBroker* b, const CMPIContext*) {
    ++of(b).attached;
    return ok();
  }
  static CMPIStatus detach(const CMPIBroker* b, const CMPIContext*) {
    ++of(b).detached;
    return ok();
  }
  static CMPIInstance* get_instance(const CMPIBroker* b, const CMPIContext*, const CMPIObjectPath* path,
                                    const char** properties, CMPIStatus* rc) {
    Broker& broker = of(b);
    ++broker.get_instance_calls;
    broker.property_lists.push_back(properties);
    if (!broker.get_instance) {
      set_rc(rc, CMPI_RC_ERR_NOT_FOUND);
      return nullptr;
    }
    set_rc(rc, CMPI_RC_OK);
    return broker.get_instance(path, rc);
  }
  static CMPIEnumeration* enumerate(const CMPIBroker* b, const CMPIContext*, const CMPIObjectPath* path,
                                    const char**, CMPIStatus* rc) {
    Broker& broker = of(b);
    if (!broker.enumerate_instances) {
      set_rc(rc, CMPI_RC_ERR_NOT_SUPPORTED);
      return nullptr;
    }
    auto* e = new FEnumeration;
    e->hdl = e;
    e->ft = &kEnumerationFT;
    for (CMPIInstance* i : broker.enumerate_instances(path)) {
      CMPIData d{CMPI_instance, CMPI_goodValue, {}};
      d.value.inst = i;
      e->items.push_back(d);
    }
    set_rc(rc, CMPI_RC_OK);
    return e;
  }
  static CMPIObjectPath* create(const CMPIBroker* b, const CMPIContext*, const CMPIObjectPath* path,
                                const CMPIInstance*, CMPIStatus* rc) {
    of(b).created.push_back(class_of(path));
    set_rc(rc, CMPI_RC_OK);
    return path_clone(path, nullptr);
  }
  static CMPIStatus modify(const CMPIBroker* b, const CMPIContext*, const CMPIObjectPath* path, const CMPIInstance*,
                           const char**) {
    of(b).modified.push_back(class_of(path));
    return ok();
  }
  static CMPIStatus remove(const CMPIBroker* b, const CMPIContext*, const CMPIObjectPath* path) {
    of(b).deleted.push_back(class_of(path));
    return ok();
  }

  static CMPIInstance* e_new_instance(const CMPIBroker*, const CMPIObjectPath* path, CMPIStatus* rc) {
    set_rc(rc, CMPI_RC_OK);
    return new_instance(path);
  }
  static CMPIObjectPath* e_new_path(const CMPIBroker*, const char* ns, const char* cn, CMPIStatus* rc) {
    set_rc(rc, CMPI_RC_OK);
    return new_path(ns, cn);
  }
  static CMPIArgs* e_new_args(const CMPIBroker*, CMPIStatus* rc) {
    set_rc(rc, CMPI_RC_OK);
    return new_args();
  }
  static CMPIString* e_new_string(const CMPIBroker*, const char* s, CMPIStatus* rc) {
    set_rc(rc, CMPI_RC_OK);
    return new_string(s);
  }
  static CMPIArray* e_new_array(const CMPIBroker*, CMPICount n, CMPIType t, CMPIStatus* rc) {
    set_rc(rc, CMPI_RC_OK);
    return new_array(n, t);
  }
  static CMPIDateTime* e_new_datetime(const CMPIBroker*, const char* s, CMPIStatus* rc) {
    set_rc(rc, CMPI_RC_OK);
    return new_datetime(s);
  }
};

namespace {

const CMPIBrokerFT kBrokerFT = {0,
                                100,
                                "fake",
                                Broker_Access::prepare,
                                Broker_Access::attach,
                                Broker_Access::detach,
                                nullptr,
                                nullptr,
                                Broker_Access::get_instance,
                                Broker_Access::create,
                                Broker_Access::modify,
                                Broker_Access::remove,
                                nullptr,
                                Broker_Access::enumerate};

CMPIBrokerEncFT make_encft() {
  CMPIBrokerEncFT ft{};
  ft.ftVersion = 100;
  ft.newInstance = Broker_Access::e_new_instance;
  ft.newObjectPath = Broker_Access::e_new_path;
  ft.newArgs = Broker_Access::e_new_args;
  ft.newString = Broker_Access::e_new_string;
  ft.newArray = Broker_Access::e_new_array;
  ft.newDateTimeFromChars = Broker_Access::e_new_datetime;
  return ft;
}
const CMPIBrokerEncFT kBrokerEncFT = make_encft();

}  // namespace

Broker::Broker() : broker_{this, &kBrokerFT, &kBrokerEncFT, nullptr, nullptr} {}

Broker::~Broker() {
  for (CMPIContext* c : attach_contexts_) context_release(c);
}

}  // namespace fake

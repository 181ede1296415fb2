// A minimal in-process CMPI broker for driving the adapter through its MI
// tables: the encapsulated objects the adapter creates or reads (strings,
// datetimes, arrays, object paths, instances, arguments, contexts, results,
// enumerations) and the few up-calls it makes.  Stored values are deep
// copies, as a CIMOM keeps them; every object counts itself so tests can
// check that the adapter releases what it creates.
#pragma once

#include <atomic>
#include <functional>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "cmpimacs.h"

namespace fake {

// Objects alive (created and not yet released), all kinds together.
int live_objects();

CMPIString* new_string(const char* text);
CMPIObjectPath* new_path(const char* name_space, const char* class_name);
CMPIInstance* new_instance(const CMPIObjectPath* path);
CMPIArgs* new_args();
CMPIArray* new_array(CMPICount size, CMPIType type);
CMPIDateTime* new_datetime(const char* text);
CMPIContext* new_context(const char* principal);  // null principal: no entry

// Text of a string-typed key, property or argument ("" when absent).
std::string text_of(const CMPIData& data);
void add_string_key(const CMPIObjectPath* path, const char* name, const char* value);
void set_string_property(const CMPIInstance* instance, const char* name, const char* value);
std::string class_of(const CMPIObjectPath* path);
std::string name_space_of(const CMPIObjectPath* path);
// The stored property (CMPI_notFound state when the instance lacks it).
CMPIData property_of(const CMPIInstance* instance, const char* name);
CMPIData key_of(const CMPIObjectPath* path, const char* name);
CMPIData arg_of(const CMPIArgs* args, const char* name);
const CMPIObjectPath* path_of(const CMPIInstance* instance);

// What the adapter returned through a CMPIResult.
struct Returned {
  std::vector<CMPIInstance*> instances;  // clones, owned
  std::vector<CMPIObjectPath*> paths;    // clones, owned
  std::vector<CMPIData> data;            // deep copies, owned
  int done = 0;
  std::vector<int> live_at_return;  // live_objects() after each returned object
};

class Result {
 public:
  Result();
  ~Result();
  Result(const Result&) = delete;
  Result& operator=(const Result&) = delete;
  const CMPIResult* get() const { return &result_; }
  const Returned& returned() const { return returned_; }

 private:
  friend struct Result_Access;
  CMPIResult result_;
  Returned returned_;
};

class Broker {
 public:
  Broker();
  ~Broker();
  Broker(const Broker&) = delete;
  Broker& operator=(const Broker&) = delete;
  const CMPIBroker* get() const { return &broker_; }

  // Up-call behaviour; each answers a new object the caller releases.
  std::function<CMPIInstance*(const CMPIObjectPath* path, CMPIStatus* rc)> get_instance;
  std::function<std::vector<CMPIInstance*>(const CMPIObjectPath* path)> enumerate_instances;

  // Thread calls come from threads the adapter starts.
  std::atomic<int> prepared{0};
  std::atomic<int> attached{0};
  std::atomic<int> detached{0};
  int get_instance_calls = 0;
  std::vector<std::string> created, modified, deleted;  // class names
  std::vector<const char**> property_lists;               // as given to getInstance

 private:
  friend struct Broker_Access;
  CMPIBroker broker_;
  std::vector<CMPIContext*> attach_contexts_;
};

}  // namespace fake

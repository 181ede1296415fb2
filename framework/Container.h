// cimple::Container: an abstract, indexable set of named values, and the one
// generic conversion between a container and an instance (or method-call
// record) in both directions.  Each CMPI object kind has its own container.
//
// Contract: a conversion never stops at one bad entry: the entry is logged
// to the trace file and skipped.  Only a missing instance argument fails it.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

#include "framework/Value.h"

namespace cimple {

class Container {
 public:
  Container() = default;
  Container(const Container&) = delete;
  Container& operator=(const Container&) = delete;
  virtual ~Container() = default;

  virtual size_t get_size() = 0;
  virtual int get_name(size_t pos, std::string& name) = 0;
  // The value at `pos` converted to `type` (a Value type); `feature` is the
  // feature it is meant for (references need its class).  0 or -1.
  virtual int get_value(size_t pos, int type, const Meta_Feature* feature, Value& value) = 0;
  virtual int set_value(const char* name, const Value& value, uint32_t flags) = 0;
  // A scalar string, which is most of what an instance holds, set without
  // a Value (that is, without copying it); by default through set_value.
  virtual int set_chars(const char* name, const char* chars, uint32_t flags);

  // Container to instance: fills the features (restricted to those with a
  // flag of `mask`, when non-zero) of `instance`; when `instance` is null,
  // first creates one of `mc` with every property null.  Answers 0.
  int convert(const Meta_Class* mc, uint32_t mask, Instance*& instance);
  // Instance to container: sets every non-null feature (restricted by
  // `mask`) under its name.  -1 only for a null instance.
  int convert(const Instance* instance, uint32_t mask);
};

}  // namespace cimple

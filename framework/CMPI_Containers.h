// The containers over CMPI objects: object path keys, instance properties
// and method arguments, each read and written through the CMPI functions of
// its object kind.
//
// Contract: a container borrows the CMPI object it wraps and the strings of
// its CMPI_Env; both must outlive it.  Conversion failures are logged to the
// trace file and answered -1; nothing here throws into the CIMOM.
#pragma once

#include <string>

#include "framework/CMPI_Data.h"
#include "framework/Container.h"

namespace cimple {

class CMPI_Container : public Container {
 protected:
  explicit CMPI_Container(const CMPI_Env& env)
      : name_space_(env.name_space ? env.name_space : ""),
        env_{env.broker, env.repository, name_space_.c_str()} {}
  // Reads the entry name of a CMPI "...At" accessor result.
  static int take_name(CMPIString* name, const CMPIStatus& rc, std::string& out);

  std::string name_space_;
  CMPI_Env env_;
};

class CMPIObjectPath_Container : public CMPI_Container {
 public:
  CMPIObjectPath_Container(const CMPI_Env& env, const CMPIObjectPath* path) : CMPI_Container(env), path_(path) {}
  size_t get_size() override;
  int get_name(size_t pos, std::string& name) override;
  int get_value(size_t pos, int type, const Meta_Feature* feature, Value& value) override;
  int set_value(const char* name, const Value& value, uint32_t flags) override;
  int set_chars(const char* name, const char* chars, uint32_t flags) override;

 private:
  const CMPIObjectPath* path_;
};

class CMPIInstance_Container : public CMPI_Container {
 public:
  CMPIInstance_Container(const CMPI_Env& env, const CMPIInstance* instance)
      : CMPI_Container(env), instance_(instance) {}
  size_t get_size() override;
  int get_name(size_t pos, std::string& name) override;
  int get_value(size_t pos, int type, const Meta_Feature* feature, Value& value) override;
  int set_value(const char* name, const Value& value, uint32_t flags) override;
  int set_chars(const char* name, const char* chars, uint32_t flags) override;

 private:
  const CMPIInstance* instance_;
};

// Over method arguments.  A value set under "return_value" is also kept as
// the method's return value (with its CMPI type) for returnData.
class CMPIArgs_Container : public CMPI_Container {
 public:
  CMPIArgs_Container(const CMPI_Env& env, const CMPIArgs* args) : CMPI_Container(env), args_(args) {}
  size_t get_size() override;
  int get_name(size_t pos, std::string& name) override;
  int get_value(size_t pos, int type, const Meta_Feature* feature, Value& value) override;
  int set_value(const char* name, const Value& value, uint32_t flags) override;

  bool has_return_value() const { return has_return_value_; }
  CMPI_Out_Value& return_value() { return return_value_; }

 private:
  const CMPIArgs* args_;
  bool has_return_value_ = false;
  CMPI_Out_Value return_value_;
};

}  // namespace cimple

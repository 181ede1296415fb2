#include "tests/e2e/E2E_Fixture.h"

#include <dlfcn.h>
#include <stdlib.h>

#include <filesystem>
#include <fstream>
#include <sstream>

namespace e2e {

namespace {
// Removed when the test program ends.
struct Scratch_Home {
  Scratch_Home() {
    char pattern[] = "/tmp/nrv-e2e-XXXXXX";
    if (mkdtemp(pattern) == nullptr) return;
    dir = pattern;
    std::ofstream(dir + "/.cimplerc") << "LOG_LEVEL=DBG\n";
    setenv("CIMPLE_HOME", dir.c_str(), 1);
  }
  ~Scratch_Home() {
    std::error_code ignored;
    if (!dir.empty()) std::filesystem::remove_all(dir, ignored);
  }
  std::string dir;
};
}  // namespace

const std::string& trace_home() {
  static const Scratch_Home home;
  return home.dir;
}

std::string read_traces() {
  std::ifstream in(trace_home() + "/.cimple/messages");
  std::ostringstream text;
  text << in.rdbuf();
  return text.str();
}

PathData class_path(const std::string& class_name) {
  PathData path;
  path.nameSpace = kNs;
  path.className = class_name;
  return path;
}

namespace {
PathData keyed(const std::string& class_name, const std::string& tag) {
  PathData path = class_path(class_name);
  path.keys = {{"CreationClassName", Datum::string(class_name)}, {"Tag", Datum::string(tag)}};
  return path;
}
}  // namespace

PathData card_path(const std::string& tag) { return keyed("NRVTAVO_Card", tag); }
PathData chip_path(const std::string& tag) { return keyed("NRVTAVO_Chip", tag); }

PathData service_path(const std::string& name) {
  PathData path = class_path("NRVTAVO_ChannelMgmtService");
  path.keys = {{"SystemCreationClassName", Datum::string("CIM_ComputerSystem")},
               {"SystemName", Datum::string("host")},
               {"CreationClassName", Datum::string("NRVTAVO_ChannelMgmtService")},
               {"Name", Datum::string(name)}};
  return path;
}

const Datum* property(const HostInstance& instance, const std::string& name) {
  return findNamed(instance.properties, name);
}

void E2E_Test::SetUp() {
  trace_home();
  trace_start_ = read_traces().size();
  host_ = std::make_unique<Host>(test_module());
  ASSERT_TRUE(host_->moduleLoaded()) << host_->loadError();
  handle_ = dlopen(test_module().c_str(), RTLD_NOW | RTLD_NOLOAD);
  ASSERT_NE(handle_, nullptr) << dlerror();
  auto reset = reinterpret_cast<void (*)()>(dlsym(handle_, "nrv_test_module_reset"));
  ASSERT_NE(reset, nullptr);
  reset();
}

void E2E_Test::TearDown() {
  host_.reset();
  if (handle_) dlclose(handle_);
}

test::Store& E2E_Test::module_store() {
  auto hook = reinterpret_cast<test::Store* (*)()>(module_symbol("nrv_test_module_store"));
  return *hook();
}

void* E2E_Test::module_symbol(const char* name) { return dlsym(handle_, name); }

std::string E2E_Test::traces() const { return read_traces().substr(trace_start_); }

}  // namespace e2e

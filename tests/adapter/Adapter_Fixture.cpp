#include "tests/adapter/Adapter_Fixture.h"

#include <stdlib.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>

namespace test {

namespace {
// Outlives every static destructor, so the exit hook may still read it.
char g_home[] = "/tmp/nrv_adapter_trace_XXXXXX";
}  // namespace

const std::string& trace_home() {
  static const std::string home = [] {
    if (mkdtemp(g_home) == nullptr) return std::string("/tmp");
    std::ofstream(std::string(g_home) + "/.cimplerc") << "# adapter tests\n\nLOG_LEVEL = DBG  \n";
    setenv("CIMPLE_HOME", g_home, 1);
    std::atexit([] { std::filesystem::remove_all(g_home); });
    return std::string(g_home);
  }();
  return home;
}

std::string read_traces() {
  std::ifstream in(trace_home() + "/.cimple/messages");
  std::stringstream text;
  text << in.rdbuf();
  return text.str();
}

void Adapter_Test::SetUp() {
  trace_home();
  reset_store();
  context_ = fake::new_context("alice");
  trace_mark_ = read_traces().size();
}

void Adapter_Test::TearDown() {
  for (Provider_Slot slot : {card_slot(), chip_slot(), link_slot(), service_slot()}) {
    for (int guard = 0; slot.record->adapter && guard < 100; ++guard)
      CMPI_Adapter::cleanup(slot.record, context_, 1, "cleanup");
  }
  for (CMPIObjectPath* p : paths_) CMRelease(p);
  for (CMPIArgs* a : args_) CMRelease(a);
  for (CMPIInstance* i : instances_) CMRelease(i);
  CMRelease(context_);
}

void* Adapter_Test::factory(Provider_Slot slot, char kind) {
  void* mi = nullptr;
  cimple_cmpi_adapter(67, slot.record, slot.registration, broker_.get(), context_, slot.registration->provider_name,
                      kind, &mi);
  return mi;
}

CMPIObjectPath* Adapter_Test::path(const char* class_name, const char* ns) {
  paths_.push_back(fake::new_path(ns, class_name));
  return paths_.back();
}

CMPIObjectPath* Adapter_Test::card_path(const char* tag) {
  CMPIObjectPath* p = path("NRVTAVO_Card");
  fake::add_string_key(p, "CreationClassName", "NRVTAVO_Card");
  fake::add_string_key(p, "Tag", tag);
  return p;
}

CMPIObjectPath* Adapter_Test::chip_path(const char* tag) {
  CMPIObjectPath* p = path("NRVTAVO_Chip");
  fake::add_string_key(p, "CreationClassName", "NRVTAVO_Chip");
  fake::add_string_key(p, "Tag", tag);
  return p;
}

CMPIObjectPath* Adapter_Test::service_path(const char* name) {
  CMPIObjectPath* p = path("NRVTAVO_ChannelMgmtService");
  fake::add_string_key(p, "SystemCreationClassName", "CIM_ComputerSystem");
  fake::add_string_key(p, "SystemName", "host");
  fake::add_string_key(p, "CreationClassName", "NRVTAVO_ChannelMgmtService");
  fake::add_string_key(p, "Name", name);
  return p;
}

CMPIArgs* Adapter_Test::args() {
  args_.push_back(fake::new_args());
  return args_.back();
}

CMPIInstance* Adapter_Test::instance(const CMPIObjectPath* on) {
  instances_.push_back(fake::new_instance(on));
  return instances_.back();
}

std::string Adapter_Test::traces() const { return read_traces().substr(trace_mark_); }

}  // namespace test

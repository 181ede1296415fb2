// The built module as a CIMOM sees it: its registration list and the
// exported factories of every provider, found with dlopen/dlsym.
#include <dlfcn.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <set>
#include <string>
#include <vector>

#include "framework/Provider.h"
#include "schema/ProviderClasses.h"

namespace {

#define NRV_NAME(C) #C,
const std::vector<std::string> all_classes = {NRV_FOR_EACH_PROVIDER_CLASS(NRV_NAME)};
const std::vector<std::string> association_classes = {NRV_FOR_EACH_ASSOCIATION_PROVIDER_CLASS(NRV_NAME)};
#undef NRV_NAME

class Module : public ::testing::Test {
 protected:
  static void SetUpTestSuite() {
    const char* path = std::getenv("NRV_MODULE");
    ASSERT_NE(path, nullptr) << "NRV_MODULE names the built module";
    handle_ = dlopen(path, RTLD_NOW | RTLD_LOCAL);
    ASSERT_NE(handle_, nullptr) << dlerror();
  }
  static void TearDownTestSuite() {
    if (handle_) dlclose(handle_);
  }
  static void* symbol(const std::string& name) { return dlsym(handle_, name.c_str()); }
  static void* handle_;
};
void* Module::handle_ = nullptr;

TEST_F(Module, RegistersEveryProviderOnceUnderTheModuleName) {
  using Entry = const cimple::Provider_Registration* (*)();
  auto entry = reinterpret_cast<Entry>(symbol("cimple_module"));
  ASSERT_NE(entry, nullptr);
  std::multiset<std::string> names;
  for (const auto* r = entry(); r; r = r->next) {
    EXPECT_STREQ(r->module_name, "norvane_tavo_provider_Module");
    ASSERT_NE(r->meta_class, nullptr);
    EXPECT_EQ(std::string(r->provider_name), std::string(r->meta_class->name) + "_Provider");
    EXPECT_NE(r->proc, nullptr);
    names.insert(r->provider_name);
  }
  EXPECT_EQ(names.size(), all_classes.size());
  for (const std::string& c : all_classes) EXPECT_EQ(names.count(c + "_Provider"), 1u) << c;
}

TEST_F(Module, ExportsTheFactoriesAndTheirAliases) {
  std::set<std::string> associations(association_classes.begin(), association_classes.end());
  for (const std::string& c : all_classes) {
    for (const char* kind : {"Instance", "Method", "Association"}) {
      bool wanted = std::string(kind) != "Association" || associations.count(c);
      std::string suffix = std::string("_Create_") + kind + "MI";
      EXPECT_EQ(symbol(c + "_Provider" + suffix) != nullptr, wanted) << c << suffix;
      EXPECT_EQ(symbol(c + suffix) != nullptr, wanted) << c << suffix << " (alias)";
    }
  }
}

TEST_F(Module, KeepsEverythingElseInside) {
  EXPECT_EQ(symbol("RM_GetHBAAttributes"), nullptr);
  EXPECT_EQ(symbol("HBA_OpenAdapter"), nullptr);
}

TEST_F(Module, OperationsOutsideTheTableAreRefused) {
  using Entry = const cimple::Provider_Registration* (*)();
  const auto* r = reinterpret_cast<Entry>(symbol("cimple_module"))();
  ASSERT_NE(r, nullptr);
  for (int operation : {-5, 17, 99}) EXPECT_EQ(r->proc(r, operation, 0, 0, 0, 0, 0, 0, 0, 0), -1);
}

}  // namespace

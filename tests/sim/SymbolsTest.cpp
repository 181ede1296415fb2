// Every function the module's loader looks up resolves with dlsym in the
// library directory it is meant for, and each variant directory lacks exactly
// what it is built to lack, so the forwarders' failure paths can really run.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "SimLibrary.h"

namespace nrvsim_test {
namespace {

std::vector<std::string> paired_ops() {
  std::vector<std::string> out;
#define NAME_(op, ...) out.push_back(#op);
  NRV_RM_PAIRED_FUNCTIONS(NAME_)
#undef NAME_
  return out;
}

std::vector<std::string> singles(const std::string& group) {
  std::vector<std::string> out;
#define NAME_(g, ret, name, ...) \
  if (group == #g) out.push_back(#name);
  NRV_RM_SINGLE_FUNCTIONS(NAME_)
#undef NAME_
  return out;
}

void expect_management(const Library& lib, bool lrm_names) {
  ASSERT_TRUE(lib.ok()) << dlerror();
  for (const auto& op : paired_ops()) {
    EXPECT_NE(lib.symbol(("RM_" + op).c_str()), nullptr) << "RM_" << op;
    EXPECT_EQ(lib.symbol(("LRM_" + op).c_str()) != nullptr, lrm_names) << "LRM_" << op;
  }
  for (const auto& name : singles("MGMT")) EXPECT_NE(lib.symbol(name.c_str()), nullptr) << name;
}

TEST(Symbols, PrimaryManagementLibraryHasEveryName) {
  EXPECT_GT(paired_ops().size(), 100u);
  expect_management(lrmapi(), true);
}

TEST(Symbols, FallbackLibraryHasEveryName) {
  Library lib(library_path("sim-fallback", "librmapi.so"));
  expect_management(lib, true);
}

TEST(Symbols, FallbackLibraryAnswersFromTheSameSite) {
  Library lib(library_path("sim-fallback", "librmapi.so"));
  ASSERT_TRUE(lib.ok());
  EXPECT_EQ(SIM_CALL(lib, RM_GetNumberOfLocalAdapters), SIM_CALL(lrmapi(), RM_GetNumberOfLocalAdapters));
  EXPECT_GT(SIM_CALL(lib, RM_GetNumberOfLocalAdapters), 0u);
  EXPECT_EQ(SIM_CALL(lib, RM_InitLib), 0u);
}

TEST(Symbols, RmOnlyFallbackKeepsTheLrmOnlyNames) {
  Library lib(library_path("sim-fallback-rmonly", "librmapi.so"));
  expect_management(lib, false);
}

TEST(Symbols, HbaApiLibraryHasEveryName) {
  ASSERT_TRUE(hbaapi().ok()) << dlerror();
  for (const auto& name : singles("HBA")) EXPECT_NE(hbaapi().symbol(name.c_str()), nullptr) << name;
  Library unversioned(library_path("sim", "libHBAAPI.so"));
  EXPECT_NE(unversioned.symbol("HBA_OpenAdapter"), nullptr);
}

TEST(Symbols, ManagementLibraryExportsNothingElse) {
  // No QoS names (their slot is never opened) and no internals that could
  // bind to the module's own definitions.
  for (const auto& name : singles("QOS")) EXPECT_EQ(lrmapi().symbol(name.c_str()), nullptr) << name;
  EXPECT_EQ(lrmapi().symbol("HBA_OpenAdapter"), nullptr);
}

TEST(Symbols, NoSymVariantsLackExactlyTheirFunction) {
  struct Variant {
    std::string name, file;
  };
  const Variant variants[] = {{"HBA_OpenAdapter", "libHBAAPI.so.2"},
                              {"HBA_SendReadCapacity", "libHBAAPI.so.2"},
                              {"LRM_CNA_FCOE_GetFIPParams", "liblrmapi.so"},
                              {"LRM_GetHBAAttributes", "liblrmapi.so"},
                              {"LRM_InitLib", "liblrmapi.so"}};
  for (const Variant& v : variants) {
    Library lib(library_path("sim-nosym-" + v.name, v.file));
    ASSERT_TRUE(lib.ok()) << v.name << ": " << dlerror();
    EXPECT_EQ(lib.symbol(v.name.c_str()), nullptr) << v.name;
    const char* neighbour = v.file == "liblrmapi.so" ? "LRM_GetPortAttributes" : "HBA_GetAdapterName";
    EXPECT_NE(lib.symbol(neighbour), nullptr) << v.name;
    // The other library of the directory is the full one.
    const std::string other = v.file == "liblrmapi.so" ? "libHBAAPI.so.2" : "liblrmapi.so";
    Library sibling(library_path("sim-nosym-" + v.name, other));
    EXPECT_TRUE(sibling.ok()) << other;
  }
}

TEST(Symbols, NoManagementDirectoryHoldsOnlyTheHbaApi) {
  Library hba(library_path("sim-nomgmt", "libHBAAPI.so.2"));
  EXPECT_TRUE(hba.ok());
  Library mgmt(library_path("sim-nomgmt", "liblrmapi.so"));
  EXPECT_FALSE(mgmt.ok());
}

}  // namespace
}  // namespace nrvsim_test

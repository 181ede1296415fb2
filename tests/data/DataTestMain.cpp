// Loads the HBA API and management libraries (the simulator, through the test
// environment's library path and site) once for every test of the process.
#include <gtest/gtest.h>

#include "access/NRV_Runtime_Loader.h"

namespace {

class LibrariesEnvironment : public ::testing::Environment {
 public:
  void SetUp() override { ASSERT_EQ(cimple::NRV_Runtime_Loader::loadLibraries(), 0); }
  void TearDown() override { cimple::NRV_Runtime_Loader::unloadLibraries(); }
};

[[maybe_unused]] ::testing::Environment* const g_libraries =
    ::testing::AddGlobalTestEnvironment(new LibrariesEnvironment);

}  // namespace

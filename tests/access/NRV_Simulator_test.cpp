// The loader and the method wrapper against the simulated adapter site
// (LD_LIBRARY_PATH = the simulator's library directory).
#include <gtest/gtest.h>

#include <vector>

#include "TestSupport.h"
#include "access/NRV_MethodWrapper.h"
#include "access/NRV_Runtime_Loader.h"

using namespace cimple;

TEST(Simulator, WrapperOperationsReachTheSimulatedLibrary) {
  ASSERT_EQ(0, NRV_Runtime_Loader::loadLibraries());
  EXPECT_EQ("liblrmapi.so", NRV_Runtime_Loader::fileName(NRV_Runtime_Loader::kLrmApiSlot));
  EXPECT_EQ("libHBAAPI.so.2", NRV_Runtime_Loader::fileName(NRV_Runtime_Loader::kHbaApiSlot));
  {
    NRV_MethodWrapper wrapper;
    std::string version;
    EXPECT_EQ(0u, NRV_MethodWrapper::GetLibraryVersion(102, version));
    EXPECT_FALSE(version.empty());

    HBA_UINT32 count = 1;
    std::vector<HBA_UINT32> instances(count);
    RM_STATUS status = RM_GetAllLocalHBAInstances(&count, instances.data());
    if (status == RM_STATUS_ERROR_BUFFER_TOO_SMALL) {
      instances.resize(count);
      status = RM_GetAllLocalHBAInstances(&count, instances.data());
    }
    ASSERT_EQ(0u, status);
    ASSERT_GT(count, 0u);
    RM_ADAPTER_INSTANCE pair{0, instances[0]};
    RM_LOCAL_HBA_INFO_V4 info{};
    ASSERT_EQ(0u, RM_GetLocalHBAInfoV4(&pair, &info));
    // The identifier the library hands out is local, and survives the text forms.
    EXPECT_EQ(0, NRV_MethodWrapper::Validatewwpn(info.wwpn));
    char plain[kHbaNamePlainSize];
    HBA_NAME back{};
    ASSERT_EQ(1, string2HBAName(&back, HBAName2string(info.wwpn, plain)));
    EXPECT_EQ(0, NRV_MethodWrapper::Validatewwpn(back));
    bool nic = false, iscsi = false, fcoe = false, roce = false;
    EXPECT_EQ(0u, NRV_MethodWrapper::GetCNAType(info.wwpn, nic, iscsi, fcoe, roce));
    HBA_NAME stranger{{0x99, 0x99, 0x99, 0x99, 0x99, 0x99, 0x99, 0x99}};
    EXPECT_EQ(1, NRV_MethodWrapper::Validatewwpn(stranger));
  }
  EXPECT_EQ(0, NRV_Runtime_Loader::unloadLibraries());
}

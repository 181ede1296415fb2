// Extrinsic methods of the test module through the host: parameters and
// the return value both ways, method names matched without case, text
// converted for a uint16 parameter, and an unknown method named back.
#include "tests/e2e/E2E_Fixture.h"
#include "tests/host/HostTestSupport.h"

namespace e2e {
namespace {

using Methods = E2E_Test;
using nrv::host::test::runClient;

TEST_F(Methods, ParametersArriveAndOutputsComeBack) {
  Result result = host_->invokeMethod(service_path("svc"), "RequestStateChange",
                                      {{"RequestedState", Datum::unsignedInt(CMPI_uint16, 3)}});
  ASSERT_TRUE(result.ok()) << result.errorText();
  EXPECT_EQ(result.returnValue.asInteger(), 0);
  EXPECT_EQ(result.returnValue.type, CMPI_uint32);
  EXPECT_FALSE(module_store().requested_state_null);
  EXPECT_EQ(module_store().requested_state, 3);
  EXPECT_TRUE(module_store().timeout_null);
  const Datum* job = findNamed(result.outArgs, "Job");
  ASSERT_NE(job, nullptr);
  ASSERT_EQ(job->type, CMPI_ref);
  EXPECT_EQ(findNamed(job->path()->keys, "InstanceID")->text, "NRV:Job:1");
}

TEST_F(Methods, AMethodNameInAnotherCaseReachesTheMethod) {
  Result result = host_->invokeMethod(service_path("svc"), "rEQUESTsTATEcHANGE",
                                      {{"RequestedState", Datum::unsignedInt(CMPI_uint16, 2)}});
  ASSERT_TRUE(result.ok()) << result.errorText();
  EXPECT_EQ(module_store().requested_state, 2);
}

TEST_F(Methods, TextForAUint16ParameterIsConverted) {
  Result result =
      host_->invokeMethod(service_path("svc"), "RequestStateChange", {{"RequestedState", Datum::string("32768")}});
  ASSERT_TRUE(result.ok()) << result.errorText();
  EXPECT_FALSE(module_store().requested_state_null);
  EXPECT_EQ(module_store().requested_state, 32768);

  Result missing = host_->invokeMethod(service_path("svc"), "RequestStateChange");
  ASSERT_TRUE(missing.ok()) << missing.errorText();
  EXPECT_TRUE(module_store().requested_state_null);
  EXPECT_EQ(missing.returnValue.asInteger(), 32969);
}

// nrv-cim sends untyped arguments as text: the number reaches the uint16
// parameter, anything else leaves it null (the method then answers 32969).
TEST_F(Methods, TheClientsTextArgumentsReachTheUint16Parameter) {
  const std::string path =
      "root/norvane:NRVTAVO_ChannelMgmtService.SystemCreationClassName=\"CIM_ComputerSystem\","
      "SystemName=\"host\",CreationClassName=\"NRVTAVO_ChannelMgmtService\",Name=\"svc\"";
  auto number = runClient({"-m", test_module(), "cm", path, "RequestStateChange", "RequestedState=5"});
  EXPECT_EQ(number.status, 0) << number.err;
  EXPECT_NE(number.out.find("ReturnValue = 0;"), std::string::npos) << number.out;
  auto text = runClient({"-m", test_module(), "cm", path, "RequestStateChange", "RequestedState=abc"});
  EXPECT_EQ(text.status, 0) << text.err;
  EXPECT_NE(text.out.find("ReturnValue = 32969;"), std::string::npos) << text.out;
}

TEST_F(Methods, AnUnknownMethodAnswersMethodNotFoundWithItsName) {
  Result result = host_->invokeMethod(service_path("svc"), "Frobnicate");
  EXPECT_EQ(result.rc, CMPI_RC_ERR_METHOD_NOT_FOUND);
  EXPECT_NE(result.message.find("Frobnicate"), std::string::npos) << result.message;
}

TEST_F(Methods, ArraysArriveAndANullElementIsSkipped) {
  std::vector<Datum> values = {Datum::unsignedInt(CMPI_uint16, 10), Datum::null(CMPI_uint16),
                               Datum::unsignedInt(CMPI_uint16, 30)};
  Result result = host_->invokeMethod(service_path("svc"), "SetCMBandwidths",
                                      {{"MinBWValues", Datum::arrayOf(CMPI_uint16, values)}});
  ASSERT_TRUE(result.ok()) << result.errorText();
  EXPECT_EQ(result.returnValue.asInteger(), 4097);
  EXPECT_EQ(module_store().min_bandwidths, "10,30");
  EXPECT_NE(traces().find("encountered null array element"), std::string::npos);
}

}  // namespace
}  // namespace e2e

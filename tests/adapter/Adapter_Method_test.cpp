// Extrinsic methods through the method MI table: parameter conversion
// (including text for numeric parameters), outputs and the return value,
// method-name matching.
#include "tests/adapter/Adapter_Fixture.h"

namespace test {
namespace {

class Methods : public Adapter_Test {
 protected:
  void SetUp() override {
    Adapter_Test::SetUp();
    store().services.insert(make_service("cm0"));
    mi_ = method_mi(service_slot());
  }
  CMPIStatus invoke(const char* method, const CMPIArgs* in, CMPIArgs* out, fake::Result& result) {
    return mi_->ft->invokeMethod(mi_, context_, result.get(), service_path("cm0"), method, in, out);
  }
  CMPIMethodMI* mi_ = nullptr;
};

void add_uint16(const CMPIArgs* args, const char* name, CMPIUint16 v) {
  CMPIValue value;
  value.uint16 = v;
  CMAddArg(args, name, &value, CMPI_uint16);
}

void add_chars(const CMPIArgs* args, const char* name, const char* text) {
  CMAddArg(args, name, text, CMPI_chars);
}

TEST_F(Methods, ParametersArriveAndTheReturnValueComesBackTwice) {
  CMPIArgs* in = args();
  CMPIArgs* out = args();
  add_uint16(in, "RequestedState", 3);
  fake::Result result;
  ASSERT_EQ(invoke("RequestStateChange", in, out, result).rc, CMPI_RC_OK);
  EXPECT_FALSE(store().requested_state_null);
  EXPECT_EQ(store().requested_state, 3);
  EXPECT_TRUE(store().timeout_null);
  const fake::Returned& r = result.returned();
  ASSERT_EQ(r.data.size(), 1u);
  EXPECT_EQ(r.data[0].type, CMPI_uint32);
  EXPECT_EQ(r.data[0].value.uint32, 0u);
  EXPECT_EQ(r.done, 1);
  CMPIData returned = fake::arg_of(out, "return_value");
  EXPECT_EQ(returned.type, CMPI_uint32);
  CMPIData job = fake::arg_of(out, "Job");
  ASSERT_EQ(job.type, CMPI_ref);
  EXPECT_EQ(fake::class_of(job.value.ref), "CIM_ConcreteJob");
  EXPECT_EQ(fake::text_of(fake::key_of(job.value.ref, "InstanceID")), "NRV:Job:1");
  EXPECT_EQ(fake::name_space_of(job.value.ref), kNs);
  EXPECT_EQ(fake::arg_of(out, "RequestedState").state, CMPI_notFound);  // an "In" parameter only
}

TEST_F(Methods, AMethodNameInAnotherCaseStillReachesTheMethod) {
  CMPIArgs* in = args();
  add_uint16(in, "requestedstate", 2);
  fake::Result result;
  ASSERT_EQ(invoke("requeststatechange", in, args(), result).rc, CMPI_RC_OK);
  EXPECT_EQ(store().requested_state, 2);
}

TEST_F(Methods, AnUnknownMethodAnswersMethodNotFoundWithItsName) {
  fake::Result result;
  CMPIStatus rc = invoke("Frobnicate", args(), args(), result);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_METHOD_NOT_FOUND);
  ASSERT_NE(rc.msg, nullptr);
  EXPECT_STREQ(CMGetCharsPtr(rc.msg, nullptr), "Frobnicate");
  CMRelease(rc.msg);
  EXPECT_TRUE(result.returned().data.empty());
}

TEST_F(Methods, AnUnknownClassAnswersFailedWithAMessage) {
  fake::Result result;
  CMPIStatus rc = mi_->ft->invokeMethod(mi_, context_, result.get(), path("No_Such_Class"), "RequestStateChange",
                                        args(), args());
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_FAILED);
  ASSERT_NE(rc.msg, nullptr);
  EXPECT_STREQ(CMGetCharsPtr(rc.msg, nullptr), "MetaClass not found");
  CMRelease(rc.msg);
}

TEST_F(Methods, TextForAUint16ParameterIsReadAsANumber) {
  CMPIArgs* in = args();
  add_chars(in, "RequestedState", "3");
  fake::Result result;
  ASSERT_EQ(invoke("RequestStateChange", in, args(), result).rc, CMPI_RC_OK);
  EXPECT_FALSE(store().requested_state_null);
  EXPECT_EQ(store().requested_state, 3);
  EXPECT_NE(traces().find("converting string to registered parameter type"), std::string::npos);
}

TEST_F(Methods, TextThatIsNotANumberLeavesTheParameterNull) {
  for (const char* text : {"abc", "3x", "70000", "-1", ""}) {
    CMPIArgs* in = args();
    add_chars(in, "RequestedState", text);
    fake::Result result;
    ASSERT_EQ(invoke("RequestStateChange", in, args(), result).rc, CMPI_RC_OK) << text;
    EXPECT_TRUE(store().requested_state_null) << text;
    ASSERT_EQ(result.returned().data.size(), 1u);
    EXPECT_EQ(result.returned().data[0].value.uint32, 32969u) << text;
  }
}

TEST_F(Methods, TextForADatetimeParameterIsRefused) {
  CMPIArgs* in = args();
  add_uint16(in, "RequestedState", 3);
  add_chars(in, "TimeoutPeriod", "00000001020304.000005:000");
  fake::Result result;
  ASSERT_EQ(invoke("RequestStateChange", in, args(), result).rc, CMPI_RC_OK);
  EXPECT_TRUE(store().timeout_null);
  std::string log = traces();
  EXPECT_NE(log.find("Default case - unsupported type"), std::string::npos);
  EXPECT_NE(log.find("cast_cmpi_string_to_scalar(): Not supported"), std::string::npos);
}

TEST_F(Methods, ADatetimeParameterArrivesThroughItsText) {
  CMPIArgs* in = args();
  add_uint16(in, "RequestedState", 3);
  CMPIValue value;
  value.dateTime = fake::new_datetime("00000001020304.000005:000");
  CMAddArg(in, "TimeoutPeriod", &value, CMPI_dateTime);
  CMRelease(value.dateTime);
  fake::Result result;
  ASSERT_EQ(invoke("RequestStateChange", in, args(), result).rc, CMPI_RC_OK);
  EXPECT_FALSE(store().timeout_null);
}

TEST_F(Methods, ArraysAndReferenceParametersArriveAndNullElementsAreSkipped) {
  CMPIArgs* in = args();
  CMPIObjectPath* target = path("NRVTAVO_ChannelSettingData");
  fake::add_string_key(target, "InstanceID", "NRV:Channel:1");
  CMPIValue ref;
  ref.ref = target;
  CMAddArg(in, "Target", &ref, CMPI_ref);
  CMPIArray* values = fake::new_array(3, CMPI_uint16);
  CMPIValue v;
  v.uint16 = 10;
  CMSetArrayElementAt(values, 0, &v, CMPI_uint16);
  v.uint16 = 30;
  CMSetArrayElementAt(values, 2, &v, CMPI_uint16);  // element 1 stays null
  CMPIValue array;
  array.array = values;
  CMAddArg(in, "MinBWValues", &array, CMPI_uint16A);
  CMRelease(values);
  fake::Result result;
  ASSERT_EQ(invoke("SetCMBandwidths", in, args(), result).rc, CMPI_RC_OK);
  EXPECT_EQ(store().target_name, "NRV:Channel:1");
  EXPECT_EQ(store().min_bandwidths, "10,30");
  EXPECT_NE(traces().find("encountered null array element"), std::string::npos);
  ASSERT_EQ(result.returned().data.size(), 1u);
  EXPECT_EQ(result.returned().data[0].value.uint32, 4097u);
}

TEST_F(Methods, AWronglyTypedArrayIsSkippedNotCrashed) {
  CMPIArgs* in = args();
  CMPIArray* values = fake::new_array(1, CMPI_string);
  CMSetArrayElementAt(values, 0, "10", CMPI_chars);
  CMPIValue array;
  array.array = values;
  CMAddArg(in, "MinBWValues", &array, CMPI_stringA);
  CMRelease(values);
  fake::Result result;
  ASSERT_EQ(invoke("SetCMBandwidths", in, args(), result).rc, CMPI_RC_OK);
  EXPECT_EQ(store().min_bandwidths, "null");
  EXPECT_NE(traces().find("type mismatch on MinBWValues: uint16_array/string_array"), std::string::npos);
}

TEST_F(Methods, NullInputsAndOutputsDoNotCrash) {
  fake::Result result;
  EXPECT_EQ(invoke("RequestStateChange", nullptr, nullptr, result).rc, CMPI_RC_OK);
  EXPECT_TRUE(store().requested_state_null);
  EXPECT_EQ(mi_->ft->invokeMethod(mi_, context_, nullptr, service_path("cm0"), "RequestStateChange", nullptr,
                                  nullptr).rc,
            CMPI_RC_OK);
  CMPIStatus no_path =
      mi_->ft->invokeMethod(mi_, context_, result.get(), nullptr, "RequestStateChange", nullptr, nullptr);
  EXPECT_EQ(no_path.rc, CMPI_RC_ERR_FAILED);
  if (no_path.msg) CMRelease(no_path.msg);
  CMPIStatus rc = mi_->ft->invokeMethod(mi_, context_, result.get(), service_path("cm0"), nullptr, nullptr, nullptr);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_METHOD_NOT_FOUND);
  if (rc.msg) CMRelease(rc.msg);
}

}  // namespace
}  // namespace test

// The conversion layer on its own: Value type names and feature access,
// containers over CMPI objects, property lists, and a uint64 parameter that
// arrives as text.
#include <gtest/gtest.h>

#include "framework/Converter.h"
#include "tests/adapter/Adapter_Fixture.h"

namespace test {
namespace {

TEST(Value_Names, UpperAndLowerNamesFollowTheTypeCodes) {
  EXPECT_STREQ(Value::type_name(Value::NONE), "NONE");
  EXPECT_STREQ(Value::type_name(Value::NONE, false), "none");
  EXPECT_STREQ(Value::type_name(Value::BOOLEAN), "BOOLEAN");
  EXPECT_STREQ(Value::type_name(Value::INSTANCE), "INSTANCE");
  EXPECT_STREQ(Value::type_name(139), "CHAR16_ARRAY");
  EXPECT_STREQ(Value::type_name(140), "STRING_ARRAY");
  EXPECT_STREQ(Value::type_name(142), "INSTANCE_ARRAY");
  EXPECT_STREQ(Value::type_name(128), "BOOLEAN_ARRAY");
  EXPECT_STREQ(Value::type_name(Value::DATETIME, false), "datetime");
  EXPECT_STREQ(Value::type_name(99), "UNKNOWN");
}

TEST(Value_Features, ValuesRoundTripThroughSlotsAndRefuseWrongTypes) {
  NRVTAVO_Card* card = make_card("A1");
  const Meta_Class* mc = &NRVTAVO_Card::static_meta_class;
  Value model;
  ASSERT_EQ(model.get_feature(card, find_feature(mc, "Model")), 0);
  EXPECT_EQ(model.type(), Value::STRING);
  EXPECT_EQ(*model.get<String>(), "LPe");
  Value height;
  ASSERT_EQ(height.get_feature(card, find_feature(mc, "Height")), 0);
  EXPECT_TRUE(height.is_null());
  EXPECT_EQ(height.type(), Value::REAL32);

  NRVTAVO_Card* other = NRVTAVO_Card::create(true);
  EXPECT_EQ(model.set_feature(other, find_feature(mc, "Model")), 0);
  EXPECT_EQ(other->Model.value, "LPe");
  EXPECT_FALSE(other->Model.is_null());
  EXPECT_EQ(model.set_feature(other, find_feature(mc, "PoweredOn")), -1);
  EXPECT_EQ(model.set_feature(nullptr, find_feature(mc, "Model")), -1);

  Value statuses;
  statuses.set(Array<uint16>{2, 3});
  EXPECT_EQ(statuses.type(), Value::UINT16_ARRAY);
  ASSERT_EQ(statuses.set_feature(other, find_feature(mc, "OperationalStatus")), 0);
  EXPECT_EQ(other->OperationalStatus.value.size(), 2u);
  unref(card);
  unref(other);
}

class Conversions : public Adapter_Test {};

TEST_F(Conversions, AnObjectPathWithAnExtraKeyGivesAKeyInstanceWithoutIt) {
  CMPIObjectPath* p = card_path("A1");
  fake::add_string_key(p, "Nonsense", "1");
  Instance* keys = nullptr;
  ASSERT_EQ(make_cimple_reference(CMPI_Env{broker_.get(), nullptr, kNs}, &NRVTAVO_Card::static_meta_class, p, keys),
            CMPI_RC_OK);
  auto* card = static_cast<NRVTAVO_Card*>(keys);
  EXPECT_EQ(card->Tag.value, "A1");
  EXPECT_FALSE(card->Tag.is_null());
  EXPECT_TRUE(card->Model.is_null());
  EXPECT_EQ(card->__name_space, kNs);
  EXPECT_NE(traces().find("unknown feature: NRVTAVO_Card.Nonsense"), std::string::npos);
  unref(keys);
}

TEST_F(Conversions, InstancesSurviveTheRoundTripThroughCmpi) {
  NRVTAVO_Card* card = make_card("A1");
  card->OperationalStatus.set(Array<uint16>{2, 6});
  card->InstallDate.set(Datetime::interval(93784000005ull));
  CMPI_Ptr<CMPIObjectPath> p;
  CMPI_Ptr<CMPIInstance> ci;
  ASSERT_EQ(make_cmpi_object_path(broker_.get(), card, kNs, p), CMPI_RC_OK);
  ASSERT_EQ(make_cmpi_instance(broker_.get(), card, kNs, p.get(), nullptr, ci), CMPI_RC_OK);
  Instance* back = nullptr;
  ASSERT_EQ(make_cimple_instance(CMPI_Env{broker_.get(), nullptr, kNs}, &NRVTAVO_Card::static_meta_class, p.get(),
                                 ci.get(), back),
            CMPI_RC_OK);
  EXPECT_TRUE(key_eq(card, back));
  auto* copy = static_cast<NRVTAVO_Card*>(back);
  EXPECT_EQ(copy->OperationalStatus.value, card->OperationalStatus.value);
  EXPECT_EQ(copy->InstallDate.value.ascii(), "00000001020304.000005:000");
  EXPECT_EQ(copy->PoweredOn.value, true);
  EXPECT_TRUE(copy->Height.is_null());
  unref(back);
  unref(card);
}

TEST_F(Conversions, APropertyListNullsWhatIsNotListed) {
  NRVTAVO_Card* card = make_card("A1");
  const char* list[] = {"name", "Bogus", nullptr};
  ASSERT_EQ(apply_property_list(card, list, true), 0);
  EXPECT_FALSE(card->Name.is_null());
  EXPECT_FALSE(card->Tag.is_null());
  EXPECT_TRUE(card->Model.is_null());
  ASSERT_EQ(apply_property_list(card, list, false), 0);
  EXPECT_TRUE(card->Tag.is_null());
  ASSERT_EQ(apply_property_list(card, nullptr, false), 0);
  EXPECT_FALSE(card->Height.is_null());  // no list: everything wanted
  unref(card);
}

// A method with a uint64 parameter, which the module's schema does not have.
const Meta_Property kCount = {0, FLAG_PROPERTY | FLAG_IN, "Count", 0, nullptr, UINT64, 0, 24, nullptr};
const Meta_Property kFlag = {0, FLAG_PROPERTY | FLAG_IN, "Flag", 0, nullptr, BOOLEAN, 0, 40, nullptr};
const Meta_Property kResult = {0, FLAG_PROPERTY | FLAG_OUT, "return_value", 0, nullptr, UINT32, 0, 44, nullptr};
const Meta_Feature* const kParams[] = {reinterpret_cast<const Meta_Feature*>(&kCount),
                                       reinterpret_cast<const Meta_Feature*>(&kFlag),
                                       reinterpret_cast<const Meta_Feature*>(&kResult)};
const Meta_Method kCountMethod = {0, FLAG_METHOD, "SetCount", 0, nullptr, kParams, 3, 56, UINT32};

TEST_F(Conversions, AUint64ParameterGivenAsTextIsRefusedAndStaysNull) {
  CMPIArgs* in = args();
  CMAddArg(in, "Count", "12", CMPI_chars);
  CMAddArg(in, "Flag", "TRUE please", CMPI_chars);
  Instance* record = nullptr;
  ASSERT_EQ(make_cimple_method(CMPI_Env{broker_.get(), nullptr, kNs}, &kCountMethod, nullptr, in, record),
            CMPI_RC_OK);
  EXPECT_EQ(*null_flag(record, &kCount), 1);
  EXPECT_EQ(*null_flag(record, &kFlag), 0);
  EXPECT_TRUE(*static_cast<const bool*>(slot(record, kFlag.offset)));
  EXPECT_NE(traces().find("cast_cmpi_string_to_scalar(): Not supported"), std::string::npos);
  unref(record);
}

TEST_F(Conversions, OutputsCarryTheReturnValueUnderItsName) {
  Instance* record = create(&kCountMethod);
  set_null_flags(record, true, true, 1);
  *static_cast<uint32_t*>(slot(record, kResult.offset)) = 7;
  *null_flag(record, &kResult) = 0;
  CMPIArgs* out = args();
  bool has_return_value = false;
  CMPI_Out_Value return_value;
  ASSERT_EQ(make_method_outputs(CMPI_Env{broker_.get(), nullptr, kNs}, record, out, has_return_value, return_value),
            CMPI_RC_OK);
  EXPECT_TRUE(has_return_value);
  EXPECT_EQ(return_value.type, CMPI_uint32);
  EXPECT_EQ(return_value.value.uint32, 7u);
  EXPECT_EQ(fake::arg_of(out, "return_value").value.uint32, 7u);
  EXPECT_EQ(fake::arg_of(out, "Count").state, CMPI_notFound);
  unref(record);
}

}  // namespace
}  // namespace test

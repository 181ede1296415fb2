// Instance and method-call record layout of the generated classes: the meta
// offsets that the rest of the module (and the CIMOM-facing conversion) rely
// on, and agreement between the meta-data and the generated structs.
#include <gtest/gtest.h>

#include <cstddef>
#include <string>

#include "framework/Instance.h"
#include "schema/CIM_EnabledLogicalElement.h"
#include "schema/NRVTAVO_CardContainsChip.h"
#include "schema/NRVTAVO_Chip.h"
#include "schema/NRVTAVO_ConcreteJob.h"
#include "schema/NRVTAVO_EthernetPort.h"
#include "schema/NRVTAVO_ProviderConfigSetting.h"
#include "schema/NRVTAVO_Realizes.h"
#include "schema/NRVTAVO_ResourcePool.h"
#include "schema/Repository.h"

#pragma GCC diagnostic ignored "-Winvalid-offsetof"

namespace cimple {
namespace {

uint32_t offset_of(const Meta_Class* mc, const char* name) {
  const Meta_Feature* f = find_feature(mc, name, KIND_PROPERTY | KIND_REFERENCE);
  if (!f) {
    ADD_FAILURE() << mc->name << " has no feature " << name;
    return 0;
  }
  if (f->flags & FLAG_REFERENCE) return reinterpret_cast<const Meta_Reference*>(f)->offset;
  return reinterpret_cast<const Meta_Property*>(f)->offset;
}

TEST(ChipLayout, MetaOffsetsMatchTheCatalogueLayout) {
  const Meta_Class* mc = &NRVTAVO_Chip::static_meta_class;
  EXPECT_EQ(mc->size, 488u);
  EXPECT_EQ(offset_of(mc, "InstanceID"), 24u);
  EXPECT_EQ(offset_of(mc, "Generation"), 88u);
  EXPECT_EQ(offset_of(mc, "OperationalStatus"), 136u);
  EXPECT_EQ(offset_of(mc, "HealthState"), 184u);
  EXPECT_EQ(offset_of(mc, "PoweredOn"), 352u);
}

TEST(ChipLayout, StructMembersSitAtTheMetaOffsets) {
  EXPECT_EQ(sizeof(NRVTAVO_Chip), 488u);
  EXPECT_EQ(offsetof(NRVTAVO_Chip, InstanceID), 24u);
  EXPECT_EQ(offsetof(NRVTAVO_Chip, Generation), 88u);
  EXPECT_EQ(offsetof(NRVTAVO_Chip, OperationalStatus), 136u);
  EXPECT_EQ(offsetof(NRVTAVO_Chip, HealthState), 184u);
  EXPECT_EQ(offsetof(NRVTAVO_Chip, PoweredOn), 352u);
  const Meta_Class* mc = &NRVTAVO_Chip::static_meta_class;
  EXPECT_EQ(offsetof(NRVTAVO_Chip, Tag), offset_of(mc, "Tag"));
  EXPECT_EQ(offsetof(NRVTAVO_Chip, ThresholdWarningTemp), offset_of(mc, "ThresholdWarningTemp"));
}

TEST(ChipLayout, OwnPropertiesFillTheTail) {
  const Meta_Class* mc = &NRVTAVO_Chip::static_meta_class;
  for (const char* name : {"SubAdapterId", "OASCapability", "TemperatureUnit", "BoardTemperature",
                           "ThresholdCriticalTemp", "ThresholdWarningTemp"}) {
    EXPECT_GE(offset_of(mc, name), 424u) << name;
    EXPECT_NE(find_property(mc, name), nullptr) << name;
  }
  EXPECT_EQ(find_property(mc, "BoardTemperature")->type, SINT32);
  EXPECT_EQ(find_property(mc, "Tag")->flags & FLAG_KEY, FLAG_KEY);
  EXPECT_EQ(mc->num_keys, 2u);  // Tag and CreationClassName
}

TEST(RealizesLayout, EveryRealizesAssociationHoldsTwoPointers) {
  const Meta_Class* realizes = find_meta_class(&nrv_meta_repository, "CIM_Realizes");
  ASSERT_NE(realizes, nullptr);
  int seen = 0;
  for (size_t i = 0; i < nrv_meta_repository.num_meta_classes; ++i) {
    const Meta_Class* mc = nrv_meta_repository.meta_classes[i];
    if (!is_subclass(realizes, mc)) continue;
    ++seen;
    EXPECT_EQ(mc->size, 40u) << mc->name;
    EXPECT_EQ(offset_of(mc, "Antecedent"), 24u) << mc->name;
    EXPECT_EQ(offset_of(mc, "Dependent"), 32u) << mc->name;
    EXPECT_EQ(mc->num_keys, 2u) << mc->name;
  }
  EXPECT_GE(seen, 6);  // CIM_Realizes and the five module associations
  EXPECT_EQ(sizeof(NRVTAVO_Realizes), 40u);
  EXPECT_EQ(offsetof(NRVTAVO_Realizes, Antecedent), 24u);
  EXPECT_EQ(offsetof(NRVTAVO_Realizes, Dependent), 32u);
}

TEST(Associations, OverridingReferencesNarrowTheClassButKeepKeyAndSlot) {
  const Meta_Class* mc = &NRVTAVO_CardContainsChip::static_meta_class;
  EXPECT_TRUE(mc->flags & FLAG_ASSOCIATION);
  EXPECT_TRUE(mc->flags & FLAG_AGGREGATION);  // inherited from CIM_Container
  EXPECT_FALSE(mc->flags & FLAG_CLASS);
  const Meta_Reference* group = find_reference(mc, "GroupComponent");
  const Meta_Reference* part = find_reference(mc, "PartComponent");
  ASSERT_NE(group, nullptr);
  ASSERT_NE(part, nullptr);
  EXPECT_STREQ(group->meta_class->name, "NRVTAVO_Card");
  EXPECT_STREQ(part->meta_class->name, "NRVTAVO_Chip");
  EXPECT_TRUE(group->flags & FLAG_KEY);
  EXPECT_TRUE(part->flags & FLAG_KEY);
  const Meta_Class* container = find_meta_class(&nrv_meta_repository, "CIM_Container");
  ASSERT_NE(container, nullptr);
  EXPECT_EQ(group->offset, find_reference(container, "GroupComponent")->offset);
  EXPECT_EQ(part->offset, find_reference(container, "PartComponent")->offset);
  // The struct's pointers are typed with the narrowed classes.
  NRVTAVO_CardContainsChip* assoc = nullptr;
  static_assert(std::is_same_v<decltype(assoc->GroupComponent), NRVTAVO_Card*>);
  static_assert(std::is_same_v<decltype(assoc->PartComponent), NRVTAVO_Chip*>);
}

TEST(MethodRecords, RequestStateChangeIsLaidOutLikeAnInstance) {
  const Meta_Method* mm = find_method(&NRVTAVO_EthernetPort::static_meta_class, "requeststatechange");
  ASSERT_NE(mm, nullptr);
  EXPECT_EQ(mm, &CIM_EnabledLogicalElement_RequestStateChange_method::static_meta_class);
  EXPECT_TRUE(mm->flags & FLAG_METHOD);
  EXPECT_EQ(mm->return_type, UINT32);
  ASSERT_EQ(mm->num_meta_features, 4u);
  const char* names[] = {"RequestedState", "Job", "TimeoutPeriod", "return_value"};
  for (size_t i = 0; i < 4; ++i) EXPECT_STREQ(mm->meta_features[i]->name, names[i]);
  auto param = [&](size_t i) { return reinterpret_cast<const Meta_Property*>(mm->meta_features[i]); };
  EXPECT_EQ(param(0)->flags & (FLAG_IN | FLAG_OUT), FLAG_IN);
  EXPECT_EQ(param(0)->type, UINT16);
  EXPECT_EQ(mm->meta_features[1]->flags & (FLAG_IN | FLAG_OUT | FLAG_REFERENCE), FLAG_OUT | FLAG_REFERENCE);
  EXPECT_STREQ(reinterpret_cast<const Meta_Reference*>(mm->meta_features[1])->meta_class->name, "CIM_ConcreteJob");
  EXPECT_EQ(param(2)->flags & (FLAG_IN | FLAG_OUT), FLAG_IN);
  EXPECT_EQ(param(2)->type, DATETIME);
  EXPECT_EQ(param(3)->flags & (FLAG_IN | FLAG_OUT), FLAG_OUT);
  EXPECT_EQ(param(3)->type, UINT32);

  using Call = NRVTAVO_EthernetPort_RequestStateChange_method;
  EXPECT_EQ(sizeof(Call), mm->size);
  EXPECT_EQ(offsetof(Call, RequestedState), param(0)->offset);
  EXPECT_EQ(offsetof(Call, Job), reinterpret_cast<const Meta_Reference*>(mm->meta_features[1])->offset);
  EXPECT_EQ(offsetof(Call, TimeoutPeriod), param(2)->offset);
  EXPECT_EQ(offsetof(Call, return_value), param(3)->offset);
  EXPECT_EQ(param(0)->offset, 24u);
}

TEST(MethodRecords, ErrorsComeBackAsEmbeddedInstancesOfCimError) {
  const Meta_Method* mm = find_method(&NRVTAVO_ConcreteJob::static_meta_class, "GetErrors");
  ASSERT_NE(mm, nullptr);
  const Meta_Feature* errors = mm->meta_features[0];
  EXPECT_STREQ(errors->name, "Errors");
  EXPECT_TRUE(errors->flags & FLAG_REFERENCE);
  EXPECT_TRUE(errors->flags & FLAG_EMBEDDED_INSTANCE);
  EXPECT_TRUE(errors->flags & FLAG_OUT);
  const auto* ref = reinterpret_cast<const Meta_Reference*>(errors);
  EXPECT_NE(ref->subscript, 0);
  EXPECT_STREQ(ref->meta_class->name, "CIM_Error");
  const Meta_Class* error = find_meta_class(&nrv_meta_repository, "CIM_Error");
  ASSERT_NE(error, nullptr);
  EXPECT_TRUE(error->flags & FLAG_INDICATION);
}

TEST(Instances, CreateAndCloneThroughTheGeneratedStructs) {
  NRVTAVO_Chip* chip = NRVTAVO_Chip::create();
  ASSERT_NE(chip, nullptr);
  EXPECT_EQ(chip->meta_class, &NRVTAVO_Chip::static_meta_class);
  chip->Tag.set(String("SN1234:1"));
  chip->BoardTemperature.set(47);
  NRVTAVO_Chip* copy = NRVTAVO_Chip::clone(chip);
  unref(chip);
  EXPECT_STREQ(copy->Tag.value.c_str(), "SN1234:1");
  EXPECT_EQ(copy->BoardTemperature.value, 47);
  EXPECT_FALSE(copy->BoardTemperature.is_null());
  unref(copy);
}

TEST(Instances, SchemaDefaultsAreAppliedOnRequest) {
  NRVTAVO_EthernetPort* port = NRVTAVO_EthernetPort::create(true);
  EXPECT_EQ(port->EnabledState.value, 5);  // "Not Applicable"
  EXPECT_FALSE(port->EnabledState.is_null());
  EXPECT_EQ(port->RequestedState.value, 12);
  EXPECT_TRUE(port->DeviceID.is_null());
  unref(port);

  NRVTAVO_ResourcePool* pool = NRVTAVO_ResourcePool::create(true);
  EXPECT_STREQ(pool->ConsumedResourceUnits.value.c_str(), "count");
  EXPECT_FALSE(pool->Primordial.value);
  EXPECT_FALSE(pool->Primordial.is_null());
  unref(pool);

  NRVTAVO_ConcreteJob* job = NRVTAVO_ConcreteJob::create(true);
  EXPECT_FALSE(job->TimeBeforeRemoval.is_null());  // an interval of five minutes
  unref(job);
}

TEST(Instances, ProviderConfigSettingCarriesItsRangeProperties) {
  const Meta_Class* mc = &NRVTAVO_ProviderConfigSetting::static_meta_class;
  EXPECT_EQ(find_property(mc, "paramname")->type, STRING);
  for (const char* name : {"lowRange", "highRange", "def", "current"})
    EXPECT_EQ(find_property(mc, name)->type, UINT32) << name;
  EXPECT_TRUE(find_property(mc, "InstanceID")->flags & FLAG_KEY);
  EXPECT_EQ(mc->num_keys, 1u);
  NRVTAVO_ProviderConfigSetting* s = NRVTAVO_ProviderConfigSetting::create();
  s->current.set(10);
  EXPECT_EQ(*static_cast<const uint32_t*>(slot(s, find_property(mc, "current")->offset)), 10u);
  unref(s);
}

}  // namespace
}  // namespace cimple

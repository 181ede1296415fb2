// Instance operations through the instance MI table: results, property
// lists, the get-instance fallback, result-code mapping and releases.
#include "tests/adapter/Adapter_Fixture.h"

namespace test {
namespace {

class Instance_Ops : public Adapter_Test {
 protected:
  void SetUp() override {
    Adapter_Test::SetUp();
    store().cards.insert(make_card("A1", "LPe-A"));
    store().cards.insert(make_card("B2", "LPe-B"));
    store().chips.insert(make_chip("C1"));
    mi_ = instance_mi(card_slot());
  }
  CMPIInstanceMI* mi_ = nullptr;
};

std::string tag_of(const CMPIObjectPath* p) { return fake::text_of(fake::key_of(p, "Tag")); }

TEST_F(Instance_Ops, EnumInstanceNamesAnswersKeyPathsInTheRequestNameSpace) {
  fake::Result result;
  CMPIStatus rc = mi_->ft->enumerateInstanceNames(mi_, context_, result.get(), path("NRVTAVO_Card"));
  EXPECT_EQ(rc.rc, CMPI_RC_OK);
  const fake::Returned& r = result.returned();
  ASSERT_EQ(r.paths.size(), 2u);
  EXPECT_EQ(tag_of(r.paths[0]), "A1");
  EXPECT_EQ(fake::text_of(fake::key_of(r.paths[1], "CreationClassName")), "NRVTAVO_Card");
  EXPECT_EQ(fake::class_of(r.paths[1]), "NRVTAVO_Card");
  EXPECT_EQ(fake::name_space_of(r.paths[1]), kNs);
  EXPECT_EQ(fake::key_of(r.paths[0], "Model").state, CMPI_notFound);
  EXPECT_EQ(r.done, 1);
  std::string log = traces();
  EXPECT_NE(log.find("enter: enumInstanceNames()"), std::string::npos);
  EXPECT_NE(log.find("return: enumInstanceNames(): CMPI_RC_OK"), std::string::npos);
}

TEST_F(Instance_Ops, AClassTheProviderDoesNotServeFails) {
  fake::Result result;
  EXPECT_EQ(mi_->ft->enumerateInstanceNames(mi_, context_, result.get(), path("NRVTAVO_Chip")).rc,
            CMPI_RC_ERR_FAILED);
  EXPECT_EQ(mi_->ft->enumerateInstances(mi_, context_, result.get(), path("No_Such_Class"), nullptr).rc,
            CMPI_RC_ERR_FAILED);
  EXPECT_TRUE(result.returned().paths.empty());
}

TEST_F(Instance_Ops, AnAncestorClassPathIsAnsweredWithTheProvidersClass) {
  fake::Result result;
  EXPECT_EQ(mi_->ft->enumerateInstanceNames(mi_, context_, result.get(), path("CIM_Card")).rc, CMPI_RC_OK);
  ASSERT_EQ(result.returned().paths.size(), 2u);
  EXPECT_EQ(fake::class_of(result.returned().paths[0]), "NRVTAVO_Card");
}

TEST_F(Instance_Ops, EnumInstancesCarriesEveryValueAndItsType) {
  fake::Result result;
  ASSERT_EQ(mi_->ft->enumerateInstances(mi_, context_, result.get(), path("NRVTAVO_Card"), nullptr).rc, CMPI_RC_OK);
  const fake::Returned& r = result.returned();
  ASSERT_EQ(r.instances.size(), 2u);
  EXPECT_EQ(r.done, 1);
  EXPECT_EQ(fake::text_of(fake::property_of(r.instances[1], "Model")), "LPe-B");
  CMPIData powered = fake::property_of(r.instances[0], "PoweredOn");
  EXPECT_EQ(powered.type, CMPI_boolean);
  EXPECT_EQ(powered.value.boolean, 1);
  EXPECT_EQ(fake::property_of(r.instances[0], "Height").state, CMPI_notFound);  // null in the catalogue
  EXPECT_EQ(tag_of(fake::path_of(r.instances[0])), "A1");
}

TEST_F(Instance_Ops, APropertyListKeepsTheKeysAndTheListedPropertiesOnly) {
  fake::Result result;
  const char* list[] = {"Name", nullptr};
  ASSERT_EQ(mi_->ft->enumerateInstances(mi_, context_, result.get(), path("NRVTAVO_Card"), list).rc, CMPI_RC_OK);
  ASSERT_EQ(result.returned().instances.size(), 2u);
  const CMPIInstance* first = result.returned().instances[0];
  EXPECT_EQ(fake::text_of(fake::property_of(first, "Name")), "Card A1");
  EXPECT_EQ(fake::text_of(fake::property_of(first, "Tag")), "A1");
  EXPECT_EQ(fake::text_of(fake::property_of(first, "CreationClassName")), "NRVTAVO_Card");
  EXPECT_EQ(fake::property_of(first, "Model").state, CMPI_notFound);
  EXPECT_EQ(fake::property_of(first, "PoweredOn").state, CMPI_notFound);
}

TEST_F(Instance_Ops, GetInstanceFindsByKeysOrAnswersNotFound) {
  fake::Result found;
  ASSERT_EQ(mi_->ft->getInstance(mi_, context_, found.get(), card_path("B2"), nullptr).rc, CMPI_RC_OK);
  ASSERT_EQ(found.returned().instances.size(), 1u);
  EXPECT_EQ(fake::text_of(fake::property_of(found.returned().instances[0], "Model")), "LPe-B");
  EXPECT_EQ(found.returned().done, 1);

  fake::Result missing;
  EXPECT_EQ(mi_->ft->getInstance(mi_, context_, missing.get(), card_path("Z9"), nullptr).rc, CMPI_RC_ERR_NOT_FOUND);
  EXPECT_TRUE(missing.returned().instances.empty());
}

TEST_F(Instance_Ops, GetInstanceOfAnEnumerationOnlyProviderFallsBackOnKeyComparison) {
  CMPIInstanceMI* chips = instance_mi(chip_slot());
  fake::Result found;
  ASSERT_EQ(chips->ft->getInstance(chips, context_, found.get(), chip_path("C1"), nullptr).rc, CMPI_RC_OK);
  ASSERT_EQ(found.returned().instances.size(), 1u);
  EXPECT_EQ(fake::text_of(fake::property_of(found.returned().instances[0], "Name")), "Chip C1");
  fake::Result missing;
  EXPECT_EQ(chips->ft->getInstance(chips, context_, missing.get(), chip_path("C7"), nullptr).rc,
            CMPI_RC_ERR_NOT_FOUND);
}

TEST_F(Instance_Ops, CreateAnswersThePathAndRefusesADuplicate) {
  CMPIObjectPath* class_path = path("NRVTAVO_Card");
  CMPIInstance* fresh = instance(class_path);
  fake::set_string_property(fresh, "Tag", "N3");
  fake::set_string_property(fresh, "CreationClassName", "NRVTAVO_Card");
  fake::set_string_property(fresh, "Model", "New");
  fake::Result created;
  ASSERT_EQ(mi_->ft->createInstance(mi_, context_, created.get(), class_path, fresh).rc, CMPI_RC_OK);
  ASSERT_EQ(created.returned().paths.size(), 1u);
  EXPECT_EQ(tag_of(created.returned().paths[0]), "N3");
  EXPECT_EQ(store().cards.size(), 3u);

  fake::Result again;
  EXPECT_EQ(mi_->ft->createInstance(mi_, context_, again.get(), class_path, fresh).rc, CMPI_RC_ERR_ALREADY_EXISTS);
  EXPECT_TRUE(again.returned().paths.empty());
}

TEST_F(Instance_Ops, ModifyChangesOnlyTheListedProperties) {
  CMPIObjectPath* target = card_path("A1");
  CMPIInstance* change = instance(target);
  fake::set_string_property(change, "Manufacturer", "Other");
  fake::set_string_property(change, "Model", "ignored");
  const char* list[] = {"Manufacturer", nullptr};
  fake::Result result;
  ASSERT_EQ(mi_->ft->modifyInstance(mi_, context_, result.get(), target, change, list).rc, CMPI_RC_OK);
  EXPECT_EQ(result.returned().done, 1);
  auto* stored = static_cast<NRVTAVO_Card*>(store().cards[0]);
  EXPECT_EQ(stored->Manufacturer.value, "Other");
  EXPECT_EQ(stored->Model.value, "LPe-A");

  fake::Result missing;
  EXPECT_EQ(mi_->ft->modifyInstance(mi_, context_, missing.get(), card_path("Z9"), change, list).rc,
            CMPI_RC_ERR_NOT_FOUND);
}

TEST_F(Instance_Ops, DeleteRemovesOnceThenAnswersNotFound) {
  fake::Result first;
  EXPECT_EQ(mi_->ft->deleteInstance(mi_, context_, first.get(), card_path("A1")).rc, CMPI_RC_OK);
  EXPECT_EQ(first.returned().done, 1);
  EXPECT_EQ(store().cards.size(), 1u);
  fake::Result second;
  EXPECT_EQ(mi_->ft->deleteInstance(mi_, context_, second.get(), card_path("A1")).rc, CMPI_RC_ERR_NOT_FOUND);
}

TEST_F(Instance_Ops, UnsupportedOperationsMapToNotSupported) {
  CMPIInstanceMI* chips = instance_mi(chip_slot());
  fake::Result result;
  EXPECT_EQ(chips->ft->deleteInstance(chips, context_, result.get(), chip_path("C1")).rc, CMPI_RC_ERR_NOT_SUPPORTED);
  CMPIInstance* change = instance(chip_path("C1"));
  EXPECT_EQ(chips->ft->createInstance(chips, context_, result.get(), chip_path("C2"), change).rc,
            CMPI_RC_ERR_NOT_SUPPORTED);
}

TEST_F(Instance_Ops, EnumerationFailuresMapToTheirCodesWithoutDone) {
  store().card_enumeration_result = ENUM_INSTANCES_ACCESS_DENIED;
  fake::Result denied;
  EXPECT_EQ(mi_->ft->enumerateInstanceNames(mi_, context_, denied.get(), path("NRVTAVO_Card")).rc,
            CMPI_RC_ERR_ACCESS_DENIED);
  EXPECT_EQ(denied.returned().done, 0);
  store().card_enumeration_result = ENUM_INSTANCES_FAILED;
  fake::Result failed;
  EXPECT_EQ(code_of(mi_->ft->enumerateInstances(mi_, context_, failed.get(), path("NRVTAVO_Card"), nullptr)),
            CMPI_RC_ERR_FAILED);
  EXPECT_EQ(failed.returned().done, 0);
  EXPECT_NE(traces().find("return: enumInstances(): CMPI_RC_ERR_FAILED"), std::string::npos);
}

TEST_F(Instance_Ops, ExecQueryIsNotSupported) {
  fake::Result result;
  EXPECT_EQ(mi_->ft->execQuery(mi_, context_, result.get(), path("NRVTAVO_Card"), "select * from x", "WQL").rc,
            CMPI_RC_ERR_NOT_SUPPORTED);
}

// Each returned instance must be released before the next is built: the
// live count may grow by one stored copy per result and by nothing else.
TEST_F(Instance_Ops, ALargeEnumerationHoldsOneObjectInFlight) {
  store().cards.clear();
  for (int i = 0; i < 300; ++i) store().cards.insert(make_card(("T" + std::to_string(i)).c_str()));
  const int before = fake::live_objects();
  {
    CMPIObjectPath* class_path = fake::new_path(kNs, "NRVTAVO_Card");
    fake::Result result;
    ASSERT_EQ(mi_->ft->enumerateInstances(mi_, context_, result.get(), class_path, nullptr).rc, CMPI_RC_OK);
    const fake::Returned& r = result.returned();
    ASSERT_EQ(r.instances.size(), 300u);
    const int live = fake::live_objects();
    CMPIInstance* copy = CMClone(r.instances[0], nullptr);
    const int copy_cost = fake::live_objects() - live;
    CMRelease(copy);
    for (size_t i = 1; i < r.live_at_return.size(); ++i)
      ASSERT_EQ(r.live_at_return[i] - r.live_at_return[i - 1], copy_cost) << "at result " << i;
    CMRelease(class_path);
  }
  EXPECT_EQ(fake::live_objects(), before);
}

}  // namespace
}  // namespace test

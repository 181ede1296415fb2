// Instances of the module's generated classes: creation with and without
// defaults, key comparison, cloning, reference counts, copies, model paths,
// meta-data look-ups and the instance map.
#include <gtest/gtest.h>

#include <string>

#include "framework/Instance_Map.h"
#include "schema/CIM_Chip.h"
#include "schema/NRVTAVO_Card.h"
#include "schema/NRVTAVO_CardContainsChip.h"
#include "schema/NRVTAVO_Chip.h"
#include "schema/NRVTAVO_EthernetPort.h"
#include "schema/Repository.h"

using namespace cimple;

namespace {

NRVTAVO_Chip* make_chip(const char* tag) {
  auto* chip = NRVTAVO_Chip::create();
  chip->CreationClassName.set("NRVTAVO_Chip");
  chip->Tag.set(tag);
  return chip;
}

NRVTAVO_Card* make_card(const char* tag) {
  auto* card = NRVTAVO_Card::create();
  card->CreationClassName.set("NRVTAVO_Card");
  card->Tag.set(tag);
  return card;
}

NRVTAVO_CardContainsChip* make_containment(const char* card_tag, const char* chip_tag) {
  auto* link = NRVTAVO_CardContainsChip::create();
  link->GroupComponent = make_card(card_tag);
  link->PartComponent = make_chip(chip_tag);
  return link;
}

template <class T>
void drop(T* instance) {
  unref(instance);
}

TEST(Instance, CreateWritesTheHeaderAndLeavesValuesPresent) {
  auto* chip = NRVTAVO_Chip::create();
  EXPECT_EQ(chip->magic, kInstanceMagic);
  EXPECT_EQ(chip->refs, 1u);
  EXPECT_EQ(chip->meta_class, &NRVTAVO_Chip::static_meta_class);
  EXPECT_STREQ(chip->__name_space.c_str(), "");
  EXPECT_FALSE(chip->Tag.is_null());
  EXPECT_FALSE(chip->OperationalStatus.is_null());
  EXPECT_EQ(chip->OperationalStatus.value.size(), 0u);
  drop(chip);
}

TEST(Instance, CreateWithDefaultsNullsEverythingWithoutADefault) {
  auto* port = NRVTAVO_EthernetPort::create(true);
  const Meta_Class* mc = &NRVTAVO_EthernetPort::static_meta_class;
  size_t defaults = 0;
  for (size_t i = 0; i < mc->num_meta_features; ++i) {
    const Meta_Feature* mf = mc->meta_features[i];
    if (!(mf->flags & FLAG_PROPERTY)) continue;
    auto* mp = reinterpret_cast<const Meta_Property*>(mf);
    EXPECT_EQ(*null_flag(port, mp), mp->value ? 0 : 1) << mp->name;
    defaults += mp->value != nullptr;
  }
  EXPECT_GT(defaults, 0u) << "the DMTF schema gives EthernetPort some defaults";
  drop(port);
}

TEST(KeyEq, IgnoresNonKeysAndComparesKeys) {
  auto* a = make_chip("chip-1");
  auto* b = make_chip("chip-1");
  b->ElementName.set("a different name");
  b->BoardTemperature.set(55);
  EXPECT_TRUE(key_eq(a, b));
  b->Tag.set("chip-2");
  EXPECT_FALSE(key_eq(a, b));
  b->Tag.set("chip-1");
  b->Tag.set_null();
  EXPECT_FALSE(key_eq(a, b)) << "null flags must match";
  drop(a);
  drop(b);
}

TEST(KeyEq, WorksAcrossSubclasses) {
  auto* derived = make_chip("chip-1");
  auto* base = CIM_Chip::create();
  base->CreationClassName.set("NRVTAVO_Chip");
  base->Tag.set("chip-1");
  EXPECT_TRUE(key_eq(derived, base));
  EXPECT_TRUE(key_eq(base, derived));
  drop(derived);
  drop(base);
}

TEST(KeyEq, ComparesKeyReferencesByTheirTargetsKeys) {
  auto* a = make_containment("card-1", "chip-1");
  auto* b = make_containment("card-1", "chip-1");
  EXPECT_TRUE(key_eq(a, b));
  b->PartComponent->Tag.set("chip-2");
  EXPECT_FALSE(key_eq(a, b));

  unref(b->PartComponent);
  b->PartComponent = nullptr;
  EXPECT_FALSE(key_eq(a, b)) << "one reference null, the other set";
  unref(a->PartComponent);
  a->PartComponent = nullptr;
  EXPECT_TRUE(key_eq(a, b)) << "both null";
  drop(a);
  drop(b);
}

TEST(Clone, AssociationClonesOwnTheirTargets) {
  auto* original = make_containment("card-1", "chip-1");
  auto* copy = NRVTAVO_CardContainsChip::clone(original);
  EXPECT_NE(copy->PartComponent, original->PartComponent);
  EXPECT_TRUE(key_eq(copy, original));
  drop(original);
  EXPECT_EQ(copy->PartComponent->Tag.value, "chip-1");
  EXPECT_EQ(copy->GroupComponent->Tag.value, "card-1");
  drop(copy);
}

TEST(Clone, ChangingACloneNeverChangesTheOriginal) {
  auto* chip = make_chip("chip-1");
  chip->OperationalStatus.set(Array<uint16>{2});
  chip->ElementName.set("name");
  auto* copy = NRVTAVO_Chip::clone(chip);
  copy->OperationalStatus.value.append(6);
  copy->ElementName.value.append("-changed");
  copy->Tag.set_null();
  EXPECT_EQ(chip->OperationalStatus.value.size(), 1u);
  // The clone keeps the original's elements before its own.
  ASSERT_EQ(copy->OperationalStatus.value.size(), 2u);
  EXPECT_EQ(copy->OperationalStatus.value[0], 2);
  EXPECT_EQ(chip->ElementName.value, "name");
  EXPECT_FALSE(chip->Tag.is_null());
  drop(chip);
  drop(copy);
}

TEST(RefCount, NestedInstancesLiveAsLongAsTheirLastHolder) {
  auto* link = make_containment("card-1", "chip-1");
  NRVTAVO_Chip* chip = link->PartComponent;
  ref(chip);
  EXPECT_EQ(chip->refs, 2u);
  drop(link);
  EXPECT_EQ(chip->refs, 1u);
  EXPECT_EQ(chip->Tag.value, "chip-1");
  drop(chip);
}

TEST(Editing, NullFlagsCopyAndCreateRefs) {
  auto* chip = make_chip("chip-1");
  set_null_flags(chip, false, true, 1);
  EXPECT_FALSE(chip->Tag.is_null());
  EXPECT_TRUE(chip->ElementName.is_null());

  auto* source = make_chip("chip-1");
  source->ElementName.set("copied");
  source->BoardTemperature.set(40);
  auto* model = NRVTAVO_Chip::create();
  set_null_flags(model, false, true, 1);
  model->ElementName.null = 0;
  copy(chip, source, false, model);
  EXPECT_EQ(chip->ElementName.value, "copied");
  EXPECT_TRUE(chip->BoardTemperature.is_null()) << "only properties non-null in the model";

  auto* card = make_card("card-1");
  copy(chip, card);  // different classes: nothing happens
  EXPECT_EQ(chip->CreationClassName.value, "NRVTAVO_Chip");

  auto* link = NRVTAVO_CardContainsChip::create();
  create_refs(link);
  ASSERT_NE(link->GroupComponent, nullptr);
  EXPECT_EQ(link->GroupComponent->meta_class, &NRVTAVO_Card::static_meta_class);
  for (Instance* i : {static_cast<Instance*>(chip), static_cast<Instance*>(source), static_cast<Instance*>(model),
                      static_cast<Instance*>(card), static_cast<Instance*>(link)})
    unref(i);
}

TEST(ModelPath, KeysInDeclarationOrderWithEscapedReferences) {
  auto* link = make_containment("card \"1\"", "chip-1");
  std::string path;
  ASSERT_TRUE(instance_to_model_path(link->PartComponent, path));
  EXPECT_EQ(path, "NRVTAVO_Chip.Tag=\"chip-1\",CreationClassName=\"NRVTAVO_Chip\"");
  ASSERT_TRUE(instance_to_model_path(link, path));
  EXPECT_EQ(path,
            "NRVTAVO_CardContainsChip.GroupComponent=\"NRVTAVO_Card.Tag=\\\"card \\\"1\\\"\\\","
            "CreationClassName=\\\"NRVTAVO_Card\\\"\",PartComponent=\"NRVTAVO_Chip.Tag=\\\"chip-1\\\","
            "CreationClassName=\\\"NRVTAVO_Chip\\\"\"");
  link->PartComponent->Tag.set_null();
  std::string untouched = "before";
  EXPECT_FALSE(instance_to_model_path(link, untouched));
  EXPECT_EQ(untouched, "before");
  drop(link);
}

TEST(Lookup, FeaturesAndClassesCaseInsensitively) {
  const Meta_Class* mc = &NRVTAVO_EthernetPort::static_meta_class;
  EXPECT_NE(find_feature(mc, "permanentaddress", KIND_PROPERTY), nullptr);
  EXPECT_EQ(find_feature(mc, "PermanentAddress", KIND_METHOD), nullptr);
  EXPECT_NE(find_method(mc, "requestSTATEchange"), nullptr);
  EXPECT_EQ(find_feature(mc, "NoSuchFeature"), nullptr);
  EXPECT_EQ(find_feature(mc, ""), nullptr);
  EXPECT_EQ(find_meta_class(&nrv_meta_repository, "nrvtavo_chip"), &NRVTAVO_Chip::static_meta_class);
  EXPECT_EQ(find_meta_class(&nrv_meta_repository, "NRVTAVO_NoSuchClass"), nullptr);
  EXPECT_TRUE(is_subclass(&CIM_Chip::static_meta_class, &NRVTAVO_Chip::static_meta_class));
  EXPECT_FALSE(is_subclass(&NRVTAVO_Chip::static_meta_class, &CIM_Chip::static_meta_class));
}

TEST(MethodRecord, ParametersThenReturnValue) {
  const Meta_Method* mm = find_method(&NRVTAVO_EthernetPort::static_meta_class, "RequestStateChange");
  ASSERT_NE(mm, nullptr);
  ASSERT_GE(mm->num_meta_features, 2u);
  const Meta_Feature* last = mm->meta_features[mm->num_meta_features - 1];
  EXPECT_STREQ(last->name, "return_value");
  EXPECT_TRUE(last->flags & FLAG_OUT);
  Instance* call = create(mm);
  EXPECT_STREQ(call->meta_class->name, "RequestStateChange");
  unref(call);
}

TEST(InstanceMap, RefusesDuplicatesAndAnswersWithResultCodes) {
  Instance_Map map(&NRVTAVO_Chip::static_meta_class);
  EXPECT_EQ(map.insert(make_chip("a")), 0);
  EXPECT_EQ(map.insert(make_chip("b")), 1);
  auto* duplicate = make_chip("a");
  EXPECT_EQ(map.insert(duplicate), -1);
  EXPECT_EQ(map.create_instance(duplicate), CREATE_INSTANCE_DUPLICATE);

  Instance* found = nullptr;
  EXPECT_EQ(map.get_instance(duplicate, found), GET_INSTANCE_OK);
  ASSERT_NE(found, nullptr);
  EXPECT_NE(found, map[0]) << "handed out as a clone";
  unref(found);

  duplicate->ElementName.set("renamed");
  EXPECT_EQ(map.modify_instance(nullptr, duplicate), MODIFY_INSTANCE_OK);
  EXPECT_EQ(static_cast<NRVTAVO_Chip*>(map.lookup(duplicate))->ElementName.value, "renamed");

  auto* missing = make_chip("zz");
  EXPECT_EQ(map.get_instance(missing, found), GET_INSTANCE_NOT_FOUND);
  EXPECT_EQ(map.modify_instance(nullptr, missing), MODIFY_INSTANCE_NOT_FOUND);
  EXPECT_EQ(map.delete_instance(missing), DELETE_INSTANCE_NOT_FOUND);
  EXPECT_EQ(map.create_instance(missing), CREATE_INSTANCE_OK);
  EXPECT_EQ(map.delete_instance(duplicate), DELETE_INSTANCE_OK);
  EXPECT_EQ(map.find(duplicate), -1);
  EXPECT_EQ(map.find(missing), 1) << "positions shift after removal";

  std::vector<std::string> order;
  Handler collect{[](Instance* i, int, void* data) {
                    static_cast<std::vector<std::string>*>(data)->push_back(
                        static_cast<NRVTAVO_Chip*>(i)->Tag.value.str());
                    unref(i);
                    return true;
                  },
                  &order};
  EXPECT_EQ(map.enum_instances(collect), 0);
  EXPECT_EQ(order, (std::vector<std::string>{"b", "zz"}));
  drop(duplicate);
  drop(missing);
}

TEST(InstanceMap, AssociationsAreFoundByTheirTargetsKeys) {
  Instance_Map map(&NRVTAVO_CardContainsChip::static_meta_class);
  for (int i = 0; i < 50; ++i)
    ASSERT_GE(map.insert(make_containment("card", ("chip-" + std::to_string(i)).c_str())), 0);
  auto* probe = make_containment("card", "chip-37");
  EXPECT_EQ(map.find(probe), 37);
  EXPECT_EQ(map.insert(probe), -1);
  drop(probe);
}

}  // namespace

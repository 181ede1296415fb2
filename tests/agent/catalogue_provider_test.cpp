// The catalogue-backed provider as the adapter sees it through the provider
// procedure: enumeration of clones, the duplicate-key and empty-map answers,
// get instance through the enumeration fallback, and everything else
// unsupported.
#include <stdexcept>

#include "AgentFixture.h"
#include "logging/Log.h"
#include "derivedObjects/Catalogue_Provider.h"
#include "schema/Classes.h"

namespace nrv_test {
namespace {

using namespace cimple;

class CatalogueProviderTest : public AgentTest {
 protected:
  void SetUp() override {
    AgentTest::SetUp();
    chip = make_slot<Catalogue_Provider<NRVTAVO_Chip>, NRVTAVO_Chip>();
    ASSERT_EQ(chip->load(), LOAD_OK);
    agent = ProviderAgent::peekInstance();
  }
  void TearDown() override {
    chip->unload();
    chip.reset();
    AgentTest::TearDown();
  }

  static const String& tag_of(const Instance* i) { return static_cast<const NRVTAVO_Chip*>(i)->Tag.value; }

  std::unique_ptr<ProviderSlot> chip;
  ProviderAgent* agent = nullptr;
};

TEST_F(CatalogueProviderTest, DeliversClonesOfTheMapInOrder) {
  Collected first;
  ASSERT_EQ(chip->enumerate(first), ENUM_INSTANCES_OK);
  ASSERT_TRUE(one_generation(first, 6));
  for (size_t i = 0; i < first.instances.size(); ++i)
    EXPECT_EQ(tag_of(first.instances[i]), String("chip-" + std::to_string(i)));

  // What the handler owns is its own: changing it leaves the catalogue alone.
  static_cast<NRVTAVO_Chip*>(first.instances[0])->Tag.set("changed");
  {
    std::lock_guard<std::recursive_mutex> data(agent->m_DataMutex);
    EXPECT_NE(first.instances[0], agent->m_NRVTAVO_Chip_map[0]);
    EXPECT_EQ(tag_of(agent->m_NRVTAVO_Chip_map[0]), String("chip-0"));
  }
  Collected second;
  chip->enumerate(second);
  EXPECT_EQ(tag_of(second.instances[0]), String("chip-0"));
}

TEST_F(CatalogueProviderTest, AnEmptyMapAnswersAnEmptySuccess) {
  FakeCatalogue::get().chips = 0;
  Collected none;
  EXPECT_EQ(chip->enumerate(none), ENUM_INSTANCES_OK);
  EXPECT_EQ(none.closing, ENUM_INSTANCES_OK);
  EXPECT_TRUE(none.instances.empty());
}

TEST_F(CatalogueProviderTest, TwoInstancesWithEqualKeysDeliverNothing) {
  Collected built;
  chip->enumerate(built);
  {
    // Only an edit in place can give two map entries equal keys.
    std::lock_guard<std::recursive_mutex> data(agent->m_DataMutex);
    static_cast<NRVTAVO_Chip*>(agent->m_NRVTAVO_Chip_map[1])->Tag.set("chip-0");
  }
  capture.reset();
  Collected none;
  EXPECT_EQ(chip->enumerate(none), ENUM_INSTANCES_OK);
  EXPECT_TRUE(none.instances.empty());
  EXPECT_EQ(capture.count("Insert failed for 1", NRV_CRIT), 1);
  for (const auto& e : capture.entries()) {
    if (e.message == "Insert failed for 1") {
      EXPECT_EQ(e.file, "ProviderAgent.h");
    }
  }
  EXPECT_TRUE(capture.contains("NRVTAVO_Chip_Provider::enum_instances()"));
}

// A failure inside the enumeration (here the handler throwing) is logged
// and the answer is still success.
bool throwing_handler(Instance* instance, int, void*) {
  if (instance == nullptr) return true;
  unref(instance);
  throw std::runtime_error("handler failed");
}

TEST_F(CatalogueProviderTest, AnExceptionIsLoggedAndTheAnswerIsStillSuccess) {
  EXPECT_EQ(chip->handle().enum_instances(nullptr, &throwing_handler, nullptr), ENUM_INSTANCES_OK);
  EXPECT_EQ(capture.count("Exception in CIM Provider Enumeration - do nothing", NRV_CRIT), 1);
  EXPECT_TRUE(capture.contains("NRVTAVO_Chip_Provider::enum_instances()"));

  auto disk = make_slot<Catalogue_Provider<NRVTAVO_LogicalDisk>, NRVTAVO_LogicalDisk>();
  ASSERT_EQ(disk->load(), LOAD_OK);
  EXPECT_EQ(disk->handle().enum_instances(nullptr, &throwing_handler, nullptr), ENUM_INSTANCES_OK);
  EXPECT_EQ(capture.count("Exception in SAN CIM Provider Enumeration - do nothing", NRV_CRIT), 1);
  for (const auto& e : capture.entries()) {
    if (e.message.rfind("Exception in", 0) == 0) {
      EXPECT_EQ(e.file, "ProviderAgent.h");
    }
  }
  // The locks were released: the next enumeration goes through.
  Collected all;
  chip->enumerate(all);
  EXPECT_TRUE(one_generation(all, 6));
  disk->unload();
}

TEST_F(CatalogueProviderTest, GetInstanceFindsByKeyThroughTheEnumeration) {
  NRVTAVO_Chip* keys = NRVTAVO_Chip::create();
  keys->CreationClassName.set("NRVTAVO_Chip");
  keys->Tag.set("chip-3");
  Instance* found = nullptr;
  EXPECT_EQ(chip->handle().get_instance(keys, found), GET_INSTANCE_OK);
  ASSERT_NE(found, nullptr);
  EXPECT_EQ(tag_of(found), String("chip-3"));
  unref(found);

  keys->Tag.set("chip-99");
  Instance* missing = nullptr;
  EXPECT_EQ(chip->handle().get_instance(keys, missing), GET_INSTANCE_NOT_FOUND);
  EXPECT_EQ(missing, nullptr);
  unref(keys);
}

TEST_F(CatalogueProviderTest, WritesAndMethodsAreUnsupported) {
  NRVTAVO_Chip* keys = NRVTAVO_Chip::create();
  EXPECT_EQ(chip->handle().create_instance(keys), CREATE_INSTANCE_UNSUPPORTED);
  EXPECT_EQ(chip->handle().delete_instance(keys), DELETE_INSTANCE_UNSUPPORTED);
  EXPECT_EQ(chip->handle().modify_instance(keys, keys), MODIFY_INSTANCE_UNSUPPORTED);
  unref(keys);
}

TEST_F(CatalogueProviderTest, EveryExtrinsicMethodOfTheClassAnswersUnsupported) {
  auto pci = make_slot<Catalogue_Provider<NRVTAVO_PCIDevice>, NRVTAVO_PCIDevice>();
  const Meta_Class& mc = NRVTAVO_PCIDevice::static_meta_class;
  int methods = 0;
  for (size_t i = 0; i < mc.num_meta_features; ++i) {
    if (!(mc.meta_features[i]->flags & FLAG_METHOD)) continue;
    ++methods;
    Instance* call = create(reinterpret_cast<const Meta_Method*>(mc.meta_features[i]));
    EXPECT_EQ(pci->handle().invoke_method(nullptr, call), INVOKE_METHOD_UNSUPPORTED) << mc.meta_features[i]->name;
    unref(call);
  }
  EXPECT_GE(methods, 1);
}

TEST_F(CatalogueProviderTest, AFirstSANReadTriggersASANFetchAndWaitsForIt) {
  auto disk = make_slot<Catalogue_Provider<NRVTAVO_LogicalDisk>, NRVTAVO_LogicalDisk>();
  ASSERT_EQ(disk->load(), LOAD_OK);
  Collected disks;
  EXPECT_EQ(disk->enumerate(disks), ENUM_INSTANCES_OK);
  EXPECT_TRUE(one_generation(disks, 4));
  EXPECT_TRUE(capture.contains("NRVTAVO_LogicalDisk_Provider::enum_instances()"));
  disk->unload();
}

}  // namespace
}  // namespace nrv_test

// The test module's life in the host: factories found by name, the
// instance and method MIs of one provider sharing one adapter, and the
// shutdown cleanups decrementing before the last one unloads.
#include "tests/e2e/E2E_Fixture.h"

namespace e2e {
namespace {

using Lifecycle = E2E_Test;

TEST_F(Lifecycle, FactoriesAndAliasesResolveForEveryProvider) {
  for (const char* c : {"NRVTAVO_Card", "NRVTAVO_Chip", "NRVTAVO_CardContainsChip", "NRVTAVO_ChannelMgmtService"})
    for (const char* kind : {"Instance", "Method"}) {
      std::string suffix = std::string("_Create_") + kind + "MI";
      EXPECT_TRUE(host_->resolves(std::string(c) + "_Provider" + suffix)) << c << suffix;
      EXPECT_TRUE(host_->resolves(std::string(c) + suffix)) << c << suffix;
    }
  EXPECT_TRUE(host_->resolves("NRVTAVO_CardContainsChip_Provider_Create_AssociationMI"));
  EXPECT_FALSE(host_->resolves("NRVTAVO_Card_Provider_Create_AssociationMI"));
  EXPECT_TRUE(host_->resolves("cimple_module"));
}

TEST_F(Lifecycle, InstanceAndMethodMisShareOneAdapterAndCleanupDecrementsThenUnloads) {
  ClassMis card = host_->mis("NRVTAVO_Card");
  ASSERT_NE(card.instance, nullptr);
  ASSERT_NE(card.method, nullptr);
  EXPECT_EQ(card.association, nullptr);
  EXPECT_EQ(card.instance->hdl, card.method->hdl);  // the provider's one static adapter record
  EXPECT_EQ(module_store().loads, 1);

  ClassMis link = host_->mis("NRVTAVO_CardContainsChip");
  ASSERT_NE(link.association, nullptr);
  EXPECT_EQ(link.association->hdl, link.instance->hdl);
  EXPECT_NE(link.instance->hdl, card.instance->hdl);

  host_->shutdown();
  for (const CleanupRecord& record : host_->cleanupRecords()) EXPECT_EQ(record.rc, CMPI_RC_OK) << record.factory;
  EXPECT_EQ(host_->cleanupRecords().size(), 5u);
  EXPECT_EQ(module_store().unloads, 1);
  std::string log = traces();
  size_t decrement = log.find("cleanup decrement");
  size_t unload = log.find("cleanup unload");
  ASSERT_NE(decrement, std::string::npos) << log;
  ASSERT_NE(unload, std::string::npos) << log;
  EXPECT_LT(decrement, unload);
}

TEST_F(Lifecycle, ALaterHostGetsAFreshAdapterFromTheSameRecord) {
  ClassMis first = host_->mis("NRVTAVO_Card");
  ASSERT_NE(first.instance, nullptr);
  host_ = std::make_unique<Host>(test_module());
  ASSERT_TRUE(host_->enumerateInstances(kNs, "NRVTAVO_Card").ok());
  EXPECT_EQ(module_store().loads, 2);
  EXPECT_EQ(module_store().unloads, 1);
}

}  // namespace
}  // namespace e2e

// Adapter life: factory calls sharing one adapter, the MI tables, cleanup
// order and the unload refusal.
#include "framework/cimom.h"
#include "tests/adapter/Adapter_Fixture.h"

namespace test {
namespace {

using Lifecycle = Adapter_Test;

TEST_F(Lifecycle, TwoFactoryCallsShareOneAdapterAndTheLastCleanupUnloads) {
  Provider_Slot slot = card_slot();
  CMPIInstanceMI* imi = instance_mi(slot);
  CMPIMethodMI* mmi = method_mi(slot);
  ASSERT_NE(imi, nullptr);
  ASSERT_NE(mmi, nullptr);
  EXPECT_EQ(imi->hdl, slot.record);
  EXPECT_EQ(mmi->hdl, slot.record);
  ASSERT_NE(slot.record->adapter, nullptr);
  EXPECT_EQ(slot.record->adapter->load_count(), 2);
  EXPECT_EQ(store().loads, 1);

  CMPIStatus first = imi->ft->cleanup(imi, context_, 0);
  EXPECT_EQ(first.rc, CMPI_RC_OK);
  EXPECT_NE(slot.record->adapter, nullptr);
  EXPECT_EQ(store().unloads, 0);

  CMPIStatus second = mmi->ft->cleanup(mmi, context_, 0);
  EXPECT_EQ(second.rc, CMPI_RC_OK);
  EXPECT_EQ(slot.record->adapter, nullptr);
  EXPECT_EQ(store().unloads, 1);

  std::string log = traces();
  size_t decrement = log.find("cleanup decrement");
  size_t unload = log.find("cleanup unload");
  size_t destroyed = log.find("~CMPI_Adapter");
  ASSERT_NE(decrement, std::string::npos);
  ASSERT_NE(unload, std::string::npos);
  ASSERT_NE(destroyed, std::string::npos);
  EXPECT_LT(decrement, unload);
  EXPECT_LT(unload, destroyed);
  EXPECT_NE(log.find("DBG: CMPI_Adapter.cpp("), std::string::npos);
  EXPECT_NE(log.find("enter: cimple_cmpi_adapter()"), std::string::npos);
  EXPECT_NE(log.find("enter: CMPI_Adapter()"), std::string::npos);
}

TEST_F(Lifecycle, TablesFollowTheStandardSlotsAndNameTheProvider) {
  Provider_Slot slot = link_slot();
  CMPIInstanceMI* imi = instance_mi(slot);
  CMPIAssociationMI* ami = association_mi(slot);
  auto* nmi = static_cast<CMPIIndicationMI*>(factory(slot, 'N'));
  ASSERT_TRUE(imi && ami && nmi);
  EXPECT_EQ(imi->ft->ftVersion, 100);
  EXPECT_EQ(imi->ft->miVersion, 100);
  EXPECT_STREQ(imi->ft->miName, "instanceNRVTAVO_CardContainsChip_Provider");
  EXPECT_STREQ(ami->ft->miName, "associationNRVTAVO_CardContainsChip_Provider");
  EXPECT_STREQ(nmi->ft->miName, "indicationNRVTAVO_CardContainsChip_Provider");
  EXPECT_STREQ(slot.record->method_name, "methodNRVTAVO_CardContainsChip_Provider");
  for (auto fn : {reinterpret_cast<void*>(imi->ft->enumerateInstanceNames),
                  reinterpret_cast<void*>(imi->ft->execQuery), reinterpret_cast<void*>(ami->ft->referenceNames),
                  reinterpret_cast<void*>(nmi->ft->disableIndications)})
    EXPECT_NE(fn, nullptr);
  EXPECT_EQ(slot.record->adapter->load_count(), 3);
}

TEST_F(Lifecycle, AnUnknownKindHandsOutNothingAndCountsNothing) {
  Provider_Slot slot = card_slot();
  instance_mi(slot);
  void* mi = reinterpret_cast<void*>(0x1);
  EXPECT_EQ(cimple_cmpi_adapter(67, slot.record, slot.registration, broker_.get(), context_, "x", 'Q', &mi), 0);
  EXPECT_EQ(mi, reinterpret_cast<void*>(0x1));
  EXPECT_EQ(slot.record->adapter->load_count(), 1);
}

TEST_F(Lifecycle, AProviderMayRefuseANonTerminatingUnload) {
  Provider_Slot slot = card_slot();
  CMPIInstanceMI* imi = instance_mi(slot);
  {
    CMPI_Thread_Context context(broker_.get(), context_, slot.record->adapter);
    Thread_Context::push(&context);
    cimom::allow_unload(false);
    Thread_Context::pop();
  }
  EXPECT_EQ(imi->ft->cleanup(imi, context_, 0).rc, CMPI_RC_DO_NOT_UNLOAD);
  EXPECT_NE(slot.record->adapter, nullptr);
  EXPECT_NE(traces().find("cleanup do not unload"), std::string::npos);
  EXPECT_EQ(imi->ft->cleanup(imi, context_, 1).rc, CMPI_RC_OK);
  EXPECT_EQ(slot.record->adapter, nullptr);
}

TEST_F(Lifecycle, AFactoryCallAfterUnloadBuildsAFreshAdapter) {
  Provider_Slot slot = card_slot();
  CMPIInstanceMI* imi = instance_mi(slot);
  imi->ft->cleanup(imi, context_, 0);
  ASSERT_EQ(slot.record->adapter, nullptr);
  imi = instance_mi(slot);
  ASSERT_NE(slot.record->adapter, nullptr);
  EXPECT_EQ(store().loads, 2);
  EXPECT_EQ(slot.record->adapter->load_count(), 1);
}

TEST_F(Lifecycle, CallsOnACleanedUpMiFailWithoutCrashing) {
  Provider_Slot slot = card_slot();
  CMPIInstanceMI* imi = instance_mi(slot);
  imi->ft->cleanup(imi, context_, 1);
  fake::Result result;
  EXPECT_EQ(imi->ft->enumerateInstanceNames(imi, context_, result.get(), path("NRVTAVO_Card")).rc,
            CMPI_RC_ERR_FAILED);
  EXPECT_EQ(imi->ft->cleanup(imi, context_, 1).rc, CMPI_RC_OK);
}

TEST_F(Lifecycle, IndicationFunctionsAnswerWithoutAProducer) {
  Provider_Slot slot = card_slot();
  auto* nmi = static_cast<CMPIIndicationMI*>(factory(slot, 'N'));
  CMPIObjectPath* class_path = path("NRVTAVO_Card");
  EXPECT_EQ(nmi->ft->authorizeFilter(nmi, context_, nullptr, "NRVTAVO_Card", class_path, "me").rc, CMPI_RC_OK);
  EXPECT_EQ(nmi->ft->mustPoll(nmi, context_, nullptr, "NRVTAVO_Card", class_path).rc, CMPI_RC_OK);
  EXPECT_EQ(nmi->ft->activateFilter(nmi, context_, nullptr, "NRVTAVO_Card", class_path, 1).rc, CMPI_RC_OK);
  EXPECT_EQ(nmi->ft->activateFilter(nmi, context_, nullptr, "NRVTAVO_Card", class_path, 0).rc, CMPI_RC_OK);
  EXPECT_EQ(slot.record->adapter->active_filters().at(kNs), 2);
  EXPECT_EQ(nmi->ft->deActivateFilter(nmi, context_, nullptr, "NRVTAVO_Card", class_path, 1).rc, CMPI_RC_OK);
  EXPECT_TRUE(slot.record->adapter->active_filters().empty());
  // A provider without indications cannot enable them: that is no success.
  EXPECT_EQ(code_of(nmi->ft->enableIndications(nmi, context_)), CMPI_RC_ERR_FAILED);
  EXPECT_EQ(code_of(nmi->ft->disableIndications(nmi, context_)), CMPI_RC_ERR_FAILED);
  EXPECT_EQ(nmi->ft->cleanup(nmi, context_, 0).rc, CMPI_RC_OK);
  EXPECT_NE(traces().find("indicationCleanup"), std::string::npos);
}

}  // namespace
}  // namespace test

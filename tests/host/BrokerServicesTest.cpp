// Broker services an MI relies on besides the objects, at smoke level: up-calls routed with
// their arguments, class hierarchy, thread attachment, memory blocks, and refusal of a
// foreign or dead broker handle.
#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <thread>

#include "HostTestSupport.h"
#include "cmpimacs.h"
#include "host/EncObjects.h"

namespace nrv::host {
namespace {

class BrokerServicesTest : public ::testing::Test {
 protected:
  test::ScriptedRouter router;
  Broker broker{router};
  const CMPIBroker* mb = broker.cmpi();
  std::unique_ptr<ArenaScope> scope = std::make_unique<ArenaScope>();
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  CMPIContext* ctx = makeContext(mb, Broker::requestContext("root/test"));

  void TearDown() override { scope.reset(); }

  CMPIObjectPath* widget(const char* id) {
    CMPIObjectPath* op = CMNewObjectPath(mb, "root/test", "TST_Widget", nullptr);
    CMAddKey(op, "InstanceID", id, CMPI_chars);
    return op;
  }
};

TEST_F(BrokerServicesTest, UpcallCarriesPathPropertiesAndContext) {
  InstanceData inst;
  inst.path.className = "TST_Widget";
  inst.properties.emplace_back("Name", Datum::string("n"));
  router.next.items = {Datum::embedded(inst)};
  const char* props[] = {"Name", nullptr};
  CMPIInstance* got = CBGetInstance(mb, ctx, widget("W1"), props, &rc);
  ASSERT_NE(got, nullptr);
  EXPECT_EQ(router.last.op, Operation::GetInstance);
  EXPECT_EQ(router.last.path.className, "TST_Widget");
  ASSERT_TRUE(router.last.properties.has_value());
  EXPECT_EQ(router.last.properties->at(0), "Name");
  EXPECT_NE(findNamed(router.last.context, CMPIPrincipal), nullptr);
  EXPECT_STREQ(CMGetCharPtr(CMGetProperty(got, "Name", nullptr).value.string), "n");
}

TEST_F(BrokerServicesTest, UpcallFailureKeepsCodeAndMessage) {
  router.next = Outcome::failure(CMPI_RC_ERR_NOT_FOUND, "gone");
  EXPECT_EQ(CBGetInstance(mb, ctx, widget("W1"), nullptr, &rc), nullptr);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_NOT_FOUND);
  ASSERT_NE(rc.msg, nullptr);
  EXPECT_STREQ(CMGetCharPtr(rc.msg), "gone");
  EXPECT_EQ(CBEnumInstances(mb, ctx, nullptr, nullptr, &rc), nullptr);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_PARAMETER);
}

TEST_F(BrokerServicesTest, InvokeMethodReturnsValueAndOutArgs) {
  router.next.returnValue = Datum::unsignedInt(CMPI_uint32, 5);
  router.next.outArgs.emplace_back("Out", Datum::string("o"));
  CMPIArgs* in = CMNewArgs(mb, nullptr);
  CMAddArg(in, "X", "1", CMPI_chars);
  CMPIArgs* out = CMNewArgs(mb, nullptr);
  CMPIData d = CBInvokeMethod(mb, ctx, widget("W1"), "Go", in, out, &rc);
  EXPECT_EQ(rc.rc, CMPI_RC_OK);
  EXPECT_EQ(d.type, CMPI_uint32);
  EXPECT_EQ(d.value.uint32, 5u);
  EXPECT_EQ(router.last.method, "Go");
  EXPECT_EQ(router.last.inArgs.size(), 1u);
  EXPECT_STREQ(CMGetCharPtr(CMGetArg(out, "Out", nullptr).value.string), "o");
  CBInvokeMethod(mb, ctx, widget("W1"), nullptr, in, out, &rc);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_PARAMETER);
}

TEST_F(BrokerServicesTest, ClassPathIsAFollowsTheParentTable) {
  CMPIObjectPath* cs = CMNewObjectPath(mb, "root/kvlhost", "KVLD_ComputerSystem", nullptr);
  EXPECT_TRUE(CMClassPathIsA(mb, cs, "CIM_ComputerSystem", &rc));
  EXPECT_TRUE(CMClassPathIsA(mb, cs, "cim_managedelement", &rc));
  EXPECT_TRUE(CMClassPathIsA(mb, cs, "KVLD_ComputerSystem", &rc));
  EXPECT_FALSE(CMClassPathIsA(mb, cs, "CIM_Chassis", &rc));
  broker.addClassParent("TST_Widget", "CIM_LogicalElement");
  EXPECT_TRUE(CMClassPathIsA(mb, widget("W1"), "CIM_ManagedElement", &rc));
  EXPECT_FALSE(CMClassPathIsA(mb, nullptr, "CIM_ManagedElement", &rc));
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_PARAMETER);
}

TEST_F(BrokerServicesTest, ForeignBrokerHandleIsRefused) {
  CMPIBroker fake = *mb;
  fake.hdl = nullptr;
  EXPECT_EQ(fake.eft->newString(&fake, "x", &rc), nullptr);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_HANDLE);
  EXPECT_EQ(fake.bft->getInstance(&fake, ctx, widget("W1"), nullptr, &rc), nullptr);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_HANDLE);
  EXPECT_EQ(router.calls, 0);
}

TEST(BrokerLifetimeTest, CallsAfterTheBrokerIsGoneAreRefused) {
  test::ScriptedRouter router;
  auto broker = std::make_unique<Broker>(router);
  const CMPIBroker* mb = broker->cmpi();
  CMPIContext* prepared = nullptr;
  {
    ArenaScope scope;
    CMPIContext* ctx = makeContext(mb, Broker::requestContext("root/test"));
    prepared = CBPrepareAttachThread(mb, ctx);
  }
  EXPECT_EQ(CBAttachThread(mb, prepared).rc, CMPI_RC_OK);
  EXPECT_EQ(broker->attachedThreads(), 1);
  broker.reset();  // e.g. a module thread that outlived its cleanup
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  EXPECT_EQ(mb->eft->newString(mb, "late", &rc), nullptr);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_HANDLE);
  EXPECT_EQ(CBDetachThread(mb, prepared).rc, CMPI_RC_ERR_INVALID_HANDLE);
  EXPECT_EQ(mb->bft->enumerateInstanceNames(mb, prepared, nullptr, &rc), nullptr);
  EXPECT_EQ(rc.rc, CMPI_RC_ERR_INVALID_HANDLE);
  EXPECT_EQ(router.calls, 0);
  detachThreadArena();  // the thread's own arena, left by the refused detach
}

TEST_F(BrokerServicesTest, AttachedThreadOwnsItsObjectsUntilDetach) {
  CMPIContext* prepared = CBPrepareAttachThread(mb, ctx);
  ASSERT_NE(prepared, nullptr);
  const size_t before = ObjectRegistry::instance().liveCount(mb);
  CMPIrc attach = CMPI_RC_ERR_FAILED, detach = CMPI_RC_ERR_FAILED;
  size_t during = 0;
  std::thread t([&] {
    attach = CBAttachThread(mb, prepared).rc;
    for (int i = 0; i < 10; ++i) CMNewString(mb, "in thread", nullptr);
    during = ObjectRegistry::instance().liveCount(mb);
    detach = CBDetachThread(mb, prepared).rc;
  });
  t.join();
  EXPECT_EQ(attach, CMPI_RC_OK);
  EXPECT_EQ(detach, CMPI_RC_OK);
  EXPECT_EQ(during, before + 10);
  // The prepared context went with the detach.
  EXPECT_EQ(ObjectRegistry::instance().liveCount(mb), before - 1);
  EXPECT_EQ(CBDetachThread(mb, ctx).rc, CMPI_RC_ERR_FAILED);
  EXPECT_EQ(CBAttachThread(mb, nullptr).rc, CMPI_RC_ERR_INVALID_PARAMETER);
}

TEST_F(BrokerServicesTest, MemoryBlocksBelongToTheRequest) {
  const size_t before = ObjectRegistry::instance().liveCount(mb);
  {
    ArenaScope request;
    auto* block = static_cast<char*>(mb->mft->cmpiCalloc(mb, 4, 2));
    ASSERT_NE(block, nullptr);
    EXPECT_EQ(std::string(block, 8), std::string(8, '\0'));
    std::memcpy(block, "abcdefg", 8);
    auto* grown = static_cast<char*>(mb->mft->cmpiRealloc(mb, block, 64));
    ASSERT_NE(grown, nullptr);
    EXPECT_STREQ(grown, "abcdefg");
    char* copy = mb->mft->cmpiStrDup(mb, "text");
    EXPECT_STREQ(copy, "text");
    mb->mft->cmpiFree(mb, copy);
    mb->mft->cmpiFree(mb, copy);  // already gone: ignored
    EXPECT_EQ(mb->mft->cmpiRealloc(mb, copy, 8), nullptr);
    EXPECT_EQ(ObjectRegistry::instance().liveCount(mb), before + 1);
  }
  // The request ended: its blocks went with it.
  EXPECT_EQ(ObjectRegistry::instance().liveCount(mb), before);
}

}  // namespace
}  // namespace nrv::host

// Bad input reaching the module through CMPI: null paths, keys of the wrong
// type, classes the provider does not serve and extra keys are answered with
// a status, never a crash.  Null arguments go straight to the MI tables,
// with the host broker's own context and result objects.
#include "host/EncObjects.h"
#include "host/ObjectRegistry.h"
#include "tests/e2e/E2E_Fixture.h"
#include "tests/host/HostTestSupport.h"

namespace e2e {
namespace {

class Robustness : public E2E_Test {
 protected:
  const void* owner() { return host_->broker(); }
  CMPIContext* context() { return makeContext(owner(), Broker::requestContext(kNs)); }
  CMPIResult* result() { return makeResult(owner(), std::make_shared<ResultSink>()); }
  CMPIObjectPath* path(const PathData& data) { return makeObjectPath(owner(), data); }
};

TEST_F(Robustness, NullPathsAndInstancesAnswerAStatus) {
  ClassMis card = host_->mis("NRVTAVO_Card");
  ClassMis link = host_->mis("NRVTAVO_CardContainsChip");
  ClassMis service = host_->mis("NRVTAVO_ChannelMgmtService");
  ASSERT_TRUE(card.instance && link.association && service.method);
  ArenaScope scope;
  CMPIInstanceMI* mi = card.instance;
  EXPECT_EQ(mi->ft->enumerateInstances(mi, context(), result(), nullptr, nullptr).rc, CMPI_RC_ERR_FAILED);
  EXPECT_EQ(mi->ft->getInstance(mi, context(), result(), nullptr, nullptr).rc, CMPI_RC_ERR_FAILED);
  EXPECT_EQ(mi->ft->deleteInstance(mi, context(), result(), nullptr).rc, CMPI_RC_ERR_FAILED);
  EXPECT_EQ(mi->ft->createInstance(mi, context(), result(), nullptr, nullptr).rc, CMPI_RC_ERR_FAILED);
  EXPECT_EQ(mi->ft->createInstance(mi, context(), result(), path(class_path("NRVTAVO_Card")), nullptr).rc,
            CMPI_RC_ERR_INVALID_PARAMETER);
  EXPECT_EQ(mi->ft->modifyInstance(mi, context(), result(), path(card_path("A")), nullptr, nullptr).rc,
            CMPI_RC_ERR_INVALID_PARAMETER);
  EXPECT_EQ(mi->ft->getInstance(mi, context(), nullptr, path(card_path("A")), nullptr).rc,
            CMPI_RC_ERR_INVALID_PARAMETER);
  CMPIStatus no_path = service.method->ft->invokeMethod(service.method, context(), result(), nullptr,
                                                        "RequestStateChange", nullptr, nullptr);
  EXPECT_EQ(no_path.rc, CMPI_RC_ERR_FAILED);
  // An association call without a source has nothing to answer.
  CMPIAssociationMI* ami = link.association;
  auto sink = std::make_shared<ResultSink>();
  CMPIResult* names = makeResult(owner(), sink);
  EXPECT_EQ(ami->ft->associatorNames(ami, context(), names, nullptr, nullptr, nullptr, nullptr, nullptr).rc,
            CMPI_RC_OK);
  EXPECT_EQ(ami->ft->references(ami, context(), names, nullptr, nullptr, nullptr, nullptr).rc, CMPI_RC_OK);
  EXPECT_TRUE(sink->items.empty());
  // The module still serves afterwards.
  EXPECT_EQ(host_->enumerateInstanceNames(kNs, "NRVTAVO_Card").paths.size(), 2u);
}

TEST_F(Robustness, AClassTheProviderDoesNotServeFails) {
  ClassMis card = host_->mis("NRVTAVO_Card");
  ASSERT_NE(card.instance, nullptr);
  ArenaScope scope;
  CMPIInstanceMI* mi = card.instance;
  EXPECT_EQ(mi->ft->enumerateInstanceNames(mi, context(), result(), path(class_path("No_Such_Class"))).rc,
            CMPI_RC_ERR_FAILED);
  EXPECT_EQ(mi->ft->getInstance(mi, context(), result(), path(chip_path("X")), nullptr).rc, CMPI_RC_ERR_FAILED);
  // Through the host, a class without factories never reaches the module.
  EXPECT_FALSE(host_->enumerateInstances(kNs, "No_Such_Class").ok());
}

TEST_F(Robustness, AKeyOfTheWrongTypeFindsNothing) {
  PathData wrong = card_path("A");
  setNamed(wrong.keys, "Tag", Datum::unsignedInt(CMPI_uint32, 7));
  EXPECT_EQ(host_->getInstance(wrong).rc, CMPI_RC_ERR_NOT_FOUND);
  EXPECT_EQ(host_->deleteInstance(wrong).rc, CMPI_RC_ERR_NOT_FOUND);
  EXPECT_TRUE(host_->getInstance(card_path("A")).ok());
}

TEST_F(Robustness, AnExtraKeyIsIgnoredAndReported) {
  PathData extra = card_path("A");
  extra.keys.emplace_back("Bogus", Datum::string("x"));
  Result result = host_->getInstance(extra);
  ASSERT_TRUE(result.ok()) << result.errorText();
  EXPECT_EQ(result.instances.at(0).path, card_path("A"));
  EXPECT_NE(traces().find("unknown feature: NRVTAVO_Card.Bogus"), std::string::npos);
}

TEST_F(Robustness, ANullKeyAndANullArgumentArrayAreSurvived) {
  PathData odd = card_path("A");
  setNamed(odd.keys, "Tag", Datum::null(CMPI_string));
  EXPECT_EQ(host_->getInstance(odd).rc, CMPI_RC_ERR_NOT_FOUND);
  Result result = host_->invokeMethod(service_path("svc"), "SetCMBandwidths",
                                      {{"MinBWValues", Datum::null(CMPI_uint16 | CMPI_ARRAY)}});
  ASSERT_TRUE(result.ok()) << result.errorText();
  EXPECT_EQ(module_store().min_bandwidths, "null");
}

// A provider that throws has failed, whatever the operation: the client is
// told so, with the provider named, and never told it succeeded.
TEST_F(Robustness, AThrowingProviderFailsEveryOperation) {
  module_store().throw_in_operations = true;
  HostInstance card;
  card.path = card_path("N");
  card.properties = {{"Tag", Datum::string("N")}, {"CreationClassName", Datum::string("NRVTAVO_Card")}};
  HostInstance changed = card;
  changed.path = card_path("A");
  setNamed(changed.properties, "Tag", Datum::string("A"));
  setNamed(changed.properties, "Model", Datum::string("changed"));
  const std::pair<const char*, Result> answers[] = {
      {"create", host_->createInstance(card)},
      {"modify", host_->modifyInstance(changed)},
      {"delete", host_->deleteInstance(card_path("A"))},
      {"enumerate", host_->enumerateInstances(kNs, "NRVTAVO_Card")},
      {"enumerate names", host_->enumerateInstanceNames(kNs, "NRVTAVO_Card")},
      {"get", host_->getInstance(card_path("A"))},
      {"invoke", host_->invokeMethod(service_path("svc"), "RequestStateChange")},
      {"reference names", host_->referenceNames(chip_path("X"))},
      {"associator names", host_->associatorNames(card_path("A"))},
      {"associators", host_->associators(card_path("A"))},
  };
  for (const auto& [operation, answer] : answers) {
    EXPECT_EQ(answer.rc, CMPI_RC_ERR_FAILED) << operation;
    EXPECT_NE(answer.message.find("_Provider: "), std::string::npos) << operation << ": " << answer.message;
  }
  module_store().throw_in_operations = false;
  EXPECT_EQ(host_->enumerateInstanceNames(kNs, "NRVTAVO_Card").paths.size(), 2u);
  EXPECT_EQ(module_store().cards.size(), 2u);
}

TEST_F(Robustness, TheClientReportsAThrowingProviderAndExitsWithOne) {
  const std::string card = "root/norvane:NRVTAVO_Card.CreationClassName=\"NRVTAVO_Card\",Tag=\"A\"";
  const std::string service =
      "root/norvane:NRVTAVO_ChannelMgmtService.SystemCreationClassName=\"CIM_ComputerSystem\","
      "SystemName=\"host\",CreationClassName=\"NRVTAVO_ChannelMgmtService\",Name=\"svc\"";
  const std::vector<std::vector<std::string>> commands = {
      {"ci", "root/norvane:NRVTAVO_Card.CreationClassName=\"NRVTAVO_Card\",Tag=\"N\""},
      {"mi", card, "Model=changed"},
      {"di", card},
      {"ei", "root/norvane:NRVTAVO_Card"},
      {"cm", service, "RequestStateChange", "RequestedState=2"},
  };
  for (std::vector<std::string> command : commands) {
    command.insert(command.begin(), {"-m", test_module()});
    auto run = nrv::host::test::runClient(command, {"NRV_TEST_MODULE_FAULTS=1"});
    EXPECT_EQ(run.status, 1) << command[2] << ": " << run.out << run.err;
    EXPECT_NE(run.err.find("CMPI_RC_ERR_FAILED"), std::string::npos) << command[2] << ": " << run.err;
  }
}

}  // namespace
}  // namespace e2e

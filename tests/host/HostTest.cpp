// The host against a provider module written in C: MIs made once, every CIM operation
// carried into the MIs and back, up-calls from a provider (also from a thread it
// attached), the platform classes, failures, and MI cleanup at shutdown.
#include <dlfcn.h>
#include <gtest/gtest.h>

#include <algorithm>

#include "HostTestSupport.h"
#include "host/Host.h"
#include "host/ObjectRegistry.h"

namespace nrv::host {
namespace {

PathData path(const std::string& text) { return std::get<PathData>(parsePath(text, "root/test")); }

const Datum& prop(const InstanceData& inst, const std::string& name) {
  static const Datum missing;
  const Datum* d = findNamed(inst.properties, name);
  return d == nullptr ? missing : *d;
}

class HostTest : public ::testing::Test {
 protected:
  Host host{test::testProvider(), Host::Options{test::platformFile()}};
};

TEST_F(HostTest, MisAreCreatedOncePerProviderAndKind) {
  ClassMis w = host.mis("TST_Widget");
  EXPECT_NE(w.instance, nullptr);
  EXPECT_NE(w.method, nullptr);
  EXPECT_EQ(w.association, nullptr);
  EXPECT_STREQ(w.instance->ft->miName, "instanceTST_Widget_Provider");
  EXPECT_EQ(host.mis("tst_widget").instance, w.instance);
  ClassMis link = host.mis("TST_WidgetGadget");
  EXPECT_NE(link.association, nullptr);
  EXPECT_EQ(host.loadedMis().size(), 4u);
}

TEST_F(HostTest, EnumerateInstancesCarriesEveryType) {
  Result r = host.enumerateInstances("root/test", "TST_Widget");
  ASSERT_TRUE(r.ok()) << r.errorText();
  ASSERT_GE(r.instances.size(), 3u);
  const InstanceData& w1 = r.instances[0];
  EXPECT_EQ(w1.path.nameSpace, "root/test");
  EXPECT_EQ(prop(w1, "InstanceID").text, "W1");
  EXPECT_EQ(prop(w1, "Count").type, CMPI_uint16);
  EXPECT_EQ(prop(w1, "Count").scalar.uint16, 1);
  EXPECT_EQ(prop(w1, "Enabled").type, CMPI_boolean);
  EXPECT_EQ(prop(w1, "Tags").type, CMPI_stringA);
  EXPECT_EQ(prop(w1, "Tags").array()->elements[1].text, "W1");
  EXPECT_EQ(prop(w1, "Created").dateTime().text(), "20240102030405.000000+000");
  EXPECT_EQ(prop(w1, "Label").text, "widget W1");
  EXPECT_TRUE(prop(w1, "Nothing").isNull);
  EXPECT_EQ(ObjectRegistry::instance().liveCount(host.broker()), 0u);
}

TEST_F(HostTest, PropertyListNarrowsInstances) {
  Result r = host.enumerateInstances("root/test", "TST_Widget", std::vector<std::string>{"Name"});
  ASSERT_TRUE(r.ok());
  for (const auto& inst : r.instances) {
    EXPECT_EQ(inst.properties.size(), 2u);
    EXPECT_FALSE(prop(inst, "Name").isNull);
    EXPECT_FALSE(prop(inst, "InstanceID").isNull);
  }
}

TEST_F(HostTest, EnumerateNamesAndGet) {
  Result names = host.enumerateInstanceNames("root/test", "tst_widget");
  ASSERT_TRUE(names.ok());
  ASSERT_GE(names.paths.size(), 3u);
  EXPECT_EQ(formatPath(names.paths[0]), "root/test:TST_Widget.InstanceID=\"W1\"");
  Result got = host.getInstance(names.paths[1]);
  ASSERT_TRUE(got.ok());
  ASSERT_EQ(got.instances.size(), 1u);
  EXPECT_EQ(prop(got.instances[0], "Name").text, "second");
  Result missing = host.getInstance(path("TST_Widget.InstanceID=\"W99\""));
  EXPECT_EQ(missing.rc, CMPI_RC_ERR_NOT_FOUND);
  EXPECT_EQ(missing.message, "no such widget");
  EXPECT_EQ(missing.errorText(), "CMPI_RC_ERR_NOT_FOUND : no such widget");
}

TEST_F(HostTest, CreateModifyDeleteCycle) {
  InstanceData w;
  w.path = path("TST_Widget");
  w.properties.emplace_back("InstanceID", Datum::string("W7"));
  w.properties.emplace_back("Name", Datum::string("seventh"));
  Result created = host.createInstance(w);
  ASSERT_TRUE(created.ok()) << created.errorText();
  ASSERT_EQ(created.paths.size(), 1u);
  EXPECT_EQ(formatPath(created.paths[0]), "root/test:TST_Widget.InstanceID=\"W7\"");
  EXPECT_EQ(host.createInstance(w).rc, CMPI_RC_ERR_ALREADY_EXISTS);

  InstanceData change;
  change.path = created.paths[0];
  change.properties.emplace_back("Count", Datum::unsignedInt(CMPI_uint16, 9));
  change.properties.emplace_back("Name", Datum::string("ignored"));
  ASSERT_TRUE(host.modifyInstance(change, std::vector<std::string>{"Count"}).ok());
  Result got = host.getInstance(created.paths[0]);
  ASSERT_TRUE(got.ok());
  EXPECT_EQ(prop(got.instances[0], "Count").scalar.uint16, 9);
  EXPECT_EQ(prop(got.instances[0], "Name").text, "seventh");

  EXPECT_TRUE(host.deleteInstance(created.paths[0]).ok());
  EXPECT_EQ(host.getInstance(created.paths[0]).rc, CMPI_RC_ERR_NOT_FOUND);
  EXPECT_EQ(host.deleteInstance(created.paths[0]).rc, CMPI_RC_ERR_NOT_FOUND);
}

TEST_F(HostTest, InvokeMethodReturnsValueAndOutputs) {
  const PathData w2 = path("TST_Widget.InstanceID=\"W2\"");
  NamedData in;
  in.emplace_back("Amount", Datum::unsignedInt(CMPI_uint16, 5));
  Result r = host.invokeMethod(w2, "Add", in);
  ASSERT_TRUE(r.ok()) << r.errorText();
  EXPECT_EQ(r.returnValue.type, CMPI_uint32);
  const CMPIUint32 after = r.returnValue.scalar.uint32;
  ASSERT_NE(findNamed(r.outArgs, "NewCount"), nullptr);
  EXPECT_EQ(findNamed(r.outArgs, "NewCount")->scalar.uint32, after);

  NamedData text;
  text.emplace_back("Amount", Datum::string("2"));
  EXPECT_EQ(host.invokeMethod(w2, "Add", text).returnValue.scalar.uint32, after + 2);

  NamedData echo;
  echo.emplace_back("Text", Datum::string("hi"));
  Result e = host.invokeMethod(w2, "Echo", echo);
  ASSERT_TRUE(e.ok());
  EXPECT_EQ(findNamed(e.outArgs, "Echoed")->text, "hi");

  Result bogus = host.invokeMethod(w2, "Bogus");
  EXPECT_EQ(bogus.rc, CMPI_RC_ERR_METHOD_NOT_FOUND);
  EXPECT_EQ(bogus.message, "Bogus");
}

TEST_F(HostTest, AssociationsFromEitherEnd) {
  const PathData w1 = path("TST_Widget.InstanceID=\"W1\"");
  Result names = host.associatorNames(w1);
  ASSERT_TRUE(names.ok()) << names.errorText();
  ASSERT_EQ(names.paths.size(), 1u);
  EXPECT_EQ(formatPath(names.paths[0]), "root/test:TST_Gadget.Tag=\"G1\"");

  // The provider fetches the far end through the broker, which routes back into the module.
  Result assoc = host.associators(w1);
  ASSERT_TRUE(assoc.ok()) << assoc.errorText();
  ASSERT_EQ(assoc.instances.size(), 1u);
  EXPECT_EQ(prop(assoc.instances[0], "Weight").scalar.sint32, -7);

  Result refs = host.references(w1);
  ASSERT_EQ(refs.instances.size(), 1u);
  EXPECT_EQ(prop(refs.instances[0], "Gadget").type, CMPI_ref);
  EXPECT_EQ(prop(refs.instances[0], "Gadget").path()->keys[0].second.text, "G1");
  Result refNames = host.referenceNames(w1);
  ASSERT_EQ(refNames.paths.size(), 1u);
  EXPECT_EQ(refNames.paths[0].className, "TST_WidgetGadget");

  Result back = host.associatorNames(path("TST_Gadget.Tag=\"G1\""));
  EXPECT_EQ(back.paths.size(), 2u);
}

TEST_F(HostTest, AssociationFilters) {
  const PathData w1 = path("TST_Widget.InstanceID=\"W1\"");
  AssocFilter f;
  f.assocClass = "TST_WidgetGadget";
  EXPECT_EQ(host.associatorNames(w1, f).paths.size(), 1u);
  f.resultClass = "TST_Widget";
  EXPECT_TRUE(host.associatorNames(w1, f).paths.empty());
  AssocFilter role;
  role.role = "Gadget";
  EXPECT_TRUE(host.associatorNames(w1, role).paths.empty());
  EXPECT_TRUE(host.referenceNames(w1, role).paths.empty());
  // On references the result class names the association class.
  AssocFilter links;
  links.resultClass = "TST_WidgetGadget";
  EXPECT_EQ(host.referenceNames(w1, links).paths.size(), 1u);
  EXPECT_EQ(host.references(w1, links).instances.size(), 1u);
  links.resultClass = "TST_Gadget";
  EXPECT_TRUE(host.referenceNames(w1, links).paths.empty());
  EXPECT_TRUE(host.references(w1, links).instances.empty());
  AssocFilter unknown;
  unknown.assocClass = "TST_NoSuchAssoc";
  EXPECT_EQ(host.associatorNames(w1, unknown).rc, CMPI_RC_ERR_INVALID_CLASS);
}

TEST_F(HostTest, PlatformClassesComeFromTheFile) {
  Result cs = host.enumerateInstances("root/kvlhost", "KVLD_ComputerSystem");
  ASSERT_TRUE(cs.ok());
  ASSERT_EQ(cs.instances.size(), 1u);
  EXPECT_EQ(prop(cs.instances[0], "EnabledState").type, CMPI_uint16);
  EXPECT_EQ(prop(cs.instances[0], "Dedicated").type, CMPI_uint16A);
  EXPECT_EQ(prop(cs.instances[0], "Roles").type, CMPI_stringA);
  EXPECT_EQ(formatPath(cs.instances[0].path),
            "root/kvlhost:KVLD_ComputerSystem.CreationClassName=\"KVLD_ComputerSystem\","
            "Name=\"host1.example\"");
  Result ch = host.getInstance(
      std::get<PathData>(parsePath("root/kvlhost:KVLD_Chassis.CreationClassName=\"KVLD_Chassis\","
                                   "Tag=\"CH-1\"")));
  ASSERT_TRUE(ch.ok());
  EXPECT_EQ(prop(ch.instances[0], "PackageType").scalar.uint16, 3);
  EXPECT_EQ(host.getInstance(std::get<PathData>(parsePath("root/kvlhost:KVLD_Chassis.Tag=\"no\"")))
                .rc,
            CMPI_RC_ERR_NOT_FOUND);
  InstanceData change = ch.instances[0];
  EXPECT_EQ(host.modifyInstance(change).rc, CMPI_RC_ERR_NOT_SUPPORTED);
}

TEST_F(HostTest, ProviderUpcallsReachThePlatform) {
  const PathData w1 = path("TST_Widget.InstanceID=\"W1\"");
  Result direct = host.invokeMethod(w1, "CountPlatform");
  ASSERT_TRUE(direct.ok()) << direct.errorText();
  EXPECT_EQ(direct.returnValue.scalar.uint32, 1u);
  // Same up-call from a thread the provider attached with prepareAttachThread/attachThread.
  Result threaded = host.invokeMethod(w1, "SpawnThread");
  ASSERT_TRUE(threaded.ok()) << threaded.errorText();
  EXPECT_EQ(threaded.returnValue.scalar.uint32, 1u);
  EXPECT_EQ(ObjectRegistry::instance().liveCount(host.broker()), 0u);
}

TEST_F(HostTest, FailuresBecomeStatusCodes) {
  Result broken = host.enumerateInstances("root/test", "TST_Broken");
  EXPECT_EQ(broken.rc, CMPI_RC_ERR_FAILED);
  EXPECT_NE(broken.message.find("broken on purpose"), std::string::npos);
  EXPECT_EQ(host.enumerateInstances("root/test", "TST_Unknown").rc, CMPI_RC_ERR_INVALID_CLASS);
  EXPECT_EQ(host.invokeMethod(path("TST_Gadget.Tag=\"G1\""), "Go").rc, CMPI_RC_ERR_NOT_SUPPORTED);
  EXPECT_EQ(host.getInstance(path("TST_WidgetGadget")).rc, CMPI_RC_ERR_NOT_SUPPORTED);
  EXPECT_EQ(host.enumerateInstances("root/test", "").rc, CMPI_RC_ERR_INVALID_PARAMETER);
}

TEST(HostShutdownTest, CleansUpEveryMiTerminating) {
  // Our own handle keeps the module (and its counters) loaded across the host's unload.
  void* self = dlopen(test::testProvider().c_str(), RTLD_NOW | RTLD_LOCAL);
  ASSERT_NE(self, nullptr);
  auto terminating = reinterpret_cast<int (*)()>(dlsym(self, "tst_terminating_calls"));
  auto all = reinterpret_cast<int (*)()>(dlsym(self, "tst_cleanup_calls"));
  ASSERT_NE(terminating, nullptr);
  const int before = terminating();
  const int allBefore = all();
  {
    Host host(test::testProvider(), Host::Options{std::nullopt});
    host.mis("TST_Widget");
    host.enumerateInstances("root/test", "TST_Gadget");
    EXPECT_EQ(all(), allBefore);
    host.shutdown();
    ASSERT_EQ(host.cleanupRecords().size(), 3u);
    for (const auto& rec : host.cleanupRecords()) EXPECT_EQ(rec.rc, CMPI_RC_OK) << rec.factory;
    // Newest first.
    EXPECT_EQ(host.cleanupRecords().front().factory, "TST_Gadget_Create_InstanceMI");
    EXPECT_EQ(terminating(), before + 3);
    Result after = host.enumerateInstances("root/test", "TST_Widget");
    EXPECT_EQ(after.rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(after.message, "host is shut down");
    host.shutdown();  // idempotent
    EXPECT_EQ(terminating(), before + 3);
  }
  dlclose(self);
}

TEST(HostModuleTest, MissingModuleIsReportedNotFatal) {
  Host host("/nonexistent/libnothing.so", Host::Options{test::platformFile()});
  EXPECT_FALSE(host.moduleLoaded());
  EXPECT_NE(host.loadError(), "");
  Result r = host.enumerateInstances("root/norvane", "NRVTAVO_Chip");
  EXPECT_EQ(r.rc, CMPI_RC_ERR_FAILED);
  EXPECT_TRUE(host.enumerateInstances("root/kvlhost", "KVLD_Chassis").ok());
  EXPECT_TRUE(host.factorySymbols().empty());
}

}  // namespace
}  // namespace nrv::host

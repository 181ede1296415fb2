// Embedded instances and objects through the host: they cross CMPI as
// instances in both directions, in method parameters (arrays included) and
// in properties; an embedded object may hold a path.
#include "tests/e2e/E2E_Fixture.h"

namespace e2e {
namespace {

using Embedded = E2E_Test;

HostInstance setting(const std::string& class_name, const std::string& id, const std::string& element_name) {
  HostInstance s;
  s.path = class_path(class_name);
  s.path.keys = {{"InstanceID", Datum::string(id)}};
  s.properties = {{"InstanceID", Datum::string(id)}, {"ElementName", Datum::string(element_name)}};
  return s;
}

PathData job_path(const std::string& id) {
  PathData path = class_path("NRVTAVO_ConcreteJob");
  path.keys = {{"InstanceID", Datum::string(id)}};
  return path;
}

TEST_F(Embedded, EmbeddedInstancesRoundTripThroughAMethod) {
  const HostInstance templates[] = {setting("NRVTAVO_DiagnosticSettingData", "NRV:Diag:1", "loopback"),
                                    setting("NRVTAVO_ProviderConfigSetting", "NRV:Conf:1", "cache")};
  PathData capabilities = class_path("NRVTAVO_EnabledLogicalElementCapabilities");
  capabilities.keys = {{"InstanceID", Datum::string("NRV:Cap:1")}};
  Result result = host_->invokeMethod(
      capabilities, "CreateGoalSettings",
      {{"TemplateGoalSettings",
        Datum::arrayOf(CMPI_instance, {Datum::embedded(templates[0]), Datum::embedded(templates[1])})}});
  ASSERT_TRUE(result.ok()) << result.errorText();
  EXPECT_EQ(result.returnValue.asInteger(), 0);
  const Datum* goals = findNamed(result.outArgs, "SupportedGoalSettings");
  ASSERT_NE(goals, nullptr);
  ASSERT_EQ(goals->type, CMPI_instanceA);
  ASSERT_EQ(goals->array()->elements.size(), 2u);
  for (size_t i = 0; i < 2; ++i) {
    const Datum& goal = goals->array()->elements[i];
    ASSERT_EQ(goal.type, CMPI_instance);
    EXPECT_EQ(goal.instance()->path.className, templates[i].path.className);
    EXPECT_EQ(property(*goal.instance(), "InstanceID")->text, findNamed(templates[i].properties, "InstanceID")->text);
    EXPECT_EQ(property(*goal.instance(), "ElementName")->text,
              "goal: " + findNamed(templates[i].properties, "ElementName")->text);
  }
}

// An embedded object holds an instance of any class, or a path (kept as the
// instance it names); both are stored and come back as instances.
TEST_F(Embedded, EmbeddedObjectPropertiesHoldAnInstanceOrAPath) {
  HostInstance in_parameters;
  in_parameters.path = card_path("P");
  in_parameters.properties = {{"Tag", Datum::string("P")}, {"Model", Datum::string("LPe")}};
  HostInstance job;
  job.path = job_path("NRV:Job:8");
  job.properties = job.path.keys;
  job.properties.emplace_back("JobInParameters", Datum::embedded(in_parameters));
  job.properties.emplace_back("JobOutParameters", Datum::reference(card_path("Q")));
  ASSERT_TRUE(host_->createInstance(job).ok());

  Result got = host_->getInstance(job_path("NRV:Job:8"));
  ASSERT_TRUE(got.ok()) << got.errorText();
  const Datum* in = property(got.instances.at(0), "JobInParameters");
  ASSERT_NE(in, nullptr);
  ASSERT_EQ(in->type, CMPI_instance);
  EXPECT_EQ(in->instance()->path.className, "NRVTAVO_Card");
  EXPECT_EQ(property(*in->instance(), "Model")->text, "LPe");
  const Datum* out = property(got.instances.at(0), "JobOutParameters");
  ASSERT_NE(out, nullptr);
  ASSERT_EQ(out->type, CMPI_instance);
  EXPECT_EQ(property(*out->instance(), "Tag")->text, "Q");
}

}  // namespace
}  // namespace e2e

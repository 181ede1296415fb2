// Instance operations of the test module through the host: enumeration,
// get (direct and through the enumeration fallback), property lists,
// create, modify, delete and execQuery.
#include "tests/e2e/E2E_Fixture.h"

namespace e2e {
namespace {

using Instances = E2E_Test;

TEST_F(Instances, EnumerationAnswersEveryInstanceWithItsPathAndValues) {
  Result all = host_->enumerateInstances(kNs, "NRVTAVO_Card");
  ASSERT_TRUE(all.ok()) << all.errorText();
  ASSERT_EQ(all.instances.size(), 2u);
  const HostInstance& a = all.instances[0];
  EXPECT_EQ(a.path.nameSpace, kNs);
  EXPECT_EQ(a.path.className, "NRVTAVO_Card");
  ASSERT_NE(findNamed(a.path.keys, "Tag"), nullptr);
  EXPECT_EQ(findNamed(a.path.keys, "Tag")->text, "A");
  ASSERT_NE(property(a, "Model"), nullptr);
  EXPECT_EQ(property(a, "Model")->text, "LPe");
  ASSERT_NE(property(a, "PoweredOn"), nullptr);
  EXPECT_EQ(property(a, "PoweredOn")->type, CMPI_boolean);
  EXPECT_TRUE(property(a, "PoweredOn")->scalar.boolean);

  Result names = host_->enumerateInstanceNames(kNs, "NRVTAVO_Card");
  ASSERT_TRUE(names.ok()) << names.errorText();
  ASSERT_EQ(names.paths.size(), 2u);
  EXPECT_EQ(names.paths[1], card_path("B"));
}

TEST_F(Instances, APropertyListKeepsTheKeysAndTheListedPropertiesOnly) {
  Result all = host_->enumerateInstances(kNs, "NRVTAVO_Card", std::vector<std::string>{"Model"});
  ASSERT_TRUE(all.ok()) << all.errorText();
  ASSERT_EQ(all.instances.size(), 2u);
  EXPECT_NE(property(all.instances[1], "Model"), nullptr);
  EXPECT_NE(property(all.instances[1], "Tag"), nullptr);
  EXPECT_EQ(property(all.instances[1], "Manufacturer"), nullptr);

  Result one = host_->getInstance(card_path("A"), std::vector<std::string>{"Name"});
  ASSERT_TRUE(one.ok()) << one.errorText();
  ASSERT_EQ(one.instances.size(), 1u);
  ASSERT_NE(property(one.instances[0], "Name"), nullptr);
  EXPECT_EQ(property(one.instances[0], "Name")->text, "Card A");
  EXPECT_EQ(property(one.instances[0], "Model"), nullptr);
}

TEST_F(Instances, GetFindsByKeysDirectlyOrThroughTheEnumeration) {
  Result card = host_->getInstance(card_path("B"));
  ASSERT_TRUE(card.ok()) << card.errorText();
  EXPECT_EQ(property(card.instances.at(0), "Model")->text, "OCe");

  Result chip = host_->getInstance(chip_path("Y"));  // the chip provider only enumerates
  ASSERT_TRUE(chip.ok()) << chip.errorText();
  EXPECT_EQ(property(chip.instances.at(0), "Name")->text, "Chip Y");

  EXPECT_EQ(host_->getInstance(card_path("Z")).rc, CMPI_RC_ERR_NOT_FOUND);
  EXPECT_EQ(host_->getInstance(chip_path("Z")).rc, CMPI_RC_ERR_NOT_FOUND);
}

TEST_F(Instances, CreateModifyAndDeleteChangeTheProvidersData) {
  HostInstance card;
  card.path = card_path("C");
  card.properties = {{"Tag", Datum::string("C")},
                     {"CreationClassName", Datum::string("NRVTAVO_Card")},
                     {"Model", Datum::string("New")},
                     {"Name", Datum::string("Card C")}};
  Result created = host_->createInstance(card);
  ASSERT_TRUE(created.ok()) << created.errorText();
  ASSERT_EQ(created.paths.size(), 1u);
  EXPECT_EQ(created.paths[0], card_path("C"));
  EXPECT_EQ(host_->createInstance(card).rc, CMPI_RC_ERR_ALREADY_EXISTS);
  EXPECT_EQ(property(host_->getInstance(card_path("C")).instances.at(0), "Model")->text, "New");

  card.properties = {{"Model", Datum::string("Changed")}, {"Name", Datum::string("Renamed")}};
  Result modified = host_->modifyInstance(card, std::vector<std::string>{"Name"});
  ASSERT_TRUE(modified.ok()) << modified.errorText();
  HostInstance now = host_->getInstance(card_path("C")).instances.at(0);
  EXPECT_EQ(property(now, "Name")->text, "Renamed");
  EXPECT_EQ(property(now, "Model")->text, "New");  // not in the property list

  card.path = card_path("Q");
  EXPECT_EQ(host_->modifyInstance(card).rc, CMPI_RC_ERR_NOT_FOUND);

  EXPECT_TRUE(host_->deleteInstance(card_path("C")).ok());
  EXPECT_EQ(host_->deleteInstance(card_path("C")).rc, CMPI_RC_ERR_NOT_FOUND);
  EXPECT_EQ(host_->getInstance(card_path("C")).rc, CMPI_RC_ERR_NOT_FOUND);
  EXPECT_EQ(host_->enumerateInstanceNames(kNs, "NRVTAVO_Card").paths.size(), 2u);
}

TEST_F(Instances, OperationsTheProviderLacksAnswerNotSupported) {
  HostInstance chip;
  chip.path = chip_path("Z");
  chip.properties = {{"Tag", Datum::string("Z")}, {"CreationClassName", Datum::string("NRVTAVO_Chip")}};
  EXPECT_EQ(host_->createInstance(chip).rc, CMPI_RC_ERR_NOT_SUPPORTED);
  EXPECT_EQ(host_->deleteInstance(chip_path("X")).rc, CMPI_RC_ERR_NOT_SUPPORTED);
}

TEST_F(Instances, ExecQueryIsNotSupported) {
  Request query;
  query.op = Operation::ExecQuery;
  query.path = class_path("NRVTAVO_Card");
  query.query = "SELECT * FROM NRVTAVO_Card";
  query.queryLanguage = "WQL";
  Result result = host_->execute(query);
  EXPECT_EQ(result.rc, CMPI_RC_ERR_NOT_SUPPORTED) << result.errorText();
  EXPECT_TRUE(result.instances.empty());
}

}  // namespace
}  // namespace e2e

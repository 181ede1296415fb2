// Associations of an enumeration-only association provider through the
// host: the adapter walks the links for names and references, and fetches
// whole far ends back through the host broker's getInstance.
#include <set>

#include "tests/e2e/E2E_Fixture.h"

namespace e2e {
namespace {

using Associations = E2E_Test;

std::set<std::string> tags(const std::vector<PathData>& paths) {
  std::set<std::string> out;
  for (const PathData& p : paths) out.insert(findNamed(p.keys, "Tag") ? findNamed(p.keys, "Tag")->text : "?");
  return out;
}

std::set<std::string> tags(const std::vector<HostInstance>& instances) {
  std::vector<PathData> paths;
  for (const HostInstance& i : instances) paths.push_back(i.path);
  return tags(paths);
}

TEST_F(Associations, AssociatorsFetchWholeFarEndsThroughTheBroker) {
  Result chips = host_->associators(card_path("A"));
  ASSERT_TRUE(chips.ok()) << chips.errorText();
  EXPECT_EQ(tags(chips.instances), (std::set<std::string>{"X", "Y"}));
  for (const HostInstance& chip : chips.instances) {
    EXPECT_EQ(chip.path.className, "NRVTAVO_Chip");
    ASSERT_NE(property(chip, "Name"), nullptr);  // a non-key value: only the chip provider has it
    EXPECT_EQ(property(chip, "Name")->text, "Chip " + findNamed(chip.path.keys, "Tag")->text);
  }

  Result cards = host_->associators(chip_path("X"), {}, std::vector<std::string>{"Model"});
  ASSERT_TRUE(cards.ok()) << cards.errorText();
  ASSERT_EQ(cards.instances.size(), 1u);
  EXPECT_EQ(property(cards.instances[0], "Model")->text, "LPe");
  EXPECT_EQ(property(cards.instances[0], "Manufacturer"), nullptr);
}

TEST_F(Associations, NamesAndReferencesFollowTheLinks) {
  Result names = host_->associatorNames(card_path("A"));
  ASSERT_TRUE(names.ok()) << names.errorText();
  EXPECT_EQ(tags(names.paths), (std::set<std::string>{"X", "Y"}));

  Result links = host_->references(card_path("A"));
  ASSERT_TRUE(links.ok()) << links.errorText();
  ASSERT_EQ(links.instances.size(), 2u);
  for (const HostInstance& link : links.instances) {
    EXPECT_EQ(link.path.className, "NRVTAVO_CardContainsChip");
    const Datum* group = property(link, "GroupComponent");
    ASSERT_NE(group, nullptr);
    ASSERT_EQ(group->type, CMPI_ref);
    EXPECT_EQ(findNamed(group->path()->keys, "Tag")->text, "A");
  }

  Result link_names = host_->referenceNames(chip_path("Y"));
  ASSERT_TRUE(link_names.ok()) << link_names.errorText();
  ASSERT_EQ(link_names.paths.size(), 1u);
  EXPECT_EQ(link_names.paths[0].className, "NRVTAVO_CardContainsChip");
}

TEST_F(Associations, FiltersAndUnlinkedSourcesAnswerEmptySuccess) {
  AssocFilter cards_only;
  cards_only.resultClass = "NRVTAVO_Card";
  Result none = host_->associatorNames(card_path("A"), cards_only);
  ASSERT_TRUE(none.ok()) << none.errorText();
  EXPECT_TRUE(none.paths.empty());

  AssocFilter wrong_role;
  wrong_role.role = "PartComponent";
  EXPECT_TRUE(host_->referenceNames(card_path("A"), wrong_role).paths.empty());

  Result lonely = host_->associators(card_path("B"));
  ASSERT_TRUE(lonely.ok()) << lonely.errorText();
  EXPECT_TRUE(lonely.instances.empty());
}

TEST_F(Associations, AFarEndThatIsGoneStopsTheWalkQuietly) {
  ASSERT_TRUE(host_->deleteInstance(card_path("A")).ok());
  Result cards = host_->associators(chip_path("X"));
  ASSERT_TRUE(cards.ok()) << cards.errorText();
  EXPECT_TRUE(cards.instances.empty());
  EXPECT_EQ(host_->associatorNames(chip_path("X")).paths.size(), 1u);  // names need no fetch
}

}  // namespace
}  // namespace e2e

// Association operations through the association MI table, all served by
// the generic fallbacks of a provider that only enumerates its links.
#include "tests/adapter/Adapter_Fixture.h"

#include "framework/Converter.h"

namespace test {
namespace {

class Associations : public Adapter_Test {
 protected:
  void SetUp() override {
    Adapter_Test::SetUp();
    store().cards.insert(make_card("A1"));
    store().chips.insert(make_chip("C1"));
    store().chips.insert(make_chip("C2"));
    store().chips.insert(make_chip("C9"));
    store().links.insert(make_link("A1", "C1"));
    store().links.insert(make_link("A1", "C2"));
    store().links.insert(make_link("B7", "C9"));
    mi_ = association_mi(link_slot());
    // The CIMOM answers getInstance for chips from the chip catalogue.
    broker_.get_instance = [this](const CMPIObjectPath* p, CMPIStatus* rc) -> CMPIInstance* {
      NRVTAVO_Chip* keys = make_chip(fake::text_of(fake::key_of(p, "Tag")).c_str());
      Instance* chip = store().chips.lookup(keys);
      unref(keys);
      if (chip == nullptr) {
        *rc = CMPIStatus{CMPI_RC_ERR_NOT_FOUND, nullptr};
        return nullptr;
      }
      CMPI_Ptr<CMPIInstance> made;
      make_cmpi_instance(broker_.get(), chip, kNs, nullptr, nullptr, made);
      return made.release();
    };
  }
  CMPIAssociationMI* mi_ = nullptr;
};

std::vector<std::string> tags(const std::vector<CMPIObjectPath*>& paths) {
  std::vector<std::string> out;
  for (const CMPIObjectPath* p : paths) out.push_back(fake::text_of(fake::key_of(p, "Tag")));
  return out;
}

TEST_F(Associations, ReferenceNamesAnswerTheLinksOfTheSource) {
  fake::Result result;
  ASSERT_EQ(mi_->ft->referenceNames(mi_, context_, result.get(), card_path("A1"), nullptr, nullptr).rc, CMPI_RC_OK);
  const fake::Returned& r = result.returned();
  ASSERT_EQ(r.paths.size(), 2u);
  EXPECT_EQ(r.done, 0);
  EXPECT_EQ(fake::class_of(r.paths[0]), "NRVTAVO_CardContainsChip");
  CMPIData part = fake::key_of(r.paths[1], "PartComponent");
  ASSERT_EQ(part.type, CMPI_ref);
  EXPECT_EQ(fake::text_of(fake::key_of(part.value.ref, "Tag")), "C2");
}

TEST_F(Associations, ARoleThatDoesNotMatchAnswersNothing) {
  fake::Result result;
  ASSERT_EQ(mi_->ft->referenceNames(mi_, context_, result.get(), card_path("A1"), nullptr, "PartComponent").rc,
            CMPI_RC_OK);
  EXPECT_TRUE(result.returned().paths.empty());
}

TEST_F(Associations, ReferencesApplyThePropertyList) {
  fake::Result all;
  ASSERT_EQ(mi_->ft->references(mi_, context_, all.get(), chip_path("C9"), nullptr, nullptr, nullptr).rc, CMPI_RC_OK);
  ASSERT_EQ(all.returned().instances.size(), 1u);
  EXPECT_EQ(fake::text_of(fake::property_of(all.returned().instances[0], "LocationWithinContainer")), "slot");

  fake::Result listed;
  const char* list[] = {"GroupComponent", nullptr};
  ASSERT_EQ(mi_->ft->references(mi_, context_, listed.get(), chip_path("C9"), nullptr, nullptr, list).rc,
            CMPI_RC_OK);
  ASSERT_EQ(listed.returned().instances.size(), 1u);
  const CMPIInstance* link = listed.returned().instances[0];
  EXPECT_EQ(fake::property_of(link, "LocationWithinContainer").state, CMPI_notFound);
  EXPECT_EQ(fake::property_of(link, "GroupComponent").type, CMPI_ref);
}

TEST_F(Associations, AssociatorNamesAnswerTheFarEnds) {
  fake::Result result;
  ASSERT_EQ(mi_->ft->associatorNames(mi_, context_, result.get(), card_path("A1"), nullptr, nullptr, nullptr,
                                     nullptr)
                .rc,
            CMPI_RC_OK);
  EXPECT_EQ(tags(result.returned().paths), (std::vector<std::string>{"C1", "C2"}));
  EXPECT_EQ(fake::class_of(result.returned().paths[0]), "NRVTAVO_Chip");
  EXPECT_EQ(result.returned().done, 0);

  fake::Result filtered;
  ASSERT_EQ(mi_->ft->associatorNames(mi_, context_, filtered.get(), card_path("A1"), nullptr, "CIM_Card", nullptr,
                                     nullptr)
                .rc,
            CMPI_RC_OK);
  EXPECT_TRUE(filtered.returned().paths.empty());
}

TEST_F(Associations, AssociatorsFallBackOnTheCimomForWholeFarEnds) {
  fake::Result result;
  const char* list[] = {"Name", nullptr};
  ASSERT_EQ(mi_->ft->associators(mi_, context_, result.get(), card_path("A1"), nullptr, nullptr, nullptr, nullptr,
                                 list)
                .rc,
            CMPI_RC_OK);
  ASSERT_EQ(broker_.property_lists.size(), 2u);
  EXPECT_EQ(broker_.property_lists[0], list);
  const fake::Returned& r = result.returned();
  ASSERT_EQ(r.instances.size(), 2u);
  EXPECT_EQ(fake::text_of(fake::property_of(r.instances[1], "Name")), "Chip C2");  // not only the keys
  EXPECT_EQ(broker_.get_instance_calls, 2);
}

TEST_F(Associations, AFailedFetchStopsTheWalk) {
  store().chips.clear();
  fake::Result result;
  EXPECT_EQ(mi_->ft->associators(mi_, context_, result.get(), card_path("A1"), nullptr, nullptr, nullptr, nullptr,
                                 nullptr)
                .rc,
            CMPI_RC_OK);
  EXPECT_TRUE(result.returned().instances.empty());
  EXPECT_EQ(broker_.get_instance_calls, 1);
}

TEST_F(Associations, AssociatorsOfAProviderThatAnswersThemselvesNeedNoFetch) {
  store().associators_supported = true;
  fake::Result result;
  const char* list[] = {"Name", nullptr};
  ASSERT_EQ(mi_->ft->associators(mi_, context_, result.get(), card_path("A1"), nullptr, nullptr, nullptr, nullptr,
                                 list)
                .rc,
            CMPI_RC_OK);
  ASSERT_EQ(result.returned().instances.size(), 2u);
  EXPECT_EQ(fake::text_of(fake::property_of(result.returned().instances[0], "Name")), "Chip C1");
  EXPECT_EQ(broker_.get_instance_calls, 0);
}

TEST_F(Associations, AnUnknownSourceClassAnswersAnEmptySuccess) {
  fake::Result result;
  CMPIObjectPath* unknown = path("Unknown_Class");
  EXPECT_EQ(mi_->ft->referenceNames(mi_, context_, result.get(), unknown, nullptr, nullptr).rc, CMPI_RC_OK);
  EXPECT_EQ(mi_->ft->references(mi_, context_, result.get(), unknown, nullptr, nullptr, nullptr).rc, CMPI_RC_OK);
  EXPECT_EQ(mi_->ft->associatorNames(mi_, context_, result.get(), unknown, nullptr, nullptr, nullptr, nullptr).rc,
            CMPI_RC_OK);
  EXPECT_EQ(
      mi_->ft->associators(mi_, context_, result.get(), unknown, nullptr, nullptr, nullptr, nullptr, nullptr).rc,
      CMPI_RC_OK);
  EXPECT_TRUE(result.returned().paths.empty());
  EXPECT_TRUE(result.returned().instances.empty());
}

TEST_F(Associations, AssociationCallsOnAPlainClassFail) {
  CMPIAssociationMI* cards = association_mi(card_slot());
  fake::Result result;
  EXPECT_EQ(code_of(cards->ft->referenceNames(cards, context_, result.get(), chip_path("C1"), nullptr, nullptr)),
            CMPI_RC_ERR_FAILED);
  EXPECT_EQ(code_of(cards->ft->associatorNames(cards, context_, result.get(), chip_path("C1"), nullptr, nullptr,
                                               nullptr, nullptr)),
            CMPI_RC_ERR_FAILED);
}

}  // namespace
}  // namespace test

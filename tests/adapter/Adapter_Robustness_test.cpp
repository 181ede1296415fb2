// Bad input through CMPI never crashes and answers a status code: null
// objects, keys of the wrong type, extra keys, unknown classes.
#include "tests/adapter/Adapter_Fixture.h"

namespace test {
namespace {

class Robustness : public Adapter_Test {
 protected:
  void SetUp() override {
    Adapter_Test::SetUp();
    store().cards.insert(make_card("A1"));
    store().links.insert(make_link("A1", "C1"));
  }
};

TEST_F(Robustness, NullPathsResultsAndInstancesAnswerAStatus) {
  CMPIInstanceMI* mi = instance_mi(card_slot());
  fake::Result result;
  EXPECT_EQ(mi->ft->enumerateInstanceNames(mi, context_, result.get(), nullptr).rc, CMPI_RC_ERR_FAILED);
  EXPECT_EQ(mi->ft->enumerateInstances(mi, context_, result.get(), nullptr, nullptr).rc, CMPI_RC_ERR_FAILED);
  EXPECT_EQ(mi->ft->getInstance(mi, context_, result.get(), nullptr, nullptr).rc, CMPI_RC_ERR_FAILED);
  EXPECT_EQ(mi->ft->deleteInstance(mi, context_, result.get(), nullptr).rc, CMPI_RC_ERR_FAILED);
  EXPECT_EQ(mi->ft->createInstance(mi, context_, result.get(), nullptr, nullptr).rc, CMPI_RC_ERR_FAILED);
  EXPECT_EQ(mi->ft->modifyInstance(mi, context_, result.get(), nullptr, nullptr, nullptr).rc, CMPI_RC_ERR_FAILED);
  EXPECT_EQ(mi->ft->enumerateInstanceNames(mi, context_, nullptr, path("NRVTAVO_Card")).rc,
            CMPI_RC_ERR_INVALID_PARAMETER);
  EXPECT_EQ(mi->ft->getInstance(mi, context_, nullptr, card_path("A1"), nullptr).rc, CMPI_RC_ERR_INVALID_PARAMETER);
  EXPECT_EQ(mi->ft->createInstance(mi, context_, result.get(), path("NRVTAVO_Card"), nullptr).rc,
            CMPI_RC_ERR_INVALID_PARAMETER);
  EXPECT_EQ(mi->ft->modifyInstance(mi, context_, result.get(), card_path("A1"), nullptr, nullptr).rc,
            CMPI_RC_ERR_INVALID_PARAMETER);
  EXPECT_EQ(mi->ft->enumerateInstanceNames(nullptr, context_, result.get(), path("NRVTAVO_Card")).rc,
            CMPI_RC_ERR_FAILED);
  CMPIAssociationMI* ami = association_mi(link_slot());
  EXPECT_EQ(ami->ft->references(ami, context_, result.get(), nullptr, nullptr, nullptr, nullptr).rc, CMPI_RC_OK);
  EXPECT_EQ(ami->ft->associators(ami, context_, nullptr, card_path("A1"), nullptr, nullptr, nullptr, nullptr,
                                 nullptr)
                .rc,
            CMPI_RC_OK);
  EXPECT_TRUE(result.returned().paths.empty());
}

TEST_F(Robustness, AKeyOfTheWrongTypeIsSkippedSoTheInstanceIsNotFound) {
  CMPIInstanceMI* mi = instance_mi(card_slot());
  CMPIObjectPath* wrong = path("NRVTAVO_Card");
  fake::add_string_key(wrong, "CreationClassName", "NRVTAVO_Card");
  CMPIValue number;
  number.uint32 = 7;
  CMAddKey(wrong, "Tag", &number, CMPI_uint32);
  fake::Result result;
  EXPECT_EQ(mi->ft->getInstance(mi, context_, result.get(), wrong, nullptr).rc, CMPI_RC_ERR_NOT_FOUND);
  EXPECT_NE(traces().find("type mismatch on Tag: string/uint32"), std::string::npos);
}

TEST_F(Robustness, AnExtraKeyIsIgnoredAndReported) {
  CMPIInstanceMI* mi = instance_mi(card_slot());
  CMPIObjectPath* extra = card_path("A1");
  fake::add_string_key(extra, "Bogus", "x");
  fake::Result result;
  EXPECT_EQ(mi->ft->getInstance(mi, context_, result.get(), extra, nullptr).rc, CMPI_RC_OK);
  EXPECT_EQ(result.returned().instances.size(), 1u);
  EXPECT_NE(traces().find("unknown feature: NRVTAVO_Card.Bogus"), std::string::npos);
}

TEST_F(Robustness, ANullStringKeyIsIgnored) {
  CMPIInstanceMI* mi = instance_mi(card_slot());
  CMPIObjectPath* odd = path("NRVTAVO_Card");
  fake::add_string_key(odd, "CreationClassName", "NRVTAVO_Card");
  CMPIValue none;
  none.string = nullptr;
  CMAddKey(odd, "Tag", &none, CMPI_string);
  fake::Result result;
  EXPECT_EQ(mi->ft->getInstance(mi, context_, result.get(), odd, nullptr).rc, CMPI_RC_ERR_NOT_FOUND);
  EXPECT_NE(traces().find("ignored null CMPI string"), std::string::npos);
}

TEST_F(Robustness, AReferenceKeyOfTheWrongClassIsRefused) {
  CMPIAssociationMI* mi = association_mi(link_slot());
  CMPIInstanceMI* imi = instance_mi(link_slot());
  CMPIObjectPath* link = path("NRVTAVO_CardContainsChip");
  CMPIValue ref;
  ref.ref = card_path("A1");
  CMAddKey(link, "PartComponent", &ref, CMPI_ref);  // a card where a chip belongs
  fake::Result result;
  EXPECT_EQ(imi->ft->getInstance(imi, context_, result.get(), link, nullptr).rc, CMPI_RC_ERR_NOT_FOUND);
  EXPECT_NE(traces().find("failed to assign instance of NRVTAVO_Card to NRVTAVO_CardContainsChip.PartComponent"),
            std::string::npos);
  (void)mi;
}

TEST_F(Robustness, AMethodNamedInAPropertyListIsRefused) {
  CMPIInstanceMI* mi = instance_mi(service_slot());
  store().services.insert(make_service("cm0"));
  const char* list[] = {"RequestStateChange", nullptr};
  fake::Result result;
  EXPECT_EQ(mi->ft->enumerateInstances(mi, context_, result.get(), path("NRVTAVO_ChannelMgmtService"), list).rc,
            CMPI_RC_ERR_INVALID_PARAMETER);
}

}  // namespace
}  // namespace test

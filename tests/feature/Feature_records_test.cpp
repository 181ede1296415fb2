// Records that break their own layout: a VPD walk that never ends or leaves
// its image, values longer than their FRU members, SFF records with
// impossible values, driver-parameter and event-log records without their
// terminators.  Nothing crashes or reads past a record (the suite also runs
// under AddressSanitizer); what can be read is still published.
#include <cmath>
#include <cstring>
#include <limits>

#include "FeatureTestSupport.h"
#include "access/NRV_Common.h"
#include "access/NRV_VpdWalk.h"
#include "data/NRV_DriverParameters.h"
#include "data/NRV_FruRecord.h"
#include "data/NRV_Transceiver.h"
#include "schema/Classes.h"

namespace feature_test {
namespace {

using namespace cimple;

// Library walks that misbehave, each answering "AB" = "x".
void* fill(char* keyword, char* value) {
  std::memcpy(keyword, "AB", 3);
  std::memcpy(value, "x", 2);
  return nullptr;
}
void* sameCursor(void* cursor, char* keyword, char* value) {
  fill(keyword, value);
  return cursor;
}
void* oneByteOn(void* cursor, char* keyword, char* value) {
  fill(keyword, value);
  return static_cast<char*>(cursor) + 1;
}
void* farAway(void* cursor, char* keyword, char* value) {
  fill(keyword, value);
  return static_cast<char*>(cursor) + (1 << 20);
}

TEST(VpdWalk, StopsWhateverTheLibraryAnswers) {
  const std::vector<uint8_t> image(30, 0x41);
  struct Case {
    Vpd_Next next;
    size_t entries;
  } const cases[] = {{sameCursor, 1}, {oneByteOn, 11}, {farAway, 1}};
  for (const Case& c : cases) {
    const std::vector<Vpd_Entry> entries = walkVpd(image, c.next);
    EXPECT_EQ(entries.size(), c.entries);
    EXPECT_EQ(entries.front().keyword, "AB");
    EXPECT_EQ(entries.front().text(), "x");
  }
  EXPECT_TRUE(walkVpd({}, sameCursor).empty());
}

TEST_F(FeatureTest, AVpdImageWithoutItsEndTagIsWalkedInsideItsCopy) {
  // An identifier string claiming 200 bytes of which 5 are delivered.
  const std::vector<uint8_t> image = {0x82, 200, 0, 'N', 'o', 'r', 'v', 'a'};
  // The library's walk reads on past the image; the copy's tail holds it.
  const std::vector<Vpd_Entry> entries = walkVpd(image);
  ASSERT_EQ(entries.size(), 1u);
  EXPECT_EQ(entries[0].text(), "Norva");
}

Vpd_Entry entry(const std::string& keyword, const std::string& value) {
  Vpd_Entry e{keyword, value};
  e.value.resize(RM_VPD_VALUE_SIZE, '\0');
  return e;
}

TEST(FruRecord, ValuesAreCutToTheirMembersAndKeptPrintable) {
  NRV_FruRecord record;
  std::string full(RM_VPD_VALUE_SIZE, 'F');  // no terminator in the library's buffer
  Vpd_Entry fw{"FW", std::string(38, 'w') + ",V:" + std::string(30, '9') + ",D:\x01" "2012"};
  fw.value.resize(RM_VPD_VALUE_SIZE, '\0');
  record.fill({entry("FN", std::string(200, 'n')), Vpd_Entry{"MN", full}, fw, entry("UU", std::string("\0\x10", 2)),
               entry("CF", "\x60"), entry("ZZ", "unknown")});
  EXPECT_EQ(NRV_FruRecord::text(record.FN), std::string(16, 'n'));
  EXPECT_EQ(NRV_FruRecord::text(record.MN), std::string(RM_VPD_VALUE_SIZE, 'F'));
  EXPECT_EQ(NRV_FruRecord::text(record.FW).size(), 40u);
  EXPECT_EQ(NRV_FruRecord::text(record.FWVersion), std::string(16, '9'));
  EXPECT_EQ(NRV_FruRecord::text(record.FWDate), "?2012");
  EXPECT_EQ(NRV_FruRecord::text(record.UU), "00100000000000000000000000000000");
  std::string text;
  EXPECT_EQ(CardFunctionText(record.CF, text), 0u);
  EXPECT_EQ(text, "iSCSI");
  EXPECT_EQ(CardFunctionText(17, text), kNrvNotFound);
  EXPECT_EQ(SoftwareClassificationText(32775, text), 0u);
  EXPECT_EQ(text, "CIM Provider");
  EXPECT_EQ(SoftwareClassificationText(3, text), kNrvNotFound);
}

// ---- SFF records ----------------------------------------------------------------

std::vector<uint8_t> sffRecord() {
  std::vector<uint8_t> record(RM_SFF_DATA_SIZE, 0);
  record[584] = record[586] = 1;
  const uint8_t oui[] = {0x0A, 0x0B, 0x0C};
  std::memcpy(&record[616], oui, 3);
  std::memcpy(&record[620], "ACME            ", 16);
  std::memcpy(&record[680], "050101", 6);
  return record;
}

template <class T>
void put(std::vector<uint8_t>& record, size_t at, T value) {
  std::memcpy(&record[at], &value, sizeof value);
}

TEST(SffRecord, WithoutDiagnosticsOnlyTheIdentityIsPublished) {
  std::vector<uint8_t> record = sffRecord();
  std::unique_ptr<NRVTAVO_Transceiver, void (*)(NRVTAVO_Transceiver*)> t(
      transceiverFromSff(record.data(), "0090FA5C2E100000"), [](NRVTAVO_Transceiver* i) { destroy(i); });
  EXPECT_EQ(textOf(t->OUI), "0A-0B-0c");
  EXPECT_EQ(textOf(t->Manufacturer), "ACME");
  EXPECT_EQ(t->ManufactureDate.value.ascii(), "20050101000000.000000+000");
  EXPECT_EQ(t->SFPStatus.value, 1u);
  EXPECT_TRUE(t->Temperature.is_null());
  EXPECT_TRUE(t->TemperatureHighAlarm.is_null());
  EXPECT_TRUE(t->TemperatureUnit.is_null());
}

TEST(SffRecord, ImpossibleValuesAreLeftUnsetAndTextsStayInTheirFields) {
  // Every byte set: texts without terminators, NaN readings, no date.
  std::vector<uint8_t> record(RM_SFF_DATA_SIZE, 0xFF);
  put(record, 596, std::numeric_limits<float>::infinity());
  put(record, 600, -std::numeric_limits<float>::infinity());
  put<int16_t>(record, 298, static_cast<int16_t>(0xFB00));
  std::unique_ptr<NRVTAVO_Transceiver, void (*)(NRVTAVO_Transceiver*)> t(
      transceiverFromSff(record.data(), "0090FA5C2E100000"), [](NRVTAVO_Transceiver* i) { destroy(i); });
  EXPECT_EQ(textOf(t->Manufacturer), std::string(18, '?'));
  EXPECT_EQ(textOf(t->Version), std::string(6, '?'));
  EXPECT_TRUE(t->ManufactureDate.is_null());
  EXPECT_TRUE(t->Temperature.is_null());
  EXPECT_TRUE(t->Vcc.is_null());
  EXPECT_TRUE(t->RxPower.is_null());
  EXPECT_FLOAT_EQ(t->TemperatureLowAlarm.value, -5.0f);
  EXPECT_NEAR(t->VoltageHighAlarm.value, 6.5535, 1e-4);
  EXPECT_EQ(t->SFPStatus.value, 0u);

  for (const char* code : {"991331", "990230", "000229", "9912 1", "AB1231"}) {
    std::vector<uint8_t> dated = sffRecord();
    std::memcpy(&dated[680], code, 6);
    std::unique_ptr<NRVTAVO_Transceiver, void (*)(NRVTAVO_Transceiver*)> d(
        transceiverFromSff(dated.data(), "X"), [](NRVTAVO_Transceiver* i) { destroy(i); });
    EXPECT_EQ(d->ManufactureDate.is_null(), std::string(code) != "000229") << code;
  }
}

// ---- Driver-parameter records ------------------------------------------------------

TEST(DriverParameterRecords, TextsStayInTheirFields) {
  RM_DRIVER_PARAM record;
  std::memset(&record, 'z', sizeof record);
  record.currentValue = 7;
  std::vector<Instance*> made = driverParamInstances({record}, "10000090FA5C2E12", false);
  ASSERT_EQ(made.size(), 4u);
  const auto* current = static_cast<const NRVTAVO_DriverParameterSettingData*>(made[0]);
  EXPECT_EQ(textOf(current->ParameterName), std::string(32, 'z'));
  EXPECT_EQ(textOf(current->help), std::string(44, 'z'));
  EXPECT_EQ(current->Value.value, 7u);
  for (Instance* i : made) destroy(i);
}

}  // namespace
}  // namespace feature_test

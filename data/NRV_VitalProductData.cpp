// General VPD keywords into the instance: the known ones by table, every
// other one into the tag lists.
#include "data/NRV_VitalProductData.h"

#include <cstdio>
#include <string>

#include "access/NRV_Common.h"
#include "access/NRV_MethodWrapper.h"
#include "access/NRV_VpdWalk.h"
#include "logging/Log.h"
#include "schema/NRVTAVO_VitalProductData.h"

namespace cimple {

namespace {

using Vpd = NRVTAVO_VitalProductData;
using Vpd_Member = Property<String> Vpd::*;

struct Vpd_Keyword {
  const char* keyword;
  const char* description;  // what the keyword holds (general table)
  Vpd_Member member;
};

// The general table, in table order.
constexpr Vpd_Keyword kGeneralKeywords[] = {
    {"CP", "EXT_CAPABILITY", &Vpd::ExtCapability},   {"EC", "EC_LEVEL", &Vpd::ECLevel},
    {"FG", "FABRIC_GEOGRAPHY", &Vpd::FabricGeography}, {"LC", "LOCATION", &Vpd::Location},
    {"MN", "MANUFACTURER_ID", &Vpd::ManufactureId},  {"PG", "PCI_GEOGRAPHY", &Vpd::PCIGeography},
    {"PN", "PART_NUMBER", &Vpd::PartNumber},         {"SN", "SERIAL_NUMBER", &Vpd::VPDSerialNumber},
    {"YX", "YX (VPD-W)", &Vpd::VPDW},
};

// Keywords outside the table that still have a property of their own.
constexpr Vpd_Keyword kFieldKeywords[] = {
    {"\x82\x82", "identifier string", &Vpd::ProductName}, {"V0", "vendor 0", &Vpd::FieldV0},
    {"V1", "vendor 1", &Vpd::FieldV1}, {"V2", "vendor 2", &Vpd::FieldV2}, {"V3", "vendor 3", &Vpd::FieldV3},
    {"V4", "vendor 4", &Vpd::FieldV4}, {"V5", "vendor 5", &Vpd::FieldV5}, {"VB", "vendor B", &Vpd::FieldVB},
};

template <size_t N>
const Vpd_Keyword* find(const Vpd_Keyword (&table)[N], const std::string& keyword) {
  for (const Vpd_Keyword& k : table)
    if (keyword == k.keyword) return &k;
  return nullptr;
}

std::string keywordText(const std::string& keyword) {
  std::string out;
  for (char c : keyword) {
    const auto b = static_cast<unsigned char>(c);
    if (b >= 0x20 && b <= 0x7E) {
      out += c;
    } else {
      char hex[3];
      std::snprintf(hex, sizeof hex, "%02X", b);
      out += hex;
    }
  }
  return out;
}

void appendText(Property<Array<String>>& array, const std::string& text) {
  if (array.is_null()) array.set(Array<String>());
  array.value.append(String(text));
}

}  // namespace

uint32_t CreateVPD(NRV_Catalogue& catalogue, const char* deviceId) {
  NRV_LOG(NRV_DBG, "Inside CreateVPD");
  HBA_NAME name{};
  if (!deviceIdToHBAName(deviceId, name, "Id2HBAName failed", "str2HBAName failed")) return 1;
  std::vector<std::pair<std::string, std::string>> entries;
  const RM_STATUS status = NRV_MethodWrapper::ReadVPD(name, entries);
  if (status != RM_STATUS_SUCCESS) return status;

  auto* vpd = makeInstance<Vpd>();
  vpd->InstanceID.set(deviceId);
  for (const auto& [keyword, raw] : entries) {
    const std::string value = printableText(raw);
    if (const Vpd_Keyword* known = find(kGeneralKeywords, keyword)) {
      NRV_LOG(NRV_DBG, "VPD:%s", keyword.c_str());
      NRV_LOG(NRV_DBG, "%s", value.c_str());
      (vpd->*(known->member)).set(String(value));
      continue;
    }
    const std::string tag = keywordText(keyword);
    NRV_LOG(NRV_DBG, "%s--%s", tag.c_str(), value.c_str());
    if (const Vpd_Keyword* field = find(kFieldKeywords, keyword)) (vpd->*(field->member)).set(String(value));
    appendText(vpd->VPDTags, tag);
    appendText(vpd->VPDTagValues, value);
  }
  if (!catalogue.insert(vpd)) NRV_LOG(NRV_CRIT, "Insert Failed : m_NRVTAVO_VitalProductData_map");
  return 0;
}

}  // namespace cimple

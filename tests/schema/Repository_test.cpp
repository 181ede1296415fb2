// The generated class repository as a whole: every provider class present
// once with the right kind, sound inheritance, look-ups, and the invariants
// every generated meta-class must keep (slots inside the record and apart,
// key counts, inherited features shared with the super-class).
#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <set>
#include <string>
#include <strings.h>
#include <utility>
#include <vector>

#include "framework/Instance.h"
#include "schema/Classes.h"
#include "schema/ProviderClasses.h"
#include "schema/Repository.h"
#include "tests/schema/ProviderLists.h"

namespace cimple {
namespace {

std::vector<const Meta_Class*> all_classes() {
  return {nrv_meta_repository.meta_classes,
          nrv_meta_repository.meta_classes + nrv_meta_repository.num_meta_classes};
}

size_t count_named(const char* name) {
  size_t n = 0;
  for (const Meta_Class* mc : all_classes()) n += strcasecmp(mc->name, name) == 0;
  return n;
}

// Bytes a slot occupies: { T value; uint8_t null; } for properties, a bare
// pointer or Array handle for references.
uint32_t slot_size(const Meta_Feature* f) {
  if (f->flags & FLAG_REFERENCE) return 8;
  const auto* mp = reinterpret_cast<const Meta_Property*>(f);
  uint32_t value = mp->subscript ? 8 : type_size[mp->type];
  return (value + 1 + value - 1) / value * value;
}

uint32_t slot_offset(const Meta_Feature* f) {
  if (f->flags & FLAG_REFERENCE) return reinterpret_cast<const Meta_Reference*>(f)->offset;
  return reinterpret_cast<const Meta_Property*>(f)->offset;
}

// Checks that the data slots of a record fit in `size` bytes after the
// header, aligned, and do not overlap.
void expect_disjoint_slots(const char* owner, const Meta_Feature* const* features, size_t n, uint32_t size) {
  std::vector<std::pair<uint32_t, uint32_t>> spans;
  for (size_t i = 0; i < n; ++i) {
    const Meta_Feature* f = features[i];
    if (f->flags & FLAG_METHOD) continue;
    uint32_t off = slot_offset(f), len = slot_size(f);
    uint32_t alignment = (f->flags & FLAG_REFERENCE) ? 8 : len / 2 < 8 ? len / 2 : 8;
    EXPECT_GE(off, 24u) << owner << "." << f->name;
    EXPECT_LE(off + len, size) << owner << "." << f->name;
    EXPECT_EQ(off % alignment, 0u) << owner << "." << f->name;
    spans.emplace_back(off, off + len);
  }
  std::sort(spans.begin(), spans.end());
  for (size_t i = 1; i < spans.size(); ++i) EXPECT_LE(spans[i - 1].second, spans[i].first) << owner;
}

TEST(ProviderClasses, EveryPlainProviderClassIsPresentOnceAndIsNoAssociation) {
  for (const char* name : nrv_test::kPlainProviderClasses) {
    EXPECT_EQ(count_named(name), 1u) << name;
    const Meta_Class* mc = find_meta_class(&nrv_meta_repository, name);
    ASSERT_NE(mc, nullptr) << name;
    EXPECT_STREQ(mc->name, name);
    EXPECT_TRUE(mc->flags & FLAG_CLASS) << name;
    EXPECT_FALSE(mc->flags & FLAG_ASSOCIATION) << name;
  }
}

TEST(ProviderClasses, EveryAssociationProviderClassIsPresentOnceAndIsAnAssociation) {
  for (const char* name : nrv_test::kAssociationProviderClasses) {
    EXPECT_EQ(count_named(name), 1u) << name;
    const Meta_Class* mc = find_meta_class(&nrv_meta_repository, name);
    ASSERT_NE(mc, nullptr) << name;
    EXPECT_TRUE(mc->flags & FLAG_ASSOCIATION) << name;
    EXPECT_FALSE(mc->flags & FLAG_CLASS) << name;
    size_t refs = 0;
    for (size_t i = 0; i < mc->num_meta_features; ++i)
      refs += (mc->meta_features[i]->flags & (FLAG_REFERENCE | FLAG_KEY)) == (FLAG_REFERENCE | FLAG_KEY);
    // Only the initiator-target-unit paths link three elements.
    const bool path = std::strstr(name, "InitiatorTarget") && std::strstr(name, "Path");
    EXPECT_EQ(refs, path ? 3u : 2u) << name;
    EXPECT_EQ(mc->num_keys, refs) << name;
  }
}

TEST(ProviderClasses, XMacroListsMatchTheProviderLists) {
  std::set<std::string> plain, assoc, all;
#define X_PLAIN(C) plain.insert(C::static_meta_class.name);
#define X_ASSOC(C) assoc.insert(C::static_meta_class.name);
#define X_ALL(C) all.insert(C::static_meta_class.name);
  NRV_FOR_EACH_PLAIN_PROVIDER_CLASS(X_PLAIN)
  NRV_FOR_EACH_ASSOCIATION_PROVIDER_CLASS(X_ASSOC)
  NRV_FOR_EACH_PROVIDER_CLASS(X_ALL)
#undef X_PLAIN
#undef X_ASSOC
#undef X_ALL
  std::set<std::string> want_plain(std::begin(nrv_test::kPlainProviderClasses),
                                   std::end(nrv_test::kPlainProviderClasses));
  std::set<std::string> want_assoc(std::begin(nrv_test::kAssociationProviderClasses),
                                   std::end(nrv_test::kAssociationProviderClasses));
  EXPECT_EQ(plain, want_plain);
  EXPECT_EQ(assoc, want_assoc);
  EXPECT_EQ(all.size(), want_plain.size() + want_assoc.size());
  EXPECT_EQ(size_t{NRV_PROVIDER_CLASS_COUNT}, all.size());
}

TEST(ProviderClasses, PlatformClassesArePresent) {
  const std::pair<const char*, const char*> expected[] = {{"KVLD_ComputerSystem", "CIM_ComputerSystem"},
                                                          {"KVLD_Chassis", "CIM_Chassis"},
                                                          {"PG_RegisteredProfile", "CIM_RegisteredProfile"}};
  for (const auto& [name, super] : expected) {
    const Meta_Class* mc = find_meta_class(&nrv_meta_repository, name);
    ASSERT_NE(mc, nullptr) << name;
    ASSERT_NE(mc->super_meta_class, nullptr) << name;
    EXPECT_STREQ(mc->super_meta_class->name, super);
  }
  EXPECT_NE(find_meta_class(&nrv_meta_repository, "CIM_Error"), nullptr);
  EXPECT_EQ(find_meta_class(&nrv_meta_repository, "NRVTAVO_NoSuchClass"), nullptr);
}

TEST(Inheritance, EverySuperClassChainEndsAtARootInTheRepository) {
  const size_t n = nrv_meta_repository.num_meta_classes;
  for (const Meta_Class* mc : all_classes()) {
    const Meta_Class* c = mc;
    size_t steps = 0;
    while (c->super_meta_class && steps <= n) {
      c = c->super_meta_class;
      ++steps;
      EXPECT_EQ(count_named(c->name), 1u) << mc->name << " has ancestor " << c->name;
    }
    EXPECT_EQ(c->super_meta_class, nullptr) << mc->name << ": the chain does not end";
    EXPECT_TRUE(is_subclass(c, mc));
    EXPECT_EQ(mc->meta_repository, &nrv_meta_repository) << mc->name;
  }
  const Meta_Class* chip = find_meta_class(&nrv_meta_repository, "NRVTAVO_Chip");
  const Meta_Class* root = find_meta_class(&nrv_meta_repository, "CIM_ManagedElement");
  EXPECT_STREQ(chip->super_meta_class->name, "CIM_Chip");
  EXPECT_TRUE(is_subclass(root, chip));
  EXPECT_FALSE(is_subclass(chip, root));
}

TEST(Inheritance, InheritedFeaturesAreTheSuperClassRecordsInTheSameSlots) {
  for (const Meta_Class* mc : all_classes()) {
    const Meta_Class* super = mc->super_meta_class;
    if (!super) {
      for (size_t i = 0; i < mc->num_meta_features; ++i) EXPECT_EQ(mc->locals[i], 1) << mc->name;
      continue;
    }
    ASSERT_GE(mc->num_meta_features, super->num_meta_features) << mc->name;
    EXPECT_GE(mc->size, super->size) << mc->name;
    for (size_t i = 0; i < super->num_meta_features; ++i) {
      const Meta_Feature* mine = mc->meta_features[i];
      const Meta_Feature* theirs = super->meta_features[i];
      EXPECT_STREQ(mine->name, theirs->name) << mc->name;
      if (mc->locals[i]) {
        // An override: same kind, same slot.
        EXPECT_EQ(mine->flags & 7u, theirs->flags & 7u) << mc->name << "." << mine->name;
        if (!(mine->flags & FLAG_METHOD)) {
          EXPECT_EQ(slot_offset(mine), slot_offset(theirs)) << mc->name << "." << mine->name;
        }
      } else {
        EXPECT_EQ(mine, theirs) << mc->name << "." << mine->name;
      }
    }
    for (size_t i = super->num_meta_features; i < mc->num_meta_features; ++i)
      EXPECT_EQ(mc->locals[i], 1) << mc->name << "." << mc->meta_features[i]->name;
  }
}

TEST(Invariants, SlotsLieInsideTheRecordAndNeverOverlap) {
  for (const Meta_Class* mc : all_classes()) {
    EXPECT_EQ(mc->size % 8, 0u) << mc->name;
    EXPECT_GE(mc->size, 24u) << mc->name;
    expect_disjoint_slots(mc->name, mc->meta_features, mc->num_meta_features, mc->size);
  }
}

TEST(Invariants, KeyCountsMatchTheKeyFeatures) {
  for (const Meta_Class* mc : all_classes()) {
    size_t keys = 0;
    for (size_t i = 0; i < mc->num_meta_features; ++i) keys += (mc->meta_features[i]->flags & FLAG_KEY) != 0;
    EXPECT_EQ(mc->num_keys, keys) << mc->name;
  }
}

TEST(Invariants, FlagsNameExactlyOneKindOfRecord) {
  for (const Meta_Class* mc : all_classes()) {
    EXPECT_EQ(mc->refs, 0u);
    EXPECT_NE((mc->flags & FLAG_CLASS) != 0, (mc->flags & FLAG_ASSOCIATION) != 0) << mc->name;
    if (mc->flags & FLAG_AGGREGATION) {
      EXPECT_TRUE(mc->flags & FLAG_ASSOCIATION) << mc->name;
    }
    for (size_t i = 0; i < mc->num_meta_features; ++i) {
      uint32_t kind = mc->meta_features[i]->flags & 7u;
      EXPECT_TRUE(kind == FLAG_PROPERTY || kind == FLAG_REFERENCE || kind == FLAG_METHOD)
          << mc->name << "." << mc->meta_features[i]->name;
    }
  }
}

TEST(Invariants, ReferencesNameAClassOfTheRepository) {
  for (const Meta_Class* mc : all_classes()) {
    for (size_t i = 0; i < mc->num_meta_features; ++i) {
      const Meta_Feature* f = mc->meta_features[i];
      if (!(f->flags & FLAG_REFERENCE)) continue;
      const Meta_Class* target = reinterpret_cast<const Meta_Reference*>(f)->meta_class;
      ASSERT_NE(target, nullptr) << mc->name << "." << f->name;
      if (target != &Instance_meta_class) {
        EXPECT_EQ(count_named(target->name), 1u) << target->name;
      }
    }
  }
}

TEST(Invariants, MethodRecordsEndWithTheirReturnValue) {
  std::set<const Meta_Method*> seen;
  for (const Meta_Class* mc : all_classes()) {
    for (size_t i = 0; i < mc->num_meta_features; ++i) {
      if (!(mc->meta_features[i]->flags & FLAG_METHOD)) continue;
      const auto* mm = reinterpret_cast<const Meta_Method*>(mc->meta_features[i]);
      if (!seen.insert(mm).second) continue;
      ASSERT_GE(mm->num_meta_features, 1u) << mm->name;
      const auto* ret = reinterpret_cast<const Meta_Property*>(mm->meta_features[mm->num_meta_features - 1]);
      EXPECT_STREQ(ret->name, "return_value");
      EXPECT_EQ(ret->flags & (FLAG_PROPERTY | FLAG_IN | FLAG_OUT), FLAG_PROPERTY | FLAG_OUT) << mm->name;
      EXPECT_EQ(ret->type, mm->return_type) << mm->name;
      for (size_t p = 0; p + 1 < mm->num_meta_features; ++p)
        EXPECT_TRUE(mm->meta_features[p]->flags & (FLAG_IN | FLAG_OUT)) << mm->name;
      EXPECT_EQ(mm->size % 8, 0u);
      expect_disjoint_slots(mm->name, mm->meta_features, mm->num_meta_features, mm->size);
    }
  }
  EXPECT_GT(seen.size(), 20u);
}

TEST(Lookups, FeaturesAreFoundCaseInsensitivelyByKind) {
  const Meta_Class* port = find_meta_class(&nrv_meta_repository, "nrvtavo_ethernetport");
  ASSERT_NE(port, nullptr);
  EXPECT_STREQ(port->name, "NRVTAVO_EthernetPort");
  const Meta_Feature* f = find_feature(port, "deviceid", KIND_PROPERTY);
  ASSERT_NE(f, nullptr);
  EXPECT_STREQ(f->name, "DeviceID");
  EXPECT_TRUE(f->flags & FLAG_KEY);
  EXPECT_EQ(find_feature(port, "DeviceID", KIND_METHOD), nullptr);
  EXPECT_NE(find_method(port, "REQUESTSTATECHANGE"), nullptr);
  EXPECT_EQ(find_property(port, "RequestStateChange"), nullptr);

  const Meta_Class* realizes = find_meta_class(&nrv_meta_repository, "NRVTAVO_Realizes");
  ASSERT_NE(realizes, nullptr);
  const Meta_Reference* dep = find_reference(realizes, "dependent");
  ASSERT_NE(dep, nullptr);
  EXPECT_EQ(dep->meta_class, find_meta_class(&nrv_meta_repository, "NRVTAVO_EthernetPort"));
  EXPECT_EQ(find_property(realizes, "Dependent"), nullptr);

  const Meta_Class* log = find_meta_class(&nrv_meta_repository, "NRVTAVO_RecordLog");
  ASSERT_NE(log, nullptr);
  const Meta_Method* set_params = find_method(log, "SetLogParams");
  ASSERT_NE(set_params, nullptr);
  EXPECT_EQ(set_params->num_meta_features, 4u);
  EXPECT_NE(find_method(log, "ClearLog"), nullptr);
  EXPECT_EQ(find_feature(log, "NoSuchFeature"), nullptr);
}

// Methods the catalogue classes inherit from their DMTF ancestors, and the
// module's own service methods; each must be reachable by name.
TEST(Lookups, ClassesCarryTheirExtrinsicMethods) {
  const std::pair<const char*, std::vector<const char*>> expected[] = {
      {"NRVTAVO_ARPTable", {"RefreshTable"}},
      {"NRVTAVO_PCIDevice",
       {"RequestStateChange", "SetPowerState", "Reset", "EnableDevice", "OnlineDevice", "QuiesceDevice",
        "SaveProperties", "RestoreProperties", "BISTExecution"}},
      {"NRVTAVO_TapeDrive", {"LockMedia", "Reset"}},
      {"NRVTAVO_FIPService", {"RequestStateChange", "StartService", "StopService", "ChangeAffectedElementsAssignedSequence"}},
      {"NRVTAVO_iSCSITargetProtocolEndpoint", {"RequestStateChange", "BroadcastReset"}},
      {"NRVTAVO_iSCSISession", {"RequestStateChange"}},
      {"NRVTAVO_ConcreteJob", {"KillJob", "RequestStateChange", "GetError", "GetErrors"}},
      {"NRVTAVO_EnabledRecordLogCapabilities", {"CreateGoalSettings"}},
      {"NRVTAVO_PhysicalPackage", {"IsCompatible"}},
      {"NRVTAVO_ISCSISessionStatistics", {"ResetSelectedStats"}},
      {"NRVTAVO_DiagnosticTest", {"RunDiagnosticService"}},
      {"NRVTAVO_HelpService", {"GetHelp"}},
      {"NRVTAVO_DiagnosticsLog", {"ClearLog"}},
      {"NRVTAVO_IPConfigurationService",
       {"ApplySettingToIPProtocolEndpoint", "AddStaticIPv4Interface", "ApplySettingToLANEndpoint"}},
      {"NRVTAVO_SoftwareInstallationService",
       {"InstallFromURI", "InstallFromByteStream", "Reset", "SetPortEnabled", "SetSRIOVState", "GetHBAFeatures"}},
      {"NRVTAVO_DumpService",
       {"GenerateExtFATDump", "GetDumpFileNames", "DeleteDumpFiles", "SetAdvancedFATDumpTraceLevel",
        "RestoreAdvancedFATDumpSetting", "GenerateCoreDump", "RetrieveFATDump"}},
      {"NRVTAVO_FCWWNService", {"ChangeWWN", "RestoreWWN", "ReadWWN", "GetWWNCapability"}},
      {"NRVTAVO_ChannelMgmtService", {"SetCMMode", "SetCMChannelType", "SetCMBandwidths", "SetCMLPVIDs", "SetVEPAState"}},
      {"NRVTAVO_DriverParameterService", {"DisableAllOASLuns"}},
      {"NRVTAVO_iSCSISettingService",
       {"Ping", "AddTargetPortal", "RemoveTargetPortal", "AddTarget", "RemoveTarget", "TargetLogin", "TargetLogout",
        "setBootTargetSession", "setTargetLoginProperties", "setTargetProperties", "setTPLoginProperties"}},
  };
  for (const auto& [name, methods] : expected) {
    const Meta_Class* mc = find_meta_class(&nrv_meta_repository, name);
    ASSERT_NE(mc, nullptr) << name;
    for (const char* m : methods) EXPECT_NE(find_method(mc, m), nullptr) << name << "." << m;
  }
}

TEST(Lookups, SettingDataLinksCarryThePendingFlag) {
  const Meta_Class* esd = find_meta_class(&nrv_meta_repository, "CIM_ElementSettingData");
  ASSERT_NE(esd, nullptr);
  size_t links = 0;
  for (const char* name : nrv_test::kAssociationProviderClasses) {
    const Meta_Class* mc = find_meta_class(&nrv_meta_repository, name);
    if (!is_subclass(esd, mc)) continue;
    ++links;
    const Meta_Property* pending = find_property(mc, "IsPending");
    ASSERT_NE(pending, nullptr) << name;
    EXPECT_EQ(pending->type, UINT16);
  }
  EXPECT_GT(links, 30u);
}

}  // namespace
}  // namespace cimple

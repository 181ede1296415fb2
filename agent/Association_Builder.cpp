#include "agent/Association_Builder.h"

#include <string_view>
#include <unordered_map>

namespace cimple {

namespace {

// Log texts of the associations whose messages differ from the common ones
// ("Insert Failed : m_<class>_map", "Wrong input to <class> (<label>)").
// "%s" in a wrong-input text stands for the label.
struct Association_Texts {
  const char* class_name;
  const char* insert_failed;  // null: the common text
  const char* wrong_input;    // null: the common text
};

constexpr Association_Texts kTexts[] = {
    {"NRVTAVO_ProviderUseOfLog", "Insert Failed", "Wrong input to CreateTAVOProviderUseOfLogInstance"},
    {"NRVTAVO_RecordLogCapabilities", "Insert Failed", "Wrong input to createAssoc_TAVORecordLog_ElementCapabilities"},
    {"NRVTAVO_RecordLogConformsToProfile", nullptr, "Wrong input to NRVTAVO_RecordLogConformsToProfile"},
    {"NRVTAVO_HostedInstallationService", "Insert Failed", "Wrong input to createAssoc_Service_CompSystem"},
    {"NRVTAVO_InstallServiceAffectsSystem", "Insert Failed", "Wrong input to createAssoc_Service_CompSystem"},
    {"NRVTAVO_InstallServiceConformsToProfile", "Insert Failed", "Wrong input to createAssoc_Service_RegProf"},
    {"NRVTAVO_InstalledSoftwareIdentity", nullptr, "Generating createTAVOInstalledSoftwareIdentity failed (%s)"},
    {"NRVTAVO_SoftwareConformsToProfile", nullptr, "wrong input createTAVOSoftwareIdentityConformsToProfile "},
    {"NRVTAVO_FCWWNServiceAffectsFCPort", "Insert Failed", nullptr},
    {"NRVTAVO_FCWWNServiceAffectsSystem", "Insert Failed", nullptr},
    {"NRVTAVO_HostedFCWWNService", "Insert Failed", nullptr},
    {"NRVTAVO_ElementCapabilities", "Insert Failed", "Wrong input to createAssoc_Service_Capability"},
    {"NRVTAVO_ElementSoftwareIdentity", "Insert Failed : m_NRVTAVO_TAVOPortSoftwareIdentity_map",
     "wrong input for createElementSoftwareIdentity "},
    {"NRVTAVO_ChassisContainsCard", "Insert Failed:NRVTAVO_ChassisContainsCard", nullptr},
    {"NRVTAVO_CardContainsChip", "Insert Failed (CNA): NRVTAVO_Container", nullptr},
    {"NRVTAVO_InstallServiceAffectsChip", "Insert Failed:NRVTAVO_InstallServiceAffectsChip", nullptr},
    {"NRVTAVO_ConcreteIdentity", "Insert Failed (CNA): m_NRVTAVO_ConcreteIdentity_map", nullptr},
    {"NRVTAVO_FCConcreteIdentity", "Insert Failed (CNA): m_NRVTAVO_FCConcreteIdentity_map", nullptr},
    {"NRVTAVO_FirmwareElementSoftwareIdentity", "Insert Failed (CNA): m_NRVTAVO_FirmwareElementSoftwareIdentity_map",
     nullptr},
};

const Association_Texts* texts_of(const Meta_Class* mc) {
  static const std::unordered_map<std::string_view, const Association_Texts*> index = [] {
    std::unordered_map<std::string_view, const Association_Texts*> m;
    for (const Association_Texts& t : kTexts) m.emplace(t.class_name, &t);
    return m;
  }();
  auto it = index.find(mc->name);
  return it == index.end() ? nullptr : it->second;
}

std::string wrong_input_text(const Meta_Class* mc, const std::string& label) {
  const Association_Texts* t = texts_of(mc);
  if (t == nullptr || t->wrong_input == nullptr) return std::string("Wrong input to ") + mc->name + " (" + label + ")";
  std::string text = t->wrong_input;
  if (size_t at = text.find("%s"); at != std::string::npos) text.replace(at, 2, label);
  return text;
}

std::string insert_failed_text(const Meta_Class* mc) {
  const Association_Texts* t = texts_of(mc);
  if (t != nullptr && t->insert_failed != nullptr) return t->insert_failed;
  return std::string("Insert Failed : m_") + mc->name + "_map";
}

bool fits(const Meta_Reference* mr, const Instance* end) {
  return mr->meta_class == nullptr || is_subclass(mr->meta_class, end->meta_class);
}

}  // namespace

Association_Ends association_ends(const Meta_Class* mc) {
  Association_Ends ends;
  for (size_t i = 0; i < mc->num_meta_features; ++i) {
    const Meta_Feature* mf = mc->meta_features[i];
    if (!(mf->flags & FLAG_REFERENCE)) continue;
    auto* mr = reinterpret_cast<const Meta_Reference*>(mf);
    if (is_reference_array(mr)) continue;
    if (ends.first == nullptr) {
      ends.first = mr;
    } else {
      ends.second = mr;
      break;
    }
  }
  return ends;
}

Instance* build_association(Catalogue_Build& build, Instance_Map& map, const Meta_Class* mc, const std::string& label,
                            const Instance* first, const Instance* second) {
  NRV_LOG(NRV_DBG, "Generating %s (%s)", mc->name, label.c_str());
  if (first == nullptr || second == nullptr) {
    NRV_LOG(NRV_CRIT, "%s", wrong_input_text(mc, label).c_str());
    return nullptr;
  }
  const Association_Ends ends = association_ends(mc);
  if (ends.second == nullptr || !fits(ends.first, first) || !fits(ends.second, second)) {
    NRV_LOG(NRV_CRIT, "Could not create the instance of the Association class");
    return nullptr;
  }
  Instance* association = create(mc, true);
  Instance* a = build.endpoint(first);
  Instance* b = build.endpoint(second);
  ref(a);
  ref(b);
  reference_slot(association, ends.first) = a;
  reference_slot(association, ends.second) = b;
  if (map.insert(association) >= 0) return association;
  NRV_LOG(NRV_CRIT, "%s", insert_failed_text(mc).c_str());
  destroy(association);
  return nullptr;
}

}  // namespace cimple

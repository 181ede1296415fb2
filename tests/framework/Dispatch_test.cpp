// The provider procedure and the handle's fallbacks, over small providers
// that implement only what a catalogue provider implements.
#include <gtest/gtest.h>

#include <stdexcept>
#include <string>
#include <vector>

#include "framework/Instance_Map.h"
#include "framework/Provider_Handle.h"
#include "framework/Provider_Proc.h"
#include "schema/NRVTAVO_Card.h"
#include "schema/NRVTAVO_CardContainsChip.h"
#include "schema/NRVTAVO_Chip.h"
#include "schema/NRVTAVO_EthernetPort.h"

using namespace cimple;

namespace {

NRVTAVO_Chip* chip(const char* tag) {
  auto* c = NRVTAVO_Chip::create();
  c->CreationClassName.set("NRVTAVO_Chip");
  c->Tag.set(tag);
  return c;
}

NRVTAVO_Card* card(const char* tag) {
  auto* c = NRVTAVO_Card::create();
  c->CreationClassName.set("NRVTAVO_Card");
  c->Tag.set(tag);
  return c;
}

// Serves chips "c1" and "c2" by enumeration only.
class Chip_Provider : public Provider_Base {
 public:
  Chip_Provider() {
    map_.insert(chip("c1"));
    map_.insert(chip("c2"));
  }
  int enum_instances(const Instance*, const Handler& handler) { return map_.enum_instances(handler); }

 private:
  Instance_Map map_{&NRVTAVO_Chip::static_meta_class};
};

// Card "k1" contains c1 and c2; card "k2" contains c3.
class Containment_Provider : public Provider_Base {
 public:
  Containment_Provider() {
    add("k1", "c1");
    add("k1", "c2");
    add("k2", "c3");
  }
  int enum_instances(const Instance*, const Handler& handler) { return map_.enum_instances(handler); }

 private:
  void add(const char* k, const char* c) {
    auto* link = NRVTAVO_CardContainsChip::create();
    link->GroupComponent = card(k);
    link->PartComponent = chip(c);
    map_.insert(link);
  }
  Instance_Map map_{&NRVTAVO_CardContainsChip::static_meta_class};
};

class Port_Provider : public Provider_Base {
 public:
  int request_state_change(const Instance*, Instance* call) {
    reinterpret_cast<Property<uint32>*>(slot(call, last_offset(call)))->set(77);
    return INVOKE_METHOD_OK;
  }
  static std::span<const Method_Entry<Port_Provider>> methods() {
    static const Method_Entry<Port_Provider> table[] = {{"requestSTATEchange", &Port_Provider::request_state_change}};
    return table;
  }
  static uint32_t last_offset(const Instance* call) {
    auto* mm = reinterpret_cast<const Meta_Method*>(call->meta_class);
    return reinterpret_cast<const Meta_Property*>(mm->meta_features[mm->num_meta_features - 1])->offset;
  }
};

// A provider whose enumeration throws, as a faulty one does.
template <class Base>
class Throwing : public Base {
 public:
  int enum_instances(const Instance*, const Handler&) { throw std::runtime_error("provider fault"); }
};

const Provider_Registration chip_registration = {kModuleName, "NRVTAVO_Chip_Provider", provider_proc<Chip_Provider>,
                                                 &NRVTAVO_Chip::static_meta_class, nullptr};
const Provider_Registration containment_registration = {
    kModuleName, "NRVTAVO_CardContainsChip_Provider", provider_proc<Containment_Provider>,
    &NRVTAVO_CardContainsChip::static_meta_class, nullptr};
const Provider_Registration port_registration = {kModuleName, "NRVTAVO_EthernetPort_Provider",
                                                 provider_proc<Port_Provider>,
                                                 &NRVTAVO_EthernetPort::static_meta_class, nullptr};

const Provider_Registration throwing_chip_registration = {kModuleName, "NRVTAVO_Chip_Provider",
                                                          provider_proc<Throwing<Chip_Provider>>,
                                                          &NRVTAVO_Chip::static_meta_class, nullptr};
const Provider_Registration throwing_containment_registration = {
    kModuleName, "NRVTAVO_CardContainsChip_Provider", provider_proc<Throwing<Containment_Provider>>,
    &NRVTAVO_CardContainsChip::static_meta_class, nullptr};

// Collects what an enumeration delivers, and the closing call's status.
struct Collected {
  std::vector<std::string> tags;
  int closing_calls = 0;
  int closing_status = -99;

  static bool handle(Instance* instance, int status, void* data) {
    auto* self = static_cast<Collected*>(data);
    if (instance == nullptr) {
      ++self->closing_calls;
      self->closing_status = status;
      return false;
    }
    const Meta_Property* tag = find_property(instance->meta_class, "Tag");
    self->tags.push_back(tag ? static_cast<const String*>(slot(instance, tag->offset))->str() : "?");
    unref(instance);
    return true;
  }
};

class Handle : public ::testing::Test {
 protected:
  void open(const Provider_Registration* registration) {
    handle_ = std::make_unique<Provider_Handle>(registration);
    ASSERT_EQ(handle_->create_provider(), 0);
    ASSERT_EQ(handle_->load(), 0);
  }
  void TearDown() override {
    if (handle_) {
      handle_->unload();
      handle_->destroy_provider();
    }
  }
  std::unique_ptr<Provider_Handle> handle_;
};

TEST_F(Handle, GetInstanceFallsBackOnEnumeration) {
  open(&chip_registration);
  auto* model = chip("c2");
  Instance* found = nullptr;
  ASSERT_EQ(handle_->get_instance(model, found), GET_INSTANCE_OK);
  EXPECT_TRUE(key_eq(found, model));
  unref(found);
  model->Tag.set("nope");
  found = nullptr;
  EXPECT_EQ(handle_->get_instance(model, found), GET_INSTANCE_NOT_FOUND);
  EXPECT_EQ(found, nullptr);
  unref(model);
}

TEST_F(Handle, EnumerationAlwaysEndsWithAClosingCall) {
  open(&chip_registration);
  Collected got;
  EXPECT_EQ(handle_->enum_instances(nullptr, Collected::handle, &got), 0);
  EXPECT_EQ(got.tags, (std::vector<std::string>{"c1", "c2"}));
  EXPECT_EQ(got.closing_calls, 1);
  EXPECT_EQ(got.closing_status, 0);
}

// The closing call still comes, and no fallback built on the enumeration
// turns its failure into a success.
TEST_F(Handle, AThrowingEnumerationClosesAndFailsEveryFallback) {
  open(&throwing_chip_registration);
  Collected got;
  EXPECT_EQ(handle_->enum_instances(nullptr, Collected::handle, &got), -1);
  EXPECT_EQ(got.closing_calls, 1);
  EXPECT_EQ(got.closing_status, -1);
  auto* model = chip("c1");
  Instance* found = nullptr;
  EXPECT_EQ(handle_->get_instance(model, found), GET_INSTANCE_FAILED);
  EXPECT_EQ(found, nullptr);
  unref(model);

  TearDown();
  open(&throwing_containment_registration);
  auto* source = card("k1");
  Collected references;
  EXPECT_EQ(handle_->enum_references(source, nullptr, nullptr, Collected::handle, &references),
            ENUM_REFERENCES_FAILED);
  EXPECT_EQ(references.closing_status, ENUM_REFERENCES_FAILED);
  Collected names;
  EXPECT_EQ(handle_->enum_associator_names(source, nullptr, nullptr, nullptr, Collected::handle, &names),
            ENUM_ASSOCIATOR_NAMES_FAILED);
  EXPECT_EQ(names.closing_status, ENUM_ASSOCIATOR_NAMES_FAILED);
  unref(source);
}

TEST_F(Handle, ReferencesFallbackFindsTheAssociationsOfAnInstance) {
  open(&containment_registration);
  auto* source = card("k1");
  Collected got;
  EXPECT_EQ(handle_->enum_references(source, nullptr, nullptr, Collected::handle, &got), 0);
  EXPECT_EQ(got.tags.size(), 2u);
  EXPECT_EQ(got.closing_calls, 1);
  Collected with_wrong_role;
  EXPECT_EQ(handle_->enum_references(source, nullptr, "PartComponent", Collected::handle, &with_wrong_role), 0);
  EXPECT_TRUE(with_wrong_role.tags.empty());
  unref(source);
}

TEST_F(Handle, AssociatorNamesFallbackWalksToTheFarEnds) {
  open(&containment_registration);
  auto* source = card("k1");
  Collected got;
  EXPECT_EQ(handle_->enum_associator_names(source, nullptr, nullptr, nullptr, Collected::handle, &got), 0);
  EXPECT_EQ(got.tags, (std::vector<std::string>{"c1", "c2"}));

  Collected by_class;
  handle_->enum_associator_names(source, "CIM_Chip", "GroupComponent", "PartComponent", Collected::handle, &by_class);
  EXPECT_EQ(by_class.tags.size(), 2u) << "result class matches a superclass by name";

  Collected wrong_class;
  handle_->enum_associator_names(source, "NRVTAVO_Card", nullptr, nullptr, Collected::handle, &wrong_class);
  EXPECT_TRUE(wrong_class.tags.empty());

  Collected wrong_role;
  handle_->enum_associator_names(source, nullptr, "PartComponent", nullptr, Collected::handle, &wrong_role);
  EXPECT_TRUE(wrong_role.tags.empty());

  auto* part = chip("c3");
  Collected reverse;
  handle_->enum_associator_names(part, nullptr, nullptr, nullptr, Collected::handle, &reverse);
  EXPECT_EQ(reverse.tags, (std::vector<std::string>{"k2"}));
  unref(part);
  unref(source);
}

TEST_F(Handle, AssociationOperationsOnAPlainClassFail) {
  open(&chip_registration);
  auto* source = chip("c1");
  Collected got;
  EXPECT_EQ(handle_->enum_references(source, nullptr, nullptr, Collected::handle, &got), ENUM_REFERENCES_FAILED);
  EXPECT_EQ(handle_->enum_associator_names(source, nullptr, nullptr, nullptr, Collected::handle, &got),
            ENUM_ASSOCIATOR_NAMES_FAILED);
  EXPECT_EQ(handle_->enum_associators(source, nullptr, nullptr, nullptr, Collected::handle, &got), -1);
  unref(source);
}

TEST_F(Handle, MethodsAreFoundCaseInsensitively) {
  open(&port_registration);
  const Meta_Method* mm = find_method(&NRVTAVO_EthernetPort::static_meta_class, "RequestStateChange");
  ASSERT_NE(mm, nullptr);
  Instance* call = create(mm);
  EXPECT_EQ(handle_->invoke_method(nullptr, call), 0);
  auto* result = reinterpret_cast<Property<uint32>*>(slot(call, Port_Provider::last_offset(call)));
  EXPECT_EQ(result->value, 77u);
  unref(call);

  const Meta_Method* other = find_method(&NRVTAVO_EthernetPort::static_meta_class, "Reset");
  if (other) {
    Instance* unknown = create(other);
    EXPECT_EQ(handle_->invoke_method(nullptr, unknown), -1) << "a method the provider does not serve";
    unref(unknown);
  }
}

TEST(ProviderProc, RefusesOperationsOutsideTheTable) {
  void* provider = nullptr;
  auto proc = chip_registration.proc;
  ASSERT_EQ(proc(&chip_registration, OPERATION_CREATE_PROVIDER, &provider, 0, 0, 0, 0, 0, 0, 0), 0);
  for (int operation : {-1, 11, 12, 17, 1000})
    EXPECT_EQ(proc(&chip_registration, operation, provider, 0, 0, 0, 0, 0, 0, 0), -1) << operation;
  EXPECT_EQ(proc(&chip_registration, OPERATION_INVOKE_METHOD, provider, nullptr, nullptr, 0, 0, 0, 0, 0), -1);
  EXPECT_EQ(proc(nullptr, OPERATION_LOAD, provider, 0, 0, 0, 0, 0, 0, 0), -1);
  const Meta_Repository* repository = nullptr;
  EXPECT_EQ(proc(&chip_registration, OPERATION_GET_REPOSITORY, &repository, 0, 0, 0, 0, 0, 0, 0), 0);
  EXPECT_NE(repository, nullptr);
  EXPECT_EQ(proc(&chip_registration, OPERATION_DESTROY_PROVIDER, provider, 0, 0, 0, 0, 0, 0, 0), 0);
  EXPECT_EQ(proc(&chip_registration, OPERATION_DESTROY_PROVIDER, nullptr, 0, 0, 0, 0, 0, 0, 0), 0);
}

}  // namespace

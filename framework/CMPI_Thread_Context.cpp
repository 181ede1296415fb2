#include "framework/CMPI_Thread_Context.h"

#include "cmpimacs.h"
#include "framework/CMPI_Adapter.h"
#include "framework/Converter.h"
#include "framework/Trace_File.h"

namespace cimple {

namespace {

// Walks a CIMOM enumeration, converting only its CMPI instances into
// instances of the model's class.
class CMPI_Instance_Cursor : public Instance_Cursor {
 public:
  CMPI_Instance_Cursor(const CMPI_Env& env, const Meta_Class* mc, CMPI_Ptr<CMPIObjectPath> path,
                       CMPI_Ptr<CMPIEnumeration> enumeration)
      : name_space_(env.name_space),
        env_{env.broker, env.repository, name_space_.c_str()},
        mc_(mc),
        path_(std::move(path)),
        enumeration_(std::move(enumeration)) {}

  Instance* next() override {
    while (enumeration_ && CMHasNext(enumeration_.get(), nullptr)) {
      CMPIStatus rc{CMPI_RC_OK, nullptr};
      CMPIData data = CMGetNext(enumeration_.get(), &rc);
      if (rc.rc != CMPI_RC_OK) break;
      if (data.type != CMPI_instance || data.value.inst == nullptr) continue;
      Instance* instance = nullptr;
      if (make_cimple_instance(env_, mc_, nullptr, data.value.inst, instance) == CMPI_RC_OK) return instance;
    }
    return nullptr;
  }

 private:
  std::string name_space_;
  CMPI_Env env_;
  const Meta_Class* mc_;
  CMPI_Ptr<CMPIObjectPath> path_;
  CMPI_Ptr<CMPIEnumeration> enumeration_;
};

}  // namespace

CMPI_Thread_Context::CMPI_Thread_Context(const CMPIBroker* broker, const CMPIContext* context,
                                         CMPI_Adapter* adapter)
    : broker_(broker), context_(context), adapter_(adapter), repository_(adapter ? adapter->repository() : nullptr) {}

CMPI_Thread_Context::CMPI_Thread_Context(const CMPIBroker* broker, const CMPIContext* context,
                                         const Meta_Repository* repository)
    : broker_(broker), context_(context), adapter_(nullptr), repository_(repository) {}

Instance* CMPI_Thread_Context::get_instance(const char* name_space, const Instance* model) {
  if (name_space == nullptr || model == nullptr || broker_ == nullptr) return nullptr;
  CMPI_Ptr<CMPIObjectPath> path;
  if (make_cmpi_object_path(broker_, model, name_space, path) != CMPI_RC_OK) return nullptr;
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  CMPI_Ptr<CMPIInstance> found(CBGetInstance(broker_, context_, path.get(), nullptr, &rc));
  if (rc.rc != CMPI_RC_OK || !found) return nullptr;
  Instance* instance = nullptr;
  if (make_cimple_instance(CMPI_Env{broker_, repository_, name_space}, model->meta_class, path.get(), found.get(),
                           instance) != CMPI_RC_OK)
    return nullptr;
  return instance;
}

std::unique_ptr<Instance_Cursor> CMPI_Thread_Context::enum_instances(const char* name_space, const Instance* model) {
  if (name_space == nullptr || model == nullptr || broker_ == nullptr) return nullptr;
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  CMPI_Ptr<CMPIObjectPath> path(CMNewObjectPath(broker_, name_space, model->meta_class->name, &rc));
  if (!path || rc.rc != CMPI_RC_OK) return nullptr;
  CMPI_Ptr<CMPIEnumeration> enumeration(CBEnumInstances(broker_, context_, path.get(), nullptr, &rc));
  if (!enumeration || rc.rc != CMPI_RC_OK) return nullptr;
  return std::make_unique<CMPI_Instance_Cursor>(CMPI_Env{broker_, repository_, name_space}, model->meta_class,
                                                std::move(path), std::move(enumeration));
}

int CMPI_Thread_Context::create_instance(const char* name_space, const Instance* instance) {
  if (name_space == nullptr || instance == nullptr || broker_ == nullptr) return -1;
  CMPI_Ptr<CMPIObjectPath> path;
  CMPI_Ptr<CMPIInstance> cmpi_instance;
  if (make_cmpi_object_path(broker_, instance, name_space, path) != CMPI_RC_OK ||
      make_cmpi_instance(broker_, instance, name_space, path.get(), nullptr, cmpi_instance) != CMPI_RC_OK)
    return -1;
  CMPIStatus rc{CMPI_RC_OK, nullptr};
  CMPI_Ptr<CMPIObjectPath> created(CBCreateInstance(broker_, context_, path.get(), cmpi_instance.get(), &rc));
  return rc.rc == CMPI_RC_OK ? 0 : -1;
}

int CMPI_Thread_Context::modify_instance(const char* name_space, const Instance* instance) {
  if (name_space == nullptr || instance == nullptr || broker_ == nullptr) return -1;
  CMPI_Ptr<CMPIObjectPath> path;
  CMPI_Ptr<CMPIInstance> cmpi_instance;
  if (make_cmpi_object_path(broker_, instance, name_space, path) != CMPI_RC_OK ||
      make_cmpi_instance(broker_, instance, name_space, path.get(), nullptr, cmpi_instance) != CMPI_RC_OK)
    return -1;
  return CBModifyInstance(broker_, context_, path.get(), cmpi_instance.get(), nullptr).rc == CMPI_RC_OK ? 0 : -1;
}

int CMPI_Thread_Context::delete_instance(const char* name_space, const Instance* instance) {
  if (name_space == nullptr || instance == nullptr || broker_ == nullptr) return -1;
  CMPI_Ptr<CMPIObjectPath> path;
  if (make_cmpi_object_path(broker_, instance, name_space, path) != CMPI_RC_OK) return -1;
  return CBDeleteInstance(broker_, context_, path.get()).rc == CMPI_RC_OK ? 0 : -1;
}

bool CMPI_Thread_Context::get_username(std::string& user) {
  CMPIStatus rc{CMPI_RC_ERR_FAILED, nullptr};
  CMPIData data{};
  if (context_) data = CMGetContextEntry(context_, CMPIPrincipal, &rc);
  const char* chars = nullptr;
  if (rc.rc == CMPI_RC_OK && !(data.state & CMPI_nullValue)) {
    if (data.type == CMPI_string && data.value.string) chars = CMGetCharsPtr(data.value.string, nullptr);
    else if (data.type == CMPI_chars) chars = data.value.chars;
  }
  if (chars == nullptr) {
    CIMPLE_ERR("username not OK cmpirc=%d", static_cast<int>(rc.rc != CMPI_RC_OK ? rc.rc : CMPI_RC_ERR_FAILED));
    return false;
  }
  user = chars;
  return true;
}

// A started thread has no provider of its own to keep loaded.
void CMPI_Thread_Context::allow_unload(bool flag) {
  if (adapter_) adapter_->set_unload_allowed(flag);
}

// The new thread may outlive the adapter of this call: it gets no adapter.
Thread_Context* CMPI_Thread_Context::new_thread_context() {
  if (broker_ == nullptr) return nullptr;
  CMPIContext* context = CBPrepareAttachThread(broker_, context_);
  if (context == nullptr) return nullptr;
  return new CMPI_Thread_Context(broker_, context, repository_);
}

void CMPI_Thread_Context::thread_attach() { CBAttachThread(broker_, context_); }

void CMPI_Thread_Context::thread_detach() { CBDetachThread(broker_, context_); }

}  // namespace cimple

// Host: module loading, request routing with the shutdown gate, and the C++ operation API.
#include "host/Host.h"

#include <algorithm>
#include <cstdlib>
#include <filesystem>

#include "host/MiInvoker.h"

namespace nrv::host {

namespace {

constexpr const char* kDefaultModule = "build/lib/libnorvane_tavo_provider.so";

Result toResult(Outcome outcome) {
  Result r;
  r.rc = outcome.rc;
  r.message = std::move(outcome.message);
  r.instances.reserve(std::count_if(outcome.items.begin(), outcome.items.end(),
                                    [](const Datum& item) { return item.type == CMPI_instance; }));
  for (auto& item : outcome.items) {
    if (item.isNull) continue;
    if (item.type == CMPI_instance) {
      // Every instance the host stores is made non-const (Datum::embedded), so the sole
      // holder may move it out instead of copying it.
      if (item.holdsAlone())
        r.instances.push_back(std::move(const_cast<InstanceData&>(*item.instance())));
      else
        r.instances.push_back(*item.instance());
    } else if (item.type == CMPI_ref) {
      r.paths.push_back(*item.path());
    }
  }
  r.returnValue = std::move(outcome.returnValue);
  r.outArgs = std::move(outcome.outArgs);
  return r;
}

// An explicitly named file, else the default beside the module if it exists; nullopt: none.
std::optional<std::string> chosenFile(const std::optional<std::string>& option,
                                      const std::optional<std::string>& shareDir,
                                      const std::string& name) {
  if (option) return option->empty() ? std::nullopt : option;
  if (!shareDir || !std::filesystem::exists(*shareDir + "/" + name)) return std::nullopt;
  return *shareDir + "/" + name;
}

// Reads an optional file with T::read; a failure goes to `error` and leaves none.
template <typename T>
std::unique_ptr<T> readOptional(const std::optional<std::string>& path, std::string& error) {
  if (!path) return nullptr;
  auto read = T::read(*path);
  if (auto* e = std::get_if<std::string>(&read)) {
    error += (error.empty() ? "" : "; ") + *e;
    return nullptr;
  }
  return std::make_unique<T>(std::get<T>(std::move(read)));
}

std::string moduleName(const std::string& modulePath) {
  std::string name = std::filesystem::path(modulePath).filename().string();
  if (name.rfind("lib", 0) == 0) name.erase(0, 3);
  if (const size_t so = name.find(".so"); so != std::string::npos) name.resize(so);
  return name;
}

Request requestFor(Operation op, const PathData& path) {
  Request r;
  r.op = op;
  r.path = path;
  return r;
}

void applyFilter(Request& r, const AssocFilter& f) {
  r.assocClass = f.assocClass;
  r.resultClass = f.resultClass;
  r.role = f.role;
  r.resultRole = f.resultRole;
}

}  // namespace

std::string Result::errorText() const {
  return message.empty() ? rcName(rc) : rcName(rc) + " : " + message;
}

std::string Host::defaultModulePath() {
  const char* env = std::getenv("NRV_MODULE");
  return (env != nullptr && *env != '\0') ? env : kDefaultModule;
}

Host::Host(const std::string& modulePath) : Host(modulePath, Options{}) {}

std::optional<std::string> Host::shareDirFor(const std::string& modulePath) {
  const std::filesystem::path dir = std::filesystem::path(modulePath).parent_path();
  const std::string name = moduleName(modulePath);
  for (const auto& candidate : {dir / ".." / "share" / name, dir / ".." / ".." / "share" / name}) {
    std::error_code ec;
    if (std::filesystem::is_directory(candidate, ec)) return candidate.lexically_normal().string();
  }
  return std::nullopt;
}

Host::Host(const std::string& modulePath, Options options)
    : broker_(std::make_unique<Broker>(*this)),
      platform_(options.platformFile),
      cleanup_(options.cleanup) {
  auto opened = ModuleLoader::open(modulePath);
  if (auto* loader = std::get_if<std::unique_ptr<ModuleLoader>>(&opened)) {
    module_ = std::move(*loader);
    table_ = std::make_unique<ProviderTable>(*module_, broker_->cmpi());
  } else {
    loadError_ = std::get<std::string>(opened);
    return;
  }
  const auto share = shareDirFor(modulePath);
  const std::string name = moduleName(modulePath);
  registration_ = readOptional<Registration>(
      chosenFile(options.registrationFile, share, name + ".reg"), catalogError_);
  repository_ = readOptional<ClassRepository>(
      chosenFile(options.repositoryFile, share, "repository.json"), catalogError_);
  dispatch_ = std::make_unique<Dispatch>(*module_, registration_.get(), repository_.get());
}

KeySchema Host::keySchema() const { return repository_ ? repository_->keySchema() : KeySchema{}; }

Host::~Host() {
  shutdown();
  // A thread the module attached and never detached still runs module code: unmapping the
  // module under it would crash the process, so it stays mapped.
  if (module_ && broker_->attachedThreads() > 0) module_->pin();
  // The module goes before the broker: its static destructors may still release objects.
  dispatch_.reset();
  table_.reset();
  module_.reset();
  broker_.reset();
}

bool Host::enter() {
  std::lock_guard<std::mutex> lock(gateMu_);
  if (shut_) return false;
  ++inFlight_;
  return true;
}

void Host::leave() {
  std::lock_guard<std::mutex> lock(gateMu_);
  if (--inFlight_ == 0) gateCv_.notify_all();
}

void Host::shutdown() {
  {
    std::unique_lock<std::mutex> lock(gateMu_);
    if (shut_) return;
    shut_ = true;
    gateCv_.wait(lock, [this] { return inFlight_ == 0; });
  }
  if (table_) {
    cleanups_ = table_->cleanupAll(Broker::requestContext(kDefaultNameSpace),
                                   cleanup_ == Cleanup::OncePerMiType);
  }
}

Outcome Host::route(const Request& incoming) {
  if (!enter()) return Outcome::failure(CMPI_RC_ERR_FAILED, "host is shut down");
  Request request = incoming;
  if (request.context.empty()) request.context = Broker::requestContext(request.path.nameSpace);
  Outcome out;
  if (request.path.className.empty()) {
    out = Outcome::failure(CMPI_RC_ERR_INVALID_PARAMETER, "object path without a class name");
  } else if (platform_.serves(request.path)) {
    out = platform_.serve(request);
  } else if (!module_) {
    out = Outcome::failure(CMPI_RC_ERR_FAILED, "provider module not loaded: " + loadError_);
  } else {
    out = invokeMi(*table_, *dispatch_, broker_->cmpi(), request);
  }
  leave();
  return out;
}

Result Host::execute(Request request) { return toResult(route(request)); }

Result Host::enumerateInstances(const std::string& ns, const std::string& className,
                                PropertyList properties) {
  PathData path;
  path.nameSpace = ns;
  path.className = className;
  Request r = requestFor(Operation::EnumerateInstances, path);
  r.properties = std::move(properties);
  return execute(std::move(r));
}

Result Host::enumerateInstanceNames(const std::string& ns, const std::string& className) {
  PathData path;
  path.nameSpace = ns;
  path.className = className;
  return execute(requestFor(Operation::EnumerateInstanceNames, path));
}

Result Host::getInstance(const PathData& path, PropertyList properties) {
  Request r = requestFor(Operation::GetInstance, path);
  r.properties = std::move(properties);
  return execute(std::move(r));
}

Result Host::createInstance(const HostInstance& instance) {
  Request r = requestFor(Operation::CreateInstance, instance.path);
  r.instance = instance;
  return execute(std::move(r));
}

Result Host::modifyInstance(const HostInstance& instance, PropertyList properties) {
  Request r = requestFor(Operation::ModifyInstance, instance.path);
  r.instance = instance;
  r.properties = std::move(properties);
  return execute(std::move(r));
}

Result Host::deleteInstance(const PathData& path) {
  return execute(requestFor(Operation::DeleteInstance, path));
}

Result Host::invokeMethod(const PathData& path, const std::string& method, NamedData inArgs) {
  Request r = requestFor(Operation::InvokeMethod, path);
  r.method = method;
  r.inArgs = std::move(inArgs);
  return execute(std::move(r));
}

Result Host::associators(const PathData& path, const AssocFilter& filter,
                         PropertyList properties) {
  Request r = requestFor(Operation::Associators, path);
  applyFilter(r, filter);
  r.properties = std::move(properties);
  return execute(std::move(r));
}

Result Host::associatorNames(const PathData& path, const AssocFilter& filter) {
  Request r = requestFor(Operation::AssociatorNames, path);
  applyFilter(r, filter);
  return execute(std::move(r));
}

Result Host::references(const PathData& path, const AssocFilter& filter,
                        PropertyList properties) {
  Request r = requestFor(Operation::References, path);
  applyFilter(r, filter);
  r.properties = std::move(properties);
  return execute(std::move(r));
}

Result Host::referenceNames(const PathData& path, const AssocFilter& filter) {
  Request r = requestFor(Operation::ReferenceNames, path);
  applyFilter(r, filter);
  return execute(std::move(r));
}

std::vector<std::string> Host::factorySymbols() const {
  return module_ ? module_->factorySymbols() : std::vector<std::string>{};
}

bool Host::resolves(const std::string& symbol) const {
  return module_ != nullptr && module_->symbol(symbol) != nullptr;
}

ClassMis Host::mis(const std::string& className) {
  ClassMis out;
  if (!table_ || !enter()) return out;
  const NamedData ctx = Broker::requestContext(kDefaultNameSpace);
  auto get = [&](MiKind kind) -> void* {
    auto mi = table_->mi(className, kind, ctx);
    auto* p = std::get_if<void*>(&mi);
    return p == nullptr ? nullptr : *p;
  };
  out.instance = static_cast<CMPIInstanceMI*>(get(MiKind::Instance));
  out.method = static_cast<CMPIMethodMI*>(get(MiKind::Method));
  out.association = static_cast<CMPIAssociationMI*>(get(MiKind::Association));
  leave();
  return out;
}

std::vector<LoadedMi> Host::loadedMis() const {
  return table_ ? table_->loaded() : std::vector<LoadedMi>{};
}

}  // namespace nrv::host

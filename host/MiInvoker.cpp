// MiInvoker: request to MI call, MI answer to Outcome.
#include "host/MiInvoker.h"

#include "host/EncObjects.h"

namespace nrv::host {

namespace {

// The CMPI objects of one call.
struct CallFrame {
  const CMPIBroker* mb;
  CMPIContext* ctx;
  std::shared_ptr<ResultSink> sink = std::make_shared<ResultSink>();
  CMPIResult* rslt;
  CMPIObjectPath* op;
  std::vector<const char*> props;  // null-terminated, empty for "all properties"

  CallFrame(const CMPIBroker* broker, const Request& r)
      : mb(broker),
        ctx(makeContext(broker, r.context)),
        rslt(makeResult(broker, sink)),
        op(makeObjectPath(broker, r.path)) {
    if (r.properties) {
      for (const auto& p : *r.properties) props.push_back(p.c_str());
      props.push_back(nullptr);
    }
  }
  const char** propertyList() { return props.empty() ? nullptr : props.data(); }
};

const char* cstr(const std::optional<std::string>& s) { return s ? s->c_str() : nullptr; }

Outcome finish(CallFrame& frame, CMPIStatus st) {
  Outcome out;
  out.rc = st.rc;
  if (auto text = stringOf(st.msg)) out.message = *text;
  std::lock_guard<std::mutex> lock(frame.sink->mu);
  out.items = std::move(frame.sink->items);
  out.done = frame.sink->done;
  return out;
}

Outcome notSupported(const Request& r) {
  return Outcome::failure(CMPI_RC_ERR_NOT_SUPPORTED,
                          std::string(operationName(r.op)) + " is not supported by the provider");
}

Outcome callInstanceMi(CMPIInstanceMI* mi, const CMPIBroker* mb, const Request& r) {
  const CMPIInstanceMIFT* ft = mi->ft;
  CallFrame f(mb, r);
  CMPIStatus st{CMPI_RC_ERR_NOT_SUPPORTED, nullptr};
  switch (r.op) {
    case Operation::EnumerateInstanceNames:
      if (ft->enumerateInstanceNames == nullptr) return notSupported(r);
      st = ft->enumerateInstanceNames(mi, f.ctx, f.rslt, f.op);
      break;
    case Operation::EnumerateInstances:
      if (ft->enumerateInstances == nullptr) return notSupported(r);
      st = ft->enumerateInstances(mi, f.ctx, f.rslt, f.op, f.propertyList());
      break;
    case Operation::GetInstance:
      if (ft->getInstance == nullptr) return notSupported(r);
      st = ft->getInstance(mi, f.ctx, f.rslt, f.op, f.propertyList());
      break;
    case Operation::CreateInstance: {
      if (ft->createInstance == nullptr) return notSupported(r);
      CMPIInstance* inst = makeInstance(mb, r.instance);
      st = ft->createInstance(mi, f.ctx, f.rslt, f.op, inst);
      break;
    }
    case Operation::ModifyInstance: {
      if (ft->modifyInstance == nullptr) return notSupported(r);
      CMPIInstance* inst = makeInstance(mb, r.instance);
      st = ft->modifyInstance(mi, f.ctx, f.rslt, f.op, inst, f.propertyList());
      break;
    }
    case Operation::DeleteInstance:
      if (ft->deleteInstance == nullptr) return notSupported(r);
      st = ft->deleteInstance(mi, f.ctx, f.rslt, f.op);
      break;
    case Operation::ExecQuery:
      if (ft->execQuery == nullptr) return notSupported(r);
      st = ft->execQuery(mi, f.ctx, f.rslt, f.op, r.query.c_str(), r.queryLanguage.c_str());
      break;
    default:
      return notSupported(r);
  }
  return finish(f, st);
}

Outcome callMethodMi(CMPIMethodMI* mi, const CMPIBroker* mb, const Request& r) {
  if (mi->ft->invokeMethod == nullptr) return notSupported(r);
  CallFrame f(mb, r);
  CMPIArgs* in = makeArgs(mb, r.inArgs);
  CMPIArgs* out = makeArgs(mb, {});
  const CMPIStatus st = mi->ft->invokeMethod(mi, f.ctx, f.rslt, f.op, r.method.c_str(), in, out);
  Outcome o = finish(f, st);
  o.outArgs = argsOf(out).value_or(NamedData{});
  // The return value travels through returnData.
  if (!o.items.empty()) o.returnValue = o.items.front();
  return o;
}

Outcome callAssociationMi(CMPIAssociationMI* mi, const CMPIBroker* mb, const Request& r,
                          const std::string& assocClass) {
  const CMPIAssociationMIFT* ft = mi->ft;
  CallFrame f(mb, r);
  CMPIStatus st{CMPI_RC_ERR_NOT_SUPPORTED, nullptr};
  const char* ac = assocClass.c_str();
  switch (r.op) {
    case Operation::Associators:
      if (ft->associators == nullptr) return notSupported(r);
      st = ft->associators(mi, f.ctx, f.rslt, f.op, ac, cstr(r.resultClass), cstr(r.role),
                           cstr(r.resultRole), f.propertyList());
      break;
    case Operation::AssociatorNames:
      if (ft->associatorNames == nullptr) return notSupported(r);
      st = ft->associatorNames(mi, f.ctx, f.rslt, f.op, ac, cstr(r.resultClass), cstr(r.role),
                               cstr(r.resultRole));
      break;
    case Operation::References:
      if (ft->references == nullptr) return notSupported(r);
      st = ft->references(mi, f.ctx, f.rslt, f.op, cstr(r.resultClass), cstr(r.role),
                          f.propertyList());
      break;
    case Operation::ReferenceNames:
      if (ft->referenceNames == nullptr) return notSupported(r);
      st = ft->referenceNames(mi, f.ctx, f.rslt, f.op, cstr(r.resultClass), cstr(r.role));
      break;
    default:
      return notSupported(r);
  }
  return finish(f, st);
}

// Association request for one association class.
Outcome associationFor(ProviderTable& table, const CMPIBroker* mb, const Request& r,
                       const std::string& assocClass) {
  auto mi = table.mi(assocClass, MiKind::Association, r.context);
  if (auto* failure = std::get_if<Outcome>(&mi)) return std::move(*failure);
  return callAssociationMi(static_cast<CMPIAssociationMI*>(std::get<void*>(mi)), mb, r,
                           assocClass);
}

// A non-association request to the provider of its path's class.
Outcome callFor(ProviderTable& table, const CMPIBroker* broker, const Request& request) {
  if (request.op == Operation::InvokeMethod) {
    auto mi = table.mi(request.path.className, MiKind::Method, request.context);
    if (auto* failure = std::get_if<Outcome>(&mi)) return std::move(*failure);
    return callMethodMi(static_cast<CMPIMethodMI*>(std::get<void*>(mi)), broker, request);
  }
  auto mi = table.mi(request.path.className, MiKind::Instance, request.context);
  if (auto* failure = std::get_if<Outcome>(&mi)) return std::move(*failure);
  return callInstanceMi(static_cast<CMPIInstanceMI*>(std::get<void*>(mi)), broker, request);
}

}  // namespace

Outcome invokeMi(ProviderTable& table, const Dispatch& dispatch, const CMPIBroker* broker,
                 const Request& request) {
  ArenaScope scope;
  auto targets = dispatch.targets(request);
  if (auto* failure = std::get_if<Outcome>(&targets)) return std::move(*failure);
  const bool association = isAssociationOperation(request.op);
  const bool tolerant = association && !dispatch.registered();
  Outcome merged;
  std::optional<Outcome> firstFailure;
  bool anySuccess = false;
  for (const auto& cls : std::get<std::vector<std::string>>(targets)) {
    Outcome o;
    if (association) {
      o = associationFor(table, broker, request, cls);
    } else {
      Request own = request;
      own.path.className = cls;
      o = callFor(table, broker, own);
    }
    if (!o.ok()) {
      if (!tolerant) return o;
      if (!firstFailure) firstFailure = std::move(o);
      continue;
    }
    anySuccess = true;
    if (merged.items.empty()) {
      merged = std::move(o);
    } else {
      for (auto& item : o.items) merged.items.push_back(std::move(item));
    }
  }
  if (!anySuccess && firstFailure) return std::move(*firstFailure);
  return merged;
}

}  // namespace nrv::host

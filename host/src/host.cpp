// Provider loading, MI creation as each server flavour does it, the CIM
// operations, filters and indication delivery.
#include <dlfcn.h>

#include <algorithm>
#include <cctype>
#include <cstring>

#include "cimhost/text.h"
#include "internal.h"

namespace cimhost {

using namespace detail;

namespace {

const char* const kMiNames[4] = {"Instance", "Association", "Method", "Indication"};

struct RcRow {
    int rc;
    const char* name;
};

const RcRow kRcNames[] = {
    {CMPI_RC_OK, "CMPI_RC_OK"},
    {CMPI_RC_ERR_FAILED, "CMPI_RC_ERR_FAILED"},
    {CMPI_RC_ERR_ACCESS_DENIED, "CMPI_RC_ERR_ACCESS_DENIED"},
    {CMPI_RC_ERR_INVALID_NAMESPACE, "CMPI_RC_ERR_INVALID_NAMESPACE"},
    {CMPI_RC_ERR_INVALID_PARAMETER, "CMPI_RC_ERR_INVALID_PARAMETER"},
    {CMPI_RC_ERR_INVALID_CLASS, "CMPI_RC_ERR_INVALID_CLASS"},
    {CMPI_RC_ERR_NOT_FOUND, "CMPI_RC_ERR_NOT_FOUND"},
    {CMPI_RC_ERR_NOT_SUPPORTED, "CMPI_RC_ERR_NOT_SUPPORTED"},
    {CMPI_RC_ERR_CLASS_HAS_CHILDREN, "CMPI_RC_ERR_CLASS_HAS_CHILDREN"},
    {CMPI_RC_ERR_CLASS_HAS_INSTANCES, "CMPI_RC_ERR_CLASS_HAS_INSTANCES"},
    {CMPI_RC_ERR_INVALID_SUPERCLASS, "CMPI_RC_ERR_INVALID_SUPERCLASS"},
    {CMPI_RC_ERR_ALREADY_EXISTS, "CMPI_RC_ERR_ALREADY_EXISTS"},
    {CMPI_RC_ERR_NO_SUCH_PROPERTY, "CMPI_RC_ERR_NO_SUCH_PROPERTY"},
    {CMPI_RC_ERR_TYPE_MISMATCH, "CMPI_RC_ERR_TYPE_MISMATCH"},
    {CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED, "CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED"},
    {CMPI_RC_ERR_INVALID_QUERY, "CMPI_RC_ERR_INVALID_QUERY"},
    {CMPI_RC_ERR_METHOD_NOT_AVAILABLE, "CMPI_RC_ERR_METHOD_NOT_AVAILABLE"},
    {CMPI_RC_ERR_METHOD_NOT_FOUND, "CMPI_RC_ERR_METHOD_NOT_FOUND"},
    {CMPI_RC_DO_NOT_UNLOAD, "CMPI_RC_DO_NOT_UNLOAD"},
    {CMPI_RC_NEVER_UNLOAD, "CMPI_RC_NEVER_UNLOAD"},
    {CMPI_RC_ERR_INVALID_HANDLE, "CMPI_RC_ERR_INVALID_HANDLE"},
    {CMPI_RC_ERR_INVALID_DATA_TYPE, "CMPI_RC_ERR_INVALID_DATA_TYPE"},
    {CMPI_RC_ERROR_SYSTEM, "CMPI_RC_ERROR_SYSTEM"},
    {CMPI_RC_ERROR, "CMPI_RC_ERROR"},
};

using InstFactory = CMPIInstanceMI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);
using AssocFactory = CMPIAssociationMI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);
using MethFactory = CMPIMethodMI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);
using IndFactory = CMPIIndicationMI* (*)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);

void* callFactory(MiType t, void* sym, const CMPIBroker* b, const CMPIContext* ctx, CMPIStatus* st) {
    switch (t) {
        case MiType::Instance: return reinterpret_cast<InstFactory>(sym)(b, ctx, st);
        case MiType::Association: return reinterpret_cast<AssocFactory>(sym)(b, ctx, st);
        case MiType::Method: return reinterpret_cast<MethFactory>(sym)(b, ctx, st);
        case MiType::Indication: return reinterpret_cast<IndFactory>(sym)(b, ctx, st);
    }
    return nullptr;
}

CMPIStatus callCleanup(const MiEntry& e, const CMPIContext* ctx, bool terminating) {
    const CMPIBoolean term = terminating ? 1 : 0;
    switch (e.type) {
        case MiType::Instance: {
            auto* mi = static_cast<CMPIInstanceMI*>(e.mi);
            return mi->ft->cleanup(mi, ctx, term);
        }
        case MiType::Association: {
            auto* mi = static_cast<CMPIAssociationMI*>(e.mi);
            return mi->ft->cleanup(mi, ctx, term);
        }
        case MiType::Method: {
            auto* mi = static_cast<CMPIMethodMI*>(e.mi);
            return mi->ft->cleanup(mi, ctx, term);
        }
        case MiType::Indication: {
            auto* mi = static_cast<CMPIIndicationMI*>(e.mi);
            return mi->ft->cleanup(mi, ctx, term);
        }
    }
    CMPIStatus s{CMPI_RC_ERR_FAILED, nullptr};
    return s;
}

std::string msgOf(const CMPIStatus& st) { return st.msg ? stringOf(st.msg) : std::string(); }

// Property list as the NULL-terminated array CMPI takes.
struct CList {
    explicit CList(const PropertyList& pl) {
        if (!pl) return;
        for (const auto& s : *pl) ptrs.push_back(s.c_str());
        ptrs.push_back(nullptr);
    }
    const char** get() { return ptrs.empty() ? nullptr : ptrs.data(); }
    std::vector<const char*> ptrs;
};

const char* orNull(const std::string& s) { return s.empty() ? nullptr : s.c_str(); }

std::string lowerCase(std::string s) {
    for (auto& c : s) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return s;
}

}  // namespace

const char* rcName(int rc) {
    for (const auto& r : kRcNames)
        if (r.rc == rc) return r.name;
    return "CMPI_RC_UNKNOWN";
}

std::string statusLine(const Status& s) {
    std::string line = rcName(s.rc);
    if (!s.message.empty()) line += ": " + s.message;
    return line;
}

bool flavourFromName(const std::string& name, Flavour& out) {
    if (namesEqual(name, "pegasus")) out = Flavour::Pegasus;
    else if (namesEqual(name, "sfcb")) out = Flavour::Sfcb;
    else return false;
    return true;
}

const char* flavourName(Flavour f) { return f == Flavour::Sfcb ? "sfcb" : "pegasus"; }

const char* miTypeName(MiType t) { return kMiNames[static_cast<int>(t)]; }

// ---------------------------------------------------------------- Impl

Host::Impl::Impl() : lifeArena(std::make_unique<Arena>(0)) {
    Tables& t = tables();
    broker.hdl = this;
    broker.bft = &t.bft;
    broker.eft = &t.eft;
    broker.xft = &t.xft;
    broker.mft = &t.mft;
}

Host::Impl::~Impl() = default;

void Host::Impl::event(const std::string& e) {
    std::lock_guard<std::mutex> g(counterLock);
    counters.events.push_back(e);
}

void Host::Impl::log(const std::string& line) {
    std::function<void(const std::string&)> sink;
    {
        std::lock_guard<std::mutex> g(logLock);
        logLines.push_back(line);
        if (logLines.size() > 10000) logLines.pop_front();
        sink = logSink;
    }
    if (sink) sink(line);
}

void Host::Impl::finishStrict(OpResult& r) const {
    if (!strict || r.strictErrors.empty() || r.rc != CMPI_RC_OK) return;
    r.rc = CMPI_RC_ERR_FAILED;
    r.message = "strict check: " + r.strictErrors.front();
    if (r.strictErrors.size() > 1) r.message += " (and " + std::to_string(r.strictErrors.size() - 1) + " more)";
}

std::string Host::Impl::sectionFor(const std::string& cls, MiType type) const {
    auto hasType = [&](const std::string& c) {
        if (!registrations.empty()) {
            for (const auto& r : registrations) {
                if (!namesEqual(r.className, c)) continue;
                for (MiType t : r.types)
                    if (t == type) return true;
            }
            return false;
        }
        const ClassDecl* d = repo.find(c);
        if (!d) return false;
        switch (type) {
            case MiType::Instance: return !d->indication;
            case MiType::Association: return d->association;
            case MiType::Method: return !d->methods.empty();
            case MiType::Indication: return d->indication;
        }
        return false;
    };
    std::string cur = cls;
    for (int guard = 0; guard < 64 && !cur.empty(); ++guard) {
        if (hasType(cur)) {
            const ClassDecl* d = repo.find(cur);
            return d ? d->name : cur;
        }
        const ClassDecl* d = repo.find(cur);
        if (!d) break;
        cur = d->superClass;
    }
    return std::string();
}

std::vector<std::string> Host::Impl::associationClassesFor(const std::string& sourceClass,
                                                           const std::string& named) const {
    // The provider's association classes: those its registration serves as
    // associations, or without one every concrete association class that no
    // other class of the repository derives from (a schema class with
    // subclasses of the provider is not the provider's).
    std::vector<std::string> own;
    const std::vector<std::string> all = repo.classNames();
    if (!registrations.empty()) {
        for (const auto& r : registrations)
            if (std::find(r.types.begin(), r.types.end(), MiType::Association) != r.types.end())
                own.push_back(r.className);
    } else {
        std::set<std::string> parents;   // lower case
        for (const auto& c : all) {
            const ClassDecl* d = repo.find(c);
            if (d && !d->superClass.empty()) parents.insert(lowerCase(d->superClass));
        }
        for (const auto& c : all) {
            const ClassDecl* d = repo.find(c);
            if (d && d->association && !d->abstract && !parents.count(lowerCase(c))) own.push_back(c);
        }
    }
    std::vector<std::string> out;
    for (const auto& c : own) {
        if (!named.empty() && !repo.isA(c, named)) continue;
        bool refersToSource = false;
        for (const auto& p : repo.allProperties(c))
            refersToSource = refersToSource || (!p.refClass.empty() && repo.isA(sourceClass, p.refClass));
        if (refersToSource) out.push_back(c);
    }
    return out;
}

void* Host::Impl::getMi(MiType type, const std::string& cls, OpResult& r) {
    std::lock_guard<std::mutex> g(miLock);
    const int t = static_cast<int>(type);
    if (!lib) {
        r.rc = CMPI_RC_ERR_FAILED;
        r.message = "no provider is loaded";
        return nullptr;
    }
    if (!factories[t]) {
        r.rc = CMPI_RC_ERR_NOT_SUPPORTED;
        r.message = "provider " + name + " has no " + name + "_Create_" + kMiNames[t] + "MI";
        return nullptr;
    }
    const std::string section = flavour == Flavour::Sfcb ? sectionFor(cls, type) : std::string();
    for (const auto& e : mis)
        if (e.type == type && e.section == section) return e.mi;
    EncContext* ctx = newContext(this, defaultNs);
    CMPIStatus st{CMPI_RC_OK, nullptr};
    void* mi = callFactory(type, factories[t], &broker, &ctx->enc, &st);
    {
        std::lock_guard<std::mutex> c(counterLock);
        counters.factoryCalls[t]++;
        counters.events.push_back(std::string("factory ") + kMiNames[t] +
                                  (section.empty() ? std::string() : " " + section));
    }
    if (!mi) {
        r.rc = st.rc != CMPI_RC_OK ? st.rc : CMPI_RC_ERR_FAILED;
        r.message = name + "_Create_" + kMiNames[t] + "MI returned no MI";
        const std::string m = msgOf(st);
        if (!m.empty()) r.message += ": " + m;
        return nullptr;
    }
    mis.push_back(MiEntry{type, section, mi});
    return mi;
}

void Host::Impl::deliver(const std::string& ns, Instance inst, bool serverThread) {
    // OpenPegasus takes the namespace from the indication's own path.
    const std::string target =
        flavour == Flavour::Pegasus && !inst.path.nameSpace.empty() ? inst.path.nameSpace : ns;
    Indication ind;
    ind.nameSpace = target;
    ind.deliveredTo = ns;
    ind.instance = std::move(inst);
    ind.instance.path = instancePath(this, ind.instance);
    if (strict) ind.error = checkInstance(repo, ind.instance);
    // A real server may crash on a broker call from a thread it does not know.
    if (!serverThread) {
        const std::string fault = "deliverIndication on a thread that is neither a request thread nor attached";
        log("cimhost: " + fault);
        {
            std::lock_guard<std::mutex> g(counterLock);
            counters.indicationsFromUnattachedThreads++;
        }
        if (strict) ind.error = ind.error.empty() ? fault : ind.error + "; " + fault;
    }
    std::function<void(const Indication&)> l;
    bool matched = false;
    {
        std::lock_guard<std::mutex> g(indLock);
        for (const auto& f : filters) {
            // sfcb hands an indication to every filter active on the provider
            // whose class it is, and looks at no namespace; OpenPegasus also
            // wants the filter's source namespace.
            const bool nsMatches = flavour == Flavour::Sfcb || namesEqual(f.sourceNs, target);
            if (nsMatches && repo.isA(ind.instance.className(), f.fromClass)) {
                matched = true;
                break;
            }
        }
        if (matched) {
            queue.push_back(ind);
            l = listener;
        }
    }
    {
        std::lock_guard<std::mutex> g(counterLock);
        if (matched) counters.indicationsDelivered++;
        else counters.indicationsDropped++;
    }
    if (!matched) return;
    indCv.notify_all();
    if (l) l(ind);
}

// ---------------------------------------------------------------- Host

Host::Host() : impl_(std::make_unique<Impl>()) {}

Host::~Host() {
    try {
        unload(true);
    } catch (...) {
    }
    impl_->freeAllArenas();
}

void Host::setFlavour(Flavour f) { impl_->flavour = f; }
Flavour Host::flavour() const { return impl_->flavour; }
void Host::setStrict(bool on) { impl_->strict = on; }
bool Host::strict() const { return impl_->strict; }
void Host::setRefuseEmptyGetInstance(bool on) { impl_->refuseEmptyGetInstance = on; }
void Host::setMissingKeyMessage(bool on) { impl_->missingKeyMessage = on; }
void Host::setDefaultNamespace(const std::string& ns) { impl_->defaultNs = ns; }
const std::string& Host::defaultNamespace() const { return impl_->defaultNs; }
ClassRepository& Host::classes() { return impl_->repo; }
const ClassRepository& Host::classes() const { return impl_->repo; }

Status Host::loadMof(const std::string& fileOrDir) {
    Status s;
    std::string err;
    if (!impl_->repo.loadPath(fileOrDir, err)) {
        s.rc = CMPI_RC_ERR_FAILED;
        s.message = "MOF: " + err;
    }
    return s;
}

void Host::setRegistrations(std::vector<Registration> regs) { impl_->registrations = std::move(regs); }

Status Host::load(const std::string& libraryPath, const std::string& providerName) {
    std::unique_lock<std::shared_mutex> lk(impl_->opLock);
    Status s;
    Impl& c = *impl_;
    if (c.lib) {
        s.rc = CMPI_RC_ERR_FAILED;
        s.message = "provider " + c.name + " is already loaded";
        return s;
    }
    if (providerName.empty()) {
        s.rc = CMPI_RC_ERR_INVALID_PARAMETER;
        s.message = "no provider name (factory prefix) given";
        return s;
    }
    dlerror();
    void* lib = dlopen(libraryPath.c_str(), RTLD_NOW | RTLD_LOCAL);
    if (!lib) {
        const char* e = dlerror();
        s.rc = CMPI_RC_ERR_FAILED;
        s.message = "cannot load " + libraryPath + ": " + (e ? e : "unknown error");
        return s;
    }
    void* found[4] = {nullptr, nullptr, nullptr, nullptr};
    std::string generic;
    int named = 0;
    for (int t = 0; t < 4; ++t) {
        found[t] = dlsym(lib, (providerName + "_Create_" + kMiNames[t] + "MI").c_str());
        if (found[t]) ++named;
        const std::string g = std::string("_Generic_Create_") + kMiNames[t] + "MI";
        if (dlsym(lib, g.c_str()) && generic.empty()) generic = g;
    }
    if (!generic.empty() && named > 0) {
        dlclose(lib);
        s.rc = CMPI_RC_ERR_FAILED;
        s.message = libraryPath + " exports " + generic + " beside " + providerName +
                    "_Create_*MI; a library with both is refused";
        return s;
    }
    if (named == 0) {
        dlclose(lib);
        s.rc = CMPI_RC_ERR_FAILED;
        s.message = libraryPath + " exports no " + providerName + "_Create_<Instance|Association|Method|Indication>MI";
        return s;
    }
    {
        std::lock_guard<std::mutex> g(c.miLock);
        c.lib = lib;
        c.libPath = libraryPath;
        c.name = providerName;
        for (int t = 0; t < 4; ++t) c.factories[t] = found[t];
    }
    std::lock_guard<std::mutex> g(c.counterLock);
    c.counters.loads++;
    c.counters.events.push_back("load " + providerName);
    return s;
}

Status Host::unload(bool terminating) {
    std::unique_lock<std::shared_mutex> lk(impl_->opLock);
    Impl& c = *impl_;
    Status s;
    if (!c.lib) return s;
    std::vector<MiEntry> kept;
    {
        RequestScope scope(&c);
        EncContext* ctx = newContext(&c, c.defaultNs);
        std::vector<MiEntry> all;
        {
            std::lock_guard<std::mutex> g(c.miLock);
            all.swap(c.mis);
        }
        // sfcb keeps a list of (library, MI type) pairs already cleaned up and
        // skips every further MI of a type on it: one cleanup per MI type,
        // whatever the number of MIs its factory handed out. OpenPegasus
        // cleans up every MI it made.
        bool typeCleaned[4] = {false, false, false, false};
        bool typeKept[4] = {false, false, false, false};
        for (const auto& e : all) {
            const int t = static_cast<int>(e.type);
            if (c.flavour == Flavour::Sfcb && typeCleaned[t]) {
                if (typeKept[t]) kept.push_back(e);
                continue;
            }
            typeCleaned[t] = true;
            const CMPIStatus st = callCleanup(e, &ctx->enc, terminating);
            {
                std::lock_guard<std::mutex> g(c.counterLock);
                c.counters.cleanupCalls++;
                c.counters.events.push_back(std::string("cleanup ") + kMiNames[static_cast<int>(e.type)] +
                                            (terminating ? " terminating" : ""));
            }
            if (!terminating && (st.rc == CMPI_RC_DO_NOT_UNLOAD || st.rc == CMPI_RC_NEVER_UNLOAD)) {
                kept.push_back(e);
                typeKept[t] = true;
            } else if (st.rc != CMPI_RC_OK && st.rc != CMPI_RC_DO_NOT_UNLOAD && st.rc != CMPI_RC_NEVER_UNLOAD) {
                c.log(std::string("cleanup of ") + kMiNames[static_cast<int>(e.type)] + "MI returned " +
                      statusLine(Status{st.rc, msgOf(st)}));
            }
        }
    }
    if (!kept.empty()) {
        std::lock_guard<std::mutex> g(c.miLock);
        c.mis = kept;
        s.rc = CMPI_RC_DO_NOT_UNLOAD;
        s.message = "provider " + c.name + " refused to be unloaded; the library stays loaded";
        return s;
    }
    c.closeLibrary();
    return s;
}

Status Host::unloadWithoutCleanup() {
    std::unique_lock<std::shared_mutex> lk(impl_->opLock);
    Impl& c = *impl_;
    if (!c.lib) return Status{};
    {
        std::lock_guard<std::mutex> g(c.miLock);
        c.mis.clear();
    }
    c.closeLibrary();
    return Status{};
}

// The library goes first: its unload code may still use objects the
// provider kept (a prepared context its thread detaches with); they go after.
void Host::Impl::closeLibrary() {
    {
        std::lock_guard<std::mutex> g(indLock);
        filters.clear();
        indicationsEnabled = false;
    }
    void* closing = nullptr;
    {
        std::lock_guard<std::mutex> g(miLock);
        closing = lib;
        lib = nullptr;
        for (auto& f : factories) f = nullptr;
    }
    dlclose(closing);  // no host lock held: the library's unload code may call the broker
    freeAllArenas();
    std::lock_guard<std::mutex> g(counterLock);
    counters.unloads++;
    counters.events.push_back("unload " + name);
}

bool Host::loaded() const {
    std::lock_guard<std::mutex> g(impl_->miLock);
    return impl_->lib != nullptr;
}

std::string Host::providerName() const { return impl_->name; }

namespace {

// Runs one request: finds (or creates) the MI, builds context and result,
// calls `call`, and collects the status. The request's broker objects go
// when it ends.
template <class Mi, class Call>
OpResult runOp(Host::Impl& c, MiType type, const ObjectPath& path, ResultKind kind, Call call,
               bool expectsOneInstance = false) {
    OpResult r;
    try {
        std::shared_lock<std::shared_mutex> lk(c.opLock);
        RequestScope scope(&c);
        void* mi = c.getMi(type, path.className, r);
        if (!mi) return r;
        EncContext* ctx = newContext(&c, c.nsOf(path));
        EncResult* res = newResult(&c, kind, &r);
        res->expectsOneInstance = expectsOneInstance;
        EncPath* op = newPath(&c, c.withNs(path));
        const CMPIStatus st = call(static_cast<Mi*>(mi), &ctx->enc, &res->enc, &op->enc);
        r.rc = st.rc;
        r.message = msgOf(st);
        c.finishStrict(r);
    } catch (const std::exception& e) {
        r.rc = CMPI_RC_ERR_FAILED;
        r.message = std::string("host error: ") + e.what();
    }
    return r;
}

}  // namespace

OpResult Host::enumerateInstanceNames(const ObjectPath& cp) {
    return runOp<CMPIInstanceMI>(*impl_, MiType::Instance, cp, ResultKind::Paths,
                                 [](CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* res,
                                    const CMPIObjectPath* op) {
                                     return mi->ft->enumerateInstanceNames(mi, ctx, res, op);
                                 });
}

OpResult Host::enumerateInstances(const ObjectPath& cp, const PropertyList& props) {
    CList pl(props);
    return runOp<CMPIInstanceMI>(*impl_, MiType::Instance, cp, ResultKind::Instances,
                                 [&](CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* res,
                                     const CMPIObjectPath* op) {
                                     return mi->ft->enumerateInstances(mi, ctx, res, op, pl.get());
                                 });
}

OpResult Host::getInstance(const ObjectPath& path, const PropertyList& props) {
    CList pl(props);
    return runOp<CMPIInstanceMI>(*impl_, MiType::Instance, path, ResultKind::Instances,
                                 [&](CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* res,
                                     const CMPIObjectPath* op) {
                                     return mi->ft->getInstance(mi, ctx, res, op, pl.get());
                                 },
                                 /*expectsOneInstance=*/true);
}

OpResult Host::createInstance(const ObjectPath& path, const Instance& inst) {
    Impl& c = *impl_;
    return runOp<CMPIInstanceMI>(c, MiType::Instance, path, ResultKind::Paths,
                                 [&](CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* res,
                                     const CMPIObjectPath* op) {
                                     Instance i = inst;
                                     if (i.path.className.empty()) i.path = c.withNs(path);
                                     return mi->ft->createInstance(mi, ctx, res, op, &newInstance(&c, i)->enc);
                                 });
}

OpResult Host::modifyInstance(const ObjectPath& path, const Instance& inst, const PropertyList& props) {
    Impl& c = *impl_;
    CList pl(props);
    return runOp<CMPIInstanceMI>(c, MiType::Instance, path, ResultKind::Data,
                                 [&](CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* res,
                                     const CMPIObjectPath* op) {
                                     Instance i = inst;
                                     if (i.path.className.empty()) i.path = c.withNs(path);
                                     return mi->ft->modifyInstance(mi, ctx, res, op, &newInstance(&c, i)->enc,
                                                                   pl.get());
                                 });
}

OpResult Host::deleteInstance(const ObjectPath& path) {
    return runOp<CMPIInstanceMI>(*impl_, MiType::Instance, path, ResultKind::Data,
                                 [](CMPIInstanceMI* mi, const CMPIContext* ctx, const CMPIResult* res,
                                    const CMPIObjectPath* op) { return mi->ft->deleteInstance(mi, ctx, res, op); });
}

namespace {

// An association request as the flavour makes it. sfcb hands the provider
// the client's association class as it stands. OpenPegasus calls the
// provider once for each of its association classes that can reference the
// source's class and is the named class or derives from it (every such
// class when none is named), hands it that class as assocClass (associators)
// or resultClass (references), and merges the answers; the first failure
// ends the request.
template <class Call>
OpResult fanOut(Host::Impl& c, const ObjectPath& path, const AssocParams& given, std::string AssocParams::*classParam,
               Call call) {
    if (c.flavour == Flavour::Sfcb) return call(given);
    const std::string& named = given.*classParam;
    OpResult merged;
    merged.done = true;
    for (const std::string& cls : c.associationClassesFor(path.className, named)) {
        AssocParams p = given;
        p.*classParam = cls;
        OpResult one = call(p);
        merged.instances.insert(merged.instances.end(), one.instances.begin(), one.instances.end());
        merged.paths.insert(merged.paths.end(), one.paths.begin(), one.paths.end());
        merged.data.insert(merged.data.end(), one.data.begin(), one.data.end());
        merged.strictErrors.insert(merged.strictErrors.end(), one.strictErrors.begin(), one.strictErrors.end());
        merged.done = merged.done && one.done;
        if (!one.ok()) {
            merged.rc = one.rc;
            merged.message = one.message;
            break;
        }
    }
    return merged;
}

}  // namespace

OpResult Host::associators(const ObjectPath& path, const AssocParams& given, const PropertyList& props) {
    return fanOut(*impl_, path, given, &AssocParams::assocClass,
                  [&](const AssocParams& p) { return associatorsAsCalled(path, p, props); });
}

OpResult Host::associatorNames(const ObjectPath& path, const AssocParams& given) {
    return fanOut(*impl_, path, given, &AssocParams::assocClass,
                  [&](const AssocParams& p) { return associatorNamesAsCalled(path, p); });
}

OpResult Host::references(const ObjectPath& path, const AssocParams& given, const PropertyList& props) {
    return fanOut(*impl_, path, given, &AssocParams::resultClass,
                  [&](const AssocParams& p) { return referencesAsCalled(path, p, props); });
}

OpResult Host::referenceNames(const ObjectPath& path, const AssocParams& given) {
    return fanOut(*impl_, path, given, &AssocParams::resultClass,
                  [&](const AssocParams& p) { return referenceNamesAsCalled(path, p); });
}

OpResult Host::associatorsAsCalled(const ObjectPath& path, const AssocParams& p, const PropertyList& props) {
    CList pl(props);
    return runOp<CMPIAssociationMI>(
        *impl_, MiType::Association, path, ResultKind::Instances,
        [&](CMPIAssociationMI* mi, const CMPIContext* ctx, const CMPIResult* res, const CMPIObjectPath* op) {
            return mi->ft->associators(mi, ctx, res, op, orNull(p.assocClass), orNull(p.resultClass),
                                       orNull(p.role), orNull(p.resultRole), pl.get());
        });
}

OpResult Host::associatorNamesAsCalled(const ObjectPath& path, const AssocParams& p) {
    return runOp<CMPIAssociationMI>(
        *impl_, MiType::Association, path, ResultKind::Paths,
        [&](CMPIAssociationMI* mi, const CMPIContext* ctx, const CMPIResult* res, const CMPIObjectPath* op) {
            return mi->ft->associatorNames(mi, ctx, res, op, orNull(p.assocClass), orNull(p.resultClass),
                                           orNull(p.role), orNull(p.resultRole));
        });
}

OpResult Host::referencesAsCalled(const ObjectPath& path, const AssocParams& p, const PropertyList& props) {
    CList pl(props);
    return runOp<CMPIAssociationMI>(
        *impl_, MiType::Association, path, ResultKind::Instances,
        [&](CMPIAssociationMI* mi, const CMPIContext* ctx, const CMPIResult* res, const CMPIObjectPath* op) {
            return mi->ft->references(mi, ctx, res, op, orNull(p.resultClass), orNull(p.role), pl.get());
        });
}

OpResult Host::referenceNamesAsCalled(const ObjectPath& path, const AssocParams& p) {
    return runOp<CMPIAssociationMI>(
        *impl_, MiType::Association, path, ResultKind::Paths,
        [&](CMPIAssociationMI* mi, const CMPIContext* ctx, const CMPIResult* res, const CMPIObjectPath* op) {
            return mi->ft->referenceNames(mi, ctx, res, op, orNull(p.resultClass), orNull(p.role));
        });
}

OpResult Host::invokeMethod(const ObjectPath& path, const std::string& method, const std::vector<NamedValue>& in) {
    Impl& c = *impl_;
    std::vector<NamedValue> outArgs;
    OpResult r = runOp<CMPIMethodMI>(
        c, MiType::Method, path, ResultKind::Method,
        [&](CMPIMethodMI* mi, const CMPIContext* ctx, const CMPIResult* res, const CMPIObjectPath* op) {
            EncArgs* inArgs = newArgs(&c, in);
            EncArgs* out = newArgs(&c, {});
            const CMPIStatus st = mi->ft->invokeMethod(mi, ctx, res, op, method.c_str(), &inArgs->enc, &out->enc);
            outArgs = out->args;
            return st;
        });
    r.outArgs = std::move(outArgs);
    if (!c.strict || r.rc != CMPI_RC_OK) return r;
    // The method's return value and output arguments against its declaration.
    const MethodDecl* m = c.repo.findMethod(path.className, method);
    if (!m) return r;
    if (!r.data.empty()) {
        std::string err = checkValueType("return value of " + path.className + "." + method, m->returnType, false,
                                         false, r.data.front());
        if (!err.empty()) r.strictErrors.push_back(err);
    }
    for (const auto& a : r.outArgs) {
        const ParamDecl* pd = m->param(a.first);
        if (!pd || !pd->out) {
            r.strictErrors.push_back("method " + path.className + "." + method + " has no output parameter " +
                                     a.first);
            continue;
        }
        std::string err = checkValueType("output " + path.className + "." + method + "." + a.first, pd->type,
                                         pd->array, pd->embedded, a.second);
        if (!err.empty()) r.strictErrors.push_back(err);
    }
    c.finishStrict(r);
    return r;
}

Status Host::activateFilter(const std::string& query, const std::string& sourceNs, int& filterId) {
    Impl& c = *impl_;
    filterId = 0;
    std::string cls;
    if (!queryClass(query, cls)) return Status{CMPI_RC_ERR_INVALID_QUERY, "no class after FROM in: " + query};
    ActiveFilter f;
    f.query = query;
    f.fromClass = cls;
    f.sourceNs = sourceNs.empty() ? c.defaultNs : sourceNs;
    ObjectPath cp;
    cp.nameSpace = f.sourceNs;
    cp.className = cls;
    bool first = false, enable = false;
    {
        std::lock_guard<std::mutex> g(c.indLock);
        first = c.filters.empty();
        enable = !c.indicationsEnabled;
    }
    std::vector<std::string> events;
    OpResult r = runOp<CMPIIndicationMI>(
        c, MiType::Indication, cp, ResultKind::Data,
        [&](CMPIIndicationMI* mi, const CMPIContext* ctx, const CMPIResult*, const CMPIObjectPath* op) {
            EncSelectExp* se = newSelectExp(&c, query, "WQL");
            CMPIStatus st{CMPI_RC_OK, nullptr};
            if (c.flavour == Flavour::Sfcb) {
                st = mi->ft->authorizeFilter(mi, ctx, &se->enc, cls.c_str(), op, "cimhost");
                c.event("authorizeFilter " + cls + " rc=" + std::to_string(st.rc));
                if (st.rc != CMPI_RC_OK) return st;
                const CMPIStatus poll = mi->ft->mustPoll(mi, ctx, &se->enc, cls.c_str(), op);
                c.event("mustPoll " + cls + " rc=" + std::to_string(poll.rc));
            }
            st = mi->ft->activateFilter(mi, ctx, &se->enc, cls.c_str(), op, first ? 1 : 0);
            c.event("activateFilter " + cls + " first=" + (first ? "1" : "0") + " rc=" + std::to_string(st.rc));
            if (st.rc != CMPI_RC_OK) return st;
            {
                // The subscription stands before indications are enabled.
                std::lock_guard<std::mutex> g(c.indLock);
                f.id = c.nextFilterId++;
                filterId = f.id;
                c.filters.push_back(f);
                if (enable) c.indicationsEnabled = true;
            }
            if (enable) {
                const CMPIStatus en = mi->ft->enableIndications(mi, ctx);
                c.event("enableIndications rc=" + std::to_string(en.rc));
            }
            return st;
        });
    return r;
}

Status Host::deactivateFilter(int filterId) {
    Impl& c = *impl_;
    ActiveFilter f;
    bool last = false, disable = false;
    {
        std::lock_guard<std::mutex> g(c.indLock);
        auto it = std::find_if(c.filters.begin(), c.filters.end(),
                               [&](const ActiveFilter& a) { return a.id == filterId; });
        if (it == c.filters.end())
            return Status{CMPI_RC_ERR_NOT_FOUND, "no active filter " + std::to_string(filterId)};
        f = *it;
        c.filters.erase(it);
        last = c.filters.empty();
        disable = last && c.flavour == Flavour::Pegasus && c.indicationsEnabled;
        if (disable) c.indicationsEnabled = false;
    }
    ObjectPath cp;
    cp.nameSpace = f.sourceNs;
    cp.className = f.fromClass;
    OpResult r = runOp<CMPIIndicationMI>(
        c, MiType::Indication, cp, ResultKind::Data,
        [&](CMPIIndicationMI* mi, const CMPIContext* ctx, const CMPIResult*, const CMPIObjectPath* op) {
            EncSelectExp* se = newSelectExp(&c, f.query, "WQL");
            const CMPIStatus st =
                mi->ft->deActivateFilter(mi, ctx, &se->enc, f.fromClass.c_str(), op, last ? 1 : 0);
            c.event("deActivateFilter " + f.fromClass + " last=" + (last ? "1" : "0") + " rc=" +
                    std::to_string(st.rc));
            if (disable) {
                const CMPIStatus dis = mi->ft->disableIndications(mi, ctx);
                c.event("disableIndications rc=" + std::to_string(dis.rc));
            }
            return st;
        });
    return r;
}

bool Host::waitIndication(Indication& out, std::chrono::milliseconds timeout) {
    Impl& c = *impl_;
    std::unique_lock<std::mutex> lk(c.indLock);
    if (!c.indCv.wait_for(lk, timeout, [&] { return !c.queue.empty(); })) return false;
    out = std::move(c.queue.front());
    c.queue.pop_front();
    return true;
}

void Host::setIndicationListener(std::function<void(const Indication&)> listener) {
    std::lock_guard<std::mutex> g(impl_->indLock);
    impl_->listener = std::move(listener);
}

Counters Host::counters() const {
    std::lock_guard<std::mutex> g(impl_->counterLock);
    return impl_->counters;
}

void Host::setLogSink(std::function<void(const std::string&)> sink) {
    std::lock_guard<std::mutex> g(impl_->logLock);
    impl_->logSink = std::move(sink);
}

std::vector<std::string> Host::logLines() const {
    std::lock_guard<std::mutex> g(impl_->logLock);
    return std::vector<std::string>(impl_->logLines.begin(), impl_->logLines.end());
}

}  // namespace cimhost

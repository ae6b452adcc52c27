// The broker side of CMPI: the encapsulated types (strings, datetimes,
// object paths, arrays, instances, arguments, contexts, enumerations,
// results, select expressions) and the four broker tables.
//
// Every function here is called from C code of a provider: none lets an
// exception out; failures become CMPI status codes.
#include <pthread.h>
#include <strings.h>

#include <algorithm>
#include <cctype>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <memory>
#include <tuple>
#include <type_traits>

#include "cimhost/text.h"
#include "internal.h"

namespace cimhost {
namespace detail {

namespace {

thread_local std::vector<unsigned long long> tlsArenas;
std::atomic<unsigned long long> gNextArenaId{1};

CMPIStatus mkStatus(CMPIrc rc) {
    CMPIStatus s;
    s.rc = rc;
    s.msg = nullptr;
    return s;
}

void setRc(CMPIStatus* rc, CMPIrc code) {
    if (rc) {
        rc->rc = code;
        rc->msg = nullptr;
    }
}

CMPIData nullData(CMPIValueState state = CMPI_nullValue) {
    CMPIData d;
    std::memset(&d, 0, sizeof d);
    d.type = CMPI_null;
    d.state = state;
    return d;
}

void setFt(EncString* o) { o->enc.ft = &tables().stringFT; }
void setFt(EncDateTime* o) { o->enc.ft = &tables().dateTimeFT; }
void setFt(EncPath* o) { o->enc.ft = &tables().pathFT; }
void setFt(EncArray* o) { o->enc.ft = &tables().arrayFT; }
void setFt(EncInstance* o) { o->enc.ft = &tables().instanceFT; }
void setFt(EncArgs* o) { o->enc.ft = &tables().argsFT; }
void setFt(EncContext* o) { o->enc.ft = &tables().contextFT; }
void setFt(EncResult* o) { o->enc.ft = &tables().resultFT; }
void setFt(EncSelectExp* o) { o->enc.ft = &tables().selectFT; }

template <class T>
T* adoptNew(Host::Impl* core, Arena* arena) {
    T* o = new T();
    o->core = core;
    o->enc.hdl = o;
    setFt(o);
    arena->adopt(o);
    return o;
}

template <class T>
T* make(Host::Impl* core) {
    return adoptNew<T>(core, core->currentArena());
}

// Objects that outlive the request: clones and prepared contexts. They go
// when the provider is unloaded.
template <class T>
T* makeLife(Host::Impl* core) {
    std::lock_guard<std::mutex> g(core->arenaLock);
    return adoptNew<T>(core, core->lifeArena.get());
}

void releaseObj(Obj* o) {
    if (!o) return;
    if (o->arena) o->arena->forget(o);
    delete o;
}

// Handle checks: an object is ours when its table is ours.
template <class Enc, class C>
Enc* as(const C* c, const void* ft) {
    if (!c || c->ft != ft || !c->hdl) return nullptr;
    return static_cast<Enc*>(const_cast<void*>(static_cast<const void*>(c->hdl)));
}

EncString* asString(const CMPIString* s) { return as<EncString>(s, &tables().stringFT); }
EncDateTime* asDateTime(const CMPIDateTime* d) { return as<EncDateTime>(d, &tables().dateTimeFT); }
EncPath* asPath(const CMPIObjectPath* p) { return as<EncPath>(p, &tables().pathFT); }
EncArray* asArray(const CMPIArray* a) { return as<EncArray>(a, &tables().arrayFT); }
EncInstance* asInstance(const CMPIInstance* i) { return as<EncInstance>(i, &tables().instanceFT); }
EncArgs* asArgs(const CMPIArgs* a) { return as<EncArgs>(a, &tables().argsFT); }
EncContext* asContext(const CMPIContext* c) { return as<EncContext>(c, &tables().contextFT); }
EncEnum* asEnum(const CMPIEnumeration* e) { return as<EncEnum>(e, &tables().enumFT); }
EncResult* asResult(const CMPIResult* r) { return as<EncResult>(r, &tables().resultFT); }
EncSelectExp* asSelect(const CMPISelectExp* s) { return as<EncSelectExp>(s, &tables().selectFT); }

Host::Impl* coreOf(const CMPIBroker* mb) { return mb ? static_cast<Host::Impl*>(mb->hdl) : nullptr; }

bool scalarType(CMPIType t, Type& out) {
    switch (t) {
        case CMPI_boolean: out = Type::Boolean; return true;
        case CMPI_char16: out = Type::Char16; return true;
        case CMPI_real32: out = Type::Real32; return true;
        case CMPI_real64: out = Type::Real64; return true;
        case CMPI_uint8: out = Type::UInt8; return true;
        case CMPI_uint16: out = Type::UInt16; return true;
        case CMPI_uint32: out = Type::UInt32; return true;
        case CMPI_uint64: out = Type::UInt64; return true;
        case CMPI_sint8: out = Type::SInt8; return true;
        case CMPI_sint16: out = Type::SInt16; return true;
        case CMPI_sint32: out = Type::SInt32; return true;
        case CMPI_sint64: out = Type::SInt64; return true;
        case CMPI_instance: out = Type::Instance; return true;
        case CMPI_ref: out = Type::Reference; return true;
        case CMPI_string:
        case CMPI_chars:
        case CMPI_charsptr: out = Type::String; return true;
        case CMPI_dateTime: out = Type::DateTime; return true;
        case CMPI_null: out = Type::Null; return true;
        default: return false;
    }
}

// A value that refers to an encapsulated object: a null pointer is a null
// value, a handle that is not ours an error.
template <class C, class Enc, class F>
CMPIrc objectValue(const C* c, const Enc* e, Type t, Value& out, F from) {
    if (!c) out = Value::nullOf(t);
    else if (!e) return CMPI_RC_ERR_INVALID_HANDLE;
    else out = from(*e);
    return CMPI_RC_OK;
}

CMPIrc scalarToValue(const CMPIValue& v, CMPIType t, Value& out) {
    switch (t) {
        case CMPI_boolean: out = Value::fromBool(v.boolean != 0); return CMPI_RC_OK;
        case CMPI_char16: out = Value::fromUnsigned(Type::Char16, v.char16); return CMPI_RC_OK;
        case CMPI_uint8: out = Value::fromUnsigned(Type::UInt8, v.uint8); return CMPI_RC_OK;
        case CMPI_uint16: out = Value::fromUnsigned(Type::UInt16, v.uint16); return CMPI_RC_OK;
        case CMPI_uint32: out = Value::fromUnsigned(Type::UInt32, v.uint32); return CMPI_RC_OK;
        case CMPI_uint64: out = Value::fromUnsigned(Type::UInt64, v.uint64); return CMPI_RC_OK;
        case CMPI_sint8: out = Value::fromSigned(Type::SInt8, v.sint8); return CMPI_RC_OK;
        case CMPI_sint16: out = Value::fromSigned(Type::SInt16, v.sint16); return CMPI_RC_OK;
        case CMPI_sint32: out = Value::fromSigned(Type::SInt32, v.sint32); return CMPI_RC_OK;
        case CMPI_sint64: out = Value::fromSigned(Type::SInt64, v.sint64); return CMPI_RC_OK;
        case CMPI_real32: out = Value::fromReal(Type::Real32, v.real32); return CMPI_RC_OK;
        case CMPI_real64: out = Value::fromReal(Type::Real64, v.real64); return CMPI_RC_OK;
        case CMPI_string:
            return objectValue(v.string, asString(v.string), Type::String, out, [](const EncString& s) {
                return s.null ? Value::nullOf(Type::String) : Value::fromString(s.s);
            });
        case CMPI_charsptr:
            out = v.dataPtr.ptr ? Value::fromString(static_cast<const char*>(v.dataPtr.ptr))
                                : Value::nullOf(Type::String);
            return CMPI_RC_OK;
        case CMPI_dateTime:
            return objectValue(v.dateTime, asDateTime(v.dateTime), Type::DateTime, out,
                               [](const EncDateTime& d) { return Value::fromDateTime(d.dt); });
        case CMPI_ref:
            return objectValue(v.ref, asPath(v.ref), Type::Reference, out,
                               [](const EncPath& p) { return Value::fromRef(p.p); });
        case CMPI_instance:
            return objectValue(v.inst, asInstance(v.inst), Type::Instance, out,
                               [](const EncInstance& i) { return Value::fromInstance(i.inst); });
        default: return CMPI_RC_ERR_INVALID_DATA_TYPE;
    }
}

// CMPIString** out-parameter helpers.
void putName(Host::Impl* core, CMPIString** name, const std::string& s) {
    if (name) *name = &newString(core, s)->enc;
}

// What a function returns to the provider when it fails.
template <class R>
R failValue() {
    if constexpr (std::is_same_v<R, CMPIData>) return nullData();
    else return R{};
}

// The frame of the broker functions that report through a CMPIStatus*:
// handles that are not ours give CMPI_RC_ERR_INVALID_HANDLE, an exception
// gives CMPI_RC_ERR_FAILED, each with the failure value; otherwise rc is
// CMPI_RC_OK unless the body sets another code.
template <class R, class F>
R guarded(CMPIStatus* rc, bool handlesOk, F&& body) {
    try {
        if (!handlesOk) return setRc(rc, CMPI_RC_ERR_INVALID_HANDLE), failValue<R>();
        setRc(rc, CMPI_RC_OK);
        return body();
    } catch (...) {
        setRc(rc, CMPI_RC_ERR_FAILED);
        return failValue<R>();
    }
}

// The same frame for the functions that return a status: the body returns
// the code.
template <class F>
CMPIStatus guardedStatus(bool handlesOk, F&& body) {
    try {
        if (!handlesOk) return mkStatus(CMPI_RC_ERR_INVALID_HANDLE);
        return mkStatus(body());
    } catch (...) {
        return mkStatus(CMPI_RC_ERR_FAILED);
    }
}

// An entry of a function table that the host does not serve: it reports
// CMPI_RC_ERR_NOT_SUPPORTED, as its status or through its last parameter,
// and returns the failure value.
template <class Fn>
struct NotSupported;

template <class R, class... A>
struct NotSupported<R (*)(A...)> {
    static R call(A... args) {
        if constexpr (std::is_same_v<R, CMPIStatus>) {
            return mkStatus(CMPI_RC_ERR_NOT_SUPPORTED);
        } else {
            constexpr size_t last = sizeof...(A) - 1;
            static_assert(std::is_same_v<std::tuple_element_t<last, std::tuple<A...>>, CMPIStatus*>,
                          "the status pointer comes last");
            setRc(std::get<last>(std::forward_as_tuple(args...)), CMPI_RC_ERR_NOT_SUPPORTED);
            return failValue<R>();
        }
    }
};

template <class Fn>
void unsupported(Fn& entry) {
    entry = NotSupported<Fn>::call;
}

// release() of an encapsulated object, and the broker's free functions for
// it: the object goes at once instead of with its arena.
template <auto As, class C>
CMPIStatus releaseOf(C* c) {
    releaseObj(As(c));
    return mkStatus(CMPI_RC_OK);
}

template <auto As, class C>
void freeOf(const CMPIBroker*, C* c) {
    releaseObj(As(c));
}

// A clone copies the whole object and lives until the provider is
// unloaded, not with the request.
template <class Enc>
auto cloneOf(const Enc* e, CMPIStatus* rc) {
    using C = decltype(e->enc);
    return guarded<C*>(rc, e != nullptr, [&] {
        auto o = std::make_unique<Enc>(*e);
        o->arena = nullptr;
        o->enc.hdl = o.get();
        std::lock_guard<std::mutex> g(e->core->arenaLock);
        e->core->lifeArena->adopt(o.get());
        return &o.release()->enc;
    });
}

}  // namespace

// ---------------------------------------------------------------- arenas

Arena::~Arena() {
    for (Obj* o : objs) {
        o->arena = nullptr;
        delete o;
    }
}

void Arena::adopt(Obj* o) {
    std::lock_guard<std::mutex> g(m);
    o->arena = this;
    objs.insert(o);
}

void Arena::forget(Obj* o) {
    std::lock_guard<std::mutex> g(m);
    objs.erase(o);
    o->arena = nullptr;
}

RequestScope::RequestScope(Host::Impl* core) : core_(core), id_(core->pushArena(true)) {}
RequestScope::~RequestScope() { core_->popArena(id_); }

bool EncInstance::wanted(const std::string& name) const {
    if (!filtered) return true;
    for (const auto& f : filter)
        if (namesEqual(f, name)) return true;
    for (const auto& k : filterKeys)
        if (namesEqual(k, name)) return true;
    return false;
}

// ---------------------------------------------------------------- conversions

CMPIrc toValue(const CMPIValue* v, CMPIType type, Value& out) {
    if (type & CMPI_ARRAY) {
        Type et;
        if (!scalarType(static_cast<CMPIType>(type & ~CMPI_ARRAY), et)) return CMPI_RC_ERR_INVALID_DATA_TYPE;
        if (!v || !v->array) {
            out = Value::nullOf(et, true);
            return CMPI_RC_OK;
        }
        EncArray* a = asArray(v->array);
        if (!a) return CMPI_RC_ERR_INVALID_HANDLE;
        if (a->bytes) {
            out = Value::byteArray(*a->bytes);
            return CMPI_RC_OK;
        }
        out = Value::arrayOf(a->elemType, a->elems);
        return CMPI_RC_OK;
    }
    Type st;
    if (!scalarType(type, st)) return CMPI_RC_ERR_INVALID_DATA_TYPE;
    // As both servers do it, a CMPI_chars value pointer is the text itself.
    if (type == CMPI_chars) {
        out = v ? Value::fromString(reinterpret_cast<const char*>(v)) : Value::nullOf(Type::String);
        return CMPI_RC_OK;
    }
    if (!v || type == CMPI_null) {
        out = Value::nullOf(st);
        return CMPI_RC_OK;
    }
    return scalarToValue(*v, type, out);
}

CMPIData toData(Host::Impl* core, const Value& v) {
    CMPIData d = nullData(CMPI_goodValue);
    d.type = v.typeCode();
    if (v.null) {
        d.state = CMPI_nullValue;
        return d;
    }
    if (v.array) {
        d.value.array = v.bytes ? &newByteArray(core, v.bytes)->enc : &newArray(core, v.type, v.elems)->enc;
        return d;
    }
    switch (v.type) {
        case Type::Boolean: d.value.boolean = v.b ? 1 : 0; break;
        case Type::Char16: d.value.char16 = static_cast<CMPIChar16>(v.u); break;
        case Type::UInt8: d.value.uint8 = static_cast<CMPIUint8>(v.u); break;
        case Type::UInt16: d.value.uint16 = static_cast<CMPIUint16>(v.u); break;
        case Type::UInt32: d.value.uint32 = static_cast<CMPIUint32>(v.u); break;
        case Type::UInt64: d.value.uint64 = v.u; break;
        case Type::SInt8: d.value.sint8 = static_cast<CMPISint8>(v.i); break;
        case Type::SInt16: d.value.sint16 = static_cast<CMPISint16>(v.i); break;
        case Type::SInt32: d.value.sint32 = static_cast<CMPISint32>(v.i); break;
        case Type::SInt64: d.value.sint64 = v.i; break;
        case Type::Real32: d.value.real32 = static_cast<CMPIReal32>(v.d); break;
        case Type::Real64: d.value.real64 = v.d; break;
        case Type::String: d.value.string = &newString(core, v.s)->enc; break;
        case Type::DateTime: d.value.dateTime = &newDateTime(core, v.dt)->enc; break;
        case Type::Reference: d.value.ref = &newPath(core, v.ref ? *v.ref : ObjectPath())->enc; break;
        case Type::Instance: d.value.inst = &newInstance(core, v.inst ? *v.inst : Instance())->enc; break;
        case Type::Null: d.state = CMPI_nullValue; break;
    }
    return d;
}

std::string stringOf(const CMPIString* s) {
    EncString* e = asString(s);
    return e ? e->s : std::string();
}

ObjectPath instancePath(const Host::Impl* core, const Instance& inst) {
    ObjectPath p = inst.path;
    const auto keys = core->repo.sharedKeyNames(inst.className());
    for (const auto& k : *keys) {
        if (const Value* v = inst.property(k)) {
            if (!v->null) p.setKey(k, *v);
        }
    }
    return p;
}

// ---------------------------------------------------------------- factories

EncString* newString(Host::Impl* core, std::string s) {
    auto* o = make<EncString>(core);
    o->s = std::move(s);
    return o;
}

EncPath* newPath(Host::Impl* core, ObjectPath p) {
    auto* o = make<EncPath>(core);
    o->p = std::move(p);
    return o;
}

EncInstance* newInstance(Host::Impl* core, Instance i) {
    auto* o = make<EncInstance>(core);
    o->inst = std::move(i);
    return o;
}

EncArgs* newArgs(Host::Impl* core, std::vector<NamedValue> a) {
    auto* o = make<EncArgs>(core);
    o->args = std::move(a);
    return o;
}

EncContext* newContext(Host::Impl* core, const std::string& ns) {
    auto* o = make<EncContext>(core);
    o->entries.emplace_back(CMPIInitNameSpace, Value::fromString(ns));
    o->entries.emplace_back(CMPIPrincipal, Value::fromString("cimhost"));
    o->entries.emplace_back(CMPIInvocationFlags, Value::fromUnsigned(Type::UInt32, 0));
    return o;
}

EncResult* newResult(Host::Impl* core, ResultKind kind, OpResult* sink) {
    auto* o = make<EncResult>(core);
    o->kind = kind;
    o->sink = sink;
    return o;
}

// "SELECT ... FROM Class [WHERE ...]": the class after FROM.
bool queryClass(const std::string& q, std::string& cls) {
    std::string up;
    for (char c : q) up += static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    const size_t start = up.find_first_not_of(" \t\r\n");
    if (start == std::string::npos || up.compare(start, 6, "SELECT") != 0) return false;
    size_t pos = up.find("FROM", start + 6);
    while (pos != std::string::npos &&
           !(std::isspace(static_cast<unsigned char>(up[pos - 1])) && pos + 4 < up.size() &&
             std::isspace(static_cast<unsigned char>(up[pos + 4]))))
        pos = up.find("FROM", pos + 1);
    if (pos == std::string::npos) return false;
    pos += 4;
    while (pos < q.size() && std::isspace(static_cast<unsigned char>(q[pos]))) ++pos;
    const size_t s = pos;
    while (pos < q.size() && (std::isalnum(static_cast<unsigned char>(q[pos])) || q[pos] == '_')) ++pos;
    cls = q.substr(s, pos - s);
    return !cls.empty();
}

EncSelectExp* newSelectExp(Host::Impl* core, const std::string& query, const std::string& lang) {
    std::string cls;
    if (!queryClass(query, cls)) return nullptr;
    auto* o = make<EncSelectExp>(core);
    o->query = query;
    o->lang = lang;
    o->fromClass = cls;
    return o;
}

EncDateTime* newDateTime(Host::Impl* core, const DateTime& dt) {
    auto* o = make<EncDateTime>(core);
    o->dt = dt;
    return o;
}

EncArray* newArray(Host::Impl* core, Type elemType, std::vector<Value> elems) {
    auto* o = make<EncArray>(core);
    o->elemType = elemType;
    o->elems = std::move(elems);
    return o;
}

EncArray* newByteArray(Host::Impl* core, std::shared_ptr<const std::vector<std::uint8_t>> bytes) {
    auto* o = make<EncArray>(core);
    o->elemType = Type::UInt8;
    o->bytes = std::move(bytes);
    return o;
}

namespace {

// ---------------------------------------------------------------- CMPIString

CMPIString* strClone(const CMPIString* s, CMPIStatus* rc) { return cloneOf(asString(s), rc); }

const char* strChars(const CMPIString* s, CMPIStatus* rc) {
    EncString* e = asString(s);
    return guarded<const char*>(rc, e, [&] { return e->null ? nullptr : e->s.c_str(); });
}

// ---------------------------------------------------------------- CMPIDateTime

CMPIDateTime* dtClone(const CMPIDateTime* d, CMPIStatus* rc) { return cloneOf(asDateTime(d), rc); }

CMPIUint64 dtBinary(const CMPIDateTime* d, CMPIStatus* rc) {
    EncDateTime* e = asDateTime(d);
    return guarded<CMPIUint64>(rc, e, [&] { return e->dt.usec; });
}

CMPIString* dtText(const CMPIDateTime* d, CMPIStatus* rc) {
    EncDateTime* e = asDateTime(d);
    return guarded<CMPIString*>(rc, e, [&] { return &newString(e->core, e->dt.toText())->enc; });
}

CMPIBoolean dtIsInterval(const CMPIDateTime* d, CMPIStatus* rc) {
    EncDateTime* e = asDateTime(d);
    return guarded<CMPIBoolean>(rc, e, [&] { return CMPIBoolean(e->dt.interval ? 1 : 0); });
}

// ---------------------------------------------------------------- CMPIObjectPath

CMPIObjectPath* opClone(const CMPIObjectPath* op, CMPIStatus* rc) { return cloneOf(asPath(op), rc); }

template <std::string ObjectPath::*Field>
CMPIStatus opSetText(CMPIObjectPath* op, const char* text) {
    EncPath* e = asPath(op);
    return guardedStatus(e, [&] {
        e->p.*Field = text ? text : "";
        return CMPI_RC_OK;
    });
}

template <std::string ObjectPath::*Field>
CMPIString* opGetText(const CMPIObjectPath* op, CMPIStatus* rc) {
    EncPath* e = asPath(op);
    return guarded<CMPIString*>(rc, e, [&] { return &newString(e->core, e->p.*Field)->enc; });
}

CMPIStatus opAddKey(CMPIObjectPath* op, const char* name, const CMPIValue* value, CMPIType type) {
    EncPath* e = asPath(op);
    return guardedStatus(e, [&] {
        if (!name || !*name) return CMPI_RC_ERR_INVALID_PARAMETER;
        Value v;
        const CMPIrc r = toValue(value, type, v);
        if (r != CMPI_RC_OK) return r;
        e->p.setKey(name, std::move(v));
        return CMPI_RC_OK;
    });
}

CMPIStatus opSetNsFrom(CMPIObjectPath* op, const CMPIObjectPath* src) {
    EncPath* e = asPath(op);
    EncPath* s = asPath(src);
    return guardedStatus(e && s, [&] {
        e->p.nameSpace = s->p.nameSpace;
        return CMPI_RC_OK;
    });
}

CMPIStatus opSetHostNsFrom(CMPIObjectPath* op, const CMPIObjectPath* src) {
    EncPath* e = asPath(op);
    EncPath* s = asPath(src);
    return guardedStatus(e && s, [&] {
        e->p.nameSpace = s->p.nameSpace;
        e->p.host = s->p.host;
        return CMPI_RC_OK;
    });
}


CMPIString* opToString(const CMPIObjectPath* op, CMPIStatus* rc) {
    EncPath* e = asPath(op);
    return guarded<CMPIString*>(rc, e, [&] { return &newString(e->core, formatPath(e->p))->enc; });
}

// ---------------------------------------------------------------- CMPIArray

CMPIArray* arClone(const CMPIArray* a, CMPIStatus* rc) { return cloneOf(asArray(a), rc); }

CMPICount arSize(const CMPIArray* a, CMPIStatus* rc) {
    EncArray* e = asArray(a);
    return guarded<CMPICount>(rc, e, [&] { return static_cast<CMPICount>(e->bytes ? e->bytes->size() : e->elems.size()); });
}

CMPIType arType(const CMPIArray* a, CMPIStatus* rc) {
    EncArray* e = asArray(a);
    return guarded<CMPIType>(rc, e, [&] { return static_cast<CMPIType>(e->elemType); });
}

CMPIData arGet(const CMPIArray* a, CMPICount index, CMPIStatus* rc) {
    EncArray* e = asArray(a);
    return guarded<CMPIData>(rc, e, [&] {
        if (e->bytes) {
            if (index >= e->bytes->size()) return setRc(rc, CMPI_RC_ERR_NO_SUCH_PROPERTY), nullData(CMPI_badValue);
            CMPIData d = nullData(CMPI_goodValue);
            d.type = CMPI_uint8;
            d.value.uint8 = (*e->bytes)[index];
            return d;
        }
        if (index >= e->elems.size()) return setRc(rc, CMPI_RC_ERR_NO_SUCH_PROPERTY), nullData(CMPI_badValue);
        CMPIData d = toData(e->core, e->elems[index]);
        d.type = static_cast<CMPIType>(e->elemType);
        return d;
    });
}

CMPIStatus arSet(CMPIArray* a, CMPICount index, const CMPIValue* value, CMPIType type) {
    EncArray* e = asArray(a);
    return guardedStatus(e, [&] {
        if (e->bytes) {
            // The provider changes an element: the array takes its elements as Values.
            std::vector<Value> elems;
            elems.reserve(e->bytes->size());
            for (std::uint8_t b : *e->bytes) elems.push_back(Value::fromUnsigned(Type::UInt8, b));
            e->elems = std::move(elems);
            e->bytes.reset();
        }
        if (index >= e->elems.size()) return CMPI_RC_ERR_NO_SUCH_PROPERTY;
        if (type & CMPI_ARRAY) return CMPI_RC_ERR_TYPE_MISMATCH;
        Value v;
        const CMPIrc r = toValue(value, type, v);
        if (r != CMPI_RC_OK) return r;
        if (type != CMPI_null && v.type != e->elemType) return CMPI_RC_ERR_TYPE_MISMATCH;
        v.type = e->elemType;
        e->elems[index] = std::move(v);
        return CMPI_RC_OK;
    });
}

// ---------------------------------------------------------------- CMPIInstance

CMPIInstance* inClone(const CMPIInstance* i, CMPIStatus* rc) { return cloneOf(asInstance(i), rc); }

CMPIStatus inSet(const CMPIInstance* i, const char* name, const CMPIValue* value, CMPIType type) {
    EncInstance* e = asInstance(i);
    return guardedStatus(e, [&] {
        if (!name || !*name) return CMPI_RC_ERR_INVALID_PARAMETER;
        Value v;
        const CMPIrc r = toValue(value, type, v);
        if (r != CMPI_RC_OK) return r;
        if (!e->wanted(name)) return CMPI_RC_OK;   // filtered out
        e->inst.setProperty(name, std::move(v));
        return CMPI_RC_OK;
    });
}

CMPIStatus inSetWithOrigin(const CMPIInstance* i, const char* name, const CMPIValue* value, CMPIType type,
                           const char*) {
    return inSet(i, name, value, type);
}

CMPIObjectPath* inPath(const CMPIInstance* i, CMPIStatus* rc) {
    EncInstance* e = asInstance(i);
    return guarded<CMPIObjectPath*>(rc, e, [&] { return &newPath(e->core, instancePath(e->core, e->inst))->enc; });
}

std::vector<std::string> nameList(const char** list) {
    std::vector<std::string> out;
    for (size_t k = 0; list && list[k]; ++k) out.emplace_back(list[k]);
    return out;
}

CMPIStatus inSetFilter(CMPIInstance* i, const char** props, const char** keys) {
    EncInstance* e = asInstance(i);
    return guardedStatus(e, [&] {
        if (!props) {
            e->filtered = false;
            e->filter.clear();
            e->filterKeys.clear();
            return CMPI_RC_OK;
        }
        e->filtered = true;
        e->filter = nameList(props);
        e->filterKeys = nameList(keys);
        auto& ps = e->inst.properties;
        ps.erase(std::remove_if(ps.begin(), ps.end(), [&](const NamedValue& p) { return !e->wanted(p.first); }),
                 ps.end());
        return CMPI_RC_OK;
    });
}

CMPIStatus inSetPath(CMPIInstance* i, const CMPIObjectPath* op) {
    EncInstance* e = asInstance(i);
    EncPath* p = asPath(op);
    return guardedStatus(e && p, [&] {
        e->inst.path = p->p;
        return CMPI_RC_OK;
    });
}

// ---------------------------------------------------------------- named values

// The keys of a path, the properties of an instance, the arguments and the
// context entries: lists of named values that one set of functions serves.
// Named<Enc> says which list a type holds, what a name that is not there
// reports, and whether the values are keys.
template <class Enc>
struct Named;
template <>
struct Named<EncPath> {
    static std::vector<NamedValue>& list(EncPath* e) { return e->p.keys; }
    static constexpr CMPIrc missing = CMPI_RC_ERR_NOT_FOUND;
    static constexpr bool keys = true;
};
template <>
struct Named<EncInstance> {
    static std::vector<NamedValue>& list(EncInstance* e) { return e->inst.properties; }
    static constexpr CMPIrc missing = CMPI_RC_ERR_NO_SUCH_PROPERTY;
    static constexpr bool keys = false;
};
template <>
struct Named<EncArgs> {
    static std::vector<NamedValue>& list(EncArgs* e) { return e->args; }
    static constexpr CMPIrc missing = CMPI_RC_ERR_NOT_FOUND;
    static constexpr bool keys = false;
};
template <>
struct Named<EncContext> {
    static std::vector<NamedValue>& list(EncContext* e) { return e->entries; }
    static constexpr CMPIrc missing = CMPI_RC_ERR_NOT_FOUND;
    static constexpr bool keys = false;
};

// getX(name) and getXAt(index): a name that is not there gives `missing`,
// an index past the end CMPI_RC_ERR_NO_SUCH_PROPERTY, each with data of
// state CMPI_notFound. A key's data carries CMPI_keyValue in its state.
CMPIData namedData(Host::Impl* core, const Value& v, bool key) {
    CMPIData d = toData(core, v);
    if (key) d.state = static_cast<CMPIValueState>(d.state | CMPI_keyValue);
    return d;
}

CMPIData getNamed(Host::Impl* core, const std::vector<NamedValue>& list, const char* name, CMPIrc missing, bool key,
                  CMPIStatus* rc) {
    const Value* v = name ? findNamed(list, name) : nullptr;
    if (!v) return setRc(rc, missing), nullData(CMPI_notFound);
    return namedData(core, *v, key);
}

CMPIData getNamedAt(Host::Impl* core, const std::vector<NamedValue>& list, CMPICount index, CMPIString** name,
                    bool key, CMPIStatus* rc) {
    if (index >= list.size()) return setRc(rc, CMPI_RC_ERR_NO_SUCH_PROPERTY), nullData(CMPI_notFound);
    putName(core, name, list[index].first);
    return namedData(core, list[index].second, key);
}

template <auto As, class C>
C* nlClone(const C* c, CMPIStatus* rc) {
    return cloneOf(As(c), rc);
}

// addArg and addEntry: a name that is there is set in place.
template <auto As, class C>
CMPIStatus nlAdd(const C* c, const char* name, const CMPIValue* value, CMPIType type) {
    auto* e = As(c);
    return guardedStatus(e, [&] {
        if (!name || !*name) return CMPI_RC_ERR_INVALID_PARAMETER;
        Value v;
        const CMPIrc r = toValue(value, type, v);
        if (r != CMPI_RC_OK) return r;
        setNamed(Named<std::remove_pointer_t<decltype(e)>>::list(e), name, std::move(v));
        return CMPI_RC_OK;
    });
}

template <auto As, class C>
CMPIData nlGet(const C* c, const char* name, CMPIStatus* rc) {
    auto* e = As(c);
    using N = Named<std::remove_pointer_t<decltype(e)>>;
    return guarded<CMPIData>(rc, e, [&] { return getNamed(e->core, N::list(e), name, N::missing, N::keys, rc); });
}

// getKey of a path; a key that is not there is reported with a message
// when the host is told to (setMissingKeyMessage), as some servers do.
CMPIData pathGetKey(const CMPIObjectPath* op, const char* name, CMPIStatus* rc) {
    CMPIData d = nlGet<asPath>(op, name, rc);
    EncPath* e = asPath(op);
    if (e && rc && rc->rc == CMPI_RC_ERR_NOT_FOUND && e->core->missingKeyMessage.load())
        rc->msg = &newString(e->core, std::string("no key ") + (name ? name : "") + " in the path")->enc;
    return d;
}

template <auto As, class C>
CMPIData nlGetAt(const C* c, CMPICount index, CMPIString** name, CMPIStatus* rc) {
    auto* e = As(c);
    using N = Named<std::remove_pointer_t<decltype(e)>>;
    return guarded<CMPIData>(rc, e, [&] { return getNamedAt(e->core, N::list(e), index, name, N::keys, rc); });
}

template <auto As, class C>
CMPICount nlCount(const C* c, CMPIStatus* rc) {
    auto* e = As(c);
    using N = Named<std::remove_pointer_t<decltype(e)>>;
    return guarded<CMPICount>(rc, e, [&] { return static_cast<CMPICount>(N::list(e).size()); });
}

// ---------------------------------------------------------------- CMPIEnumeration

CMPIEnumeration* enClone(const CMPIEnumeration* en, CMPIStatus* rc) { return cloneOf(asEnum(en), rc); }

CMPIData enNext(const CMPIEnumeration* en, CMPIStatus* rc) {
    EncEnum* e = asEnum(en);
    return guarded<CMPIData>(rc, e, [&] {
        if (e->next >= e->items.size()) return setRc(rc, CMPI_RC_ERR_NO_SUCH_PROPERTY), nullData(CMPI_notFound);
        return toData(e->core, e->items[e->next++]);
    });
}

CMPIBoolean enHasNext(const CMPIEnumeration* en, CMPIStatus* rc) {
    EncEnum* e = asEnum(en);
    return guarded<CMPIBoolean>(rc, e, [&] { return CMPIBoolean(e->next < e->items.size() ? 1 : 0); });
}

CMPIArray* enToArray(const CMPIEnumeration* en, CMPIStatus* rc) {
    EncEnum* e = asEnum(en);
    return guarded<CMPIArray*>(rc, e, [&] {
        const Type t = e->items.empty() ? Type::Null : e->items.front().type;
        return &newArray(e->core, t, e->items)->enc;
    });
}

// ---------------------------------------------------------------- CMPIResult


void noteStrict(EncResult* e, const std::string& what) {
    if (e->core->strict) e->sink->strictErrors.push_back(what);
}

// Called with e->m held: the instance or path goes to the sink, and under
// --strict what the strict checks find goes with it.
void noteFinding(EncResult* e, std::string err) {
    if (!err.empty()) e->sink->strictErrors.push_back(std::move(err));
}

void addInstance(EncResult* e, Instance inst) {
    if (e->core->strict) noteFinding(e, checkInstance(e->core->repo, inst));
    e->sink->instances.push_back(std::move(inst));
}

void addPath(EncResult* e, const ObjectPath& p) {
    if (e->core->strict) noteFinding(e, checkPath(e->core->repo, p));
    e->sink->paths.push_back(p);
}

bool resultOk(const EncResult* e) { return e && e->sink; }

CMPIStatus rsData(const CMPIResult* r, const CMPIValue* value, CMPIType type) {
    EncResult* e = asResult(r);
    return guardedStatus(resultOk(e), [&] {
        Value v;
        const CMPIrc rc = toValue(value, type, v);
        if (rc != CMPI_RC_OK) return rc;
        std::lock_guard<std::mutex> g(e->m);
        if (e->kind == ResultKind::Instances && v.type == Type::Instance && !v.array && v.inst) {
            // returnData of an instance counts as returnInstance.
            Instance copy = *v.inst;
            copy.path = instancePath(e->core, copy);
            addInstance(e, std::move(copy));
        } else if (e->kind == ResultKind::Paths && v.type == Type::Reference && !v.array && v.ref) {
            addPath(e, *v.ref);
        } else {
            if (e->kind != ResultKind::Method && e->kind != ResultKind::Data)
                noteStrict(e, std::string("returnData of a ") + typeName(v.type) + " in an operation that returns " +
                                  (e->kind == ResultKind::Paths ? "object paths" : "instances"));
            e->sink->data.push_back(std::move(v));
        }
        return CMPI_RC_OK;
    });
}

CMPIStatus rsInstance(const CMPIResult* r, const CMPIInstance* inst) {
    EncResult* e = asResult(r);
    EncInstance* i = asInstance(inst);
    return guardedStatus(resultOk(e) && i, [&] {
        Instance copy = i->inst;
        copy.path = instancePath(e->core, i->inst);
        std::lock_guard<std::mutex> g(e->m);
        if (e->kind != ResultKind::Instances) noteStrict(e, "returnInstance in an operation that returns no instances");
        addInstance(e, std::move(copy));
        return CMPI_RC_OK;
    });
}

CMPIStatus rsPath(const CMPIResult* r, const CMPIObjectPath* op) {
    EncResult* e = asResult(r);
    EncPath* p = asPath(op);
    return guardedStatus(resultOk(e) && p, [&] {
        std::lock_guard<std::mutex> g(e->m);
        if (e->kind != ResultKind::Paths && e->kind != ResultKind::Data)
            noteStrict(e, "returnObjectPath in an operation that returns no object paths");
        addPath(e, p->p);
        return CMPI_RC_OK;
    });
}

CMPIStatus rsDone(const CMPIResult* r) {
    EncResult* e = asResult(r);
    bool tooFew = false;
    CMPIStatus st = guardedStatus(resultOk(e), [&] {
        std::lock_guard<std::mutex> g(e->m);
        e->sink->done = true;
        tooFew = e->expectsOneInstance && e->core->refuseEmptyGetInstance.load() && e->sink->instances.empty();
        return tooFew ? CMPI_RC_ERR_FAILED : CMPI_RC_OK;
    });
    if (tooFew) st.msg = &newString(e->core, "Too few objects delivered.")->enc;
    return st;
}


// ---------------------------------------------------------------- CMPISelectExp

CMPISelectExp* seClone(const CMPISelectExp* s, CMPIStatus* rc) { return cloneOf(asSelect(s), rc); }

// Matches by class only: the WHERE clause is not evaluated.
CMPIBoolean seEvaluate(const CMPISelectExp* s, const CMPIInstance* inst, CMPIStatus* rc) {
    EncSelectExp* e = asSelect(s);
    EncInstance* i = asInstance(inst);
    return guarded<CMPIBoolean>(rc, e && i, [&] {
        return CMPIBoolean(e->core->repo.isA(i->inst.className(), e->fromClass) ? 1 : 0);
    });
}

CMPIString* seString(const CMPISelectExp* s, CMPIStatus* rc) {
    EncSelectExp* e = asSelect(s);
    return guarded<CMPIString*>(rc, e, [&] { return &newString(e->core, e->query)->enc; });
}



// ---------------------------------------------------------------- CMPIBrokerFT

CMPIContext* bPrepareAttach(const CMPIBroker* mb, const CMPIContext* ctx) {
    Host::Impl* core = coreOf(mb);
    EncContext* e = asContext(ctx);
    return guarded<CMPIContext*>(nullptr, core, [&] {
        auto* o = makeLife<EncContext>(core);
        if (e) o->entries = e->entries;
        return &o->enc;
    });
}

CMPIStatus bAttach(const CMPIBroker* mb, const CMPIContext* ctx) {
    Host::Impl* core = coreOf(mb);
    return guardedStatus(core && asContext(ctx), [&] {
        core->pushArena(true);
        return CMPI_RC_OK;
    });
}

CMPIStatus bDetach(const CMPIBroker* mb, const CMPIContext* ctx) {
    Host::Impl* core = coreOf(mb);
    return guardedStatus(core && asContext(ctx), [&] {
        // The newest arena of this host on this thread is the attached one.
        unsigned long long id = 0;
        {
            std::lock_guard<std::mutex> g(core->arenaLock);
            for (auto it = tlsArenas.rbegin(); it != tlsArenas.rend(); ++it) {
                if (core->arenas.count(*it)) {
                    id = *it;
                    break;
                }
            }
        }
        if (id == 0) return CMPI_RC_ERR_FAILED;
        core->popArena(id);
        return CMPI_RC_OK;
    });
}

CMPIStatus bDeliver(const CMPIBroker* mb, const CMPIContext*, const char* ns, const CMPIInstance* ind) {
    Host::Impl* core = coreOf(mb);
    EncInstance* i = asInstance(ind);
    return guardedStatus(core && i, [&] {
        core->deliver(ns ? ns : "", i->inst, core->onServerThread());
        return CMPI_RC_OK;
    });
}


// ---------------------------------------------------------------- CMPIBrokerEncFT

CMPIInstance* eNewInstance(const CMPIBroker* mb, const CMPIObjectPath* op, CMPIStatus* rc) {
    Host::Impl* core = coreOf(mb);
    EncPath* p = asPath(op);
    return guarded<CMPIInstance*>(rc, core && p, [&] {
        Instance inst;
        inst.path = p->p;
        // sfcb makes the keys of the path properties of the new instance.
        if (core->flavour == Flavour::Sfcb)
            for (const auto& k : p->p.keys) inst.setProperty(k.first, k.second);
        return &newInstance(core, std::move(inst))->enc;
    });
}

CMPIObjectPath* eNewPath(const CMPIBroker* mb, const char* ns, const char* cn, CMPIStatus* rc) {
    Host::Impl* core = coreOf(mb);
    return guarded<CMPIObjectPath*>(rc, core, [&] {
        ObjectPath p;
        p.nameSpace = ns ? ns : "";
        p.className = cn ? cn : "";
        return &newPath(core, std::move(p))->enc;
    });
}

CMPIArgs* eNewArgs(const CMPIBroker* mb, CMPIStatus* rc) {
    Host::Impl* core = coreOf(mb);
    return guarded<CMPIArgs*>(rc, core, [&] { return &newArgs(core, {})->enc; });
}

CMPIString* eNewString(const CMPIBroker* mb, const char* data, CMPIStatus* rc) {
    Host::Impl* core = coreOf(mb);
    return guarded<CMPIString*>(rc, core, [&] {
        EncString* s = newString(core, data ? data : "");
        s->null = data == nullptr;
        return &s->enc;
    });
}

CMPIArray* eNewArray(const CMPIBroker* mb, CMPICount max, CMPIType type, CMPIStatus* rc) {
    Host::Impl* core = coreOf(mb);
    return guarded<CMPIArray*>(rc, core, [&]() -> CMPIArray* {
        Type et;
        if (!scalarType(static_cast<CMPIType>(type & ~CMPI_ARRAY), et) || et == Type::Null)
            return setRc(rc, CMPI_RC_ERR_INVALID_DATA_TYPE), nullptr;
        if (max > (1u << 24)) return setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER), nullptr;
        return &newArray(core, et, std::vector<Value>(max, Value::nullOf(et)))->enc;
    });
}

CMPIDateTime* eNewDateTime(const CMPIBroker* mb, CMPIStatus* rc) {
    Host::Impl* core = coreOf(mb);
    return guarded<CMPIDateTime*>(rc, core, [&] { return &newDateTime(core, DateTime::now())->enc; });
}

CMPIDateTime* eNewDateTimeBin(const CMPIBroker* mb, CMPIUint64 bin, CMPIBoolean interval, CMPIStatus* rc) {
    Host::Impl* core = coreOf(mb);
    return guarded<CMPIDateTime*>(rc, core, [&] {
        DateTime dt;
        dt.usec = bin;
        dt.interval = interval != 0;
        return &newDateTime(core, dt)->enc;
    });
}

CMPIDateTime* eNewDateTimeChars(const CMPIBroker* mb, const char* text, CMPIStatus* rc) {
    Host::Impl* core = coreOf(mb);
    return guarded<CMPIDateTime*>(rc, core, [&]() -> CMPIDateTime* {
        auto dt = text ? DateTime::fromText(text) : std::nullopt;
        if (!dt) return setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER), nullptr;
        return &newDateTime(core, *dt)->enc;
    });
}

CMPISelectExp* eNewSelectExp(const CMPIBroker* mb, const char* query, const char* lang, CMPIArray** projection,
                             CMPIStatus* rc) {
    Host::Impl* core = coreOf(mb);
    if (projection) *projection = nullptr;
    return guarded<CMPISelectExp*>(rc, core, [&]() -> CMPISelectExp* {
        if (!lang || (strcasecmp(lang, "WQL") != 0 && strcasecmp(lang, "CQL") != 0 &&
                      strcasecmp(lang, "DMTF:CQL") != 0))
            return setRc(rc, CMPI_RC_ERR_QUERY_LANGUAGE_NOT_SUPPORTED), nullptr;
        EncSelectExp* s = newSelectExp(core, query ? query : "", lang);
        if (!s) return setRc(rc, CMPI_RC_ERR_INVALID_QUERY), nullptr;
        return &s->enc;
    });
}

CMPIBoolean eClassPathIsA(const CMPIBroker* mb, const CMPIObjectPath* op, const char* type, CMPIStatus* rc) {
    Host::Impl* core = coreOf(mb);
    EncPath* p = asPath(op);
    if (core) {
        std::lock_guard<std::mutex> g(core->counterLock);
        core->counters.classPathIsACalls++;
    }
    return guarded<CMPIBoolean>(rc, core && p, [&] {
        if (!type) return setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER), CMPIBoolean(0);
        return CMPIBoolean(core->repo.isA(p->p.className, type) ? 1 : 0);
    });
}

// Which encapsulated type an object is, by its function table.
const char* typeOfObject(const void* object) {
    struct Head {
        void* hdl;
        const void* ft;
    };
    if (!object) return nullptr;
    const void* ft = static_cast<const Head*>(object)->ft;
    const Tables& t = tables();
    if (ft == &t.instanceFT) return "CMPIInstance";
    if (ft == &t.pathFT) return "CMPIObjectPath";
    if (ft == &t.stringFT) return "CMPIString";
    if (ft == &t.dateTimeFT) return "CMPIDateTime";
    if (ft == &t.arrayFT) return "CMPIArray";
    if (ft == &t.argsFT) return "CMPIArgs";
    if (ft == &t.contextFT) return "CMPIContext";
    if (ft == &t.enumFT) return "CMPIEnumeration";
    if (ft == &t.resultFT) return "CMPIResult";
    if (ft == &t.selectFT) return "CMPISelectExp";
    return nullptr;
}

CMPIString* eToString(const CMPIBroker* mb, const void* object, CMPIStatus* rc) {
    Host::Impl* core = coreOf(mb);
    const char* t = typeOfObject(object);
    return guarded<CMPIString*>(rc, core && t, [&] {
        std::string text;
        const std::string type = t;
        if (type == "CMPIInstance") text = formatInstanceMof(asInstance(static_cast<const CMPIInstance*>(object))->inst);
        else if (type == "CMPIObjectPath") text = formatPath(asPath(static_cast<const CMPIObjectPath*>(object))->p);
        else if (type == "CMPIString") text = asString(static_cast<const CMPIString*>(object))->s;
        else if (type == "CMPIDateTime") text = asDateTime(static_cast<const CMPIDateTime*>(object))->dt.toText();
        else text = type;
        return &newString(core, text)->enc;
    });
}

CMPIBoolean eIsOfType(const CMPIBroker*, const void* object, const char* type, CMPIStatus* rc) {
    const char* t = typeOfObject(object);
    return guarded<CMPIBoolean>(rc, t, [&] { return CMPIBoolean(type && std::strcmp(t, type) == 0 ? 1 : 0); });
}

CMPIString* eGetType(const CMPIBroker* mb, const void* object, CMPIStatus* rc) {
    Host::Impl* core = coreOf(mb);
    const char* t = typeOfObject(object);
    return guarded<CMPIString*>(rc, core && t, [&] { return &newString(core, t)->enc; });
}

// Message lookup: there are no message files, so the default text is
// returned as it stands (insert arguments are not read).
CMPIString* eGetMessage(const CMPIBroker* mb, const char*, const char* defMsg, CMPIStatus* rc, CMPICount, ...) {
    Host::Impl* core = coreOf(mb);
    return guarded<CMPIString*>(rc, core, [&] { return &newString(core, defMsg ? defMsg : "")->enc; });
}

// logMessage and trace: one line to the host's log, "<what>[<level>] <id>: <text>".
CMPIStatus logLine(const CMPIBroker* mb, const char* what, int level, const char* id, const char* text,
                   const CMPIString* string) {
    Host::Impl* core = coreOf(mb);
    return guardedStatus(core, [&] {
        std::string line = std::string(what) + "[" + std::to_string(level) + "] " + (id ? id : "") + ": ";
        line += text ? text : stringOf(string);
        core->log(line);
        return CMPI_RC_OK;
    });
}

CMPIStatus eLog(const CMPIBroker* mb, int severity, const char* id, const char* text, const CMPIString* string) {
    return logLine(mb, "log", severity, id, text, string);
}

CMPIStatus eTrace(const CMPIBroker* mb, int level, const char* component, const char* text,
                  const CMPIString* string) {
    return logLine(mb, "trace", level, component, text, string);
}


CMPIStatus eOpenMsgFile(const CMPIBroker*, const char*, CMPIMsgFileHandle* handle) {
    if (handle) *handle = nullptr;
    return mkStatus(CMPI_RC_OK);
}

CMPIStatus eCloseMsgFile(const CMPIBroker*, const CMPIMsgFileHandle) { return mkStatus(CMPI_RC_OK); }

CMPIString* eGetMessage2(const CMPIBroker* mb, const char*, const CMPIMsgFileHandle, const char* defMsg,
                         CMPIStatus* rc, CMPICount, ...) {
    return eGetMessage(mb, nullptr, defMsg, rc, 0);
}

// ---------------------------------------------------------------- CMPIBrokerExtFT

char* xResolveFileName(const char* filename) {
    if (!filename) return nullptr;
    const std::string name = std::string("lib") + filename + ".so";
    return strdup(name.c_str());
}

CMPI_THREAD_TYPE xNewThread(CMPI_THREAD_RETURN(CMPI_THREAD_CDECL* start)(void*), void* parm, int detached) {
    pthread_t t;
    pthread_attr_t attr;
    pthread_attr_init(&attr);
    if (detached) pthread_attr_setdetachstate(&attr, PTHREAD_CREATE_DETACHED);
    const int rc = pthread_create(&t, &attr, start, parm);
    pthread_attr_destroy(&attr);
    if (rc != 0) return nullptr;
    static_assert(sizeof(pthread_t) <= sizeof(void*), "pthread_t fits a pointer");
    return reinterpret_cast<CMPI_THREAD_TYPE>(t);
}

int xJoinThread(CMPI_THREAD_TYPE thread, CMPI_THREAD_RETURN* retval) {
    return pthread_join(reinterpret_cast<pthread_t>(thread), retval);
}

int xExitThread(CMPI_THREAD_RETURN rc) { pthread_exit(rc); }

int xCancelThread(CMPI_THREAD_TYPE thread) { return pthread_cancel(reinterpret_cast<pthread_t>(thread)); }

int xSleep(CMPIUint32 msec) {
    timespec ts;
    ts.tv_sec = msec / 1000;
    ts.tv_nsec = static_cast<long>(msec % 1000) * 1000000L;
    while (nanosleep(&ts, &ts) != 0 && errno == EINTR) {
    }
    return 0;
}

std::mutex gOnceLock;

int xOnce(int* once, void (*init)(void)) {
    if (!once || !init) return EINVAL;
    std::lock_guard<std::mutex> g(gOnceLock);
    if (*once == 0) {
        *once = 1;
        init();
    }
    return 0;
}

int xCreateKey(CMPI_THREAD_KEY_TYPE* key, void (*cleanup)(void*)) {
    if (!key) return EINVAL;
    pthread_key_t k;
    const int rc = pthread_key_create(&k, cleanup);
    if (rc == 0) *key = static_cast<CMPI_THREAD_KEY_TYPE>(k);
    return rc;
}

int xDestroyKey(CMPI_THREAD_KEY_TYPE key) { return pthread_key_delete(static_cast<pthread_key_t>(key)); }
void* xGetSpecific(CMPI_THREAD_KEY_TYPE key) { return pthread_getspecific(static_cast<pthread_key_t>(key)); }
int xSetSpecific(CMPI_THREAD_KEY_TYPE key, void* value) {
    return pthread_setspecific(static_cast<pthread_key_t>(key), value);
}

CMPI_MUTEX_TYPE xNewMutex(int) {
    auto* m = new (std::nothrow) pthread_mutex_t;
    if (m) pthread_mutex_init(m, nullptr);
    return m;
}
void xDestroyMutex(CMPI_MUTEX_TYPE m) {
    if (!m) return;
    pthread_mutex_destroy(static_cast<pthread_mutex_t*>(m));
    delete static_cast<pthread_mutex_t*>(m);
}
void xLock(CMPI_MUTEX_TYPE m) {
    if (m) pthread_mutex_lock(static_cast<pthread_mutex_t*>(m));
}
void xUnlock(CMPI_MUTEX_TYPE m) {
    if (m) pthread_mutex_unlock(static_cast<pthread_mutex_t*>(m));
}
CMPI_COND_TYPE xNewCond(int) {
    auto* c = new (std::nothrow) pthread_cond_t;
    if (c) pthread_cond_init(c, nullptr);
    return c;
}
void xDestroyCond(CMPI_COND_TYPE c) {
    if (!c) return;
    pthread_cond_destroy(static_cast<pthread_cond_t*>(c));
    delete static_cast<pthread_cond_t*>(c);
}
int xCondWait(CMPI_COND_TYPE c, CMPI_MUTEX_TYPE m) {
    if (!c || !m) return EINVAL;
    return pthread_cond_wait(static_cast<pthread_cond_t*>(c), static_cast<pthread_mutex_t*>(m));
}
int xTimedCondWait(CMPI_COND_TYPE c, CMPI_MUTEX_TYPE m, struct timespec* wait) {
    if (!c || !m || !wait) return EINVAL;
    return pthread_cond_timedwait(static_cast<pthread_cond_t*>(c), static_cast<pthread_mutex_t*>(m), wait);
}
int xSignalCond(CMPI_COND_TYPE c) {
    if (!c) return EINVAL;
    return pthread_cond_signal(static_cast<pthread_cond_t*>(c));
}

// ---------------------------------------------------------------- CMPIBrokerMemFT

CMPIGcStat* mMark(const CMPIBroker* mb, CMPIStatus* rc) {
    Host::Impl* core = coreOf(mb);
    return guarded<CMPIGcStat*>(rc, core, [&] {
        const unsigned long long id = core->pushArena();
        return reinterpret_cast<CMPIGcStat*>(static_cast<uintptr_t>(id));
    });
}

CMPIStatus mRelease(const CMPIBroker* mb, const CMPIGcStat* gc) {
    Host::Impl* core = coreOf(mb);
    return guardedStatus(core && gc, [&] {
        const auto id = static_cast<unsigned long long>(reinterpret_cast<uintptr_t>(gc));
        {
            std::lock_guard<std::mutex> g(core->arenaLock);
            if (!core->arenas.count(id)) return CMPI_RC_ERR_INVALID_HANDLE;
        }
        core->popArena(id);
        return CMPI_RC_OK;
    });
}

void* track(Host::Impl* core, void* p) {
    if (!core || !p) return p;
    try {
        std::lock_guard<std::mutex> g(core->mallocLock);
        core->mallocs.insert(p);
    } catch (...) {
        std::free(p);
        return nullptr;
    }
    return p;
}

void* mMalloc(const CMPIBroker* mb, size_t size) { return track(coreOf(mb), std::malloc(size)); }
void* mCalloc(const CMPIBroker* mb, size_t n, size_t size) { return track(coreOf(mb), std::calloc(n, size)); }

void* mRealloc(const CMPIBroker* mb, void* ptr, size_t size) {
    Host::Impl* core = coreOf(mb);
    if (!core) return nullptr;
    if (!ptr) return mMalloc(mb, size);
    std::lock_guard<std::mutex> g(core->mallocLock);
    auto it = core->mallocs.find(ptr);
    if (it == core->mallocs.end()) return nullptr;   // not from cmpiMalloc
    void* np = std::realloc(ptr, size);
    if (!np) return nullptr;
    core->mallocs.erase(it);
    try {
        core->mallocs.insert(np);
    } catch (...) {
    }
    return np;
}

char* mStrDup(const CMPIBroker* mb, const char* s) {
    if (!s) return nullptr;
    return static_cast<char*>(track(coreOf(mb), strdup(s)));
}

void mFree(const CMPIBroker* mb, void* ptr) {
    Host::Impl* core = coreOf(mb);
    if (!core || !ptr) return;
    std::lock_guard<std::mutex> g(core->mallocLock);
    auto it = core->mallocs.find(ptr);
    if (it == core->mallocs.end()) return;   // not ours: leave it alone
    core->mallocs.erase(it);
    std::free(ptr);
}


Tables buildTables() {
    Tables t;
    std::memset(&t, 0, sizeof t);

    t.bft.brokerCapabilities = CMPI_MB_Class_0 | CMPI_MB_Supports_IndicationMI;
    t.bft.brokerVersion = 200;
    t.bft.brokerName = "cimhost";
    t.bft.prepareAttachThread = bPrepareAttach;
    t.bft.attachThread = bAttach;
    t.bft.detachThread = bDetach;
    t.bft.deliverIndication = bDeliver;
    // Up-calls to other providers: the host serves one provider only.
    unsupported(t.bft.enumerateInstanceNames);
    unsupported(t.bft.getInstance);
    unsupported(t.bft.createInstance);
    unsupported(t.bft.modifyInstance);
    unsupported(t.bft.deleteInstance);
    unsupported(t.bft.execQuery);
    unsupported(t.bft.enumerateInstances);
    unsupported(t.bft.associators);
    unsupported(t.bft.associatorNames);
    unsupported(t.bft.references);
    unsupported(t.bft.referenceNames);
    unsupported(t.bft.invokeMethod);
    unsupported(t.bft.setProperty);
    unsupported(t.bft.getProperty);

    t.eft.ftVersion = 200;
    t.eft.newInstance = eNewInstance;
    t.eft.newObjectPath = eNewPath;
    t.eft.newArgs = eNewArgs;
    t.eft.newString = eNewString;
    t.eft.newArray = eNewArray;
    t.eft.newDateTime = eNewDateTime;
    t.eft.newDateTimeFromBinary = eNewDateTimeBin;
    t.eft.newDateTimeFromChars = eNewDateTimeChars;
    t.eft.newSelectExp = eNewSelectExp;
    t.eft.classPathIsA = eClassPathIsA;
    t.eft.toString = eToString;
    t.eft.isOfType = eIsOfType;
    t.eft.getType = eGetType;
    t.eft.getMessage = eGetMessage;
    t.eft.logMessage = eLog;
    t.eft.trace = eTrace;
    unsupported(t.eft.newCMPIError);
    t.eft.openMessageFile = eOpenMsgFile;
    t.eft.closeMessageFile = eCloseMsgFile;
    t.eft.getMessage2 = eGetMessage2;

    t.xft.ftVersion = 200;
    t.xft.resolveFileName = xResolveFileName;
    t.xft.newThread = xNewThread;
    t.xft.joinThread = xJoinThread;
    t.xft.exitThread = xExitThread;
    t.xft.cancelThread = xCancelThread;
    t.xft.threadSleep = xSleep;
    t.xft.threadOnce = xOnce;
    t.xft.createThreadKey = xCreateKey;
    t.xft.destroyThreadKey = xDestroyKey;
    t.xft.getThreadSpecific = xGetSpecific;
    t.xft.setThreadSpecific = xSetSpecific;
    t.xft.newMutex = xNewMutex;
    t.xft.destroyMutex = xDestroyMutex;
    t.xft.lockMutex = xLock;
    t.xft.unlockMutex = xUnlock;
    t.xft.newCondition = xNewCond;
    t.xft.destroyCondition = xDestroyCond;
    t.xft.condWait = xCondWait;
    t.xft.timedCondWait = xTimedCondWait;
    t.xft.signalCondition = xSignalCond;

    t.mft.ftVersion = 200;
    t.mft.mark = mMark;
    t.mft.release = mRelease;
    t.mft.cmpiMalloc = mMalloc;
    t.mft.cmpiCalloc = mCalloc;
    t.mft.cmpiRealloc = mRealloc;
    t.mft.cmpiStrDup = mStrDup;
    t.mft.cmpiFree = mFree;
    t.mft.freeInstance = freeOf<asInstance>;
    t.mft.freeObjectPath = freeOf<asPath>;
    t.mft.freeArgs = freeOf<asArgs>;
    t.mft.freeString = freeOf<asString>;
    t.mft.freeArray = freeOf<asArray>;
    t.mft.freeDateTime = freeOf<asDateTime>;
    t.mft.freeSelectExp = freeOf<asSelect>;

    t.stringFT.ftVersion = 200;
    t.stringFT.release = releaseOf<asString>;
    t.stringFT.clone = strClone;
    t.stringFT.getCharPtr = strChars;

    t.dateTimeFT.ftVersion = 200;
    t.dateTimeFT.release = releaseOf<asDateTime>;
    t.dateTimeFT.clone = dtClone;
    t.dateTimeFT.getBinaryFormat = dtBinary;
    t.dateTimeFT.getStringFormat = dtText;
    t.dateTimeFT.isInterval = dtIsInterval;

    t.pathFT.ftVersion = 200;
    t.pathFT.release = releaseOf<asPath>;
    t.pathFT.clone = opClone;
    t.pathFT.setNameSpace = opSetText<&ObjectPath::nameSpace>;
    t.pathFT.getNameSpace = opGetText<&ObjectPath::nameSpace>;
    t.pathFT.setHostname = opSetText<&ObjectPath::host>;
    t.pathFT.getHostname = opGetText<&ObjectPath::host>;
    t.pathFT.setClassName = opSetText<&ObjectPath::className>;
    t.pathFT.getClassName = opGetText<&ObjectPath::className>;
    t.pathFT.addKey = opAddKey;
    t.pathFT.getKey = pathGetKey;
    t.pathFT.getKeyAt = nlGetAt<asPath>;
    t.pathFT.getKeyCount = nlCount<asPath>;
    t.pathFT.setNameSpaceFromObjectPath = opSetNsFrom;
    t.pathFT.setHostAndNameSpaceFromObjectPath = opSetHostNsFrom;
    unsupported(t.pathFT.getClassQualifier);
    unsupported(t.pathFT.getPropertyQualifier);
    unsupported(t.pathFT.getMethodQualifier);
    unsupported(t.pathFT.getParameterQualifier);
    t.pathFT.toString = opToString;

    t.arrayFT.ftVersion = 200;
    t.arrayFT.release = releaseOf<asArray>;
    t.arrayFT.clone = arClone;
    t.arrayFT.getSize = arSize;
    t.arrayFT.getSimpleType = arType;
    t.arrayFT.getElementAt = arGet;
    t.arrayFT.setElementAt = arSet;

    t.instanceFT.ftVersion = 200;
    t.instanceFT.release = releaseOf<asInstance>;
    t.instanceFT.clone = inClone;
    t.instanceFT.getProperty = nlGet<asInstance>;
    t.instanceFT.getPropertyAt = nlGetAt<asInstance>;
    t.instanceFT.getPropertyCount = nlCount<asInstance>;
    t.instanceFT.setProperty = inSet;
    t.instanceFT.getObjectPath = inPath;
    t.instanceFT.setPropertyFilter = inSetFilter;
    t.instanceFT.setObjectPath = inSetPath;
    t.instanceFT.setPropertyWithOrigin = inSetWithOrigin;

    t.argsFT.ftVersion = 200;
    t.argsFT.release = releaseOf<asArgs>;
    t.argsFT.clone = nlClone<asArgs>;
    t.argsFT.addArg = nlAdd<asArgs>;
    t.argsFT.getArg = nlGet<asArgs>;
    t.argsFT.getArgAt = nlGetAt<asArgs>;
    t.argsFT.getArgCount = nlCount<asArgs>;

    t.contextFT.ftVersion = 200;
    t.contextFT.release = releaseOf<asContext>;
    t.contextFT.clone = nlClone<asContext>;
    t.contextFT.getEntry = nlGet<asContext>;
    t.contextFT.getEntryAt = nlGetAt<asContext>;
    t.contextFT.getEntryCount = nlCount<asContext>;
    t.contextFT.addEntry = nlAdd<asContext>;

    t.enumFT.ftVersion = 200;
    t.enumFT.release = releaseOf<asEnum>;
    t.enumFT.clone = enClone;
    t.enumFT.getNext = enNext;
    t.enumFT.hasNext = enHasNext;
    t.enumFT.toArray = enToArray;

    t.resultFT.ftVersion = 200;
    t.resultFT.release = releaseOf<asResult>;
    unsupported(t.resultFT.clone);
    t.resultFT.returnData = rsData;
    t.resultFT.returnInstance = rsInstance;
    t.resultFT.returnObjectPath = rsPath;
    t.resultFT.returnDone = rsDone;
    unsupported(t.resultFT.returnError);

    t.selectFT.ftVersion = 200;
    t.selectFT.release = releaseOf<asSelect>;
    t.selectFT.clone = seClone;
    t.selectFT.evaluate = seEvaluate;
    t.selectFT.getString = seString;
    unsupported(t.selectFT.getDOC);
    unsupported(t.selectFT.getCOD);
    unsupported(t.selectFT.evaluateUsingAccessor);
    return t;
}

}  // namespace

Tables& tables() {
    static Tables t = buildTables();
    return t;
}

}  // namespace detail

// ---------------------------------------------------------------- arena bookkeeping of the host

Arena* Host::Impl::currentArena() {
    std::lock_guard<std::mutex> g(arenaLock);
    for (auto it = detail::tlsArenas.rbegin(); it != detail::tlsArenas.rend(); ++it) {
        auto found = arenas.find(*it);
        if (found != arenas.end()) return found->second;
    }
    return lifeArena.get();
}

bool Host::Impl::onServerThread() {
    std::lock_guard<std::mutex> g(arenaLock);
    for (unsigned long long id : detail::tlsArenas) {
        auto found = arenas.find(id);
        if (found != arenas.end() && found->second->threadScope) return true;
    }
    return false;
}

unsigned long long Host::Impl::pushArena(bool threadScope) {
    const unsigned long long id = detail::gNextArenaId.fetch_add(1);
    auto arena = std::make_unique<Arena>(id, threadScope);
    {
        std::lock_guard<std::mutex> g(arenaLock);
        arenas[id] = arena.get();
    }
    detail::tlsArenas.push_back(id);
    arena.release();
    return id;
}

void Host::Impl::popArena(unsigned long long id) {
    auto& stack = detail::tlsArenas;
    for (auto it = stack.rbegin(); it != stack.rend(); ++it) {
        if (*it == id) {
            stack.erase(std::next(it).base());
            break;
        }
    }
    // Ids of arenas that are gone (another host, a freed one) go too.
    Arena* arena = nullptr;
    {
        std::lock_guard<std::mutex> g(arenaLock);
        auto found = arenas.find(id);
        if (found != arenas.end()) {
            arena = found->second;
            arenas.erase(found);
        }
    }
    delete arena;
}

void Host::Impl::freeAllArenas() {
    std::unordered_map<unsigned long long, Arena*> all;
    std::unique_ptr<Arena> life;
    {
        std::lock_guard<std::mutex> g(arenaLock);
        all.swap(arenas);
        life = std::move(lifeArena);
        lifeArena = std::make_unique<Arena>(0);
    }
    for (auto& kv : all) delete kv.second;
    life.reset();
    std::lock_guard<std::mutex> g(mallocLock);
    for (void* p : mallocs) std::free(p);
    mallocs.clear();
}

}  // namespace cimhost

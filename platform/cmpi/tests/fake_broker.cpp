// In-process broker for the wrapper's unit tests; see fake_broker.h.
#include "fake_broker.h"

#include <cstdio>
#include <cstring>
#include <map>
#include <memory>
#include <mutex>
#include <strings.h>
#include <sys/time.h>

namespace fake {
namespace {

struct Object {
    virtual ~Object() = default;
};

std::mutex g_mutex;
std::vector<std::unique_ptr<Object>> g_objects;
std::map<std::string, std::string> g_super;  // lower-case class -> lower-case superclass
std::vector<Delivered> g_delivered;
int g_attached = 0;

template <class T>
T* keep(T* obj)
{
    std::lock_guard<std::mutex> lock(g_mutex);
    g_objects.emplace_back(obj);
    return obj;
}

CMPIStatus ok()
{
    return CMPIStatus{CMPI_RC_OK, nullptr};
}

CMPIStatus fail(CMPIrc rc)
{
    return CMPIStatus{rc, nullptr};
}

void setRc(CMPIStatus* rc, CMPIrc code)
{
    if (rc != nullptr) {
        rc->rc = code;
        rc->msg = nullptr;
    }
}

std::string lower(const char* s)
{
    std::string out = s != nullptr ? s : "";
    for (char& c : out)
        c = static_cast<char>(tolower(static_cast<unsigned char>(c)));
    return out;
}

// Only object paths are ever cloned (by the association module); the other
// tables have no clone function, nor entries that nothing calls.

// ---- strings ----------------------------------------------------------

struct String : Object {
    CMPIString enc;
    std::string text;
};

CMPIStatus strRelease(CMPIString*) { return ok(); }
const char* strChars(const CMPIString* s, CMPIStatus* rc)
{
    setRc(rc, CMPI_RC_OK);
    return static_cast<String*>(s->hdl)->text.c_str();
}
CMPIStringFT g_strFT = {200, strRelease, nullptr, strChars};

CMPIString* makeString(const char* text)
{
    String* s = keep(new String);
    s->text = text != nullptr ? text : "";
    s->enc.hdl = s;
    s->enc.ft = &g_strFT;
    return &s->enc;
}

// Stores a value.  CMPI_chars is refused: brokers disagree on how its
// CMPIValue is laid out, so the wrapper must never send it.
CMPIData store(const CMPIValue* value, CMPIType type)
{
    CMPIData d;
    d.type = type;
    d.state = CMPI_goodValue;
    d.value.uint64 = 0;
    if (value == nullptr) {
        d.state = CMPI_nullValue;
        return d;
    }
    // Read only the member of the type: the caller's object may be as
    // small as that member (a CMPIUint16 passed by address).
    if (type & CMPI_ARRAY) {
        d.value.array = value->array;
        return d;
    }
    switch (type) {
    case CMPI_boolean: d.value.boolean = value->boolean; break;
    case CMPI_char16: d.value.char16 = value->char16; break;
    case CMPI_real32: d.value.real32 = value->real32; break;
    case CMPI_real64: d.value.real64 = value->real64; break;
    case CMPI_uint8: d.value.uint8 = value->uint8; break;
    case CMPI_sint8: d.value.sint8 = value->sint8; break;
    case CMPI_uint16: d.value.uint16 = value->uint16; break;
    case CMPI_sint16: d.value.sint16 = value->sint16; break;
    case CMPI_uint32: d.value.uint32 = value->uint32; break;
    case CMPI_sint32: d.value.sint32 = value->sint32; break;
    case CMPI_uint64: d.value.uint64 = value->uint64; break;
    case CMPI_sint64: d.value.sint64 = value->sint64; break;
    default: d.value.inst = value->inst; break;  // every handle type
    }
    return d;
}

bool isChars(CMPIType t)
{
    return (t & ~CMPI_ARRAY) == CMPI_chars;
}

CMPIData absent()
{
    CMPIData d;
    d.type = CMPI_null;
    d.state = CMPI_nullValue | CMPI_notFound;
    d.value.uint64 = 0;
    return d;
}

// ---- named value lists (keys, properties, args, context entries) --------

using Named = std::vector<std::pair<std::string, CMPIData>>;

CMPIData* findNamed(Named& list, const char* name)
{
    for (auto& e : list)
        if (strcasecmp(e.first.c_str(), name != nullptr ? name : "") == 0)
            return &e.second;
    return nullptr;
}

void putNamed(Named& list, const char* name, CMPIData d)
{
    if (CMPIData* old = findNamed(list, name))
        *old = d;
    else
        list.emplace_back(name, d);
}

CMPIData getNamed(Named& list, const char* name, CMPIStatus* rc, CMPIrc absentRc)
{
    if (CMPIData* d = findNamed(list, name)) {
        setRc(rc, CMPI_RC_OK);
        return *d;
    }
    setRc(rc, absentRc);
    return absent();
}

CMPIData getNamedAt(Named& list, CMPICount i, CMPIString** name, CMPIStatus* rc)
{
    if (i >= list.size()) {
        setRc(rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
        return absent();
    }
    if (name != nullptr)
        *name = makeString(list[i].first.c_str());
    setRc(rc, CMPI_RC_OK);
    return list[i].second;
}

// ---- arrays -------------------------------------------------------------

struct Array : Object {
    CMPIArray enc;
    CMPIType type;
    std::vector<CMPIData> items;
};

Array* arr(const CMPIArray* a) { return static_cast<Array*>(a->hdl); }
CMPIStatus arrRelease(CMPIArray*) { return ok(); }
CMPICount arrSize(const CMPIArray* a, CMPIStatus* rc) { setRc(rc, CMPI_RC_OK); return static_cast<CMPICount>(arr(a)->items.size()); }
CMPIType arrType(const CMPIArray* a, CMPIStatus* rc) { setRc(rc, CMPI_RC_OK); return arr(a)->type; }
CMPIData arrGet(const CMPIArray* a, CMPICount i, CMPIStatus* rc)
{
    if (i >= arr(a)->items.size()) {
        setRc(rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
        return absent();
    }
    setRc(rc, CMPI_RC_OK);
    return arr(a)->items[i];
}
CMPIStatus arrSet(CMPIArray* a, CMPICount i, const CMPIValue* v, CMPIType t)
{
    if (isChars(t))
        return fail(CMPI_RC_ERR_INVALID_DATA_TYPE);
    if (i >= arr(a)->items.size())
        return fail(CMPI_RC_ERR_NO_SUCH_PROPERTY);
    arr(a)->items[i] = store(v, t);
    return ok();
}
CMPIArrayFT g_arrFT = {200, arrRelease, nullptr, arrSize, arrType, arrGet, arrSet};

// ---- object paths -------------------------------------------------------

struct Path : Object {
    CMPIObjectPath enc;
    std::string ns, host, cls;
    Named keys;
};

Path* path(const CMPIObjectPath* op) { return static_cast<Path*>(op->hdl); }
CMPIStatus opRelease(CMPIObjectPath*) { return ok(); }
CMPIObjectPath* makePath(const char* ns, const char* cls);
CMPIObjectPath* opClone(const CMPIObjectPath* op, CMPIStatus* rc)
{
    CMPIObjectPath* copy = makePath(path(op)->ns.c_str(), path(op)->cls.c_str());
    path(copy)->host = path(op)->host;
    path(copy)->keys = path(op)->keys;
    setRc(rc, CMPI_RC_OK);
    return copy;
}
CMPIStatus opSetNs(CMPIObjectPath* op, const char* ns) { path(op)->ns = ns != nullptr ? ns : ""; return ok(); }
CMPIString* opGetNs(const CMPIObjectPath* op, CMPIStatus* rc) { setRc(rc, CMPI_RC_OK); return makeString(path(op)->ns.c_str()); }
CMPIStatus opSetHost(CMPIObjectPath* op, const char* h) { path(op)->host = h != nullptr ? h : ""; return ok(); }
CMPIString* opGetHost(const CMPIObjectPath* op, CMPIStatus* rc) { setRc(rc, CMPI_RC_OK); return makeString(path(op)->host.c_str()); }
CMPIStatus opSetCls(CMPIObjectPath* op, const char* c) { path(op)->cls = c != nullptr ? c : ""; return ok(); }
CMPIString* opGetCls(const CMPIObjectPath* op, CMPIStatus* rc) { setRc(rc, CMPI_RC_OK); return makeString(path(op)->cls.c_str()); }
CMPIStatus opAddKey(CMPIObjectPath* op, const char* name, const CMPIValue* v, const CMPIType t)
{
    if (name == nullptr || *name == '\0')
        return fail(CMPI_RC_ERR_INVALID_PARAMETER);
    if (isChars(t))
        return fail(CMPI_RC_ERR_INVALID_DATA_TYPE);
    CMPIData d = store(v, t);
    d.state = static_cast<CMPIValueState>(d.state | CMPI_keyValue);
    putNamed(path(op)->keys, name, d);
    return ok();
}
CMPIData opGetKey(const CMPIObjectPath* op, const char* name, CMPIStatus* rc)
{
    return getNamed(path(op)->keys, name, rc, CMPI_RC_ERR_NOT_FOUND);
}
CMPIData opGetKeyAt(const CMPIObjectPath* op, CMPICount i, CMPIString** name, CMPIStatus* rc)
{
    return getNamedAt(path(op)->keys, i, name, rc);
}
CMPICount opKeyCount(const CMPIObjectPath* op, CMPIStatus* rc) { setRc(rc, CMPI_RC_OK); return static_cast<CMPICount>(path(op)->keys.size()); }
CMPIString* opToString(const CMPIObjectPath* op, CMPIStatus* rc)
{
    std::string s = path(op)->ns + ":" + path(op)->cls;
    setRc(rc, CMPI_RC_OK);
    return makeString(s.c_str());
}
CMPIObjectPathFT g_opFT = {200, opRelease, opClone, opSetNs, opGetNs, opSetHost, opGetHost,
                           opSetCls, opGetCls, opAddKey, opGetKey, opGetKeyAt, opKeyCount,
                           nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, opToString};

CMPIObjectPath* makePath(const char* ns, const char* cls)
{
    Path* p = keep(new Path);
    p->ns = ns != nullptr ? ns : "";
    p->cls = cls != nullptr ? cls : "";
    p->enc.hdl = p;
    p->enc.ft = &g_opFT;
    return &p->enc;
}

// ---- instances ----------------------------------------------------------

struct Instance : Object {
    CMPIInstance enc;
    CMPIObjectPath* op;
    Named props;
    bool filtered = false;
    std::vector<std::string> allowed;  // lower case
};

Instance* inst(const CMPIInstance* i) { return static_cast<Instance*>(i->hdl); }
CMPIStatus instRelease(CMPIInstance*) { return ok(); }
CMPIData instGet(const CMPIInstance* i, const char* name, CMPIStatus* rc)
{
    return getNamed(inst(i)->props, name, rc, CMPI_RC_ERR_NO_SUCH_PROPERTY);
}
CMPIData instGetAt(const CMPIInstance* i, CMPICount n, CMPIString** name, CMPIStatus* rc)
{
    return getNamedAt(inst(i)->props, n, name, rc);
}
CMPICount instCount(const CMPIInstance* i, CMPIStatus* rc) { setRc(rc, CMPI_RC_OK); return static_cast<CMPICount>(inst(i)->props.size()); }
CMPIStatus instSet(const CMPIInstance* i, const char* name, const CMPIValue* v, CMPIType t)
{
    if (name == nullptr || *name == '\0')
        return fail(CMPI_RC_ERR_INVALID_PARAMETER);
    if (isChars(t))
        return fail(CMPI_RC_ERR_INVALID_DATA_TYPE);
    Instance* in = inst(i);
    if (in->filtered) {
        bool allowed = false;
        for (const auto& a : in->allowed)
            allowed = allowed || a == lower(name);
        if (!allowed)
            return ok();  // filtered out: accepted and dropped
    }
    putNamed(in->props, name, store(v, t));
    return ok();
}
CMPIObjectPath* instPath(const CMPIInstance* i, CMPIStatus* rc) { setRc(rc, CMPI_RC_OK); return inst(i)->op; }
CMPIStatus instFilter(CMPIInstance* i, const char** props, const char** keys)
{
    Instance* in = inst(i);
    if (props == nullptr) {
        in->filtered = false;
        return ok();
    }
    in->filtered = true;
    in->allowed.clear();
    for (const char** p = props; *p != nullptr; ++p)
        in->allowed.push_back(lower(*p));
    for (const char** k = keys; k != nullptr && *k != nullptr; ++k)
        in->allowed.push_back(lower(*k));
    return ok();
}
CMPIInstanceFT g_instFT = {200, instRelease, nullptr, instGet, instGetAt, instCount, instSet,
                           instPath, instFilter, nullptr, nullptr};

// ---- args ---------------------------------------------------------------

struct Args : Object {
    CMPIArgs enc;
    Named args;
};

Args* args(const CMPIArgs* a) { return static_cast<Args*>(a->hdl); }
CMPIStatus argsRelease(CMPIArgs*) { return ok(); }
CMPIStatus argsAdd(const CMPIArgs* a, const char* name, const CMPIValue* v, const CMPIType t)
{
    if (isChars(t))
        return fail(CMPI_RC_ERR_INVALID_DATA_TYPE);
    putNamed(args(a)->args, name, store(v, t));
    return ok();
}
CMPIData argsGet(const CMPIArgs* a, const char* name, CMPIStatus* rc)
{
    return getNamed(args(a)->args, name, rc, CMPI_RC_ERR_NOT_FOUND);
}
CMPIData argsGetAt(const CMPIArgs* a, CMPICount i, CMPIString** name, CMPIStatus* rc)
{
    return getNamedAt(args(a)->args, i, name, rc);
}
CMPICount argsCount(const CMPIArgs* a, CMPIStatus* rc) { setRc(rc, CMPI_RC_OK); return static_cast<CMPICount>(args(a)->args.size()); }
CMPIArgsFT g_argsFT = {200, argsRelease, nullptr, argsAdd, argsGet, argsGetAt, argsCount};

// ---- date-times ---------------------------------------------------------

struct DateTime : Object {
    CMPIDateTime enc;
    CMPIUint64 micros;
    bool interval;
};

DateTime* dt(const CMPIDateTime* d) { return static_cast<DateTime*>(d->hdl); }
CMPIStatus dtRelease(CMPIDateTime*) { return ok(); }
CMPIUint64 dtBinary(const CMPIDateTime* d, CMPIStatus* rc) { setRc(rc, CMPI_RC_OK); return dt(d)->micros; }
CMPIString* dtString(const CMPIDateTime* d, CMPIStatus* rc)
{
    char buf[32];
    CMPIUint64 us = dt(d)->micros;
    std::snprintf(buf, sizeof buf, "%020llu", static_cast<unsigned long long>(us));
    setRc(rc, CMPI_RC_OK);
    return makeString(buf);
}
CMPIBoolean dtIsInterval(const CMPIDateTime* d, CMPIStatus* rc) { setRc(rc, CMPI_RC_OK); return dt(d)->interval ? 1 : 0; }
CMPIDateTimeFT g_dtFT = {200, dtRelease, nullptr, dtBinary, dtString, dtIsInterval};

CMPIDateTime* makeDateTime(CMPIUint64 micros, bool interval)
{
    DateTime* d = keep(new DateTime);
    d->micros = micros;
    d->interval = interval;
    d->enc.hdl = d;
    d->enc.ft = &g_dtFT;
    return &d->enc;
}

// ---- results, contexts, select expressions -------------------------------

struct Result : Object {
    CMPIResult enc;
    std::vector<ResultItem> items;
    bool done = false;
};

Result* res(const CMPIResult* r) { return static_cast<Result*>(r->hdl); }
CMPIStatus resRelease(CMPIResult*) { return ok(); }
CMPIStatus resData(const CMPIResult* r, const CMPIValue* v, const CMPIType t)
{
    if (isChars(t))
        return fail(CMPI_RC_ERR_INVALID_DATA_TYPE);
    res(r)->items.push_back(ResultItem{store(v, t)});
    return ok();
}
CMPIStatus resInst(const CMPIResult* r, const CMPIInstance* i)
{
    CMPIValue v;
    v.inst = const_cast<CMPIInstance*>(i);
    return resData(r, &v, CMPI_instance);
}
CMPIStatus resPath(const CMPIResult* r, const CMPIObjectPath* op)
{
    CMPIValue v;
    v.ref = const_cast<CMPIObjectPath*>(op);
    return resData(r, &v, CMPI_ref);
}
CMPIStatus resDone(const CMPIResult* r)
{
    res(r)->done = true;
    return ok();
}
CMPIResultFT g_resFT = {200, resRelease, nullptr, resData, resInst, resPath, resDone, nullptr};

struct Context : Object {
    CMPIContext enc;
    Named entries;
};

CMPIStatus ctxRelease(CMPIContext*) { return ok(); }
CMPIData ctxGet(const CMPIContext* c, const char* name, CMPIStatus* rc)
{
    return getNamed(static_cast<Context*>(c->hdl)->entries, name, rc, CMPI_RC_ERR_NOT_FOUND);
}
CMPIStatus ctxAdd(const CMPIContext* c, const char* name, const CMPIValue* v, const CMPIType t)
{
    putNamed(static_cast<Context*>(c->hdl)->entries, name, store(v, t));
    return ok();
}
CMPIContextFT g_ctxFT = {200, ctxRelease, nullptr, ctxGet, nullptr, nullptr, ctxAdd};

struct SelectExp : Object {
    CMPISelectExp enc;
    std::string query;
};

CMPIStatus seRelease(CMPISelectExp*) { return ok(); }
CMPIString* seString(const CMPISelectExp* se, CMPIStatus* rc)
{
    setRc(rc, CMPI_RC_OK);
    return makeString(static_cast<SelectExp*>(se->hdl)->query.c_str());
}
CMPISelectExpFT g_seFT = {200, seRelease, nullptr, nullptr, seString, nullptr, nullptr, nullptr};

// ---- the broker ---------------------------------------------------------

CMPIInstance* bNewInstance(const CMPIBroker*, const CMPIObjectPath* op, CMPIStatus* rc)
{
    if (op == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER);
        return nullptr;
    }
    Instance* i = keep(new Instance);
    i->op = opClone(op, nullptr);
    i->enc.hdl = i;
    i->enc.ft = &g_instFT;
    setRc(rc, CMPI_RC_OK);
    return &i->enc;
}

CMPIObjectPath* bNewPath(const CMPIBroker*, const char* ns, const char* cls, CMPIStatus* rc)
{
    setRc(rc, CMPI_RC_OK);
    return makePath(ns, cls);
}

CMPIArgs* bNewArgs(const CMPIBroker*, CMPIStatus* rc)
{
    Args* a = keep(new Args);
    a->enc.hdl = a;
    a->enc.ft = &g_argsFT;
    setRc(rc, CMPI_RC_OK);
    return &a->enc;
}

CMPIString* bNewString(const CMPIBroker*, const char* text, CMPIStatus* rc)
{
    setRc(rc, CMPI_RC_OK);
    return makeString(text);
}

CMPIArray* bNewArray(const CMPIBroker*, CMPICount n, CMPIType t, CMPIStatus* rc)
{
    Array* a = keep(new Array);
    a->type = t;
    a->items.assign(n, CMPIData{t, CMPI_nullValue, {0}});
    a->enc.hdl = a;
    a->enc.ft = &g_arrFT;
    setRc(rc, CMPI_RC_OK);
    return &a->enc;
}

CMPIDateTime* bNewDateTime(const CMPIBroker*, CMPIStatus* rc)
{
    struct timeval tv;
    gettimeofday(&tv, nullptr);
    setRc(rc, CMPI_RC_OK);
    return makeDateTime(static_cast<CMPIUint64>(tv.tv_sec) * 1000000u + static_cast<CMPIUint64>(tv.tv_usec), false);
}

CMPIDateTime* bNewDateTimeBin(const CMPIBroker*, CMPIUint64 t, CMPIBoolean interval, CMPIStatus* rc)
{
    setRc(rc, CMPI_RC_OK);
    return makeDateTime(t, interval != 0);
}

// Only the interval form "ddddddddhhmmss.mmmmmm:000" is understood here.
CMPIDateTime* bNewDateTimeChars(const CMPIBroker*, const char* s, CMPIStatus* rc)
{
    unsigned long long d, h, m, sec, us;
    char colon = 0;
    if (s == nullptr || std::strlen(s) != 25 ||
        std::sscanf(s, "%8llu%2llu%2llu%2llu.%6llu%c", &d, &h, &m, &sec, &us, &colon) != 6 || colon != ':') {
        setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER);
        return nullptr;
    }
    setRc(rc, CMPI_RC_OK);
    return makeDateTime((((d * 24 + h) * 60 + m) * 60 + sec) * 1000000ull + us, true);
}

CMPIBoolean bIsA(const CMPIBroker*, const CMPIObjectPath* op, const char* type, CMPIStatus* rc)
{
    if (op == nullptr || type == nullptr) {
        setRc(rc, CMPI_RC_ERR_INVALID_PARAMETER);
        return 0;
    }
    setRc(rc, CMPI_RC_OK);
    std::lock_guard<std::mutex> lock(g_mutex);
    std::string cls = lower(path(op)->cls.c_str());
    const std::string want = lower(type);
    for (int depth = 0; depth < 64 && !cls.empty(); ++depth) {
        if (cls == want)
            return 1;
        auto it = g_super.find(cls);
        cls = it != g_super.end() ? it->second : std::string();
    }
    return 0;
}

CMPIContext* bPrepare(const CMPIBroker*, const CMPIContext*)
{
    return newContext();
}

CMPIStatus bAttach(const CMPIBroker*, const CMPIContext*)
{
    std::lock_guard<std::mutex> lock(g_mutex);
    ++g_attached;
    return ok();
}

CMPIStatus bDetach(const CMPIBroker*, const CMPIContext*)
{
    std::lock_guard<std::mutex> lock(g_mutex);
    --g_attached;
    return ok();
}

CMPIStatus bDeliver(const CMPIBroker*, const CMPIContext*, const char* ns, const CMPIInstance* ind)
{
    if (ns == nullptr || ind == nullptr)
        return fail(CMPI_RC_ERR_INVALID_PARAMETER);
    std::lock_guard<std::mutex> lock(g_mutex);
    g_delivered.push_back(Delivered{ns, ind});
    return ok();
}

CMPIBrokerFT g_bft = {0, 200, "FakeBroker", bPrepare, bAttach, bDetach, bDeliver,
                      nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                      nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr};

CMPIBrokerEncFT g_eft = {200, bNewInstance, bNewPath, bNewArgs, bNewString, bNewArray,
                         bNewDateTime, bNewDateTimeBin, bNewDateTimeChars, nullptr, bIsA,
                         nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                         nullptr, nullptr, nullptr};

CMPIBroker g_broker = {nullptr, &g_bft, &g_eft, nullptr, nullptr};

} // namespace

const CMPIBroker* broker()
{
    return &g_broker;
}

void reset()
{
    std::lock_guard<std::mutex> lock(g_mutex);
    g_objects.clear();
    g_delivered.clear();
    g_attached = 0;
}

void addSubclass(const char* cls, const char* super)
{
    std::lock_guard<std::mutex> lock(g_mutex);
    g_super[lower(cls)] = lower(super);
}

CMPIContext* newContext()
{
    Context* c = keep(new Context);
    c->enc.hdl = c;
    c->enc.ft = &g_ctxFT;
    return &c->enc;
}

CMPIResult* newResult()
{
    Result* r = keep(new Result);
    r->enc.hdl = r;
    r->enc.ft = &g_resFT;
    return &r->enc;
}

CMPISelectExp* newSelectExp(const char* query)
{
    SelectExp* se = keep(new SelectExp);
    se->query = query != nullptr ? query : "";
    se->enc.hdl = se;
    se->enc.ft = &g_seFT;
    return &se->enc;
}

const std::vector<ResultItem>& resultItems(const CMPIResult* r)
{
    return res(r)->items;
}

bool resultDone(const CMPIResult* r)
{
    return res(r)->done;
}

std::vector<Delivered> delivered()
{
    std::lock_guard<std::mutex> lock(g_mutex);
    return g_delivered;
}

int attachedThreads()
{
    std::lock_guard<std::mutex> lock(g_mutex);
    return g_attached;
}

std::string text(const CMPIString* s)
{
    if (s == nullptr)
        return "";
    const char* t = s->ft->getCharPtr(s, nullptr);
    return t != nullptr ? t : "";
}

} // namespace fake

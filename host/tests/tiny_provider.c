/*
 * A small CMPI provider written in C against the CMPI headers alone, used by
 * the host's tests. Classes (tiny.mof): Tiny_Thing and three faulty
 * subclasses, the association Tiny_Link and the indication Tiny_Event.
 *
 * Built three times: libTiny_Provider.so; with TINY_GENERIC defined
 * libTinyGeneric_Provider.so, which also exports _Generic_Create_InstanceMI;
 * with TINY_NO_ASSOC defined libTinyNoAssoc_Provider.so, which lacks the
 * association factory; with TINY_USES_HOST_SYMBOL libTinyLeaky_Provider.so,
 * which calls a function of the host directly.
 */
#include <cmpift.h>
#include <pthread.h>
#include <stdio.h>
#include <string.h>
#include <strings.h>
#include <time.h>

static const CMPIBroker *tb;
static int generation;      /* counts provider starts within this load */
static int veto;            /* cleanup(terminating = false) refuses */
static int cleanups;

/* Indication thread: started by enableIndications, stopped by
 * disableIndications or cleanup. */
static pthread_mutex_t indLock = PTHREAD_MUTEX_INITIALIZER;
static pthread_cond_t indCond = PTHREAD_COND_INITIALIZER;
static pthread_t indThread;
static int indRunning, indStop;
static const CMPIContext *indCtx;

static const char *NS = "root/tiny";

struct Thing {
    const char *name;
    CMPIUint16 id;
    CMPIUint32 count;
    CMPIBoolean flag;
    CMPIUint64 big;
    CMPISint32 neg;
};

static const struct Thing things[] = {
    {"alpha", 1, 10, 1, 18446744073709551615ULL, -5},
    {"beta", 2, 20, 0, 42, 7},
};

static CMPIStatus ok(void) {
    CMPIStatus s = {CMPI_RC_OK, NULL};
    return s;
}

static CMPIStatus err(CMPIrc rc, const char *text) {
    CMPIStatus s;
    s.rc = rc;
    s.msg = tb->eft->newString(tb, text, NULL);
    return s;
}

static const char *classOf(const CMPIObjectPath *op) {
    CMPIString *s = op->ft->getClassName(op, NULL);
    return s ? s->ft->getCharPtr(s, NULL) : "";
}

static CMPIObjectPath *thingPath(const char *cls, const struct Thing *t) {
    CMPIObjectPath *p = tb->eft->newObjectPath(tb, NS, cls, NULL);
    CMPIValue v;
    v.string = tb->eft->newString(tb, t->name, NULL);
    p->ft->addKey(p, "Name", &v, CMPI_string);
    if (strcmp(cls, "Tiny_NoKey") != 0) {
        v.uint16 = t->id;
        p->ft->addKey(p, "Id", &v, CMPI_uint16);
    }
    return p;
}

static CMPIInstance *thingInstance(const char *cls, const struct Thing *t, const char **props) {
    static const char *keys[] = {"Name", "Id", NULL};
    CMPIInstance *ci = tb->eft->newInstance(tb, thingPath(cls, t), NULL);
    CMPIValue v;
    CMPIArray *tags;
    if (props) ci->ft->setPropertyFilter(ci, props, keys);
    ci->ft->setProperty(ci, "Name", (const CMPIValue *)t->name, CMPI_chars);
    if (strcmp(cls, "Tiny_NoKey") != 0) {
        v.uint16 = t->id;
        ci->ft->setProperty(ci, "Id", &v, CMPI_uint16);
    }
    if (strcmp(cls, "Tiny_BadType") == 0) {
        ci->ft->setProperty(ci, "Count", (const CMPIValue *)"ten", CMPI_chars);
    } else {
        v.uint32 = t->count;
        ci->ft->setProperty(ci, "Count", &v, CMPI_uint32);
    }
    v.boolean = t->flag;
    ci->ft->setProperty(ci, "Flag", &v, CMPI_boolean);
    v.uint64 = t->big;
    ci->ft->setProperty(ci, "Big", &v, CMPI_uint64);
    v.sint32 = t->neg;
    ci->ft->setProperty(ci, "Neg", &v, CMPI_sint32);
    v.dateTime = tb->eft->newDateTimeFromChars(tb, "00000001020304.000005:000", NULL);
    ci->ft->setProperty(ci, "When", &v, CMPI_dateTime);
    tags = tb->eft->newArray(tb, 2, CMPI_string, NULL);
    v.string = tb->eft->newString(tb, "x", NULL);
    tags->ft->setElementAt(tags, 0, &v, CMPI_string);
    tags->ft->setElementAt(tags, 1, (const CMPIValue *)"y\"q", CMPI_chars);
    v.array = tags;
    ci->ft->setProperty(ci, "Tags", &v, CMPI_stringA);
    ci->ft->setProperty(ci, "Note", NULL, CMPI_string);
    if (strcmp(cls, "Tiny_BadProp") == 0) {
        v.uint8 = 1;
        ci->ft->setProperty(ci, "Bogus", &v, CMPI_uint8);
    }
    return ci;
}

static const struct Thing *findThing(const CMPIObjectPath *op) {
    CMPIStatus rc;
    CMPIData name = op->ft->getKey(op, "Name", &rc);
    unsigned k;
    if (rc.rc != CMPI_RC_OK || name.type != CMPI_string || !name.value.string) return NULL;
    for (k = 0; k < sizeof things / sizeof things[0]; ++k)
        if (strcmp(things[k].name, name.value.string->ft->getCharPtr(name.value.string, NULL)) == 0)
            return &things[k];
    return NULL;
}

/* ------------------------------------------------------------ instance MI */

static void stopIndications(void) {
    int join;
    pthread_mutex_lock(&indLock);
    join = indRunning;
    indStop = 1;
    pthread_cond_broadcast(&indCond);
    pthread_mutex_unlock(&indLock);
    if (join) pthread_join(indThread, NULL);
    pthread_mutex_lock(&indLock);
    indRunning = 0;
    pthread_mutex_unlock(&indLock);
}

static CMPIStatus cleanupAny(const CMPIContext *ctx, CMPIBoolean terminating) {
    (void)ctx;
    if (!terminating && veto) return err(CMPI_RC_DO_NOT_UNLOAD, "veto");
    ++cleanups;
    stopIndications();
    return ok();
}

static CMPIStatus instCleanup(CMPIInstanceMI *mi, const CMPIContext *ctx, CMPIBoolean t) {
    (void)mi;
    return cleanupAny(ctx, t);
}

static CMPIStatus enumNames(CMPIInstanceMI *mi, const CMPIContext *ctx, const CMPIResult *rslt,
                            const CMPIObjectPath *op) {
    unsigned k;
    (void)mi;
    (void)ctx;
    for (k = 0; k < sizeof things / sizeof things[0]; ++k)
        rslt->ft->returnObjectPath(rslt, thingPath(classOf(op), &things[k]));
    rslt->ft->returnDone(rslt);
    return ok();
}

static CMPIStatus enumInsts(CMPIInstanceMI *mi, const CMPIContext *ctx, const CMPIResult *rslt,
                            const CMPIObjectPath *op, const char **props) {
    unsigned k;
    (void)mi;
    (void)ctx;
    for (k = 0; k < sizeof things / sizeof things[0]; ++k)
        rslt->ft->returnInstance(rslt, thingInstance(classOf(op), &things[k], props));
    rslt->ft->returnDone(rslt);
    return ok();
}

static CMPIStatus getInst(CMPIInstanceMI *mi, const CMPIContext *ctx, const CMPIResult *rslt,
                          const CMPIObjectPath *op, const char **props) {
    const struct Thing *t = findThing(op);
    (void)mi;
    (void)ctx;
    if (!t) return err(CMPI_RC_ERR_NOT_FOUND, "no such Tiny_Thing");
    rslt->ft->returnInstance(rslt, thingInstance(classOf(op), t, props));
    rslt->ft->returnDone(rslt);
    return ok();
}

static CMPIStatus createInst(CMPIInstanceMI *mi, const CMPIContext *ctx, const CMPIResult *rslt,
                             const CMPIObjectPath *op, const CMPIInstance *inst) {
    CMPIStatus rc;
    CMPIData count = inst->ft->getProperty(inst, "Count", &rc);
    (void)mi;
    (void)ctx;
    if (rc.rc != CMPI_RC_OK || count.type != CMPI_uint32) return err(CMPI_RC_ERR_INVALID_PARAMETER, "Count must be uint32");
    rslt->ft->returnObjectPath(rslt, op);
    rslt->ft->returnDone(rslt);
    return ok();
}

static CMPIStatus modifyInst(CMPIInstanceMI *mi, const CMPIContext *ctx, const CMPIResult *rslt,
                             const CMPIObjectPath *op, const CMPIInstance *inst, const char **props) {
    (void)mi;
    (void)ctx;
    (void)rslt;
    (void)inst;
    if (!findThing(op)) return err(CMPI_RC_ERR_NOT_FOUND, "no such Tiny_Thing");
    if (!props || !props[0] || props[1]) return err(CMPI_RC_ERR_INVALID_PARAMETER, "give exactly one property");
    return ok();
}

static CMPIStatus deleteInst(CMPIInstanceMI *mi, const CMPIContext *ctx, const CMPIResult *rslt,
                             const CMPIObjectPath *op) {
    (void)mi;
    (void)ctx;
    (void)rslt;
    return findThing(op) ? ok() : err(CMPI_RC_ERR_NOT_FOUND, "no such Tiny_Thing");
}

/* The host never asks a provider for a query. */
static CMPIInstanceMIFT instFT = {200, 200, "instanceTiny", instCleanup, enumNames, enumInsts, getInst,
                                  createInst, modifyInst, deleteInst, NULL};

/* ------------------------------------------------------------ association MI */

static CMPIStatus assocCleanup(CMPIAssociationMI *mi, const CMPIContext *ctx, CMPIBoolean t) {
    (void)mi;
    return cleanupAny(ctx, t);
}

/* The one link: alpha (Left) to beta (Right). Returns the other end, or
 * NULL when the filters leave nothing. */
static const struct Thing *otherEnd(const CMPIObjectPath *op, const char *assocClass, const char *resultClass,
                                    const char *role, const char **roleName) {
    const struct Thing *t = findThing(op);
    CMPIObjectPath *cp;
    if (!t) return NULL;
    *roleName = t == &things[0] ? "Left" : "Right";
    if (assocClass && strcasecmp(assocClass, "Tiny_Link") != 0) return NULL;
    if (role && strcasecmp(role, *roleName) != 0) return NULL;
    if (resultClass) {
        cp = tb->eft->newObjectPath(tb, NS, "Tiny_Thing", NULL);
        if (!tb->eft->classPathIsA(tb, cp, resultClass, NULL)) return NULL;
    }
    return t == &things[0] ? &things[1] : &things[0];
}

static CMPIInstance *linkInstance(const char **props) {
    CMPIObjectPath *p = tb->eft->newObjectPath(tb, NS, "Tiny_Link", NULL);
    CMPIInstance *ci;
    CMPIValue v;
    v.ref = thingPath("Tiny_Thing", &things[0]);
    p->ft->addKey(p, "Left", &v, CMPI_ref);
    ci = tb->eft->newInstance(tb, p, NULL);
    if (props) {
        static const char *keys[] = {"Left", "Right", NULL};
        ci->ft->setPropertyFilter(ci, props, keys);
    }
    ci->ft->setProperty(ci, "Left", &v, CMPI_ref);
    v.ref = thingPath("Tiny_Thing", &things[1]);
    ci->ft->setProperty(ci, "Right", &v, CMPI_ref);
    ci->ft->setProperty(ci, "Kind", (const CMPIValue *)"pair", CMPI_chars);
    return ci;
}

static CMPIStatus associators(CMPIAssociationMI *mi, const CMPIContext *ctx, const CMPIResult *rslt,
                              const CMPIObjectPath *op, const char *assocClass, const char *resultClass,
                              const char *role, const char *resultRole, const char **props) {
    const char *rn;
    const struct Thing *o = otherEnd(op, assocClass, resultClass, role, &rn);
    (void)mi;
    (void)ctx;
    (void)resultRole;
    if (o) rslt->ft->returnInstance(rslt, thingInstance("Tiny_Thing", o, props));
    rslt->ft->returnDone(rslt);
    return ok();
}

static CMPIStatus associatorNames(CMPIAssociationMI *mi, const CMPIContext *ctx, const CMPIResult *rslt,
                                  const CMPIObjectPath *op, const char *assocClass, const char *resultClass,
                                  const char *role, const char *resultRole) {
    const char *rn;
    const struct Thing *o = otherEnd(op, assocClass, resultClass, role, &rn);
    (void)mi;
    (void)ctx;
    (void)resultRole;
    if (o) rslt->ft->returnObjectPath(rslt, thingPath("Tiny_Thing", o));
    rslt->ft->returnDone(rslt);
    return ok();
}

static CMPIStatus references(CMPIAssociationMI *mi, const CMPIContext *ctx, const CMPIResult *rslt,
                             const CMPIObjectPath *op, const char *resultClass, const char *role,
                             const char **props) {
    const char *rn;
    (void)mi;
    (void)ctx;
    if (otherEnd(op, resultClass, NULL, role, &rn)) rslt->ft->returnInstance(rslt, linkInstance(props));
    rslt->ft->returnDone(rslt);
    return ok();
}

static CMPIStatus referenceNames(CMPIAssociationMI *mi, const CMPIContext *ctx, const CMPIResult *rslt,
                                 const CMPIObjectPath *op, const char *resultClass, const char *role) {
    const char *rn;
    CMPIStatus rc;
    (void)mi;
    (void)ctx;
    if (otherEnd(op, resultClass, NULL, role, &rn)) {
        CMPIInstance *ci = linkInstance(NULL);
        rslt->ft->returnObjectPath(rslt, ci->ft->getObjectPath(ci, &rc));
    }
    rslt->ft->returnDone(rslt);
    return ok();
}

#ifdef TINY_NO_ASSOC
__attribute__((unused))
#endif
static CMPIAssociationMIFT assocFT = {200, 200, "associationTiny", assocCleanup, associators, associatorNames,
                                      references, referenceNames};


/* ------------------------------------------------------------ broker probe */

/* Exercises the broker's encapsulated types and service tables from C the
 * way a provider uses them; each failed check is named in `log`. Returns the
 * number of failures. */
static void *probeThread(void *arg) {
    int *flag = (int *)arg;
    *flag = 1;
    return NULL;
}

static int once;
static int onceRuns;
static void onceInit(void) { ++onceRuns; }

static unsigned probe(const CMPIContext *ctx, char *log, size_t logSize) {
    unsigned failures = 0;
    CMPIStatus rc;
    CMPIValue v;
    CMPIData d;
    CMPIString *s;
#define CHECK(cond, what)                                                      \
    do {                                                                       \
        if (!(cond)) {                                                         \
            if (failures++ == 0) snprintf(log, logSize, "%s", what);           \
        }                                                                      \
    } while (0)

    /* Context entries of the request. */
    d = ctx->ft->getEntry(ctx, CMPIInitNameSpace, &rc);
    CHECK(rc.rc == CMPI_RC_OK && d.type == CMPI_string &&
              strcmp(d.value.string->ft->getCharPtr(d.value.string, NULL), NS) == 0,
          "context namespace");
    v.uint32 = 7;
    CHECK(ctx->ft->addEntry(ctx, "Mine", &v, CMPI_uint32).rc == CMPI_RC_OK, "addEntry");
    d = ctx->ft->getEntry(ctx, "mine", &rc);
    CHECK(d.type == CMPI_uint32 && d.value.uint32 == 7, "getEntry after addEntry");
    ctx->ft->getEntry(ctx, "Absent", &rc);
    CHECK(rc.rc == CMPI_RC_ERR_NOT_FOUND, "absent context entry");

    /* Date-times: binary, text, interval, bad text. */
    {
        CMPIDateTime *dt = tb->eft->newDateTimeFromBinary(tb, 3000000000ULL, 1, &rc);
        s = dt->ft->getStringFormat(dt, NULL);
        CHECK(strcmp(s->ft->getCharPtr(s, NULL), "00000000005000.000000:000") == 0, "interval text");
        CHECK(dt->ft->isInterval(dt, NULL), "isInterval");
        dt = tb->eft->newDateTimeFromChars(tb, "19700102000000.000001+000", &rc);
        CHECK(rc.rc == CMPI_RC_OK && dt->ft->getBinaryFormat(dt, NULL) == 86400000001ULL, "absolute binary");
        CHECK(!dt->ft->isInterval(dt, NULL), "absolute is no interval");
        tb->eft->newDateTimeFromChars(tb, "yesterday", &rc);
        CHECK(rc.rc == CMPI_RC_ERR_INVALID_PARAMETER, "bad datetime text refused");
        dt = tb->eft->newDateTime(tb, &rc);
        CHECK(dt->ft->getBinaryFormat(dt, NULL) > 1600000000000000ULL, "newDateTime is now");
    }

    /* Arrays: typed elements, bounds, clone and release. */
    {
        CMPIArray *a = tb->eft->newArray(tb, 2, CMPI_uint16, &rc), *c;
        v.uint16 = 5;
        CHECK(a->ft->setElementAt(a, 1, &v, CMPI_uint16).rc == CMPI_RC_OK, "setElementAt");
        CHECK(a->ft->setElementAt(a, 2, &v, CMPI_uint16).rc == CMPI_RC_ERR_NO_SUCH_PROPERTY, "setElementAt bound");
        CHECK(a->ft->setElementAt(a, 0, (const CMPIValue *)"x", CMPI_chars).rc == CMPI_RC_ERR_TYPE_MISMATCH,
              "setElementAt type");
        d = a->ft->getElementAt(a, 0, NULL);
        CHECK(d.state & CMPI_nullValue, "unset element is null");
        c = a->ft->clone(a, &rc);
        d = c->ft->getElementAt(c, 1, NULL);
        CHECK(d.type == CMPI_uint16 && d.value.uint16 == 5 && c->ft->getSize(c, NULL) == 2, "array clone");
        CHECK(c->ft->getSimpleType(c, NULL) == CMPI_uint16, "getSimpleType");
        c->ft->release(c);
        c = tb->eft->newArray(tb, 1, CMPI_ptr, &rc);
        CHECK(c == NULL && rc.rc == CMPI_RC_ERR_INVALID_DATA_TYPE, "array of an unsupported type");
    }

    /* Object paths: keys, namespace, toString, classPathIsA. */
    {
        CMPIObjectPath *p = tb->eft->newObjectPath(tb, NS, "Tiny_BadType", &rc), *q;
        v.string = tb->eft->newString(tb, "a\"b", NULL);
        p->ft->addKey(p, "Name", &v, CMPI_string);
        v.uint16 = 3;
        p->ft->addKey(p, "Id", &v, CMPI_uint16);
        s = p->ft->toString(p, NULL);
        CHECK(strcmp(s->ft->getCharPtr(s, NULL), "root/tiny:Tiny_BadType.Name=\"a\\\"b\",Id=3") == 0, "path text");
        CHECK(tb->eft->classPathIsA(tb, p, "Tiny_Base", NULL), "classPathIsA superclass");
        CHECK(!tb->eft->classPathIsA(tb, p, "Tiny_Link", NULL), "classPathIsA other");
        d = p->ft->getKey(p, "id", &rc);
        CHECK(rc.rc == CMPI_RC_OK && (d.state & CMPI_keyValue) && d.value.uint16 == 3, "getKey");
        CHECK(p->ft->getKeyCount(p, NULL) == 2, "getKeyCount");
        q = tb->eft->newObjectPath(tb, "root/else", "X", NULL);
        q->ft->setNameSpaceFromObjectPath(q, p);
        s = q->ft->getNameSpace(q, NULL);
        CHECK(strcmp(s->ft->getCharPtr(s, NULL), NS) == 0, "setNameSpaceFromObjectPath");
        CHECK(tb->eft->isOfType(tb, p, "CMPIObjectPath", NULL), "isOfType");
        s = tb->eft->getType(tb, s, NULL);
        CHECK(strcmp(s->ft->getCharPtr(s, NULL), "CMPIString") == 0, "getType");
    }

    /* Instances: property filter, getObjectPath. */
    {
        static const char *props[] = {"Count", NULL};
        static const char *keys[] = {"Name", "Id", NULL};
        CMPIObjectPath *p = tb->eft->newObjectPath(tb, NS, "Tiny_Thing", NULL), *op;
        CMPIInstance *ci = tb->eft->newInstance(tb, p, NULL);
        v.uint32 = 1;
        ci->ft->setProperty(ci, "Flag", &v, CMPI_uint32);
        ci->ft->setPropertyFilter(ci, props, keys);
        CHECK(ci->ft->getPropertyCount(ci, NULL) == 0, "filter drops what was set");
        ci->ft->setProperty(ci, "Name", (const CMPIValue *)"n", CMPI_chars);
        v.uint16 = 4;
        ci->ft->setProperty(ci, "Id", &v, CMPI_uint16);
        ci->ft->setProperty(ci, "Count", &v, CMPI_uint16);
        ci->ft->setProperty(ci, "Big", &v, CMPI_uint16);
        CHECK(ci->ft->getPropertyCount(ci, NULL) == 3, "filter keeps listed and keys");
        ci->ft->getProperty(ci, "Big", &rc);
        CHECK(rc.rc == CMPI_RC_ERR_NO_SUCH_PROPERTY, "filtered property absent");
        op = ci->ft->getObjectPath(ci, NULL);
        s = op->ft->toString(op, NULL);
        CHECK(strcmp(s->ft->getCharPtr(s, NULL), "root/tiny:Tiny_Thing.Name=\"n\",Id=4") == 0,
              "instance path from key properties");
    }

    /* Memory: mark/release, cmpiMalloc/free, explicit free of objects. */
    {
        CMPIGcStat *gc = tb->mft->mark(tb, &rc);
        char *m;
        CHECK(rc.rc == CMPI_RC_OK && gc != NULL, "mark");
        tb->eft->newString(tb, "released with the mark", NULL);
        CHECK(tb->mft->release(tb, gc).rc == CMPI_RC_OK, "release");
        m = (char *)tb->mft->cmpiMalloc(tb, 16);
        m = (char *)tb->mft->cmpiRealloc(tb, m, 64);
        CHECK(m != NULL, "cmpiRealloc");
        tb->mft->cmpiFree(tb, m);
        m = tb->mft->cmpiStrDup(tb, "kept until unload");
        CHECK(m && strcmp(m, "kept until unload") == 0, "cmpiStrDup");
        tb->mft->freeString(tb, tb->eft->newString(tb, "gone now", NULL));
    }

    /* Services: threads, mutexes, conditions, keys, once. */
    {
        int flag = 0;
        void *ret = NULL;
        CMPI_THREAD_TYPE t = tb->xft->newThread(probeThread, &flag, 0);
        CMPI_MUTEX_TYPE mx = tb->xft->newMutex(0);
        CMPI_COND_TYPE cv = tb->xft->newCondition(0);
        CMPI_THREAD_KEY_TYPE key;
        struct timespec ts;
        CHECK(t != NULL && tb->xft->joinThread(t, &ret) == 0 && flag == 1, "newThread/joinThread");
        tb->xft->lockMutex(mx);
        clock_gettime(CLOCK_REALTIME, &ts);
        CHECK(tb->xft->timedCondWait(cv, mx, &ts) != 0, "timedCondWait times out");
        tb->xft->unlockMutex(mx);
        CHECK(tb->xft->signalCondition(cv) == 0, "signalCondition");
        tb->xft->destroyCondition(cv);
        tb->xft->destroyMutex(mx);
        CHECK(tb->xft->createThreadKey(&key, NULL) == 0, "createThreadKey");
        tb->xft->setThreadSpecific(key, &flag);
        CHECK(tb->xft->getThreadSpecific(key) == &flag, "thread specific");
        tb->xft->destroyThreadKey(key);
        tb->xft->threadOnce(&once, onceInit);
        tb->xft->threadOnce(&once, onceInit);
        CHECK(onceRuns == 1, "threadOnce");
        CHECK(tb->xft->threadSleep(1) == 0, "threadSleep");
    }

    /* Up-calls are not offered; logging reaches the host. */
    tb->bft->enumerateInstanceNames(tb, ctx, tb->eft->newObjectPath(tb, NS, "Tiny_Thing", NULL), &rc);
    CHECK(rc.rc == CMPI_RC_ERR_NOT_SUPPORTED, "up-call not supported");
    CHECK(tb->eft->logMessage(tb, 1, "tiny", "probe done", NULL).rc == CMPI_RC_OK, "logMessage");
#undef CHECK
    return failures;
}

/* ------------------------------------------------------------ method MI */

static CMPIStatus methCleanup(CMPIMethodMI *mi, const CMPIContext *ctx, CMPIBoolean t) {
    (void)mi;
    return cleanupAny(ctx, t);
}

static void deliverEvent(const char *pathNs, const char *deliverNs, CMPIUint32 seq);

/* Event 7 from a thread of the provider's own that never attached: what a
 * real server may not survive. */
static void *strayDelivery(void *arg) {
    (void)arg;
    deliverEvent(NS, NS, 7);
    return NULL;
}

static CMPIStatus invokeMethod(CMPIMethodMI *mi, const CMPIContext *ctx, const CMPIResult *rslt,
                               const CMPIObjectPath *op, const char *method, const CMPIArgs *in, CMPIArgs *out) {
    CMPIValue v;
    CMPIStatus rc;
    (void)mi;
    (void)ctx;
    (void)op;
    if (strcmp(method, "Echo") == 0) {
        CMPIData text = in->ft->getArg(in, "Text", &rc);
        CMPIData times = in->ft->getArg(in, "Times", NULL);
        char buf[256] = "";
        unsigned n = times.type == CMPI_uint16 && !(times.state & CMPI_nullValue) ? times.value.uint16 : 1, k;
        CMPIArray *codes = tb->eft->newArray(tb, 3, CMPI_uint8, NULL);
        const char *t;
        if (rc.rc != CMPI_RC_OK || text.type != CMPI_string) return err(CMPI_RC_ERR_INVALID_PARAMETER, "Text missing");
        t = text.value.string->ft->getCharPtr(text.value.string, NULL);
        for (k = 0; k < n && strlen(buf) + strlen(t) < sizeof buf; ++k) strcat(buf, t);
        out->ft->addArg(out, "Reply", (const CMPIValue *)buf, CMPI_chars);
        for (k = 0; k < 3; ++k) {
            v.uint8 = (CMPIUint8)(k + 1);
            codes->ft->setElementAt(codes, k, &v, CMPI_uint8);
        }
        v.array = codes;
        out->ft->addArg(out, "Codes", &v, CMPI_uint8A);
        v.uint32 = (CMPIUint32)strlen(buf);
        rslt->ft->returnData(rslt, &v, CMPI_uint32);
    } else if (strcmp(method, "SetVeto") == 0) {
        CMPIData on = in->ft->getArg(in, "On", NULL);
        veto = on.type == CMPI_boolean && on.value.boolean;
        v.uint32 = 0;
        rslt->ft->returnData(rslt, &v, CMPI_uint32);
    } else if (strcmp(method, "Generation") == 0) {
        v.uint32 = (CMPIUint32)generation;
        rslt->ft->returnData(rslt, &v, CMPI_uint32);
    } else if (strcmp(method, "BadOut") == 0) {
        v.uint32 = 1;
        out->ft->addArg(out, "Reply", &v, CMPI_uint32);
        rslt->ft->returnData(rslt, &v, CMPI_uint32);
    } else if (strcmp(method, "Probe") == 0) {
        char log[256] = "";
        v.uint32 = probe(ctx, log, sizeof log);
        out->ft->addArg(out, "Log", (const CMPIValue *)log, CMPI_chars);
        rslt->ft->returnData(rslt, &v, CMPI_uint32);
    } else if (strcmp(method, "DeliverStray") == 0) {
        pthread_t stray;
        pthread_create(&stray, NULL, strayDelivery, NULL);
        pthread_join(stray, NULL);
        v.uint32 = 0;
        rslt->ft->returnData(rslt, &v, CMPI_uint32);
    } else if (strcmp(method, "Fail") == 0) {
        return err(CMPI_RC_ERR_FAILED, "Fail was asked to fail");
    } else {
        return err(CMPI_RC_ERR_METHOD_NOT_FOUND, method);
    }
    rslt->ft->returnDone(rslt);
    return ok();
}

static CMPIMethodMIFT methFT = {200, 200, "methodTiny", methCleanup, invokeMethod};

/* ------------------------------------------------------------ indication MI */

static void deliverEvent(const char *pathNs, const char *deliverNs, CMPIUint32 seq) {
    CMPIObjectPath *p = tb->eft->newObjectPath(tb, pathNs, "Tiny_Event", NULL);
    CMPIInstance *ci = tb->eft->newInstance(tb, p, NULL);
    CMPIValue v;
    ci->ft->setProperty(ci, "Message", (const CMPIValue *)"tick", CMPI_chars);
    v.uint32 = seq;
    ci->ft->setProperty(ci, "Seq", &v, CMPI_uint32);
    tb->bft->deliverIndication(tb, indCtx, deliverNs, ci);
}

/* Sends events 1..3 (path and argument in root/tiny), then 99 whose path
 * names root/other while the argument says root/tiny, then waits for stop. */
static void *indicationThread(void *arg) {
    CMPIUint32 seq;
    struct timespec ts;
    int stop = 0;
    (void)arg;
    tb->bft->attachThread(tb, indCtx);
    for (seq = 1; seq <= 4 && !stop; ++seq) {
        deliverEvent(seq == 4 ? "root/other" : NS, NS, seq == 4 ? 99 : seq);
        clock_gettime(CLOCK_REALTIME, &ts);
        ts.tv_nsec += 10 * 1000000L;
        if (ts.tv_nsec >= 1000000000L) {
            ts.tv_sec += 1;
            ts.tv_nsec -= 1000000000L;
        }
        pthread_mutex_lock(&indLock);
        if (!indStop) pthread_cond_timedwait(&indCond, &indLock, &ts);
        stop = indStop;
        pthread_mutex_unlock(&indLock);
    }
    pthread_mutex_lock(&indLock);
    while (!indStop) pthread_cond_wait(&indCond, &indLock);
    pthread_mutex_unlock(&indLock);
    tb->bft->detachThread(tb, indCtx);
    return NULL;
}

static CMPIStatus indCleanup(CMPIIndicationMI *mi, const CMPIContext *ctx, CMPIBoolean t) {
    (void)mi;
    return cleanupAny(ctx, t);
}

static CMPIStatus authorizeFilter(CMPIIndicationMI *mi, const CMPIContext *ctx, const CMPISelectExp *f,
                                  const char *cls, const CMPIObjectPath *op, const char *owner) {
    (void)mi;
    (void)ctx;
    (void)f;
    (void)op;
    (void)owner;
    return strcmp(cls, "Tiny_Event") == 0 ? ok() : err(CMPI_RC_ERR_ACCESS_DENIED, "only Tiny_Event");
}

static CMPIStatus mustPoll(CMPIIndicationMI *mi, const CMPIContext *ctx, const CMPISelectExp *f, const char *cls,
                           const CMPIObjectPath *op) {
    (void)mi;
    (void)ctx;
    (void)f;
    (void)cls;
    (void)op;
    return err(CMPI_RC_ERR_NOT_SUPPORTED, "no polling");
}

static CMPIStatus activateFilter(CMPIIndicationMI *mi, const CMPIContext *ctx, const CMPISelectExp *f,
                                 const char *cls, const CMPIObjectPath *op, CMPIBoolean first) {
    CMPIStatus rc;
    CMPIString *q = f->ft->getString(f, &rc);
    (void)mi;
    (void)ctx;
    (void)op;
    (void)first;
    if (rc.rc != CMPI_RC_OK || !strstr(q->ft->getCharPtr(q, NULL), cls)) return err(CMPI_RC_ERR_INVALID_QUERY, "query");
    return ok();
}

static CMPIStatus deActivateFilter(CMPIIndicationMI *mi, const CMPIContext *ctx, const CMPISelectExp *f,
                                   const char *cls, const CMPIObjectPath *op, CMPIBoolean last) {
    (void)mi;
    (void)ctx;
    (void)f;
    (void)cls;
    (void)op;
    (void)last;
    return ok();
}

static CMPIStatus enableIndications(CMPIIndicationMI *mi, const CMPIContext *ctx) {
    int start;
    (void)mi;
    pthread_mutex_lock(&indLock);
    start = !indRunning;
    if (start) {
        indRunning = 1;
        indStop = 0;
    }
    pthread_mutex_unlock(&indLock);
    if (start) {
        indCtx = tb->bft->prepareAttachThread(tb, ctx);
        pthread_create(&indThread, NULL, indicationThread, NULL);
    }
    return ok();
}

static CMPIStatus disableIndications(CMPIIndicationMI *mi, const CMPIContext *ctx) {
    (void)mi;
    (void)ctx;
    stopIndications();
    return ok();
}

static CMPIIndicationMIFT indFT = {200, 200, "indicationTiny", indCleanup, authorizeFilter, mustPoll,
                                   activateFilter, deActivateFilter, enableIndications, disableIndications};

/* ------------------------------------------------------------ factories */

#ifdef TINY_USES_HOST_SYMBOL
/* cimhost::rcName(int): a server function reached other than through the
 * broker. The host exports nothing, so this library must fail to load. */
extern const char *_ZN7cimhost6rcNameEi(int);
#endif

static void start(const CMPIBroker *b) {
    if (!tb) ++generation;
    tb = b;
#ifdef TINY_USES_HOST_SYMBOL
    (void)_ZN7cimhost6rcNameEi(0);
#endif
}

/* Each factory hands out its one MI structure. */
#define TINY_FACTORY(Kind, table)                                                              \
    CMPI##Kind##MI *Tiny_Create_##Kind##MI(const CMPIBroker *b, const CMPIContext *ctx, CMPIStatus *rc) { \
        static CMPI##Kind##MI mi = {NULL, &table};                                             \
        (void)ctx;                                                                             \
        start(b);                                                                              \
        if (rc) *rc = ok();                                                                    \
        return &mi;                                                                            \
    }
TINY_FACTORY(Instance, instFT)
#ifndef TINY_NO_ASSOC
TINY_FACTORY(Association, assocFT)
#endif
TINY_FACTORY(Method, methFT)
TINY_FACTORY(Indication, indFT)

#ifdef TINY_GENERIC
CMPIInstanceMI *_Generic_Create_InstanceMI(const CMPIBroker *b, const CMPIContext *ctx, const char *name,
                                           CMPIStatus *rc) {
    (void)name;
    return Tiny_Create_InstanceMI(b, ctx, rc);
}
#endif

// Sample provider: one object of all four MI kinds, written against the
// CMPI headers and the cmpiCppImpl wrapper, serving the classes of
// sample.mof in "root/sample".
//
//   Sample_Widget        instances: enumerate, get, create, modify, delete
//   Sample_Gadget        instances: enumerate, get
//   Sample_WidgetGadget  association Owner (widget) -> Part (gadget)
//   Sample_Service       method Scale (typed in and out arguments), Fail
//   Sample_Alert         indications, sent from a thread of the provider's
//                        own while at least one filter is active
#include "CmpiImpl.h"

#include <chrono>
#include <condition_variable>
#include <cstring>
#include <mutex>
#include <string>
#include <strings.h>
#include <thread>
#include <vector>

namespace {

const char* const kNamespace = "root/sample";
const char* const kWidget = "Sample_Widget";
const char* const kGadget = "Sample_Gadget";
const char* const kLink = "Sample_WidgetGadget";
const char* const kService = "Sample_Service";
const char* const kAlert = "Sample_Alert";
const char* const kServiceName = "svc";

bool same(const char* a, const char* b)
{
    return a != nullptr && b != nullptr && strcasecmp(a, b) == 0;
}

bool empty(const char* s)
{
    return s == nullptr || *s == '\0';
}

struct Widget {
    std::string name;
    bool enabled;
    CMPIUint8 level;
    CMPIUint16 port;
    CMPIUint32 count;
    CMPIUint64 bytes;
    CMPISint32 offset;
    CMPIUint64 installedUs;  // microseconds since 1970
    CMPIUint64 uptimeUs;     // interval
    std::vector<std::string> tags;
    std::vector<CMPIUint16> codes;
};

struct Gadget {
    std::string id;
    CMPIUint16 kind;
    std::string owner;  // widget name
};

class SampleProvider : public CmpiInstanceMI,
                       public CmpiAssociationMI,
                       public CmpiIndicationMI,
                       public CmpiMethodMI {
public:
    SampleProvider(const CmpiBroker& mb, const CmpiContext& ctx)
        : CmpiBaseMI(mb, ctx), CmpiInstanceMI(mb, ctx), CmpiAssociationMI(mb, ctx),
          CmpiIndicationMI(mb, ctx), CmpiMethodMI(mb, ctx)
    {
        widgets_.push_back(Widget{"w1", true, 3, 8080, 7, 1ull << 40, -12, 1700000000000000ull,
                                  90000000ull, {"red", "blue"}, {1, 2, 3}});
        widgets_.push_back(Widget{"w2", false, 0, 22, 0, 0, 5, 1600000000000000ull, 0, {}, {}});
        gadgets_.push_back(Gadget{"g1", 1, "w1"});
        gadgets_.push_back(Gadget{"g2", 2, "w1"});
        gadgets_.push_back(Gadget{"g3", 3, "w2"});
    }

    ~SampleProvider() override { stopIndicationThread(); }

    CmpiStatus cleanup(CmpiContext&) override
    {
        stopIndicationThread();
        return CmpiStatus(CMPI_RC_OK);
    }

    // ---- instances ---------------------------------------------------

    CmpiStatus enumInstanceNames(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop) override
    {
        std::lock_guard<std::mutex> lock(mutex_);
        const CmpiString ns = cop.getNameSpace();
        if (cop.classPathIsA(kWidget)) {
            for (const Widget& w : widgets_)
                rslt.returnData(widgetPath(ns, w));
        } else if (cop.classPathIsA(kGadget)) {
            for (const Gadget& g : gadgets_)
                rslt.returnData(gadgetPath(ns, g));
        } else if (cop.classPathIsA(kLink)) {
            for (const Gadget& g : gadgets_)
                rslt.returnData(linkPath(ns, g));
        } else if (cop.classPathIsA(kService)) {
            rslt.returnData(servicePath(ns));
        }
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus enumInstances(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop,
                             const char** properties) override
    {
        std::lock_guard<std::mutex> lock(mutex_);
        const CmpiString ns = cop.getNameSpace();
        if (cop.classPathIsA(kWidget)) {
            for (const Widget& w : widgets_)
                rslt.returnData(widgetInstance(ns, w, properties));
        } else if (cop.classPathIsA(kGadget)) {
            for (const Gadget& g : gadgets_)
                rslt.returnData(gadgetInstance(ns, g, properties));
        } else if (cop.classPathIsA(kLink)) {
            for (const Gadget& g : gadgets_)
                rslt.returnData(linkInstance(ns, g));
        } else if (cop.classPathIsA(kService)) {
            rslt.returnData(serviceInstance(ns, properties));
        }
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus getInstance(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop,
                           const char** properties) override
    {
        std::lock_guard<std::mutex> lock(mutex_);
        const CmpiString ns = cop.getNameSpace();
        if (cop.classPathIsA(kWidget)) {
            rslt.returnData(widgetInstance(ns, findWidget(cop.getKey("Name")), properties));
        } else if (cop.classPathIsA(kGadget)) {
            rslt.returnData(gadgetInstance(ns, findGadget(cop.getKey("Id")), properties));
        } else if (cop.classPathIsA(kService)) {
            const char* name = cop.getKey("Name");
            if (!same(name, kServiceName))
                throw CmpiStatus(CMPI_RC_ERR_NOT_FOUND, name);
            rslt.returnData(serviceInstance(ns, properties));
        } else {
            throw CmpiStatus(CMPI_RC_ERR_NOT_FOUND, cop.getClassName().charPtr());
        }
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus createInstance(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop,
                              const CmpiInstance& inst) override
    {
        std::lock_guard<std::mutex> lock(mutex_);
        if (!cop.classPathIsA(kWidget))
            throw CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED, cop.getClassName().charPtr());
        CmpiData key = inst.getProperty("Name");
        const char* name = key.isNullValue() ? static_cast<const char*>(cop.getKey("Name"))
                                             : static_cast<const char*>(key);
        if (empty(name))
            throw CmpiStatus(CMPI_RC_ERR_INVALID_PARAMETER, "Name");
        for (const Widget& w : widgets_)
            if (same(w.name.c_str(), name))
                throw CmpiStatus(CMPI_RC_ERR_ALREADY_EXISTS, name);
        Widget w{name, false, 0, 0, 0, 0, 0, 0, 0, {}, {}};
        applyProperties(w, inst, nullptr);
        widgets_.push_back(w);
        rslt.returnData(widgetPath(cop.getNameSpace(), w));
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus setInstance(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop,
                           const CmpiInstance& inst, const char** properties) override
    {
        std::lock_guard<std::mutex> lock(mutex_);
        if (!cop.classPathIsA(kWidget))
            throw CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED, cop.getClassName().charPtr());
        applyProperties(findWidget(cop.getKey("Name")), inst, properties);
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus deleteInstance(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop) override
    {
        std::lock_guard<std::mutex> lock(mutex_);
        if (!cop.classPathIsA(kWidget))
            throw CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED, cop.getClassName().charPtr());
        const char* name = cop.getKey("Name");
        for (auto it = widgets_.begin(); it != widgets_.end(); ++it) {
            if (same(it->name.c_str(), name)) {
                widgets_.erase(it);
                rslt.returnDone();
                return CmpiStatus(CMPI_RC_OK);
            }
        }
        throw CmpiStatus(CMPI_RC_ERR_NOT_FOUND, name);
    }

    // ---- associations --------------------------------------------------

    CmpiStatus associators(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& op,
                           const char* assocClass, const char* resultClass, const char* role,
                           const char* resultRole, const char** properties) override
    {
        std::lock_guard<std::mutex> lock(mutex_);
        walk(op, assocClass, resultClass, role, resultRole, [&](const Gadget& g, bool fromWidget) {
            const CmpiString ns = op.getNameSpace();
            if (fromWidget)
                rslt.returnData(gadgetInstance(ns, g, properties));
            else
                rslt.returnData(widgetInstance(ns, findWidget(g.owner.c_str()), properties));
        });
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus associatorNames(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& op,
                               const char* assocClass, const char* resultClass, const char* role,
                               const char* resultRole) override
    {
        std::lock_guard<std::mutex> lock(mutex_);
        walk(op, assocClass, resultClass, role, resultRole, [&](const Gadget& g, bool fromWidget) {
            const CmpiString ns = op.getNameSpace();
            if (fromWidget)
                rslt.returnData(gadgetPath(ns, g));
            else
                rslt.returnData(widgetPath(ns, findWidget(g.owner.c_str())));
        });
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus references(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& op,
                          const char* resultClass, const char* role, const char**) override
    {
        std::lock_guard<std::mutex> lock(mutex_);
        walk(op, resultClass, nullptr, role, nullptr,
             [&](const Gadget& g, bool) { rslt.returnData(linkInstance(op.getNameSpace(), g)); });
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus referenceNames(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& op,
                              const char* resultClass, const char* role) override
    {
        std::lock_guard<std::mutex> lock(mutex_);
        walk(op, resultClass, nullptr, role, nullptr,
             [&](const Gadget& g, bool) { rslt.returnData(linkPath(op.getNameSpace(), g)); });
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    // ---- methods ---------------------------------------------------------

    CmpiStatus invokeMethod(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& ref,
                            const char* methodName, const CmpiArgs& in, CmpiArgs& out) override
    {
        if (!ref.classPathIsA(kService))
            throw CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED, ref.getClassName().charPtr());
        if (same(methodName, "Fail"))
            throw CmpiStatus(CMPI_RC_ERR_INVALID_PARAMETER, "Fail was asked for");
        if (!same(methodName, "Scale"))
            throw CmpiStatus(CMPI_RC_ERR_METHOD_NOT_FOUND, methodName);

        CmpiData value = in.getArg("Value");
        CMPIUint32 v = value.isNullValue() ? 0 : static_cast<CMPIUint32>(value);
        CmpiArray factors = in.getArg("Factors");  // absent: size 0
        CMPIUint64 sum = 0;
        for (CMPICount i = 0; i < factors.size(); ++i)
            sum += static_cast<CMPIUint16>(factors[static_cast<int>(i)]);
        const char* label = in.getArg("Label");
        CmpiData verbose = in.getArg("Verbose");
        CmpiObjectPath target = in.getArg("Target");
        if (target.isNull()) {
            rslt.returnData(CmpiData(CMPIUint32(2)));
            rslt.returnDone();
            return CmpiStatus(CMPI_RC_OK);
        }

        const Widget w = [&] {
            std::lock_guard<std::mutex> lock(mutex_);
            return findWidget(target.getKey("Name"));
        }();
        std::string echo = std::string(label != nullptr ? label : "") + "@" + w.name;
        if (!verbose.isNullValue() && static_cast<CMPIBoolean>(verbose))
            echo += " (verbose)";
        out.setArg("Result", CmpiData(CMPIUint64(v) * (sum == 0 ? 1 : sum)));
        out.setArg("Echo", CmpiData(echo));
        out.setArg("Level", CmpiData(w.level));
        CmpiArray offsets(2, CMPI_sint32);
        offsets[0] = CmpiData(CMPISint32(-1));
        offsets[1] = CmpiData(w.offset);
        out.setArg("Offsets", CmpiData(offsets));
        out.setArg("Delay", CmpiData(CmpiDateTime("00000000003000.000000:000")));
        out.setArg("Job", CmpiData(target));
        rslt.returnData(CmpiData(CMPIUint32(0)));
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }

    // ---- indications -----------------------------------------------------

    CmpiStatus authorizeFilter(const CmpiContext&, const CmpiSelectExp&, const char*,
                               const CmpiObjectPath&, const char*) override
    {
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus mustPoll(const CmpiContext&, const CmpiSelectExp&, const char*,
                        const CmpiObjectPath&) override
    {
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus activateFilter(const CmpiContext&, const CmpiSelectExp&, const char*,
                              const CmpiObjectPath&, CMPIBoolean) override
    {
        std::lock_guard<std::mutex> lock(indMutex_);
        ++filters_;
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus deActivateFilter(const CmpiContext&, const CmpiSelectExp&, const char*,
                                const CmpiObjectPath&, CMPIBoolean) override
    {
        std::lock_guard<std::mutex> lock(indMutex_);
        if (filters_ > 0)
            --filters_;
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus enableIndications(const CmpiContext& ctx) override
    {
        std::lock_guard<std::mutex> lock(threadMutex_);
        if (indThread_.joinable())
            return CmpiStatus(CMPI_RC_OK);
        CmpiContext threadCtx = broker->prepareAttachThread(ctx);
        {
            std::lock_guard<std::mutex> ilock(indMutex_);
            stop_ = false;
        }
        indThread_ = std::thread([this, threadCtx] { indicationLoop(threadCtx); });
        return CmpiStatus(CMPI_RC_OK);
    }

    CmpiStatus disableIndications(const CmpiContext&) override
    {
        stopIndicationThread();
        return CmpiStatus(CMPI_RC_OK);
    }

private:
    // ---- building paths and instances -------------------------------------

    static CmpiObjectPath widgetPath(const CmpiString& ns, const Widget& w)
    {
        CmpiObjectPath op(ns, kWidget);
        op.setKey("Name", CmpiData(w.name));
        return op;
    }

    static CmpiObjectPath gadgetPath(const CmpiString& ns, const Gadget& g)
    {
        CmpiObjectPath op(ns, kGadget);
        op.setKey("Id", CmpiData(g.id));
        return op;
    }

    static CmpiObjectPath servicePath(const CmpiString& ns)
    {
        CmpiObjectPath op(ns, kService);
        op.setKey("Name", CmpiData(kServiceName));
        return op;
    }

    CmpiObjectPath linkPath(const CmpiString& ns, const Gadget& g)
    {
        CmpiObjectPath op(ns, kLink);
        op.setKey("Owner", CmpiData(widgetPath(ns, findWidget(g.owner.c_str()))));
        op.setKey("Part", CmpiData(gadgetPath(ns, g)));
        return op;
    }

    static CmpiInstance widgetInstance(const CmpiString& ns, const Widget& w, const char** properties)
    {
        static const char* keys[] = {"Name", nullptr};
        CmpiInstance inst(widgetPath(ns, w));
        if (properties != nullptr)
            inst.setPropertyFilter(properties, keys);
        inst.setProperty("Name", CmpiData(w.name));
        inst.setProperty("Caption", CmpiData(("Widget " + w.name).c_str()));
        inst.setProperty("Enabled", CmpiData(w.enabled));
        inst.setProperty("Level", CmpiData(w.level));
        inst.setProperty("Port", CmpiData(w.port));
        inst.setProperty("Count", CmpiData(w.count));
        inst.setProperty("Bytes", CmpiData(w.bytes));
        inst.setProperty("Offset", CmpiData(w.offset));
        inst.setProperty("Installed", CmpiData(CmpiDateTime(w.installedUs, false)));
        inst.setProperty("Uptime", CmpiData(CmpiDateTime(w.uptimeUs, true)));
        CmpiArray tags(static_cast<CMPICount>(w.tags.size()), CMPI_string);
        for (size_t i = 0; i < w.tags.size(); ++i)
            tags[static_cast<int>(i)] = CmpiData(w.tags[i]);
        inst.setProperty("Tags", CmpiData(tags));
        CmpiArray codes(static_cast<CMPICount>(w.codes.size()), CMPI_uint16);
        for (size_t i = 0; i < w.codes.size(); ++i)
            codes[static_cast<int>(i)] = CmpiData(w.codes[i]);
        inst.setProperty("Codes", CmpiData(codes));
        return inst;
    }

    static CmpiInstance gadgetInstance(const CmpiString& ns, const Gadget& g, const char** properties)
    {
        static const char* keys[] = {"Id", nullptr};
        CmpiInstance inst(gadgetPath(ns, g));
        if (properties != nullptr)
            inst.setPropertyFilter(properties, keys);
        inst.setProperty("Id", CmpiData(g.id));
        inst.setProperty("Kind", CmpiData(g.kind));
        inst.setProperty("Caption", CmpiData("Gadget"));
        return inst;
    }

    CmpiInstance linkInstance(const CmpiString& ns, const Gadget& g)
    {
        CmpiInstance inst(linkPath(ns, g));
        inst.setProperty("Owner", CmpiData(widgetPath(ns, findWidget(g.owner.c_str()))));
        inst.setProperty("Part", CmpiData(gadgetPath(ns, g)));
        return inst;
    }

    static CmpiInstance serviceInstance(const CmpiString& ns, const char** properties)
    {
        static const char* keys[] = {"Name", nullptr};
        CmpiInstance inst(servicePath(ns));
        if (properties != nullptr)
            inst.setPropertyFilter(properties, keys);
        inst.setProperty("Name", CmpiData(kServiceName));
        inst.setProperty("Caption", CmpiData("Sample service"));
        return inst;
    }

    // ---- lookups -----------------------------------------------------------

    Widget& findWidget(const char* name)
    {
        for (Widget& w : widgets_)
            if (same(w.name.c_str(), name))
                return w;
        throw CmpiStatus(CMPI_RC_ERR_NOT_FOUND, name != nullptr ? name : "");
    }

    Gadget& findGadget(const char* id)
    {
        for (Gadget& g : gadgets_)
            if (same(g.id.c_str(), id))
                return g;
        throw CmpiStatus(CMPI_RC_ERR_NOT_FOUND, id != nullptr ? id : "");
    }

    static bool wanted(const char** properties, const char* name)
    {
        if (properties == nullptr)
            return true;
        for (const char** p = properties; *p != nullptr; ++p)
            if (same(*p, name))
                return true;
        return false;
    }

    // Copies the properties that the instance carries (and the list, if
    // any, admits) into the widget.
    static void applyProperties(Widget& w, const CmpiInstance& inst, const char** properties)
    {
        auto take = [&](const char* name, auto apply) {
            if (!wanted(properties, name))
                return;
            CmpiData d = inst.getProperty(name);
            if (!d.isNullValue())
                apply(d);
        };
        take("Enabled", [&](const CmpiData& d) { w.enabled = static_cast<CMPIBoolean>(d) != 0; });
        take("Level", [&](const CmpiData& d) { w.level = static_cast<CMPIUint8>(d); });
        take("Port", [&](const CmpiData& d) { w.port = static_cast<CMPIUint16>(d); });
        take("Count", [&](const CmpiData& d) { w.count = static_cast<CMPIUint32>(d); });
        take("Bytes", [&](const CmpiData& d) { w.bytes = static_cast<CMPIUint64>(d); });
        take("Offset", [&](const CmpiData& d) { w.offset = static_cast<CMPISint32>(d); });
        take("Installed", [&](const CmpiData& d) { w.installedUs = static_cast<CmpiDateTime>(d).getDateTime(); });
        take("Tags", [&](const CmpiData& d) {
            CmpiArray a = d;
            w.tags.clear();
            for (CMPICount i = 0; i < a.size(); ++i) {
                const char* t = a[static_cast<int>(i)];
                w.tags.push_back(t != nullptr ? t : "");
            }
        });
        take("Codes", [&](const CmpiData& d) {
            CmpiArray a = d;
            w.codes.clear();
            for (CMPICount i = 0; i < a.size(); ++i)
                w.codes.push_back(static_cast<CMPIUint16>(a[static_cast<int>(i)]));
        });
    }

    // Calls visit(gadget, sourceIsWidget) for each link of the source path
    // that the association, role and result class filters admit.  A source
    // of neither end class is refused with CMPI_RC_ERR_NOT_SUPPORTED.
    template <class Visit>
    void walk(const CmpiObjectPath& op, const char* assocClass, const char* resultClass,
              const char* role, const char* resultRole, Visit visit)
    {
        bool fromWidget = op.classPathIsA(kWidget);
        if (!fromWidget && !op.classPathIsA(kGadget))
            throw CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED, op.getClassName().charPtr());
        if (!empty(assocClass) && !same(assocClass, kLink))
            return;
        const char* myRole = fromWidget ? "Owner" : "Part";
        const char* otherRole = fromWidget ? "Part" : "Owner";
        if ((!empty(role) && !same(role, myRole)) || (!empty(resultRole) && !same(resultRole, otherRole)))
            return;
        if (!empty(resultClass)) {
            CmpiObjectPath partner(op.getNameSpace(), fromWidget ? kGadget : kWidget);
            if (!partner.classPathIsA(resultClass))
                return;
        }
        if (fromWidget) {
            const Widget& w = findWidget(op.getKey("Name"));
            for (const Gadget& g : gadgets_)
                if (g.owner == w.name)
                    visit(g, true);
        } else {
            visit(findGadget(op.getKey("Id")), false);
        }
    }

    // ---- the indication thread ------------------------------------------

    void indicationLoop(CmpiContext ctx)
    {
        try {
            broker->attachThread(ctx);
        } catch (...) {
            return;
        }
        CMPIUint32 sequence = 0;
        std::unique_lock<std::mutex> lock(indMutex_);
        while (!stop_) {
            indCv_.wait_for(lock, std::chrono::milliseconds(100), [this] { return stop_; });
            if (stop_ || filters_ <= 0)
                continue;
            ++sequence;
            lock.unlock();
            try {
                CmpiObjectPath op(kNamespace, kAlert);
                CmpiInstance ind(op);
                ind.setProperty("Message", CmpiData("tick"));
                ind.setProperty("Sequence", CmpiData(sequence));
                ind.setProperty("Raised", CmpiData(CmpiDateTime()));
                CmpiObjectPath source(kNamespace, kWidget);
                source.setKey("Name", CmpiData("w1"));
                ind.setProperty("Source", CmpiData(source));
                broker->deliverIndication(ctx, kNamespace, ind);
            } catch (...) {
                // A delivery that fails is dropped; the next tick tries again.
            }
            lock.lock();
        }
        lock.unlock();
        try {
            broker->detachThread(ctx);
        } catch (...) {
        }
    }

    void stopIndicationThread()
    {
        std::lock_guard<std::mutex> lock(threadMutex_);
        if (!indThread_.joinable())
            return;
        {
            std::lock_guard<std::mutex> ilock(indMutex_);
            stop_ = true;
        }
        indCv_.notify_all();
        indThread_.join();
    }

    std::mutex mutex_;  // widgets_ and gadgets_
    std::vector<Widget> widgets_;
    std::vector<Gadget> gadgets_;

    std::mutex threadMutex_;  // start and stop of indThread_
    std::thread indThread_;
    std::mutex indMutex_;  // filters_ and stop_
    std::condition_variable indCv_;
    int filters_ = 0;
    bool stop_ = false;
};

// ---- factories ---------------------------------------------------------

CmpiProviderBase g_base;
std::mutex g_factoryMutex;

// The first factory call makes and initialises the provider; every call
// hands out the same object. Each MI structure counts once per life, as a
// server may call a factory for every class it serves but cleans each MI up
// once.
template <class MI, class FT>
MI* create(MI& mi, FT* ft, const CMPIBroker* mb, const CMPIContext* ctx, CMPIStatus* rc)
{
    try {
        std::lock_guard<std::mutex> lock(g_factoryMutex);
        mi.ft = ft;
        CmpiBaseMI* base = g_base.getBaseMI();
        if (base == nullptr) {
            CmpiBroker broker(mb);
            CmpiContext context(ctx);
            SampleProvider* provider = new SampleProvider(broker, context);
            base = provider;
            base->setProviderBase(&g_base);
            CmpiStatus st = base->initialize(context);
            if (st.rc() != CMPI_RC_OK) {
                delete provider;
                if (rc != nullptr)
                    *rc = st.status(mb);
                return nullptr;
            }
            g_base.setBaseMI(base);
        }
        mi.hdl = base;
        g_base.attachMI(&mi);
        if (rc != nullptr)
            *rc = CmpiStatus(CMPI_RC_OK).status(mb);
        return &mi;
    } catch (const CmpiStatus& st) {
        if (rc != nullptr)
            *rc = st.status(mb);
    } catch (...) {
        if (rc != nullptr)
            *rc = CmpiStatus(CMPI_RC_ERR_FAILED).status(mb);
    }
    return nullptr;
}

CMPIInstanceMIFT instFT = cmpiInstanceMIFT("instanceSample_Provider");
CMPIAssociationMIFT assocFT = cmpiAssociationMIFT("associationSample_Provider");
CMPIMethodMIFT methFT = cmpiMethodMIFT("methodSample_Provider");
CMPIIndicationMIFT indFT = cmpiIndicationMIFT("indicationSample_Provider");

} // namespace

CMPI_PROVIDER_FACTORY CMPIInstanceMI* Sample_Provider_Create_InstanceMI(const CMPIBroker* mb,
                                                                        const CMPIContext* ctx,
                                                                        CMPIStatus* rc)
{
    static CMPIInstanceMI mi;
    return create(mi, &instFT, mb, ctx, rc);
}

CMPI_PROVIDER_FACTORY CMPIAssociationMI* Sample_Provider_Create_AssociationMI(const CMPIBroker* mb,
                                                                              const CMPIContext* ctx,
                                                                              CMPIStatus* rc)
{
    static CMPIAssociationMI mi;
    return create(mi, &assocFT, mb, ctx, rc);
}

CMPI_PROVIDER_FACTORY CMPIMethodMI* Sample_Provider_Create_MethodMI(const CMPIBroker* mb,
                                                                    const CMPIContext* ctx,
                                                                    CMPIStatus* rc)
{
    static CMPIMethodMI mi;
    return create(mi, &methFT, mb, ctx, rc);
}

CMPI_PROVIDER_FACTORY CMPIIndicationMI* Sample_Provider_Create_IndicationMI(const CMPIBroker* mb,
                                                                            const CMPIContext* ctx,
                                                                            CMPIStatus* rc)
{
    static CMPIIndicationMI mi;
    return create(mi, &indFT, mb, ctx, rc);
}

// A provider object of all four MI kinds for the driver tests, with the
// factories written the way a provider library writes them.
#ifndef CMPI_TESTS_TEST_PROVIDER_H
#define CMPI_TESTS_TEST_PROVIDER_H

#include "CmpiImpl.h"

#include <atomic>
#include <stdexcept>
#include <string>

struct TestProvider : public CmpiInstanceMI,
                      public CmpiAssociationMI,
                      public CmpiIndicationMI,
                      public CmpiMethodMI {
    static std::atomic<int> live;
    static std::atomic<int> cleanups;
    static std::atomic<bool> unloadable;

    // What the last operation saw.
    std::string seen;

    TestProvider(const CmpiBroker& mb, const CmpiContext& ctx)
        : CmpiBaseMI(mb, ctx), CmpiInstanceMI(mb, ctx), CmpiAssociationMI(mb, ctx),
          CmpiIndicationMI(mb, ctx), CmpiMethodMI(mb, ctx)
    {
        ++live;
    }
    ~TestProvider() override { --live; }

    CmpiStatus cleanup(CmpiContext&) override
    {
        ++cleanups;
        return CmpiStatus(CMPI_RC_OK);
    }
    bool isUnloadable() const override { return unloadable; }

    // getInstance fails in the way the key names: "status:<rc>",
    // "std", "int"; any other key returns an instance.
    CmpiStatus getInstance(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop,
                           const char**) override
    {
        std::string key = static_cast<const char*>(cop.getKey("Name"));
        if (key.rfind("status:", 0) == 0)
            throw CmpiStatus(static_cast<CMPIrc>(std::stoi(key.substr(7))), key.c_str());
        if (key == "std")
            throw std::runtime_error("broken");
        if (key == "int")
            throw 42;
        rslt.returnData(CmpiInstance(cop));
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }
    // createInstance answers the path it was handed; both note the
    // instance's Name, setInstance the property list after it.
    CmpiStatus createInstance(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& cop,
                              const CmpiInstance& inst) override
    {
        seen = static_cast<const char*>(inst.getProperty("Name"));
        rslt.returnData(cop);
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }
    CmpiStatus setInstance(const CmpiContext&, CmpiResult&, const CmpiObjectPath&, const CmpiInstance& inst,
                           const char** properties) override
    {
        seen = static_cast<const char*>(inst.getProperty("Name"));
        for (const char** p = properties; p != nullptr && *p != nullptr; ++p)
            seen += std::string("|") + *p;
        return CmpiStatus(CMPI_RC_OK);
    }
    CmpiStatus execQuery(const CmpiContext&, CmpiResult&, const CmpiObjectPath&, const char* query,
                         const char* language) override
    {
        seen = std::string(query) + "|" + language;
        return CmpiStatus(CMPI_RC_OK);
    }
    CmpiStatus associatorNames(const CmpiContext&, CmpiResult&, const CmpiObjectPath&,
                               const char* assocClass, const char* resultClass, const char* role,
                               const char* resultRole) override
    {
        seen = std::string(assocClass) + "|" + resultClass + "|" + role + "|" + resultRole;
        return CmpiStatus(CMPI_RC_ERR_NOT_FOUND, "none");
    }
    CmpiStatus invokeMethod(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath&,
                            const char* method, const CmpiArgs& in, CmpiArgs& out) override
    {
        seen = method;
        CMPIUint32 x = in.getArg("X");
        out.setArg("Y", CmpiData(CMPIUint32(x * 2)));
        rslt.returnData(CmpiData(CMPIUint32(0)));
        rslt.returnDone();
        return CmpiStatus(CMPI_RC_OK);
    }
    CmpiStatus activateFilter(const CmpiContext&, const CmpiSelectExp& se, const char* className,
                              const CmpiObjectPath&, CMPIBoolean first) override
    {
        seen = std::string(se.getString().charPtr()) + "|" + className + "|" + (first ? "1" : "0");
        return CmpiStatus(CMPI_RC_OK);
    }
};

// The library's file-scope link between factories and provider object.
extern CmpiProviderBase testProviderBase;

// A factory as a provider library writes it: the first call makes and
// initialises the provider, every call stores it as the MI's handle and
// counts once (incUseCount), or counts the MI structure once per life
// (attachMI).
template <class MI, class FT>
MI* testFactory(MI& mi, FT* ft, const CMPIBroker* mb, const CMPIContext* ctx, bool attach = false)
{
    mi.ft = ft;
    CmpiBaseMI* base = testProviderBase.getBaseMI();
    if (base == nullptr) {
        CmpiBroker broker(mb);
        CmpiContext context(ctx);
        TestProvider* provider = new TestProvider(broker, context);
        base = provider;
        base->setProviderBase(&testProviderBase);
        base->initialize(context);
        testProviderBase.setBaseMI(base);
    }
    mi.hdl = base;
    if (attach)
        testProviderBase.attachMI(&mi);
    else
        testProviderBase.incUseCount();
    return &mi;
}

extern CMPIInstanceMIFT testInstFT;
extern CMPIAssociationMIFT testAssocFT;
extern CMPIMethodMIFT testMethFT;
extern CMPIIndicationMIFT testIndFT;

#endif

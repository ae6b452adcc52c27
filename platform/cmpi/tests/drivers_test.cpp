// The MI drivers and the provider lifecycle: factories in any order share
// one object, cleanup through every MI, unload vetoes, second life, and the
// translation of C++ exceptions into CMPI statuses.
#include "fake_broker.h"
#include "test_provider.h"

#include <gtest/gtest.h>

namespace {

class Drivers : public ::testing::Test {
protected:
    CMPIInstanceMI inst{};
    CMPIAssociationMI assoc{};
    CMPIMethodMI meth{};
    CMPIIndicationMI ind{};
    CMPIContext* ctx = nullptr;

    void SetUp() override
    {
        fake::reset();
        CmpiProviderBase::setBroker(fake::broker());
        ctx = fake::newContext();
        TestProvider::unloadable = true;
        TestProvider::cleanups = 0;
    }
    void TearDown() override
    {
        // Leave no provider behind for the next test.
        TestProvider::unloadable = true;
        CmpiBaseMI::driveBaseCleanup(&inst, ctx, 1);
        CmpiBaseMI::driveBaseCleanup(&assoc, ctx, 1);
        CmpiBaseMI::driveBaseCleanup(&meth, ctx, 1);
        CmpiBaseMI::driveBaseCleanup(&ind, ctx, 1);
        EXPECT_EQ(TestProvider::live, 0);
        EXPECT_EQ(testProviderBase.getUseCount(), 0);
    }
    void createAll()
    {
        testFactory(meth, &testMethFT, fake::broker(), ctx);
        testFactory(ind, &testIndFT, fake::broker(), ctx);
        testFactory(inst, &testInstFT, fake::broker(), ctx);
        testFactory(assoc, &testAssocFT, fake::broker(), ctx);
    }
    TestProvider* provider() { return dynamic_cast<TestProvider*>(testProviderBase.getBaseMI()); }

    CMPIStatus getInstance(const char* key, CMPIResult** out = nullptr)
    {
        CmpiObjectPath op("root/sample", "Sample_Widget");
        op.setKey("Name", CmpiData(key));
        CMPIResult* r = fake::newResult();
        if (out != nullptr)
            *out = r;
        return inst.ft->getInstance(&inst, ctx, r, op.getEnc(), nullptr);
    }
};

TEST_F(Drivers, FactoriesInAnyOrderShareOneProvider)
{
    createAll();
    EXPECT_EQ(TestProvider::live, 1);
    EXPECT_EQ(testProviderBase.getUseCount(), 4);
    EXPECT_EQ(inst.hdl, assoc.hdl);
    EXPECT_EQ(meth.hdl, ind.hdl);
    EXPECT_EQ(CmpiProviderBase::getBroker(), fake::broker());
}

TEST_F(Drivers, LastCleanupDeletesAndASecondLifeStartsClean)
{
    createAll();
    EXPECT_EQ(inst.ft->cleanup(&inst, ctx, 0).rc, CMPI_RC_OK);
    EXPECT_EQ(assoc.ft->cleanup(&assoc, ctx, 0).rc, CMPI_RC_OK);
    EXPECT_EQ(ind.ft->cleanup(&ind, ctx, 0).rc, CMPI_RC_OK);
    EXPECT_EQ(TestProvider::live, 1);
    EXPECT_EQ(TestProvider::cleanups, 0);
    EXPECT_EQ(meth.ft->cleanup(&meth, ctx, 0).rc, CMPI_RC_OK);
    EXPECT_EQ(TestProvider::live, 0);
    EXPECT_EQ(TestProvider::cleanups, 1);
    EXPECT_EQ(testProviderBase.getBaseMI(), nullptr);
    // No cleaned-up MI reaches the deleted object any more.
    EXPECT_EQ(inst.hdl, nullptr);
    EXPECT_EQ(assoc.hdl, nullptr);
    EXPECT_EQ(ind.hdl, nullptr);
    EXPECT_EQ(meth.hdl, nullptr);

    // A further cleanup of that MI does nothing.
    EXPECT_EQ(meth.ft->cleanup(&meth, ctx, 1).rc, CMPI_RC_OK);
    EXPECT_EQ(TestProvider::cleanups, 1);

    // Reload in the same process: the factories make a new object.
    createAll();
    EXPECT_EQ(TestProvider::live, 1);
    EXPECT_EQ(testProviderBase.getUseCount(), 4);
    EXPECT_EQ(getInstance("w1").rc, CMPI_RC_OK);
}

// sfcb calls a factory once per registered class: the same static MI
// structure comes back each time, and is cleaned up as often.
TEST_F(Drivers, OneMiStructureFromManyFactoryCalls)
{
    for (int i = 0; i < 3; ++i)
        testFactory(inst, &testInstFT, fake::broker(), ctx);
    testFactory(assoc, &testAssocFT, fake::broker(), ctx);
    EXPECT_EQ(testProviderBase.getUseCount(), 4);
    EXPECT_EQ(TestProvider::live, 1);
    for (int i = 0; i < 3; ++i) {
        EXPECT_EQ(inst.ft->cleanup(&inst, ctx, 0).rc, CMPI_RC_OK);
        EXPECT_EQ(TestProvider::live, 1);
    }
    EXPECT_EQ(assoc.ft->cleanup(&assoc, ctx, 0).rc, CMPI_RC_OK);
    EXPECT_EQ(TestProvider::live, 0);
    EXPECT_EQ(TestProvider::cleanups, 1);
    EXPECT_EQ(inst.hdl, nullptr);
}

// With attachMI an MI structure counts once per life however often its
// factory runs, and its first cleanup counts it down: one cleanup per MI type
// ends the provider, as sfcb gives it; a repeated cleanup changes nothing; an
// MI handed out again after its cleanup counts again.
TEST_F(Drivers, AttachedMisCountOncePerLife)
{
    for (int i = 0; i < 3; ++i)
        testFactory(inst, &testInstFT, fake::broker(), ctx, true);
    testFactory(assoc, &testAssocFT, fake::broker(), ctx, true);
    testFactory(meth, &testMethFT, fake::broker(), ctx, true);
    EXPECT_EQ(testProviderBase.getUseCount(), 3);
    EXPECT_EQ(inst.ft->cleanup(&inst, ctx, 0).rc, CMPI_RC_OK);
    EXPECT_EQ(inst.ft->cleanup(&inst, ctx, 0).rc, CMPI_RC_OK);
    EXPECT_EQ(testProviderBase.getUseCount(), 2);
    testFactory(inst, &testInstFT, fake::broker(), ctx, true);
    EXPECT_EQ(testProviderBase.getUseCount(), 3);
    EXPECT_EQ(inst.ft->cleanup(&inst, ctx, 0).rc, CMPI_RC_OK);
    EXPECT_EQ(assoc.ft->cleanup(&assoc, ctx, 0).rc, CMPI_RC_OK);
    EXPECT_EQ(TestProvider::live, 1);
    EXPECT_EQ(meth.ft->cleanup(&meth, ctx, 0).rc, CMPI_RC_OK);
    EXPECT_EQ(TestProvider::live, 0);
    EXPECT_EQ(TestProvider::cleanups, 1);
    EXPECT_EQ(inst.hdl, nullptr);
    EXPECT_EQ(meth.hdl, nullptr);
    // A new life counts afresh.
    testFactory(inst, &testInstFT, fake::broker(), ctx, true);
    EXPECT_EQ(testProviderBase.getUseCount(), 1);
}

TEST_F(Drivers, UnloadVetoUnlessTerminating)
{
    createAll();
    TestProvider::unloadable = false;
    EXPECT_EQ(inst.ft->cleanup(&inst, ctx, 0).rc, CMPI_RC_DO_NOT_UNLOAD);
    EXPECT_EQ(testProviderBase.getUseCount(), 4);
    EXPECT_NE(inst.hdl, nullptr);
    // Server shutdown: cleanup goes on regardless.
    EXPECT_EQ(inst.ft->cleanup(&inst, ctx, 1).rc, CMPI_RC_OK);
    EXPECT_EQ(testProviderBase.getUseCount(), 3);
    EXPECT_EQ(assoc.ft->cleanup(&assoc, ctx, 1).rc, CMPI_RC_OK);
    EXPECT_EQ(meth.ft->cleanup(&meth, ctx, 1).rc, CMPI_RC_OK);
    EXPECT_EQ(ind.ft->cleanup(&ind, ctx, 1).rc, CMPI_RC_OK);
    EXPECT_EQ(TestProvider::live, 0);
}

TEST_F(Drivers, ThrownStatusesBecomeTheReturnedStatus)
{
    createAll();
    CMPIResult* r = nullptr;
    EXPECT_EQ(getInstance("w1", &r).rc, CMPI_RC_OK);
    EXPECT_EQ(fake::resultItems(r).size(), 1u);

    CMPIStatus nf = getInstance("status:6");
    EXPECT_EQ(nf.rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(fake::text(nf.msg), "status:6");

    CMPIStatus std = getInstance("std");
    EXPECT_EQ(std.rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(fake::text(std.msg), "broken");

    CMPIStatus other = getInstance("int");
    EXPECT_EQ(other.rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(other.msg, nullptr);

    // A wrapper exception inside the provider (absent key) comes out too.
    CmpiObjectPath nokey("root/sample", "Sample_Widget");
    CMPIStatus st = inst.ft->getInstance(&inst, ctx, fake::newResult(), nokey.getEnc(), nullptr);
    EXPECT_EQ(st.rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(fake::text(st.msg), "Name");
}

TEST_F(Drivers, ArgumentsReachTheOperations)
{
    createAll();
    CmpiObjectPath op("root/sample", "Sample_Widget");
    EXPECT_EQ(inst.ft->execQuery(&inst, ctx, fake::newResult(), op.getEnc(), "SELECT *", "WQL").rc,
              CMPI_RC_OK);
    EXPECT_EQ(provider()->seen, "SELECT *|WQL");

    CMPIStatus st = assoc.ft->associatorNames(&assoc, ctx, fake::newResult(), op.getEnc(), "A", "R",
                                              "r1", "r2");
    EXPECT_EQ(st.rc, CMPI_RC_ERR_NOT_FOUND);  // a returned (not thrown) status passes too
    EXPECT_EQ(fake::text(st.msg), "none");
    EXPECT_EQ(provider()->seen, "A|R|r1|r2");

    CmpiInstance widget(op);
    widget.setProperty("Name", CmpiData("w3"));
    CMPIResult* created = fake::newResult();
    EXPECT_EQ(inst.ft->createInstance(&inst, ctx, created, op.getEnc(), widget.getEnc()).rc, CMPI_RC_OK);
    EXPECT_EQ(provider()->seen, "w3");
    ASSERT_EQ(fake::resultItems(created).size(), 1u);
    EXPECT_EQ(fake::resultItems(created)[0].data.type, CMPI_ref);
    const char* list[] = {"Port", "Level", nullptr};
    EXPECT_EQ(inst.ft->modifyInstance(&inst, ctx, fake::newResult(), op.getEnc(), widget.getEnc(), list).rc,
              CMPI_RC_OK);
    EXPECT_EQ(provider()->seen, "w3|Port|Level");

    CmpiArgs in;
    in.setArg("X", CmpiData(CMPIUint32(21)));
    CmpiArgs out;
    CMPIResult* r = fake::newResult();
    EXPECT_EQ(meth.ft->invokeMethod(&meth, ctx, r, op.getEnc(), "Double", in.getEnc(), out.getEnc()).rc,
              CMPI_RC_OK);
    EXPECT_EQ(provider()->seen, "Double");
    EXPECT_EQ(static_cast<CMPIUint32>(out.getArg("Y")), 42u);
    ASSERT_EQ(fake::resultItems(r).size(), 1u);

    EXPECT_EQ(ind.ft->activateFilter(&ind, ctx, fake::newSelectExp("SELECT * FROM A"), "A", op.getEnc(), 1).rc,
              CMPI_RC_OK);
    EXPECT_EQ(provider()->seen, "SELECT * FROM A|A|1");
}

TEST_F(Drivers, DefaultOperations)
{
    createAll();
    CmpiObjectPath op("root/sample", "Sample_Widget");
    CMPISelectExp* se = fake::newSelectExp("q");
    EXPECT_EQ(inst.ft->enumerateInstanceNames(&inst, ctx, fake::newResult(), op.getEnc()).rc,
              CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(inst.ft->deleteInstance(&inst, ctx, fake::newResult(), op.getEnc()).rc,
              CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(assoc.ft->references(&assoc, ctx, fake::newResult(), op.getEnc(), nullptr, nullptr, nullptr).rc,
              CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(ind.ft->authorizeFilter(&ind, ctx, se, "A", op.getEnc(), "me").rc, CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(ind.ft->mustPoll(&ind, ctx, se, "A", op.getEnc()).rc, CMPI_RC_ERR_NOT_SUPPORTED);
    EXPECT_EQ(ind.ft->enableIndications(&ind, ctx).rc, CMPI_RC_OK);
    EXPECT_EQ(ind.ft->disableIndications(&ind, ctx).rc, CMPI_RC_OK);
}

// An object that serves instances only, behind an association table.
struct InstanceOnly : public CmpiInstanceMI {
    InstanceOnly(const CmpiBroker& mb, const CmpiContext& ctx) : CmpiBaseMI(mb, ctx), CmpiInstanceMI(mb, ctx) {}
};

TEST_F(Drivers, WrongOrMissingProviderObject)
{
    CmpiObjectPath op("root/sample", "Sample_Widget");
    CMPIAssociationMI orphan = {nullptr, &testAssocFT};
    CMPIStatus st = orphan.ft->referenceNames(&orphan, ctx, fake::newResult(), op.getEnc(), nullptr, nullptr);
    EXPECT_EQ(st.rc, CMPI_RC_ERR_FAILED);
    EXPECT_EQ(fake::text(st.msg), "no provider object");

    InstanceOnly only(CmpiBroker(fake::broker()), CmpiContext(ctx));
    CMPIAssociationMI wrong = {static_cast<CmpiBaseMI*>(&only), &testAssocFT};
    EXPECT_EQ(wrong.ft->referenceNames(&wrong, ctx, fake::newResult(), op.getEnc(), nullptr, nullptr).rc,
              CMPI_RC_ERR_NOT_SUPPORTED);
    // Never linked to a provider base: cleanup leaves it alone.
    EXPECT_EQ(wrong.ft->cleanup(&wrong, ctx, 1).rc, CMPI_RC_OK);
}

} // namespace

// The provider object on its own, against a small in-process broker: its
// lifecycle and the routing of requests by class.
#include <gtest/gtest.h>

#include <memory>

#include "fake_broker.h"
#include "inventory/AdapterFunc.h"
#include "provider/Vexlan_CNA_Provider_CMPI.h"
#include "provider_env.h"
#include "zorap_sim_control.h"

using namespace provtest;

namespace {

class ProviderObject : public ::testing::Test {
protected:
    void SetUp() override
    {
        writeSettings("DebugLog=1\nErrorLog=1\n", "LinkStatusPollIntervalSeconds=0\n");
        removeLog();
        fake::reset();
        zorap_sim_load_default();
        zorap_sim_reset();
        broker_ = std::make_unique<CmpiBroker>(fake::broker());
        context_ = CmpiContext(fake::newContext());
        provider_ = std::make_unique<Vexlan_CNA_Provider>(*broker_, context_);
    }
    void TearDown() override
    {
        CmpiContext ctx(fake::newContext());
        provider_->cleanup(ctx);
        provider_.reset();
    }

    CMPIObjectPath* path(const char* className)
    {
        CMPIStatus rc = {CMPI_RC_OK, nullptr};
        return fake::broker()->eft->newObjectPath(fake::broker(), "root/vexlan_cmpi", className, &rc);
    }

    std::unique_ptr<CmpiBroker> broker_;
    CmpiContext context_;
    std::unique_ptr<Vexlan_CNA_Provider> provider_;
};

}  // namespace

TEST_F(ProviderObject, ASecondInitializeStartsNoSecondThreadAndCleanupStopsIt)
{
    const int threadsBefore = threadCount();
    ASSERT_TRUE(provider_->initialize(context_).rc() == CMPI_RC_OK);
    EXPECT_TRUE(provider_->state.initialized);
    EXPECT_TRUE(provider_->state.initializing);
    // The polling thread, and the adapter library's alarm thread.
    const int threadsRunning = threadCount();
    EXPECT_EQ(threadsRunning, threadsBefore + 2);
    EXPECT_EQ(fake::attachedThreads(), 1);

    ASSERT_TRUE(provider_->initialize(context_).rc() == CMPI_RC_OK);
    EXPECT_EQ(countLog("***** Vexlan_CNA_Provider already initialized *****"), 1);
    EXPECT_EQ(threadCount(), threadsRunning);
    EXPECT_EQ(fake::attachedThreads(), 1);
    EXPECT_EQ(zorap_sim_call_count(ZORAP_FN_Initialize), 1u);

    CmpiContext ctx(fake::newContext());
    ASSERT_TRUE(provider_->cleanup(ctx).rc() == CMPI_RC_OK);
    EXPECT_FALSE(provider_->state.initialized);
    EXPECT_FALSE(provider_->state.initializing);
    EXPECT_FALSE(provider_->pollingEnabled);
    EXPECT_EQ(fake::attachedThreads(), 0);
    EXPECT_EQ(threadCount(), threadsBefore);
    EXPECT_EQ(zorap_sim_call_count(ZORAP_FN_Uninitialize), 1u);
    EXPECT_EQ(m_CNAList, nullptr);

    // The same object may start again after a cleanup.
    ASSERT_TRUE(provider_->initialize(context_).rc() == CMPI_RC_OK);
    EXPECT_TRUE(provider_->state.initialized);
    EXPECT_EQ(zorap_sim_call_count(ZORAP_FN_Initialize), 2u);
}

TEST_F(ProviderObject, CleanupOfAProviderThatNeverStartedTouchesNoAdapter)
{
    CmpiContext ctx(fake::newContext());
    ASSERT_TRUE(provider_->cleanup(ctx).rc() == CMPI_RC_OK);
    EXPECT_EQ(countLog("***** Vexlan_CNA_Provider cleanup done *****"), 1);
    EXPECT_EQ(countLog("  Polling already disabled"), 0);
    for (int fn = 0; fn < ZORAP_FN_COUNT; ++fn)
        EXPECT_EQ(zorap_sim_call_count(fn), 0u) << zorap_sim_function_name(fn);
}

TEST_F(ProviderObject, IsUnloadableIsFalseWhileAFlashWriteRuns)
{
    EXPECT_TRUE(provider_->isUnloadable());
    gbFlashUpdateInProgress = true;
    EXPECT_FALSE(provider_->isUnloadable());
    gbFlashUpdateInProgress = false;
    EXPECT_TRUE(provider_->isUnloadable());
    EXPECT_EQ(countLog("***** Vexlan_CNA_Provider Flash update in progress. So, prevent unloading*****"), 1);
}

TEST_F(ProviderObject, RequestsAreRoutedBySubclassAndUnknownClassesAnswerEmpty)
{
    ASSERT_TRUE(provider_->initialize(context_).rc() == CMPI_RC_OK);
    fake::addSubclass("Vexlan_Test_Host", "Vexlan_Adapter_ComputerSystem");

    CMPIResult* subclass = fake::newResult();
    CmpiResult subclassResult(subclass);
    CmpiStatus st = provider_->enumInstances(context_, subclassResult, CmpiObjectPath(path("Vexlan_Test_Host")), nullptr);
    EXPECT_EQ(st.rc(), CMPI_RC_OK);
    EXPECT_EQ(fake::resultItems(subclass).size(), 1u);
    EXPECT_TRUE(fake::resultDone(subclass));

    CMPIResult* unknown = fake::newResult();
    CmpiResult unknownResult(unknown);
    st = provider_->enumInstanceNames(context_, unknownResult, CmpiObjectPath(path("Vexlan_Unknown")));
    EXPECT_EQ(st.rc(), CMPI_RC_OK);
    EXPECT_TRUE(fake::resultItems(unknown).empty());
    EXPECT_TRUE(fake::resultDone(unknown));
    EXPECT_EQ(countLog("Entering Vexlan_CNA_Provider enumInstanceNames: classname = Vexlan_Unknown"), 1);
    EXPECT_EQ(countLog("Exiting  Vexlan_CNA_Provider enumInstanceNames"), 1);

    // A module's NOT_FOUND ends the request with that status, after returnDone.
    CMPIObjectPath* miss = path("Vexlan_Adapter_ComputerSystem");
    CMPIValue name;
    name.string = fake::broker()->eft->newString(fake::broker(), "elsewhere", nullptr);
    miss->ft->addKey(miss, "Name", &name, CMPI_string);
    CMPIResult* missed = fake::newResult();
    CmpiResult missedResult(missed);
    st = provider_->getInstance(context_, missedResult, CmpiObjectPath(miss), nullptr);
    EXPECT_EQ(st.rc(), CMPI_RC_ERR_NOT_FOUND);
    ASSERT_NE(st.msg(), nullptr);
    EXPECT_STREQ(st.msg(), "elsewhere");
    EXPECT_TRUE(fake::resultDone(missed));
}

TEST_F(ProviderObject, InvokeMethodWaitsAtMostTenSecondsForTheFirstBuild)
{
    CMPIResult* result = fake::newResult();
    CmpiResult rslt(result);
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CmpiArgs in(fake::broker()->eft->newArgs(fake::broker(), &rc));
    CmpiArgs out(fake::broker()->eft->newArgs(fake::broker(), &rc));
    auto start = std::chrono::steady_clock::now();
    CmpiStatus st = provider_->invokeMethod(context_, rslt, CmpiObjectPath(path("Vexlan_Adapter_ComputerSystem")),
                                            "AnyMethod", in, out);
    auto waited = std::chrono::steady_clock::now() - start;
    EXPECT_EQ(st.rc(), CMPI_RC_OK);
    EXPECT_TRUE(fake::resultDone(result));
    EXPECT_GE(waited, std::chrono::seconds(9));
    EXPECT_LT(waited, std::chrono::seconds(15));
    EXPECT_EQ(countLog("invokeMethod is waiting for the provider to initialize..."), 5);
}

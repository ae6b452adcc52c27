// The subscription gate of the provider object on its own, against a small
// in-process broker: what no CIM server does but a provider must survive (a
// deactivation without activation), and enableIndications waiting for the
// end of the first build.
#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <memory>
#include <thread>

#include "fake_broker.h"
#include "provider/Vexlan_CNA_Provider_CMPI.h"
#include "provider_env.h"
#include "zorap_sim_control.h"

using namespace provtest;

namespace {

class Gate : public ::testing::Test {
protected:
    void SetUp() override
    {
        writeSettings(kLogsOn, "");
        removeLog();
        fake::reset();
        broker_ = std::make_unique<CmpiBroker>(fake::broker());
        context_ = CmpiContext(fake::newContext());
        provider_ = std::make_unique<Vexlan_CNA_Provider>(*broker_, context_);
    }
    void TearDown() override { provider_.reset(); }

    void activate() { provider_->activateFilter(context_, select_, "C", path_, 1); }
    void deactivate() { provider_->deActivateFilter(context_, select_, "C", path_, 1); }
    static bool on() { return IndicationGate::m_bIndicationEnabled; }
    static int count() { return IndicationGate::m_numSubscriptions; }

    std::unique_ptr<CmpiBroker> broker_;
    CmpiContext context_;
    std::unique_ptr<Vexlan_CNA_Provider> provider_;
    CmpiSelectExp select_{static_cast<const CMPISelectExp*>(nullptr)};
    CmpiObjectPath path_{static_cast<const CMPIObjectPath*>(nullptr)};
};

}  // namespace

TEST_F(Gate, OnlyACountOfExactlyZeroClosesIt)
{
    EXPECT_FALSE(on());
    deactivate();   // nothing was active
    EXPECT_EQ(count(), -1);
    EXPECT_FALSE(on());
    activate();
    EXPECT_EQ(count(), 0);
    EXPECT_TRUE(on());
    deactivate();
    EXPECT_EQ(count(), -1);
    EXPECT_TRUE(on()) << "the count went past 0, so the switch stays";
    // Both lines tell the count before the decrement: 0 each time.
    EXPECT_EQ(countLog("Number of subscriptions still available is: 0"), 2);
    EXPECT_EQ(countLog("Number of subscriptions is: 0"), 1);
    provider_->disableIndications();
    EXPECT_FALSE(on());
    EXPECT_EQ(count(), -1) << "disableIndications leaves the count";
    EXPECT_EQ(countLog("disableIndications:Indications disabled"), 1);
}

TEST_F(Gate, EnableIndicationsWaitsWhileTheFirstBuildHoldsItsMutex)
{
    std::atomic<bool> returned{false};
    pthread_mutex_lock(&ProviderLocks::linux_enable_indications_mutex);
    std::thread caller([&] {
        provider_->enableIndications();
        returned = true;
    });
    std::this_thread::sleep_for(std::chrono::milliseconds(100));
    EXPECT_FALSE(returned.load());
    EXPECT_FALSE(on());
    pthread_mutex_unlock(&ProviderLocks::linux_enable_indications_mutex);
    caller.join();
    EXPECT_TRUE(on());
    EXPECT_EQ(countLog("enableIndications: Indication enabled"), 1);
}

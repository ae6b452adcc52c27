// Every function of the adapter library made to fail in turn: during each
// request kind, during the first build (and the unload after it) and during
// a rebuild. The provider must answer every request with success (or
// NOT_FOUND for an instance that is not there), start no second thread,
// leave no thread and no block of the library behind at the unload, and come
// back to the full lists once the library works again. A function that a
// phase never calls can't fail in it and is passed over.
//
// The short run (make test) fails each function during the requests; the
// long run adds the first builds and the rebuilds.
#include <gtest/gtest.h>

#include <array>
#include <chrono>
#include <functional>
#include <string>
#include <thread>
#include <vector>

#include "reliability_env.h"
#include "zorap_cna.h"
#include "zorap_sim_control.h"

using namespace provtest;
using namespace reltest;
using cimhost::Host;
using std::chrono::milliseconds;
using std::chrono::seconds;

namespace {

const char kFile[] = "adapters.json";
const char kStatusClass[] = "VexlanCNA_AlertIndication_AdapterStatusChange";

// How a function fails: at every call until cleared, or at its second call
// from now only (a failure in the middle of a walk).
struct Mode {
    const char* name;
    unsigned long callNumber;
    int times;
};
const Mode kModes[] = {{"every call", 1, -1}, {"the second call", 2, 1}};

using CallCounts = std::array<unsigned long, ZORAP_FN_COUNT>;

CallCounts callCounts()
{
    CallCounts c{};
    for (int fn = 0; fn < ZORAP_FN_COUNT; ++fn)
        c[fn] = zorap_sim_call_count(fn);
    return c;
}

// The functions that `step` calls.
std::array<bool, ZORAP_FN_COUNT> calledBy(const std::function<void()>& step)
{
    const CallCounts before = callCounts();
    step();
    const CallCounts after = callCounts();
    std::array<bool, ZORAP_FN_COUNT> called{};
    for (int fn = 0; fn < ZORAP_FN_COUNT; ++fn)
        called[fn] = after[fn] > before[fn];
    return called;
}

std::string caseName(int fn, const Mode& mode)
{
    return std::string(zorap_sim_function_name(fn)) + " failing at " + mode.name;
}

bool settled()
{
    const unsigned long start = zorap_sim_call_count(ZORAP_FN_DidConfigChange);
    const auto until = std::chrono::steady_clock::now() + seconds(60);
    while (zorap_sim_call_count(ZORAP_FN_DidConfigChange) < start + 2) {
        if (std::chrono::steady_clock::now() > until)
            return false;
        std::this_thread::sleep_for(milliseconds(50));
    }
    return true;
}

// Every request kind over every class, an alarm with a subscription and a
// flash job; every problem is a test failure named after the case.
void everyRequest(Host& host, const Classes& classes, const std::string& name)
{
    std::vector<std::string> problems;
    for (const std::string& cls : classes.instances)
        requestEveryKind(host, cls, false, problems);
    for (const std::string& cls : classes.associations)
        requestEveryKind(host, cls, true, problems);
    int filter = 0;
    if (host.activateFilter(std::string("SELECT * FROM ") + kStatusClass, kNamespace, filter).ok()) {
        zorap_sim_set_fc_port_state(kFcPort, ZORAP_PORT_STATE_LOOPDOWN);
        zorap_sim_raise_alarm(0, 0, "port 0 state changed");
        zorap_sim_set_fc_port_state(kFcPort, ZORAP_PORT_STATE_ONLINE);
        zorap_sim_raise_alarm(0, 0, "port 0 state changed");
        EXPECT_EQ(0, zorap_sim_wait_alarms_idle(30000)) << name;
        EXPECT_TRUE(host.deactivateFilter(filter).ok()) << name;
    } else {
        ADD_FAILURE() << name << ": activateFilter failed";
    }
    // A write that fails: a successful one would change the configuration
    // and make the next poll rebuild, with or without a failing library.
    const Job job = startFlashJob(host, false, 10, 9);
    if (job.value == 4096) {
        const std::uint64_t state = waitJobEnd(host, job);
        EXPECT_EQ(state, 10u) << name << ": job state";
    } else {
        EXPECT_EQ(job.value, 2u) << name << ": InstallFromURI";
    }
    for (const std::string& p : problems)
        ADD_FAILURE() << name << ": " << p;
}

class FaultTable : public ::testing::Test {
protected:
    void SetUp() override
    {
        writeSettings(kLogsOn, "LinkStatusPollIntervalSeconds=0\n");
        removeLog();
        configA_ = defaultDescription();
        configB_ = withoutLastAdapter(configA_);
        replaceFile(kFile, configA_);
        ASSERT_EQ(0, zorap_sim_load_file(kFile));
        zorap_sim_reset();
    }
    void TearDown() override
    {
        zorap_sim_reset();
        zorap_sim_load_default();
    }
    // A life of the provider up to its first build.
    static void start(Host& host)
    {
        prepareHost(host);
        host.enumerateInstanceNames(classPath("Vexlan_Adapter_ComputerSystem"));
    }
    std::string configA_, configB_;
};

}  // namespace

TEST_F(FaultTable, EachFunctionFailingDuringEachRequestKind)
{
    Host host;
    start(host);
    const Classes classes = providerClasses(host);
    ASSERT_TRUE(settled());
    const Counts healthy = countAll(host, classes);
    const auto called = calledBy([&] { everyRequest(host, classes, "without a failure"); });
    int cases = 0;
    for (int fn = 0; fn < ZORAP_FN_COUNT; ++fn) {
        if (!called[fn])
            continue;
        for (const Mode& mode : kModes) {
            const std::string name = caseName(fn, mode);
            ASSERT_EQ(0, zorap_sim_fail_call(fn, ZORAP_ERR_FAILED, mode.callNumber, mode.times));
            everyRequest(host, classes, name);
            zorap_sim_fail(fn, 0, 0);
            ++cases;
            // An alarm that the library answers again rebuilds what the
            // failing one left out.
            everyRequest(host, classes, name + ", then working");
            for (const std::string& d : countDifferences(countAll(host, classes), healthy))
                ADD_FAILURE() << name << ", then working: " << d;
        }
    }
    EXPECT_GE(cases, 8);
    ASSERT_TRUE(host.unload(true).ok());
    EXPECT_EQ(zorap_sim_outstanding_allocations(), 0u);
}

TEST_F(FaultTable, EachFunctionFailingDuringTheFirstBuildAndTheUnload)
{
    if (!fullRun())
        GTEST_SKIP() << "long run only (VEXLAN_RELIABILITY_FULL=1)";
    const int threadsBefore = threadCount();
    Classes classes;
    Counts healthy;
    const auto called = calledBy([&] {
        Host host;
        start(host);
        classes = providerClasses(host);
        healthy = countAll(host, classes);
        ASSERT_TRUE(host.unload(true).ok());
    });
    for (int fn = 0; fn < ZORAP_FN_COUNT; ++fn) {
        if (!called[fn])
            continue;
        for (const Mode& mode : kModes) {
            const std::string name = caseName(fn, mode);
            ASSERT_EQ(0, zorap_sim_fail_call(fn, ZORAP_ERR_FAILED, mode.callNumber, mode.times));
            {
                Host host;
                start(host);
                everyRequest(host, classes, name);
                EXPECT_TRUE(host.unload(true).ok()) << name;
            }
            zorap_sim_fail(fn, 0, 0);
            // A failed shutdown leaves the library's own alarm thread; the
            // library is shut down here, as the next provider life expects.
            if (fn == ZORAP_FN_Uninitialize)
                ZORAP_Uninitialize();
            EXPECT_EQ(threadCount(), threadsBefore) << name;
            EXPECT_EQ(zorap_sim_outstanding_allocations(), 0u) << name;
        }
    }
    // A life with a working library has every instance again.
    Host host;
    start(host);
    for (const std::string& d : countDifferences(countAll(host, classes), healthy))
        ADD_FAILURE() << "after the failures: " << d;
}

TEST_F(FaultTable, EachFunctionFailingDuringARebuild)
{
    if (!fullRun())
        GTEST_SKIP() << "long run only (VEXLAN_RELIABILITY_FULL=1)";
    Host host;
    start(host);
    const Classes classes = providerClasses(host);
    ASSERT_TRUE(settled());
    const Counts countsA = countAll(host, classes);
    bool useB = true;
    Counts countsB;
    const auto called = calledBy([&] {
        replaceFile(kFile, configB_);
        ASSERT_TRUE(settled());
        countsB = countAll(host, classes);
    });
    for (int fn = 0; fn < ZORAP_FN_COUNT; ++fn) {
        if (!called[fn])
            continue;
        const Mode& mode = kModes[0];
        const std::string name = caseName(fn, mode) + " in a rebuild";
        useB = !useB;
        ASSERT_EQ(0, zorap_sim_fail_call(fn, ZORAP_ERR_FAILED, mode.callNumber, mode.times));
        replaceFile(kFile, useB ? configB_ : configA_);
        ASSERT_TRUE(settled()) << name;
        everyRequest(host, classes, name);
        zorap_sim_fail(fn, 0, 0);
        // The next rebuild with a working library gives the full lists.
        useB = !useB;
        replaceFile(kFile, useB ? configB_ : configA_);
        ASSERT_TRUE(settled()) << name;
        for (const std::string& d : countDifferences(countAll(host, classes), useB ? countsB : countsA))
            ADD_FAILURE() << name << ", then working: " << d;
    }
    ASSERT_TRUE(host.unload(true).ok());
    EXPECT_EQ(zorap_sim_outstanding_allocations(), 0u);
}

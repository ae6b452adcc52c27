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
#include <cstdio>
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

// Log lines of a build, a poll or a request that an exception ended.
int exceptionLines()
{
    return countLog("detected an exception") + countLog("detected an unknown exception");
}

// Names the functions that a phase made fail, for the test's output.
void printCovered(const char* phase, const std::vector<int>& functions)
{
    std::string names;
    for (int fn : functions)
        names += std::string(names.empty() ? "" : " ") + zorap_sim_function_name(fn);
    std::printf("%s: %zu functions failed in turn: %s\n", phase, functions.size(), names.c_str());
}

std::string caseName(int fn, const Mode& mode)
{
    return std::string(zorap_sim_function_name(fn)) + " failing at " + mode.name;
}

// One request-time step: every request kind on one class, an alarm with a
// subscription, or a flash job. Problems are added to the list.
struct Step {
    std::string name;
    std::function<void(Host&, std::vector<std::string>&)> run;
};

void alarmStep(Host& host, std::vector<std::string>& problems)
{
    int filter = 0;
    if (!host.activateFilter(std::string("SELECT * FROM ") + kStatusClass, kNamespace, filter).ok()) {
        problems.push_back("activateFilter failed");
        return;
    }
    zorap_sim_set_fc_port_state(kFcPort, ZORAP_PORT_STATE_LOOPDOWN);
    zorap_sim_raise_alarm(0, 0, "port 0 state changed");
    zorap_sim_set_fc_port_state(kFcPort, ZORAP_PORT_STATE_ONLINE);
    zorap_sim_raise_alarm(0, 0, "port 0 state changed");
    if (zorap_sim_wait_alarms_idle(30000) != 0)
        problems.push_back("alarms not delivered within 30 s");
    if (!host.deactivateFilter(filter).ok())
        problems.push_back("deactivateFilter failed");
}

// A flash job of the FC HBA (ZORAP_doOptionROMUpdate) or of the CNA's NIC
// functions (ZORAP_UpdateFlash).
void flashStep(Host& host, bool nic, std::vector<std::string>& problems)
{
    // A write that fails: a successful one would change the configuration
    // and make the next poll rebuild, with or without a failing library.
    const Job job = startFlashJob(host, nic, 10, 9);
    if (job.value == 4096) {
        const std::uint64_t state = waitJobEnd(host, job);
        if (state != 10)
            problems.push_back("flash job ended in state " + std::to_string(state));
    } else if (job.value != 2) {
        problems.push_back("InstallFromURI gave " + std::to_string(job.value));
    }
}

std::vector<Step> requestSteps(const Classes& classes)
{
    std::vector<Step> steps;
    for (const auto* list : {&classes.instances, &classes.associations}) {
        const bool association = list == &classes.associations;
        for (const std::string& cls : *list)
            steps.push_back({cls, [cls, association](Host& host, std::vector<std::string>& problems) {
                                 requestEveryKind(host, cls, association, problems);
                             }});
    }
    steps.push_back({"alarm", alarmStep});
    for (bool nic : {false, true})
        steps.push_back({nic ? "NIC flash job" : "FC flash job",
                         [nic](Host& host, std::vector<std::string>& problems) { flashStep(host, nic, problems); }});
    return steps;
}

void runSteps(Host& host, const std::vector<Step>& steps, const std::string& name)
{
    std::vector<std::string> problems;
    for (const Step& step : steps)
        step.run(host, problems);
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
    ASSERT_TRUE(pollsSettled());
    const Counts healthy = countAll(host, classes);
    // Which steps call which function, with a working library.
    const std::vector<Step> steps = requestSteps(classes);
    std::vector<std::array<bool, ZORAP_FN_COUNT>> calls;
    for (const Step& step : steps)
        calls.push_back(calledBy([&] { runSteps(host, {step}, "without a failure"); }));
    std::vector<int> covered;
    for (int fn = 0; fn < ZORAP_FN_COUNT; ++fn) {
        std::vector<Step> callers;
        for (std::size_t i = 0; i < steps.size(); ++i)
            if (calls[i][fn])
                callers.push_back(steps[i]);
        if (callers.empty())
            continue;
        covered.push_back(fn);
        for (const Mode& mode : kModes) {
            const std::string name = caseName(fn, mode);
            const int exceptions = exceptionLines();
            ASSERT_EQ(0, zorap_sim_fail_call(fn, ZORAP_ERR_FAILED, mode.callNumber, mode.times));
            runSteps(host, callers, name);
            zorap_sim_fail(fn, 0, 0);
            EXPECT_EQ(exceptionLines(), exceptions) << name;
            // The same requests (and an alarm, which rebuilds the FC port
            // list) with the library working again give every list in full.
            callers.push_back({"alarm", alarmStep});
            runSteps(host, callers, name + ", then working");
            callers.pop_back();
            for (const std::string& d : countDifferences(countAll(host, classes), healthy))
                ADD_FAILURE() << name << ", then working: " << d;
        }
    }
    printCovered("requests", covered);
    EXPECT_GE(covered.size(), 4u);
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
    std::vector<int> covered;
    for (int fn = 0; fn < ZORAP_FN_COUNT; ++fn) {
        if (!called[fn])
            continue;
        covered.push_back(fn);
        for (const Mode& mode : kModes) {
            const std::string name = caseName(fn, mode);
            ASSERT_EQ(0, zorap_sim_fail_call(fn, ZORAP_ERR_FAILED, mode.callNumber, mode.times));
            {
                removeLog();
                Host host;
                start(host);
                runSteps(host, requestSteps(classes), name);
                EXPECT_TRUE(host.unload(true).ok()) << name;
                EXPECT_EQ(exceptionLines(), 0) << name;
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
    printCovered("first build and unload", covered);
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
    ASSERT_TRUE(pollsSettled());
    const Counts countsA = countAll(host, classes);
    bool useB = true;
    Counts countsB;
    const auto called = calledBy([&] {
        replaceFile(kFile, configB_);
        ASSERT_TRUE(pollsSettled());
        countsB = countAll(host, classes);
    });
    std::vector<int> covered;
    for (int fn = 0; fn < ZORAP_FN_COUNT; ++fn) {
        if (!called[fn])
            continue;
        covered.push_back(fn);
        const Mode& mode = kModes[0];
        const std::string name = caseName(fn, mode) + " in a rebuild";
        useB = !useB;
        const int exceptions = exceptionLines();
        ASSERT_EQ(0, zorap_sim_fail_call(fn, ZORAP_ERR_FAILED, mode.callNumber, mode.times));
        replaceFile(kFile, useB ? configB_ : configA_);
        ASSERT_TRUE(pollsSettled()) << name;
        runSteps(host, requestSteps(classes), name);
        zorap_sim_fail(fn, 0, 0);
        EXPECT_EQ(exceptionLines(), exceptions) << name;
        // The next rebuild with a working library gives the full lists.
        useB = !useB;
        replaceFile(kFile, useB ? configB_ : configA_);
        ASSERT_TRUE(pollsSettled()) << name;
        for (const std::string& d : countDifferences(countAll(host, classes), useB ? countsB : countsA))
            ADD_FAILURE() << name << ", then working: " << d;
    }
    printCovered("rebuild", covered);
    ASSERT_TRUE(host.unload(true).ok());
    EXPECT_EQ(zorap_sim_outstanding_allocations(), 0u);
}

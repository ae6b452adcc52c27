// Unload and reload in one process, as a CIM server does when it stops an
// idle provider and starts it again: each cycle loads the provider, builds,
// subscribes, starts a flash job and unloads while requests still arrive.
// No thread of the provider may outlive an unload, and the process's file
// descriptors and heap must come back to their level after the first cycle.
// 100 cycles per flavour in the long run, 3 otherwise.
#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <cstdio>
#include <string>
#include <thread>
#include <vector>

#include "reliability_env.h"
#include "zorap_sim_control.h"

using namespace provtest;
using namespace reltest;
using cimhost::Flavour;
using cimhost::Host;

namespace {

// Heap that a cycle may leave over the first one's level: the host's own
// records (its log lines, its counters' event list) grow a little per cycle.
constexpr std::size_t kHeapSlack = 1024 * 1024;

class ReloadCycles : public ::testing::TestWithParam<Flavour> {};

}  // namespace

TEST_P(ReloadCycles, UnloadsWithRequestsASubscriptionAndAJobInFlightLeaveNothingBehind)
{
    writeSettings(kLogsOn, "LinkStatusPollIntervalSeconds=0\n");
    removeLog();
    ASSERT_EQ(0, zorap_sim_load_default());
    zorap_sim_reset();
    const int cycles = fullRun() ? 100 : 3;
    const int threadsBefore = threadCount();
    Host host;
    prepareHost(host, GetParam());
    const Classes classes = providerClasses(host);
    ASSERT_FALSE(classes.associations.empty());
    int writesInFlight = 0;
    int fdsAfterFirst = 0;
    std::size_t heapAfterFirst = 0;
    for (int cycle = 0; cycle < cycles; ++cycle) {
        if (cycle > 0) {
            ASSERT_TRUE(host.load(PROVIDER_LIBRARY, kProviderName).ok()) << "cycle " << cycle;
        }
        ASSERT_TRUE(host.enumerateInstanceNames(classPath("Vexlan_Adapter_ComputerSystem")).ok()) << cycle;
        int filter = 0;
        ASSERT_TRUE(host.activateFilter("SELECT * FROM VexlanCNA_AlertIndication_AdapterStatusChange", kNamespace,
                                        filter)
                        .ok())
            << cycle;
        const Job job = startFlashJob(host, false, 500);
        ASSERT_EQ(job.value, 4096u) << cycle;
        // The job's worker starts the write on its own; on a loaded machine
        // the write may be over before this thread looks, and the cycle goes
        // on without it.
        if (zorap_sim_wait_flash_writes(1, 30000) == 0)
            ++writesInFlight;
        else
            EXPECT_NE(jobState(host, job), 4u) << "a running job without a write, cycle " << cycle;

        // Requests keep coming during the unload; those that come after it
        // are refused by the host, none may crash.
        std::atomic<bool> stop{false};
        std::atomic<int> answered{0};
        std::vector<std::thread> clients;
        for (const char* cls : {"Vexlan_FCHBA_FCPort", "Vexlan_FCHBA_PortController"}) {
            clients.emplace_back([&, cls] {
                std::vector<std::string> ignored;
                while (!stop) {
                    if (host.enumerateInstances(classPath(cls)).ok())
                        ++answered;
                    requestEveryKind(host, classes.associations.front(), true, ignored);
                }
            });
        }
        const auto until = std::chrono::steady_clock::now() + std::chrono::seconds(60);
        while (answered == 0 && std::chrono::steady_clock::now() < until)
            std::this_thread::sleep_for(std::chrono::milliseconds(5));
        zorap_sim_raise_alarm(0, 0, "port 0 state changed");
        const bool unloaded = host.unload(true).ok();
        stop = true;
        for (auto& t : clients)
            t.join();
        ASSERT_TRUE(unloaded) << cycle;
        EXPECT_GT(answered.load(), 0) << cycle;
        host.deactivateFilter(filter);

        EXPECT_EQ(zorap_sim_flash_writes_running(), 0u) << cycle;
        ASSERT_EQ(threadCount(), threadsBefore) << "a thread outlived unload " << cycle;
        EXPECT_EQ(zorap_sim_outstanding_allocations(), 0u) << cycle;
        if (cycle == 0) {
            fdsAfterFirst = openFileCount();
            heapAfterFirst = heapInUse();
        } else {
            ASSERT_EQ(openFileCount(), fdsAfterFirst) << "cycle " << cycle;
            ASSERT_LE(heapInUse(), heapAfterFirst + kHeapSlack) << "cycle " << cycle;
        }
    }
    EXPECT_EQ(host.counters().loads, cycles);
    std::printf("%s: %d cycles, %d with the flash write in flight at the unload\n",
                cimhost::flavourName(GetParam()), cycles, writesInFlight);
    EXPECT_GT(writesInFlight, 0);
}

INSTANTIATE_TEST_SUITE_P(Flavours, ReloadCycles, ::testing::Values(Flavour::Pegasus, Flavour::Sfcb),
                         [](const ::testing::TestParamInfo<Flavour>& flavour) {
                             return std::string(cimhost::flavourName(flavour.param));
                         });

// Everything the provider does at once, for the thread checker: eight request
// threads over every class and association, the polling thread rebuilding
// from a description file rewritten underneath it, alarms from the library's
// thread every few milliseconds, link changes, subscriptions switched on and
// off and flash jobs. At quiet points the instance counts must be those of
// the description in use; every indication must come from a known thread
// with its own identifier. 30 s in the long run, a few seconds otherwise.
#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstdio>
#include <mutex>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "reliability_env.h"
#include "zorap_cna.h"
#include "zorap_sim_control.h"

using namespace provtest;
using namespace reltest;
using cimhost::Host;
using cimhost::Indication;
using std::chrono::milliseconds;
using std::chrono::seconds;

namespace {

const char kFile[] = "adapters.json";
const char* const kAlertClasses[] = {"VexlanCNA_AlertIndication_AdapterStatusChange",
                                     "Vexlan_NIC_IndicationEthernetPortLinkUp",
                                     "Vexlan_NIC_IndicationEthernetPortLinkDown"};

// Holds the threads that change things at a quiet point, and lets them go.
class Pauser {
public:
    explicit Pauser(int threads) : threads_(threads) {}
    // Called by a changing thread between two changes.
    void checkpoint()
    {
        std::unique_lock<std::mutex> l(mu_);
        if (!paused_)
            return;
        ++parked_;
        cv_.notify_all();
        cv_.wait(l, [&] { return !paused_; });
        --parked_;
    }
    bool pause()
    {
        std::unique_lock<std::mutex> l(mu_);
        paused_ = true;
        return cv_.wait_for(l, seconds(60), [&] { return parked_ == threads_; });
    }
    void resume()
    {
        std::lock_guard<std::mutex> l(mu_);
        paused_ = false;
        cv_.notify_all();
    }

private:
    std::mutex mu_;
    std::condition_variable cv_;
    bool paused_ = false;
    int parked_ = 0;
    const int threads_;
};

}  // namespace

TEST(Stress, EveryRequestBesideRebuildsAlarmsLinksSubscriptionsAndJobsThenACleanStop)
{
    writeSettings(kLogsOn, "LinkStatusPollIntervalSeconds=0\n");
    removeLog();
    const std::string configA = defaultDescription();
    const std::string configB = withoutLastAdapter(configA);
    ASSERT_NE(configA, configB);
    replaceFile(kFile, configA);
    ASSERT_EQ(0, zorap_sim_load_file(kFile));
    zorap_sim_reset();

    Host host;
    prepareHost(host);
    ASSERT_TRUE(host.enumerateInstanceNames(classPath("Vexlan_Adapter_ComputerSystem")).ok());
    const Classes classes = providerClasses(host);
    ASSERT_GT(classes.associations.size(), 40u);

    // The counts of both configurations, taken while nothing else runs.
    ASSERT_TRUE(pollsSettled());
    const Counts countsA = countAll(host, classes);
    replaceFile(kFile, configB);
    ASSERT_TRUE(pollsSettled());
    const Counts countsB = countAll(host, classes);
    // Configuration B lacks the single-port FC HBA: one adapter, one port.
    EXPECT_EQ(countsA.at("Vexlan_FCHBA_FCPort"), countsB.at("Vexlan_FCHBA_FCPort") + 1);
    EXPECT_EQ(countsA.at("Vexlan_Adapter_PhysicalPackage"), countsB.at("Vexlan_Adapter_PhysicalPackage") + 1);
    EXPECT_EQ(countsA.at("Vexlan_Adapter_ComputerSystem"), 1u);
    EXPECT_EQ(countsA.at("Vexlan_NIC_EthernetPort2"), countsB.at("Vexlan_NIC_EthernetPort2"));

    const seconds runTime = fullRun() ? seconds(30) : seconds(4);
    const seconds quietEvery = fullRun() ? seconds(10) : runTime;
    std::atomic<bool> stop{false};
    std::atomic<bool> useB{true};
    std::atomic<int> jobsStarted{0};
    std::mutex problemsMu;
    std::vector<std::string> problems;
    auto problem = [&](const std::string& text) {
        std::lock_guard<std::mutex> l(problemsMu);
        if (problems.size() < 50)
            problems.push_back(text);
    };
    Pauser pauser(4);
    std::vector<std::thread> threads;

    // The library's alarms every few milliseconds, for a port that keeps
    // changing state, a device the list can't name, and a link that flaps.
    threads.emplace_back([&] {
        for (unsigned n = 0; !stop; ++n) {
            pauser.checkpoint();
            zorap_sim_set_fc_port_state(kFcPort, n % 2 ? ZORAP_PORT_STATE_LOOPDOWN : ZORAP_PORT_STATE_ONLINE);
            zorap_sim_raise_alarm(n % 3 == 2 ? 65536 : n % 3, 0, "storm");
            if (n % 16 == 0)
                zorap_sim_set_link_state(kInterface, n % 32 ? ZORAP_LINK_DOWN : ZORAP_LINK_UP);
            std::this_thread::sleep_for(milliseconds(3));
        }
    });
    // The description file rewritten: live state every 100 ms, the
    // configuration every second, so that the polling thread rebuilds.
    threads.emplace_back([&] {
        for (unsigned n = 1; !stop; ++n) {
            pauser.checkpoint();
            if (n % 10 == 0)
                useB = !useB;
            replaceFile(kFile, withLiveState(useB ? configB : configA, n % 2, n % 3 != 0));
            std::this_thread::sleep_for(milliseconds(100));
        }
    });
    // Subscriptions to each alert switched on and off.
    threads.emplace_back([&] {
        for (unsigned n = 0; !stop; ++n) {
            pauser.checkpoint();
            int id = 0;
            if (!host.activateFilter(std::string("SELECT * FROM ") + kAlertClasses[n % 3], kNamespace, id).ok()) {
                problem("activateFilter failed");
                continue;
            }
            std::this_thread::sleep_for(milliseconds(20));
            if (!host.deactivateFilter(id).ok())
                problem("deactivateFilter failed");
        }
    });
    // Flash jobs of the FC HBA, one after the other, each to its end.
    threads.emplace_back([&] {
        while (!stop) {
            pauser.checkpoint();
            const Job job = startFlashJob(host, false, 50);
            if (job.value != 4096) {
                problem("flash job not started: " + std::to_string(job.value));
                continue;
            }
            ++jobsStarted;
            const std::uint64_t state = waitJobEnd(host, job);
            if (state != 7)
                problem("flash job ended in state " + std::to_string(state));
        }
    });
    // Every indication from a known thread, whole, with its own identifier.
    std::set<std::string> identifiers;
    std::atomic<int> indications{0};
    std::atomic<bool> stopReading{false};
    std::thread reader([&] {
        Indication ind;
        while (!stopReading) {
            if (!host.waitIndication(ind, milliseconds(100)))
                continue;
            ++indications;
            if (!ind.error.empty())
                problem("indication: " + ind.error);
            bool known = false;
            for (const char* cls : kAlertClasses)
                known = known || ind.instance.className() == cls;
            if (!known)
                problem("indication of class " + ind.instance.className());
            if (!identifiers.insert(propertyText(ind.instance, "IndicationIdentifier")).second)
                problem("indication identifier twice: " + propertyText(ind.instance, "IndicationIdentifier"));
        }
    });
    // Eight request threads, each over every class and association.
    std::atomic<long> requests{0};
    for (int t = 0; t < 8; ++t) {
        threads.emplace_back([&, t] {
            std::vector<std::string> mine;
            const std::size_t all = classes.instances.size() + classes.associations.size();
            for (std::size_t n = static_cast<std::size_t>(t) * 7; !stop; ++n) {
                const std::size_t i = n % all;
                const bool association = i >= classes.instances.size();
                const std::string& cls =
                    association ? classes.associations[i - classes.instances.size()] : classes.instances[i];
                requests += requestEveryKind(host, cls, association, mine);
            }
            for (const std::string& p : mine)
                problem(p);
        });
    }

    // Quiet points: the changing threads wait, the description is written
    // whole in its last configuration, and once the polls have settled the
    // counts are those of that configuration.
    const auto end = std::chrono::steady_clock::now() + runTime;
    int quietPoints = 0;
    while (std::chrono::steady_clock::now() < end) {
        std::this_thread::sleep_until(std::min(end, std::chrono::steady_clock::now() + quietEvery));
        bool settled = pauser.pause();
        const bool b = useB;
        if (settled) {
            replaceFile(kFile, b ? configB : configA);
            settled = pollsSettled();
        }
        if (!settled) {
            ADD_FAILURE() << "no quiet point within 60 s";
            pauser.resume();
            break;
        }
        const Counts counts = countAll(host, classes);
        for (const std::string& d : countDifferences(counts, b ? countsB : countsA))
            ADD_FAILURE() << "quiet point " << quietPoints << " (configuration " << (b ? "B" : "A") << "): " << d;
        EXPECT_EQ(host.enumerateInstanceNames(classPath("Vexlan_Adapter_ConcreteJob")).paths.size(),
                  static_cast<std::size_t>(jobsStarted.load()));
        ++quietPoints;
        pauser.resume();
    }
    stop = true;
    pauser.resume();
    for (auto& t : threads)
        t.join();
    // On a heavily loaded machine every 20-ms subscription of the storm may
    // miss the alarms; the alert path must then still deliver once it is over.
    if (indications == 0) {
        int settledId = 0;
        if (host.activateFilter(std::string("SELECT * FROM ") + kAlertClasses[0], kNamespace, settledId).ok()) {
            for (int tries = 0; tries < 50 && indications == 0; ++tries) {
                zorap_sim_set_fc_port_state(kFcPort, tries % 2 ? ZORAP_PORT_STATE_LOOPDOWN : ZORAP_PORT_STATE_ONLINE);
                zorap_sim_raise_alarm(0, 0, "after the storm");
                std::this_thread::sleep_for(milliseconds(100));
            }
            EXPECT_TRUE(host.deactivateFilter(settledId).ok());
        }
    }
    stopReading = true;
    reader.join();

    for (const std::string& p : problems)
        ADD_FAILURE() << p;
    std::printf("stress: %d s, %ld requests, %d quiet points, %d jobs, %lu rebuilds, %d indications\n",
                static_cast<int>(runTime.count()), requests.load(), quietPoints, jobsStarted.load(),
                zorap_sim_call_count(ZORAP_FN_SwapBackupToMainAdapterList), indications.load());
    EXPECT_GE(quietPoints, 1);
    EXPECT_GT(requests.load(), 100);
    EXPECT_GE(jobsStarted.load(), 1);
    EXPECT_GE(zorap_sim_call_count(ZORAP_FN_SwapBackupToMainAdapterList), 2u);
    EXPECT_GE(indications.load(), 1);
    EXPECT_EQ(host.counters().indicationsFromUnattachedThreads, 0);

    // Alarms go on during the stop; nothing is delivered after cleanup, and
    // the callback is gone before the library shuts down.
    std::atomic<bool> lateStop{false};
    std::thread late([&] {
        while (!lateStop)
            zorap_sim_raise_alarm(0, 0, "late");
    });
    int id = 0;
    ASSERT_TRUE(host.activateFilter(std::string("SELECT * FROM ") + kAlertClasses[0], kNamespace, id).ok());
    ASSERT_TRUE(host.unload(true).ok());
    const int afterCleanup = host.counters().indicationsDelivered + host.counters().indicationsDropped;
    std::this_thread::sleep_for(milliseconds(100));
    lateStop = true;
    late.join();
    EXPECT_EQ(host.counters().indicationsDelivered + host.counters().indicationsDropped, afterCleanup);
    EXPECT_EQ(-1, zorap_sim_raise_alarm(0, 0, "after cleanup"));
    zorap_sim_load_default();
}

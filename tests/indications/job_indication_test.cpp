// Lifecycle indications of the update jobs through the shipped provider and the
// embedded CIM host, in both flavours: what a successful and a failed job send
// and in which order, nothing without a filter, nothing once cleanup has begun
// (the job still ends), jobs beside filters switched on and off, and the
// command line's subscriptions with the generated sfcb registration.
#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <cstdlib>
#include <memory>
#include <fstream>
#include <mutex>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "cimhost/cli.h"
#include "cimhost/text.h"
#include "provider_env.h"
#include "zorap_cna.h"
#include "zorap_sim_control.h"

using namespace provtest;
using cimhost::Flavour;
using cimhost::Host;
using cimhost::Indication;
using cimhost::Instance;
using cimhost::NamedValue;
using cimhost::ObjectPath;
using cimhost::OpResult;
using cimhost::Type;
using cimhost::Value;
using std::chrono::milliseconds;
using std::chrono::seconds;
using Clock = std::chrono::steady_clock;

namespace {

const char kCreation[] = "CIM_InstCreation";
const char kModification[] = "CIM_InstModification";
const char kImage[] = "/var/tmp/job-image.bin";

struct Side {
    bool nic;
    const char* service;
    const char* controller;
    const char* deviceId;
};
const Side kFC = {false, "Vexlan_FCHBA_SoftwareInstallationService", "Vexlan_FCHBA_PortController", "VXA1631K0042"};
const Side kNIC = {true, "Vexlan_NIC_SoftwareInstallationService", "Vexlan_NIC_PortController", "VXC2447M0193_NIC"};

const char* flavourText(Flavour f)
{
    return f == Flavour::Pegasus ? "pegasus" : "sfcb";
}

void writeImage()
{
    std::ofstream(kImage, std::ios::binary | std::ios::trunc) << std::string(4096, '\x5a');
}

std::string servicePathText(const Side& side)
{
    return std::string(kNamespace) + ":" + side.service +
           ".SystemCreationClassName=\"Vexlan_Adapter_ComputerSystem\",SystemName=\"" + expectedHost().name +
           "\",CreationClassName=\"" + side.service + "\",Name=\"CNA_SW_INSTALLER\"";
}

// InstallFromURI with {5, 32768}; the job's InstanceID, empty when no job started.
std::string startJob(Host& host, const Side& side)
{
    ObjectPath target = classPath(side.controller);
    target.setKey("DeviceID", Value::fromString(side.deviceId));
    const std::vector<NamedValue> in = {
        {"URI", Value::fromString(std::string("file://") + kImage)},
        {"Target", Value::fromRef(target)},
        {"InstallOptions", Value::arrayOf(Type::UInt16, {Value::fromUnsigned(Type::UInt16, 5),
                                                         Value::fromUnsigned(Type::UInt16, 32768)})}};
    const OpResult r = host.invokeMethod(servicePath(side.nic), "InstallFromURI", in);
    EXPECT_TRUE(r.ok()) << cimhost::statusLine(r);
    if (r.data.empty() || r.data[0].u != 4096)
        return std::string();
    for (const NamedValue& a : r.outArgs)
        if (a.first == "Job" && a.second.ref)
            if (const Value* id = a.second.ref->key("InstanceID"))
                return id->s;
    return std::string();
}

OpResult jobInstance(Host& host, const std::string& id)
{
    ObjectPath p = classPath("Vexlan_Adapter_ConcreteJob");
    p.setKey("InstanceID", Value::fromString(id));
    return host.getInstance(p);
}

std::uint64_t waitJobState(Host& host, const std::string& id, std::uint64_t wanted)
{
    ObjectPath p = classPath("Vexlan_Adapter_ConcreteJob");
    p.setKey("InstanceID", Value::fromString(id));
    return provtest::waitJobState(host, p, wanted);
}

int subscribe(Host& host, const char* cls)
{
    int id = 0;
    const cimhost::Status st = host.activateFilter(std::string("SELECT * FROM ") + cls, kNamespace, id);
    EXPECT_TRUE(st.ok()) << st.message;
    return id;
}

int indicationsMade(Host& host)
{
    const cimhost::Counters c = host.counters();
    return c.indicationsDelivered + c.indicationsDropped;
}

const Instance& embedded(const Instance& ind, const char* name)
{
    static const Instance none;
    const Value* v = ind.property(name);
    if (v == nullptr || v->type != Type::Instance || !v->inst) {
        ADD_FAILURE() << name << " is no embedded instance";
        return none;
    }
    return *v->inst;
}

// The indication as MOF text, its embedded jobs with it, kept in
// tests/fixtures/indications/<name>.mof: identifiers, times, the job's key
// and name (which holds its start time) and the host's name, which change
// from run to run, stand as @...@ (the test checks them apart). VEXLAN_RECORD_INDICATIONS=<dir> writes the texts.
void stabilize(Instance& inst)
{
    for (auto& p : inst.properties) {
        if (p.first == "IndicationIdentifier" || p.first == "IndicationTime" || p.first == "CorrelatedIndications" ||
            p.first == "TimeOfLastStateChange" || p.first == "Name") {
            p.second = Value::fromString("@" + p.first + "@");
        } else if (p.second.type == Type::Instance && p.second.inst) {
            p.second.inst = std::make_shared<Instance>(*p.second.inst);
            stabilize(*p.second.inst);
        }
    }
}

void expectJobIndicationAsKept(const Indication& ind, const std::string& jobId, const std::string& name)
{
    Instance copy = ind.instance;
    stabilize(copy);
    std::string text = cimhost::formatInstanceMof(copy);
    replaceAll(text, jobId, "@JOB@");
    replaceAll(text, expectedHost().name, "@HOST@");
    expectAsKept(text, std::string(VEXLAN_FIXTURES) + "/indications/" + name + ".mof",
                 std::getenv("VEXLAN_RECORD_INDICATIONS"));
}

std::string modelPath(const std::string& id)
{
    return std::string(kNamespace) + ":Vexlan_Adapter_ConcreteJob.InstanceID=\"" + id + "\"";
}

// ---- One provider per flavour: what a successful and a failed job send -----------

class JobIndications : public ::testing::TestWithParam<Flavour> {
protected:
    void SetUp() override
    {
        writeSettings(kLogsOn, "");
        removeLog();
        zorap_sim_load_default();
        zorap_sim_reset();
        writeImage();
        prepareHost(host_, GetParam());
        ASSERT_TRUE(host_.enumerateInstanceNames(classPath("Vexlan_Adapter_ComputerSystem")).ok());
    }
    Host host_;
};

struct JobCase {
    const Side* side;
    std::uint32_t result;  // the library's answer to the write
    const char* name;      // of the kept texts: <name>-created, <name>-modified
};

TEST_P(JobIndications, EachJobSendsItsCreationThenOneModificationOfItsState)
{
    subscribe(host_, kCreation);
    subscribe(host_, kModification);
    const JobCase cases[] = {
        {&kFC, 0, "job-fc-completed"},
        {&kNIC, 0, "job-nic-completed"},
        {&kFC, ZORAP_ERR_FLASH_FAILED, "job-fc-failed"},
        {&kNIC, ZORAP_ERR_FLASH_FAILED, "job-nic-failed"},
    };
    for (const JobCase& c : cases) {
        SCOPED_TRACE(std::string(c.side->service) + " result " + std::to_string(c.result));
        zorap_sim_set_next_flash(c.result, 600);
        const auto started = Clock::now();
        const std::string id = startJob(host_, *c.side);
        ASSERT_FALSE(id.empty());

        Indication created;
        ASSERT_TRUE(host_.waitIndication(created, seconds(5)));
        EXPECT_LT(Clock::now() - started, milliseconds(500)) << "the creation comes as the job starts";
        const Instance& ci = created.instance;
        EXPECT_TRUE(created.error.empty()) << created.error;
        EXPECT_EQ(ci.path.nameSpace, kNamespace);
        EXPECT_EQ(created.nameSpace, GetParam() == Flavour::Pegasus ? kNamespace : "root/PG_InterOp");
        expectJobIndicationAsKept(created, id, std::string(c.name) + "-created");
        const std::string creationId = propertyText(ci, "IndicationIdentifier");
        EXPECT_EQ(creationId.rfind("Vexlan:", 0), 0u) << creationId;
        EXPECT_FALSE(scalar(ci, "IndicationTime", Type::DateTime).dt.interval);
        EXPECT_EQ(propertyText(ci, "SourceInstanceModelPath"), modelPath(id));

        // While it writes, GetInstance shows what the creation showed.
        const OpResult running = jobInstance(host_, id);
        ASSERT_EQ(running.instances.size(), 1u);
        EXPECT_EQ(cimhost::formatInstanceMof(running.instances[0]),
                  cimhost::formatInstanceMof(embedded(ci, "SourceInstance")));

        Indication modified;
        ASSERT_TRUE(host_.waitIndication(modified, seconds(5)));
        EXPECT_GE(Clock::now() - started, milliseconds(550)) << "the modification comes when the write ends";
        const Instance& mi = modified.instance;
        EXPECT_TRUE(modified.error.empty()) << modified.error;
        expectJobIndicationAsKept(modified, id, std::string(c.name) + "-modified");
        EXPECT_NE(propertyText(mi, "IndicationIdentifier"), creationId);
        ASSERT_NE(mi.property("CorrelatedIndications"), nullptr);
        ASSERT_EQ(mi.property("CorrelatedIndications")->elems.size(), 1u);
        EXPECT_EQ(mi.property("CorrelatedIndications")->elems[0].s, creationId);
        const Instance& now = embedded(mi, "SourceInstance");
        const Instance& before = embedded(mi, "PreviousInstance");
        EXPECT_EQ(cimhost::formatInstanceMof(before), cimhost::formatInstanceMof(embedded(ci, "SourceInstance")));
        EXPECT_GT(now.property("TimeOfLastStateChange")->dt.usec, before.property("TimeOfLastStateChange")->dt.usec);
        EXPECT_GE(scalar(mi, "IndicationTime", Type::DateTime).dt.usec,
                  now.property("TimeOfLastStateChange")->dt.usec);
        EXPECT_EQ(propertyText(mi, "SourceInstanceModelPath"), modelPath(id));

        // The job's instance now is the modification's source, and nothing more comes.
        const OpResult ended = jobInstance(host_, id);
        ASSERT_EQ(ended.instances.size(), 1u);
        EXPECT_EQ(cimhost::formatInstanceMof(ended.instances[0]), cimhost::formatInstanceMof(now));
        Indication extra;
        EXPECT_FALSE(host_.waitIndication(extra, milliseconds(200)));
    }
    EXPECT_EQ(host_.counters().indicationsFromUnattachedThreads, 0);
    EXPECT_EQ(countLog("Error delivering"), 0);
}

TEST_P(JobIndications, WithoutAFilterNothingIsBuiltAndTheJobReportsAsBefore)
{
    // An alert filter opens the gate, and the job's indications are made
    // (and reach no filter of theirs); the last deactivation closes it.
    const int alerts = subscribe(host_, "VexlanCNA_AlertIndication_AdapterStatusChange");
    zorap_sim_set_next_flash(0, 50);
    std::string id = startJob(host_, kFC);
    ASSERT_EQ(waitJobState(host_, id, 7), 7u);
    ASSERT_TRUE(waitForLog("Job " + id + ": delivered CIM_InstModification", seconds(2)));
    EXPECT_EQ(indicationsMade(host_), 2);
    ASSERT_TRUE(host_.deactivateFilter(alerts).ok());

    const int made = indicationsMade(host_);
    for (const Side* side : {&kFC, &kNIC}) {
        zorap_sim_set_next_flash(0, 50);
        id = startJob(host_, *side);
        ASSERT_EQ(waitJobState(host_, id, 7), 7u);
    }
    std::this_thread::sleep_for(milliseconds(100));
    EXPECT_EQ(indicationsMade(host_), made);
    EXPECT_EQ(countLog("delivering CIM_Inst"), 2);
    EXPECT_EQ(countLog("not sent"), 0);
    // The job file and the log of the write are those of a job without
    // subscriptions.
    EXPECT_TRUE(waitForLog("NICFlashUpdateProc: ZORAP_UpdateFlash returns 0", seconds(1)));
}

INSTANTIATE_TEST_SUITE_P(Flavours, JobIndications, ::testing::Values(Flavour::Pegasus, Flavour::Sfcb),
                         [](const ::testing::TestParamInfo<Flavour>& i) { return flavourText(i.param); });

// ---- Cleanup while a job writes ---------------------------------------------------------

TEST(JobIndicationCleanup, AJobThatEndsDuringCleanupSendsNothingAfterCleanupBegan)
{
    writeSettings(kLogsOn, "");
    writeImage();
    zorap_sim_load_default();
    for (Flavour flavour : {Flavour::Pegasus, Flavour::Sfcb}) {
        for (bool withCleanup : {true, false}) {
            SCOPED_TRACE(std::string(flavourText(flavour)) + (withCleanup ? " cleanup" : " unload without cleanup"));
            removeLog();
            zorap_sim_reset();
            Host host;
            prepareHost(host, flavour);
            std::mutex lock;
            std::vector<std::pair<std::string, Clock::time_point>> received;
            host.setIndicationListener([&](const Indication& ind) {
                std::lock_guard<std::mutex> guard(lock);
                received.emplace_back(ind.instance.className(), Clock::now());
            });
            subscribe(host, kCreation);
            subscribe(host, kModification);
            zorap_sim_set_next_flash(0, 1200);
            const std::string id = startJob(host, kFC);
            ASSERT_FALSE(id.empty());
            Indication created;
            ASSERT_TRUE(host.waitIndication(created, seconds(5)));
            ASSERT_EQ(zorap_sim_wait_flash_writes(1, 5000), 0);

            const Clock::time_point cleanupBegins = Clock::now();
            ASSERT_TRUE((withCleanup ? host.unload(true) : host.unloadWithoutCleanup()).ok());
            EXPECT_GE(Clock::now() - cleanupBegins, milliseconds(800)) << "cleanup waits for the write";
            EXPECT_EQ(zorap_sim_flash_writes_running(), 0u);
            {
                std::lock_guard<std::mutex> guard(lock);
                ASSERT_EQ(received.size(), 1u);
                EXPECT_EQ(received[0].first, kCreation);
                EXPECT_LT(received[0].second, cleanupBegins);
            }
            // The job ended all the same, and said why nothing was sent.
            EXPECT_EQ(countLog("Job " + id + ": CIM_InstModification not sent, the provider is being cleaned up"), 1);
            EXPECT_EQ(countLog("FCFlashUpdateProc: ZORAP_UpdateFlash returns 0"), 1);
            EXPECT_NE(fileText("/var/tmp/vxln_cna_provider.config").find(id + "#STATUS=2\n"), std::string::npos);
        }
    }
}

// ---- Jobs beside filters switched on and off (for ThreadSanitizer) --------------------------

TEST(JobIndicationThreads, JobsRunWhileFiltersComeAndGo)
{
    writeSettings(kLogsOn, "");
    removeLog();
    writeImage();
    zorap_sim_load_default();
    zorap_sim_reset();
    for (Flavour flavour : {Flavour::Pegasus, Flavour::Sfcb}) {
        SCOPED_TRACE(flavourText(flavour));
        Host host;
        prepareHost(host, flavour);
        ASSERT_TRUE(host.enumerateInstanceNames(classPath("Vexlan_Adapter_ComputerSystem")).ok());
        std::atomic<bool> jobsDone{false};
        std::vector<std::string> ids;
        std::thread jobs([&] {
            for (int i = 0; i < 12; ++i) {
                zorap_sim_set_next_flash(i % 3 == 0 ? ZORAP_ERR_FLASH_FAILED : 0, 20 + 10 * (i % 4));
                ids.push_back(startJob(host, kFC));
                std::this_thread::sleep_for(milliseconds(15));
            }
            jobsDone = true;
        });
        std::thread filters([&] {
            while (!jobsDone) {
                const int a = subscribe(host, kCreation);
                const int b = subscribe(host, kModification);
                std::this_thread::sleep_for(milliseconds(7));
                host.deactivateFilter(b);
                host.deactivateFilter(a);
                std::this_thread::sleep_for(milliseconds(3));
            }
        });
        jobs.join();
        filters.join();
        for (const std::string& id : ids) {
            ASSERT_FALSE(id.empty());
            const std::uint64_t state = waitJobState(host, id, 7);
            EXPECT_TRUE(state == 7 || state == 10) << id << " " << state;
        }
        // Whatever arrived is whole: a creation shows a running job, a
        // modification its end after the running job.
        Indication ind;
        while (host.waitIndication(ind, milliseconds(100))) {
            EXPECT_TRUE(ind.error.empty()) << ind.error;
            if (ind.instance.className() == kCreation) {
                EXPECT_EQ(embedded(ind.instance, "SourceInstance").property("JobState")->u, 4u);
            } else {
                EXPECT_EQ(ind.instance.className(), kModification);
                EXPECT_EQ(embedded(ind.instance, "PreviousInstance").property("JobState")->u, 4u);
                EXPECT_NE(embedded(ind.instance, "SourceInstance").property("JobState")->u, 4u);
            }
        }
        // Every filter is gone: the next job sends nothing.
        const int made = indicationsMade(host);
        zorap_sim_set_next_flash(0, 10);
        const std::string last = startJob(host, kFC);
        EXPECT_EQ(waitJobState(host, last, 7), 7u);
        std::this_thread::sleep_for(milliseconds(100));
        EXPECT_EQ(indicationsMade(host), made);
        EXPECT_EQ(host.counters().indicationsFromUnattachedThreads, 0);
    }
}

// ---- The command line: subscriptions in a batch, the generated sfcb registration -------------

TEST(JobIndicationCommandLine, ABatchSubscribesStartsAJobAndShowsBothIndications)
{
    writeSettings(kLogsOn, "");
    removeLog();
    writeImage();
    zorap_sim_load_default();
    zorap_sim_reset();
    zorap_sim_set_next_flash(0, 300);
    std::ofstream("jobs.batch") << "subscribe CIM_InstCreation\n"
                                   "subscribe -q 'SELECT * FROM CIM_InstModification WHERE SourceInstance ISA "
                                   "CIM_ConcreteJob' CIM_InstModification\n"
                                << "cm '" << servicePathText(kFC)
                                << "' InstallFromURI URI=file://" << kImage
                                << " 'Target=Vexlan_FCHBA_PortController.DeviceID=\"VXA1631K0042\"' "
                                   "'InstallOptions={5,32768}'\n"
                                   "sleep 1.5\n";
    const std::string reg = std::string(VEXLAN_MOF_DIR) + "/../Vexlan_CNA_Provider.reg";
    std::ostringstream out, err;
    const int code = cimhost::runCli({"cimhost", "-f", "sfcb", "--reg", reg, "-s", "-m", VEXLAN_MOF_DIR, "-N", kNamespace, "-p",
                                      PROVIDER_LIBRARY, "batch", "jobs.batch"},
                                     out, err);
    EXPECT_EQ(code, 0) << err.str();
    const std::string text = out.str();
    const std::size_t job = text.find("ReturnValue = 4096;");
    const std::size_t creation = text.find("instance of CIM_InstCreation {");
    const std::size_t modification = text.find("instance of CIM_InstModification {");
    ASSERT_NE(job, std::string::npos) << text;
    ASSERT_NE(creation, std::string::npos) << text;
    ASSERT_NE(modification, std::string::npos) << text;
    EXPECT_LT(job, creation);
    EXPECT_LT(creation, modification);
    EXPECT_NE(text.find("    JobState = 7;", modification), std::string::npos) << text;
    EXPECT_NE(text.find("    PercentComplete = 100;", modification), std::string::npos) << text;
    // The registration gave the provider the filters: sfcb asks it to authorise each.
    EXPECT_EQ(countLog("Entering Vexlan_CNA_Provider authorizeFilter"), 2);
    EXPECT_EQ(countLog("Number of subscriptions still available is: 1"), 1);
}

}  // namespace

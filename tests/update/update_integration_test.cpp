// Software identities, the two flash update services, their methods and the
// update jobs, through the shipped provider in a strict embedded CIM host.
// Runs under tests/isolate.sh: /opt and /var/tmp are private.
#include <gtest/gtest.h>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <chrono>
#include <fstream>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "cmpidt.h"
#include "cimhost/text.h"
#include "provider_env.h"
#include "zorap_sim_control.h"

using namespace provtest;
using namespace std::chrono_literals;

using cimhost::Host;
using cimhost::Instance;
using cimhost::NamedValue;
using cimhost::ObjectPath;
using cimhost::OpResult;
using cimhost::Type;
using cimhost::Value;
using cimhost::formatValue;

namespace {

const char kJobFile[] = "/var/tmp/vxln_cna_provider.config";
const char kFcSerial[] = "VXA1631K0042";    // dual-port 16G HBA of the default host
const char kNicSerial[] = "VXC2447M0193";   // the CNA with NIC functions

// A file of `size` bytes under /var/tmp.
std::string imageOf(std::size_t size, const std::string& name = "image.bin")
{
    const std::string path = "/var/tmp/" + name;
    std::ofstream out(path, std::ios::binary | std::ios::trunc);
    const std::string block(65536, '\x5a');
    for (std::size_t done = 0; done < size; done += block.size())
        out.write(block.data(), static_cast<std::streamsize>(std::min(block.size(), size - done)));
    return path;
}

Value controllerRef(bool nic, const std::string& deviceId, const char* cls = nullptr)
{
    ObjectPath p = classPath(cls != nullptr ? cls : nic ? "Vexlan_NIC_PortController" : "Vexlan_FCHBA_PortController");
    if (!deviceId.empty())
        p.setKey("DeviceID", Value::fromString(deviceId));
    return Value::fromRef(p);
}

Value options(std::vector<std::uint64_t> values)
{
    std::vector<Value> elems;
    for (std::uint64_t v : values)
        elems.push_back(Value::fromUnsigned(Type::UInt16, v));
    return Value::arrayOf(Type::UInt16, std::move(elems));
}

struct Call {
    OpResult result;
    std::uint64_t value() const { return result.data.empty() ? 0xDEAD : result.data[0].u; }
    const Value* out(const std::string& name) const
    {
        for (const NamedValue& a : result.outArgs)
            if (a.first == name)
                return &a.second;
        return nullptr;
    }
};

Call installFromURI(Host& host, bool nic, const std::string& uri, const std::string& deviceId,
                    const std::vector<std::uint64_t>& opts)
{
    std::vector<NamedValue> in = {{"URI", Value::fromString(uri)}, {"Target", controllerRef(nic, deviceId)},
                                  {"InstallOptions", options(opts)}};
    return Call{host.invokeMethod(servicePath(nic), "InstallFromURI", in)};
}

const std::string fcDevice = kFcSerial;
const std::string nicDevice = std::string(kNicSerial) + "_NIC";

// The job that a method's "Job" names: its path, read back, its state.
ObjectPath jobPath(const Call& call)
{
    const Value* job = call.out("Job");
    return job != nullptr && job->ref ? *job->ref : ObjectPath{};
}

OpResult jobOf(Host& host, const Call& call)
{
    return host.getInstance(jobPath(call));
}

std::uint64_t jobState(Host& host, const Call& call)
{
    return provtest::jobState(host, jobPath(call));
}

std::uint64_t waitJobState(Host& host, const Call& call, std::uint64_t wanted)
{
    return provtest::waitJobState(host, jobPath(call), wanted);
}

const Instance* withId(const std::vector<Instance>& all, const std::string& id)
{
    for (const Instance& i : all)
        if (propertyText(i, "InstanceID") == id)
            return &i;
    return nullptr;
}

}  // namespace

// ---- Software identities -------------------------------------------------------------

class SoftwareInventory : public ProviderSuite<SoftwareInventory> {
protected:
    static void SetUpTestSuite() { startSuite(kLogsOn, nullptr, "Vexlan_Adapter_ComputerSystem"); }
};

// What the identities show on the default host is compared whole in
// tests/provider/recorded_hosts_test.cpp; here what getInstance finds.
TEST_F(SoftwareInventory, GetInstanceReadsTheKeyOfEachSide)
{
    ObjectPath image = classPath("Vexlan_FCHBA_SoftwareIdentity");
    image.setKey("InstanceID", Value::fromString(expectedHost().name + "_" + kFcSerial + "__FlashImage"));
    OpResult got = host().getInstance(image);
    ASSERT_EQ(got.instances.size(), 1u) << statusLine(got);
    EXPECT_EQ(propertyText(got.instances[0], "VersionString"), "3.64.12");
    image.setKey("InstanceID", Value::fromString("nothing_FlashImage"));
    EXPECT_EQ(host().getInstance(image).rc, CMPI_RC_ERR_NOT_FOUND);

    // The key's number is the type: "02_" is type 2; a type without a row
    // gives the instance without its typed properties; an unknown serial,
    // or a key without "_", is not found.
    ObjectPath p = classPath("Vexlan_NIC_SoftwareIdentity");
    p.setKey("InstanceID", Value::fromString(std::string("02_") + kNicSerial));
    got = host().getInstance(p);
    ASSERT_EQ(got.instances.size(), 1u) << statusLine(got);
    EXPECT_EQ(propertyText(got.instances[0], "Description"), "The CNA Networking Driver");
    p.setKey("InstanceID", Value::fromString(std::string("7_") + kNicSerial));
    got = host().getInstance(p);
    ASSERT_EQ(got.instances.size(), 1u) << statusLine(got);
    EXPECT_EQ(got.instances[0].property("Name"), nullptr);
    EXPECT_EQ(propertyText(got.instances[0], "Manufacturer"), "Vexlan Corporation");
    // A negative type keeps its sign in the instance's key.
    p.setKey("InstanceID", Value::fromString(std::string("-2147483648_") + kNicSerial));
    got = host().getInstance(p);
    ASSERT_EQ(got.instances.size(), 1u) << statusLine(got);
    EXPECT_EQ(propertyText(got.instances[0], "InstanceID"), std::string("-2147483648_") + kNicSerial);
    for (const std::string& key : {std::string("2_NOSUCH"), std::string(kNicSerial)}) {
        p.setKey("InstanceID", Value::fromString(key));
        EXPECT_EQ(host().getInstance(p).rc, CMPI_RC_ERR_NOT_FOUND) << key;
    }
}

TEST_F(SoftwareInventory, ServiceGetInstanceNeedsTheHostsNameAndTheJobsClassAnswersNothing)
{
    for (bool nic : {false, true}) {
        OpResult got = host().getInstance(servicePath(nic));
        ASSERT_EQ(got.instances.size(), 1u) << statusLine(got);
        ObjectPath wrong = servicePath(nic);
        wrong.setKey("SystemName", Value::fromString("another-host"));
        OpResult miss = host().getInstance(wrong);
        EXPECT_EQ(miss.rc, CMPI_RC_ERR_NOT_FOUND);
        EXPECT_EQ(miss.message, "CNA_SW_INSTALLER");
    }
    // The jobs class answers any key of an empty map with nothing.
    ObjectPath job = classPath("Vexlan_Adapter_ConcreteJob");
    job.setKey("InstanceID", Value::fromString("abc"));
    OpResult r = host().getInstance(job);
    EXPECT_TRUE(r.ok());
    EXPECT_TRUE(r.instances.empty());
}

// ---- The methods ---------------------------------------------------------------------

class UpdateMethods : public ProviderSuite<UpdateMethods> {
protected:
    static void SetUpTestSuite() { startSuite(kLogsOn, nullptr, "Vexlan_Adapter_ComputerSystem"); }
    void SetUp() override { zorap_sim_reset(); }
};

TEST_F(UpdateMethods, UnknownMethodsGiveOneAndEveryFailureTwoWithStatusOK)
{
    const std::string image = imageOf(4096);
    for (bool nic : {false, true}) {
        Call c{host().invokeMethod(servicePath(nic), "Reboot", {})};
        EXPECT_TRUE(c.result.ok());
        EXPECT_EQ(c.value(), 1u) << nic;

        const std::string device = nic ? nicDevice : fcDevice;
        struct Case {
            std::string uri;
            std::string deviceId;
            const char* targetClass;
        };
        const Case cases[] = {
            {image, device, nic ? "Vexlan_FCHBA_PortController" : "Vexlan_NIC_PortController"},  // wrong class
            {"/var/tmp/no-such-image", device, nullptr},
            {"http://example.invalid/image.bin", device, nullptr},
            {image, "NOSUCHSERIAL", nullptr},
            {"file://" + std::string(100 * 1024, 'a'), device, nullptr},  // a 100 kB URI
        };
        for (const Case& k : cases) {
            std::vector<NamedValue> in = {{"URI", Value::fromString(k.uri)},
                                          {"Target", controllerRef(nic, k.deviceId, k.targetClass)},
                                          {"InstallOptions", options({5})}};
            Call call{host().invokeMethod(servicePath(nic), "InstallFromURI", in)};
            EXPECT_TRUE(call.result.ok()) << statusLine(call.result);
            EXPECT_EQ(call.value(), 2u) << nic << " " << k.uri.substr(0, 40) << " " << k.deviceId;
        }
    }
    EXPECT_EQ(zorap_sim_call_count(ZORAP_FN_UpdateFlash) + zorap_sim_call_count(ZORAP_FN_doOptionROMUpdate), 0u);

    // The NIC service's other methods install nothing.
    const Value source = Value::fromRef(classPath("Vexlan_NIC_SoftwareIdentity"));
    Call check{host().invokeMethod(servicePath(true), "CheckSoftwareIdentity",
                                   {{"Source", source}, {"Target", controllerRef(true, nicDevice)}})};
    EXPECT_EQ(check.value(), 2u);
    EXPECT_EQ(check.out("InstallCharacteristics"), nullptr);
    Call fromIdentity{host().invokeMethod(servicePath(true), "InstallFromSoftwareIdentity",
                                          {{"Source", source}, {"Target", controllerRef(true, nicDevice)}})};
    EXPECT_EQ(fromIdentity.value(), 2u);
    // A byte stream typed as a uint8 array is refused by its type.
    Call stream{host().invokeMethod(servicePath(true), "InstallFromByteStream",
                                    {{"Image", Value::byteArray(std::vector<std::uint8_t>(64, 7))},
                                     {"Target", controllerRef(true, nicDevice)}})};
    EXPECT_EQ(stream.value(), 2u);
    EXPECT_EQ(zorap_sim_call_count(ZORAP_FN_UpdateFlash), 0u);
}

TEST_F(UpdateMethods, ATargetKeyReadThatFailsWithAMessageLeavesNoLockHeld)
{
    host().setMissingKeyMessage(true);
    Call c = installFromURI(host(), false, imageOf(16), "", {5});
    host().setMissingKeyMessage(false);
    // The status goes to the client as it stands; the next request is answered.
    EXPECT_EQ(c.result.rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(c.result.message, "no key DeviceID in the path");
    Call again{host().invokeMethod(servicePath(true), "Reboot", {})};
    EXPECT_EQ(again.value(), 1u);
    EXPECT_EQ(enumerate(host(), "Vexlan_Adapter_ComputerSystem").instances.size(), 1u);
}

TEST_F(UpdateMethods, ASynchronousFCUpdateWritesTheFileAndShowsTheNewFlashImage)
{
    const std::string image = imageOf(2048, "fc.bin");
    zorap_sim_set_next_flash(0, 10);
    const auto start = std::chrono::steady_clock::now();
    // The prefix in capitals is skipped as well.
    Call c = installFromURI(host(), false, "FILE://" + image, std::string(kFcSerial).substr(0, 2) + "a1631k0042", {5});
    EXPECT_GE(std::chrono::steady_clock::now() - start, 5s);  // the wait before the lists are rebuilt
    EXPECT_EQ(c.value(), 0u);
    EXPECT_EQ(c.out("Job"), nullptr);
    char name[256];
    long long bytes = 0;
    ASSERT_EQ(zorap_sim_last_flash_image(name, sizeof(name), &bytes), 0);
    EXPECT_EQ(std::string(name), image);
    EXPECT_EQ(bytes, 2048);
    const OpResult r = enumerate(host(), "Vexlan_FCHBA_SoftwareIdentity");
    const Instance* flash = withId(r.instances, expectedHost().name + "_" + kFcSerial + "__FlashImage");
    ASSERT_NE(flash, nullptr);
    EXPECT_EQ(propertyText(*flash, "VersionString"), "3.66.1");
    EXPECT_EQ(formatValue(*flash->property("ReleaseDate")).substr(1, 8), "20251203");
}

TEST_F(UpdateMethods, NICImagesOfOneByteTo16MiBAreWrittenAndOthersRefused)
{
    zorap_sim_set_next_flash(0, 10);
    EXPECT_EQ(installFromURI(host(), true, imageOf(0), nicDevice, {5}).value(), 2u);
    EXPECT_EQ(installFromURI(host(), true, imageOf(16777217), nicDevice, {5}).value(), 2u);
    EXPECT_EQ(zorap_sim_call_count(ZORAP_FN_UpdateFlash), 0u);
    // Synchronous without options as well as with {5}.
    std::vector<NamedValue> in = {{"URI", Value::fromString("file://" + imageOf(16777216))},
                                  {"Target", controllerRef(true, nicDevice)}};
    Call c{host().invokeMethod(servicePath(true), "InstallFromURI", in)};
    EXPECT_EQ(c.value(), 0u);
    long long bytes = 0;
    ASSERT_EQ(zorap_sim_last_flash_image(nullptr, 0, &bytes), 0);
    EXPECT_EQ(bytes, 16777216);
    // A write the library fails gives 2.
    zorap_sim_set_next_flash(9, 10);
    EXPECT_EQ(installFromURI(host(), true, imageOf(100), nicDevice, {}).value(), 2u);
}

TEST_F(UpdateMethods, AnImageThatIsNoRegularFileOrOverItsBoundIsRefusedAtOnceWithTwo)
{
    const std::string path = "/var/tmp/planted.bin";
    constexpr std::size_t kImageBound = 64u << 20;
    for (Planted kind : kPlantedKinds) {
        plant(kind, path, kImageBound + 1);
        const std::string line = "Refusing flash image (" + path + "): " + plantedReason(kind, kImageBound) + ".";
        for (bool nic : {false, true}) {
            SCOPED_TRACE(std::string(plantedName(kind)) + (nic ? " NIC" : " FC"));
            const int before = countLog(line);
            const auto start = std::chrono::steady_clock::now();
            Call c = installFromURI(host(), nic, "file://" + path, nic ? nicDevice : fcDevice, {5});
            EXPECT_LT(std::chrono::steady_clock::now() - start, 1s);
            EXPECT_TRUE(c.result.ok());
            EXPECT_EQ(c.value(), 2u);
            EXPECT_EQ(countLog(line), before + 1) << line;
        }
        std::remove(path.c_str());
        rmdir(path.c_str());
    }
    EXPECT_EQ(zorap_sim_call_count(ZORAP_FN_UpdateFlash) + zorap_sim_call_count(ZORAP_FN_doOptionROMUpdate), 0u);
}

// ---- Jobs ------------------------------------------------------------------------------

class UpdateJobs : public ProviderSuite<UpdateJobs> {
protected:
    static void SetUpTestSuite() { startSuite(kLogsOn, nullptr, "Vexlan_Adapter_ComputerSystem"); }
    void SetUp() override { zorap_sim_reset(); }
};

TEST_F(UpdateJobs, AnFCJobRunsThenCompletesOrFailsAndIsSaved)
{
    const std::string image = imageOf(512, "job.bin");
    zorap_sim_set_next_flash(0, 1500);
    Call c = installFromURI(host(), false, image, fcDevice, {5, 32768});
    ASSERT_EQ(c.value(), 4096u);
    ASSERT_NE(c.out("Job"), nullptr);
    ASSERT_EQ(zorap_sim_wait_flash_writes(1, 5000), 0);
    OpResult running = jobOf(host(), c);
    ASSERT_EQ(running.instances.size(), 1u) << statusLine(running);
    const Instance& job = running.instances[0];
    EXPECT_EQ(job.property("JobState")->u, 4u);
    EXPECT_EQ(propertyText(job, "Name").substr(0, std::string(kFcSerial).size() + 28),
              std::string(kFcSerial) + " FC flash update with " + image.substr(0, 6));
    EXPECT_EQ(formatValue(*job.property("TimeBeforeRemoval")), "\"00000000003000.000000:000\"");
    const std::uint64_t started = job.property("TimeOfLastStateChange")->dt.usec;
    // While an FC job runs the provider may be unloaded; the job list shows it.
    EXPECT_EQ(enumerate(host(), "Vexlan_Adapter_ConcreteJob").instances.size(), 1u);

    EXPECT_EQ(waitJobState(host(), c, 7), 7u);
    EXPECT_GT(jobOf(host(), c).instances[0].property("TimeOfLastStateChange")->dt.usec, started);
    const std::string id = c.out("Job")->ref->key("InstanceID")->s;
    const std::string file = fileText(kJobFile);
    EXPECT_NE(file.find(id + "#STATUS=2\n" + id + "#RESULT=0\n" + id + "#END=1\n"), std::string::npos) << file;

    // A failing write ends the job in the exception state with the code.
    zorap_sim_set_next_flash(11, 10);
    Call bad = installFromURI(host(), false, image, fcDevice, {32768});
    ASSERT_EQ(bad.value(), 4096u);
    EXPECT_EQ(waitJobState(host(), bad, 10), 10u);
    const std::string badId = bad.out("Job")->ref->key("InstanceID")->s;
    EXPECT_NE(fileText(kJobFile).find(badId + "#RESULT=11\n"), std::string::npos);
    EXPECT_EQ(enumerate(host(), "Vexlan_Adapter_ConcreteJob").instances.size(), 2u);
}

TEST_F(UpdateJobs, ASecondNICJobIsRefusedWhileOneRunsAndTheProviderStaysLoaded)
{
    const std::string image = imageOf(4096, "nic.bin");
    zorap_sim_set_next_flash(0, 1500);
    Call first = installFromURI(host(), true, image, nicDevice, {5, 32768});
    ASSERT_EQ(first.value(), 4096u);
    ASSERT_EQ(zorap_sim_wait_flash_writes(1, 5000), 0);
    EXPECT_EQ(installFromURI(host(), true, image, nicDevice, {32768}).value(), 2u);
    EXPECT_EQ(installFromURI(host(), true, image, nicDevice, {}).value(), 2u);
    // An idle unload is refused while the NIC job writes.
    EXPECT_EQ(host().unload(false).rc, CMPI_RC_DO_NOT_UNLOAD);
    EXPECT_EQ(waitJobState(host(), first, 7), 7u);
    zorap_sim_set_next_flash(0, 10);
    Call next = installFromURI(host(), true, image, nicDevice, {32768});
    EXPECT_EQ(next.value(), 4096u);
    EXPECT_EQ(waitJobState(host(), next, 7), 7u);
}

// A job beside requests and a rebuild of the lists (for ThreadSanitizer).
TEST_F(UpdateJobs, JobsRunBesideRequestsAndRebuilds)
{
    const std::string image = imageOf(256, "busy.bin");
    std::vector<Call> calls;
    for (int round = 0; round < 3; ++round) {
        zorap_sim_set_next_flash(0, 200);
        calls.push_back(installFromURI(host(), false, image, fcDevice, {32768}));
        std::thread reader([&] {
            for (int i = 0; i < 5; ++i) {
                enumerate(host(), "Vexlan_Adapter_ConcreteJob");
                enumerate(host(), "Vexlan_FCHBA_FCPort");
            }
        });
        zorap_sim_load_default();  // a configuration change: the next poll rebuilds
        reader.join();
    }
    for (const Call& c : calls)
        EXPECT_EQ(waitJobState(host(), c, 7), 7u);
}

// ---- Jobs across unload and reload --------------------------------------------------

class UpdateLifecycle : public ::testing::Test {
protected:
    void SetUp() override
    {
        writeSettings(kLogsOn, "LinkStatusPollIntervalSeconds=0\n");
        unlink(kJobFile);
        zorap_sim_load_default();
        zorap_sim_reset();
    }
};

TEST_F(UpdateLifecycle, AnUnloadDuringAJobWaitsForItsEndAndAReloadShowsIt)
{
    const std::string image = imageOf(1024, "unload.bin");
    const int threadsBefore = threadCount();
    for (cimhost::Flavour flavour : {cimhost::Flavour::Pegasus, cimhost::Flavour::Sfcb}) {
        for (bool nic : {false, true}) {
            Host host;
            prepareHost(host, flavour);
            zorap_sim_set_next_flash(0, 800);
            Call c = installFromURI(host, nic, image, nic ? nicDevice : fcDevice, {32768});
            ASSERT_EQ(c.value(), 4096u);
            ASSERT_EQ(zorap_sim_wait_flash_writes(1, 5000), 0);
            const std::string id = c.out("Job")->ref->key("InstanceID")->s;
            ASSERT_TRUE(host.unload(true).ok());
            EXPECT_EQ(zorap_sim_flash_writes_running(), 0u);
            EXPECT_EQ(threadCount(), threadsBefore) << nic;
            EXPECT_NE(fileText(kJobFile).find(id + "#STATUS=2\n"), std::string::npos) << nic;
            ASSERT_TRUE(host.load(PROVIDER_LIBRARY, kProviderName).ok());
            EXPECT_EQ(jobState(host, c), 7u) << "the reloaded provider shows the job, " << nic;
        }
    }
    // A job older than an hour in the file is gone after a load.
    std::ofstream(kJobFile, std::ios::trunc) << "9#ID=9\n9#DESC=old\n9#TOLSC=1000\n9#STATUS=2\n9#RESULT=0\n9#END=1\n";
    chmod(kJobFile, 0600);
    Host host;
    prepareHost(host);
    EXPECT_TRUE(enumerate(host, "Vexlan_Adapter_ConcreteJob").instances.empty());
}

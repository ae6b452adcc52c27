// The shipped provider library driven through the embedded CIM host, in the
// way a CIM server drives it: factories, requests, cleanup, unload.
#include <gtest/gtest.h>

#include <chrono>
#include <thread>

#include "cmpidt.h"
#include "provider_env.h"
#include "zorap_cna.h"
#include "zorap_sim_control.h"

using namespace provtest;
using cimhost::Host;
using cimhost::OpResult;
using cimhost::Value;
using std::chrono::seconds;

namespace {

unsigned long calls(zorap_sim_function fn)
{
    return zorap_sim_call_count(fn);
}

OpResult enumerateHost(Host& host)
{
    return host.enumerateInstances(classPath("Vexlan_Adapter_ComputerSystem"));
}

}  // namespace

// ---- Lifecycle: factories, cleanup, unload and reload ----------------------------

class Lifecycle : public ::testing::Test {
protected:
    void SetUp() override
    {
        writeSettings(kLogsOn, "LinkStatusPollIntervalSeconds=0\n");
        removeLog();
        zorap_sim_load_default();
        zorap_sim_reset();
    }
};

TEST_F(Lifecycle, FactoriesInAnyOrderShareOneProviderUntilTheLastCleanup)
{
    const int threadsBefore = threadCount();
    {
        Host host;
        prepareHost(host);
        // Indication, method, association, then instance: each request makes
        // its factory run once.
        int filter = 0;
        ASSERT_TRUE(host.activateFilter("SELECT * FROM Vexlan_NIC_IndicationEthernetPortLinkUp", kNamespace, filter).ok());
        EXPECT_TRUE(host.invokeMethod(hostPath(Value::fromString("x")), "NoSuchMethod", {}).ok());
        EXPECT_TRUE(host.associatorNames(hostPath(Value::fromString("x"))).ok());
        OpResult r = enumerateHost(host);
        ASSERT_TRUE(r.ok()) << r.message;
        EXPECT_EQ(r.instances.size(), 1u);

        cimhost::Counters c = host.counters();
        for (int t = 0; t < 4; ++t)
            EXPECT_EQ(c.factoryCalls[t], 1) << "MI type " << t;
        EXPECT_EQ(countLog("***** Vexlan_CNA_Provider initialize was called *****"), 1);
        EXPECT_EQ(countLog("AdapterPollingLoop() starting"), 1);
        EXPECT_EQ(countLog("Vexlan CNA CMPI provider, version: 1.5.6"), 1);
        // The polling thread, and the adapter library's alarm thread.
        EXPECT_EQ(threadCount(), threadsBefore + 2);

        ASSERT_TRUE(host.unload(true).ok());
        // Four MI cleanups, one provider cleanup: the use count was four.
        EXPECT_EQ(host.counters().cleanupCalls, 4);
    }
    EXPECT_EQ(countLog("***** Vexlan_CNA_Provider cleanup was called *****"), 1);
    EXPECT_EQ(countLog("stopPollingLoop() completed pthread_join"), 1);
    EXPECT_EQ(countLog("AdapterPollingLoop() ending..."), 1);
    EXPECT_EQ(countLog("Vexlan_CNA_Provider destructor complete"), 1);
    EXPECT_EQ(calls(ZORAP_FN_Uninitialize), 1u);
    EXPECT_EQ(calls(ZORAP_FN_UnRegisterAlarmNotificationCallback), 1u);
    EXPECT_EQ(threadCount(), threadsBefore);
}

// sfcb calls a factory once per registered class section and provider type,
// but cleans up once per library and MI type; an idle unload and a stop both
// go that way. Every life starts the provider once and must end with the
// provider's cleanup, its destructor, the adapter library shut down and no
// thread left.
TEST_F(Lifecycle, SfcbIdleUnloadsEndEveryLifeAfterRequestsToManyClasses)
{
    Host host;
    prepareHost(host, cimhost::Flavour::Sfcb);
    const int threadsBefore = threadCount();
    for (int life = 1; life <= 2; ++life) {
        const int classTestsBefore = host.counters().classPathIsACalls;
        for (const char* cls : {"Vexlan_Adapter_ComputerSystem", "Vexlan_FCHBA_FCPort", "Vexlan_FCHBA_PortController",
                                "Vexlan_Adapter_PhysicalPackage", "Vexlan_NIC_EthernetPort2"})
            ASSERT_TRUE(host.enumerateInstanceNames(classPath(cls)).ok()) << cls;
        // Each life asks the broker its class tests afresh.
        EXPECT_GT(host.counters().classPathIsACalls, classTestsBefore) << "life " << life;
        ASSERT_TRUE(host.associatorNames(hostPath(Value::fromString("x"))).ok());
        EXPECT_EQ(host.invokeMethod(classPath("Vexlan_FCHBA_FCPort"), "NoSuchMethod", {}).rc, 0);
        EXPECT_GE(host.counters().factoryCalls[0], 5 * life);
        // However many factory calls, one start of the provider per life.
        EXPECT_EQ(countLog("AdapterPollingLoop() starting"), life);
        EXPECT_EQ(calls(ZORAP_FN_Initialize), static_cast<unsigned long>(life));
        // An idle unload (terminating false), as after providerTimeoutInterval.
        ASSERT_TRUE(host.unload(false).ok());
        EXPECT_EQ(countLog("***** Vexlan_CNA_Provider cleanup was called *****"), life);
        EXPECT_EQ(countLog("***** Vexlan_CNA_Provider cleanup done *****"), life);
        EXPECT_EQ(countLog("Vexlan_CNA_Provider destructor complete"), life);
        EXPECT_EQ(calls(ZORAP_FN_Uninitialize), static_cast<unsigned long>(life));
        EXPECT_EQ(threadCount(), threadsBefore) << "life " << life;
        ASSERT_TRUE(host.load(PROVIDER_LIBRARY, kProviderName).ok());
    }
}

// A server that unloads the library without any cleanup: the library's own
// unload code stops the polling thread and shuts the adapter library down.
TEST_F(Lifecycle, AnUnloadWithoutCleanupLeavesNoThreadRunning)
{
    Host host;
    prepareHost(host, cimhost::Flavour::Sfcb);
    const int threadsBefore = threadCount();
    ASSERT_EQ(enumerateHost(host).instances.size(), 1u);
    EXPECT_GT(threadCount(), threadsBefore);
    ASSERT_TRUE(host.unloadWithoutCleanup().ok());
    EXPECT_EQ(host.counters().cleanupCalls, 0);
    EXPECT_EQ(countLog("***** Vexlan_CNA_Provider cleanup was called *****"), 1);
    EXPECT_EQ(countLog("AdapterPollingLoop() ending..."), 1);
    EXPECT_EQ(countLog("Vexlan_CNA_Provider destructor complete"), 1);
    EXPECT_EQ(calls(ZORAP_FN_Uninitialize), 1u);
    EXPECT_EQ(threadCount(), threadsBefore);
    // The next load starts a clean second life.
    ASSERT_TRUE(host.load(PROVIDER_LIBRARY, kProviderName).ok());
    ASSERT_EQ(enumerateHost(host).instances.size(), 1u);
    ASSERT_TRUE(host.unload(true).ok());
    EXPECT_EQ(countLog("Vexlan_CNA_Provider destructor complete"), 2);
}

TEST_F(Lifecycle, WithoutSettingsBothLogsStayOffAndThePollWaits180Seconds)
{
    writeSettings("", "");
    Host host;
    prepareHost(host);
    ASSERT_EQ(enumerateHost(host).instances.size(), 1u);
    std::this_thread::sleep_for(seconds(3));
    EXPECT_EQ(calls(ZORAP_FN_DidConfigChange), 0u);
    ASSERT_TRUE(host.unload(true).ok());
    // Only the constructor's first line, written before the settings are read.
    std::vector<std::string> lines = logLines();
    ASSERT_EQ(lines.size(), 1u);
    EXPECT_NE(lines[0].find("Vexlan_CNA_Provider constructor was called"), std::string::npos);
}

// ---- Vexlan_Adapter_ComputerSystem through every instance operation ---------------

class ComputerSystem : public ::testing::Test {
protected:
    static void SetUpTestSuite()
    {
        writeSettings(kLogsOn, "");
        removeLog();
        zorap_sim_load_default();
        host_ = new Host;
        prepareHost(*host_);
        ASSERT_TRUE(enumerateHost(*host_).ok());
    }
    static void TearDownTestSuite()
    {
        delete host_;
        host_ = nullptr;
    }
    static Host* host_;
};
Host* ComputerSystem::host_ = nullptr;

// The host's properties and their order are compared in recorded_hosts_test.cpp.
TEST_F(ComputerSystem, GetInstanceMatchesTheNameWithoutRegardToCaseAndHonoursTheFilter)
{
    std::string name = expectedHost().name;
    for (auto& c : name)
        c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    OpResult r = host_->getInstance(hostPath(Value::fromString(name)));
    ASSERT_TRUE(r.ok()) << r.message;
    ASSERT_EQ(r.instances.size(), 1u);

    r = host_->getInstance(hostPath(Value::fromString(expectedHost().name)), std::vector<std::string>{"OSName"});
    ASSERT_TRUE(r.ok()) << r.message;
    ASSERT_EQ(r.instances.size(), 1u);
    EXPECT_EQ(propertyNames(r.instances[0]), (std::vector<std::string>{"CreationClassName", "Name", "OSName"}));
}

// Another name is NOT_FOUND with the key as the message, and two log
// lines; a huge key cuts them. OpenPegasus refuses returnDone of a
// GetInstance that delivered nothing: the client still sees NOT_FOUND.
TEST_F(ComputerSystem, AnotherNameIsNotFoundWithTheKeyText)
{
    removeLog();
    OpResult r = host_->getInstance(hostPath(Value::fromString("no-such-host")));
    EXPECT_EQ(r.rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(r.message, "no-such-host");
    EXPECT_TRUE(r.instances.empty());
    EXPECT_EQ(countLog("getInstance_ComputerSystem: Error no matching instance found, KeyValue=no-such-host, "
                       "MatchingElement=" + expectedHost().name + "!"), 1);
    EXPECT_EQ(countLog("Vexlan_CNA_Provider getInstance caught exception status: 6 no-such-host"), 1);

    const std::string huge(100 * 1024, 'h');
    host_->setRefuseEmptyGetInstance(true);
    r = host_->getInstance(hostPath(Value::fromString(huge)));
    host_->setRefuseEmptyGetInstance(false);
    EXPECT_EQ(r.rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(r.message, huge);
    int seen = 0;
    for (const auto& line : logLines()) {
        if (line.find("KeyValue=hhhh") == std::string::npos && line.find("status: 6 hhhh") == std::string::npos)
            continue;
        ++seen;
        EXPECT_LT(line.size(), 600u);
    }
    EXPECT_EQ(seen, 2);
}

TEST_F(ComputerSystem, ANumericKeyGivesSuccessWithoutInstance)
{
    removeLog();
    OpResult r = host_->getInstance(hostPath(Value::fromUnsigned(cimhost::Type::UInt32, 7)));
    EXPECT_TRUE(r.ok()) << r.message;
    EXPECT_TRUE(r.instances.empty());
    EXPECT_EQ(countLog("getInstance_ComputerSystem: Error invalid key data type, keyData.type=160!"), 1);
}

TEST_F(ComputerSystem, AFailingOSNameLeavesThePropertyOut)
{
    zorap_sim_fail(ZORAP_FN_GetOSName, ZORAP_ERR_FAILED, 1);
    OpResult r = enumerateHost(*host_);
    ASSERT_TRUE(r.ok()) << r.message;
    ASSERT_EQ(r.instances.size(), 1u);
    EXPECT_EQ(r.instances[0].property("OSName"), nullptr);
    EXPECT_EQ(r.instances[0].properties.size(), 8u);
}

TEST_F(ComputerSystem, AClassWithoutRouteAnswersEmptySuccess)
{
    for (const char* cls : {"CIM_RegisteredProfile", "CIM_ComputerSystem"}) {
        OpResult e = host_->enumerateInstances(classPath(cls));
        EXPECT_TRUE(e.ok()) << cls << ": " << e.message;
        EXPECT_TRUE(e.instances.empty()) << cls;
        cimhost::ObjectPath p = classPath(cls);
        p.setKey("InstanceID", Value::fromString("x"));
        OpResult g = host_->getInstance(p);
        EXPECT_TRUE(g.ok()) << cls << ": " << g.message;
        EXPECT_TRUE(g.instances.empty()) << cls;
    }
}

TEST_F(ComputerSystem, CreateModifyAndDeleteAreRefusedForEveryClass)
{
    removeLog();
    int classes = 0;
    for (const std::string& cls : host_->classes().classNames()) {
        if (cls.rfind("Vexlan", 0) != 0)
            continue;
        ++classes;
        cimhost::ObjectPath p = classPath(cls);
        cimhost::Instance inst;
        inst.path = p;
        OpResult c = host_->createInstance(p, inst);
        EXPECT_EQ(c.rc, CMPI_RC_ERR_NOT_SUPPORTED) << cls;
        EXPECT_EQ(c.message, "Vexlan_CNA_Provider cannot create") << cls;
        OpResult m = host_->modifyInstance(p, inst);
        EXPECT_EQ(m.rc, CMPI_RC_ERR_NOT_SUPPORTED) << cls;
        EXPECT_EQ(m.message, "Vexlan_CNA_Provider cannot set") << cls;
        OpResult d = host_->deleteInstance(p);
        EXPECT_EQ(d.rc, CMPI_RC_ERR_NOT_SUPPORTED) << cls;
        EXPECT_EQ(d.message, "Vexlan_CNA_Provider cannot delete") << cls;
    }
    EXPECT_GT(classes, 50);
    EXPECT_EQ(countLog("Vexlan_CNA_Provider createInstance was called but NOT SUPPORTED"), classes);
    EXPECT_EQ(countLog("Vexlan_CNA_Provider setInstance was called but NOT SUPPORTED"), classes);
    EXPECT_EQ(countLog("Vexlan_CNA_Provider deleteInstance was called but NOT SUPPORTED"), classes);
}

// ---- An adapter library whose every call fails ------------------------------------

TEST(Faults, AnUnusableAdapterLibraryGivesEmptyListsNeverACrash)
{
    writeSettings(kLogsOn, "LinkStatusPollIntervalSeconds=0\n");
    removeLog();
    zorap_sim_load_default();
    zorap_sim_reset();
    for (int fn = 0; fn < ZORAP_FN_COUNT; ++fn)
        if (fn != ZORAP_FN_FreeMem)
            zorap_sim_fail(fn, ZORAP_ERR_FAILED, -1);
    {
        Host host;
        prepareHost(host);
        OpResult r = enumerateHost(host);
        ASSERT_TRUE(r.ok()) << r.message;
        ASSERT_EQ(r.instances.size(), 1u);
        EXPECT_EQ(r.instances[0].property("OSName"), nullptr);
        // Every class of the model answers, with nothing but the host (and
        // what needs no adapter: object manager, namespaces, profiles).
        int classes = 0;
        for (const std::string& cls : host.classes().classNames()) {
            const cimhost::ClassDecl* decl = host.classes().find(cls);
            if (cls.rfind("Vexlan", 0) != 0 || decl == nullptr || decl->association || decl->indication)
                continue;
            ++classes;
            OpResult e = host.enumerateInstances(classPath(cls));
            EXPECT_TRUE(e.ok()) << cls << ": " << e.message;
            if (cls.find("Port") != std::string::npos || cls.find("Physical") != std::string::npos ||
                cls.find("StorageExtent") != std::string::npos || cls.find("Endpoint") != std::string::npos) {
                EXPECT_TRUE(e.instances.empty()) << cls;
            }
        }
        EXPECT_GT(classes, 20);
        // Polls keep running against the failing library.
        EXPECT_TRUE(waitForLog("Exiting Initialize_CNA_List()", seconds(5)));
        std::this_thread::sleep_for(seconds(3));
        EXPECT_GE(calls(ZORAP_FN_DidConfigChange), 1u);
        EXPECT_EQ(countLog("Transceiver on portID"), 0);
        ASSERT_TRUE(host.unload(true).ok());
    }
    zorap_sim_reset();
}

// ---- The polling thread --------------------------------------------------------------

namespace {

std::string nicDescription(const char* serial, const char* interfaceName, bool withTransceiver)
{
    std::string text = R"({"adapters": [{"model": "VXN1000", "serialNumber": ")" + std::string(serial) +
                       R"(", "chip": "RSX-AB0", "ports": [{"portNumber": 7, )";
    if (withTransceiver)
        text += R"("transceiver": {"vendor": "VEXLAN", "partNumber": "VXS-10G-SR"}, )";
    text += R"("protocols": [{"type": "nic", "mac": "02:7e:5a:00:00:07", "interface": ")" +
            std::string(interfaceName) + R"(", "ipv4": "192.168.7.7"}]}]}]})";
    return text;
}

}  // namespace

TEST(Polling, AChangedDescriptionIsPickedUpAtTheNextPollAndTheListsAreRebuilt)
{
    writeSettings(kLogsOn, "LinkStatusPollIntervalSeconds=0\n");
    removeLog();
    const std::string file = "adapters.json";
    writeFile(file, nicDescription("VXN0000001", "enp7s0", false));
    ASSERT_EQ(zorap_sim_load_file(file.c_str()), 0);
    zorap_sim_reset();
    {
        Host host;
        prepareHost(host);
        ASSERT_TRUE(enumerateHost(host).ok());
        EXPECT_GE(countLog("No Transceiver on portID 7"), 1);
        // Let the first polls settle (loading a description counts as a change).
        std::this_thread::sleep_for(seconds(3));
        const int rebuildsBefore = countLog("gNeedRefresh flag is ON");
        const unsigned long resetsBefore = calls(ZORAP_FN_ResetConfigChange);
        EXPECT_GE(resetsBefore, 1u) << "every poll resets the indication";

        writeFile(file, nicDescription("VXN0000002", "enp7s1", true));
        ASSERT_TRUE(waitForLog("gNeedRefresh flag is ON", seconds(15), rebuildsBefore + 1));
        ASSERT_TRUE(waitForLog("After the call to buildFCPortList()", seconds(5), rebuildsBefore + 1));
        // The new description's port has a transceiver: the rebuilt list read it.
        int withTransceiver = 0;
        for (const auto& line : logLines())
            if (line.find("Transceiver on portID 7") != std::string::npos && line.find("No Transceiver") == std::string::npos)
                ++withTransceiver;
        EXPECT_GE(withTransceiver, 1);
        EXPECT_GE(calls(ZORAP_FN_UpdateBackupAdapterList), 1u);
        EXPECT_GE(calls(ZORAP_FN_SwapBackupToMainAdapterList), 1u);
        EXPECT_GE(countLog("After the call to ZORAP_SwapBackupToMainAdapterList()"), 1);
        // Requests go on answering after the rebuild.
        EXPECT_EQ(enumerateHost(host).instances.size(), 1u);
        ASSERT_TRUE(host.unload(true).ok());
    }
    zorap_sim_load_default();
}

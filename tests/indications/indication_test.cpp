// Indications through the shipped provider library and the embedded CIM host:
// the subscription gate, the adapter status alert of an FC port, the link
// alerts of the link watch, a rewritten adapter description driving both as a
// real server would see it. All of it at once under load is the stress test
// of tests/reliability.
#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <string>
#include <thread>
#include <vector>

#include "cimhost/text.h"
#include "provider_env.h"
#include "zorap_cna.h"
#include "zorap_sim_control.h"

using namespace provtest;
using cimhost::Flavour;
using cimhost::Host;
using cimhost::Indication;
using cimhost::Instance;
using cimhost::OpResult;
using cimhost::Type;
using cimhost::Value;
using std::chrono::milliseconds;
using std::chrono::seconds;

namespace {

const char kStatusClass[] = "VexlanCNA_AlertIndication_AdapterStatusChange";
const char kLinkUpClass[] = "Vexlan_NIC_IndicationEthernetPortLinkUp";
const char kLinkDownClass[] = "Vexlan_NIC_IndicationEthernetPortLinkDown";
const char kPort0[] = "31:00:02:7e:5a:16:00:42";
const char kInterface[] = "enp7s0";
const char kPollEverySecond[] = "LinkStatusPollIntervalSeconds=0\n";

// An FC HBA with two ports and a third whose port index (65536) no entry of
// the FC port list can carry, and a CNA with one NIC port.
std::string description(const char* port0State = "online", const char* linkState = "up")
{
    return std::string(R"({"adapters": [
  {"model": "VXF1622", "serialNumber": "VXF0000042", "chip": "RSX-1620", "kind": "fc-hba",
   "ports": [
     {"portNumber": 0, "protocols": [{"type": "fc", "portIndex": 0, "nodeWWN": "30:00:02:7e:5a:16:00:42",
                                      "portWWN": "31:00:02:7e:5a:16:00:42", "state": ")") +
           port0State + R"("}]},
     {"portNumber": 1, "protocols": [{"type": "fc", "portIndex": 1, "nodeWWN": "30:00:02:7e:5a:16:00:42",
                                      "portWWN": "31:00:02:7e:5a:16:00:43"}]},
     {"portNumber": 2, "protocols": [{"type": "fc", "portIndex": 65536, "nodeWWN": "30:00:02:7e:5a:16:00:42",
                                      "portWWN": "31:00:02:7e:5a:16:00:44"}]}]},
  {"model": "VXC2402", "serialNumber": "VXC0000007", "chip": "RSX-AB0",
   "ports": [{"portNumber": 7, "protocols": [{"type": "nic", "mac": "02:7e:5a:00:00:07",
                                              "interface": "enp7s0", "linkState": ")" +
           linkState + R"("}]}]}]})";
}

// Starts the provider with the logs on, a poll every second or two, and
// `json` as the adapter description (or the file `file`, when given).
void start(Host& host, Flavour flavour, const std::string& json, const char* file = nullptr)
{
    writeSettings(kLogsOn, kPollEverySecond);
    removeLog();
    if (file != nullptr) {
        writeFile(file, json);
        ASSERT_EQ(0, zorap_sim_load_file(file));
    } else {
        ASSERT_EQ(0, zorap_sim_load_json(json.c_str()));
    }
    zorap_sim_reset();
    prepareHost(host, flavour);
    ASSERT_TRUE(host.enumerateInstanceNames(classPath("Vexlan_Adapter_ComputerSystem")).ok());
    // The first poll has passed, so no rebuild is still to come.
    ASSERT_TRUE(waitForLog("Update_CNA_List looking at port", seconds(10)));
}

unsigned long identifier(const Indication& ind)
{
    return std::stoul(propertyText(ind.instance, "IndicationIdentifier"));
}

// Activates "SELECT * FROM <cls>" with `ns` as source namespace; the filter id.
int subscribe(Host& host, const char* cls, const char* ns = kNamespace)
{
    int id = 0;
    cimhost::Status st = host.activateFilter(std::string("SELECT * FROM ") + cls, ns, id);
    EXPECT_TRUE(st.ok()) << st.message;
    return id;
}

unsigned long calls(zorap_sim_function fn)
{
    return zorap_sim_call_count(fn);
}

// The FC port of port index 0 as the provider lists it.
Instance fcPort0(Host& host)
{
    for (const Instance& inst : enumerate(host, "Vexlan_FCHBA_FCPort").instances)
        if (propertyText(inst, "PermanentAddress") == "3100027E5A160042")
            return inst;
    ADD_FAILURE() << "no FC port 3100027E5A160042";
    return Instance();
}

std::uint64_t listedStatus(Host& host)
{
    const Instance port = fcPort0(host);
    const Value* v = port.property("OperationalStatus");
    return v != nullptr && !v->elems.empty() ? v->elems[0].u : 0;
}

// Changes port 0's live state and raises its alarm, as the library would.
void portChanges(std::uint8_t stateCode, int alarmType = 0)
{
    ASSERT_EQ(0, zorap_sim_set_fc_port_state(kPort0, stateCode));
    ASSERT_EQ(0, zorap_sim_raise_alarm(0, alarmType, "port 0 state changed"));
    ASSERT_EQ(0, zorap_sim_wait_alarms_idle(5000));
}

// The alert as MOF text, kept in tests/fixtures/indications/<name>.mof, with
// what changes from run to run replaced: its identifier (a number from 1 on)
// and its time (absolute), and the host's name. Every alert comes without a
// delivery error, names the provider's namespace in its path and goes to the
// interop namespace. VEXLAN_RECORD_INDICATIONS=<dir> writes the texts there.
void expectAlertAsKept(const Indication& ind, const std::string& name)
{
    EXPECT_TRUE(ind.error.empty()) << ind.error;
    EXPECT_EQ(ind.deliveredTo, "root/PG_InterOp");
    EXPECT_EQ(ind.instance.path.nameSpace, kNamespace);
    EXPECT_GE(identifier(ind), 1u);
    EXPECT_FALSE(scalar(ind.instance, "IndicationTime", Type::DateTime).dt.interval);
    Instance alert = ind.instance;
    for (auto& p : alert.properties)
        if (p.first == "IndicationIdentifier" || p.first == "IndicationTime")
            p.second = Value::fromString("@" + p.first + "@");
    std::string text = cimhost::formatInstanceMof(alert);
    replaceAll(text, expectedHost().name, "@HOST@");
    expectAsKept(text, std::string(VEXLAN_FIXTURES) + "/indications/" + name + ".mof",
                 std::getenv("VEXLAN_RECORD_INDICATIONS"));
}

// ---- One provider for the gate, the adapter status and the link alerts -------------

class Indications : public ::testing::Test {
protected:
    static void SetUpTestSuite()
    {
        host_ = new Host;
        start(*host_, Flavour::Pegasus, description());
    }
    static void TearDownTestSuite()
    {
        delete host_;
        host_ = nullptr;
        zorap_sim_reset();
    }
    void TearDown() override
    {
        for (int id : filters_)
            host_->deactivateFilter(id);
        Indication stray;
        while (host_->waitIndication(stray, milliseconds(0))) {
        }
        zorap_sim_reset();
    }
    int subscribeHere(const char* cls)
    {
        filters_.push_back(subscribe(*host_, cls));
        return filters_.back();
    }
    static Host& host() { return *host_; }
    static inline Host* host_ = nullptr;
    std::vector<int> filters_;
};

TEST_F(Indications, WithoutAFilterAnAlarmComparesNothingAndCallsNoLibraryFunction)
{
    const char kArrived[] = "Alarm generated: Device Number: 0; coreAlarmType: 0, stringParameter: port 0 state changed";
    const char kHanded[] = "OSSGenerateHostNotificationAlarm: Calling m_generateIndication: Device Number: 0; "
                           "coreAlarmType: 0, stringParameter: port 0 state changed";
    const int arrived = countLog(kArrived), handed = countLog(kHanded);
    const int rebuilt = countLog("m_generateIndication: Detected Port Status changed");
    const unsigned long properties = calls(ZORAP_FN_GetHbaDevicePortProperty);
    const unsigned long lists = calls(ZORAP_FN_GetAdapterList);
    portChanges(ZORAP_PORT_STATE_LOOPDOWN);
    EXPECT_EQ(countLog(kArrived), arrived + 1);
    EXPECT_EQ(countLog(kHanded), handed + 1);
    std::this_thread::sleep_for(milliseconds(200));
    EXPECT_EQ(calls(ZORAP_FN_GetHbaDevicePortProperty), properties);
    EXPECT_EQ(calls(ZORAP_FN_GetAdapterList), lists);
    EXPECT_EQ(countLog("m_generateIndication: Detected Port Status changed"), rebuilt);
    // A request reads the new state into the list; the alarm had no part in it.
    EXPECT_EQ(listedStatus(host()), 6u);
    portChanges(ZORAP_PORT_STATE_ONLINE);
    EXPECT_EQ(listedStatus(host()), 2u);
}

TEST_F(Indications, APortThatLosesItsLoopSendsErrorWithSeverity6AndTheListFollows)
{
    ASSERT_EQ(listedStatus(host()), 2u);
    const int rebuilt = countLog("m_generateIndication: Detected Port Status changed. Reinitializing devices...");
    const int delivered = countLog("Vexlan_CNA_Provider::m_generateIndication: Delivered");
    subscribeHere(kStatusClass);

    portChanges(ZORAP_PORT_STATE_LOOPDOWN);
    Indication ind;
    ASSERT_TRUE(host().waitIndication(ind, seconds(5)));
    expectAlertAsKept(ind, "port-loop-down");
    EXPECT_EQ(listedStatus(host()), 6u);
    EXPECT_EQ(countLog("m_generateIndication: Detected Port Status changed. Reinitializing devices..."), rebuilt + 1);
    EXPECT_TRUE(waitForLog("Vexlan_CNA_Provider::m_generateIndication: Delivered", seconds(2), delivered + 1));
    const unsigned long first = identifier(ind);

    // Nothing changed since: nothing sent. Alarm types other than 0 are
    // ignored even when the port did change. Back online, the next alert is
    // the very next number: neither of the two made or lost one.
    portChanges(ZORAP_PORT_STATE_LOOPDOWN);
    portChanges(ZORAP_PORT_STATE_ONLINE, 3);
    portChanges(ZORAP_PORT_STATE_ONLINE);
    ASSERT_TRUE(host().waitIndication(ind, seconds(5)));
    EXPECT_EQ(identifier(ind), first + 1);
    expectAlertAsKept(ind, "port-online");
    EXPECT_FALSE(host().waitIndication(ind, milliseconds(300)));
    EXPECT_EQ(listedStatus(host()), 2u);
}

TEST_F(Indications, TwoActivationsAndOneDeactivationLeaveTheGateOpen)
{
    const int activations = countLog("Entering Vexlan_CNA_Provider activateFilter");
    const int twoActive = countLog("Number of subscriptions is: 2");
    const int twoLeft = countLog("Number of subscriptions still available is: 2");
    const int oneLeft = countLog("Number of subscriptions still available is: 1");
    const int sent = countLog("Vexlan_CNA_Provider::m_generateIndication: Delivered");
    const int first = subscribeHere(kStatusClass);
    subscribeHere(kLinkDownClass);
    EXPECT_EQ(countLog("Entering Vexlan_CNA_Provider activateFilter"), activations + 2);
    EXPECT_EQ(countLog("Number of subscriptions is: 2"), twoActive + 1);
    ASSERT_TRUE(host().deactivateFilter(first).ok());
    filters_.erase(filters_.begin());
    EXPECT_EQ(countLog("Number of subscriptions still available is: 2"), twoLeft + 1);

    // Still open: the alert is sent (and matches no active filter here).
    const int delivered = host().counters().indicationsDelivered + host().counters().indicationsDropped;
    portChanges(ZORAP_PORT_STATE_LOOPDOWN);
    ASSERT_TRUE(waitForLog("Vexlan_CNA_Provider::m_generateIndication: Delivered", seconds(5), sent + 1));
    EXPECT_EQ(host().counters().indicationsDelivered + host().counters().indicationsDropped, delivered + 1);

    // The last deactivation closes it: the next change sends nothing.
    ASSERT_TRUE(host().deactivateFilter(filters_.front()).ok());
    filters_.clear();
    EXPECT_EQ(countLog("Number of subscriptions still available is: 1"), oneLeft + 1);
    const unsigned long properties = calls(ZORAP_FN_GetHbaDevicePortProperty);
    portChanges(ZORAP_PORT_STATE_ONLINE);
    std::this_thread::sleep_for(milliseconds(200));
    EXPECT_EQ(calls(ZORAP_FN_GetHbaDevicePortProperty), properties);
    EXPECT_EQ(countLog("Vexlan_CNA_Provider::m_generateIndication: Delivered"), sent + 1);
    EXPECT_EQ(listedStatus(host()), 2u);
}

TEST_F(Indications, ADeviceTheListCannotNameIsReportedAsNotFound)
{
    subscribeHere(kStatusClass);
    ASSERT_EQ(0, zorap_sim_raise_alarm(65536, 0, "port 2"));
    Indication ind;
    ASSERT_TRUE(host().waitIndication(ind, seconds(5)));
    expectAlertAsKept(ind, "port-not-found");
    // The list can never name it, so every alarm on it sends again.
    ASSERT_EQ(0, zorap_sim_raise_alarm(65536, 0, "port 2"));
    ASSERT_TRUE(host().waitIndication(ind, seconds(5)));
    EXPECT_EQ(propertyText(ind.instance, "AlertingManagedElement"), "NOT FOUND");
}

TEST_F(Indications, ALinkDownThenUpSendsLinkDownThenLinkUpFromThePollingThread)
{
    const int downs = countLog("Generate LINK_DOWN event"), ups = countLog("Generate LINK_UP event");
    const int downTraces = countLog("Indication for link status change Down");
    const int sent = countLog("Vexlan_CNA_HBAProvider::generatePortAlertIndication: Delivered");
    subscribeHere(kLinkUpClass);
    subscribeHere(kLinkDownClass);

    auto started = std::chrono::steady_clock::now();
    ASSERT_EQ(0, zorap_sim_set_link_state(kInterface, ZORAP_LINK_DOWN));
    Indication down;
    ASSERT_TRUE(host().waitIndication(down, seconds(5)));
    EXPECT_LT(std::chrono::steady_clock::now() - started, seconds(3)) << "one poll interval";
    ASSERT_EQ(0, zorap_sim_set_link_state(kInterface, ZORAP_LINK_UP));
    Indication up;
    ASSERT_TRUE(host().waitIndication(up, seconds(5)));
    EXPECT_EQ(identifier(up), identifier(down) + 1);

    expectAlertAsKept(down, "link-down");
    expectAlertAsKept(up, "link-up");
    EXPECT_EQ(countLog("Generate LINK_DOWN event"), downs + 1);
    EXPECT_EQ(countLog("Generate LINK_UP event"), ups + 1);
    EXPECT_EQ(countLog("Indication for link status change Down"), downTraces + 1);
    EXPECT_TRUE(waitForLog("Vexlan_CNA_HBAProvider::generatePortAlertIndication: Delivered", seconds(2), sent + 2));
    // The stored state follows the link: the next polls send nothing.
    const int looks = countLog("Update_CNA_List looking at port");
    ASSERT_TRUE(waitForLog("Update_CNA_List looking at port", seconds(5), looks + 2));
    Indication extra;
    EXPECT_FALSE(host().waitIndication(extra, milliseconds(0)));
}

TEST_F(Indications, ALinkChangeWithTheGateClosedBuildsNothing)
{
    const int disabled = countLog("Indication generation is currently DISABLED...");
    const int downs = countLog("Generate LINK_DOWN event");
    ASSERT_EQ(0, zorap_sim_set_link_state(kInterface, 3));   // testing counts as down
    ASSERT_TRUE(waitForLog("Indication generation is currently DISABLED...", seconds(5), disabled + 1));
    EXPECT_EQ(countLog("Generate LINK_DOWN event"), downs + 1);
    subscribeHere(kLinkUpClass);
    const int before = countLog("Vexlan_CNA_HBAProvider::generatePortAlertIndication: Delivered");
    ASSERT_EQ(0, zorap_sim_set_link_state(kInterface, ZORAP_LINK_UP));
    Indication up;
    ASSERT_TRUE(host().waitIndication(up, seconds(5)));
    EXPECT_EQ(up.instance.className(), kLinkUpClass);
    EXPECT_TRUE(waitForLog("Vexlan_CNA_HBAProvider::generatePortAlertIndication: Delivered", seconds(2), before + 1));
}

// ---- A rewritten adapter description, as an administrator drives a real server --------

TEST(DescriptionFile, ARewrittenFileSendsTheFCAlertAndTheLinkAlertWithoutARebuild)
{
    const char file[] = "adapters.json";
    {
        Host host;
        start(host, Flavour::Sfcb, description(), file);
        // As in sfcb, the filters name the namespace of the indication
        // classes, and the provider delivers to root/PG_InterOp: sfcb matches
        // by class only.
        int status = subscribe(host, kStatusClass, "root/vexlan_cmpi");
        int down = subscribe(host, kLinkDownClass, "root/vexlan_cmpi");
        EXPECT_EQ(countLog("Entering Vexlan_CNA_Provider authorizeFilter"), 2);
        EXPECT_EQ(countLog("Entering Vexlan_CNA_Provider mustPoll"), 2);
        const int rebuilds = countLog("gNeedRefresh flag is ON");

        writeFile(file, description("loopdown", "down"));
        std::vector<std::string> classes;
        Indication ind;
        while (classes.size() < 2 && host.waitIndication(ind, seconds(6))) {
            classes.push_back(ind.instance.className());
            EXPECT_EQ(ind.nameSpace, "root/PG_InterOp");
            EXPECT_TRUE(ind.error.empty()) << ind.error;
        }
        std::sort(classes.begin(), classes.end());
        EXPECT_EQ(classes, (std::vector<std::string>{kStatusClass, kLinkDownClass}));
        EXPECT_EQ(countLog("gNeedRefresh flag is ON"), rebuilds);
        EXPECT_EQ(listedStatus(host), 6u);
        ASSERT_TRUE(host.deactivateFilter(status).ok());
        ASSERT_TRUE(host.deactivateFilter(down).ok());
        ASSERT_TRUE(host.unload(true).ok());
    }
    zorap_sim_load_default();
}

}  // namespace

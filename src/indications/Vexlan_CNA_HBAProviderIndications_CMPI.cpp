// Adapter status indications: the alarm callback, its hand-off to the polling
// thread, and VexlanCNA_AlertIndication_AdapterStatusChange of an FC port whose
// state no longer matches the FC port list.
#include "indications/Vexlan_CNA_HBAProviderIndications_CMPI.h"

#include <pthread.h>

#include <cstdarg>
#include <cstdio>
#include <cstring>
#include <list>
#include <new>
#include <mutex>
#include <string>

#include "classes/ClassModule.h"
#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "classes/Vexlan_FC_FCPort_CMPI.h"
#include "inventory/AdapterWalk.h"
#include "state/ProviderState.h"
#include "support/Vexlan_FC_Utils_CMPI.h"

std::atomic<std::uint32_t> g_indicationIdentifier{0};

using indication::debug;

namespace {

const char kAdapterStatusClass[] = "VexlanCNA_AlertIndication_AdapterStatusChange";
const char kFCPortClass[] = "Vexlan_FCHBA_FCPort";
const char kSystemClass[] = "Vexlan_Adapter_ComputerSystem";

const char* const kPortStatusTexts[] = {
    "Unknown", "Other", "OK", "Degraded", "Stressed", "Predicted Failure", "Error",
    "Non-Recoverable Error", "Starting", "Stopping", "Stopped", "In Service", "No Contact",
    "Lost Communication", "Aborted", "Dormant", "Supporting Entity in Error", "Completed", "Power Mode",
};

// ---- Hand-off ------------------------------------------------------------------

// An alarm's text is kept up to this many bytes.
constexpr std::size_t kAlarmTextLimit = 4095;
// Alarms waiting for the polling thread beyond this many are dropped: a
// library that floods alarms while a rebuild holds the thread can't make the
// provider grow without bound.
constexpr std::size_t kPendingAlarmLimit = 1024;

struct PendingAlarm {
    unsigned int device;
    int type;
    int length;
    std::string text;
};

// Guards the receiver and the queue. Taken before the receiver's mutex.
std::mutex gHandOffMutex;
ThreadArgs* gReceiver = nullptr;
// Made in storage of its own and never destroyed: the library's unload code
// stops the polling thread while the library's other objects are being
// destroyed, and the thread takes this queue until it stops (a list: empty,
// as the thread leaves it, it holds no memory).
using AlarmQueue = std::list<PendingAlarm>;
alignas(AlarmQueue) unsigned char pendingStorage[sizeof(AlarmQueue)];
AlarmQueue& gPending = *new (pendingStorage) AlarmQueue;
// Set with the receiver's mutex held too, so the polling thread's wait can't
// miss it.
std::atomic<bool> gAlarmsPending{false};

// The alarm's text: at most its given length (and kAlarmTextLimit), up to the
// first NUL, so an unterminated text is never read past.
std::string alarmText(int length, const unsigned char* text)
{
    if (text == nullptr || length <= 0)
        return std::string();
    std::size_t limit = static_cast<std::size_t>(length) < kAlarmTextLimit ? static_cast<std::size_t>(length)
                                                                          : kAlarmTextLimit;
    const char* chars = reinterpret_cast<const char*>(text);
    return std::string(chars, strnlen(chars, limit));
}

void handOver(PendingAlarm&& alarm)
{
    std::lock_guard<std::mutex> lock(gHandOffMutex);
    // The receiver is set only while the polling thread runs, so its provider
    // is alive here.
    if (gReceiver == nullptr) {
        debug("OSSGenerateHostNotificationAlarm: polling thread not running, alarm of device %u dropped",
              alarm.device);
        return;
    }
    if (!alarmIsWanted(*gReceiver->provider, alarm.type))
        return;
    if (gPending.size() >= kPendingAlarmLimit) {
        debug("OSSGenerateHostNotificationAlarm: %u alarms waiting, alarm of device %u dropped",
              static_cast<unsigned>(gPending.size()), alarm.device);
        return;
    }
    gPending.push_back(std::move(alarm));
    ProviderLockGuard wake(&gReceiver->mutex);
    gAlarmsPending = true;
    pthread_cond_broadcast(&gReceiver->changed);
}

// The alarms handed over so far; later ones wait for the next round, so a
// stream of alarms never holds off the poll.
AlarmQueue takePendingAlarms()
{
    AlarmQueue taken;
    std::lock_guard<std::mutex> lock(gHandOffMutex);
    taken.swap(gPending);
    gAlarmsPending = false;
    return taken;
}

// ---- The FC port and its device --------------------------------------------------

int findFCPortEntry(unsigned int deviceNum)
{
    for (int i = 0; i < g_FCPortList.count && g_FCPortList.entries != nullptr; ++i)
        if (g_FCPortList.entries[i].deviceNumber == deviceNum)
            return i;
    return -1;
}

// In each physical port the first FC function with this port index; the walk
// goes to the end, so the last physical port with one gives the device.
_tagZORAPSDMDevice* findFCDevice(_zorap_adapter_list_t* adapters, unsigned int deviceNum)
{
    _tagZORAPSDMDevice* device = nullptr;
    forEachPhyPortIn(adapters, [&](_zorap_adapter_t*, _zorap_phy_port_t* phy) {
        if (phy->protocolList == nullptr)
            return;
        for (_zorap_protocol_t* p = phy->protocolList->firstProtocol; p != nullptr; p = p->next) {
            if (p->protocolType < 2 && p->fcDevice.portIndex == deviceNum) {
                device = &p->fcDevice;
                return;
            }
        }
    });
    return device;
}

// OperationalStatus and PerceivedSeverity of a port state code. Unlike the
// FC port list, a state other than online and loop down counts as 0.
struct PortStatus {
    unsigned short status;
    unsigned short severity;
};

PortStatus statusOfStateCode(std::uint8_t code)
{
    switch (code) {
    case ZORAP_PORT_STATE_ONLINE:
        return {2, 2};
    case ZORAP_PORT_STATE_LOOPDOWN:
        return {6, 6};
    default:
        return {0, 4};
    }
}

// The port's live status; 0 with `rc` set when the library can't tell.
PortStatus livePortStatus(_tagZORAPSDMDevice* device, ZORAP_STATUS& rc)
{
    _zorap_port_property_t record{};
    rc = ZORAP_GetHbaDevicePortProperty(device->deviceHandle, 0, &record);
    return rc == 0 ? statusOfStateCode(record.portStateCode) : PortStatus{0, 4};
}

}  // namespace

const char* GetPortStatusString(unsigned short status)
{
    return status < sizeof(kPortStatusTexts) / sizeof(kPortStatusTexts[0]) ? kPortStatusTexts[status] : "Unknown";
}

bool alarmIsWanted(const ProviderState& provider, int alarmType)
{
    return provider.initialized && IndicationGate::m_bIndicationEnabled && alarmType == 0;
}

int OSSGenerateHostNotificationAlarm(unsigned int deviceNumber, int coreAlarmType, int stringParameterLength,
                                     unsigned char* stringParameter)
{
    try {
        std::string text = alarmText(stringParameterLength, stringParameter);
        debug("Alarm generated: Device Number: %u; coreAlarmType: %d, stringParameter: %s", deviceNumber,
              coreAlarmType, text.c_str());
        if (g_RunningProviderState.load() == nullptr) {
            debug("OSSGenerateHostNotificationAlarm: ***** g_Vexlan_CNA_Provider is NULL");
            return 0;
        }
        debug("OSSGenerateHostNotificationAlarm: Calling m_generateIndication: Device Number: %u; coreAlarmType: "
              "%d, stringParameter: %s",
              deviceNumber, coreAlarmType, text.c_str());
        handOver(PendingAlarm{deviceNumber, coreAlarmType, stringParameterLength, std::move(text)});
    } catch (...) {
        debug("Exception generated when calling m_generateIndication");
    }
    return 0;
}

void startAlarmHandOff(ThreadArgs& args)
{
    std::lock_guard<std::mutex> lock(gHandOffMutex);
    gPending.clear();
    gReceiver = &args;
    gAlarmsPending = false;
}

void stopAlarmHandOff()
{
    std::lock_guard<std::mutex> lock(gHandOffMutex);
    gReceiver = nullptr;
    gPending.clear();
    gAlarmsPending = false;
}

bool alarmsPending()
{
    return gAlarmsPending;
}

void runPendingAlarms(ThreadArgs& args)
{
    for (PendingAlarm& alarm : takePendingAlarms()) {
        ProviderLockGuard lock(&ProviderLocks::provider_lock);
        try {
            std::string text = alarm.text;   // m_generateIndication takes a writable text
            m_generateIndication(args, alarm.device, alarm.type, alarm.length,
                                 reinterpret_cast<unsigned char*>(&text[0]));
        } catch (...) {
            debug("Exception generated when calling m_generateIndication");
        }
    }
}

// ---- What both kinds of alert share -------------------------------------------------

namespace indication {

const char kIndicationNamespace[] = "root/vexlan_cmpi";
const char kDeliveryNamespace[] = "root/PG_InterOp";

void debug(const char* format, ...)
{
    if (!g_EnableDebugPrint)
        return;
    char text[kVexlanLogMessageSize];
    va_list args;
    va_start(args, format);
    std::vsnprintf(text, sizeof(text), format, args);
    va_end(args);
    Vexlan_FC_Utils_CMPI::DebugPrint("%s", text);
}

BrokerMark::BrokerMark(const CmpiBroker* broker)
{
    const CMPIBroker* mb = broker != nullptr ? broker->getEnc() : nullptr;
    if (mb == nullptr || mb->mft == nullptr || mb->mft->mark == nullptr || mb->mft->release == nullptr)
        return;
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIGcStat* mark = mb->mft->mark(mb, &rc);
    if (rc.rc == CMPI_RC_OK && mark != nullptr) {
        broker_ = mb;
        mark_ = mark;
    }
}

BrokerMark::~BrokerMark()
{
    if (mark_ != nullptr)
        broker_->mft->release(broker_, mark_);
}

CmpiInstance startAlert(const char* className)
{
    CmpiInstance alert{CmpiObjectPath(kIndicationNamespace, className)};
    char identifier[16];
    std::snprintf(identifier, sizeof(identifier), "%u", static_cast<unsigned>(++g_indicationIdentifier));
    alert.setProperty("IndicationIdentifier", CmpiData(identifier));
    alert.setProperty("IndicationTime", CmpiData(CmpiDateTime()));
    alert.setProperty("CorrelatedIndications", stringArray({""}));
    return alert;
}

void finishAlert(CmpiInstance& alert)
{
    alert.setProperty("SystemCreationClassName", CmpiData(kSystemClass));
    alert.setProperty("SystemName", CmpiData(hostName_ComputerSystem));
    alert.setProperty("ProviderName", CmpiData("Vexlan CNA Provider"));
}

void deliverAlert(ThreadArgs& args, const CmpiInstance& alert, const DeliveryTexts& texts)
{
    debug("%s", texts.delivering);
    try {
        if (args.broker == nullptr || args.context == nullptr)
            throw CmpiStatus(CMPI_RC_ERR_FAILED);
        args.broker->deliverIndication(*args.context, kDeliveryNamespace, alert);
        debug("%s", texts.delivered);
    } catch (...) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("%s", texts.failed);
    }
}

}  // namespace indication

// ---- The adapter status alert --------------------------------------------------------

void m_generateIndication(ThreadArgs& args, unsigned int deviceNum, int alarmType, int rsltParam,
                          unsigned char* strParam)
{
    if (!alarmIsWanted(*args.provider, alarmType))
        return;

    // First comparison: the list's status against the port's live one.
    int index = findFCPortEntry(deviceNum);
    _zorap_adapter_list_t* adapters = ZORAP_GetAdapterList();
    if (adapters == nullptr)
        return;
    _tagZORAPSDMDevice* device = findFCDevice(adapters, deviceNum);
    ZORAP_STATUS rc = 0;
    unsigned short oldStatus = index >= 0 && device != nullptr ? g_FCPortList.entries[index].operationalStatus : 0;
    unsigned short newStatus = device != nullptr ? livePortStatus(device, rc).status : 0;
    if (oldStatus == newStatus)
        return;

    indication::BrokerMark mark(args.broker);
    CmpiInstance alert = indication::startAlert(kAdapterStatusClass);

    char element[1024] = "NOT FOUND";
    index = findFCPortEntry(deviceNum);
    if (index >= 0)
        std::snprintf(element, sizeof(element),
                      "%s:%s.SystemCreationClassName=\"%s\",SystemName=\"%s\",CreationClassName=\"%s\",DeviceID=\"%s\"",
                      indication::kIndicationNamespace, kFCPortClass, kSystemClass, hostName_ComputerSystem,
                      kFCPortClass, g_FCPortList.entries[index].deviceId);
    alert.setProperty("AlertingManagedElement", CmpiData(element));
    alert.setProperty("AlertingElementFormat", CmpiData(static_cast<CMPIUint16>(index >= 0 ? 2 : 1)));
    alert.setProperty("AlertType", CmpiData(static_cast<CMPIUint16>(5)));

    device = findFCDevice(adapters, deviceNum);
    alert.setProperty("OwningEntity", CmpiData("Vexlan"));
    alert.setProperty("MessageID", CmpiData("Core9"));

    // The list is rebuilt below: what the message needs of the entry is
    // copied first.
    char portWWN[256] = "";
    char serialNumber[256] = "";
    oldStatus = 0;
    if (device != nullptr && index >= 0) {
        const FCPortEntry& entry = g_FCPortList.entries[index];
        std::snprintf(portWWN, sizeof(portWWN), "%.*s", static_cast<int>(sizeof(entry.portWWN)), entry.portWWN);
        std::snprintf(serialNumber, sizeof(serialNumber), "%.*s", static_cast<int>(sizeof(entry.serialNumber)),
                      entry.serialNumber);
        oldStatus = entry.operationalStatus;
    }

    // Second comparison, with the severity beside the status.
    PortStatus now = {0, 4};
    if (device == nullptr) {
        debug("Port Status: Could not detect!");
        debug("m_generateIndication: Adapter Status changed, pDevice is NULL!");
    } else {
        now = livePortStatus(device, rc);
        if (rc != 0) {
            debug("Port Status: Could not detect!");
            debug("m_generateIndication: error calling SDGetHbaDevicePortProperty return %x", rc);
        }
    }
    if (oldStatus == now.status)
        return;

    debug("m_generateIndication: deviceNum=%d, alarmType=%d, rsltParam=%d, strParam=%s...", static_cast<int>(deviceNum),
          alarmType, rsltParam, strParam != nullptr ? reinterpret_cast<const char*>(strParam) : "");
    debug("m_generateIndication: Detected Port Status changed. Reinitializing devices...");
    removeFCPortList();
    buildFCPortList();

    const char* statusText = GetPortStatusString(now.status);
    char message[1024];
    std::snprintf(message, sizeof(message), "FC Port %s in %s %s status changed to %s", portWWN, "HBA", serialNumber,
                  statusText);
    char eventId[1040];
    std::snprintf(eventId, sizeof(eventId), "%s;%d", element, 1);
    alert.setProperty("Message", CmpiData(message));
    alert.setProperty("MessageArguments", stringArray({portWWN, "HBA", serialNumber, statusText}));
    alert.setProperty("EventID", CmpiData(eventId));
    alert.setProperty("PerceivedSeverity", CmpiData(static_cast<CMPIUint16>(now.severity)));
    alert.setProperty("ProbableCause", CmpiData(static_cast<CMPIUint16>(66)));
    indication::finishAlert(alert);
    debug("Vexlan_CNA_HBAProvider::messageStr=%s", message);

    debug("Calling Try to deliver indication");
    indication::deliverAlert(args, alert,
                             {"Vexlan_CNA_Provider::m_generateIndication: Delivering...",
                              "Vexlan_CNA_Provider::m_generateIndication: Delivered",
                              "Vexlan_CNA_Provider::m_generateIndication: Error delivering indication"});
    debug("Returning from m_generateIndication...\n");
}

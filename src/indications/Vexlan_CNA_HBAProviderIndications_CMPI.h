// Indications of the provider: the adapter library's alarm callback, the
// adapter status alert of an FC port (m_generateIndication) and what it shares with the Ethernet link alerts of
// Vexlan_NIC_ProviderIndications.cpp.
//
// Threads. The adapter library calls OSSGenerateHostNotificationAlarm on a
// thread of its own, which the CIM server never attached and which must not
// wait for provider_lock: cleanupAgent holds that lock while it unregisters
// the callback, and a library may wait there for a running callback. So the
// callback only logs and hands the alarm to the polling thread, which is
// attached to the broker and wakes at once; the polling thread compares,
// rebuilds the FC port list and delivers under provider_lock. Every
// indication therefore leaves from the polling thread, and none after cleanup
// has stopped it.
#ifndef VEXLAN_INDICATIONS_VEXLAN_CNA_HBAPROVIDERINDICATIONS_CMPI_H
#define VEXLAN_INDICATIONS_VEXLAN_CNA_HBAPROVIDERINDICATIONS_CMPI_H

#include <atomic>
#include <cstdint>

#include "CmpiImpl.h"

struct ProviderState;
struct ThreadArgs;

// IndicationIdentifier of the last indication made; 0 at load, the first one
// sent is "1". Shared by both kinds of alert.
extern std::atomic<std::uint32_t> g_indicationIdentifier;

// The text of an OperationalStatus value; above 18: "Unknown".
const char* GetPortStatusString(unsigned short status);

// The alarm callback registered with the adapter library. Always returns 0.
int OSSGenerateHostNotificationAlarm(unsigned int deviceNumber, int coreAlarmType, int stringParameterLength,
                                     unsigned char* stringParameter);

// True when an alarm of this type can lead to an indication: the provider's
// first build has finished, a filter is active and the type is 0.
bool alarmIsWanted(const ProviderState& provider, int alarmType);

// The adapter status alert, on the polling thread under provider_lock, with
// the thread's block: compares the FC port's live state with the FC port list
// and, when it changed, rebuilds the list and sends the alert.
void m_generateIndication(ThreadArgs& args, unsigned int deviceNum, int alarmType, int rsltParam,
                          unsigned char* strParam);

// ---- Hand-off of alarms to the polling thread -----------------------------------
// The polling thread receives alarms from startAlarmHandOff (after it attached)
// to stopAlarmHandOff (before it detaches); alarms at other times are dropped.
// A new alarm sets alarmsPending() and signals args.changed under args.mutex.
void startAlarmHandOff(ThreadArgs& args);
void stopAlarmHandOff();
bool alarmsPending();
// On the polling thread: m_generateIndication for each alarm handed over, in
// order, each under provider_lock.
void runPendingAlarms(ThreadArgs& args);

// ---- What both kinds of alert share ---------------------------------------------
namespace indication {

// A debug log line when the debug log is on (the line cut as DebugPrint cuts it).
void debug(const char* format, ...) __attribute__((format(printf, 1, 2)));

// The namespace of the indication's path and the one it is delivered to.
extern const char kIndicationNamespace[];   // "root/vexlan_cmpi"
extern const char kDeliveryNamespace[];     // "root/PG_InterOp"

// Everything the broker makes between construction and destruction is
// released at the end (the broker's mark and release), so that indications
// made on the long-lived polling thread do not pile up until it detaches. A
// broker without them releases at detach, as before.
class BrokerMark {
public:
    explicit BrokerMark(const CmpiBroker* broker);
    ~BrokerMark();
    BrokerMark(const BrokerMark&) = delete;
    BrokerMark& operator=(const BrokerMark&) = delete;

private:
    const CMPIBroker* broker_ = nullptr;
    CMPIGcStat* mark_ = nullptr;
};

// A new indication of `className` in kIndicationNamespace with the next
// IndicationIdentifier, IndicationTime now and CorrelatedIndications {""}.
CmpiInstance startAlert(const char* className);
// SystemCreationClassName, SystemName and ProviderName, the last three.
void finishAlert(CmpiInstance& alert);

// The log lines around one delivery.
struct DeliveryTexts {
    const char* delivering;
    const char* delivered;
    const char* failed;   // error log; the indication is dropped
};
// Delivers to kDeliveryNamespace with the polling thread's context.
void deliverAlert(ThreadArgs& args, const CmpiInstance& alert, const DeliveryTexts& texts);

}  // namespace indication

#endif

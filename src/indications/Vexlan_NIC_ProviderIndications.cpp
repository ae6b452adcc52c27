// Port alert indications: Vexlan_NIC_IndicationEthernetPortLinkUp and
// ...LinkDown, sent by the link watch on the polling thread when a NIC port's
// link state changed. The decision that it changed is the caller's.
#include "indications/Vexlan_NIC_ProviderIndications.h"

#include <cstdio>

#include "classes/ClassModule.h"
#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "classes/Vexlan_NIC_NetworkPort.h"
#include "indications/Vexlan_CNA_HBAProviderIndications_CMPI.h"
#include "inventory/AdapterFunc.h"
#include "state/IndicationGate.h"
#include "state/PollingBlock.h"
#include "support/Vexlan_FC_Utils_CMPI.h"

using indication::debug;

namespace {

// The two columns of a link alert: alarm type 1 is link up, 2 link down.
struct PortAlert {
    const char* className;
    const char* traceLine;
    const char* description;
    const char* probableCauseDescription;
    CMPIUint16 perceivedSeverity;
    const char* recommendedAction;
    const char* eventId;
    const char* messageId;
    const char* messageVerb;   // "The network port %s has been <verb>"
};

const PortAlert kPortAlerts[] = {
    {"Vexlan_NIC_IndicationEthernetPortLinkUp", "Indication for link status change UP\n", "Link Status Up",
     "This alarm is generated when the ethernet port link status changes to Up", 2, "No action required", "1",
     "PLAT0260", "enabled"},
    {"Vexlan_NIC_IndicationEthernetPortLinkDown", "Indication for link status change Down\n", "Link Status Down",
     "This alarm is generated when the ethernet port link status changes to Down", 3,
     "Make sure that a cable was not accidentally removed from the CNA or switch", "2", "PLAT0261", "disabled"},
};

const char kNetworkPortClass[] = "Vexlan_NIC_NetworkPort";
const char kSystemClass[] = "Vexlan_Adapter_ComputerSystem";

void buildAndDeliver(ThreadArgs& args, const PortAlert& kind, _CNAStruc* adapter, _CNAPortStruc* port)
{
    indication::BrokerMark mark(args.broker);
    CmpiInstance alert = indication::startAlert(kind.className);

    char deviceId[kNicKeyTextSize];
    char element[1024];
    std::snprintf(element, sizeof(element),
                  "%s:%s.SystemCreationClassName=\"%s\",SystemName=\"%s\",CreationClassName=\"%s\",DeviceID=\"%s\"",
                  indication::kIndicationNamespace, kNetworkPortClass, kSystemClass, hostName_ComputerSystem,
                  kNetworkPortClass, calcDeviceID_NetworkPort(adapter, port, deviceId));
    alert.setProperty("AlertingManagedElement", CmpiData(element));
    alert.setProperty("AlertingElementFormat", CmpiData(static_cast<CMPIUint16>(2)));

    debug("%s", kind.traceLine);
    char elementName[kNicKeyTextSize];
    calcElementName_NetworkPort(adapter, port, elementName);
    char systemPath[512];
    std::snprintf(systemPath, sizeof(systemPath), "%s:%s.CreationClassName=\"%s\",Name=\"%s\"",
                  indication::kIndicationNamespace, kSystemClass, kSystemClass, hostName_ComputerSystem);
    char message[512];
    std::snprintf(message, sizeof(message), "The network port %s has been %s", elementName, kind.messageVerb);
    alert.setProperty("Description", CmpiData(kind.description));
    alert.setProperty("ProbableCause", CmpiData(static_cast<CMPIUint16>(66)));
    alert.setProperty("ProbableCauseDescription", CmpiData(kind.probableCauseDescription));
    alert.setProperty("AlertType", CmpiData(static_cast<CMPIUint16>(2)));
    alert.setProperty("PerceivedSeverity", CmpiData(kind.perceivedSeverity));
    alert.setProperty("RecommendedActions", stringArray({kind.recommendedAction}));
    alert.setProperty("EventID", CmpiData(kind.eventId));
    alert.setProperty("OwningEntity", CmpiData("DMTF"));
    alert.setProperty("MessageID", CmpiData(kind.messageId));
    alert.setProperty("MessageArguments", stringArray({elementName, systemPath}));
    alert.setProperty("Message", CmpiData(message));
    indication::finishAlert(alert);

    indication::deliverAlert(args, alert,
                             {"Vexlan_CNA_HBAProvider::generatePortAlertIndication: Delivering...\n",
                              "Vexlan_CNA_HBAProvider::generatePortAlertIndication: Delivered\n",
                              "Vexlan_NIC_Provider::generatePortAlertIndication: Error delivering indication\n"});
}

}  // namespace

void generatePortAlertIndication(ThreadArgs& args, int alarmType, _CNAStruc* adapter, _CNAPortStruc* port)
{
    debug("Entering Vexlan_NIC_Provider generatePortAlertIndication\n");
    if (alarmType != 1 && alarmType != 2) {
        debug("Alarm type not recognized.\n");
        return;
    }
    const PortAlert& kind = kPortAlerts[alarmType - 1];
    if (!IndicationGate::m_bIndicationEnabled) {
        debug("Indication generation is currently DISABLED...\n");
        return;
    }
    debug("Indication generation is currently ENABLED...\n");
    // A failure while the alert is built drops it like a failed delivery, and
    // the link watch goes on with the next port.
    try {
        buildAndDeliver(args, kind, adapter, port);
    } catch (...) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("Vexlan_NIC_Provider::generatePortAlertIndication: Error delivering indication\n");
    }
    debug("Returning from generatePortAlertIndication...\n");
}

// Vexlan_NIC_IPProtocolEndpointCapabilities as a NIC class module: one
// instance per port, the only one of its group without the system keys.
#include "classes/Vexlan_NIC_IPProtocolEndPointCapabilities.h"

#include "classes/NicClassModule.h"

namespace {

const PropertyRow<NicRecord> kProperties[] = {
    {"InstanceID", CMPI_string, nicMacValue},
    {"RequestedStatesSupported", CMPI_uint16A, CLASS_VALUE(NicRecord, uint16Array({12}))},
    {"ElementName", CMPI_string, NIC_TEXT("IPProtocolEndPointCapabilities")},
    {"Caption", CMPI_string, nicMacValue},
};

const char* const kKeys[] = {"InstanceID", nullptr};

const NicClassModule kModule =
    NicClassModule("Vexlan_NIC_IPProtocolEndPointCapabilities")
        .walk(NicWalk::Ports)
        .key("InstanceID", nicMacKey)
        .properties(kProperties)
        .keys(kKeys)
        .enumInstancesTexts(
            {"Vexlan_NIC_IPProtocolEndPointCapabilities enumInstances was called\n",
             "Vexlan_NIC_IPProtocolEndPointCapabilities: Error getting namespace in enumInstances\n",
             "Vexlan_NIC_IPProtocolEndPointCapabilities: Error getting ClassName in enumInstances\n"})
        .enumInstanceNamesTexts(
            {"Vexlan_NIC_IPProtocolEndPointCapabilities enumInstanceNames was called\n",
             "Vexlan_NIC_IPProtocolEndPointCapabilities: Error getting namespace in enumInstanceNames\n",
             "Vexlan_NIC_IPProtocolEndPointCapabilities: Error getting ClassName in enumInstanceNames\n"})
        .getInstanceTexts({"Vexlan_NIC_IPProtocolEndPointCapabilities getInstance was called\n",
                           "Vexlan_NIC_IPProtocolEndPointCapabilities: Error getting namespace in getInstance\n",
                           "Vexlan_NIC_IPProtocolEndPointCapabilities: Error getting ClassName in getInstance\n"})
        .makeTexts("Vexlan_NIC_IPProtocolEndPointCapabilities makePath was called\n",
                   "Vexlan_NIC_IPProtocolEndPointCapabilities makeInstance was called\n")
        .keyErrors("Vexlan_NIC_IPProtocolEndPointCapabilities: Error getting InstanceID key in getInstance\n",
                   {"Vexlan_NIC_IPProtocolEndPointCapabilities: Error invalid key data type in getInstance (", ")"});

}  // namespace

VEXLAN_NIC_CLASS_OPERATIONS(IPProtocolEndPointCapabilities, kModule, (_CNAPortStruc * port),
                            (NicRecord{nullptr, port, nullptr}))

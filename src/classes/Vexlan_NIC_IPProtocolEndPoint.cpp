// Vexlan_NIC_IPProtocolEndpoint as a NIC class module: one instance per port.
#include "classes/Vexlan_NIC_IPProtocolEndPoint.h"

#include "classes/NicClassModule.h"
#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "support/Vexlan_NIC_Utils.h"

namespace {

// The first IPv6 address, only when the port has any: without one the
// property is absent, not empty.
PropertyValue ipv6Address(const NicRecord& r)
{
    if (r.port->ipProperties.ipv6Addresses == nullptr)
        return std::nullopt;
    return CmpiData(nicadapter_IPToStr(r.port->ipProperties.ipv6Addresses));
}

const PropertyRow<NicRecord> kProperties[] = {
    {"SystemCreationClassName", CMPI_string, NIC_TEXT("Vexlan_Adapter_ComputerSystem")},
    {"SystemName", CMPI_string, NIC_TEXT(hostName_ComputerSystem)},
    {"CreationClassName", CMPI_string, NIC_TEXT("Vexlan_NIC_IPProtocolEndpoint")},
    {"Name", CMPI_string, nicMacValue},
    {"AddressOrigin", CMPI_uint16, NIC_UINT16(4)},
    {"IPv4Address", CMPI_string, CLASS_VALUE(NicRecord, CmpiData(nicadapter_IPToStr(&e.port->ipProperties.ipv4Address)))},
    {"SubnetMask", CMPI_string, CLASS_VALUE(NicRecord, CmpiData(nicadapter_IPToStr(&e.port->ipProperties.subnetMask)))},
    {"IPv6Address", CMPI_string, ipv6Address},
    {"ProtocolIFType", CMPI_uint16, NIC_UINT16(6)},
    {"Status", CMPI_string, NIC_TEXT("OK")},
    {"HealthState", CMPI_uint16, NIC_UINT16(5)},
    {"ElementName", CMPI_string, NIC_TEXT("IPProtocolEndPoint")},
};

const char* const kKeys[] = {"SystemCreationClassName", "SystemName", "CreationClassName", "Name", nullptr};

const NicClassModule kModule =
    NicClassModule("Vexlan_NIC_IPProtocolEndPoint")
        .walk(NicWalk::Ports)
        .key("Name", nicMacKey)
        .properties(kProperties)
        .keys(kKeys)
        .enumInstancesTexts({"Vexlan_NIC_IPProtocolEndPoint enumInstances was called\n",
                             "Vexlan_NIC_IPProtocolEndPoint: Error getting namespace in enumInstances\n",
                             "Vexlan_NIC_IPProtocolEndPoint: Error getting ClassName in enumInstances\n"})
        .enumInstanceNamesTexts({"Vexlan_NIC_IPProtocolEndPoint enumInstanceNames\n",
                                 "Vexlan_NIC_IPProtocolEndPoint: Error getting namespace in enumInstanceNames\n",
                                 "Vexlan_NIC_IPProtocolEndPoint: Error getting ClassName in enumInstanceNames\n"})
        .getInstanceTexts({"Vexlan_NIC_IPProtocolEndPoint getInstance was called\n",
                           "Vexlan_NIC_IPProtocolEndPoint: Error getting namespace in getInstances\n",
                           "Vexlan_NIC_IPProtocolEndPoint: Error getting ClassName in getInstances\n"})
        .makeTexts("Vexlan_NIC_IPProtocolEndPoint makePath was called\n",
                   "Vexlan_NIC_IPProtocolEndPoint makeInstance was called\n")
        .keyErrors("Vexlan_NIC_IPProtocolEndPoint: Error getting DeviceID key in getInstances\n",
                   {"Vexlan_NIC_IPProtocolEndPoint: Error invalid key data type, keyData.type=", "!"});

}  // namespace

char* calcName_IPProtocolEndPoint(_CNAPortStruc* port, char* out)
{
    return nicMacText(port, out);
}

VEXLAN_NIC_CLASS_OPERATIONS(IPProtocolEndPoint, kModule, (_CNAPortStruc * port), (NicRecord{nullptr, port, nullptr}))

// Vexlan_Adapter_ComputerSystem as a class module: one fixed slot, the host.
#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"

#include "zorap_cna.h"

char hostName_ComputerSystem[kHostNameBufferSize];
int hostNameType_ComputerSystem;

namespace {

// The host's slot: its fields come from the process-wide host name.
struct HostSlot {
    unsigned char valid;
};
const HostSlot kHost = {1};

const char kClassName[] = "Vexlan_Adapter_ComputerSystem";

PropertyValue nameFormat(const HostSlot&)
{
    switch (hostNameType_ComputerSystem) {
    case HOST_NAME_KIND_IPV4:
    case HOST_NAME_KIND_IPV6:
        return CmpiData("IP");
    case HOST_NAME_KIND_NAME:
        return CmpiData("DNSName");
    default:
        return CmpiData("");
    }
}

// The operating system's name as the adapter library tells it; when the call
// fails the property stays unset.
PropertyValue osName(const HostSlot&)
{
    char buffer[ZORAP_OS_NAME_BUFFER_SIZE] = {};
    std::uint32_t size = sizeof(buffer);
    if (ZORAP_GetOSName(buffer, &size) != 0)
        return std::nullopt;
    buffer[sizeof(buffer) - 1] = '\0';
    return CmpiData(buffer);
}

const PropertyRow<HostSlot> kProperties[] = {
    {"CreationClassName", CMPI_string, CLASS_VALUE(HostSlot, entryText(kClassName))},
    {"Name", CMPI_string, CLASS_VALUE(HostSlot, entryText(hostName_ComputerSystem))},
    {"NameFormat", CMPI_string, nameFormat},
    {"Description", CMPI_string, CLASS_VALUE(HostSlot, entryText("Computer system hosting the Vexlan HBA provider"))},
    {"ElementName", CMPI_string, CLASS_VALUE(HostSlot, entryText(hostName_ComputerSystem))},
    {"Dedicated", CMPI_uint16A, CLASS_VALUE(HostSlot, uint16Array({0}))},
    {"OperationalStatus", CMPI_uint16A, CLASS_VALUE(HostSlot, uint16Array({2}))},
    {"StatusDescriptions", CMPI_stringA, CLASS_VALUE(HostSlot, stringArray({"OK"}))},
    {"OSName", CMPI_string, osName},
};

const char* const kKeys[] = {"CreationClassName", "Name", nullptr};

const ClassModule<HostSlot> kComputerSystem =
    ClassModule<HostSlot>("ComputerSystem")
        .single(kHost)
        .key("Name", [](const HostSlot&) -> const char* { return hostName_ComputerSystem; })
        .filterKeys(kKeys)
        .pathKeys(kKeys)
        .properties(kProperties);

}  // namespace

void buildComputerSystem() {}
void removeComputerSystem() {}

VEXLAN_SINGLE_CLASS_OPERATIONS(ComputerSystem, kComputerSystem)

// Vexlan_FCHBA_RegisteredProfile as a class module: a full list of four rows.
#include "classes/Vexlan_FCHBA_RegisteredProfile_CMPI.h"

#include <string>

#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/Vexlan_NIC_Utils.h"

ClassList<RegisteredProfileEntry> g_RegisteredProfileList = {0, nullptr};

#define PROFILE_VALUE(expression) CLASS_VALUE(RegisteredProfileEntry, expression)

const PropertyRow<RegisteredProfileEntry> g_RegisteredProfileProperties[kRegisteredProfilePropertyCount] = {
    {"InstanceID", CMPI_string, PROFILE_VALUE(CmpiData(e.instanceId))},
    {"Caption", CMPI_string, PROFILE_VALUE(CmpiData(e.caption))},
    {"Description", CMPI_string, PROFILE_VALUE(CmpiData(e.caption))},
    {"ElementName", CMPI_string, PROFILE_VALUE(CmpiData(e.caption))},
    {"RegisteredOrganization", CMPI_uint16, PROFILE_VALUE(CmpiData(e.registeredOrganization))},
    {"OtherRegisteredOrganization", CMPI_string, PROFILE_VALUE(CmpiData(e.otherOrganization))},
    {"RegisteredName", CMPI_string, PROFILE_VALUE(CmpiData(e.registeredName))},
    {"RegisteredVersion", CMPI_string, PROFILE_VALUE(CmpiData(e.registeredVersion))},
    {"AdvertiseTypes", CMPI_uint16A, PROFILE_VALUE(uint16Array({3}))},
    {"AdvertiseTypeDescriptions", CMPI_stringA, PROFILE_VALUE(stringArray({""}))},
};

const char* const g_RegisteredProfileKeys[] = {"InstanceID", nullptr};

namespace {

// The texts that clients see, the misspelled fourth one included.
const RegisteredProfileRow kRows[] = {
    {"Vexlan_FCHBAProfile_", "SMI-S FC HBA Profile", 11, "FC HBA", "1.1.0"},
    {"Vexlan_ServerProfile_", "SMI-S Server Profile", 11, "Server", "1.1.0"},
    {"Vexlan_HostDiscoveredResourcesProfile_", "SMI-S HDR Profile", 11, "HDR", "1.1.0"},
    {"Vexlan_SofwareUpdateProfile_", "DMTF Software Update Profile", 2, "Software Update", "1.0.0"},
};

const ClassModule<RegisteredProfileEntry> kRegisteredProfile =
    ClassModule<RegisteredProfileEntry>("RegisteredProfile")
        .list(g_RegisteredProfileList, ListKind::Full)
        .key("InstanceID", [](const RegisteredProfileEntry& e) -> const char* { return e.instanceId; })
        .filterKeys(g_RegisteredProfileKeys)
        .pathKeys(g_RegisteredProfileKeys)
        .properties(g_RegisteredProfileProperties);

}  // namespace

void buildRegisteredProfileRows(ClassList<RegisteredProfileEntry>& list, const RegisteredProfileRow* rows,
                                int count, const char* operation)
{
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Entering %s", operation);
    if (list.allocate(count)) {
        for (int i = 0; i < count; ++i) {
            RegisteredProfileEntry& e = list.entries[i];
            const RegisteredProfileRow& row = rows[i];
            const std::string instanceId = std::string(row.instanceIdPrefix) + hostName_ComputerSystem;
            safeStrCpy(e.instanceId, instanceId.c_str(), sizeof(e.instanceId));
            safeStrCpy(e.caption, row.caption, sizeof(e.caption));
            e.otherOrganization[0] = '\0';
            safeStrCpy(e.registeredName, row.registeredName, sizeof(e.registeredName));
            safeStrCpy(e.registeredVersion, row.registeredVersion, sizeof(e.registeredVersion));
            e.registeredOrganization = row.registeredOrganization;
        }
        for (int i = 0; i < count; ++i)
            list.entries[i].valid = 1;
    } else if (count > 0 && g_EnableLogError) {
        Vexlan_FC_Utils_CMPI::LogError("%s: no memory for %d rows", operation, count);
    }
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Exiting  %s\n", operation);
}

void buildRegisteredProfileList()
{
    buildRegisteredProfileRows(g_RegisteredProfileList, kRows, static_cast<int>(sizeof(kRows) / sizeof(kRows[0])),
                               "buildRegisteredProfileList");
}

void removeRegisteredProfileList()
{
    g_RegisteredProfileList.remove();
}

VEXLAN_LIST_CLASS_OPERATIONS(RegisteredProfile, kRegisteredProfile)

// Vexlan_NIC_RegisteredProfile: the chain of the NIC side's profiles and the
// class module that answers from it.
#include "classes/Vexlan_NIC_RegisteredProfile.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "classes/NicClassModule.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/Vexlan_NIC_Utils.h"

_RegisteredProfile* m_RegisteredProfileList = nullptr;

namespace {

// The chain, in its order. Two profiles share the number 6.
const struct {
    std::uint32_t id;
    const char* name;
    const char* registeredName;
    const char* registeredVersion;
    std::uint16_t registeredOrganization;
} kProfiles[] = {
    {1, "EthernetPort Profile", "Ethernet Port", "1.0.0", 2},
    {2, "Host LAN Network Port Profile", "Host LAN Network Port", "1.0.0", 2},
    {3, "IP Interface Profile", "IP Interface", "1.0.1", 2},
    {4, "Registered Profile", "Vexlan_Registered_Profile", "1.1.0", 11},
    {5, "Physical Asset Profile", "Vexlan_PhysicalAsset", "1.1.0", 11},
    {6, "Software Inventory Profile", "Vexlan_SoftwareInventory", "1.1.0", 11},
    {6, "Software Update Profile", "Vexlan_SoftwareUpdate", "1.1.0", 11},
    {7, "Indications Profile", "Vexlan_Indications", "1.1.0", 11},
};

// InstanceID: the profile's number in decimal.
void idText(const NicRecord& r, char* out)
{
    std::snprintf(out, kNicKeyTextSize, "%u", r.profile->id);
}

PropertyValue instanceId(const NicRecord& r)
{
    char text[kNicKeyTextSize];
    idText(r, text);
    return CmpiData(text);
}

const PropertyRow<NicRecord> kProperties[] = {
    {"InstanceID", CMPI_string, instanceId},
    {"Caption", CMPI_string, CLASS_VALUE(NicRecord, CmpiData(nicFieldText(e.profile->description)))},
    {"Description", CMPI_string, CLASS_VALUE(NicRecord, CmpiData(nicFieldText(e.profile->description)))},
    {"ElementName", CMPI_string, CLASS_VALUE(NicRecord, CmpiData(nicFieldText(e.profile->name)))},
    {"RegisteredOrganization", CMPI_uint16, CLASS_VALUE(NicRecord, CmpiData(e.profile->registeredOrganization))},
    {"RegisteredName", CMPI_string, CLASS_VALUE(NicRecord, CmpiData(nicFieldText(e.profile->registeredName)))},
    {"RegisteredVersion", CMPI_string,
     CLASS_VALUE(NicRecord, CmpiData(nicFieldText(e.profile->registeredVersion)))},
    {"AdvertiseTypes", CMPI_uint16A, CLASS_VALUE(NicRecord, uint16Array({3}))},
    {"AdvertiseTypeDescriptions", CMPI_stringA, CLASS_VALUE(NicRecord, stringArray({"slp"}))},
};

const char* const kKeys[] = {"InstanceID", nullptr};

const NicClassModule kModule =
    NicClassModule("Vexlan_NIC_RegisteredProfile")
        .walk(NicWalk::Profiles)
        .key("InstanceID", idText)
        .properties(kProperties)
        .keys(kKeys)
        .enumInstancesTexts({"Vexlan_NIC_RegisteredProfile enumInstances_RegisteredProfile was called\n",
                             "Vexlan_NIC_RegisteredProfile: Error getting namespace\n",
                             "Vexlan_NIC_RegisteredProfile: Error getting ClassName\n"})
        .enumInstanceNamesTexts({"Vexlan_RegisteredProfile enumInstanceNames was called\n",
                                 "Vexlan_RegisteredProfile: Error getting namespace\n",
                                 "Vexlan_RegisteredProfile: Error getting ClassName\n"})
        .getInstanceTexts({"Vexlan_NIC_RegisteredProfile getInstance_RegisteredProfile was called\n",
                           "Vexlan_NIC_RegisteredProfile: Error getting namespace\n",
                           "Vexlan_NIC_RegisteredProfile: Error getting ClassName\n"})
        .makeTexts("Vexlan_NIC_RegisteredProfile makePath_RegisteredProfile was called\n",
                   "Vexlan_NIC_RegisteredProfile makeInstance_RegisteredProfile was called\n")
        .keyErrors("Vexlan_NIC_RegisteredProfile: Error getting Name key in getInstance\n")
        .keyErrorsAreDebugLines();

void freeChain()
{
    _RegisteredProfile* node = m_RegisteredProfileList;
    m_RegisteredProfileList = nullptr;
    while (node != nullptr) {
        _RegisteredProfile* next = node->next;
        std::free(node);
        node = next;
    }
}

}  // namespace

void InitializeRegisteredProfileList()
{
    freeChain();
    _RegisteredProfile** tail = &m_RegisteredProfileList;
    for (const auto& row : kProfiles) {
        auto* node = static_cast<_RegisteredProfile*>(std::malloc(sizeof(_RegisteredProfile)));
        if (node == nullptr) {
            if (g_EnableLogError)
                Vexlan_FC_Utils_CMPI::LogError("InitializeRegisteredProfileList: no memory for profile %u",
                                               row.id);
            continue;
        }
        std::memset(node, 0, sizeof(*node));
        node->id = row.id;
        safeStrCpy(node->name, row.name, sizeof(node->name));
        std::snprintf(node->description, sizeof(node->description), "Vexlan NIC %s", row.name);
        safeStrCpy(node->registeredName, row.registeredName, sizeof(node->registeredName));
        safeStrCpy(node->registeredVersion, row.registeredVersion, sizeof(node->registeredVersion));
        node->registeredOrganization = row.registeredOrganization;
        node->next = nullptr;
        *tail = node;
        tail = &node->next;
    }
}

void Clear_RegisteredProfile_List()
{
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Entering Clear_RegisteredProfile_List()");
    freeChain();
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("Exiting Clear_RegisteredProfile_List()");
}

VEXLAN_NIC_CLASS_OPERATIONS(Nic_RegisteredProfile, kModule, (_RegisteredProfile * profile),
                            (NicRecord{nullptr, nullptr, profile}))

// Vexlan_FCHBA_ObjectManager as a class module: one fixed slot.
#include "classes/Vexlan_FCHBA_ObjectManager_CMPI.h"

#include <cstdio>

#include "support/Vexlan_NIC_Properties.h"

char name_ObjectManager[kHostNameBufferSize + 16];
char hostName_ObjectManager[kHostNameBufferSize];

namespace {

struct ObjectManagerSlot {
    unsigned char valid;
};
const ObjectManagerSlot kSlot = {1};

// ElementName and Description: the configured server name and version.
PropertyValue nameVersion(const ObjectManagerSlot&)
{
    char text[sizeof(g_CIMOMNameVersion)];
    formatCIMOMNameVersion(g_CIMOMNameVersion, text, sizeof(text));
    return CmpiData(text);
}

const PropertyRow<ObjectManagerSlot> kProperties[] = {
    {"SystemCreationClassName", CMPI_string, CLASS_VALUE(ObjectManagerSlot, entryText("Vexlan_Adapter_ComputerSystem"))},
    {"SystemName", CMPI_string, CLASS_VALUE(ObjectManagerSlot, CmpiData(hostName_ObjectManager))},
    {"CreationClassName", CMPI_string, CLASS_VALUE(ObjectManagerSlot, entryText("Vexlan_FCHBA_ObjectManager"))},
    {"Name", CMPI_string, CLASS_VALUE(ObjectManagerSlot, CmpiData(name_ObjectManager))},
    {"ElementName", CMPI_string, nameVersion},
    {"Description", CMPI_string, nameVersion},
    {"OperationalStatus", CMPI_uint16A, CLASS_VALUE(ObjectManagerSlot, uint16Array({2}))},
    {"StatusDescriptions", CMPI_stringA, CLASS_VALUE(ObjectManagerSlot, stringArray({"OK"}))},
    {"Started", CMPI_boolean, CLASS_VALUE(ObjectManagerSlot, CmpiData(true))},
};

const char* const kFilterKeys[] = {"CreationClassName", "Name", nullptr};
const char* const kPathKeys[] = {"SystemCreationClassName", "SystemName", "CreationClassName", "Name", nullptr};

const ClassModule<ObjectManagerSlot> kObjectManager =
    ClassModule<ObjectManagerSlot>("ObjectManager")
        .single(kSlot)
        .key("Name", [](const ObjectManagerSlot&) -> const char* { return name_ObjectManager; })
        .filterKeys(kFilterKeys)
        .pathKeys(kPathKeys)
        .properties(kProperties);

}  // namespace

void formatCIMOMNameVersion(const char* configured, char* target, std::size_t targetSize)
{
    if (target == nullptr || targetSize == 0)
        return;
    std::size_t n = 0;
    for (const char* p = configured != nullptr ? configured : ""; *p != '\0' && n + 1 < targetSize; ++p) {
        target[n++] = *p;
        if (p[0] == '%' && p[1] == '%')
            ++p;
    }
    target[n] = '\0';
}

void buildObjectManager()
{
    int kind = 0;
    GetHostName(hostName_ObjectManager, &kind, sizeof(hostName_ObjectManager));
    std::snprintf(name_ObjectManager, sizeof(name_ObjectManager), "pegasus:%s", hostName_ObjectManager);
}

void removeObjectManager() {}

char* getNameObjectManager()
{
    return name_ObjectManager;
}

VEXLAN_SINGLE_CLASS_OPERATIONS(ObjectManager, kObjectManager)

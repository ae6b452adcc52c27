// Vexlan_FCHBA_StorageExtent as a class module: a full list of one slot per
// LUN; the enumerations skip slots that the build left invalid.
#include "classes/Vexlan_FC_StorageExtent_CMPI.h"

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <string>

#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "classes/Vexlan_FC_FCPort_CMPI.h"
#include "classes/Vexlan_FC_SCSIProtocolController_CMPI.h"

ClassList<StorageExtentEntry> g_StorageExtentList = {0, nullptr};

void buildStorageExtentList()
{
    std::uint64_t wanted = 0;
    bool haveAdapters = classmodule::walkProtocols([&](_zorap_adapter_t*, _zorap_phy_port_t*, _zorap_protocol_t* pr) {
        if (pr->protocolType >= 2)
            return;
        for (_zorap_target_t* target = pr->fcDevice.targetList; target != nullptr; target = target->next)
            wanted += target->lunCount;
    });
    ClassList<StorageExtentEntry>& list = g_StorageExtentList;
    if (!allocateCounted(list, haveAdapters, wanted))
        return;
    const int capacity = static_cast<int>(wanted);
    int index = 0;
    walkFCTargets([&](_tagZORAPSDMDevice* device, _zorap_target_t* target, const char* local, const char* remote) {
        // A LUN chain longer than the counts gives no slot beyond the capacity.
        for (_zorap_lun_t* lun = target->lunList; lun != nullptr && index < capacity; lun = lun->next) {
            classmodule::buildLine(true, "StorageExtent", index);
            // Sixteen identifier bytes when the LUN says so, else eight.
            const int idBytes = lun->lunIdLength == 16 ? 16 : 8;
            char lunId[2 * 16 + 1] = {};
            FormatHexBytes(lun->lunId, idBytes, lunId, sizeof(lunId));
            StorageExtentEntry& entry = list.entries[index];
            char number[11];
            JoinFCText(entry.deviceId, sizeof(entry.deviceId),
                       {local, "_", remote, "_", lunId, "_", DecimalText(lun->lunNumber, number)});
            entry.valid = 1;
            entry.device = device;
            entry.target = target;
            entry.lun = lun;
            classmodule::buildLine(false, "StorageExtent", index);
            ++index;
        }
        return true;
    });
}

void removeStorageExtentList()
{
    g_StorageExtentList.remove();
}

namespace {

const char kClassName[] = "Vexlan_FCHBA_StorageExtent";

// The LUN's fields; a slot without a LUN (never filled) leaves them unset.
#define LUN_VALUE(expression) \
    [](const StorageExtentEntry& e) -> PropertyValue { return e.lun != nullptr ? PropertyValue(expression) : std::nullopt; }

PropertyValue lunNumberText(const StorageExtentEntry& e)
{
    if (e.lun == nullptr)
        return std::nullopt;
    char text[11];
    return stringArray({DecimalText(e.lun->lunNumber, text)});
}

const PropertyRow<StorageExtentEntry> kProperties[] = {
    {"SystemCreationClassName", CMPI_string,
     CLASS_VALUE(StorageExtentEntry, entryText("Vexlan_Adapter_ComputerSystem"))},
    {"SystemName", CMPI_string, CLASS_VALUE(StorageExtentEntry, entryText(hostName_ComputerSystem))},
    {"CreationClassName", CMPI_string, CLASS_VALUE(StorageExtentEntry, entryText(kClassName))},
    {"DeviceID", CMPI_string, CLASS_VALUE(StorageExtentEntry, entryText(e.deviceId))},
    {"ElementName", CMPI_string, CLASS_VALUE(StorageExtentEntry, entryText(" "))},
    {"Name", CMPI_string, LUN_VALUE(fieldText(e.lun->osDeviceName))},
    {"Access", CMPI_uint16, CLASS_VALUE(StorageExtentEntry, CmpiData(static_cast<CMPIUint16>(3)))},
    {"BlockSize", CMPI_uint64, LUN_VALUE(CmpiData(static_cast<CMPIUint64>(e.lun->blockSize)))},
    {"LunID", CMPI_uint16, LUN_VALUE(CmpiData(static_cast<CMPIUint16>(e.lun->lunNumber)))},
    {"VendorID", CMPI_string, LUN_VALUE(fieldText(e.lun->vendorId))},
    {"ProductID", CMPI_string, LUN_VALUE(fieldText(e.lun->productId))},
    {"Revision", CMPI_string, LUN_VALUE(fieldText(e.lun->revision))},
    {"RaidType", CMPI_string, CLASS_VALUE(StorageExtentEntry, entryText("N/A"))},
    {"NumberOfPartitions", CMPI_string, CLASS_VALUE(StorageExtentEntry, entryText("N/A"))},
    {"OperationalStatus", CMPI_uint16A, CLASS_VALUE(StorageExtentEntry, uint16Array({2}))},
    {"OtherIdentifyingInfo", CMPI_stringA, lunNumberText},
    {"IdentifyingDescriptions", CMPI_stringA, CLASS_VALUE(StorageExtentEntry, stringArray({"Lun ID"}))},
};

#undef LUN_VALUE

const char* const kKeys[] = {"SystemCreationClassName", "SystemName", "CreationClassName", "DeviceID", nullptr};

const ClassModule<StorageExtentEntry> kStorageExtent =
    ClassModule<StorageExtentEntry>("StorageExtent")
        .list(g_StorageExtentList, ListKind::Full)
        .key("DeviceID", [](const StorageExtentEntry& e) -> const char* { return e.deviceId; })
        .filterKeys(kKeys)
        .pathKeys(kKeys)
        .properties(kProperties)
        .enumerationsTestValid();

}  // namespace

VEXLAN_LIST_CLASS_OPERATIONS(StorageExtent, kStorageExtent)

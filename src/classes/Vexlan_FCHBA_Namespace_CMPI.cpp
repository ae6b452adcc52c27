// Vexlan_FCHBA_Namespace as a class module: two fixed rows, no valid test.
#include "classes/Vexlan_FCHBA_Namespace_CMPI.h"

#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "classes/Vexlan_FCHBA_ObjectManager_CMPI.h"
#include "support/Vexlan_NIC_Properties.h"

const char* namespace_array[kNamespaceRows] = {nullptr, nullptr};

namespace {

struct NamespaceSlot {
    unsigned char valid;
    int row;
};
const NamespaceSlot kSlots[kNamespaceRows] = {{1, 0}, {1, 1}};

const char* rowName(const NamespaceSlot& e)
{
    return namespace_array[e.row];
}

#define NAMESPACE_VALUE(expression) CLASS_VALUE(NamespaceSlot, expression)

const PropertyRow<NamespaceSlot> kProperties[] = {
    {"CreationClassName", CMPI_string, NAMESPACE_VALUE(CmpiData("Vexlan_FCHBA_Namespace"))},
    {"Name", CMPI_string, NAMESPACE_VALUE(CmpiData(rowName(e)))},
    {"SystemCreationClassName", CMPI_string, NAMESPACE_VALUE(CmpiData("Vexlan_Adapter_ComputerSystem"))},
    {"SystemName", CMPI_string, NAMESPACE_VALUE(CmpiData(hostName_ComputerSystem))},
    {"ObjectManagerCreationClassName", CMPI_string, NAMESPACE_VALUE(CmpiData("Vexlan_FCHBA_ObjectManager"))},
    {"ObjectManagerName", CMPI_string, NAMESPACE_VALUE(CmpiData(getNameObjectManager()))},
    {"ClassType", CMPI_uint16, NAMESPACE_VALUE(CmpiData(static_cast<CMPIUint16>(2)))},
    {"ClassInfo", CMPI_uint16, NAMESPACE_VALUE(CmpiData(static_cast<CMPIUint16>(1)))},
    {"DescriptionOfClassInfo", CMPI_string, NAMESPACE_VALUE(CmpiData(g_CIMSchemaVersion))},
};

const char* const kKeys[] = {"CreationClassName",       "Name",       "SystemCreationClassName",
                             "SystemName",              "ObjectManagerCreationClassName",
                             "ObjectManagerName",       nullptr};

const ClassModule<NamespaceSlot> kNamespace = ClassModule<NamespaceSlot>("Namespace")
                                                  .fixed(kSlots, kNamespaceRows)
                                                  .key("Name", rowName)
                                                  .filterKeys(kKeys)
                                                  .pathKeys(kKeys)
                                                  .properties(kProperties);

}  // namespace

void buildNamespaceList()
{
    namespace_array[0] = "root/vexlan_cmpi";
    namespace_array[1] = g_InteropNamespace;
}

void removeNamespaceList() {}

VEXLAN_LIST_CLASS_OPERATIONS(Namespace, kNamespace)

// Vexlan_FCHBA_CIMXMLCommMech as a class module: one fixed slot.
#include "classes/Vexlan_FCHBA_CIMXMLCommMech_CMPI.h"

#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"

namespace {

struct CommMechSlot {
    unsigned char valid;
};
const CommMechSlot kSlot = {1};

const char kName[] = "CIMXML Communication Mechanism";

#define COMMMECH_VALUE(expression) CLASS_VALUE(CommMechSlot, expression)

const PropertyRow<CommMechSlot> kProperties[] = {
    {"SystemCreationClassName", CMPI_string, COMMMECH_VALUE(CmpiData("Vexlan_Adapter_ComputerSystem"))},
    {"SystemName", CMPI_string, COMMMECH_VALUE(CmpiData(hostName_ComputerSystem))},
    {"CreationClassName", CMPI_string, COMMMECH_VALUE(CmpiData("Vexlan_FCHBA_CIMXMLCommMech"))},
    {"Name", CMPI_string, COMMMECH_VALUE(CmpiData(kName))},
    {"ElementName", CMPI_string, COMMMECH_VALUE(CmpiData(kName))},
    {"CommunicationMechanism", CMPI_uint16, COMMMECH_VALUE(CmpiData(static_cast<CMPIUint16>(2)))},
    {"OtherCommunicationMechanismDescription", CMPI_string, COMMMECH_VALUE(CmpiData(""))},
    {"Version", CMPI_string, COMMMECH_VALUE(CmpiData("1.0"))},
    {"OperationalStatus", CMPI_uint16A, COMMMECH_VALUE(uint16Array({2}))},
    {"StatusDescriptions", CMPI_stringA, COMMMECH_VALUE(stringArray({"OK"}))},
    {"FunctionalProfilesSupported", CMPI_uint16A, COMMMECH_VALUE(uint16Array({2, 6, 9}))},
    {"FunctionalProfileDescriptions", CMPI_stringA,
     COMMMECH_VALUE(stringArray({"Basic Read", "Association Traversal", "Indications"}))},
    {"AuthenticationMechanismsSupported", CMPI_uint16A, COMMMECH_VALUE(uint16Array({3}))},
    {"AuthenticationMechanismDescriptions", CMPI_stringA, COMMMECH_VALUE(stringArray({"Basic"}))},
    {"MultipleOperationsSupported", CMPI_boolean, COMMMECH_VALUE(CmpiData(true))},
    {"CIMValidated", CMPI_boolean, COMMMECH_VALUE(CmpiData(false))},
};

const char* const kKeys[] = {"SystemCreationClassName", "SystemName", "CreationClassName", "Name", nullptr};

const ClassModule<CommMechSlot> kCommMech = ClassModule<CommMechSlot>("CIMXMLCommMech")
                                                .single(kSlot)
                                                .key("Name", [](const CommMechSlot&) -> const char* { return kName; })
                                                .filterKeys(kKeys)
                                                .pathKeys(kKeys)
                                                .properties(kProperties);

}  // namespace

void buildCIMXMLCommMech() {}
void removeCIMXMLCommMech() {}

VEXLAN_SINGLE_CLASS_OPERATIONS(CIMXMLCommMech, kCommMech)

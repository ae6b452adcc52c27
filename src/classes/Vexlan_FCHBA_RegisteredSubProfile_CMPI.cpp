// Vexlan_FCHBA_RegisteredSubProfile as a class module: a full list of two
// rows, with the property rows of the profiles.
#include "classes/Vexlan_FCHBA_RegisteredSubProfile_CMPI.h"

ClassList<RegisteredProfileEntry> g_RegisteredSubProfileList = {0, nullptr};

namespace {

// "Indication", in the singular, is the text that clients see.
const RegisteredProfileRow kRows[] = {
    {"Vexlan_FCInitiatorPortsSubProfile_", "SMI-S FC Initiator Ports SubProfile", 11, "FC Initiator Ports", "1.1.0"},
    {"Vexlan_IndicationsSubProfile_", "SMI-S Indications SubProfile", 11, "Indication", "1.1.0"},
};

// Made at first use: the property rows live in the profiles' unit.
const ClassModule<RegisteredProfileEntry>& subProfileModule()
{
    static const ClassModule<RegisteredProfileEntry> module =
        ClassModule<RegisteredProfileEntry>("RegisteredSubProfile")
            .list(g_RegisteredSubProfileList, ListKind::Full)
            .key("InstanceID", [](const RegisteredProfileEntry& e) -> const char* { return e.instanceId; })
            .filterKeys(g_RegisteredProfileKeys)
            .pathKeys(g_RegisteredProfileKeys)
            .properties(g_RegisteredProfileProperties);
    return module;
}

}  // namespace

void buildRegisteredSubProfileList()
{
    buildRegisteredProfileRows(g_RegisteredSubProfileList, kRows,
                               static_cast<int>(sizeof(kRows) / sizeof(kRows[0])), "buildRegisteredSubProfileList");
}

void removeRegisteredSubProfileList()
{
    g_RegisteredSubProfileList.remove();
}

VEXLAN_LIST_CLASS_OPERATIONS(RegisteredSubProfile, subProfileModule())

// Look-up of an adapter of m_CNAList by the text a client gives: the adapter's
// serial number or its NIC port controller's device ID. Kept apart from the
// list's build, as it needs the NIC port controller's device ID format.
#include <strings.h>

#include "inventory/AdapterFunc.h"

// The NIC port controller's device ID of an adapter serial ("<serial>_NIC"),
// in a buffer of the port controller module that the next call overwrites.
char* BuildPortControllerDeviceID(char* serial);

_CNAStruc* FindCNAFromSerialNumber(char const* text)
{
    if (text == nullptr)
        return nullptr;
    for (_CNAStruc* cna = m_CNAList; cna != nullptr; cna = cna->next) {
        cna->serialNumber[sizeof(cna->serialNumber) - 1] = '\0';
        if (strcasecmp(text, cna->serialNumber) == 0)
            return cna;
        char const* deviceId = BuildPortControllerDeviceID(cna->serialNumber);
        if (deviceId != nullptr && strcasecmp(text, deviceId) == 0)
            return cna;
    }
    return nullptr;
}

// Vexlan_FCHBA_SoftwareInstallationService, its Capabilities, and the FC
// flash update method "InstallFromURI".
#include "classes/Vexlan_FCHBA_SoftwareInstallationService_CMPI.h"

#include <strings.h>

#include <cstdarg>
#include <cstdio>
#include <string>

#include "classes/InstallationServiceModule.h"
#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "classes/Vexlan_FCHBA_SoftwareIdentity_CMPI.h"
#include "classes/Vexlan_FC_FCPort_CMPI.h"
#include "classes/Vexlan_FC_PortController_CMPI.h"
#include "inventory/AdapterFunc.h"
#include "support/ProviderFiles.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/ossimpl.h"
#include "update/FlashUpdate.h"
#include "update/InstallHelpers.h"

using installservice::kServiceName;
using installservice::ServiceSlot;
using installservice::textOf;

namespace {

const char kOperation[] = "invokeMethod_SoftwareInstallationService";

const PropertyRow<ServiceSlot> kServiceProperties[] = {
    {"Name", CMPI_string, CLASS_VALUE(ServiceSlot, entryText(kServiceName))},
    {"SystemCreationClassName", CMPI_string, CLASS_VALUE(ServiceSlot, entryText("Vexlan_Adapter_ComputerSystem"))},
    {"SystemName", CMPI_string, CLASS_VALUE(ServiceSlot, entryText(hostName_ComputerSystem))},
    {"CreationClassName", CMPI_string,
     CLASS_VALUE(ServiceSlot, entryText("Vexlan_FCHBA_SoftwareInstallationService"))},
    {"Caption", CMPI_string, CLASS_VALUE(ServiceSlot, entryText("CNA Flash Image Update Service"))},
    {"Description", CMPI_string, CLASS_VALUE(ServiceSlot, entryText("Updating CNA flash(boot code, firmwares...)"))},
    {"ElementName", CMPI_string, CLASS_VALUE(ServiceSlot, entryText("Updating Vexlan CNA flash Image"))},
};
const ClassModule<ServiceSlot> kService =
    installservice::serviceModule("SoftwareInstallationService", "Name", installservice::kServiceKeys,
                                  kServiceProperties);

const PropertyRow<ServiceSlot> kCapabilitiesProperties[] = {
    {"InstanceID", CMPI_string, CLASS_VALUE(ServiceSlot, entryText(kServiceName))},
    {"Caption", CMPI_string, CLASS_VALUE(ServiceSlot, entryText("CNA Flash Image Update Capabilities"))},
    {"CanAddToCollection", CMPI_boolean, CLASS_VALUE(ServiceSlot, CmpiData(false))},
    {"SupportedAsynchronousActions", CMPI_uint16A, CLASS_VALUE(ServiceSlot, uint16Array({5}))},
    {"SupportedSynchronousActions", CMPI_uint16A, CLASS_VALUE(ServiceSlot, uint16Array({5}))},
    {"SupportedURISchemes", CMPI_uint16A, CLASS_VALUE(ServiceSlot, uint16Array({3}))},
    {"SupportedInstallOptions", CMPI_uint16A, CLASS_VALUE(ServiceSlot, uint16Array({32768, 5}))},
    {"ElementName", CMPI_string, CLASS_VALUE(ServiceSlot, entryText("Vexlan CNA Flash Image Update"))},
    {"Description", CMPI_string,
     CLASS_VALUE(ServiceSlot, entryText("Flash image includes boot code, ASIC and MPI Firmware"))},
};
const ClassModule<ServiceSlot> kCapabilities =
    installservice::serviceModule("SoftwareInstallationServiceCapabilities", "InstanceID",
                                  installservice::kCapabilitiesKeys, kCapabilitiesProperties);

const installservice::ServiceKeyTexts kKeyTexts = {"getInstance_SoftwareInstallationService", nullptr, nullptr,
                                                   nullptr};

// A failure of the method: the text formatted, written to the error log (or
// with `debugOnly` to the debug output) behind "<operation>: Error: ", and
// thrown with `code`; the method's catch turns it into the value 2.
[[noreturn]] __attribute__((format(printf, 3, 4))) void fail(bool debugOnly, CMPIrc code, const char* format, ...)
{
    char text[1024];
    va_list args;
    va_start(args, format);
    std::vsnprintf(text, sizeof(text), format, args);
    va_end(args);
    if (debugOnly) {
        if (g_EnableDebugPrint)
            Vexlan_FC_Utils_CMPI::DebugPrint("%s: Error: %s", kOperation, text);
    } else if (g_EnableLogError) {
        Vexlan_FC_Utils_CMPI::LogError("%s: Error: %s", kOperation, text);
    }
    throw CmpiStatus(code, text);
}

#define INSTALL_DEBUG(...)                                 \
    do {                                                   \
        if (g_EnableDebugPrint)                            \
            Vexlan_FC_Utils_CMPI::DebugPrint(__VA_ARGS__); \
    } while (0)

// The FC flash write while the caller waits; the lists of the software and
// the FC ports are rebuilt afterwards so the new versions show.
unsigned int updateSynchronously(_tagZORAPSDMDevice* device, const char* fileName, const char* serial)
{
    gbFlashUpdateInProgress = true;
    const ZORAP_STATUS result =
        ZORAP_doOptionROMUpdate(device, reinterpret_cast<const unsigned char*>(fileName), 0);
    gbFlashUpdateInProgress = false;
    if (result != 0)
        fail(true, CMPI_RC_ERR_NOT_FOUND, "Failed to update flash image, ErrorCode=%d!", static_cast<int>(result));
    INSTALL_DEBUG("****** Successfully updated flash image for Device with serial number %s", serial);
    OSSSleep(5);
    removeSoftwareIdentityList();
    buildSoftwareIdentityList();
    removeFCPortList();
    buildFCPortList();
    return 0;
}

}  // namespace

VEXLAN_INSTALLATION_SERVICE_OPERATIONS(SoftwareInstallationService, kService, kKeyTexts)
VEXLAN_SINGLE_CLASS_OPERATIONS(SoftwareInstallationServiceCapabilities, kCapabilities)

CmpiStatus invokeMethod_SoftwareInstallationService(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& ref,
                                                    const char* methodName, const CmpiArgs& in, CmpiArgs& out)
{
    if (strcasecmp(methodName != nullptr ? methodName : "", "InstallFromURI") != 0) {
        ReturnMethodValue(rslt, 1);
        return CmpiStatus(CMPI_RC_OK);
    }
    // The first reading of the options stands outside the method's guard: a
    // failure here goes to the caller as a status.
    const CmpiData uri = in.getArg("URI");
    const CmpiData target = in.getArg("Target");
    {
        const CmpiArray options = in.getArg("InstallOptions");
        for (CMPICount i = 0; i < options.size(); ++i) {
            const unsigned short value = options[static_cast<int>(i)];
            INSTALL_DEBUG("invokeMethod_SoftwareInstallationService: installOptions[%d]=%d", static_cast<int>(i),
                          static_cast<int>(value));
        }
    }
    unsigned int value = 2;
    try {
        if (target.isNullValue() || target.isNotFound())
            fail(false, CMPI_RC_ERR_INVALID_PARAMETER, "Target argument is NULL!");
        if (uri.isNullValue() || uri.isNotFound())
            fail(false, CMPI_RC_ERR_INVALID_PARAMETER, "URI argument is NULL!");

        const char* nameSpace = nullptr;
        CmpiStatus failure(CMPI_RC_OK);
        if (!installservice::readServiceNameSpace(ref, nameSpace, failure))
            return failure;

        const CmpiObjectPath targetPath = target;
        const std::string targetClass = targetPath.getClassName().charPtr();
        if (strcasecmp(targetClass.c_str(), "Vexlan_FCHBA_PortController") != 0)
            fail(false, CMPI_RC_ERR_INVALID_CLASS, "Invalid Target class name, ClassName=%s, expect %s!",
                 targetClass.c_str(), "Vexlan_FCHBA_PortController");

        CMPIObjectPath* tp = targetPath.getEnc();
        CMPIStatus rc = {CMPI_RC_OK, nullptr};
        CMPIData key = tp->ft->getKey(tp, "DeviceID", &rc);
        if (rc.rc != CMPI_RC_OK) {
            // A status with a message leaves the method as it came.
            if (rc.msg != nullptr)
                throw rc;
            fail(false, rc.rc, "Unable to get Key data from the object class, Key=%s!", "DeviceID");
        }
        if (key.type != CMPI_string)
            fail(false, CMPI_RC_ERR_INVALID_PARAMETER, "Invalid Key data type, expect %s!", "CMPI_string");
        const char* deviceIdText = (key.state & CMPI_nullValue) ? nullptr : textOf(key.value.string);
        const std::string deviceId = deviceIdText != nullptr ? deviceIdText : "";

        const char* uriText = uri;
        if (uriText == nullptr)
            fail(false, CMPI_RC_ERR_INVALID_PARAMETER, "URI argument is NULL!");
        char fileName[kFlashFileNameSize];
        // Only a regular image file within its bound counts as there.
        if (!FlashFileNameOfURI(uriText, fileName) || !fileExists(fileName) || !FlashImageUsable(fileName))
            fail(false, CMPI_RC_ERR_INVALID_PARAMETER, "Invalid or unsupported URI!");

        int index = -1;
        std::string serial = deviceId;
        if (!IsDeviceInPortControllerList(reinterpret_cast<unsigned char*>(&serial[0]), &index))
            fail(true, CMPI_RC_ERR_NOT_FOUND, "Device with serial number %s is not found in PortController list!",
                 deviceId.c_str());
        if (index < 0)
            fail(true, CMPI_RC_ERR_NOT_FOUND, "Device with serial number %s is not found in Device list!",
                 deviceId.c_str());
        _tagZORAPSDMDevice* device = g_PortControllerList.entries[index].device;

        InstallOptions options;
        try {
            options = ReadInstallOptions(in.getArg("InstallOptions"));
        } catch (...) {
            fail(false, CMPI_RC_ERR_FAILED, "Caught an exception while saving InstallOptions data to local buffer!");
        }

        if (!options.asynchronous) {
            value = updateSynchronously(device, fileName, deviceId.c_str());
        } else {
            const auto start = [&](ProviderState& provider, CmpiObjectPath& jobPath) {
                return StartFCFlashUpdateThread(provider, device, reinterpret_cast<const unsigned char*>(fileName),
                                                jobPath);
            };
            if (installservice::startJob(nameSpace, out, start)) {
                value = 4096;
            } else {
                INSTALL_DEBUG("invokeMethod_SoftwareInstallationService: Failed to create flash update job thread");
                value = 2;
            }
        }
    } catch (const CmpiStatus& st) {
        INSTALL_DEBUG("Vexlan_FCHBA_Provider INSTALL_FROM_URI exception: %s %s", GetCMPIErrorString(st.rc()),
                      st.hasMsg() ? st.msg() : "");
        value = 2;
    }
    ReturnMethodValue(rslt, value);
    INSTALL_DEBUG("Exiting  invokeMethod_SoftwareInstallationService");
    return CmpiStatus(CMPI_RC_OK);
}

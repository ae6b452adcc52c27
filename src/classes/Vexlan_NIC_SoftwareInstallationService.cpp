// Vexlan_NIC_SoftwareInstallationService, its Capabilities, and the NIC
// flash update methods.
#include "classes/Vexlan_NIC_SoftwareInstallationService.h"

#include <strings.h>
#include <unistd.h>

#include <cstdio>
#include <string>
#include <vector>

#include "classes/InstallationServiceModule.h"
#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "inventory/AdapterFunc.h"
#include "support/ProviderFiles.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/Vexlan_NIC_PrefFile.h"
#include "support/Vexlan_NIC_Utils.h"
#include "update/FlashUpdate.h"
#include "update/InstallHelpers.h"

using installservice::kServiceName;
using installservice::ServiceSlot;
using installservice::textOf;

namespace {

const char kLogPrefix[] = "Vexlan_NIC_SoftwareInstallationService";

const PropertyRow<ServiceSlot> kServiceProperties[] = {
    {"Name", CMPI_string, CLASS_VALUE(ServiceSlot, entryText(kServiceName))},
    {"SystemCreationClassName", CMPI_string, CLASS_VALUE(ServiceSlot, entryText("Vexlan_Adapter_ComputerSystem"))},
    {"SystemName", CMPI_string, CLASS_VALUE(ServiceSlot, entryText(hostName_ComputerSystem))},
    {"CreationClassName", CMPI_string, CLASS_VALUE(ServiceSlot, entryText("Vexlan_NIC_SoftwareInstallationService"))},
    {"Caption", CMPI_string, CLASS_VALUE(ServiceSlot, entryText("Update flash"))},
    {"Description", CMPI_string, CLASS_VALUE(ServiceSlot, entryText("Updating CNA flash(boot code, firmwares..."))},
    {"ElementName", CMPI_string, CLASS_VALUE(ServiceSlot, entryText("Updating Vexlan CNA flash Image"))},
};
const ClassModule<ServiceSlot> kService =
    installservice::serviceModule("Nic_SoftwareInstallationService", "Name", installservice::kServiceKeys,
                                  kServiceProperties);

const PropertyRow<ServiceSlot> kCapabilitiesProperties[] = {
    {"InstanceID", CMPI_string, CLASS_VALUE(ServiceSlot, entryText(kServiceName))},
    {"Caption", CMPI_string, CLASS_VALUE(ServiceSlot, entryText("Update Capabilities"))},
    {"SupportedAsynchronousActions", CMPI_uint16A, CLASS_VALUE(ServiceSlot, uint16Array({5}))},
    {"SupportedSynchronousActions", CMPI_uint16A, CLASS_VALUE(ServiceSlot, uint16Array({5}))},
    {"SupportedURISchemes", CMPI_uint16A, CLASS_VALUE(ServiceSlot, uint16Array({3}))},
    {"SupportedInstallOptions", CMPI_uint16A, CLASS_VALUE(ServiceSlot, uint16Array({32768}))},
    {"ElementName", CMPI_string, CLASS_VALUE(ServiceSlot, entryText("Vexlan CNA Flash Image Update"))},
    {"Description", CMPI_string,
     CLASS_VALUE(ServiceSlot, entryText("Flash image includes boot code, ASIC and MPI Firmware"))},
};
const ClassModule<ServiceSlot> kCapabilities =
    installservice::serviceModule("Nic_SoftwareInstallationServiceCapabilities", "InstanceID",
                                  installservice::kCapabilitiesKeys, kCapabilitiesProperties);

const installservice::ServiceKeyTexts kKeyTexts = {
    "getInstance_Nic_SoftwareInstallationService",
    "Vexlan_NIC_SoftwareIdentity: Error getting Name key in getInstance\n",
    "Vexlan_NIC_SoftwareIdentity: Error getting SystemName key in getInstance\n",
    "Vexlan_NIC_SoftwareIdentity: Error invalid key data type"};

#define NIC_DEBUG(...)                                     \
    do {                                                   \
        if (g_EnableDebugPrint)                            \
            Vexlan_FC_Utils_CMPI::DebugPrint(__VA_ARGS__); \
    } while (0)
#define NIC_ERROR(...)                                   \
    do {                                                 \
        if (g_EnableLogError)                            \
            Vexlan_FC_Utils_CMPI::LogError(__VA_ARGS__); \
    } while (0)

[[noreturn]] void raise(CMPIrc code)
{
    throw CmpiStatus(code);
}

// A failure logged as "<service>: Error: <text>" and thrown with its text.
[[noreturn]] void raiseLogged(CMPIrc code, const char* text)
{
    NIC_ERROR("%s: Error: %s", kLogPrefix, text);
    throw CmpiStatus(code, text);
}

bool absent(const CmpiData& d)
{
    return d.isNullValue() || d.isNotFound();
}

// The adapter that a Vexlan_NIC_PortController reference names by its
// DeviceID; the class and the key are checked on the way.
_CNAStruc* targetAdapter(const CmpiData& target, std::string& deviceId)
{
    const CmpiObjectPath targetPath = target;
    if (strcasecmp(targetPath.getClassName().charPtr(), "Vexlan_NIC_PortController") != 0)
        raise(CMPI_RC_ERR_INVALID_CLASS);
    CMPIObjectPath* tp = targetPath.getEnc();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIData key = tp->ft->getKey(tp, "DeviceID", &rc);
    if (rc.rc != CMPI_RC_OK) {
        NIC_ERROR("Vexlan_NIC_SoftwareInstallationService: Error getting Name key invokeMethod\n");
        raise(CMPI_RC_ERR_INVALID_PARAMETER);
    }
    if (key.type != CMPI_string) {
        NIC_ERROR("Vexlan_NIC_SoftwareInstallationService: Invalid key type in invokeMethod\n");
        raise(CMPI_RC_ERR_INVALID_PARAMETER);
    }
    const char* text = (key.state & CMPI_nullValue) ? nullptr : textOf(key.value.string);
    deviceId = text != nullptr ? text : "";
    NIC_DEBUG("Vexlan_NIC_SoftwareInstallationService: NIC_PortController.DeviceID = %s", deviceId.c_str());
    return FindCNAFromSerialNumber(deviceId.c_str());
}

// Writes a byte stream image to a private temporary file, so that the
// adapter library gets it as it gets a file image: a name it can read to the
// image's end and no further. Empty on failure.
std::string imageFileOf(const std::vector<unsigned char>& image)
{
    std::string name = "/var/tmp/vxln_cna_image.XXXXXX";
    if (!WritePrivateTempFile(name, image.data(), image.size()))
        return std::string();
    return name;
}

unsigned int installFromURI(const CmpiObjectPath& ref, const CmpiArgs& in, CmpiArgs& out, CmpiStatus& early)
{
    const CmpiData uri = in.getArg("URI");
    const CmpiData target = in.getArg("Target");
    if (absent(uri) || absent(target) || uri.getType() != CMPI_string)
        raise(CMPI_RC_ERR_INVALID_PARAMETER);
    std::string deviceId;
    _CNAStruc* adapter = targetAdapter(target, deviceId);
    if (adapter == nullptr) {
        NIC_DEBUG("Vexlan_NIC_SoftwareInstallationService: pCNACard is NULL after FindCNAFromSerialNumber() call");
        raise(CMPI_RC_ERR_INVALID_PARAMETER);
    }

    const char* nameSpace = nullptr;
    if (!installservice::readServiceNameSpace(ref, nameSpace, early))
        return 0;

    const char* uriText = uri;
    if (uriText == nullptr)
        raiseLogged(CMPI_RC_ERR_INVALID_PARAMETER, "URI argument is NULL!");
    char fileName[kFlashFileNameSize];
    if (!FlashFileNameOfURI(uriText, fileName))
        raiseLogged(CMPI_RC_ERR_INVALID_PARAMETER, "Invalid or unsupported URI!");
    if (strncasecmp(uriText, "file://", 7) == 0)
        NIC_DEBUG("Vexlan_NIC_SoftwareInstallationService: Detected the leading 'file://' tag.  After removing the "
                  "tag, flashFileName=%s",
                  fileName);
    // Only a regular image file within its bound is handed on (a FIFO or a
    // device would stall the write); anything else counts as not there.
    if (!fileExists(fileName) || !FlashImageUsable(fileName))
        raiseLogged(CMPI_RC_ERR_INVALID_PARAMETER, "Invalid or unsupported URI!");
    NIC_DEBUG("Vexlan_NIC_SoftwareInstallationService: URI=%s.  File exists.", uriText);
    NIC_DEBUG("Vexlan_NIC_SoftwareInstallationService: flashFileName = %s", fileName);

    char localFile[kFlashFileNameSize];
    const unsigned long long imageSize = GetFlashImageFromURI(fileName, localFile);
    NIC_DEBUG("Vexlan_NIC_SoftwareInstallationService: imageSize = %llu, localFile= %s", imageSize, localFile);
    if (imageSize == 0 || imageSize > kMaxNicImageSize) {
        NIC_DEBUG("Vexlan_NIC_SoftwareInstallationService: Image did not pass the size check");
        raise(CMPI_RC_ERR_INVALID_PARAMETER);
    }

    const CmpiData optionsArgument = in.getArg("InstallOptions");
    InstallOptions options;
    if (absent(optionsArgument)) {
        NIC_DEBUG("Vexlan_NIC_SoftwareInstallationService: InstallOptions argument not passed. Will do synchronous "
                  "update.");
    } else {
        try {
            options = ReadInstallOptions(optionsArgument);
        } catch (...) {
            raiseLogged(CMPI_RC_ERR_FAILED, "Caught an exception while saving InstallOptions data to local buffer!");
        }
        NIC_DEBUG("Vexlan_NIC_SoftwareInstallationService: installOptionsSize=%llu",
                  static_cast<unsigned long long>(options.count));
        if (options.asynchronous)
            NIC_DEBUG("Vexlan_NIC_SoftwareInstallationService: Asynchronous update option specified.");
    }

    if (gbFlashUpdateInProgress) {
        NIC_DEBUG("Vexlan_NIC_SoftwareInstallationService: A flash update operation is already in progress. Wait for it "
                  "to be finished.");
        raise(CMPI_RC_ERR_INVALID_PARAMETER);
    }

    const unsigned char* file = reinterpret_cast<const unsigned char*>(localFile);
    if (options.asynchronous) {
        // Set only if still clear: a job that started in between wins.
        bool idle = false;
        if (!gbFlashUpdateInProgress.compare_exchange_strong(idle, true)) {
            NIC_DEBUG("Vexlan_NIC_SoftwareInstallationService: A flash update operation is already in progress. Wait "
                      "for it to be finished.");
            raise(CMPI_RC_ERR_INVALID_PARAMETER);
        }
        const auto start = [&](ProviderState& provider, CmpiObjectPath& jobPath) {
            return StartNICFlashUpdateThread(provider, adapter, file, imageSize, jobPath);
        };
        if (!installservice::startJob(nameSpace, out, start)) {
            gbFlashUpdateInProgress = false;
            NIC_DEBUG("Vexlan_NIC_SoftwareInstallationService: Failed to create flash update job thread");
            return 2;
        }
        NIC_DEBUG("Vexlan_NIC_SoftwareInstallationService: Successfully created flash update job thread");
        return 4096;
    }
    NIC_DEBUG("Vexlan_NIC_SoftwareInstallationService: Will do synchronous update.");
    const unsigned int value = static_cast<unsigned int>(UpdateCNAFlashImage(adapter, file, imageSize));
    NIC_DEBUG("Vexlan_NIC_SoftwareInstallationService: UpdateCNAFlashImage returns %u", value);
    return value;
}

unsigned int installFromByteStream(const CmpiArgs& in)
{
    const CmpiData image = in.getArg("Image");
    const CmpiData target = in.getArg("Target");
    // The type must be the array flag alone.
    if (absent(image) || absent(target) || image.getType() != CMPI_ARRAY)
        raise(CMPI_RC_ERR_INVALID_PARAMETER);
    std::string deviceId;
    _CNAStruc* adapter = targetAdapter(target, deviceId);
    if (adapter == nullptr)
        raise(CMPI_RC_ERR_INVALID_PARAMETER);
    const CmpiArray bytes = image;
    const unsigned long long size = bytes.size();
    if (size == 0 || size > kMaxNicImageSize)
        raise(CMPI_RC_ERR_INVALID_PARAMETER);
    std::vector<unsigned char> buffer;
    try {
        buffer.resize(static_cast<std::size_t>(size));
    } catch (...) {
        raise(CMPI_RC_ERR_FAILED);
    }
    for (std::size_t i = 0; i < buffer.size(); ++i)
        buffer[i] = static_cast<unsigned char>(bytes[static_cast<int>(i)]);
    const std::string file = imageFileOf(buffer);
    if (file.empty())
        raise(CMPI_RC_ERR_FAILED);
    const unsigned int value =
        static_cast<unsigned int>(UpdateCNAFlashImage(adapter, reinterpret_cast<const unsigned char*>(file.c_str()), size));
    unlink(file.c_str());
    return value;
}

// Source and Target must be there; the adapter found or not, the method
// installs nothing.
unsigned int installFromSoftwareIdentity(const CmpiArgs& in)
{
    const CmpiData source = in.getArg("Source");
    const CmpiData target = in.getArg("Target");
    if (absent(source) || absent(target))
        raise(CMPI_RC_ERR_INVALID_PARAMETER);
    std::string deviceId;
    targetAdapter(target, deviceId);
    raise(CMPI_RC_ERR_INVALID_PARAMETER);
}

unsigned int checkSoftwareIdentity(const CmpiArgs& in)
{
    const CmpiData source = in.getArg("Source");
    const CmpiData target = in.getArg("Target");
    const CmpiData collection = in.getArg("Collection");
    if (absent(source) || absent(target) == absent(collection))
        raise(CMPI_RC_ERR_INVALID_PARAMETER);
    if (absent(target))
        raise(CMPI_RC_ERR_INVALID_PARAMETER);
    std::string deviceId;
    if (targetAdapter(target, deviceId) != nullptr)
        raise(CMPI_RC_ERR_INVALID_PARAMETER);
    raise(CMPI_RC_ERR_TYPE_MISMATCH);
}

struct NicMethod {
    const char* name;
    const char* exceptionText;
};

}  // namespace

unsigned long long GetFlashImageFromURI(const char* uri, char* localFile)
{
    safeStrCpy(localFile, uri, kFlashFileNameSize);
    return GetFileSize(localFile);
}

VEXLAN_INSTALLATION_SERVICE_OPERATIONS(Nic_SoftwareInstallationService, kService, kKeyTexts)
VEXLAN_SINGLE_CLASS_OPERATIONS(Nic_SoftwareInstallationServiceCapabilities, kCapabilities)

CmpiStatus invokeMethod_Nic_SoftwareInstallationService(const CmpiContext&, CmpiResult& rslt,
                                                        const CmpiObjectPath& ref, const char* methodName,
                                                        const CmpiArgs& in, CmpiArgs& out)
{
    static const NicMethod kMethods[] = {
        {"InstallFromURI", "Vexlan_NIC_Provider INSTALL_FROM_URI exception: %d %s"},
        {"InstallFromSoftwareIdentity", "Vexlan_NIC_Provider INSTALL_FROM_SOFTWAREIDENTITY exception: %d %s"},
        {"InstallFromByteStream", "Vexlan_NIC_Provider INSTALL_FROM_BYTESTREAM exception: %d %s"},
        {"CheckSoftwareIdentity", "Vexlan_NIC_Provider CHECK_SOFTWARE_IDENTITY exception: %d %s"},
    };
    const char* name = methodName != nullptr ? methodName : "";
    int method = -1;
    for (int i = 0; i < 4 && method < 0; ++i)
        if (strcasecmp(name, kMethods[i].name) == 0)
            method = i;
    unsigned int value = 1;
    if (method >= 0) {
        try {
            CmpiStatus early(CMPI_RC_OK);
            switch (method) {
            case 0:
                value = installFromURI(ref, in, out, early);
                if (early.rc() != CMPI_RC_OK)
                    return early;
                break;
            case 1:
                value = installFromSoftwareIdentity(in);
                break;
            case 2:
                value = installFromByteStream(in);
                break;
            default:
                value = checkSoftwareIdentity(in);
                break;
            }
        } catch (const CmpiStatus& st) {
            if (g_EnableDebugPrint) {
                char text[1024];
                std::snprintf(text, sizeof(text), "%d %s", static_cast<int>(st.rc()), st.hasMsg() ? st.msg() : "");
                // The method's own line, with the code and the message.
                std::string line = kMethods[method].exceptionText;
                line = line.substr(0, line.find("%d")) + text;
                Vexlan_FC_Utils_CMPI::DebugPrint("%s", line.c_str());
            }
            value = 2;
        }
    }
    ReturnMethodValue(rslt, value);
    return CmpiStatus(CMPI_RC_OK);
}

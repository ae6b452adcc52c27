// Vexlan_FCHBA_SoftwareIdentity as a class module: a list of eight slots per
// FC function, filled with the function's software and, once per adapter
// serial on converged and newer chips, its flash image.
#include "classes/Vexlan_FCHBA_SoftwareIdentity_CMPI.h"

#include <time.h>

#include <cstdio>
#include <cstring>
#include <string>

#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "classes/Vexlan_FC_FCPort_CMPI.h"
#include "inventory/AdapterFunc_Chip.h"
#include "inventory/AdapterFunc_Identity.h"
#include "inventory/AdapterFunc_VPD.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/Vexlan_NIC_Utils.h"
#include "support/ossimpl-CIM.h"

ClassList<SoftwareIdentityEntry> g_SoftwareIdentityList;

namespace {

#define SWID_DEBUG(...)                                    \
    do {                                                   \
        if (g_EnableDebugPrint)                            \
            Vexlan_FC_Utils_CMPI::DebugPrint(__VA_ARGS__); \
    } while (0)

const char kProviderVersion[] = "1.5.6";
constexpr int kSlotsPerFunction = 8;

// Names and descriptions by classification; the two %s of a name are the
// vendor word and the serial.
struct ClassificationText {
    std::uint16_t classification;
    const char* cnaName;
    const char* fcName;
    const char* description;
    bool releaseDate;
};
const ClassificationText kTexts[] = {
    {kSoftwareFlashImage, "%s CNA Adapter %s Flash Image", "%s Fibre Channel Adapter %s Flash Image",
     "The Flash Image for Vexlan CNAs.", true},
    {kSoftwareDriver, "%s CNA Adapter %s Driver", "%s Fibre Channel Adapter %s Driver",
     "The driver acts as a translator between the Vexlan FC HBA and the Operating System. The driver accepts "
     "generic commands from the OS and translates them into specialized commands for the Vexlan FC HBA.",
     false},
    {kSoftwareFlashFirmware, "%s CNA Adapter %s Flash Firmware", "%s Fibre Channel Adapter %s Flash Firmware",
     "Flash Firmware. The FC HBA firmware (RISC Code) programs the RSX device to provide Fibre Channel "
     "functionality (i.e. FC protocol support). The firmware also abstracts most of the protocol-specific Fibre "
     "Channel functions from the OS drivers.",
     true},
    {kSoftwareBIOS, "%s CNA Adapter %s BIOS", "%s Fibre Channel Adapter %s BIOS",
     "The BIOS (boot code) for Vexlan FC HBAs is required if the computer system is booting from a storage "
     "device (boot device) attached to the Vexlan FC HBA. The BIOS (which resides on the HBA's flash memory) has "
     "the primary function of communicating with the external boot device before the OS is up and running. It "
     "also performs other functions like managing the setup for the HBA and initializing and testing the HBA's "
     "RSX.",
     true},
    {kSoftwareCIMProvider, "%s CNA %s CIM Provider", "%s CNA %s CIM Provider", "The CNA CIM Provider version.",
     false},
    {kSoftwareDriverFirmware, "%s CNA Adapter %s Driver Firmware", "%s Fibre Channel Adapter %s Driver Firmware",
     "Driver Firmware. The FC HBA firmware (RISC Code) programs the RSX device to provide Fibre Channel "
     "functionality (i.e. FC protocol support). The firmware also abstracts most of the protocol-specific Fibre "
     "Channel functions from the OS drivers.",
     false},
};

const ClassificationText* textsOf(const SoftwareIdentityEntry& e)
{
    for (const ClassificationText& t : kTexts)
        if (t.classification == e.classification)
            return &t;
    return nullptr;
}

// True for a serial in the 11S product ID form (the test trims a copy).
bool hasIBM11SSerial(const SoftwareIdentityEntry& e)
{
    char copy[sizeof(e.serialNumber)];
    std::memcpy(copy, e.serialNumber, sizeof(copy));
    copy[sizeof(copy) - 1] = '\0';
    return IsIBM11SProductId(copy) != 0;
}

// A name pattern with its two "%s" filled in.
std::string fillName(const char* pattern, const char* vendor, const char* serial)
{
    std::string out;
    const char* fills[] = {vendor, serial};
    int next = 0;
    for (const char* p = pattern; *p != '\0'; ++p) {
        if (p[0] == '%' && p[1] == 's' && next < 2) {
            out += fills[next++];
            ++p;
        } else {
            out += *p;
        }
    }
    return out;
}

// The brand and the name depend on the entry's own fields only, so the build
// settles them once per entry.
void settleNameAndBrand(SoftwareIdentityEntry& e)
{
    const bool ibm = hasIBM11SSerial(e);
    e.partnerBrand = ibm ? 1 : 0;
    e.name[0] = '\0';
    const ClassificationText* t = textsOf(e);
    if (t == nullptr)
        return;
    const std::string text = fillName(e.isCNA == 1 ? t->cnaName : t->fcName, ibm ? "IBM" : "Vexlan",
                                      GetSerialNumberFromIBM11SProductId(e.serialNumber));
    safeStrCpy(e.name, text.c_str(), sizeof(e.name));
}

PropertyValue manufacturer(const SoftwareIdentityEntry& e)
{
    return entryText(e.partnerBrand ? "IBM" : "Vexlan Corporation");
}

PropertyValue name(const SoftwareIdentityEntry& e)
{
    if (textsOf(e) == nullptr)
        return std::nullopt;
    return entryText(e.name);
}

PropertyValue description(const SoftwareIdentityEntry& e)
{
    const ClassificationText* t = textsOf(e);
    if (t == nullptr)
        return std::nullopt;
    return entryText(t->description);
}

PropertyValue releaseDate(const SoftwareIdentityEntry& e)
{
    const ClassificationText* t = textsOf(e);
    if (t == nullptr || !t->releaseDate || e.mbiValid != 1)
        return std::nullopt;
    return CmpiData(CmpiDateTime(dtGetBinaryFormat(e.mbiDay, e.mbiMonth, e.mbiYear), false));
}

const PropertyRow<SoftwareIdentityEntry> kProperties[] = {
    {"InstanceID", CMPI_string, CLASS_VALUE(SoftwareIdentityEntry, entryText(e.instanceId))},
    {"Manufacturer", CMPI_string, manufacturer},
    {"VersionString", CMPI_string, CLASS_VALUE(SoftwareIdentityEntry, entryText(e.versionString))},
    {"Classifications", CMPI_uint16A, CLASS_VALUE(SoftwareIdentityEntry, uint16Array({e.classification}))},
    {"IdentityInfoType", CMPI_stringA,
     CLASS_VALUE(SoftwareIdentityEntry, stringArray({"SoftwareID", "SoftwareStatus"}))},
    {"IdentityInfoValue", CMPI_stringA, CLASS_VALUE(SoftwareIdentityEntry, stringArray({e.deviceKey, "2"}))},
    {"Name", CMPI_string, name},
    {"Description", CMPI_string, description},
    {"ReleaseDate", CMPI_dateTime, releaseDate},
};

const char* const kKeys[] = {"InstanceID", nullptr};

const ClassModule<SoftwareIdentityEntry> kSoftwareIdentity =
    ClassModule<SoftwareIdentityEntry>("SoftwareIdentity")
        .list(g_SoftwareIdentityList, ListKind::Full)
        .key("InstanceID", [](const SoftwareIdentityEntry& e) -> const char* { return e.instanceId; })
        .filterKeys(kKeys)
        .pathKeys(kKeys)
        .properties(kProperties)
        .enumerationsTestValid();

// A version text of the device record, read within its field and trimmed.
template <std::size_t N>
void trimmedVersion(const char (&field)[N], char* out, std::size_t size)
{
    FormatFCText(out, size, "%.*s", static_cast<int>(N), field);
    Trim(out);
}

// What every entry of one function shares.
struct FunctionFacts {
    unsigned char isCNA;
    const char* serial;
    const char* host;
    const char* nodeWWN;
    char deviceKey[128];
    const int* mbi;          // major, minor, build, day, month, year
    bool mbiValid;
};

// Fills the next slot; false when the list is full.
bool addEntry(int& next, const FunctionFacts& f, const char* suffix, std::uint16_t classification,
              const char* version, bool withWWN = true)
{
    if (next >= g_SoftwareIdentityList.count)
        return false;
    SoftwareIdentityEntry& e = g_SoftwareIdentityList.entries[next++];
    e.isCNA = f.isCNA;
    if (withWWN)
        FormatFCText(e.instanceId, sizeof(e.instanceId), "%s_%s_%s_%s", f.host, f.serial, f.nodeWWN, suffix);
    else
        FormatFCText(e.instanceId, sizeof(e.instanceId), "%s_%s_%s", f.host, f.serial, suffix);
    FormatFCText(e.serialNumber, sizeof(e.serialNumber), "%s", f.serial);
    FormatFCText(e.deviceKey, sizeof(e.deviceKey), "%s", f.deviceKey);
    FormatFCText(e.versionString, sizeof(e.versionString), "%s", version);
    e.classification = classification;
    e.mbiValid = f.mbiValid ? 1 : 0;
    e.mbiMajor = f.mbi[0];
    e.mbiMinor = f.mbi[1];
    e.mbiBuild = f.mbi[2];
    e.mbiDay = f.mbi[3];
    e.mbiMonth = f.mbi[4];
    e.mbiYear = f.mbi[5];
    settleNameAndBrand(e);
    e.valid = 1;
    return true;
}

bool flashImageListed(const char* instanceId)
{
    for (int i = 0; i < g_SoftwareIdentityList.count; ++i)
        if (g_SoftwareIdentityList.entries[i].valid &&
            std::strcmp(g_SoftwareIdentityList.entries[i].instanceId, instanceId) == 0)
            return true;
    return false;
}

void createSoftwareIdentity(_tagZORAPSDMDevice* device, int& next, char* serial, std::size_t serialSize)
{
    SWID_DEBUG("Entering createSoftwareIdentity, current_index= %d", next);
    char host[kHostNameBufferSize] = {};
    int hostKind = 0;
    GetHostName(host, &hostKind, sizeof(host));

    int mbi[6] = {0, 0, 0, 0, 0, 0};
    bool mbiValid = false;
    char* mbiText = nullptr;
    std::uint32_t mbiLength = 0;
    if (ZORAP_GetMBIVersionString(device, &mbiText, &mbiLength) == 0) {
        if (mbiText != nullptr) {
            // The date reads month, day, year.
            std::sscanf(mbiText, "V:%d.%02d.%02d,D:%02d%02d%4d,A:Y,T:M", &mbi[0], &mbi[1], &mbi[2], &mbi[4],
                        &mbi[3], &mbi[5]);
            ZORAP_FreeMem(mbiText);
        }
        mbiValid = true;
    }

    std::memset(g_serialNumber, 0, kVpdLineSize);
    const int vpdResult = GetHBAVPDData(device);
    if (vpdResult == 0)
        SWID_DEBUG("Vexlan_FC_SoftwareIdentity: createSoftwareIdentity: VPD data retrieved successfully.");
    else
        SWID_DEBUG("Vexlan_FC_SoftwareIdentity: createSoftwareIdentity: Unable to retrieve VPD data!");
    TakeFCSerial(device, vpdResult, serial, serialSize);

    const int chipCode = GetRSXType(device);
    FunctionFacts f{};
    f.isCNA = IsEnodeMacChipCode(chipCode) ? 1 : 0;
    f.serial = serial;
    f.host = host;
    char nodeWWN[kFCWWNTextSize];
    FormatWWN(device->nodeWWN, nodeWWN, sizeof(nodeWWN));
    f.nodeWWN = nodeWWN;
    FormatFCText(f.deviceKey, sizeof(f.deviceKey), "%.*s", static_cast<int>(sizeof(device->modelName)),
                 device->modelName);
    f.mbi = mbi;
    f.mbiValid = mbiValid;

    char driver[64], firmware[64], bios[64], flashFirmware[32];
    trimmedVersion(device->driverVersionText, driver, sizeof(driver));
    trimmedVersion(device->firmwareVersionText, firmware, sizeof(firmware));
    trimmedVersion(device->biosVersionText, bios, sizeof(bios));
    if (chipCode >= 8 && (device->optionRomMask & 0x1u) != 0)
        FormatFCText(flashFirmware, sizeof(flashFirmware), "%d.%02d.%02d", device->firmwareVersion[0],
                     device->firmwareVersion[1], device->firmwareVersion[2]);
    else
        FormatFCText(flashFirmware, sizeof(flashFirmware), "N/A");

    // The provider's own entry names the host as the computer system does.
    FunctionFacts provider = f;
    provider.host = hostName_ComputerSystem;
    addEntry(next, provider, "_CIMProvider", kSoftwareCIMProvider, kProviderVersion);
    addEntry(next, f, "_Driver", kSoftwareDriver, driver);
    addEntry(next, f, "_DriverFirmware", kSoftwareDriverFirmware, firmware);
    addEntry(next, f, "_FlashFirmware", kSoftwareFlashFirmware, flashFirmware);
    addEntry(next, f, "_BIOS", kSoftwareBIOS, bios);
    const std::string fcode(device->fcodeVersionText, strnlen(device->fcodeVersionText, sizeof(device->fcodeVersionText)));
    if (!fcode.empty())
        addEntry(next, f, "_Fcode", kSoftwareFcode, fcode.c_str());
    const std::string efi(device->efiVersionText, strnlen(device->efiVersionText, sizeof(device->efiVersionText)));
    if (!efi.empty())
        addEntry(next, f, "_EFI", kSoftwareEFI, efi.c_str());

    if (chipCode > 14) {
        char id[128];
        FormatFCText(id, sizeof(id), "%s_%s_%s", host, serial, "_FlashImage");
        if (!flashImageListed(id)) {
            char version[kVpdLineSize] = {};
            SWID_DEBUG("createSoftwareIdentity: g_flashImageVersion=%s", g_flashImageVersion);
            if (mbiValid) {
                FormatFCText(version, sizeof(version), "%d.%d.%d", mbi[0], mbi[1], mbi[2]);
            } else {
                const char* colon = static_cast<const char*>(
                    std::memchr(g_flashImageVersion, ':', strnlen(g_flashImageVersion, kVpdLineSize)));
                if (colon != nullptr)
                    FormatFCText(version, sizeof(version), "%s", colon + 1);
            }
            SWID_DEBUG("createSoftwareIdentity: flashimageversion=%s", version);
            if (version[0] == '\0') {
                SWID_DEBUG("createSoftwareIdentity: flashimageversion is NULL");
                if (!mbiValid && g_flashImageVersion[0] == '\0')
                    SWID_DEBUG("ERROR: Cannot get flash image version from VPD!");
            }
            addEntry(next, f, "_FlashImage", kSoftwareFlashImage, version, false);
        }
    }
    SWID_DEBUG("Exiting  createSoftwareIdentity, current_index= %d", next);
}

}  // namespace

namespace {

// Microseconds since the Epoch of the date's 0:00 local time, with the
// daylight saving flag of `now`.
std::uint64_t convertDate(time_t now, int day, int month, int year)
{
    struct tm present {};
    localtime_r(&now, &present);
    struct tm date {};
    date.tm_isdst = present.tm_isdst;
    date.tm_mday = day;
    date.tm_mon = month;
    date.tm_year = year - 1900;
    const time_t seconds = mktime(&date);
    if (seconds == static_cast<time_t>(-1))
        return 0;
    return static_cast<std::uint64_t>(seconds) * 1000000ULL;
}

// The last date converted on this thread and the second it was converted in:
// within that second the same date gives the same value, so an enumeration
// converts each date once a second instead of once an instance.
struct ConvertedDate {
    bool known = false;
    time_t second = 0;
    int day = 0, month = 0, year = 0;
    std::uint64_t value = 0;
};
thread_local ConvertedDate t_lastDate;

}  // namespace

std::uint64_t dtGetBinaryFormat(int day, int month, int year)
{
    const time_t now = time(nullptr);
    ConvertedDate& last = t_lastDate;
    if (last.known && last.second == now && last.day == day && last.month == month && last.year == year)
        return last.value;
    last = ConvertedDate{true, now, day, month, year, convertDate(now, day, month, year)};
    return last.value;
}

void removeSoftwareIdentityList()
{
    g_SoftwareIdentityList.remove();
}

void buildSoftwareIdentityList()
{
    int functions = 0;
    if (!classmodule::walkProtocols([&](_zorap_adapter_t* a, _zorap_phy_port_t* p, _zorap_protocol_t* pr) {
            if (IsFCProtocol(a, p, pr))
                ++functions;
        }))
        return;
    if (!g_SoftwareIdentityList.allocate(functions * kSlotsPerFunction))
        return;
    int next = 0;
    char serial[128] = {};
    classmodule::walkProtocols([&](_zorap_adapter_t* a, _zorap_phy_port_t* p, _zorap_protocol_t* pr) {
        if (IsFCProtocol(a, p, pr))
            createSoftwareIdentity(&pr->fcDevice, next, serial, sizeof(serial));
    });
}

VEXLAN_LIST_CLASS_OPERATIONS(SoftwareIdentity, kSoftwareIdentity)

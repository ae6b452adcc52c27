// Vexlan_FCHBA_FCPort as a class module: a full list, one slot per FC
// protocol function, each filled from the device's VPD, option ROM, port
// property record and chip code.
#include "classes/Vexlan_FC_FCPort_CMPI.h"

#include <cstdarg>
#include <cstdio>
#include <cstring>

#include "classes/Vexlan_Adapter_ComputerSystem_CMPI.h"
#include "inventory/AdapterFunc_Chip.h"
#include "inventory/AdapterFunc_Transceiver.h"
#include "inventory/AdapterFunc_VPD.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/Vexlan_NIC_Utils.h"

ClassList<FCPortEntry> g_FCPortList;

namespace {

const char kSystemClassName[] = "Vexlan_Adapter_ComputerSystem";
const char kClassName[] = "Vexlan_FCHBA_FCPort";

#define debug(...)                                      \
    do {                                                \
        if (g_EnableDebugPrint)                         \
            Vexlan_FC_Utils_CMPI::DebugPrint(__VA_ARGS__); \
    } while (0)

// Zeroes the text of a field, which leaves it as a clear of the whole field
// would: nothing reads behind a field's first zero.
template <std::size_t N>
void clearText(char (&field)[N])
{
    std::memset(field, 0, strnlen(field, N));
}

// Appends ";<text>" to a text of `size` bytes whose first `used` bytes are
// taken, cutting at the end; returns the new length.
std::size_t appendField(char* target, std::size_t size, std::size_t used, const char* text)
{
    if (used + 1 >= size)
        return used;
    const std::size_t total = JoinFCText(target + used, size - used, {";", text});
    return used + (total < size - used - 1 ? total : size - used - 1);
}

// The VPD lines that follow product, part number and serial in VPDData, in
// their order, each only when the VPD had it.
char* const kOptionalVpdLines[] = {g_fcCodeVersion, g_fruNumberVersion, g_miscInfo,    g_manufacturingId,
                                   g_efiVersion,    g_fwVersion,         g_biosVersion, g_fcodeVersion};

// The buffers a port build clears before it reads the device's VPD.
char* const kClearedVpdLines[] = {g_productId,  g_RTag,         g_partNumber,       g_serialNumber,
                                  g_miscInfo,   g_manufacturingId, g_efiVersion,    g_fwVersion,
                                  g_biosVersion, g_fcodeVersion, g_fruNumberVersion, g_fcCodeVersion,
                                  g_flashImageVersion, g_assetTag, g_endTag};

char* const kOptionROMLines[] = {g_optionROMBIOS, g_optionROMEFI, g_optionROMFCode, g_optionROMFirmware};

// VPDData of one device from the freshly decoded buffers.
void composeVpdData(FCPortEntry& entry, int chipCode)
{
    const std::size_t size = sizeof(entry.vpdData);
    const std::size_t first =
        JoinFCText(entry.vpdData, size, {g_productId, ";", g_partNumber, ";", g_serialNumber});
    std::size_t used = first < size - 1 ? first : size - 1;
    for (const char* line : kOptionalVpdLines)
        if (line[0] != '\0')
            used = appendField(entry.vpdData, size, used, line);
    if (IsEnodeMacChipCode(chipCode) && g_flashImageVersion[0] != '\0')
        appendField(entry.vpdData, size, used, g_flashImageVersion);
}

// OperationalStatus of the port state code, with the DeviceStatus bits that a
// loop down sets and an online port clears.
constexpr std::uint32_t kLoopDownStatusBits = 0x1u | 0x1000u;

void takePortState(_tagZORAPSDMDevice* device, FCPortEntry& entry)
{
    switch (device->portStateCode) {
    case ZORAP_PORT_STATE_ONLINE:
        debug("Port state ok...");
        entry.operationalStatus = 2;
        device->portPropertyIndex &= ~kLoopDownStatusBits;
        break;
    case ZORAP_PORT_STATE_LOOPDOWN:
        debug("Port state - Loopdown...");
        entry.operationalStatus = 6;
        device->portPropertyIndex |= kLoopDownStatusBits;
        break;
    case ZORAP_PORT_STATE_SUSPENDED:
        debug("Port state - Suspended...");
        entry.operationalStatus = 1;
        break;
    default:
        debug("Port state - other ...");
        entry.operationalStatus = 1;
        break;
    }
}

// Fills one slot from one FC function. `serial` is the build's serial buffer,
// which keeps its text from one device to the next.
bool createFCPort(_tagZORAPSDMDevice* device, FCPortEntry& entry, char* serial, std::size_t serialSize)
{
    for (char* line : kClearedVpdLines)
        ClearVpdLine(line);
    clearText(entry.vpdData);

    const int chipCode = GetRSXType(device);
    const int vpdResult = GetHBAVPDData(device);
    if (vpdResult == 0) {
        debug("Vexlan_FC_FCPort: createFCPort: VPD data retrieved successfully.");
        composeVpdData(entry, chipCode);
    } else {
        debug("Vexlan_FC_FCPort: createFCPort: Unable to retrieve VPD data!");
    }

    for (char* line : kOptionROMLines)
        ClearVpdLine(line);
    clearText(entry.optionROMVersions);
    if (chipCode > 5) {
        GetHBAOptionROMVersions(device);
        debug("Vexlan_FC_FCPort: createFCPort: Option ROM versions retrieved.");
        JoinFCText(entry.optionROMVersions, sizeof(entry.optionROMVersions),
                   {g_optionROMBIOS, ";", g_optionROMEFI, ";", g_optionROMFCode, ";", g_optionROMFirmware});
    }

    TakeFCSerial(device, vpdResult, serial, serialSize);
    char nodeWWN[kFCWWNTextSize];
    FormatWWN(device->nodeWWN, nodeWWN, sizeof(nodeWWN));
    FormatWWN(device->portWWN, entry.portWWN, sizeof(entry.portWWN));
    JoinFCText(entry.deviceId, sizeof(entry.deviceId), {serial, "_", nodeWWN, "_", entry.portWWN});
    JoinFCText(entry.serialNumber, sizeof(entry.serialNumber), {serial});

    device->portPropertyIndex = 0;
    if (ZORAP_GetHbaDevicePortProperty(device->deviceHandle, 0, device->portWWN) != 0) {
        debug("Vexlan_FC_FCPort: Failed to get DevicePortProperty, setting PortStatus & PortType to Unknown...");
        entry.operationalStatus = 0;
        entry.portType = 0;
        entry.speed = 0;
    } else {
        takePortState(device, entry);
        entry.portType = FCPortTypeForCode(device->portTypeCode);
        entry.speed = FCPortSpeedForCode(device->portSpeedCode, chipCode, entry.speedDescription,
                                         sizeof(entry.speedDescription));
    }

    entry.maxSpeed = FCPortMaxSpeed(device);
    entry.deviceNumber = static_cast<std::uint16_t>(device->portIndex & 0xFFFFu);
    entry.deviceStatus = device->portPropertyIndex;
    JoinFCText(entry.model, sizeof(entry.model), {{device->modelName, sizeof(device->modelName)}});
    entry.macAvailable = TakeENodeMAC(device, entry.macAddress);
    entry.device = device;
    return true;
}

// ---- the class's tables -----------------------------------------------------

const PropertyRow<FCPortEntry> kProperties[] = {
    {"SystemCreationClassName", CMPI_string, CLASS_VALUE(FCPortEntry, entryText(kSystemClassName))},
    {"SystemName", CMPI_string, CLASS_VALUE(FCPortEntry, entryText(hostName_ComputerSystem))},
    {"CreationClassName", CMPI_string, CLASS_VALUE(FCPortEntry, entryText(kClassName))},
    {"DeviceID", CMPI_string, CLASS_VALUE(FCPortEntry, entryText(e.deviceId))},
    {"OperationalStatus", CMPI_uint16A, CLASS_VALUE(FCPortEntry, uint16Array({e.operationalStatus}))},
    {"ActiveFC4Types", CMPI_uint16A, CLASS_VALUE(FCPortEntry, uint16Array({0}))},
    {"PortType", CMPI_uint16, CLASS_VALUE(FCPortEntry, CmpiData(static_cast<CMPIUint16>(e.portType)))},
    {"Speed", CMPI_uint64, CLASS_VALUE(FCPortEntry, CmpiData(static_cast<CMPIUint64>(e.speed)))},
    {"MaxSpeed", CMPI_uint64, CLASS_VALUE(FCPortEntry, CmpiData(static_cast<CMPIUint64>(e.maxSpeed)))},
    {"PermanentAddress", CMPI_string, CLASS_VALUE(FCPortEntry, entryText(e.portWWN))},
    {"LinkTechnology", CMPI_uint16, CLASS_VALUE(FCPortEntry, CmpiData(static_cast<CMPIUint16>(4)))},
    {"ElementName", CMPI_string, CLASS_VALUE(FCPortEntry, entryText(e.deviceId))},
    {"UsageRestriction", CMPI_uint16, CLASS_VALUE(FCPortEntry, CmpiData(static_cast<CMPIUint16>(0)))},
    {"SupportedMaximumTransmissionUnit", CMPI_uint64, CLASS_VALUE(FCPortEntry, CmpiData(static_cast<CMPIUint64>(0)))},
    {"VPDData", CMPI_string, CLASS_VALUE(FCPortEntry, entryText(e.vpdData))},
    {"OptionROMVersions", CMPI_string, CLASS_VALUE(FCPortEntry, entryText(e.optionROMVersions))},
    {"SpeedDescription", CMPI_string, CLASS_VALUE(FCPortEntry, entryText(e.speedDescription))},
    {"DeviceNumber", CMPI_uint16, CLASS_VALUE(FCPortEntry, CmpiData(static_cast<CMPIUint16>(e.deviceNumber)))},
    {"DeviceStatus", CMPI_sint32, CLASS_VALUE(FCPortEntry, CmpiData(static_cast<CMPISint32>(e.deviceStatus)))},
    {"Model", CMPI_string, CLASS_VALUE(FCPortEntry, entryText(e.model))},
    {"ENodeMACAddress", CMPI_string, CLASS_VALUE(FCPortEntry, ENodeMACText(e.macAvailable, e.macAddress))},
};

const char* const kKeys[] = {"SystemCreationClassName", "SystemName", "CreationClassName", "DeviceID", nullptr};

const ClassModule<FCPortEntry> kFCPort = ClassModule<FCPortEntry>("FCPort")
                                             .list(g_FCPortList, ListKind::Full)
                                             .key("DeviceID", [](const FCPortEntry& e) -> const char* { return e.deviceId; })
                                             .filterKeys(kKeys)
                                             .pathKeys(kKeys)
                                             .properties(kProperties);


// ---- speeds -------------------------------------------------------------------

struct SpeedRow {
    std::uint32_t code;
    std::uint64_t speed;            // bits per second
    std::uint64_t speedOnEnodeChip; // the same code on chips 15, 17, 21, 26
    const char* description;        // null: "See Speed"
};

const SpeedRow kSpeeds[] = {
    {0, 0, 0, nullptr},
    {1, 1062500000ull, 1062500000ull, nullptr},
    {2, 2125000000ull, 2125000000ull, nullptr},
    {3, 0, 0, "Auto Negotiate"},
    {4, 4250000000ull, 4250000000ull, nullptr},
    {8, 8500000000ull, 8500000000ull, nullptr},
    {10, 10625000000ull, 10625000000ull, nullptr},
    {16, 17000000000ull, 10625000000ull, nullptr},
};

// CIM PortType by the library's type code 0..9.
const std::uint16_t kPortTypes[] = {0, 10, 11, 12, 13, 15, 16, 1, 14, 17};

}  // namespace

// ---- device routines ------------------------------------------------------------

bool IsFCProtocol(_zorap_adapter_t*, _zorap_phy_port_t*, _zorap_protocol_t* protocol)
{
    return protocol->protocolType < 2;
}

int FormatFCText(char* out, std::size_t size, const char* format, ...)
{
    if (out == nullptr || size == 0)
        return 0;
    va_list args;
    va_start(args, format);
    int n = std::vsnprintf(out, size, format, args);
    va_end(args);
    return n;
}

std::size_t JoinFCText(char* out, std::size_t size, std::initializer_list<FCTextPart> parts)
{
    if (out == nullptr || size == 0)
        return 0;
    std::size_t used = 0;
    std::size_t total = 0;
    for (const FCTextPart& part : parts) {
        const char* text = part.text != nullptr ? part.text : "(null)";   // as printf shows it
        const std::size_t length = strnlen(text, part.limit);
        total += length;
        const std::size_t room = size - 1 - used;
        const std::size_t n = length < room ? length : room;
        std::memcpy(out + used, text, n);
        used += n;
    }
    out[used] = '\0';
    return total;
}

void FormatHexBytes(const std::uint8_t* bytes, int count, char* out, std::size_t size)
{
    char text[2 * 16 + 1];
    JoinFCText(out, size, {hexBytesText(bytes, count < 16 ? (count > 0 ? count : 0) : 16, '\0', text)});
}

void FormatWWN(const std::uint8_t* wwn, char* out, std::size_t size)
{
    FormatHexBytes(wwn, 8, out, size);
}

const char* DecimalText(std::uint32_t value, char (&out)[11])
{
    char* p = out + sizeof out - 1;
    *p = '\0';
    do {
        *--p = static_cast<char>('0' + value % 10);
        value /= 10;
    } while (value != 0);
    return p;
}

void TakeFCSerial(_tagZORAPSDMDevice* device, int vpdResult, char* serial, std::size_t size)
{
    if (GetRSX4GbOrNewerType(device) == 0) {
        JoinFCText(serial, size, {{device->deviceSerial, sizeof(device->deviceSerial)}});
        return;
    }
    if (vpdResult != 0)
        return;
    const char* colon = static_cast<const char*>(std::memchr(g_serialNumber, ':', strnlen(g_serialNumber, kVpdLineSize)));
    if (colon != nullptr)
        JoinFCText(serial, size, {colon + 1});
}

std::uint8_t TakeENodeMAC(_tagZORAPSDMDevice* device, std::uint8_t* mac)
{
    if (!IsEnodeMacChipCode(GetRSXType(device)))
        return 0;
    GetDeviceMacAddress(device, reinterpret_cast<char*>(mac));
    return 1;
}

CmpiData ENodeMACText(std::uint8_t macAvailable, const std::uint8_t* mac)
{
    if (macAvailable != 1)
        return CmpiData("Not Available");
    char text[kMacTextSize];
    return CmpiData(macaddrToStr(mac, text));
}

std::uint64_t FCPortSpeedForCode(std::uint32_t speedCode, int chipCode, char* description, std::size_t size)
{
    const char* text = "See Speed";
    std::uint64_t speed = 0;
    for (const SpeedRow& row : kSpeeds) {
        if (row.code != speedCode)
            continue;
        speed = IsEnodeMacChipCode(chipCode) ? row.speedOnEnodeChip : row.speed;
        if (row.description != nullptr)
            text = row.description;
        break;
    }
    JoinFCText(description, size, {text});
    return speed;
}

std::uint64_t FCPortMaxSpeed(_tagZORAPSDMDevice* device)
{
    const int chipCode = GetRSXType(device);
    if (chipCode == 24 || chipCode == 25)
        return 17000000000ull;
    if (IsEnodeMacChipCode(chipCode))
        return 10625000000ull;
    if (GetRSX8GbType(device) > 0)
        return 8500000000ull;
    if (GetRSX4GbType(device) > 0)
        return 4250000000ull;
    return 2125000000ull;
}

std::uint16_t FCPortTypeForCode(std::uint8_t typeCode)
{
    return typeCode < sizeof(kPortTypes) / sizeof(kPortTypes[0]) ? kPortTypes[typeCode] : 0;
}

// ---- list operations --------------------------------------------------------------

void buildFCPortList()
{
    // The serial of a device whose VPD can't be read is the one before it.
    char serial[256] = {};
    kFCPort.build(IsFCProtocol, [&](_zorap_adapter_t*, _zorap_phy_port_t*, _zorap_protocol_t* protocol,
                                    FCPortEntry& entry, int) {
        return createFCPort(&protocol->fcDevice, entry, serial, sizeof(serial));
    });
}

void removeFCPortList()
{
    g_FCPortList.remove();
}

VEXLAN_LIST_CLASS_OPERATIONS(FCPort, kFCPort)

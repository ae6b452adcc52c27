// Transceiver decoding, the mezzanine board test and the ENode MAC.
#include "inventory/AdapterFunc_Transceiver.h"

#include <cstring>

#include "support/Vexlan_FC_Utils_CMPI.h"
#include "zorap_chip_ids.h"

namespace {

// Fields of the module's serial ID page: offset and length of each text.
struct PageField {
    unsigned int offset;
    unsigned int length;
    // The page must be longer than this for the field to be read.
    unsigned int needsMoreThan() const { return offset + length - 1; }
};

constexpr PageField kManufacturerField{20, 16};  // bytes 20..35
constexpr PageField kPartNumberField{40, 16};    // bytes 40..55
constexpr PageField kSerialNumberField{68, 16};  // bytes 68..83

template <std::size_t N>
void copyPageField(char (&out)[N], unsigned char* data, unsigned int size, PageField field) {
    if (data == nullptr || size <= field.needsMoreThan()) return;
    copySFPString(out, reinterpret_cast<char*>(data + field.offset), N, field.length);
}

// The three text fields, common to both decodings.
template <typename Fields>
void parseTextFields(unsigned char* data, unsigned int size, Fields* fields) {
    copyPageField(fields->Manufacturer, data, size, kManufacturerField);
    copyPageField(fields->PartNumber, data, size, kPartNumberField);
    copyPageField(fields->SerialNumber, data, size, kSerialNumberField);
}

template <typename Fields>
void printTextFields(Fields const* fields) {
    if (!g_EnableDebugPrint) return;
    Vexlan_FC_Utils_CMPI::DebugPrint("SFPField.PartNumber:   %s", fields->PartNumber);
    Vexlan_FC_Utils_CMPI::DebugPrint("SFPField.SerialNumber: %s", fields->SerialNumber);
    Vexlan_FC_Utils_CMPI::DebugPrint("SFPFIELD.Manufacturer: %s", fields->Manufacturer);
}

// Diagnostic text of each kind of board, printed with its subsystem IDs.
char const* mezzanineText(zorap_mezz_kind kind) {
    switch (kind) {
    case ZORAP_MEZZ_16G:
        return "16G Mezzanine CNA/HBA detected";
    case ZORAP_MEZZ_8G:
        return "8G Mezzanine CNA/HBA detected";
    case ZORAP_MEZZ_8G_OEM:
        return "Dell 8G Mezzanine CNA/HBA detected";
    case ZORAP_MEZZ_FIBREDOWN:
        return "Mezzanine HBA/FibreDown detected";
    case ZORAP_MEZZ_PLATFORM_2G:
        return "Dell Yellowstone platform motherboard 2G";
    case ZORAP_MEZZ_NONE:
        break;
    }
    return nullptr;
}

}  // namespace

void copySFPString(char* out, char* in, unsigned int outSize, unsigned int inSize) {
    if (out == nullptr || outSize == 0) return;
    if (in == nullptr || inSize == 0) {
        out[0] = '\0';
        return;
    }
    unsigned int count = outSize <= inSize ? outSize - 1 : inSize;
    std::memcpy(out, in, count);
    out[count] = '\0';
    if (count == 0 || out[count - 1] != ' ') return;
    // Blank padding of the page's text fields.
    for (unsigned int end = count; end > 0 && out[end - 1] == ' '; --end) out[end - 1] = '\0';
}

void parseSFPFields(_tagZORAPSDMDevice* device, unsigned char* data, unsigned int size,
                    _SFPFields* fields) {
    if (fields == nullptr) return;
    parseTextFields(data, size, fields);
    if (data != nullptr && size == kSFPDataSize) std::memcpy(fields->RawData, data, kSFPDataSize);

    fields->SFPStatus =
        (device != nullptr && device->transceiverState == ZORAP_TRANSCEIVER_STATE_GOOD) ? 1 : 0;
    // A mezzanine board has no pluggable module, so no module state to read.
    if (isMezzHBA(device)) fields->SFPStatus = 1;

    printTextFields(fields);
}

void parseSFPFields(unsigned char* data, unsigned int size, _Nic_SFPFields* fields) {
    if (fields == nullptr) return;
    parseTextFields(data, size, fields);
    printTextFields(fields);
}

int isMezzHBA(_tagZORAPSDMDevice* device) {
    if (device == nullptr) return 0;
    unsigned int const vendor = device->subsystemVendorId;
    unsigned int const board = device->subsystemDeviceId;
    char const* text = mezzanineText(zorap_mezz_kind_for(device->subsystemVendorId,
                                                         device->subsystemDeviceId));
    if (text == nullptr) return 0;
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("%s (SSVID/SSDID = 0x%04x/0x%04x)", text, vendor, board);
    return 1;
}

int GetDeviceMacAddress(_tagZORAPSDMDevice* device, char* out) {
    if (device == nullptr || out == nullptr) return 1;
    std::memcpy(out, device->macAddress, sizeof device->macAddress);
    if (g_EnableDebugPrint) {
        unsigned char const* mac = device->macAddress;
        Vexlan_FC_Utils_CMPI::DebugPrint(
            "GetDeviceMacAddress: MAC Address=%02X:%02X:%02X:%02X:%02X:%02X", mac[0], mac[1],
            mac[2], mac[3], mac[4], mac[5]);
    }
    return 0;
}

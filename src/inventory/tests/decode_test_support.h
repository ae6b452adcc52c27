// Helpers of the decoder tests: VPD streams built byte by byte, exact-size
// heap copies (so that any read past the end shows under ASan), the VPD
// buffers cleared, and device records made from chip names.
#ifndef VEXLAN_INVENTORY_TESTS_DECODE_TEST_SUPPORT_H
#define VEXLAN_INVENTORY_TESTS_DECODE_TEST_SUPPORT_H

#include <cstdint>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "inventory/AdapterFunc_VPD.h"
#include "zorap_chip_ids.h"
#include "zorap_cna.h"

namespace decode_test {

class VpdStream {
public:
    // Tag 0x82 with its little-endian 16-bit length.
    VpdStream& identifier(std::string const& text) {
        return identifierWithLength(text, static_cast<std::uint16_t>(text.size()));
    }
    VpdStream& identifierWithLength(std::string const& text, std::uint16_t length) {
        bytes_.push_back(0x82);
        bytes_.push_back(static_cast<std::uint8_t>(length & 0xFF));
        bytes_.push_back(static_cast<std::uint8_t>(length >> 8));
        return append(text);
    }
    // Section tags carry the section's length, which the walk passes over.
    VpdStream& readOnly(std::uint16_t sectionLength = 0) { return section(0x90, sectionLength); }
    VpdStream& writable(std::uint16_t sectionLength = 0) { return section(0x91, sectionLength); }
    VpdStream& keyword(char const* name, std::string const& value) {
        return keywordWithLength(name, value, static_cast<std::uint8_t>(value.size()));
    }
    VpdStream& keywordWithLength(char const* name, std::string const& value, std::uint8_t length) {
        bytes_.push_back(static_cast<std::uint8_t>(name[0]));
        bytes_.push_back(static_cast<std::uint8_t>(name[1]));
        bytes_.push_back(length);
        return append(value);
    }
    VpdStream& raw(std::vector<std::uint8_t> const& more) {
        bytes_.insert(bytes_.end(), more.begin(), more.end());
        return *this;
    }
    VpdStream& end() {
        bytes_.push_back(0x78);
        return *this;
    }
    std::vector<std::uint8_t> const& bytes() const { return bytes_; }

private:
    VpdStream& section(std::uint8_t tag, std::uint16_t length) {
        bytes_.push_back(tag);
        bytes_.push_back(static_cast<std::uint8_t>(length & 0xFF));
        bytes_.push_back(static_cast<std::uint8_t>(length >> 8));
        return *this;
    }
    VpdStream& append(std::string const& text) {
        bytes_.insert(bytes_.end(), text.begin(), text.end());
        return *this;
    }
    std::vector<std::uint8_t> bytes_;
};

// A heap block of exactly the bytes' size.
inline std::unique_ptr<unsigned char[]> exactCopy(std::vector<std::uint8_t> const& bytes) {
    std::unique_ptr<unsigned char[]> block(new unsigned char[bytes.size() == 0 ? 1 : bytes.size()]);
    if (!bytes.empty()) std::memcpy(block.get(), bytes.data(), bytes.size());
    return block;
}

// Every decoded-line buffer, in the order of their declaration.
inline std::vector<char*> allVpdBuffers() {
    return {g_productId,     g_RTag,         g_partNumber,      g_serialNumber,    g_miscInfo,
            g_manufacturingId, g_efiVersion,  g_fwVersion,       g_biosVersion,     g_fcodeVersion,
            g_fruNumberVersion, g_fcCodeVersion, g_flashImageVersion, g_assetTag, g_UUID,
            g_I2CUUID,       g_endTag,       g_optionROMBIOS,   g_optionROMEFI,    g_optionROMFCode,
            g_optionROMFirmware};
}

inline void clearVpdBuffers() {
    for (char* buffer : allVpdBuffers()) std::memset(buffer, 0, kVpdLineSize);
}

// Number of buffers holding any text.
inline int filledVpdBuffers() {
    int count = 0;
    for (char* buffer : allVpdBuffers()) count += buffer[0] != '\0';
    return count;
}

// A zeroed device record of a chip of the shared table.
inline _tagZORAPSDMDevice deviceOfChip(char const* chipName) {
    _tagZORAPSDMDevice device;
    std::memset(&device, 0, sizeof device);
    zorap_chip_row const* row = zorap_chip_row_for_name(chipName);
    device.pciDeviceId = row != nullptr ? row->pciDeviceId : 0xFFFF;
    device.subsystemVendorId = ZORAP_PCI_VENDOR_ID;
    device.subsystemDeviceId = ZORAP_SUBSYS_STANDARD_BOARD;
    return device;
}

}  // namespace decode_test

#endif

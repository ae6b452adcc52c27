// Any bytes as the adapter library's answers that the inventory decodes: the
// VPD stream (as given, and in the 1024-byte buffer GetHBAVPDData reads it
// into), the transceiver page of an FC and of a NIC port, and the serial and
// product ID texts behind the physical package's tag.
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "fuzz_input.h"
#include "inventory/AdapterFunc_Identity.h"
#include "inventory/AdapterFunc_Transceiver.h"
#include "inventory/AdapterFunc_VPD.h"

namespace {

// The device record whose board IDs and module state the page decoding reads.
_tagZORAPSDMDevice deviceOf(const std::uint8_t* data, std::size_t size) {
    _tagZORAPSDMDevice d{};
    std::uint8_t head[5] = {};
    std::memcpy(head, data, size < sizeof head ? size : sizeof head);
    d.subsystemVendorId = static_cast<std::uint16_t>(head[0] | head[1] << 8);
    d.subsystemDeviceId = static_cast<std::uint16_t>(head[2] | head[3] << 8);
    d.transceiverState = head[4];
    return d;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    // The walk over exactly the input's bytes, then over the library's
    // buffer (zero-padded, or cut to its size).
    std::vector<unsigned char> stream(data, data + size);
    PrintVPD(stream.data(), stream.size());
    unsigned char buffer[ZORAP_VPD_BUFFER_SIZE] = {};
    std::memcpy(buffer, data, size < sizeof buffer ? size : sizeof buffer);
    PrintVPD(buffer);

    _tagZORAPSDMDevice device = deviceOf(data, size);
    _SFPFields fields{};
    parseSFPFields(&device, stream.data(), static_cast<unsigned int>(stream.size()), &fields);
    _Nic_SFPFields nicFields{};
    parseSFPFields(stream.data(), static_cast<unsigned int>(stream.size()), &nicFields);
    fuzzin::requireTerminated(fields.Manufacturer);
    fuzzin::requireTerminated(fields.PartNumber);
    fuzzin::requireTerminated(fields.SerialNumber);
    fuzzin::requireTerminated(nicFields.Manufacturer);
    fuzzin::requireTerminated(nicFields.PartNumber);
    fuzzin::requireTerminated(nicFields.SerialNumber);

    // The identity helpers trim their argument in place: each gets its own
    // terminated copy of the input.
    std::string text(reinterpret_cast<const char*>(data), size);
    std::string copy = text;
    IsIBM11SProductId(&copy[0]);
    copy = text;
    GetPartNumberFromIBM11SProductId(&copy[0]);
    GetSerialNumberFromIBM11SProductId(text.c_str());
    copy = text;
    ConvertSerialNumberToUUID(&copy[0]);
    copy = text;
    GetPhysicalPackageTag(&copy[0]);
    copy = text;
    IsIBMBrandedAdapter(&copy[0]);
    return 0;
}

// Any bytes as the adapter description file: the library reads them as its
// description, builds its trees and answers every call of the interface for
// every record. Besides the sanitizers, the target checks that each text
// field the library fills is terminated within its array.
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string>

#include <nlohmann/json.hpp>

#include "fuzz_input.h"
#include "zorap_cna.h"
#include "zorap_sim_control.h"

namespace {


// The per-function blocks the library hands out go back to it.
void answersOfFc(_tagZORAPSDMDevice* d) {
    fuzzin::requireTerminated(d->modelName);
    fuzzin::requireTerminated(d->deviceSerial);
    fuzzin::requireTerminated(d->biosVersionText);
    fuzzin::requireTerminated(d->driverVersionText);
    fuzzin::requireTerminated(d->firmwareVersionText);
    fuzzin::requireTerminated(d->fcodeVersionText);
    fuzzin::requireTerminated(d->efiVersionText);
    _zorap_port_property_t prop{};
    ZORAP_GetHbaDevicePortProperty(d->deviceHandle, 0, &prop);
    ZORAP_RefreshDeviceStats(d);
    uint8_t sfp[ZORAP_SFP_BUFFER_SIZE];
    ZORAP_GetSFPData(d, sfp);
    char* text = nullptr;
    uint32_t length = 0;
    if (ZORAP_GetMBIVersionString(d, &text, &length) == ZORAP_OK && text != nullptr) {
        if (std::strlen(text) != length && std::strlen(text) + 1 != length) __builtin_trap();
        ZORAP_FreeMem(text);
    }
    text = nullptr;
    if (ZORAP_GetUUIDFromI2CVPD(d, &text, &length) == ZORAP_OK && text != nullptr) ZORAP_FreeMem(text);
    uint8_t vpd[ZORAP_VPD_BUFFER_SIZE];
    uint32_t size = sizeof vpd;
    ZORAP_GetVpd(d->deviceHandle, 0, vpd, &size);
    size = 8;  // too small for any stream: the need comes back
    ZORAP_GetVpd(d->deviceHandle, 0, vpd, &size);
    for (_zorap_target_t* t = d->targetList; t; t = t->next)
        for (_zorap_lun_t* l = t->lunList; l; l = l->next) {
            fuzzin::requireTerminated(l->vendorId);
            fuzzin::requireTerminated(l->productId);
            fuzzin::requireTerminated(l->revision);
            fuzzin::requireTerminated(l->osDeviceName);
        }
}

void answersOfNic(_zorap_protocol_t* q) {
    const _zorap_nic_adapter_info_t& ai = q->nicAdapterInfo;
    fuzzin::requireTerminated(ai.modelName);
    fuzzin::requireTerminated(ai.serialNumber);
    fuzzin::requireTerminated(ai.versionString);
    fuzzin::requireTerminated(ai.partNumber);
    fuzzin::requireTerminated(ai.productName);
    fuzzin::requireTerminated(ai.driverVersion);
    fuzzin::requireTerminated(ai.firmwareVersion);
    for (const _zorap_vpd_entry_t& e : q->nicPortExtra.vpd) {
        fuzzin::requireTerminated(e.keyword);
        fuzzin::requireTerminated(e.value);
    }
    const _zorap_nic_port_info_t& pi = q->nicPortInfo;
    fuzzin::requireTerminated(pi.interfaceName);
    fuzzin::requireTerminated(pi.driverName);
    fuzzin::requireTerminated(pi.driverVersion);
    fuzzin::requireTerminated(pi.firmwareVersion);
    _zorap_link_properties_t link{};
    ZORAP_GetLinkProperties(pi.interfaceName, &link);
    void* record = nullptr;
    if (ZORAP_GetIPProperties(pi.interfaceName, &record) == ZORAP_OK && record != nullptr) {
        auto* r = static_cast<_zorap_ip_properties_t*>(record);
        fuzzin::requireTerminated(r->domainName);
        ZORAP_FreeMem(record);
    }
    void* links = nullptr;
    uint32_t count = 0;
    if (ZORAP_GetFCoELinkage(pi.interfaceName, &links, &count) == ZORAP_OK && links != nullptr) {
        for (uint32_t i = 0; i < count; ++i) fuzzin::requireTerminated(static_cast<_zorap_fcoe_linkage_t*>(links)[i].fcHostName);
        ZORAP_FreeMem(links);
    }
    uint8_t dmi[ZORAP_DMI_BUFFER_SIZE];
    uint32_t length = sizeof dmi;
    ZORAP_GetTransceiverDMIData(pi.interfaceName, &length, dmi);
}

void walk(_zorap_adapter_list_t* list) {
    for (_zorap_adapter_t* a = list ? list->firstAdapter : nullptr; a; a = a->next) {
        fuzzin::requireTerminated(a->serialNumber);
        fuzzin::requireTerminated(a->modelName);
        fuzzin::requireTerminated(a->productName);
        fuzzin::requireTerminated(a->productVersion);
        for (_zorap_phy_port_t* p = a->phyPortList ? a->phyPortList->firstPhyPort : nullptr; p; p = p->next)
            for (_zorap_protocol_t* q = p->protocolList ? p->protocolList->firstProtocol : nullptr; q; q = q->next) {
                if (q->protocolType < ZORAP_PROTOCOL_NIC) answersOfFc(&q->fcDevice);
                else answersOfNic(q);
            }
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    std::string text(reinterpret_cast<const char*>(data), size);
    // A description that names the sysfs source makes the library read the
    // machine's own /sys instead of the input: such inputs are left out.
    nlohmann::json doc = nlohmann::json::parse(text, nullptr, false);
    if (doc.is_object() && doc.contains("source")) return 0;
    zorap_sim_load_json(text.c_str());
    if (ZORAP_Initialize(0, 0) != ZORAP_OK) return 0;
    char os[ZORAP_OS_NAME_BUFFER_SIZE];
    uint32_t osSize = sizeof os;
    if (ZORAP_GetOSName(os, &osSize) == ZORAP_OK) fuzzin::requireTerminated(os);
    walk(ZORAP_GetAdapterList());
    // The backup build reads the description again and takes the main place.
    if (ZORAP_UpdateBackupAdapterList() == ZORAP_OK && ZORAP_SwapBackupToMainAdapterList() == ZORAP_OK)
        walk(ZORAP_GetAdapterList());
    ZORAP_Uninitialize();
    return 0;
}

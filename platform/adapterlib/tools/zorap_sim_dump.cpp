// zorap_sim_dump: reads an adapter description through the adapter library
// and prints what the library reports, to check a description by eye.
// Usage: zorap_sim_dump [FILE]   (no FILE: ZORAP_SIM_ADAPTERS or the default)
// Exit status 0, or 1 when the description is bad.
#include <arpa/inet.h>

#include <cstdio>
#include <cstring>
#include <string>

#include "zorap_chip_ids.h"
#include "zorap_cna.h"
#include "zorap_sim_control.h"

namespace {

std::string hex(const uint8_t* p, size_t n, const char* sep) {
    std::string s;
    char b[4];
    for (size_t i = 0; i < n; ++i) {
        std::snprintf(b, sizeof b, "%02x", p[i]);
        if (i) s += sep;
        s += b;
    }
    return s;
}

std::string ip(const _zorap_ipaddr& a) {
    char s[INET6_ADDRSTRLEN] = "-";
    if (a.family == ZORAP_IP_FAMILY_IPV4) inet_ntop(AF_INET, a.address, s, sizeof s);
    if (a.family == ZORAP_IP_FAMILY_IPV6) inet_ntop(AF_INET6, a.address, s, sizeof s);
    std::string out = s;
    if (a.family == ZORAP_IP_FAMILY_IPV6 && a.prefixLength) out += "/" + std::to_string(a.prefixLength);
    return out;
}

std::string transceiverText(const uint8_t* page) {
    auto field = [&](size_t at, size_t n) {
        std::string s(reinterpret_cast<const char*>(page + at), n);
        return s.substr(0, s.find_last_not_of(' ') + 1);
    };
    return field(20, 16) + " " + field(40, 16) + " serial " + field(68, 16);
}

void dumpFc(_tagZORAPSDMDevice* d) {
    std::printf("      FC device handle 0x%x, port index %u, chip code %d\n", d->deviceHandle,
                d->portIndex, zorap_chip_code_for_device_id(d->pciDeviceId));
    std::printf("        node %s  port %s\n", hex(d->nodeWWN, 8, ":").c_str(), hex(d->portWWN, 8, ":").c_str());
    _zorap_port_property_t prop{};
    if (ZORAP_GetHbaDevicePortProperty(d->deviceHandle, 0, &prop) == ZORAP_OK)
        std::printf("        state %u, type %u, speed code %u, transceiver state %u\n", prop.portStateCode,
                    prop.portTypeCode, prop.portSpeedCode, prop.transceiverState);
    std::printf("        model %s, serial %s, BIOS %s, option ROM mask %u\n", d->modelName, d->deviceSerial,
                d->biosVersionText, d->optionRomMask);
    uint8_t sfp[ZORAP_SFP_BUFFER_SIZE];
    if (ZORAP_GetSFPData(d, sfp) == ZORAP_OK)
        std::printf("        transceiver %s\n", transceiverText(sfp).c_str());
    char* mbi = nullptr;
    uint32_t len = 0;
    if (ZORAP_GetMBIVersionString(d, &mbi, &len) == ZORAP_OK) {
        std::printf("        MBI %s\n", mbi);
        ZORAP_FreeMem(mbi);
    }
    uint8_t vpd[ZORAP_VPD_BUFFER_SIZE];
    uint32_t size = sizeof vpd;
    if (ZORAP_GetVpd(d->deviceHandle, 0, vpd, &size) == ZORAP_OK)
        std::printf("        VPD %u bytes\n", size);
    for (_zorap_target_t* t = d->targetList; t; t = t->next) {
        std::printf("        target %s, %u LUNs\n", hex(t->portWWN, 8, ":").c_str(), t->lunCount);
        for (_zorap_lun_t* l = t->lunList; l; l = l->next)
            std::printf("          LUN %u %s %s %s, %u-byte blocks, %s\n", l->lunNumber, l->vendorId,
                        l->productId, l->revision, l->blockSize, l->osDeviceName);
    }
}

void dumpNic(_zorap_protocol_t* q) {
    const _zorap_nic_port_info_t& pi = q->nicPortInfo;
    std::printf("      NIC %s, MAC %s, port %u, MTU %u\n", pi.interfaceName,
                hex(pi.macAddress.octet, 6, ":").c_str(), pi.portNumber, pi.maxTransmissionUnit);
    _zorap_link_properties_t link{};
    if (ZORAP_GetLinkProperties(pi.interfaceName, &link) == ZORAP_OK)
        std::printf("        link state %u, speed %llu Mbit/s\n", link.linkState,
                    static_cast<unsigned long long>(link.linkSpeed));
    void* rec = nullptr;
    if (ZORAP_GetIPProperties(pi.interfaceName, &rec) == ZORAP_OK) {
        auto* r = static_cast<_zorap_ip_properties_t*>(rec);
        std::printf("        IPv4 %s mask %s\n", ip(r->ipv4Address).c_str(), ip(r->subnetMask).c_str());
        for (uint32_t i = 0; i < r->ipv6AddressCount && r->ipv6Addresses; ++i)
            std::printf("        IPv6 %s\n", ip(r->ipv6Addresses[i]).c_str());
        ZORAP_FreeMem(rec);
    }
    void* links = nullptr;
    uint32_t count = 0;
    if (ZORAP_GetFCoELinkage(pi.interfaceName, &links, &count) == ZORAP_OK) {
        for (uint32_t i = 0; i < count; ++i) {
            auto* e = static_cast<_zorap_fcoe_linkage_t*>(links) + i;
            std::printf("        FCoE %s port ID %s ENode %s\n", hex(e->portWWN, 8, ":").c_str(),
                        hex(e->portId, 3, "-").c_str(), hex(e->enodeMacAddress, 6, ":").c_str());
        }
        ZORAP_FreeMem(links);
    }
    uint8_t dmi[ZORAP_DMI_BUFFER_SIZE];
    uint32_t len = sizeof dmi;
    if (ZORAP_GetTransceiverDMIData(pi.interfaceName, &len, dmi) == ZORAP_OK)
        std::printf("        transceiver %s\n", transceiverText(dmi).c_str());
}

}  // namespace

int main(int argc, char** argv) {
    if (argc > 2 || (argc == 2 && (!std::strcmp(argv[1], "-h") || !std::strcmp(argv[1], "--help")))) {
        std::fprintf(stderr, "usage: %s [FILE]\n  prints what the adapter library reports from an adapter "
                             "description\n  (no FILE: $" ZORAP_SIM_ENV " or the file beside the library)\n",
                     argv[0]);
        return argc == 2 ? 0 : 2;
    }
    int loaded = argc == 2 ? zorap_sim_load_file(argv[1]) : zorap_sim_load_default();
    std::printf("description: %s\n", zorap_sim_description_path());
    if (ZORAP_Initialize(0, 0) != ZORAP_OK) return 1;
    char os[ZORAP_OS_NAME_BUFFER_SIZE];
    uint32_t osSize = sizeof os;
    if (ZORAP_GetOSName(os, &osSize) == ZORAP_OK) std::printf("OS: %s\n", os);
    _zorap_adapter_list_t* list = ZORAP_GetAdapterList();
    for (_zorap_adapter_t* a = list ? list->firstAdapter : nullptr; a; a = a->next) {
        std::printf("adapter %d: %s, serial %s, kind %u, \"%s\" %s\n", a->adapterInstance, a->modelName,
                    a->serialNumber, a->adapterKind, a->productName, a->productVersion);
        for (_zorap_phy_port_t* p = a->phyPortList ? a->phyPortList->firstPhyPort : nullptr; p; p = p->next) {
            std::printf("  physical port %u\n", p->portNumber);
            for (_zorap_protocol_t* q = p->protocolList ? p->protocolList->firstProtocol : nullptr; q; q = q->next) {
                std::printf("    protocol type %u\n", q->protocolType);
                if (q->protocolType < 2) dumpFc(&q->fcDevice);
                if (q->protocolType == 2) dumpNic(q);
            }
        }
    }
    ZORAP_Uninitialize();
    return loaded == 0 ? 0 : 1;
}

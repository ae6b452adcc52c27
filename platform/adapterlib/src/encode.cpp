#include "encode.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstring>

namespace zorap_sim {
namespace {

void putLe16(std::vector<uint8_t>& v, size_t at, size_t value) {
    v[at] = static_cast<uint8_t>(value & 0xFF);
    v[at + 1] = static_cast<uint8_t>((value >> 8) & 0xFF);
}

void putBe16(uint8_t* p, unsigned value) {
    p[0] = static_cast<uint8_t>((value >> 8) & 0xFF);
    p[1] = static_cast<uint8_t>(value & 0xFF);
}

void appendKeyword(std::vector<uint8_t>& v, const std::string& kw, const std::string& value) {
    size_t len = std::min<size_t>(value.size(), 255);
    v.push_back(static_cast<uint8_t>(kw[0]));
    v.push_back(static_cast<uint8_t>(kw[1]));
    v.push_back(static_cast<uint8_t>(len));
    v.insert(v.end(), value.begin(), value.begin() + static_cast<std::ptrdiff_t>(len));
}

// Blank-padded text field of a transceiver page.
void putPadded(uint8_t* p, size_t width, const std::string& s) {
    std::memset(p, ' ', width);
    std::memcpy(p, s.data(), std::min(width, s.size()));
}

uint8_t checksum(const uint8_t* p, size_t n) {
    unsigned sum = 0;
    for (size_t i = 0; i < n; ++i) sum += p[i];
    return static_cast<uint8_t>(sum & 0xFF);
}

unsigned clampUnsigned(double v, double max) {
    if (!(v > 0)) return 0;
    return static_cast<unsigned>(std::lround(std::min(v, max)));
}

void encodeIp(const IpAddress& a, _zorap_ipaddr* out) {
    std::memcpy(out->address, a.bytes.data(), sizeof(out->address));
    out->family = a.family;
    out->prefixLength = a.prefixLength;
}

void fillFcDevice(const Adapter& a, const PhysPort& port, const FcFunction& fc,
                  _tagZORAPSDMDevice* d, Tree& tree) {
    d->portPropertyIndex = 0;
    d->deviceHandle = fc.handle;
    d->portIndex = fc.portIndex;
    d->pciVendorId = a.pciVendorId;
    d->pciDeviceId = a.pciDeviceId;
    d->subsystemVendorId = a.subsystemVendorId;
    d->subsystemDeviceId = a.subsystemDeviceId;
    std::memcpy(d->nodeWWN, fc.nodeWwn.data(), 8);
    copyText(d->modelName, a.model);
    copyText(d->deviceSerial, a.deviceSerial);
    const OptionRom& rom = a.versions.optionRom;
    copyText(d->biosVersionText, rom.biosText);
    d->transceiverSupport = a.transceiverSupport;
    d->optionRomMask = rom.mask;
    std::memcpy(d->firmwareVersion, rom.firmware.data(), 3);
    std::memcpy(d->efiVersion, rom.efi.data(), 2);
    std::memcpy(d->fcodeVersion, rom.fcode.data(), 3);
    _zorap_port_property_t prop{};
    encodePortProperty(fc, &prop);
    std::memcpy(d->portWWN, &prop, sizeof(prop));
    encodeFcStats(fc, d);
    std::memcpy(d->macAddress, fc.enodeMac.data(), 6);
    copyText(d->driverVersionText, a.versions.driverVersion);
    copyText(d->firmwareVersionText, a.versions.firmwareVersion);
    copyText(d->fcodeVersionText, rom.fcodeText);
    copyText(d->efiVersionText, rom.efiText);

    _zorap_target_t* prevTarget = nullptr;
    for (const Target& t : fc.targets) {
        _zorap_target_t& rt = tree.targets.emplace_back();
        std::memcpy(rt.portWWN, t.portWwn.data(), 8);
        std::memcpy(rt.nodeWWN, t.nodeWwn.data(), 8);
        rt.portId = t.portId;
        _zorap_lun_t* prevLun = nullptr;
        for (const Lun& l : t.luns) {
            _zorap_lun_t& rl = tree.luns.emplace_back();
            rl.lunNumber = l.number;
            rl.lunIdLength = static_cast<uint8_t>(l.id.size());
            rl.blockSize = l.blockSize;
            std::memcpy(rl.lunId, l.id.data(), std::min(l.id.size(), sizeof(rl.lunId)));
            copyText(rl.vendorId, l.vendor);
            copyText(rl.productId, l.product);
            copyText(rl.revision, l.revision);
            copyText(rl.osDeviceName, l.osDevice);
            rl.capacityBlocks = l.capacityBlocks;
            (prevLun ? prevLun->next : rt.lunList) = &rl;
            prevLun = &rl;
            ++rt.lunCount;
        }
        (prevTarget ? prevTarget->next : d->targetList) = &rt;
        prevTarget = &rt;
        ++d->targetCount;
    }
    (void)port;
}

void fillNic(const Adapter& a, const NicFunction& nic, _zorap_protocol_t* p) {
    _zorap_nic_adapter_info_t& info = p->nicAdapterInfo;
    std::memcpy(info.nodeWWN, a.nicNodeWwn.data(), 8);
    copyText(info.modelName, a.model);
    copyText(info.serialNumber, a.serialNumber);
    copyText(info.versionString, a.versions.versionString);
    copyText(info.partNumber, a.partNumber);
    copyText(info.productName, a.productName);
    copyText(info.driverVersion, a.versions.driverVersion);
    copyText(info.firmwareVersion, a.versions.firmwareVersion);
    info.pciVendorId = a.pciVendorId;
    info.pciDeviceId = a.pciDeviceId;
    info.subsystemVendorId = a.subsystemVendorId;
    info.subsystemDeviceId = a.subsystemDeviceId;
    for (const PhysPort& port : a.ports)
        for (const Protocol& q : port.protocols)
            if (q.isNic()) ++info.nicPortCount;

    _zorap_nic_port_extra_t& extra = p->nicPortExtra;
    for (const auto& kv : a.vpd) {
        if (extra.vpdCount >= ZORAP_NIC_VPD_ENTRIES) break;
        _zorap_vpd_entry_t& e = extra.vpd[extra.vpdCount++];
        copyText(e.keyword, kv.first);
        copyText(e.value, kv.second);
    }

    _zorap_nic_port_info_t& pi = p->nicPortInfo;
    std::memcpy(pi.macAddress.octet, nic.mac.data(), 6);
    copyText(pi.interfaceName, nic.interfaceName);
    pi.portNumber = nic.portNumber;
    _zorap_link_properties_t link{};
    encodeLinkProperties(nic, &link);
    pi.linkProperties = link;
    pi.maxTransmissionUnit = nic.mtu;
    pi.pciBus = nic.pciBus;
    pi.pciDevice = nic.pciDevice;
    pi.pciFunction = nic.pciFunction;
    copyText(pi.driverName, nic.driverName);
    copyText(pi.driverVersion, nic.driverVersion);
    copyText(pi.firmwareVersion, nic.firmwareVersion);

    uint64_t counters[13];
    std::copy(nic.stats.begin(), nic.stats.end(), counters);
    std::memcpy(&p->nicPortStats, counters, sizeof(counters));
}

}  // namespace

std::vector<uint8_t> encodeVpd(const Adapter& a) {
    if (a.vpdRaw) return *a.vpdRaw;
    std::vector<uint8_t> v;
    // Identifier string.
    v.push_back(0x82);
    v.push_back(0);
    v.push_back(0);
    v.insert(v.end(), a.vpdProductId.begin(), a.vpdProductId.end());
    putLe16(v, 1, a.vpdProductId.size());
    // Read-only section; the RV checksum makes the bytes up to it sum to 0.
    size_t roStart = v.size();
    v.push_back(0x90);
    v.push_back(0);
    v.push_back(0);
    for (const auto& kv : a.vpd)
        if (kv.first[0] != 'Y') appendKeyword(v, kv.first, kv.second);
    v.push_back('R');
    v.push_back('V');
    v.push_back(1);
    v.push_back(0);
    putLe16(v, roStart + 1, v.size() - roStart - 3);
    v.back() = static_cast<uint8_t>(0x100 - checksum(v.data(), v.size() - 1));
    // Writable section: the system keywords (Y*) and the remaining space.
    size_t rwStart = v.size();
    v.push_back(0x91);
    v.push_back(0);
    v.push_back(0);
    for (const auto& kv : a.vpd)
        if (kv.first[0] == 'Y') appendKeyword(v, kv.first, kv.second);
    v.push_back('R');
    v.push_back('W');
    v.push_back(1);
    v.push_back(0);
    putLe16(v, rwStart + 1, v.size() - rwStart - 3);
    v.push_back(0x78);
    return v;
}

void encodeTransceiverPages(const Transceiver& t, uint8_t* out) {
    std::memset(out, 0, kTransceiverPagesSize);
    uint8_t* a0 = out;
    a0[0] = 0x03;   // SFP or SFP+
    a0[1] = 0x04;   // serial ID module definition
    a0[2] = 0x07;   // LC connector
    a0[3] = 0x10;   // 10GBASE-SR
    a0[9] = 0x04;   // FC media: multimode 50 um
    a0[10] = 0xF0;  // FC speeds 1200..400 MB/s
    a0[11] = 0x06;  // 64B/66B
    a0[12] = 0x8C;  // nominal rate, 100 MBd units
    a0[16] = 0x08;  // OM2 length, 10 m units
    a0[17] = 0x03;  // OM1 length, 10 m units
    putPadded(a0 + 20, 16, t.vendor);
    std::memcpy(a0 + 37, t.oui.data(), 3);
    putPadded(a0 + 40, 16, t.partNumber);
    putPadded(a0 + 56, 4, t.revision);
    putBe16(a0 + 60, t.wavelengthNm);
    a0[63] = checksum(a0, 63);
    a0[64] = 0x00;
    a0[65] = 0x1A;  // options: TX disable, TX fault, RX LOS
    putPadded(a0 + 68, 16, t.serialNumber);
    putPadded(a0 + 84, 8, t.dateCode);
    a0[92] = 0x68;  // diagnostics implemented, internally calibrated, average power
    a0[93] = 0xF0;  // alarm/warning flags, soft TX disable and fault, RX LOS
    a0[94] = 0x03;  // diagnostics revision
    a0[95] = checksum(a0 + 64, 31);

    uint8_t* a2 = out + 256;
    // Alarm and warning thresholds: high alarm, low alarm, high warning, low warning.
    const unsigned thresholds[5][4] = {
        {75u * 256, 0xFB00 /* -5 C */, 70u * 256, 0},  // temperature, 1/256 C
        {36000, 30000, 35000, 31000},                  // Vcc, 100 uV
        {6000, 1000, 5500, 1500},                      // TX bias, 2 uA
        {12589, 1000, 10000, 1259},                    // TX power, 0.1 uW
        {12589, 100, 10000, 158},                      // RX power, 0.1 uW
    };
    for (int i = 0; i < 5; ++i)
        for (int k = 0; k < 4; ++k) putBe16(a2 + 8 * i + 2 * k, thresholds[i][k]);
    a2[95] = checksum(a2, 95);
    int temp = static_cast<int>(std::lround(std::max(-127.0, std::min(127.0, t.temperatureC)) * 256));
    putBe16(a2 + 96, static_cast<unsigned>(temp) & 0xFFFF);
    putBe16(a2 + 98, clampUnsigned(t.vccVolts * 10000, 65535));
    putBe16(a2 + 100, clampUnsigned(t.txBiasMa * 500, 65535));
    putBe16(a2 + 102, clampUnsigned(t.txPowerMw * 10000, 65535));
    putBe16(a2 + 104, clampUnsigned(t.rxPowerMw * 10000, 65535));
}

std::string mbiVersionString(const Mbi& m) {
    char text[96];
    std::snprintf(text, sizeof text, "V:%d.%02d.%02d,D:%02d%02d%4d,A:Y,T:M", m.major, m.minor,
                  m.build, m.month, m.day, m.year);
    return text;
}

size_t ipPropertiesBlockSize(const NicFunction& nic) {
    return sizeof(_zorap_ip_properties_t) +
           sizeof(_zorap_ipaddr) * (nic.ipv6.size() + nic.dnsServers.size() + nic.ipv6Gateways.size());
}

void encodeIpProperties(const NicFunction& nic, void* block) {
    auto* r = static_cast<_zorap_ip_properties_t*>(block);
    r->recordVersion = 1;
    r->dhcpEnabled = nic.dhcp ? 1 : 0;
    encodeIp(nic.ipv4, &r->ipv4Address);
    encodeIp(nic.netmask, &r->subnetMask);
    encodeIp(nic.gateway, &r->defaultGateway);
    encodeIp(nic.broadcast, &r->broadcastAddress);
    r->ipv6AddressCount = static_cast<uint32_t>(nic.ipv6.size());
    r->dnsServerCount = static_cast<uint32_t>(nic.dnsServers.size());
    r->ipv6GatewayCount = static_cast<uint32_t>(nic.ipv6Gateways.size());
    r->ipv6Enabled = nic.ipv6.empty() ? 0 : 1;
    copyText(r->domainName, nic.domain);
    auto* next = reinterpret_cast<_zorap_ipaddr*>(r + 1);
    auto place = [&next](const std::vector<IpAddress>& list) -> _zorap_ipaddr* {
        if (list.empty()) return nullptr;
        _zorap_ipaddr* start = next;
        for (const IpAddress& a : list) encodeIp(a, next++);
        return start;
    };
    r->ipv6Addresses = place(nic.ipv6);
    r->dnsServers = place(nic.dnsServers);
    r->ipv6Gateways = place(nic.ipv6Gateways);
}

void encodeFcoeLinkage(const FcoeLink& f, _zorap_fcoe_linkage_t* out) {
    std::memset(out, 0, sizeof(*out));
    std::memcpy(out->portWWN, f.portWwn.data(), 8);
    std::memcpy(out->nodeWWN, f.nodeWwn.data(), 8);
    std::memcpy(out->fabricName, f.fabricName.data(), 8);
    std::memcpy(out->fcfMacAddress, f.fcfMac.data(), 6);
    out->vlanId = f.vlan;
    out->fcfPriority = f.priority;
    out->linkState = f.loggedIn;
    out->maxFrameSize = f.maxFrameSize;
    std::memcpy(out->portId, f.portId.data(), 3);
    std::memcpy(out->enodeMacAddress, f.enodeMac.data(), 6);
    copyText(out->fcHostName, f.fcHostName);
}

void encodeLinkProperties(const NicFunction& nic, _zorap_link_properties_t* out) {
    std::memset(out, 0, sizeof(*out));
    out->recordVersion = 1;
    out->portIndex = nic.portNumber;
    // A link that is not up reports no speed.
    out->linkSpeed = nic.linkState == ZORAP_LINK_UP ? nic.linkSpeed : 0;
    out->linkState = nic.linkState;
    out->fullDuplex = nic.fullDuplex;
    out->autoNegotiation = nic.autoNegotiation;
    out->maxTransmissionUnit = nic.mtu;
}

void encodePortProperty(const FcFunction& fc, _zorap_port_property_t* out) {
    std::memset(out, 0, sizeof(*out));
    std::memcpy(out->portWWN, fc.portWwn.data(), 8);
    out->portTypeCode = fc.typeCode;
    out->portStateCode = fc.stateCode;
    out->portSpeedCode = fc.speedCode;
    out->transceiverState = fc.transceiverState;
    out->portFcId = fc.fcId;
    out->supportedSpeedMask = fc.supportedSpeedMask;
}

void encodeFcStats(const FcFunction& fc, _tagZORAPSDMDevice* d) {
    uint32_t* fields[9] = {&d->statIoCount,      &d->statMegabyteCount,   &d->statLipCount,
                           &d->statLinkFailures, &d->statLossOfSync,      &d->statLossOfSignal,
                           &d->statPrimitiveSeqErrors, &d->statInvalidTxWords, &d->statCrcErrors};
    for (size_t i = 0; i < 9; ++i) *fields[i] = fc.stats[i];
}

std::unique_ptr<Tree> buildTree(const Host& host) {
    auto tree = std::make_unique<Tree>();
    _zorap_adapter_t* prevAdapter = nullptr;
    for (const Adapter& a : host.adapters) {
        _zorap_adapter_t& ra = tree->adapters.emplace_back();
        copyText(ra.serialNumber, a.serialNumber);
        copyText(ra.modelName, a.model);
        copyText(ra.productName, a.productName);
        copyText(ra.productVersion, a.versions.productVersion);
        ra.adapterKind = a.kind;
        ra.adapterInstance = a.instance;
        (prevAdapter ? prevAdapter->next : tree->header.firstAdapter) = &ra;
        prevAdapter = &ra;
        ++tree->header.count;
        // An adapter without ports has no port list header at all.
        if (a.ports.empty()) continue;
        _zorap_phy_port_list_t& plist = tree->portLists.emplace_back();
        ra.phyPortList = &plist;
        _zorap_phy_port_t* prevPort = nullptr;
        for (const PhysPort& port : a.ports) {
            _zorap_phy_port_t& rp = tree->ports.emplace_back();
            rp.portNumber = port.number;
            (prevPort ? prevPort->next : plist.firstPhyPort) = &rp;
            prevPort = &rp;
            ++plist.count;
            if (port.protocols.empty()) continue;
            _zorap_protocol_list_t& qlist = tree->protocolLists.emplace_back();
            rp.protocolList = &qlist;
            _zorap_protocol_t* prevProto = nullptr;
            for (const Protocol& q : port.protocols) {
                _zorap_protocol_t& rq = tree->protocols.emplace_back();
                std::memset(static_cast<void*>(&rq), 0, sizeof rq);
                rq.adapterInstance = a.instance;
                rq.protocolType = q.type;
                if (q.isFc())
                    fillFcDevice(a, port, q.fc, &rq.fcDevice, *tree);
                else if (q.isNic())
                    fillNic(a, q.nic, &rq);
                (prevProto ? prevProto->next : qlist.firstProtocol) = &rq;
                prevProto = &rq;
                ++qlist.count;
            }
        }
    }
    return tree;
}

}  // namespace zorap_sim

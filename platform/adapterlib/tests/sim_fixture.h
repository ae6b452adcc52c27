// Shared fixture of the adapter library tests: a small host description,
// helpers to reach its records, and the tree as text to compare with the
// texts kept in tests/fixtures/trees.
#pragma once

#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include "zorap_cna.h"
#include "zorap_sim_control.h"

namespace zorap_test {

// Adapter 0: FC HBA, port 0 with a transceiver and a target, port 1 with an
//            empty cage and no protocol list entries but one FC function.
// Adapter 1: CNA, port 0 with an FCoE and a NIC function (IPv4, IPv6, DNS,
//            two FCoE linkage elements), port 1 with a bare NIC function.
// Adapter 2: no ports at all.
// Adapter 3: a raw VPD stream, one port without protocols.
inline const char* kHost = R"json({
  "osName": "TestOS 1.0",
  "flash": {"durationMs": 0, "result": 0},
  "adapters": [
    {
      "model": "VXF1622", "serialNumber": "SERIAL-A", "productName": "Dual FC",
      "productVersion": "A2", "chip": "RSX-1620", "kind": "fc-hba",
      "subsystemDeviceId": "0x6102",
      "driverVersion": "10.1", "firmwareVersion": "8.08.204",
      "optionRom": {"bios": "3.64", "firmware": "8.08.204", "efi": "7.00", "fcode": "4.12.03"},
      "mbiVersion": "3.64.2", "mbiDate": "2025-06-04",
      "i2cUuid": "i2c-uuid-text",
      "vpd": {"productId": "Test HBA", "PN": "PN-1", "SN": "SERIAL-A", "RM": "RM-VALUE",
              "V9": "012345", "YA": "asset", "YU": "uuid-1"},
      "afterFlash": {"firmwareVersion": "8.09.001", "mbiVersion": "3.65.0",
                     "mbiDate": "2025-12-24", "vpd": {"V9": "030650"}},
      "ports": [
        {"portNumber": 0,
         "transceiver": {"vendor": "VEXLAN", "partNumber": "VXS-16G", "serialNumber": "TSER1",
                         "revision": "A", "wavelengthNm": 850, "dateCode": "250311"},
         "protocols": [
           {"type": "fc", "portIndex": 0, "nodeWWN": "30:00:00:00:00:00:00:01",
            "portWWN": "31:00:00:00:00:00:00:01", "state": "online", "portType": 5, "speed": 16,
            "stats": {"ioCount": 100, "crcErrors": 9},
            "targets": [
              {"portWWN": "3a:00:00:00:00:00:00:01",
               "luns": [{"lun": 0, "id": "60112233445566778899aabbccddeeff", "vendor": "NORDARR",
                         "product": "Grid", "revision": "0421", "blockSize": 512,
                         "osDevice": "/dev/sdb"},
                        {"lun": 7, "id": "3400000000000007"}]}]}
         ]},
        {"portNumber": 1,
         "protocols": [
           {"type": "fc", "portIndex": 1, "nodeWWN": "30:00:00:00:00:00:00:01",
            "portWWN": "31:00:00:00:00:00:00:02", "state": "loopdown", "speed": 3}
         ]}
      ]
    },
    {
      "model": "VXC2402", "serialNumber": "SERIAL-B", "chip": "RSX-AB0",
      "versionString": "4.18.07", "partNumber": "PN-B",
      "vpd": {"PN": "PN-B", "FN": "FRU-B", "YU": "uuid-b"},
      "ports": [
        {"portNumber": 0,
         "transceiver": {"vendor": "VEXLAN", "partNumber": "VXS-10G", "serialNumber": "TSER2"},
         "protocols": [
           {"type": "fcoe", "nodeWWN": "30:00:00:00:00:00:00:0b",
            "portWWN": "31:00:00:00:00:00:00:0b", "enodeMac": "02:00:00:00:00:0b"},
           {"type": "nic", "mac": "02:00:00:00:00:0a", "interface": "eth0", "mtu": 9000,
            "linkSpeed": 10000, "linkState": "up",
            "ipv4": "192.168.40.21", "netmask": "255.255.255.0",
            "ipv6": ["fe80::1/64", "2001:db8::21/64"], "dnsServers": ["192.168.40.2"],
            "fcoe": [
              {"portWWN": "31:00:00:00:00:00:00:0b", "portId": "0A-1B-2C",
               "enodeMac": "02:00:00:00:00:0b", "vlan": 1002},
              {"portWWN": "31:00:00:00:00:00:00:0c", "portId": "0x0a1b2d"}]}
         ]},
        {"portNumber": 1,
         "protocols": [
           {"type": "nic", "mac": "02:00:00:00:00:0c", "interface": "eth1", "linkState": "down"}
         ]}
      ]
    },
    {"model": "EMPTY", "serialNumber": "SERIAL-C", "pciDeviceId": "0x9999"},
    {"model": "RAW", "serialNumber": "SERIAL-D", "chip": "RSX-880",
     "vpdHex": "82 02 00 41 42 00 00 00 90 00 00 53 4e 02 58 59 78",
     "ports": [{"portNumber": 4}]}
  ]
})json";

// Every test starts from an uninitialized library with kHost loaded.
class SimTest : public ::testing::Test {
protected:
    void SetUp() override {
        ZORAP_Uninitialize();
        zorap_sim_reset();
        ASSERT_EQ(0, zorap_sim_load_json(kHost));
        ASSERT_EQ(ZORAP_OK, ZORAP_Initialize(0, 0));
    }
    void TearDown() override {
        ZORAP_Uninitialize();
        zorap_sim_reset();
    }
};

inline std::vector<_zorap_adapter_t*> adapters() {
    std::vector<_zorap_adapter_t*> out;
    _zorap_adapter_list_t* list = ZORAP_GetAdapterList();
    for (_zorap_adapter_t* a = list ? list->firstAdapter : nullptr; a; a = a->next) out.push_back(a);
    return out;
}

inline std::vector<_zorap_protocol_t*> protocols(_zorap_adapter_t* a) {
    std::vector<_zorap_protocol_t*> out;
    if (!a || !a->phyPortList) return out;
    for (_zorap_phy_port_t* p = a->phyPortList->firstPhyPort; p; p = p->next)
        for (_zorap_protocol_t* q = p->protocolList ? p->protocolList->firstProtocol : nullptr; q;
             q = q->next)
            out.push_back(q);
    return out;
}

// The FC device of adapter a, protocol k.
inline _tagZORAPSDMDevice* device(size_t a, size_t k) { return &protocols(adapters().at(a)).at(k)->fcDevice; }

inline std::string text(const uint8_t* p, size_t n) { return std::string(reinterpret_cast<const char*>(p), n); }

// Every field of the records the library hands out in its adapter list, one
// record a line: adapters, physical ports, and each protocol's FC device with
// its targets and LUNs or its NIC records. Texts are cut at their first zero.
inline std::string treeText() {
    std::string out;
    auto hex = [](const uint8_t* p, size_t n) {
        std::string s;
        char b[4];
        for (size_t i = 0; i < n; ++i) {
            std::snprintf(b, sizeof b, "%02x", p[i]);
            s += b;
        }
        return s;
    };
    auto num = [](unsigned long long v) { return std::to_string(v); };
    auto str = [](const char* s, size_t n) { return "\"" + std::string(s, strnlen(s, n)) + "\""; };
#define ZT_STR(rec, f) (" " #f "=" + str((rec).f, sizeof (rec).f))
#define ZT_NUM(rec, f) (" " #f "=" + num((rec).f))
#define ZT_HEX(rec, f) (" " #f "=" + hex(reinterpret_cast<const uint8_t*>(&(rec).f), sizeof (rec).f))
    _zorap_adapter_list_t* list = ZORAP_GetAdapterList();
    out += "adapters" + (list ? ZT_NUM(*list, count) : std::string(" none")) + "\n";
    for (_zorap_adapter_t* a : adapters()) {
        out += "adapter" + ZT_STR(*a, serialNumber) + ZT_STR(*a, modelName) + ZT_STR(*a, productName) +
               ZT_STR(*a, productVersion) + ZT_NUM(*a, adapterKind) + ZT_NUM(*a, adapterInstance) +
               (a->phyPortList ? ZT_NUM(*a->phyPortList, count) : std::string(" no-port-list")) + "\n";
        for (_zorap_phy_port_t* p = a->phyPortList ? a->phyPortList->firstPhyPort : nullptr; p; p = p->next) {
            out += " port" + ZT_NUM(*p, portNumber) +
                   (p->protocolList ? ZT_NUM(*p->protocolList, count) : std::string(" no-protocol-list")) + "\n";
            for (_zorap_protocol_t* q = p->protocolList ? p->protocolList->firstProtocol : nullptr; q; q = q->next) {
                out += "  protocol" + ZT_NUM(*q, protocolType) + ZT_NUM(*q, adapterInstance) + "\n";
                if (q->protocolType == ZORAP_PROTOCOL_NIC) {
                    const _zorap_nic_adapter_info_t& i = q->nicAdapterInfo;
                    out += "   nic-adapter" + ZT_HEX(i, nodeWWN) + ZT_STR(i, modelName) + ZT_STR(i, serialNumber) +
                           ZT_STR(i, versionString) + ZT_STR(i, partNumber) + ZT_STR(i, productName) +
                           ZT_STR(i, driverVersion) + ZT_STR(i, firmwareVersion) + ZT_NUM(i, pciVendorId) +
                           ZT_NUM(i, pciDeviceId) + ZT_NUM(i, subsystemVendorId) + ZT_NUM(i, subsystemDeviceId) +
                           ZT_NUM(i, nicPortCount) + "\n";
                    const _zorap_nic_port_info_t& n = q->nicPortInfo;
                    const _zorap_link_properties_t& l = n.linkProperties;
                    out += "   nic-port" + ZT_HEX(n, macAddress) + ZT_HEX(n, macAddressPad) + ZT_STR(n, interfaceName) +
                           ZT_NUM(n, portNumber) + ZT_NUM(n, maxTransmissionUnit) + ZT_NUM(n, pciBus) +
                           ZT_NUM(n, pciDevice) + ZT_NUM(n, pciFunction) + ZT_STR(n, driverName) +
                           ZT_STR(n, driverVersion) + ZT_STR(n, firmwareVersion) + "\n";
                    out += "   link" + ZT_NUM(l, recordVersion) + ZT_NUM(l, portIndex) + ZT_NUM(l, linkSpeed) +
                           ZT_NUM(l, linkState) + ZT_NUM(l, fullDuplex) + ZT_NUM(l, autoNegotiation) +
                           ZT_NUM(l, maxTransmissionUnit) + "\n   stats";
                    const uint64_t* counters = &q->nicPortStats.rxBytes;
                    for (int k = 0; k < 13; ++k) out += " " + num(counters[k]);
                    out += "\n";
                    for (uint32_t k = 0; k < q->nicPortExtra.vpdCount && k < ZORAP_NIC_VPD_ENTRIES; ++k)
                        out += "   vpd" + ZT_STR(q->nicPortExtra.vpd[k], keyword) +
                               ZT_STR(q->nicPortExtra.vpd[k], value) + "\n";
                    continue;
                }
                const _tagZORAPSDMDevice& d = q->fcDevice;
                out += "   fc" + ZT_NUM(d, deviceHandle) + ZT_NUM(d, portIndex) + ZT_NUM(d, pciVendorId) +
                       ZT_NUM(d, pciDeviceId) + ZT_NUM(d, subsystemVendorId) + ZT_NUM(d, subsystemDeviceId) +
                       ZT_HEX(d, nodeWWN) + ZT_HEX(d, portWWN) + ZT_STR(d, modelName) + ZT_STR(d, deviceSerial) +
                       "\n   fc-versions" + ZT_STR(d, biosVersionText) + ZT_NUM(d, optionRomMask) +
                       ZT_HEX(d, firmwareVersion) + ZT_HEX(d, efiVersion) + ZT_HEX(d, fcodeVersion) +
                       ZT_STR(d, driverVersionText) + ZT_STR(d, firmwareVersionText) + ZT_STR(d, fcodeVersionText) +
                       ZT_STR(d, efiVersionText) + "\n   fc-port" + ZT_NUM(d, portTypeCode) +
                       ZT_NUM(d, portStateCode) + ZT_NUM(d, portSpeedCode) + ZT_NUM(d, transceiverSupport) +
                       ZT_NUM(d, transceiverState) + ZT_NUM(d, portFcId) + ZT_NUM(d, supportedSpeedMask) +
                       ZT_HEX(d, macAddress) + ZT_NUM(d, targetCount) + "\n   fc-stats" + ZT_NUM(d, statIoCount) +
                       ZT_NUM(d, statMegabyteCount) + ZT_NUM(d, statLipCount) + ZT_NUM(d, statLinkFailures) +
                       ZT_NUM(d, statLossOfSync) + ZT_NUM(d, statLossOfSignal) + ZT_NUM(d, statPrimitiveSeqErrors) +
                       ZT_NUM(d, statInvalidTxWords) + ZT_NUM(d, statCrcErrors) + "\n";
                for (_zorap_target_t* t = d.targetList; t; t = t->next) {
                    out += "    target" + ZT_HEX(*t, portWWN) + ZT_HEX(*t, nodeWWN) + ZT_NUM(*t, portId) +
                           ZT_NUM(*t, lunCount) + "\n";
                    for (_zorap_lun_t* u = t->lunList; u; u = u->next)
                        out += "     lun" + ZT_NUM(*u, lunNumber) + ZT_NUM(*u, lunIdLength) + ZT_HEX(*u, lunId) +
                               ZT_STR(*u, vendorId) + ZT_STR(*u, productId) + ZT_STR(*u, revision) +
                               ZT_NUM(*u, blockSize) + ZT_NUM(*u, capacityBlocks) + ZT_STR(*u, osDeviceName) + "\n";
                }
            }
        }
    }
#undef ZT_STR
#undef ZT_NUM
#undef ZT_HEX
    return out;
}

// Compares treeText() with tests/fixtures/trees/<name>.txt; with
// ZORAP_RECORD_TREES=<dir> in the environment it writes <dir>/<name>.txt
// instead (read the difference before keeping it).
inline void expectTreeAsKept(const std::string& name) {
    const std::string text = treeText();
    if (const char* dir = std::getenv("ZORAP_RECORD_TREES")) {
        std::ofstream(std::string(dir) + "/" + name + ".txt") << text;
        return;
    }
    std::ifstream in(std::string(ZORAP_TREE_DIR) + "/" + name + ".txt");
    std::ostringstream kept;
    kept << in.rdbuf();
    EXPECT_EQ(text, kept.str()) << name;
}

}  // namespace zorap_test

// Shared fixture of the adapter library tests: a small host description and
// helpers to reach its records.
#pragma once

#include <gtest/gtest.h>

#include <cstring>
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

}  // namespace zorap_test

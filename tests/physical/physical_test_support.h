// Adapter descriptions for the SCSI and physical class tests, written as JSON
// for the adapter library.
#ifndef VEXLAN_TESTS_PHYSICAL_PHYSICAL_TEST_SUPPORT_H
#define VEXLAN_TESTS_PHYSICAL_PHYSICAL_TEST_SUPPORT_H

#include <string>

#include "fc_test_support.h"

namespace phystest {

using fctest::json;

// A transceiver module with the given serial.
inline json transceiver(const std::string& serial, const std::string& vendor = "VEXLAN",
                        const std::string& part = "VXS-16G-SR")
{
    return json{{"vendor", vendor}, {"partNumber", part}, {"serialNumber", serial}};
}

// A NIC function with a MAC ending in `last` on interface `ifname`.
inline json nicFunction(int last, const std::string& ifname)
{
    char mac[32];
    std::snprintf(mac, sizeof(mac), "02:7e:5a:00:00:%02x", last & 0xFF);
    return json{{"type", "nic"}, {"mac", mac}, {"interface", ifname}};
}

// A port with the given protocols and, if `module` is not empty, a transceiver.
inline json port(int number, json protocols, const json& module = json())
{
    json p = {{"portNumber", number}, {"protocols", protocols}};
    if (!module.is_null())
        p["transceiver"] = module;
    return p;
}

}  // namespace phystest

#endif

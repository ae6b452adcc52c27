// Adapter descriptions for the FC class tests, written as JSON for the
// adapter library, and the switches every FC test process sets.
#ifndef VEXLAN_TESTS_FC_FC_TEST_SUPPORT_H
#define VEXLAN_TESTS_FC_FC_TEST_SUPPORT_H

#include <cstdio>
#include <string>

#include <nlohmann/json.hpp>

namespace fctest {

using json = nlohmann::json;

// "30:00:00:00:00:AA:PP:FF": node WWNs start with 30, port WWNs with 31; AA is
// the adapter number, PP the function number.
inline std::string wwn(int lead, int adapter, int function)
{
    char text[32];
    std::snprintf(text, sizeof(text), "%02X:00:00:00:00:%02X:%02X:%02X", lead, adapter & 0xFF, function & 0xFF,
                  (adapter >> 8) & 0xFF);
    return text;
}

// One FC function of adapter `adapter`; all functions of an adapter share
// its node WWN, as the functions of one board do.
inline json fcFunction(int adapter, int function, json extra = json::object())
{
    json f = {{"type", "fc"},
              {"nodeWWN", wwn(0x30, adapter, 0)},
              {"portWWN", wwn(0x31, adapter, function)},
              {"speed", 8}};
    f.update(extra);
    return f;
}

// Full VPD of an adapter whose serial is `serial`.
inline json fullVpd(const std::string& serial)
{
    return json{{"productId", "Test FC HBA"}, {"PN", "VXT-1"},  {"SN", serial},   {"MN", "7E5A"},
                {"V0", "misc"},               {"V1", "7.01"},   {"V3", "8.1.2"},  {"V4", "3.5"},
                {"V5", "4.02.01"},            {"V9", "012345"}, {"FN", "FRU-1"}, {"FC", "FC-CODE"}};
}

// An adapter with `ports` physical ports, one FC function on each.
inline json fcAdapter(int adapter, const std::string& chip, int ports, const std::string& serial)
{
    json a = {{"model", "VXT" + std::to_string(adapter)},
              {"serialNumber", serial},
              {"chip", chip},
              {"optionRom", {{"bios", "3.5"}, {"firmware", "8.1.2"}, {"efi", "7.1"}, {"fcode", "4.2.1"}}},
              {"vpd", fullVpd(serial)},
              {"ports", json::array()}};
    for (int p = 0; p < ports; ++p)
        a["ports"].push_back({{"portNumber", p}, {"protocols", json::array({fcFunction(adapter, p)})}});
    return a;
}

inline json host(json adapters)
{
    return json{{"osName", "Test OS"}, {"adapters", adapters}};
}

// 64 adapters with 4 FC functions each (two physical ports of two functions).
inline json wideHost()
{
    json adapters = json::array();
    for (int a = 0; a < 64; ++a) {
        char serial[32];
        std::snprintf(serial, sizeof(serial), "VXW%04d", a);
        json ad = fcAdapter(a, "RSX-1610", 0, serial);
        for (int p = 0; p < 2; ++p) {
            json port = {{"portNumber", p}, {"protocols", json::array()}};
            for (int f = 0; f < 2; ++f)
                port["protocols"].push_back(fcFunction(a, 2 * p + f));
            ad["ports"].push_back(port);
        }
        adapters.push_back(ad);
    }
    return host(adapters);
}

}  // namespace fctest

#endif

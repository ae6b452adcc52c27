// Live state versus configuration in an adapter description (livestate.h).
#include "livestate.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <cstdio>

namespace zorap_sim {
namespace {

// Keys of a protocol object that hold live state (FC: state, stats; NIC:
// linkState, linkSpeed, stats). A protocol accepts no other key of these
// names, so removing them by name is exact.
const char* const kLiveKeys[] = {"state", "stats", "linkState", "linkSpeed"};

void dropLiveKeys(nlohmann::json& doc) {
    if (!doc.is_object() || !doc.contains("adapters") || !doc["adapters"].is_array()) return;
    for (auto& adapter : doc["adapters"]) {
        if (!adapter.is_object() || !adapter.contains("ports") || !adapter["ports"].is_array()) continue;
        for (auto& port : adapter["ports"]) {
            if (!port.is_object() || !port.contains("protocols") || !port["protocols"].is_array()) continue;
            for (auto& protocol : port["protocols"])
                if (protocol.is_object())
                    for (const char* key : kLiveKeys) protocol.erase(key);
        }
    }
}

}  // namespace

std::string configurationOf(const std::string& jsonText) {
    // nlohmann::json keeps object keys sorted, so key order does not count.
    nlohmann::json doc = nlohmann::json::parse(jsonText, nullptr, false);
    if (doc.is_discarded()) return std::string();
    dropLiveKeys(doc);
    return doc.dump();
}

std::vector<PortStateChange> takeLiveState(Host& running, const Host& fresh) {
    std::vector<PortStateChange> changes;
    const size_t adapters = std::min(running.adapters.size(), fresh.adapters.size());
    for (size_t a = 0; a < adapters; ++a) {
        auto& ports = running.adapters[a].ports;
        const auto& freshPorts = fresh.adapters[a].ports;
        for (size_t p = 0; p < std::min(ports.size(), freshPorts.size()); ++p) {
            auto& protocols = ports[p].protocols;
            const auto& freshProtocols = freshPorts[p].protocols;
            for (size_t q = 0; q < std::min(protocols.size(), freshProtocols.size()); ++q) {
                Protocol& now = protocols[q];
                const Protocol& next = freshProtocols[q];
                if (now.isFc()) {
                    if (now.fc.stateCode != next.fc.stateCode)
                        changes.push_back({now.fc.portIndex, now.fc.portWwn, now.fc.stateCode, next.fc.stateCode});
                    now.fc.stateCode = next.fc.stateCode;
                    now.fc.stats = next.fc.stats;
                } else if (now.isNic()) {
                    now.nic.linkState = next.nic.linkState;
                    now.nic.linkSpeed = next.nic.linkSpeed;
                    now.nic.stats = next.nic.stats;
                }
            }
        }
    }
    return changes;
}

std::string portStateAlarmText(const PortStateChange& change) {
    char text[80];
    const Wwn& w = change.portWwn;
    std::snprintf(text, sizeof text, "FC port %02x:%02x:%02x:%02x:%02x:%02x:%02x:%02x state %u to %u", w[0], w[1],
                  w[2], w[3], w[4], w[5], w[6], w[7], static_cast<unsigned>(change.from),
                  static_cast<unsigned>(change.to));
    return text;
}

}  // namespace zorap_sim

// The sysfs source: the host model read from the running kernel instead of an
// adapter description, chosen by a description of the form
//     {"source": "sysfs", "root": "/"}
//
// One adapter per PCI slot (domain:bus:device), one physical port per PCI
// function that carries an FC host (/sys/class/fc_host) or an Ethernet
// interface (/sys/class/net), its FC hosts first, then its interfaces. The
// FC side brings its remote FCP targets and their SCSI devices as targets
// and LUNs; the NIC side its addresses and transceiver module.
//
// Live state (FC port state, type, speed and address, FC and NIC counters,
// link state, speed and duplex) is read afresh by the live calls and by the
// library's alarm thread; the rest is configuration, compared as one text
// (SysfsOrigin::configuration) to tell a configuration change.
#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include "model.h"

namespace zorap_sim {

// The host that the tree under `root` shows, configuration and live state;
// an unreadable tree gives a host without adapters. Never throws but
// std::bad_alloc.
Host readSysfsHost(const std::string& root);

// The live state of an FC function (port state, type, speed, address and
// counters) or a NIC function (link state, speed, duplex), read afresh from
// the tree; false when its FC host or interface is gone.
bool readFcLive(const std::string& root, FcFunction& fc);
bool readNicLive(const std::string& root, NicFunction& nic);

// The state code of every FC port in the tree, by port WWN.
std::map<Wwn, uint8_t> readFcStates(const std::string& root);
// The state codes of a host's FC ports, by port WWN.
std::map<Wwn, uint8_t> fcStatesOf(const Host& host);

// Alarm type 0 for an FC port whose state code changed.
struct PortAlarm {
    uint32_t portIndex = 0;
    std::string text;  // "FC port 31:00:... state 1 to 3"
};
PortAlarm portStateAlarm(const FcFunction& fc, uint8_t from);
// Gives `model`'s FC ports the state codes of `states` (ports not in it keep
// theirs) and returns an alarm for each port whose code changed.
std::vector<PortAlarm> takeFcStates(Host& model, const std::map<Wwn, uint8_t>& states);

}  // namespace zorap_sim

// Live state versus configuration in an adapter description.
//
// A real adapter library learns of a link going down or an FC port losing its
// loop by itself; nobody enumerates the adapters again for it. The substitute
// does the same with a rewritten description file: when the new text differs
// from the running one only in live state, the model takes the new live state
// and no configuration change is reported; an FC port whose state changed
// raises alarm type 0 for its port index. Any other difference is a change of
// configuration, read at the next backup build as before.
//
// Live state: an FC function's "state" and "stats", a NIC function's
// "linkState", "linkSpeed" and "stats".
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "model.h"

namespace zorap_sim {

// The description's configuration: its JSON with the live keys of every
// protocol left out, in one canonical form (keys sorted, no blanks), so that
// two texts describe the same configuration exactly when these are equal.
// Empty for text that is not JSON.
std::string configurationOf(const std::string& jsonText);

// An FC function whose port state changed with a live-state update.
struct PortStateChange {
    uint32_t portIndex = 0;
    Wwn portWwn{};
    uint8_t from = 0, to = 0;
};

// Copies the live state of `fresh` over `running`. Both must describe the
// same configuration (the same adapters, ports and functions in the same
// order), as equal configurationOf() texts guarantee. Returns the FC
// functions whose port state changed, in the order of the model.
std::vector<PortStateChange> takeLiveState(Host& running, const Host& fresh);

// "FC port 31:00:... state 1 to 3": the text of the alarm a change raises.
std::string portStateAlarmText(const PortStateChange& change);

}  // namespace zorap_sim

// The subscription gate: one process-wide switch, on while at least one
// indication filter is active, and the count of active filters. The
// provider's indication operations set them; the alerts and the job
// lifecycle indications are built only while the switch is on. Neither has a
// lock (both are atomic).
#ifndef VEXLAN_STATE_INDICATIONGATE_H
#define VEXLAN_STATE_INDICATIONGATE_H

#include <atomic>

struct IndicationGate {
    static std::atomic<bool> m_bIndicationEnabled;
    static std::atomic<int> m_numSubscriptions;
};

#endif

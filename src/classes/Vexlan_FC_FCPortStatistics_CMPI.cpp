// Vexlan_FCHBA_FCPortStatistics as a class module: a full list, one slot per
// FC function, the counters refreshed from the library once per build.
#include "classes/Vexlan_FC_FCPortStatistics_CMPI.h"

#include <cstddef>
#include <cstdio>

#include "classes/Vexlan_FC_FCPort_CMPI.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "zorap_cna.h"

ClassList<FCPortStatisticsEntry> g_FCPortStatisticsList;

namespace {

// The counters: the entry's field, the library's field, the CIM property, in
// the entry's order. A failed refresh clears the first kClearedOnFailure of
// them; IOCount and MegabyteCount keep what the slot held (zero, as the block
// is allocated cleared).
struct CounterRow {
    std::uint64_t FCPortStatisticsEntry::*field;
    std::uint32_t _tagZORAPSDMDevice::*source;
    const char* property;
};

const CounterRow kCounters[] = {
    {&FCPortStatisticsEntry::lipCount, &_tagZORAPSDMDevice::statLipCount, "LIPCount"},
    {&FCPortStatisticsEntry::linkFailures, &_tagZORAPSDMDevice::statLinkFailures, "LinkFailures"},
    {&FCPortStatisticsEntry::lossOfSync, &_tagZORAPSDMDevice::statLossOfSync, "LossOfSyncCounter"},
    {&FCPortStatisticsEntry::lossOfSignal, &_tagZORAPSDMDevice::statLossOfSignal, "LossOfSignalCounter"},
    {&FCPortStatisticsEntry::primitiveSeqErrors, &_tagZORAPSDMDevice::statPrimitiveSeqErrors,
     "PrimitiveSeqProtocolErrCount"},
    {&FCPortStatisticsEntry::crcErrors, &_tagZORAPSDMDevice::statCrcErrors, "CRCErrors"},
    {&FCPortStatisticsEntry::invalidTxWords, &_tagZORAPSDMDevice::statInvalidTxWords, "InvalidTransmissionWords"},
    {&FCPortStatisticsEntry::ioCount, &_tagZORAPSDMDevice::statIoCount, "IOCount"},
    {&FCPortStatisticsEntry::megabyteCount, &_tagZORAPSDMDevice::statMegabyteCount, "MegabyteCount"},
};
constexpr std::size_t kCounterCount = sizeof(kCounters) / sizeof(kCounters[0]);
constexpr std::size_t kClearedOnFailure = 7;

bool createFCPortStatistics(_tagZORAPSDMDevice* device, FCPortStatisticsEntry& entry)
{
    char nodeWWN[kFCWWNTextSize];
    FormatWWN(device->nodeWWN, nodeWWN, sizeof(nodeWWN));
    FormatWWN(device->portWWN, entry.portWWN, sizeof(entry.portWWN));
    FormatFCText(entry.instanceId, sizeof(entry.instanceId), "%s_%s", nodeWWN, entry.portWWN);

    if (ZORAP_RefreshDeviceStats(device) != 0) {
        if (g_EnableDebugPrint)
            Vexlan_FC_Utils_CMPI::DebugPrint("Vexlan_FC_FCPortStatistics ERROR in getting statistical data...");
        for (std::size_t i = 0; i < kClearedOnFailure; ++i)
            entry.*kCounters[i].field = 0;
    } else {
        for (const CounterRow& row : kCounters)
            entry.*row.field = device->*row.source;
    }
    return true;
}

template <std::size_t I>
PropertyValue counter(const FCPortStatisticsEntry& e)
{
    return CmpiData(static_cast<CMPIUint64>(e.*kCounters[I].field));
}

PropertyValue zero(const FCPortStatisticsEntry&)
{
    return CmpiData(static_cast<CMPIUint64>(0));
}

#define COUNTER_ROW(i) {kCounters[i].property, CMPI_uint64, counter<i>}

const PropertyRow<FCPortStatisticsEntry> kProperties[] = {
    {"InstanceID", CMPI_string, CLASS_VALUE(FCPortStatisticsEntry, entryText(e.instanceId))},
    {"ElementName", CMPI_string, CLASS_VALUE(FCPortStatisticsEntry, entryText(e.portWWN))},
    COUNTER_ROW(0),
    COUNTER_ROW(1),
    COUNTER_ROW(2),
    COUNTER_ROW(3),
    COUNTER_ROW(4),
    COUNTER_ROW(5),
    COUNTER_ROW(6),
    COUNTER_ROW(7),
    COUNTER_ROW(8),
    // Counters the adapter library does not keep: present, always 0.
    {"BytesTransmitted", CMPI_uint64, zero},
    {"BytesReceived", CMPI_uint64, zero},
    {"PacketsTransmitted", CMPI_uint64, zero},
    {"PacketsReceived", CMPI_uint64, zero},
    {"NOSCount", CMPI_uint64, zero},
    {"ErrorFrames", CMPI_uint64, zero},
    {"DumpedFrames", CMPI_uint64, zero},
    {"FramesTooShort", CMPI_uint64, zero},
    {"FramesTooLong", CMPI_uint64, zero},
    {"AddressErrors", CMPI_uint64, zero},
    {"BufferCreditNotProvided", CMPI_uint64, zero},
    {"DelimiterErrors", CMPI_uint64, zero},
    {"EncodingDisparityErrors", CMPI_uint64, zero},
    {"LinkResetsReceived", CMPI_uint64, zero},
    {"LinkResetsTransmitted", CMPI_uint64, zero},
    {"MulticastFramesReceived", CMPI_uint64, zero},
    {"MulticastFramesTransmitted", CMPI_uint64, zero},
};
static_assert(kCounterCount == 9, "one COUNTER_ROW per counter");

#undef COUNTER_ROW

const char* const kKeys[] = {"InstanceID", nullptr};

const ClassModule<FCPortStatisticsEntry> kFCPortStatistics =
    ClassModule<FCPortStatisticsEntry>("FCPortStatistics")
        .list(g_FCPortStatisticsList, ListKind::Full)
        .key("InstanceID", [](const FCPortStatisticsEntry& e) -> const char* { return e.instanceId; })
        .filterKeys(kKeys)
        .pathKeys(kKeys)
        .properties(kProperties);

}  // namespace

void buildFCPortStatisticsList()
{
    kFCPortStatistics.build(
        IsFCProtocol,
        [](_zorap_adapter_t*, _zorap_phy_port_t*, _zorap_protocol_t* protocol, FCPortStatisticsEntry& entry, int) {
            return createFCPortStatistics(&protocol->fcDevice, entry);
        });
}

void removeFCPortStatisticsList()
{
    g_FCPortStatisticsList.remove();
}

VEXLAN_LIST_CLASS_OPERATIONS(FCPortStatistics, kFCPortStatistics)

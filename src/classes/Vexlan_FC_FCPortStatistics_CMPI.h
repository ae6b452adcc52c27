// Vexlan_FCHBA_FCPortStatistics: the error and traffic counters of one FC
// function as the adapter library gave them at the last build. Nothing is
// read again when a client reads an instance; the dispatcher rebuilds the
// list before each request of this class.
#ifndef VEXLAN_CLASSES_VEXLAN_FC_FCPORTSTATISTICS_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_FC_FCPORTSTATISTICS_CMPI_H

#include <cstdint>

#include "classes/ClassModule.h"

struct FCPortStatisticsEntry {
    std::uint8_t valid;
    char instanceId[128];              // "<node WWN>_<port WWN>"
    char portWWN[128];                 // 16 hex digits: ElementName
    std::uint64_t lipCount;            // LIPCount
    std::uint64_t linkFailures;        // LinkFailures
    std::uint64_t lossOfSync;          // LossOfSyncCounter
    std::uint64_t lossOfSignal;        // LossOfSignalCounter
    std::uint64_t primitiveSeqErrors;  // PrimitiveSeqProtocolErrCount
    std::uint64_t crcErrors;           // CRCErrors
    std::uint64_t invalidTxWords;      // InvalidTransmissionWords
    std::uint64_t ioCount;             // IOCount
    std::uint64_t megabyteCount;       // MegabyteCount
};

extern ClassList<FCPortStatisticsEntry> g_FCPortStatisticsList;

void buildFCPortStatisticsList();
void removeFCPortStatisticsList();

VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(FCPortStatistics);

#endif

// Vexlan_Adapter_PhysicalPackage: the adapter board, one instance per serial
// number whichever functions the board has. The one class of the FC side that
// also serves the NIC side, through the _Nic_ operations, which find a board
// by the serial of an m_CNAList adapter.
#ifndef VEXLAN_CLASSES_VEXLAN_ADAPTER_PHYSICALPACKAGE_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_ADAPTER_PHYSICALPACKAGE_CMPI_H

#include <cstddef>
#include <cstdint>
#include <cstring>

#include "classes/ClassModule.h"
#include "inventory/AdapterFunc.h"
#include "support/Vexlan_FC_Utils_CMPI.h"

struct PhysicalPackageEntry {
    unsigned char valid;
    unsigned char isCNA;          // 1 for an adapter kind other than 1, 2, 3
    char tag[128];                // Tag: a UUID text or the serial
    char model[128];              // Model
    char serialNumber[128];       // may be an 11S product ID
    char sku[128];                // SKU, empty when unknown
    char partNumber[128];         // PartNumber, empty when unknown
    std::uint32_t adapterType;    // AdapterType
    unsigned char partnerBrand;   // a branded model or an 11S serial: the partner's name and maker
    unsigned char productId11S;   // the serial is an 11S product ID
    char name[256];               // Name and Description, joined at the build
};

extern ClassList<PhysicalPackageEntry> g_PhysicalPackageList;

// Size of the texts that the calc functions write; `out` must hold it.
constexpr std::size_t kPhysicalPackageTextSize = 128;

// The Tag, SKU and PartNumber of a NIC adapter: the adapter's serial
// (for the tag) or part number, unless the VPD keywords of its first port
// say "YU", "FN" or "PN" (the last such keyword wins). A null adapter gives
// the empty text. Each returns `out`, or null for a null `out`.
char* calcTag_PhysicalPackage(_CNAStruc* cna, char* out);
char* calcSKU_PhysicalPackage(_CNAStruc* cna, char* out);
char* calcPartNumber_PhysicalPackage(_CNAStruc* cna, char* out);

// The adapter type of an adapter kind: 1 gives 0, 2 gives 1, 3 gives 2,
// anything else 3. Shared with Product.
std::uint32_t AdapterTypeOfKind(std::uint32_t adapterKind);

void buildPhysicalPackageList();
void removePhysicalPackageList();

VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(PhysicalPackage);

// The first slot whose serial equals the adapter's, without regard to case;
// -1 when there is none or the adapter is null.
int findSlot_Nic_PhysicalPackage(_CNAStruc* cna);
// makePath_PhysicalPackage and makeInstance_PhysicalPackage of that slot.
// With no such slot nothing is built: the result is a null handle (isNull()).
CmpiObjectPath makePath_Nic_PhysicalPackage(const char* className, const char* nameSpace, _CNAStruc* cna);
CmpiInstance makeInstance_Nic_PhysicalPackage(const char* className, const char* nameSpace,
                                              const char** properties, _CNAStruc* cna);

// A debug line of the physical class builds, when debug output is on.
#define PHYSICAL_DEBUG(...)                                    \
    do {                                                       \
        if (g_EnableDebugPrint)                                \
            Vexlan_FC_Utils_CMPI::DebugPrint(__VA_ARGS__);     \
    } while (0)

// Copies at most `sourceMax` bytes of text (less at a NUL) into `target` of
// `targetSize` bytes, cut to fit and always terminated. Library records'
// fixed text fields are read this way, never beyond their arrays.
inline void copyBoundedText(char* target, std::size_t targetSize, const char* source, std::size_t sourceMax)
{
    if (target == nullptr || targetSize == 0)
        return;
    std::size_t n = source != nullptr ? strnlen(source, sourceMax) : 0;
    if (n >= targetSize)
        n = targetSize - 1;
    if (n > 0)
        std::memcpy(target, source, n);
    target[n] = '\0';
}

template <std::size_t N, std::size_t M>
inline void copyFieldText(char (&target)[N], const char (&source)[M])
{
    copyBoundedText(target, N, source, M);
}

#endif

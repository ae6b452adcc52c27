// Vexlan_FCHBA_SoftwareIdentity: the software on each FC function of the
// adapters (provider, driver, firmwares, boot code, FCode, EFI) and one flash
// image per adapter, as a list module built from the adapter tree.
#ifndef VEXLAN_CLASSES_VEXLAN_FCHBA_SOFTWAREIDENTITY_CMPI_H
#define VEXLAN_CLASSES_VEXLAN_FCHBA_SOFTWAREIDENTITY_CMPI_H

#include <cstdint>

#include "classes/ClassModule.h"

struct SoftwareIdentityEntry {
    unsigned char valid;
    unsigned char isCNA;            // chip codes 15, 17, 21, 26
    char instanceId[128];           // InstanceID
    char serialNumber[128];         // the adapter's serial
    char deviceKey[128];            // the device's model name: first IdentityInfoValue
    char versionString[128];        // VersionString
    std::uint16_t classification;   // the one element of Classifications
    unsigned char mbiValid;         // the flash image's MBI string was read
    std::int32_t mbiMajor, mbiMinor, mbiBuild, mbiDay, mbiMonth, mbiYear;
    unsigned char partnerBrand;     // the serial is an 11S product ID: the partner's name and maker
    char name[256];                 // Name, joined at the build; empty for a classification without texts
};

// Capacity 8 slots per FC function; the enumerations skip the unfilled ones.
extern ClassList<SoftwareIdentityEntry> g_SoftwareIdentityList;

// The classifications of the entries.
enum SoftwareClassification : std::uint16_t {
    kSoftwareDriver = 2,
    kSoftwareFlashFirmware = 10,
    kSoftwareFlashImage = 13,
    kSoftwareDriverFirmware = 32768,
    kSoftwareEFI = 32769,
    kSoftwareBIOS = 32770,
    kSoftwareFcode = 32771,
    kSoftwareCIMProvider = 32775,
};

void buildSoftwareIdentityList();
void removeSoftwareIdentityList();

// Microseconds since the Epoch of 0:00 local time of the date, with the month
// taken as tm_mon as it stands (so a date falls one month late, and month 12
// rolls into January of the next year).
std::uint64_t dtGetBinaryFormat(int day, int month, int year);

VEXLAN_DECLARE_LIST_CLASS_OPERATIONS(SoftwareIdentity);

#endif

/*
 * zorap_cna.h - interface of the adapter library libzorap_cna_provider.
 *
 * The library enumerates the host's FC and converged adapters into a tree
 * (adapters -> physical ports -> protocols), keeps a main and a backup copy of
 * that tree, answers per-device and per-interface questions (VPD, transceiver
 * pages, link and IP properties, FCoE linkage, flash image version), writes
 * flash images and raises alarms through a registered callback.
 *
 * Everything here is plain C with C linkage, x86_64 LP64, little-endian.
 * Scalar fields are host integers; chains end in a null pointer; every chain is
 * reached through a list header whose pointer may itself be null.
 *
 * Ownership: all tree records belong to the library.  The tree returned by
 * ZORAP_GetAdapterList stays valid until the next
 * ZORAP_SwapBackupToMainAdapterList or ZORAP_Uninitialize.  Memory that the
 * library hands out through an out-parameter (UUID text, MBI text, FCoE linkage
 * array, IP properties record) is released with ZORAP_FreeMem and nothing else.
 *
 * Record sizes and the offsets of the fields that callers depend on are fixed
 * and checked by the static assertions at the end of this file.
 */
#ifndef ZORAP_CNA_H
#define ZORAP_CNA_H

#include <stddef.h>
#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif

/* ------------------------------------------------------------------------ */
/* Status codes.  0 is success; any other value is a failure code.           */
/* ------------------------------------------------------------------------ */
typedef uint32_t ZORAP_STATUS;

#define ZORAP_OK                     0u
#define ZORAP_ERR_FAILED             1u  /* generic failure                          */
#define ZORAP_ERR_NOT_INITIALIZED    2u  /* ZORAP_Initialize has not run             */
#define ZORAP_ERR_INVALID_PARAMETER  3u  /* null pointer or bad size                 */
#define ZORAP_ERR_NOT_FOUND          4u  /* unknown handle, interface or adapter     */
#define ZORAP_ERR_NOT_PRESENT        5u  /* no transceiver, no VPD, no such data     */
#define ZORAP_ERR_BUFFER_TOO_SMALL   6u  /* size out-parameter holds the need        */
#define ZORAP_ERR_NO_MEMORY          7u
#define ZORAP_ERR_BUSY               8u  /* a flash write on this adapter is running */
#define ZORAP_ERR_FLASH_FAILED       9u  /* the adapter refused the image            */
#define ZORAP_ERR_NOT_SUPPORTED     10u  /* the source can't do this (flash writes
                                            of the running system's adapters)     */

/* protocolType values: every FC test is "less than 2". */
#define ZORAP_PROTOCOL_FC    0u
#define ZORAP_PROTOCOL_FCOE  1u
#define ZORAP_PROTOCOL_NIC   2u

/* adapterKind values of _zorap_adapter_t. */
#define ZORAP_ADAPTER_KIND_FC_HBA        1u
#define ZORAP_ADAPTER_KIND_FC_MEZZANINE  2u
#define ZORAP_ADAPTER_KIND_NIC           3u
#define ZORAP_ADAPTER_KIND_CNA           4u

/* optionRomMask bits of _tagZORAPSDMDevice. */
#define ZORAP_OPTROM_FIRMWARE  0x1u
#define ZORAP_OPTROM_EFI       0x2u
#define ZORAP_OPTROM_FCODE     0x4u

/* _zorap_ipaddr.family */
#define ZORAP_IP_FAMILY_IPV4  1u
#define ZORAP_IP_FAMILY_IPV6  2u

/* linkState of the link properties record: 1 up, anything else down. */
#define ZORAP_LINK_UP    1u
#define ZORAP_LINK_DOWN  2u

/* portStateCode of an FC port. */
#define ZORAP_PORT_STATE_ONLINE     1u
#define ZORAP_PORT_STATE_SUSPENDED  2u
#define ZORAP_PORT_STATE_LOOPDOWN   3u

/* transceiverState value of a module whose state counts as good. */
#define ZORAP_TRANSCEIVER_STATE_GOOD 6u

/* Buffer sizes the callers pass. */
#define ZORAP_VPD_BUFFER_SIZE      0x400u
#define ZORAP_SFP_BUFFER_SIZE      512u
#define ZORAP_DMI_BUFFER_SIZE      1024u
#define ZORAP_OS_NAME_BUFFER_SIZE  512u

/* ------------------------------------------------------------------------ */
/* Small records                                                             */
/* ------------------------------------------------------------------------ */

/* A MAC address, bytes in transmission order. 6 bytes. */
typedef struct _zorap_macaddr {
    uint8_t octet[6];
} _zorap_macaddr;

/* An IP address. 24 bytes: address in bytes 0..15 (IPv4 uses the first 4),
 * family in byte 16 (1 IPv4, 2 IPv6, anything else: no address). */
typedef struct _zorap_ipaddr {
    uint8_t address[16];
    uint8_t family;
    uint8_t prefixLength;     /* 0 when unknown */
    uint8_t reserved[6];
} _zorap_ipaddr;

#pragma pack(push, 4)
/* Link properties of a NIC interface. 172 bytes, 4-byte aligned.
 * In 8-byte words: word 1 is the link speed in Mbit/s, word 2 the link state. */
typedef struct _zorap_link_properties_t {
    uint32_t recordVersion;          /* 1 */
    uint32_t portIndex;              /* port number of the interface */
    uint64_t linkSpeed;              /* Mbit/s, 10000 for 10G; 0 when down */
    uint32_t linkState;              /* ZORAP_LINK_UP, or any other value: down */
    uint32_t linkStateReserved;      /* always 0, so word 2 compares as a whole */
    uint32_t fullDuplex;             /* 1 full, 0 half */
    uint32_t autoNegotiation;        /* 1 on */
    uint32_t maxTransmissionUnit;
    uint8_t  reserved[136];
} _zorap_link_properties_t;
#pragma pack(pop)

/* IP properties of a NIC interface, handed out by ZORAP_GetIPProperties in one
 * allocation together with the three address arrays it points to.  304 bytes.
 * The three address arrays are counted at bytes 104, 108 and 112; their
 * pointers are 64-bit and therefore stand at the 8-byte aligned bytes 152, 160
 * and 168 (the first array holds the IPv6 addresses). */
typedef struct _zorap_ip_properties_t {
    uint32_t recordVersion;          /* 1 */
    uint32_t dhcpEnabled;            /* 1 when the IPv4 address came from DHCP */
    _zorap_ipaddr ipv4Address;       /* byte 8 */
    _zorap_ipaddr subnetMask;        /* byte 32 */
    _zorap_ipaddr defaultGateway;    /* byte 56 */
    _zorap_ipaddr broadcastAddress;  /* byte 80 */
    uint32_t ipv6AddressCount;       /* byte 104 */
    uint32_t dnsServerCount;         /* byte 108 */
    uint32_t ipv6GatewayCount;       /* byte 112 */
    uint32_t ipv6Enabled;            /* byte 116 */
    char     domainName[28];         /* byte 120 */
    uint8_t  reserved0[4];           /* byte 148 */
    _zorap_ipaddr* ipv6Addresses;    /* byte 152 */
    _zorap_ipaddr* dnsServers;       /* byte 160 */
    _zorap_ipaddr* ipv6Gateways;     /* byte 168 */
    uint8_t  reserved1[128];         /* byte 176 */
} _zorap_ip_properties_t;

/* One FCoE linkage element of a NIC interface: the virtual FC port that the
 * converged function runs over this Ethernet port. 88 bytes. */
typedef struct _zorap_fcoe_linkage_t {
    uint8_t  portWWN[8];             /* bytes 0..7   */
    uint8_t  nodeWWN[8];             /* bytes 8..15  */
    uint8_t  fabricName[8];          /* bytes 16..23 */
    uint8_t  fcfMacAddress[6];       /* bytes 24..29: MAC of the FC forwarder */
    uint16_t vlanId;                 /* byte 30 */
    uint32_t fcfPriority;            /* byte 32 */
    uint32_t linkState;              /* byte 36: 1 logged in, 0 not */
    uint32_t maxFrameSize;           /* byte 40 */
    uint32_t fcoeFunctionIndex;      /* byte 44 */
    uint8_t  portId[3];              /* bytes 48..50: FC address, domain first */
    uint8_t  reserved0[5];           /* bytes 51..55 */
    uint8_t  enodeMacAddress[6];     /* bytes 56..61 */
    uint8_t  reserved1[2];           /* bytes 62..63 */
    char     fcHostName[24];         /* bytes 64..87: host name of the FC function */
} _zorap_fcoe_linkage_t;

/* ------------------------------------------------------------------------ */
/* FC device records                                                         */
/* ------------------------------------------------------------------------ */

/* One LUN behind a target. */
typedef struct _zorap_lun_t {
    uint16_t lunNumber;
    uint8_t  lunIdLength;            /* 16, or 8 for a short identifier */
    uint8_t  reserved0;
    uint32_t blockSize;              /* bytes */
    uint8_t  lunId[16];              /* identifier bytes, lunIdLength of them used */
    char     vendorId[16];           /* SCSI inquiry vendor, up to 8 characters */
    char     productId[24];          /* SCSI inquiry product, up to 16 characters */
    char     revision[8];            /* SCSI inquiry revision, up to 4 characters */
    char     osDeviceName[64];       /* host block device, e.g. "/dev/sdc" */
    uint64_t capacityBlocks;
    struct _zorap_lun_t* next;
} _zorap_lun_t;

/* One discovered target of an FC port. */
typedef struct _zorap_target_t {
    uint8_t  portWWN[8];
    uint8_t  nodeWWN[8];
    uint32_t portId;                 /* 24-bit FC address */
    uint32_t lunCount;
    _zorap_lun_t* lunList;
    struct _zorap_target_t* next;
} _zorap_target_t;

/* The port property record that ZORAP_GetHbaDevicePortProperty fills.  It is
 * laid out exactly like the device record from its portWWN field on, so a
 * caller may pass either the device's portWWN or a local record of this type. */
typedef struct _zorap_port_property_t {
    uint8_t  portWWN[8];
    uint8_t  portTypeCode;           /* 0..9 */
    uint8_t  portStateCode;          /* 1 online, 2 suspended, 3 loop down */
    uint16_t reserved0;
    uint32_t portSpeedCode;          /* 0..16: 1 1G, 2 2G, 3 auto, 4 4G, 8 8G, 10 10G, 16 16G */
    uint16_t transceiverState;       /* 6: module state good */
    uint16_t reserved1;
    uint32_t portFcId;               /* 24-bit FC address of the port */
    uint32_t supportedSpeedMask;     /* bit n: speed code n supported */
} _zorap_port_property_t;

/* The FC device of an FC protocol function. */
typedef struct _tagZORAPSDMDevice {
    uint32_t portPropertyIndex;      /* written 0 by the caller before the port property call */
    uint32_t deviceHandle;           /* handle for the device calls */
    uint32_t portIndex;              /* port number on the adapter */
    uint16_t pciVendorId;
    uint16_t pciDeviceId;            /* input of the chip classification */
    uint16_t subsystemVendorId;
    uint16_t subsystemDeviceId;
    uint8_t  nodeWWN[8];
    char     modelName[64];
    char     deviceSerial[64];       /* the serial kept by the library */
    char     biosVersionText[32];    /* BIOS version text of the option ROM */
    uint16_t transceiverSupport;     /* 1: the port has a pluggable transceiver cage */
    uint16_t reserved0;
    uint32_t optionRomMask;          /* ZORAP_OPTROM_* bits: which versions are present;
                                        bit 0 (the firmware flag) marks firmwareVersion valid */
    uint8_t  firmwareVersion[3];     /* major, minor, sub */
    uint8_t  efiVersion[2];          /* major, minor */
    uint8_t  fcodeVersion[3];        /* major, minor, sub */
    /* Port property record, see _zorap_port_property_t. */
    uint8_t  portWWN[8];
    uint8_t  portTypeCode;
    uint8_t  portStateCode;
    uint16_t reserved1;
    uint32_t portSpeedCode;
    uint16_t transceiverState;
    uint16_t reserved2;
    uint32_t portFcId;
    uint32_t supportedSpeedMask;
    /* Port counters, refreshed by ZORAP_RefreshDeviceStats. */
    uint32_t statIoCount;
    uint32_t statMegabyteCount;
    uint32_t statLipCount;
    uint32_t statLinkFailures;
    uint32_t statLossOfSync;
    uint32_t statLossOfSignal;
    uint32_t statPrimitiveSeqErrors;
    uint32_t statInvalidTxWords;
    uint32_t statCrcErrors;
    uint8_t  macAddress[6];          /* ENode MAC of a converged port */
    uint16_t reserved3;
    uint32_t targetCount;
    _zorap_target_t* targetList;
    char     driverVersionText[32];
    char     firmwareVersionText[32];
    char     fcodeVersionText[32];   /* FCode version text of the adapter, empty if none */
    char     efiVersionText[32];     /* EFI version text of the adapter, empty if none */
} _tagZORAPSDMDevice;

/* ------------------------------------------------------------------------ */
/* NIC function records (copied whole by the caller)                         */
/* ------------------------------------------------------------------------ */

/* The adapter as a NIC function describes it. 928 bytes, 4-byte aligned. */
typedef struct _zorap_nic_adapter_info_t {
    uint8_t  nodeWWN[8];             /* WWN of the adapter's converged function */
    char     modelName[64];          /* byte 8 */
    char     serialNumber[64];       /* byte 72 */
    char     versionString[64];      /* byte 136: flash image version of the adapter */
    char     partNumber[64];         /* byte 200 */
    char     productName[128];       /* byte 264 */
    char     driverVersion[32];      /* byte 392 */
    char     firmwareVersion[32];    /* byte 424 */
    uint16_t pciVendorId;            /* byte 456 */
    uint16_t pciDeviceId;
    uint16_t subsystemVendorId;
    uint16_t subsystemDeviceId;
    uint32_t nicPortCount;           /* byte 464 */
    uint8_t  reserved[460];          /* byte 468 */
} _zorap_nic_adapter_info_t;

/* One keyword of the adapter's VPD as the NIC function reports it. */
typedef struct _zorap_vpd_entry_t {
    char keyword[8];                 /* two letters, NUL terminated */
    char value[128];                 /* NUL terminated */
} _zorap_vpd_entry_t;

#define ZORAP_NIC_VPD_ENTRIES 47

/* Further port data of a NIC function: the VPD keywords. 6396 bytes. */
typedef struct _zorap_nic_port_extra_t {
    uint32_t vpdCount;
    _zorap_vpd_entry_t vpd[ZORAP_NIC_VPD_ENTRIES];
} _zorap_nic_port_extra_t;

/* The port as a NIC function describes it. 876 bytes, 4-byte aligned. */
typedef struct _zorap_nic_port_info_t {
    _zorap_macaddr macAddress;       /* byte 0, in an 8-byte field */
    uint8_t  macAddressPad[2];       /* always 0 */
    char     interfaceName[32];      /* byte 8: interface name in the host, e.g. "eth2" */
    uint32_t portNumber;             /* byte 40 */
    _zorap_link_properties_t linkProperties; /* byte 44: as at enumeration */
    uint32_t maxTransmissionUnit;    /* byte 216 */
    uint32_t pciBus;                 /* byte 220 */
    uint32_t pciDevice;
    uint32_t pciFunction;
    char     driverName[32];         /* byte 232 */
    char     driverVersion[32];      /* byte 264 */
    char     firmwareVersion[32];    /* byte 296 */
    uint8_t  reserved[548];          /* byte 328 */
} _zorap_nic_port_info_t;

#pragma pack(push, 4)
/* Traffic counters of a NIC function. 960 bytes, 4-byte aligned. */
typedef struct _zorap_nic_port_stats_t {
    uint64_t rxBytes;
    uint64_t txBytes;
    uint64_t rxPackets;
    uint64_t txPackets;
    uint64_t rxErrors;
    uint64_t txErrors;
    uint64_t rxDropped;
    uint64_t txDropped;
    uint64_t rxMulticast;
    uint64_t collisions;
    uint64_t rxCrcErrors;
    uint64_t rxPauseFrames;
    uint64_t txPauseFrames;
    uint64_t reserved[107];
} _zorap_nic_port_stats_t;
#pragma pack(pop)

/* ------------------------------------------------------------------------ */
/* The adapter tree                                                          */
/* ------------------------------------------------------------------------ */

struct _zorap_protocol_t;
struct _zorap_phy_port_t;
struct _zorap_adapter_t;

typedef struct _zorap_protocol_list_t {
    struct _zorap_protocol_t* firstProtocol;
    uint32_t count;
} _zorap_protocol_list_t;

typedef struct _zorap_phy_port_list_t {
    struct _zorap_phy_port_t* firstPhyPort;
    uint32_t count;
} _zorap_phy_port_list_t;

typedef struct _zorap_adapter_list_t {
    struct _zorap_adapter_t* firstAdapter;
    uint32_t count;
} _zorap_adapter_list_t;

/* One function of a physical port. */
typedef struct _zorap_protocol_t {
    int32_t adapterInstance;         /* number of the physical adapter */
    uint32_t reserved0;
    union {                          /* the two uses exclude each other */
        _zorap_nic_adapter_info_t nicAdapterInfo;  /* NIC protocols */
        _tagZORAPSDMDevice        fcDevice;        /* FC protocols */
    };
    _zorap_nic_port_extra_t nicPortExtra;
    _zorap_nic_port_info_t  nicPortInfo;
    _zorap_nic_port_stats_t nicPortStats;
    uint32_t protocolType;           /* ZORAP_PROTOCOL_*: below 2 FC, 2 NIC */
    uint32_t reserved1;
    struct _zorap_protocol_t* next;
} _zorap_protocol_t;

/* A physical port of an adapter. */
typedef struct _zorap_phy_port_t {
    uint8_t portNumber;              /* at the record's start */
    uint8_t reserved[7];
    _zorap_protocol_list_t* protocolList;
    struct _zorap_phy_port_t* next;
} _zorap_phy_port_t;

/* An adapter board. */
typedef struct _zorap_adapter_t {
    char     serialNumber[64];       /* at the record's start */
    char     modelName[64];
    char     productName[128];
    char     productVersion[64];
    uint32_t adapterKind;            /* ZORAP_ADAPTER_KIND_* */
    int32_t  adapterInstance;
    _zorap_phy_port_list_t* phyPortList;
    struct _zorap_adapter_t* next;
} _zorap_adapter_t;

/* ------------------------------------------------------------------------ */
/* Functions                                                                 */
/* ------------------------------------------------------------------------ */

/* Alarm callback: called on a thread of the library, never on a caller's. */
typedef int (*ZORAP_ALARM_CALLBACK)(unsigned int deviceNumber, int coreAlarmType,
                                    int stringParameterLength,
                                    unsigned char* stringParameter);

/* Prepare the library and enumerate the adapters into the main tree.
 * logMask 0x1f turns the library's own trace on; reserved is 0. */
ZORAP_STATUS ZORAP_Initialize(int logMask, int reserved);
/* Release everything; the trees are gone, the alarm thread has ended. */
ZORAP_STATUS ZORAP_Uninitialize(void);
/* Header of the main tree, or null. */
_zorap_adapter_list_t* ZORAP_GetAdapterList(void);
/* Non-zero when the adapter configuration changed since the last reset. */
int ZORAP_DidConfigChange(void);
ZORAP_STATUS ZORAP_ResetConfigChange(void);
/* Enumerate afresh into the backup tree; the main tree is not touched. */
ZORAP_STATUS ZORAP_UpdateBackupAdapterList(void);
/* Make the backup tree the main tree. Pointers into the old main tree die. */
ZORAP_STATUS ZORAP_SwapBackupToMainAdapterList(void);
ZORAP_STATUS ZORAP_RegisterAlarmNotificationCallback(ZORAP_ALARM_CALLBACK callback);
ZORAP_STATUS ZORAP_UnRegisterAlarmNotificationCallback(ZORAP_ALARM_CALLBACK callback);
/* Fill a port property record (the device's portWWN field or a local
 * _zorap_port_property_t) from the port's current state. index is 0. */
ZORAP_STATUS ZORAP_GetHbaDevicePortProperty(uint32_t deviceHandle, uint32_t index,
                                            void* portRecord);
/* Update the stat* counters inside the device record. */
ZORAP_STATUS ZORAP_RefreshDeviceStats(_tagZORAPSDMDevice* device);
/* Fill buffer with the tagged VPD stream; *size is the buffer size on entry
 * and the stream length on return (the need, with BUFFER_TOO_SMALL). */
ZORAP_STATUS ZORAP_GetVpd(uint32_t deviceHandle, uint32_t index, uint8_t* buffer,
                          uint32_t* size);
/* Newly allocated UUID text (free with ZORAP_FreeMem); length without NUL. */
ZORAP_STATUS ZORAP_GetUUIDFromI2CVPD(_tagZORAPSDMDevice* device, char** text,
                                     uint32_t* length);
/* Newly allocated "V:%d.%02d.%02d,D:%02d%02d%4d,A:Y,T:M" (month, day, year). */
ZORAP_STATUS ZORAP_GetMBIVersionString(_tagZORAPSDMDevice* device, char** text,
                                       uint32_t* length);
/* Fill 512 bytes: transceiver pages A0 (0..255) and A2 (256..511). */
ZORAP_STATUS ZORAP_GetSFPData(_tagZORAPSDMDevice* device, uint8_t* buffer);
/* Host operating system name; *size is the buffer size (512) on entry. */
ZORAP_STATUS ZORAP_GetOSName(char* buffer, uint32_t* size);
/* Newly allocated array of *count _zorap_fcoe_linkage_t (free with ZORAP_FreeMem). */
ZORAP_STATUS ZORAP_GetFCoELinkage(const char* interfaceName, void** array,
                                  uint32_t* count);
ZORAP_STATUS ZORAP_GetLinkProperties(const char* interfaceName,
                                     _zorap_link_properties_t* properties);
/* Transceiver pages A0 and A2 of the interface's module; *length is the buffer
 * size (1024) on entry and the data length (512) on return. */
ZORAP_STATUS ZORAP_GetTransceiverDMIData(const char* interfaceName, uint32_t* length,
                                         uint8_t* buffer);
/* Newly allocated _zorap_ip_properties_t with its address arrays in the same
 * allocation (one ZORAP_FreeMem releases all). */
ZORAP_STATUS ZORAP_GetIPProperties(const char* interfaceName, void** record);
/* Write a NIC flash image; blocks until done. The image argument is not read
 * by the library beyond being present. */
ZORAP_STATUS ZORAP_UpdateFlash(uint32_t adapterInstance, const unsigned char* image,
                               uint32_t flags);
/* Write an FC flash image; blocks until done. */
ZORAP_STATUS ZORAP_doOptionROMUpdate(_tagZORAPSDMDevice* device,
                                     const unsigned char* image, uint32_t flags);
/* Release memory the library handed out; null is ignored. */
void ZORAP_FreeMem(void* memory);

/* ------------------------------------------------------------------------ */
/* Layout checks                                                             */
/* ------------------------------------------------------------------------ */
#ifdef __cplusplus
#define ZORAP_STATIC_ASSERT(cond, msg) static_assert(cond, msg)
#define ZORAP_ALIGNOF(type) alignof(type)
#else
#define ZORAP_ALIGNOF(type) _Alignof(type)
#define ZORAP_STATIC_ASSERT(cond, msg) _Static_assert(cond, msg)
#endif

ZORAP_STATIC_ASSERT(sizeof(void*) == 8, "the adapter library records are laid out for LP64");
ZORAP_STATIC_ASSERT(sizeof(_zorap_macaddr) == 6, "_zorap_macaddr is 6 bytes");
ZORAP_STATIC_ASSERT(sizeof(_zorap_ipaddr) == 24, "_zorap_ipaddr is 24 bytes");
ZORAP_STATIC_ASSERT(offsetof(_zorap_ipaddr, family) == 16, "family at byte 16");

ZORAP_STATIC_ASSERT(sizeof(_zorap_link_properties_t) == 172, "link properties are 172 bytes");
ZORAP_STATIC_ASSERT(offsetof(_zorap_link_properties_t, linkSpeed) == 8, "link speed is word 1");
ZORAP_STATIC_ASSERT(offsetof(_zorap_link_properties_t, linkState) == 16, "link state is word 2");

ZORAP_STATIC_ASSERT(sizeof(_zorap_ip_properties_t) == 304, "IP properties are 304 bytes");
ZORAP_STATIC_ASSERT(offsetof(_zorap_ip_properties_t, ipv4Address) == 8, "IPv4 address at 8");
ZORAP_STATIC_ASSERT(offsetof(_zorap_ip_properties_t, subnetMask) == 32, "subnet mask at 32");
ZORAP_STATIC_ASSERT(offsetof(_zorap_ip_properties_t, ipv6AddressCount) == 104, "count 1 at 104");
ZORAP_STATIC_ASSERT(offsetof(_zorap_ip_properties_t, dnsServerCount) == 108, "count 2 at 108");
ZORAP_STATIC_ASSERT(offsetof(_zorap_ip_properties_t, ipv6GatewayCount) == 112, "count 3 at 112");
ZORAP_STATIC_ASSERT(offsetof(_zorap_ip_properties_t, ipv6Addresses) == 152, "array 1 at 152");
ZORAP_STATIC_ASSERT(offsetof(_zorap_ip_properties_t, dnsServers) == 160, "array 2 at 160");
ZORAP_STATIC_ASSERT(offsetof(_zorap_ip_properties_t, ipv6Gateways) == 168, "array 3 at 168");

ZORAP_STATIC_ASSERT(sizeof(_zorap_fcoe_linkage_t) == 88, "FCoE linkage element is 88 bytes");
ZORAP_STATIC_ASSERT(offsetof(_zorap_fcoe_linkage_t, portWWN) == 0, "WWN at bytes 0..7");
ZORAP_STATIC_ASSERT(offsetof(_zorap_fcoe_linkage_t, portId) == 48, "port ID at bytes 48..50");
ZORAP_STATIC_ASSERT(offsetof(_zorap_fcoe_linkage_t, enodeMacAddress) == 56, "MAC at bytes 56..61");

ZORAP_STATIC_ASSERT(sizeof(_zorap_nic_adapter_info_t) == 928, "nicAdapterInfo is 928 bytes");
ZORAP_STATIC_ASSERT(ZORAP_ALIGNOF(_zorap_nic_adapter_info_t) == 4, "adapter info is 4-byte aligned");
ZORAP_STATIC_ASSERT(sizeof(_tagZORAPSDMDevice) <= sizeof(_zorap_nic_adapter_info_t),
                    "fcDevice lies inside nicAdapterInfo's range");
ZORAP_STATIC_ASSERT(sizeof(_zorap_nic_port_extra_t) == 6396, "nicPortExtra is 6396 bytes");
ZORAP_STATIC_ASSERT(sizeof(_zorap_nic_port_info_t) == 876, "nicPortInfo is 876 bytes");
ZORAP_STATIC_ASSERT(ZORAP_ALIGNOF(_zorap_nic_port_info_t) == 4, "port info is 4-byte aligned");
ZORAP_STATIC_ASSERT(offsetof(_zorap_nic_port_info_t, macAddress) == 0, "MAC first");
ZORAP_STATIC_ASSERT(sizeof(_zorap_nic_port_stats_t) == 960, "nicPortStats is 960 bytes");

/* The port property record mirrors the device record from portWWN on. */
#define ZORAP_PORTPROP_SAME(f) \
    (offsetof(_tagZORAPSDMDevice, f) - offsetof(_tagZORAPSDMDevice, portWWN) == \
     offsetof(_zorap_port_property_t, f))
ZORAP_STATIC_ASSERT(ZORAP_PORTPROP_SAME(portTypeCode) && ZORAP_PORTPROP_SAME(portStateCode) &&
                    ZORAP_PORTPROP_SAME(portSpeedCode) && ZORAP_PORTPROP_SAME(transceiverState) &&
                    ZORAP_PORTPROP_SAME(portFcId) && ZORAP_PORTPROP_SAME(supportedSpeedMask) &&
                    offsetof(_tagZORAPSDMDevice, statIoCount) -
                            offsetof(_tagZORAPSDMDevice, portWWN) ==
                        sizeof(_zorap_port_property_t),
                    "port property record layout matches the device record");
#undef ZORAP_PORTPROP_SAME

/* The named fields of the device record stand in the order of the record. */
#define ZORAP_BEFORE(t, a, b) (offsetof(t, a) < offsetof(t, b))
ZORAP_STATIC_ASSERT(ZORAP_BEFORE(_tagZORAPSDMDevice, portPropertyIndex, deviceHandle) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, deviceHandle, portIndex) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, portIndex, pciDeviceId) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, pciDeviceId, subsystemVendorId) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, subsystemVendorId, subsystemDeviceId) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, subsystemDeviceId, nodeWWN) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, nodeWWN, modelName) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, modelName, deviceSerial) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, deviceSerial, biosVersionText) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, biosVersionText, transceiverSupport) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, transceiverSupport, optionRomMask) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, optionRomMask, firmwareVersion) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, firmwareVersion, efiVersion) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, efiVersion, fcodeVersion) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, fcodeVersion, portWWN) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, portWWN, portTypeCode) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, portTypeCode, portStateCode) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, portStateCode, portSpeedCode) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, portSpeedCode, transceiverState) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, transceiverState, statIoCount) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, statCrcErrors, macAddress) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, macAddress, targetCount) &&
                    ZORAP_BEFORE(_tagZORAPSDMDevice, targetCount, targetList),
                    "device fields in the order of the record");
/* The adapter info read by NIC callers: six WWN bytes first, then these. */
ZORAP_STATIC_ASSERT(offsetof(_zorap_nic_adapter_info_t, nodeWWN) == 0 &&
                    ZORAP_BEFORE(_zorap_nic_adapter_info_t, modelName, serialNumber) &&
                    ZORAP_BEFORE(_zorap_nic_adapter_info_t, serialNumber, versionString) &&
                    ZORAP_BEFORE(_zorap_nic_adapter_info_t, versionString, partNumber),
                    "adapter info fields in order");
/* The port info starts with the fields NIC callers read, in this order. */
ZORAP_STATIC_ASSERT(ZORAP_BEFORE(_zorap_nic_port_info_t, macAddress, interfaceName) &&
                    ZORAP_BEFORE(_zorap_nic_port_info_t, interfaceName, portNumber) &&
                    ZORAP_BEFORE(_zorap_nic_port_info_t, portNumber, linkProperties) &&
                    ZORAP_BEFORE(_zorap_nic_port_info_t, linkProperties, maxTransmissionUnit),
                    "port info fields in order");
#undef ZORAP_BEFORE

ZORAP_STATIC_ASSERT(offsetof(_zorap_adapter_t, serialNumber) == 0, "adapter serial first");
ZORAP_STATIC_ASSERT(offsetof(_zorap_phy_port_t, portNumber) == 0, "port number first");

#ifdef __cplusplus
} /* extern "C" */
#endif

#endif /* ZORAP_CNA_H */

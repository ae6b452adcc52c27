/*
 * zorap_chip_ids.h - PCI identities of the adapter vendor's chips and boards.
 *
 * One table maps a PCI device ID to the chip type code, the ordinal of the
 * chip's generation: 0 is the oldest chip, 26 the newest, 100 an unknown
 * device ID.  The same rows carry the two 4G kinds (codes 8 to 11) and the
 * 8G part (code 12).  A second table lists the PCI subsystem IDs of the
 * mezzanine and embedded boards, which have no pluggable transceiver.
 *
 * The adapter library fills pciDeviceId and the subsystem IDs of its device
 * records from these tables, and the chip classification reads them back, so
 * both sides agree by construction.
 */
#ifndef ZORAP_CHIP_IDS_H
#define ZORAP_CHIP_IDS_H

#include <stddef.h>
#include <stdint.h>
#include <string.h>

#ifdef __cplusplus
extern "C" {
#endif

/* PCI vendor ID of the adapter vendor; also its subsystem vendor ID. */
#define ZORAP_PCI_VENDOR_ID 0x7E5Au

#define ZORAP_CHIP_CODE_NONE     0   /* the answer for a null device */
#define ZORAP_CHIP_CODE_UNKNOWN  100 /* a device ID not in the table */

typedef struct zorap_chip_row {
    uint16_t pciDeviceId;
    int32_t  chipCode;       /* 0..26 */
    uint8_t  fourGbKind;     /* 1 or 2 for the two 4G pairs, else 0 */
    uint8_t  eightGb;        /* 1 for the 8G part, else 0 */
    const char* chipName;
} zorap_chip_row;

/* One row per device ID; code 26 has two rows. */
static const zorap_chip_row ZORAP_CHIP_TABLE[] = {
    /* the oldest parts: no VPD, no option ROM read */
    {0x0210,  0, 0, 0, "RSX-210"},
    {0x0220,  1, 0, 0, "RSX-220"},
    {0x0230,  2, 0, 0, "RSX-230"},
    {0x0231,  3, 0, 0, "RSX-231"},
    {0x0240,  4, 0, 0, "RSX-240"},
    {0x0241,  5, 0, 0, "RSX-241"},
    /* option-ROM versions readable, no VPD */
    {0x0250,  6, 0, 0, "RSX-250"},
    {0x0251,  7, 0, 0, "RSX-251"},
    /* 4G parts: the second kind, then the first kind */
    {0x0460,  8, 2, 0, "RSX-460"},
    {0x0461,  9, 2, 0, "RSX-461"},
    {0x0470, 10, 1, 0, "RSX-470"},
    {0x0471, 11, 1, 0, "RSX-471"},
    /* the 8G part */
    {0x0880, 12, 0, 1, "RSX-880"},
    {0x0890, 13, 0, 0, "RSX-890"},
    /* converged parts; 15, 17, 21 and 26 carry an ENode MAC */
    {0x0A10, 14, 0, 0, "RSX-A10"},
    {0x0A20, 15, 0, 0, "RSX-A20"},
    {0x0A30, 16, 0, 0, "RSX-A30"},
    {0x0A40, 17, 0, 0, "RSX-A40"},
    {0x0A50, 18, 0, 0, "RSX-A50"},
    {0x0A60, 19, 0, 0, "RSX-A60"},
    {0x0A70, 20, 0, 0, "RSX-A70"},
    {0x0A80, 21, 0, 0, "RSX-A80"},
    {0x0A90, 22, 0, 0, "RSX-A90"},
    {0x0AA0, 23, 0, 0, "RSX-AA0"},
    /* 16G parts */
    {0x1610, 24, 0, 0, "RSX-1610"},
    {0x1620, 25, 0, 0, "RSX-1620"},
    /* the newest converged part, two device IDs */
    {0x0AB0, 26, 0, 0, "RSX-AB0"},
    {0x0AB1, 26, 0, 0, "RSX-AB1"},
};

#define ZORAP_CHIP_TABLE_ROWS (sizeof(ZORAP_CHIP_TABLE) / sizeof(ZORAP_CHIP_TABLE[0]))

/* The row of a device ID, or null. */
static inline const zorap_chip_row* zorap_chip_row_for_device_id(uint16_t pciDeviceId)
{
    size_t i;
    for (i = 0; i < ZORAP_CHIP_TABLE_ROWS; ++i)
        if (ZORAP_CHIP_TABLE[i].pciDeviceId == pciDeviceId)
            return &ZORAP_CHIP_TABLE[i];
    return NULL;
}

/* Chip type code of a device ID: the table's code, or 100. */
static inline int32_t zorap_chip_code_for_device_id(uint16_t pciDeviceId)
{
    const zorap_chip_row* row = zorap_chip_row_for_device_id(pciDeviceId);
    return row ? row->chipCode : ZORAP_CHIP_CODE_UNKNOWN;
}

/* The row of a chip name (case-sensitive), or null. */
static inline const zorap_chip_row* zorap_chip_row_for_name(const char* chipName)
{
    size_t i;
    if (chipName == NULL)
        return NULL;
    for (i = 0; i < ZORAP_CHIP_TABLE_ROWS; ++i)
        if (strcmp(ZORAP_CHIP_TABLE[i].chipName, chipName) == 0)
            return &ZORAP_CHIP_TABLE[i];
    return NULL;
}

/* ------------------------------------------------------------------------ */
/* Mezzanine and embedded boards, by PCI subsystem IDs                       */
/* ------------------------------------------------------------------------ */

/* Which diagnostic line a positive answer prints. */
typedef enum zorap_mezz_kind {
    ZORAP_MEZZ_NONE = 0,
    ZORAP_MEZZ_16G,          /* "16G Mezzanine CNA/HBA detected ..." */
    ZORAP_MEZZ_8G,           /* "8G Mezzanine CNA/HBA detected ..." */
    ZORAP_MEZZ_8G_OEM,       /* the OEM 8G mezzanine line */
    ZORAP_MEZZ_FIBREDOWN,    /* "Mezzanine HBA/FibreDown detected ..." */
    ZORAP_MEZZ_PLATFORM_2G   /* the platform motherboard 2G line */
} zorap_mezz_kind;

/* The vendor's own boards. */
static const uint16_t ZORAP_MEZZ_OWN_16G_IDS[] = {0x6101, 0x6102, 0x6103};
static const uint16_t ZORAP_MEZZ_OWN_8G_IDS[] = {0x6801, 0x6802, 0x6803, 0x6804,
                                                 0x6805, 0x6806, 0x6807, 0x6808,
                                                 0x6809, 0x680A, 0x680B, 0x680C};
static const uint16_t ZORAP_MEZZ_OWN_FIBREDOWN_IDS[] = {0x6F01, 0x6F02, 0x6F03,
                                                        0x6F04, 0x6F05, 0x6F06,
                                                        0x6F07, 0x6F08, 0x6F09};
static const uint16_t ZORAP_MEZZ_OWN_PLATFORM_2G_IDS[] = {0x6201, 0x6202, 0x6203};
/* Boards of server makers that carry the vendor's chips. */
static const uint16_t ZORAP_MEZZ_OEM_A_8G_IDS[] = {0x3261, 0x336F, 0x3377, 0x337D, 0x337E, 0x338E};
static const uint16_t ZORAP_MEZZ_OEM_B_8G_IDS[] = {0x69, 0x75};
static const uint16_t ZORAP_MEZZ_OEM_C_8G_IDS[] = {0x1F64};
static const uint16_t ZORAP_MEZZ_OEM_C_8G_OEM_IDS[] = {0x170, 0x18A, 0x45F};
static const uint16_t ZORAP_MEZZ_OEM_D_FIBREDOWN_IDS[] = {0x102, 0x105, 0x109};
static const uint16_t ZORAP_MEZZ_OEM_A_FIBREDOWN_IDS[] = {0x1705, 0x1329};

typedef struct zorap_mezz_row {
    uint16_t subsystemVendorId;
    const uint16_t* subsystemDeviceIds;
    size_t count;
    zorap_mezz_kind kind;
} zorap_mezz_row;

#define ZORAP_MEZZ_ROW(vendor, ids, kind) {vendor, ids, sizeof(ids) / sizeof(ids[0]), kind}

/* Tested in this order; the first matching row decides. */
static const zorap_mezz_row ZORAP_MEZZ_TABLE[] = {
    ZORAP_MEZZ_ROW(ZORAP_PCI_VENDOR_ID, ZORAP_MEZZ_OWN_16G_IDS, ZORAP_MEZZ_16G),
    ZORAP_MEZZ_ROW(ZORAP_PCI_VENDOR_ID, ZORAP_MEZZ_OWN_8G_IDS, ZORAP_MEZZ_8G),
    ZORAP_MEZZ_ROW(0x103C, ZORAP_MEZZ_OEM_A_8G_IDS, ZORAP_MEZZ_8G),
    ZORAP_MEZZ_ROW(0x1137, ZORAP_MEZZ_OEM_B_8G_IDS, ZORAP_MEZZ_8G),
    ZORAP_MEZZ_ROW(0x1028, ZORAP_MEZZ_OEM_C_8G_IDS, ZORAP_MEZZ_8G),
    ZORAP_MEZZ_ROW(0x1028, ZORAP_MEZZ_OEM_C_8G_OEM_IDS, ZORAP_MEZZ_8G_OEM),
    ZORAP_MEZZ_ROW(ZORAP_PCI_VENDOR_ID, ZORAP_MEZZ_OWN_FIBREDOWN_IDS, ZORAP_MEZZ_FIBREDOWN),
    ZORAP_MEZZ_ROW(0x0E11, ZORAP_MEZZ_OEM_D_FIBREDOWN_IDS, ZORAP_MEZZ_FIBREDOWN),
    ZORAP_MEZZ_ROW(0x103C, ZORAP_MEZZ_OEM_A_FIBREDOWN_IDS, ZORAP_MEZZ_FIBREDOWN),
    ZORAP_MEZZ_ROW(ZORAP_PCI_VENDOR_ID, ZORAP_MEZZ_OWN_PLATFORM_2G_IDS, ZORAP_MEZZ_PLATFORM_2G),
};

#define ZORAP_MEZZ_TABLE_ROWS (sizeof(ZORAP_MEZZ_TABLE) / sizeof(ZORAP_MEZZ_TABLE[0]))

/* The kind of a board by its subsystem IDs, ZORAP_MEZZ_NONE for a board with
 * a pluggable transceiver. */
static inline zorap_mezz_kind zorap_mezz_kind_for(uint16_t subsystemVendorId,
                                                  uint16_t subsystemDeviceId)
{
    size_t r, i;
    for (r = 0; r < ZORAP_MEZZ_TABLE_ROWS; ++r) {
        if (ZORAP_MEZZ_TABLE[r].subsystemVendorId != subsystemVendorId)
            continue;
        for (i = 0; i < ZORAP_MEZZ_TABLE[r].count; ++i)
            if (ZORAP_MEZZ_TABLE[r].subsystemDeviceIds[i] == subsystemDeviceId)
                return ZORAP_MEZZ_TABLE[r].kind;
    }
    return ZORAP_MEZZ_NONE;
}

/* Subsystem device ID of the vendor's ordinary PCIe boards (with cages). */
#define ZORAP_SUBSYS_STANDARD_BOARD 0x0001u

#ifdef __cplusplus
} /* extern "C" */
#endif

#endif /* ZORAP_CHIP_IDS_H */

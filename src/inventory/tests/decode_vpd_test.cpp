// The VPD tag walk and its lines, on streams built here; the option ROM lines.
#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "decode_test_support.h"
#include "inventory/AdapterFunc_VPD.h"

using decode_test::VpdStream;

namespace {

class VpdWalk : public ::testing::Test {
protected:
    void SetUp() override { decode_test::clearVpdBuffers(); }

    // Decodes the stream from a heap block of exactly its size.
    static void decode(VpdStream const& stream) {
        auto block = decode_test::exactCopy(stream.bytes());
        PrintVPD(block.get(), stream.bytes().size());
    }
};

TEST_F(VpdWalk, FullStreamFillsEveryLineWithItsLabel) {
    VpdStream stream;
    stream.identifier("Vexlan 16Gb Dual-Port HBA")
        .readOnly(180)
        .keyword("PN", "VXF1622-01")
        .keyword("EC", "B")
        .keyword("SN", "VXA1631K0042")
        .keyword("MN", "7E5A")
        .keyword("V0", "PCIe Gen3 x8")
        .keyword("V1", "  7.00 ")
        .keyword("V2", "2531")
        .keyword("V3", "8.08.204  ")
        .keyword("V4", " 3.64")
        .keyword("V5", "4.12.03")
        .keyword("FN", "VXF1622-FRU")
        .keyword("FC", "FC16-2P")
        .keyword("RV", std::string(1, '\x5A'))
        .writable(40)
        .keyword("YA", "IT-ASSET-0417")
        .keyword("YU", "3f2a9c1e-7d44")
        .keyword("RW", std::string(1, '\0'))
        .end();
    decode(stream);

    EXPECT_STREQ(g_productId, "Product Identifier:Vexlan 16Gb Dual-Port HBA");
    EXPECT_STREQ(g_RTag, "VPD-R Tag:");
    EXPECT_STREQ(g_partNumber, "Part Number:VXF1622-01");
    EXPECT_STREQ(g_serialNumber, "Serial Number:VXA1631K0042");
    EXPECT_STREQ(g_manufacturingId, "Manufacturing Id:7E5A");
    EXPECT_STREQ(g_miscInfo, "Miscellaneous Information:PCIe Gen3 x8");
    EXPECT_STREQ(g_efiVersion, "EFI Driver Version:7.00");
    EXPECT_STREQ(g_fwVersion, "Firmware Version:8.08.204");
    EXPECT_STREQ(g_biosVersion, "BIOS Version:3.64");
    EXPECT_STREQ(g_fcodeVersion, "FCode Version:4.12.03");
    EXPECT_STREQ(g_fruNumberVersion, "Fru Number:VXF1622-FRU");
    EXPECT_STREQ(g_fcCodeVersion, "FC Code:FC16-2P");
    EXPECT_STREQ(g_assetTag, "Asset Tag:IT-ASSET-0417");
    EXPECT_STREQ(g_UUID, "UUID:3f2a9c1e-7d44");
    EXPECT_STREQ(g_endTag, "End Tag:");
    // EC, V2, RV, RW and the writable tag have no buffer; nothing else was
    // written.
    EXPECT_EQ(decode_test::filledVpdBuffers(), 15);
}

TEST_F(VpdWalk, UntrimmedValuesStandAsTheyAreUpToAZeroByte) {
    decode(VpdStream().keyword("PN", " VXF 01 ").keyword("SN", std::string("AB\0CD", 5)).end());
    EXPECT_STREQ(g_partNumber, "Part Number: VXF 01 ");
    EXPECT_STREQ(g_serialNumber, "Serial Number:AB");
}

TEST_F(VpdWalk, FlashImageVersionFromEitherKeywordLaterWins) {
    decode(VpdStream().keyword("V9", "012345").end());
    EXPECT_STREQ(g_flashImageVersion, "Flash Image Version:1.23.45");

    decode(VpdStream().keyword("RM", " 3.64.12 ").keyword("V9", "036601").end());
    EXPECT_STREQ(g_flashImageVersion, "Flash Image Version:3.66.1");

    decode(VpdStream().keyword("V9", "036601").keyword("RM", " 3.64.12 ").end());
    EXPECT_STREQ(g_flashImageVersion, "Flash Image Version:3.64.12");

    // Digits that can't be read leave the numbers at 0.
    decode(VpdStream().keyword("V9", " ab").end());
    EXPECT_STREQ(g_flashImageVersion, "Flash Image Version:0.0.0");
    decode(VpdStream().keyword("V9", "0702").end());
    EXPECT_STREQ(g_flashImageVersion, "Flash Image Version:7.2.0");
}

TEST_F(VpdWalk, ZeroFillerMovesThreeBytes) {
    // Were the filler one byte long, "SN" would be read as a keyword.
    decode(VpdStream().raw({0x00, 'S', 'N'}).keyword("PN", "AB").raw({0x00, 0x00, 0x00}).end());
    EXPECT_STREQ(g_partNumber, "Part Number:AB");
    EXPECT_STREQ(g_serialNumber, "");
    EXPECT_STREQ(g_endTag, "End Tag:");
}

TEST_F(VpdWalk, EndTagFirstAndUnknownKeywords) {
    decode(VpdStream().end().keyword("PN", "never"));
    EXPECT_STREQ(g_endTag, "End Tag:");
    EXPECT_EQ(decode_test::filledVpdBuffers(), 1);

    decode_test::clearVpdBuffers();
    decode(VpdStream().keyword("ZZ", "skip").keyword("pn", "lower").keyword("PN", "ok").end());
    EXPECT_STREQ(g_partNumber, "Part Number:ok");
    EXPECT_EQ(decode_test::filledVpdBuffers(), 2);
}

TEST_F(VpdWalk, StreamWithoutEndTagStopsAtTheBufferEnd) {
    decode(VpdStream().identifier("HBA").readOnly().keyword("PN", "VXF").keyword("SN", "S9"));
    EXPECT_STREQ(g_productId, "Product Identifier:HBA");
    EXPECT_STREQ(g_partNumber, "Part Number:VXF");
    EXPECT_STREQ(g_serialNumber, "Serial Number:S9");
    EXPECT_STREQ(g_endTag, "");

    // Fillers and section tags up to the very end.
    decode(VpdStream().keyword("FN", "F").raw({0x00, 0x00}));
    decode(VpdStream().keyword("FN", "F").raw({0x90}));
    EXPECT_STREQ(g_fruNumberVersion, "Fru Number:F");
    EXPECT_STREQ(g_endTag, "");
}

TEST_F(VpdWalk, KeywordRunningPastTheBufferIsCutThere) {
    decode(VpdStream().keyword("PN", "ok").keywordWithLength("SN", "ABC", 200));
    EXPECT_STREQ(g_partNumber, "Part Number:ok");
    EXPECT_STREQ(g_serialNumber, "Serial Number:ABC");

    decode(VpdStream().keywordWithLength("V3", " 9.1 ", 250));
    EXPECT_STREQ(g_fwVersion, "Firmware Version:9.1");

    decode(VpdStream().identifierWithLength("Vexlan", 0xFFFF));
    EXPECT_STREQ(g_productId, "Product Identifier:Vexlan");

    // A header cut by the end: nothing more is decoded.
    decode_test::clearVpdBuffers();
    decode(VpdStream().keyword("MN", "M").raw({'S', 'N'}));
    decode(VpdStream().keyword("MN", "M").raw({0x82, 0x05}));
    EXPECT_STREQ(g_manufacturingId, "Manufacturing Id:M");
    EXPECT_EQ(decode_test::filledVpdBuffers(), 1);
}

TEST_F(VpdWalk, LongValuesAreCutToTheLine) {
    std::string big(3000, 'x');
    decode(VpdStream().identifier(big).end());
    EXPECT_EQ(std::strlen(g_productId), kVpdLineSize - 1);
    EXPECT_EQ(std::string(g_productId, 19), "Product Identifier:");
    EXPECT_STREQ(g_endTag, "End Tag:");

    std::string longest(255, 'v');
    decode(VpdStream().keyword("V4", longest).keyword("YU", longest).end());
    EXPECT_EQ(std::string(g_biosVersion), "BIOS Version:" + longest);
    EXPECT_EQ(std::string(g_UUID), "UUID:" + longest);
}

TEST_F(VpdWalk, SingleFieldDecodingRefusesBadLengths) {
    unsigned char const pn[] = {'P', 'N'};
    unsigned char const value[] = {'A', 'B', 'C', 'D'};
    PrintVPDField(pn, value, -5);
    EXPECT_STREQ(g_partNumber, "Part Number:");
    PrintVPDField(pn, nullptr, 4);
    EXPECT_STREQ(g_partNumber, "Part Number:");
    PrintVPDField(pn, value, 2);
    EXPECT_STREQ(g_partNumber, "Part Number:AB");

    unsigned char const rv[] = {'R', 'V'};
    PrintVPDField(rv, value, 0);
    PrintVPDField(nullptr, value, 1);
    PrintVPD(nullptr, 10);
    EXPECT_EQ(decode_test::filledVpdBuffers(), 1);
}

class OptionRom : public ::testing::Test {
protected:
    void SetUp() override { decode_test::clearVpdBuffers(); }

    static _tagZORAPSDMDevice device(char const* chip, std::uint32_t mask) {
        _tagZORAPSDMDevice d = decode_test::deviceOfChip(chip);
        std::strcpy(d.biosVersionText, " 3.64\x01");
        d.optionRomMask = mask;
        d.firmwareVersion[0] = 8;
        d.firmwareVersion[1] = 8;
        d.firmwareVersion[2] = 4;
        d.efiVersion[0] = 7;
        d.efiVersion[1] = 1;
        d.fcodeVersion[0] = 4;
        d.fcodeVersion[1] = 12;
        d.fcodeVersion[2] = 3;
        return d;
    }
};

TEST_F(OptionRom, OlderChipsShowThreePartFCodeOldestNothing) {
    _tagZORAPSDMDevice oldest = device("RSX-241", 7);
    GetHBAOptionROMVersions(&oldest);
    GetHBAOptionROMVersions(nullptr);
    EXPECT_EQ(decode_test::filledVpdBuffers(), 0);

    _tagZORAPSDMDevice d = device("RSX-250", 7);
    GetHBAOptionROMVersions(&d);
    EXPECT_STREQ(g_optionROMBIOS, "OptionROM BIOS Version:3.64");  // the numbers: the test after the next
}

TEST_F(OptionRom, NewerChipsShowTwoPartFCodeAndAbsentVersionsNA) {
    _tagZORAPSDMDevice d = device("RSX-1620", ZORAP_OPTROM_FCODE);
    GetHBAOptionROMVersions(&d);
    EXPECT_STREQ(g_optionROMFCode, "OptionROM FCode Version:4.12");
    EXPECT_STREQ(g_optionROMEFI, "OptionROM EFI Version:N/A");
    EXPECT_STREQ(g_optionROMFirmware, "OptionROM Firmware Version:N/A");

    _tagZORAPSDMDevice none = device("RSX-460", 0);
    std::memset(none.biosVersionText, 0, sizeof none.biosVersionText);
    GetHBAOptionROMVersions(&none);
    EXPECT_STREQ(g_optionROMBIOS, "OptionROM BIOS Version:");
    EXPECT_STREQ(g_optionROMFCode, "OptionROM FCode Version:N/A");
    EXPECT_STREQ(g_optionROMEFI, "OptionROM EFI Version:N/A");
    EXPECT_STREQ(g_optionROMFirmware, "OptionROM Firmware Version:N/A");

    // Unknown chips count as newest; a BIOS text filling its whole field is
    // read to the field's end only.
    _tagZORAPSDMDevice unknown = device("no such chip", ZORAP_OPTROM_FCODE | ZORAP_OPTROM_EFI);
    std::memset(unknown.biosVersionText, 'B', sizeof unknown.biosVersionText);
    GetHBAOptionROMVersions(&unknown);
    EXPECT_EQ(std::string(g_optionROMBIOS),
              "OptionROM BIOS Version:" + std::string(sizeof unknown.biosVersionText, 'B'));
    EXPECT_STREQ(g_optionROMFCode, "OptionROM FCode Version:4.12");
    EXPECT_STREQ(g_optionROMEFI, "OptionROM EFI Version:7.01");
}

}  // namespace

// Every byte value prints as "%d" first and "%02d" after, in all three lines.
TEST_F(OptionRom, VersionBytesPrintAsTheirDecimalFormsForEveryValue) {
    for (unsigned v = 0; v < 256; ++v) {
        _tagZORAPSDMDevice d = device("RSX-250", 7);
        const std::uint8_t b = static_cast<std::uint8_t>(v);
        d.firmwareVersion[0] = b;
        d.firmwareVersion[1] = b;
        d.firmwareVersion[2] = static_cast<std::uint8_t>(255 - v);
        d.efiVersion[0] = static_cast<std::uint8_t>(255 - v);
        d.efiVersion[1] = b;
        d.fcodeVersion[0] = b;
        d.fcodeVersion[1] = static_cast<std::uint8_t>(v / 3);
        d.fcodeVersion[2] = b;
        GetHBAOptionROMVersions(&d);
        char expected[96];
        std::snprintf(expected, sizeof expected, "OptionROM Firmware Version:%d.%02d.%02d", v, v, 255 - v);
        EXPECT_STREQ(g_optionROMFirmware, expected);
        std::snprintf(expected, sizeof expected, "OptionROM EFI Version:%d.%02d", 255 - v, v);
        EXPECT_STREQ(g_optionROMEFI, expected);
        std::snprintf(expected, sizeof expected, "OptionROM FCode Version:%d.%02d.%02d", v, v / 3, v);
        EXPECT_STREQ(g_optionROMFCode, expected);
    }
}

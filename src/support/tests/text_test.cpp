// Text, number and address conversions.
#include "support/Vexlan_NIC_Utils.h"

#include <gtest/gtest.h>

#include <unistd.h>

#include <climits>
#include <cstring>
#include <string>
#include <thread>

namespace {

std::string trimmed(void (*trim)(char*), std::string text) {
    std::vector<char> buffer(text.begin(), text.end());
    buffer.push_back('\0');
    trim(buffer.data());
    return buffer.data();
}

TEST(TextTrim, CutsBlanksAndTabsOnly) {
    EXPECT_EQ(trimmed(Trim, " \t value  with inner  \t "), "value  with inner");
    EXPECT_EQ(trimmed(Trim, "   \t  "), "");
    EXPECT_EQ(trimmed(Trim, ""), "");
    EXPECT_EQ(trimmed(Trim, "\nkept\n"), "\nkept\n");
    EXPECT_EQ(trimmed(RTrim, "  both  "), "  both");
    EXPECT_EQ(trimmed(LTrim, "  both  "), "both  ");
    EXPECT_EQ(trimmed(LTrim, "\t\t"), "");
    Trim(nullptr);
    LTrim(nullptr);
    RTrim(nullptr);
}

TEST(TextTrim, LongTextsAreTrimmedWhole) {
    std::string body(5000, 'q');
    EXPECT_EQ(trimmed(Trim, "  " + body + "  "), body);
    EXPECT_EQ(trimmed(LTrim, "\t" + body), body);
}

TEST(TextNumbers, ScanKeepsTheOldValueWhenNothingReads) {
    unsigned int u = 7;
    atou("123", &u);
    EXPECT_EQ(u, 123u);
    atou("  42 rest", &u);
    EXPECT_EQ(u, 42u);
    atou("none", &u);
    EXPECT_EQ(u, 42u);
    atou("", &u);
    EXPECT_EQ(u, 42u);
    atou(nullptr, &u);
    EXPECT_EQ(u, 42u);

    unsigned long long llu = 9;
    atollu("18446744073709551615", &llu);
    EXPECT_EQ(llu, ULLONG_MAX);
    atollu("x1", &llu);
    EXPECT_EQ(llu, ULLONG_MAX);
}

TEST(TextNumbers, PrintFitsTheLargestValues) {
    char text[kLluTextSize];
    llutoa(ULLONG_MAX, text);
    EXPECT_STREQ(text, "18446744073709551615");
    llutoa(0, text);
    EXPECT_STREQ(text, "0");
    char small[kUTextSize];
    utoa(UINT_MAX, small);
    EXPECT_STREQ(small, "4294967295");
}

TEST(TextCopy, SafeStrCpy) {
    char target[8];
    EXPECT_EQ(safeStrCpy(target, "1234567", 8), 7u);
    EXPECT_STREQ(target, "1234567");
    EXPECT_EQ(safeStrCpy(target, "12345678", 8), 7u);  // a source as long as size
    EXPECT_STREQ(target, "1234567");
    EXPECT_EQ(safeStrCpy(target, "", 8), 0u);
    EXPECT_STREQ(target, "");
    std::strcpy(target, "keep");
    EXPECT_EQ(safeStrCpy(target, "abc", 0), 0u);
    EXPECT_EQ(safeStrCpy(nullptr, "abc", 8), 0u);
    EXPECT_EQ(safeStrCpy(target, nullptr, 8), 0u);
    EXPECT_STREQ(target, "keep");
    EXPECT_EQ(safeStrCpy(target, "abc", 1), 0u);
    EXPECT_STREQ(target, "");
}

TEST(TextCopy, CleanStrKeepsPrintableTextAndDropsOneLeadingSpace) {
    char target[64];
    EXPECT_EQ(CleanStr(" 5.03a12\x01\x7f (beta)\t\xff", target, sizeof target), 0);
    EXPECT_STREQ(target, "5.03a12 (beta)\t");
    EXPECT_EQ(CleanStr("  two", target, sizeof target), 0);
    EXPECT_STREQ(target, " two");
    EXPECT_EQ(CleanStr("abcdef", target, 4), 0);
    EXPECT_STREQ(target, "abc");

    std::strcpy(target, "keep");
    EXPECT_EQ(CleanStr("", target, sizeof target), -1);
    EXPECT_EQ(CleanStr(nullptr, target, sizeof target), -1);
    EXPECT_STREQ(target, "keep");
}

TEST(TextVersion, SumOfNumbersOrNA) {
    char text[32] = "1.2.3";
    EXPECT_EQ(getVersion(text), 6);
    EXPECT_STREQ(text, "1.2.3");

    std::strcpy(text, "10 2\t3\n");
    EXPECT_EQ(getVersion(text), 15);

    std::strcpy(text, "v1.2");  // "v1" reads as 0
    EXPECT_EQ(getVersion(text), 2);

    for (char const* none : {"0.0.0", "", " . ", "n.a"}) {
        std::strcpy(text, none);
        EXPECT_EQ(getVersion(text), 0) << none;
        EXPECT_STREQ(text, "N/A") << none;
    }
    EXPECT_EQ(getVersion(nullptr), 0);
}

TEST(TextFile, GetFileSize) {
    char path[] = "/tmp/vexlan_filesize_XXXXXX";
    int fd = mkstemp(path);
    ASSERT_GE(fd, 0);
    ASSERT_EQ(write(fd, "0123456789", 10), 10);
    close(fd);
    EXPECT_EQ(GetFileSize(path), 10u);
    unlink(path);
    EXPECT_EQ(GetFileSize(path), 0u);
    EXPECT_EQ(GetFileSize(nullptr), 0u);
}

TEST(TextAddress, MacAddress) {
    unsigned char const mac[6] = {0x00, 0x1b, 0x2c, 0xa0, 0xff, 0x09};
    char text[kMacTextSize];
    EXPECT_EQ(macaddrToStr(mac, text), text);
    EXPECT_STREQ(text, "001B2CA0FF09");

    // Without a buffer: one of the function's own, per thread.
    char* shared = macaddrToStr(mac, nullptr);
    EXPECT_STREQ(shared, "001B2CA0FF09");
    unsigned char const other[6] = {1, 2, 3, 4, 5, 6};
    std::string fromThread;
    std::thread([&] { fromThread = macaddrToStr(other, nullptr); }).join();
    EXPECT_EQ(fromThread, "010203040506");
    EXPECT_STREQ(shared, "001B2CA0FF09");
    EXPECT_EQ(macaddrToStr(other, nullptr), shared);
    EXPECT_STREQ(shared, "010203040506");
}

TEST(TextAddress, IPv4) {
    unsigned char const address[4] = {192, 168, 0, 255};
    char text[kIPv4TextSize];
    IPv4addToStr(address, text);
    EXPECT_STREQ(text, "192.168.0.255");
    for (unsigned v = 0; v < 256; ++v) {
        unsigned char const each[4] = {static_cast<unsigned char>(v), 0, static_cast<unsigned char>(255 - v), 7};
        IPv4addToStr(each, text);
        EXPECT_EQ(std::string(text), std::to_string(v) + ".0." + std::to_string(255 - v) + ".7");
    }
}

struct Compact {
    std::vector<unsigned> groups;
    bool full;
    char const* text;
};

TEST(TextAddress, IPv6Compact) {
    Compact const cases[] = {
        {{0, 0, 0, 0, 0, 0, 0, 0}, false, "::"},
        {{0, 0, 0, 0, 0, 0, 0, 0}, true, "::"},
        {{0x2001, 0xdb8, 0, 0, 0, 0, 0, 1}, false, "2001:db8::1"},
        {{0x2001, 0xdb8, 0, 0, 0, 0, 0, 1}, true, "2001:0db8::0001"},
        {{0, 0, 0, 0, 0, 0, 0, 1}, false, "::1"},
        {{0xfe80, 0, 0, 0, 0, 0, 0, 0}, false, "fe80::"},
        {{1, 0, 2, 3, 4, 5, 6, 7}, false, "1::2:3:4:5:6:7"},       // a single zero group too
        {{1, 0, 0, 2, 0, 0, 3, 4}, false, "1::2:0:0:3:4"},         // the first of equal runs
        {{1, 0, 2, 0, 0, 0, 3, 4}, false, "1:0:2::3:4"},           // the longest run
        {{1, 2, 3, 4, 5, 6, 7, 8}, false, "1:2:3:4:5:6:7:8"},
        {{0x100, 0xab, 0xab00, 0xffff, 0x1000, 0x10, 1, 0xa}, false, "100:ab:ab00:ffff:1000:10:1:a"},
        {{0x100, 0xab, 0xab00, 0xffff, 0x1000, 0x10, 1, 0xa}, true,
         "0100:00ab:ab00:ffff:1000:0010:0001:000a"},
    };
    for (Compact const& c : cases) {
        unsigned char address[16];
        for (int i = 0; i < 8; ++i) {
            address[2 * i] = static_cast<unsigned char>(c.groups[i] >> 8);
            address[2 * i + 1] = static_cast<unsigned char>(c.groups[i] & 0xff);
        }
        char text[kIPv6TextSize];
        std::memset(text, '#', sizeof text);
        ipv6addr_build_ipv6_str_compact(address, c.full, text);
        EXPECT_STREQ(text, c.text);
    }
}

TEST(TextAddress, AddressByFamily) {
    unsigned char v4[16] = {10, 1, 2, 3};
    unsigned char v6[16] = {0xfe, 0x80, 0, 0, 0, 0, 0, 0, 0x02, 0x1b, 0, 0, 0, 0, 0, 0x01};
    char text[kIPv6TextSize];

    std::memset(text, '#', sizeof text);
    nicadapter_IPaddToStr(v4, text, 4);
    EXPECT_STREQ(text, "10.1.2.3");
    nicadapter_IPaddToStr(v6, text, 6);
    EXPECT_STREQ(text, "fe80::21b:0:0:1");
    nicadapter_IPaddToStr(v4, text, 6);
    EXPECT_STREQ(text, "a01:203::");

    // Unknown family: an IPv4 address when bytes 4 to 15 are zero.
    nicadapter_IPaddToStr(v4, text, 0);
    EXPECT_STREQ(text, "10.1.2.3");
    nicadapter_IPaddToStr(v6, text, 0);
    EXPECT_STREQ(text, "fe80::21b:0:0:1");

    std::strcpy(text, "keep");
    nicadapter_IPaddToStr(nullptr, text, 4);
    EXPECT_STREQ(text, "keep");
}

TEST(TextAddress, AddressRecord) {
    unsigned char record[24] = {172, 16, 5, 9};
    record[16] = 1;
    EXPECT_STREQ(nicadapter_IPToStr(record), "172.16.5.9");

    unsigned char record6[24] = {0x20, 0x01, 0x0d, 0xb8};
    record6[15] = 0x42;
    record6[16] = 2;
    EXPECT_STREQ(nicadapter_IPToStr(record6), "2001:db8::42");

    record[16] = 3;
    EXPECT_STREQ(nicadapter_IPToStr(record), "");
    record[16] = 0;
    EXPECT_STREQ(nicadapter_IPToStr(record), "");
    EXPECT_STREQ(nicadapter_IPToStr(nullptr), "");
}

}  // namespace

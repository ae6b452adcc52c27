// The contract's records and byte streams, decoded back field by field.
#include <arpa/inet.h>

#include <cstdio>
#include <map>

#include "sim_fixture.h"
#include "zorap_chip_ids.h"

using namespace zorap_test;

namespace {

// The VPD walk of the chip decoder: tag 0x82 with a 16-bit length, 0x90/0x91
// without body, 0 fillers of three bytes, keywords with a one-byte length,
// 0x78 end.  Bounded by the buffer, unlike the original walk.
struct VpdItem {
    std::string tag;
    std::string value;
};
std::vector<VpdItem> walkVpd(const uint8_t* v, size_t size, bool* ended) {
    std::vector<VpdItem> out;
    size_t p = 0;
    *ended = false;
    while (p < size) {
        uint8_t t = v[p];
        if (t == 0x78) {
            *ended = true;
            break;
        }
        if (t == 0x90 || t == 0x91) {
            out.push_back({t == 0x90 ? "R" : "W", ""});
            p += 3;
        } else if (t == 0) {
            p += 3;
        } else {
            if (p + 3 > size) break;
            size_t len = t == 0x82 ? (v[p + 1] | (v[p + 2] << 8)) : v[p + 2];
            if (p + 3 + len > size) break;
            out.push_back({t == 0x82 ? "ID" : text(v + p, 2), text(v + p + 3, len)});
            p += 3 + len;
        }
    }
    return out;
}

std::string padded(const uint8_t* page, size_t at, size_t n) { return text(page + at, n); }

}  // namespace

// Every field of the tree as kept in tests/fixtures/trees/sim-host.txt, and
// the two records whose first field a reader takes by the record's address.
TEST_F(SimTest, TreeCarriesEveryFieldOfTheDescription) {
    expectTreeAsKept("sim-host");
    auto list = adapters();
    ASSERT_EQ(4u, list.size());
    EXPECT_STREQ("SERIAL-A", reinterpret_cast<const char*>(list[0]));  // serial at the start
    ASSERT_NE(nullptr, list[3]->phyPortList);
    EXPECT_EQ(4, *reinterpret_cast<uint8_t*>(list[3]->phyPortList->firstPhyPort));
    const _tagZORAPSDMDevice* d = device(0, 0);
    EXPECT_EQ(25, zorap_chip_code_for_device_id(d->pciDeviceId));
    EXPECT_EQ(ZORAP_MEZZ_16G, zorap_mezz_kind_for(d->subsystemVendorId, d->subsystemDeviceId));
}

TEST_F(SimTest, VpdStreamWalksBackToTheKeywordsInOrder) {
    uint8_t buf[ZORAP_VPD_BUFFER_SIZE] = {0};
    uint32_t size = sizeof buf;
    ASSERT_EQ(ZORAP_OK, ZORAP_GetVpd(device(0, 0)->deviceHandle, 0, buf, &size));
    bool ended = false;
    auto items = walkVpd(buf, size, &ended);
    EXPECT_TRUE(ended);
    EXPECT_EQ(0x78, buf[size - 1]);
    std::vector<std::string> order;
    std::map<std::string, std::string> values;
    for (auto& i : items) {
        order.push_back(i.tag);
        values[i.tag] = i.value;
    }
    EXPECT_EQ((std::vector<std::string>{"ID", "R", "PN", "SN", "RM", "V9", "RV", "W", "YA", "YU", "RW"}), order);
    EXPECT_EQ("Test HBA", values["ID"]);
    EXPECT_EQ("RM-VALUE", values["RM"]);
    EXPECT_EQ("012345", values["V9"]);
    EXPECT_EQ("uuid-1", values["YU"]);
    // RV makes the bytes from the start through the checksum sum to zero.
    size_t rv = 0;
    while (!(buf[rv] == 'R' && buf[rv + 1] == 'V')) ++rv;
    unsigned sum = 0;
    for (size_t i = 0; i <= rv + 3; ++i) sum += buf[i];
    EXPECT_EQ(0u, sum & 0xFF);
    // The length of the read-only section covers its keywords and RV.
    size_t ro = 0;
    while (buf[ro] != 0x90) ++ro;
    EXPECT_EQ(rv + 4 - (ro + 3), static_cast<size_t>(buf[ro + 1] | (buf[ro + 2] << 8)));
}

TEST_F(SimTest, VpdRawStreamAndMissingVpdAndSmallBuffer) {
    // A raw stream with a zero filler is given back as written.
    ASSERT_EQ(0, zorap_sim_load_json(R"({"adapters":[{"model":"R","serialNumber":"S","chip":"RSX-880",
        "vpdHex":"82 02 00 41 42 00 00 00 90 00 00 53 4e 02 58 59 78",
        "ports":[{"protocols":[{"type":"fc","nodeWWN":"3000000000000001","portWWN":"3100000000000001"}]}]},
        {"model":"N","serialNumber":"T","chip":"RSX-240",
        "ports":[{"protocols":[{"type":"fc","nodeWWN":"3000000000000002","portWWN":"3100000000000002"}]}]}]})"));
    ASSERT_EQ(ZORAP_OK, ZORAP_UpdateBackupAdapterList());
    ASSERT_EQ(ZORAP_OK, ZORAP_SwapBackupToMainAdapterList());
    uint8_t buf[64] = {0};
    uint32_t size = sizeof buf;
    ASSERT_EQ(ZORAP_OK, ZORAP_GetVpd(device(0, 0)->deviceHandle, 0, buf, &size));
    ASSERT_EQ(17u, size);
    bool ended = false;
    auto items = walkVpd(buf, size, &ended);
    ASSERT_EQ(3u, items.size());
    EXPECT_EQ("AB", items[0].value);
    EXPECT_EQ("R", items[1].tag);
    EXPECT_EQ("XY", items[2].value);

    size = 4;
    EXPECT_EQ(ZORAP_ERR_BUFFER_TOO_SMALL, ZORAP_GetVpd(device(0, 0)->deviceHandle, 0, buf, &size));
    EXPECT_EQ(17u, size);
    size = sizeof buf;
    EXPECT_EQ(ZORAP_ERR_NOT_PRESENT, ZORAP_GetVpd(device(1, 0)->deviceHandle, 0, buf, &size));
    EXPECT_EQ(ZORAP_ERR_NOT_FOUND, ZORAP_GetVpd(0xDEAD, 0, buf, &size));

    // A long raw stream (no end tag) is given back whole, within the size.
    std::string hexText(600, 'a');
    ASSERT_EQ(0, zorap_sim_load_json((R"({"adapters":[{"model":"R","serialNumber":"S","chip":"RSX-880","vpdHex":")" +
                                      hexText + R"(","ports":[{"protocols":[{"type":"fc","nodeWWN":"3000000000000001","portWWN":"3100000000000001"}]}]}]})")
                                         .c_str()));
    ASSERT_EQ(ZORAP_OK, ZORAP_UpdateBackupAdapterList());
    ASSERT_EQ(ZORAP_OK, ZORAP_SwapBackupToMainAdapterList());
    uint8_t big[ZORAP_VPD_BUFFER_SIZE];
    size = sizeof big;
    ASSERT_EQ(ZORAP_OK, ZORAP_GetVpd(device(0, 0)->deviceHandle, 0, big, &size));
    EXPECT_EQ(300u, size);
    EXPECT_EQ(0xaa, big[299]);
}

TEST_F(SimTest, TransceiverPagesHoldBlankPaddedTextAtTheFixedOffsets) {
    uint8_t sfp[ZORAP_SFP_BUFFER_SIZE];
    ASSERT_EQ(ZORAP_OK, ZORAP_GetSFPData(device(0, 0), sfp));
    EXPECT_EQ(0x03, sfp[0]);
    EXPECT_EQ("VEXLAN          ", padded(sfp, 20, 16));
    EXPECT_EQ("VXS-16G         ", padded(sfp, 40, 16));
    EXPECT_EQ("A   ", padded(sfp, 56, 4));
    EXPECT_EQ(850, sfp[60] << 8 | sfp[61]);
    EXPECT_EQ("TSER1           ", padded(sfp, 68, 16));
    EXPECT_EQ("250311  ", padded(sfp, 84, 8));
    unsigned base = 0, ext = 0;
    for (int i = 0; i < 63; ++i) base += sfp[i];
    for (int i = 64; i < 95; ++i) ext += sfp[i];
    EXPECT_EQ(base & 0xFF, sfp[63]);
    EXPECT_EQ(ext & 0xFF, sfp[95]);
    EXPECT_EQ(35, static_cast<int8_t>(sfp[256 + 96]));  // temperature, whole degrees
    EXPECT_EQ(33000, sfp[256 + 98] << 8 | sfp[256 + 99]);  // 3.3 V in 100 uV

    // An empty cage fails; the NIC twin gives the same layout with its length.
    EXPECT_EQ(ZORAP_ERR_NOT_PRESENT, ZORAP_GetSFPData(device(0, 1), sfp));
    uint8_t dmi[ZORAP_DMI_BUFFER_SIZE];
    uint32_t len = sizeof dmi;
    ASSERT_EQ(ZORAP_OK, ZORAP_GetTransceiverDMIData("eth0", &len, dmi));
    EXPECT_EQ(512u, len);
    EXPECT_EQ("TSER2           ", padded(dmi, 68, 16));
    EXPECT_EQ("VXS-10G         ", padded(dmi, 40, 16));
    len = sizeof dmi;
    EXPECT_EQ(ZORAP_ERR_NOT_PRESENT, ZORAP_GetTransceiverDMIData("eth1", &len, dmi));
    len = 100;
    EXPECT_EQ(ZORAP_ERR_BUFFER_TOO_SMALL, ZORAP_GetTransceiverDMIData("eth0", &len, dmi));
    EXPECT_EQ(512u, len);
}

TEST_F(SimTest, MbiStringAndI2cUuidAreAllocatedTexts) {
    char* text = nullptr;
    uint32_t len = 0;
    ASSERT_EQ(ZORAP_OK, ZORAP_GetMBIVersionString(device(0, 0), &text, &len));
    EXPECT_STREQ("V:3.64.02,D:06042025,A:Y,T:M", text);
    EXPECT_EQ(std::strlen(text), len);
    int major = 0, minor = 0, build = 0, month = 0, day = 0, year = 0;
    ASSERT_EQ(6, std::sscanf(text, "V:%d.%02d.%02d,D:%02d%02d%4d,A:Y,T:M", &major, &minor, &build,
                             &month, &day, &year));
    EXPECT_EQ((std::vector<int>{3, 64, 2, 6, 4, 2025}), (std::vector<int>{major, minor, build, month, day, year}));
    EXPECT_EQ(1u, zorap_sim_outstanding_allocations());
    ZORAP_FreeMem(text);
    EXPECT_EQ(0u, zorap_sim_outstanding_allocations());

    ASSERT_EQ(ZORAP_OK, ZORAP_GetUUIDFromI2CVPD(device(0, 0), &text, &len));
    EXPECT_STREQ("i2c-uuid-text", text);
    ZORAP_FreeMem(text);
    EXPECT_EQ(ZORAP_ERR_NOT_PRESENT, ZORAP_GetMBIVersionString(device(1, 0), &text, &len));
    EXPECT_EQ(ZORAP_ERR_NOT_PRESENT, ZORAP_GetUUIDFromI2CVPD(device(1, 0), &text, &len));
    EXPECT_EQ(0u, zorap_sim_outstanding_allocations());
}

TEST_F(SimTest, IpPropertiesDecodeAtTheFixedOffsets) {
    void* record = nullptr;
    ASSERT_EQ(ZORAP_OK, ZORAP_GetIPProperties("eth0", &record));
    const auto* b = static_cast<const uint8_t*>(record);
    auto u32 = [&](size_t at) { uint32_t v; std::memcpy(&v, b + at, 4); return v; };
    auto ptr = [&](size_t at) { const _zorap_ipaddr* p; std::memcpy(&p, b + at, 8); return p; };
    char s[INET6_ADDRSTRLEN];
    ASSERT_EQ(ZORAP_IP_FAMILY_IPV4, b[8 + 16]);
    EXPECT_STREQ("192.168.40.21", inet_ntop(AF_INET, b + 8, s, sizeof s));
    EXPECT_EQ(ZORAP_IP_FAMILY_IPV4, b[32 + 16]);
    EXPECT_STREQ("255.255.255.0", inet_ntop(AF_INET, b + 32, s, sizeof s));
    EXPECT_EQ(2u, u32(104));
    EXPECT_EQ(1u, u32(108));
    EXPECT_EQ(0u, u32(112));
    const _zorap_ipaddr* v6 = ptr(152);
    ASSERT_NE(nullptr, v6);
    EXPECT_EQ(ZORAP_IP_FAMILY_IPV6, v6[0].family);
    EXPECT_STREQ("fe80::1", inet_ntop(AF_INET6, v6[0].address, s, sizeof s));
    EXPECT_EQ(64, v6[0].prefixLength);
    EXPECT_STREQ("2001:db8::21", inet_ntop(AF_INET6, v6[1].address, s, sizeof s));
    ASSERT_NE(nullptr, ptr(160));
    EXPECT_STREQ("192.168.40.2", inet_ntop(AF_INET, ptr(160)[0].address, s, sizeof s));
    EXPECT_EQ(nullptr, ptr(168));
    ZORAP_FreeMem(record);  // one release covers the arrays too
    EXPECT_EQ(0u, zorap_sim_outstanding_allocations());

    // An interface without addresses: family 0, no arrays.
    ASSERT_EQ(ZORAP_OK, ZORAP_GetIPProperties("eth1", &record));
    auto* r = static_cast<_zorap_ip_properties_t*>(record);
    EXPECT_EQ(0, r->ipv4Address.family);
    EXPECT_EQ(0u, r->ipv6AddressCount);
    EXPECT_EQ(nullptr, r->ipv6Addresses);
    ZORAP_FreeMem(record);
    EXPECT_EQ(ZORAP_ERR_NOT_FOUND, ZORAP_GetIPProperties("nosuch", &record));
}

TEST_F(SimTest, FcoeLinkageElementsCarryWwnPortIdAndMac) {
    void* array = nullptr;
    uint32_t count = 0;
    ASSERT_EQ(ZORAP_OK, ZORAP_GetFCoELinkage("eth0", &array, &count));
    ASSERT_EQ(2u, count);
    const auto* e = static_cast<const uint8_t*>(array);
    const uint8_t wwn[8] = {0x31, 0, 0, 0, 0, 0, 0, 0x0b};
    EXPECT_EQ(0, std::memcmp(wwn, e, 8));
    EXPECT_EQ((std::vector<int>{0x0a, 0x1b, 0x2c}), (std::vector<int>{e[48], e[49], e[50]}));
    const uint8_t mac[6] = {2, 0, 0, 0, 0, 0x0b};
    EXPECT_EQ(0, std::memcmp(mac, e + 56, 6));
    EXPECT_EQ(1002, static_cast<const _zorap_fcoe_linkage_t*>(array)->vlanId);
    EXPECT_EQ((std::vector<int>{0x0a, 0x1b, 0x2d}), (std::vector<int>{e[88 + 48], e[88 + 49], e[88 + 50]}));
    ZORAP_FreeMem(array);

    array = reinterpret_cast<void*>(1);
    count = 5;
    ASSERT_EQ(ZORAP_OK, ZORAP_GetFCoELinkage("eth1", &array, &count));
    EXPECT_EQ(nullptr, array);
    EXPECT_EQ(0u, count);
    EXPECT_EQ(0u, zorap_sim_outstanding_allocations());
}

TEST_F(SimTest, LiveStateReachesPortPropertiesLinkPropertiesAndStats) {
    _tagZORAPSDMDevice* d = device(0, 0);
    ASSERT_EQ(0, zorap_sim_set_fc_port_state("31:00:00:00:00:00:00:01", ZORAP_PORT_STATE_LOOPDOWN));
    // The tree is a snapshot; the port property call reads the live state.
    EXPECT_EQ(ZORAP_PORT_STATE_ONLINE, d->portStateCode);
    _zorap_port_property_t local{};
    ASSERT_EQ(ZORAP_OK, ZORAP_GetHbaDevicePortProperty(d->deviceHandle, 0, &local));
    EXPECT_EQ(ZORAP_PORT_STATE_LOOPDOWN, local.portStateCode);
    EXPECT_EQ(0x31, local.portWWN[0]);
    d->portPropertyIndex = 0;
    ASSERT_EQ(ZORAP_OK, ZORAP_GetHbaDevicePortProperty(d->deviceHandle, 0, d->portWWN));
    EXPECT_EQ(ZORAP_PORT_STATE_LOOPDOWN, d->portStateCode);
    EXPECT_EQ(16u, d->portSpeedCode);
    EXPECT_EQ(0u, d->portPropertyIndex);  // the record starts at portWWN

    const uint32_t counters[9] = {1, 2, 3, 4, 5, 6, 7, 8, 9};
    ASSERT_EQ(0, zorap_sim_set_fc_port_stats("3100000000000001", counters));
    ASSERT_EQ(ZORAP_OK, ZORAP_RefreshDeviceStats(d));
    EXPECT_EQ(1u, d->statIoCount);
    EXPECT_EQ(3u, d->statLipCount);
    EXPECT_EQ(8u, d->statInvalidTxWords);
    EXPECT_EQ(9u, d->statCrcErrors);

    _zorap_link_properties_t link{};
    ASSERT_EQ(ZORAP_OK, ZORAP_GetLinkProperties("eth0", &link));
    const auto* words = reinterpret_cast<const uint64_t*>(&link);
    EXPECT_EQ(10000u, words[1]);
    EXPECT_EQ(ZORAP_LINK_UP, words[2]);
    ASSERT_EQ(0, zorap_sim_set_link_state("eth0", ZORAP_LINK_DOWN));
    ASSERT_EQ(ZORAP_OK, ZORAP_GetLinkProperties("eth0", &link));
    EXPECT_EQ(ZORAP_LINK_DOWN, link.linkState);
    EXPECT_EQ(0u, link.linkSpeed);  // no speed while down
    ASSERT_EQ(0, zorap_sim_set_link_state("eth0", ZORAP_LINK_UP));
    ASSERT_EQ(0, zorap_sim_set_link_speed("eth0", 1000));
    ASSERT_EQ(ZORAP_OK, ZORAP_GetLinkProperties("eth0", &link));
    EXPECT_EQ(1000u, link.linkSpeed);

    EXPECT_EQ(-1, zorap_sim_set_link_state("nosuch", 1));
    EXPECT_EQ(-1, zorap_sim_set_fc_port_state("not-a-wwn", 1));
    EXPECT_EQ(ZORAP_ERR_NOT_FOUND, ZORAP_GetLinkProperties("nosuch", &link));
}

TEST_F(SimTest, OsNameHonoursTheBufferSize) {
    char buf[ZORAP_OS_NAME_BUFFER_SIZE];
    uint32_t size = sizeof buf;
    ASSERT_EQ(ZORAP_OK, ZORAP_GetOSName(buf, &size));
    EXPECT_STREQ("TestOS 1.0", buf);
    size = 4;
    EXPECT_EQ(ZORAP_ERR_BUFFER_TOO_SMALL, ZORAP_GetOSName(buf, &size));
    EXPECT_EQ(11u, size);
}

TEST(SimUninitialized, CallsBeforeInitializeFailCleanly) {
    ZORAP_Uninitialize();
    EXPECT_EQ(nullptr, ZORAP_GetAdapterList());
    _zorap_link_properties_t link{};
    EXPECT_EQ(ZORAP_ERR_NOT_INITIALIZED, ZORAP_GetLinkProperties("eth0", &link));
    EXPECT_EQ(ZORAP_ERR_NOT_INITIALIZED, ZORAP_UpdateBackupAdapterList());
    EXPECT_EQ(ZORAP_ERR_NOT_INITIALIZED, ZORAP_SwapBackupToMainAdapterList());
    EXPECT_EQ(ZORAP_ERR_INVALID_PARAMETER, ZORAP_RefreshDeviceStats(nullptr));
    EXPECT_EQ(0, ZORAP_DidConfigChange());
    ZORAP_FreeMem(nullptr);
}

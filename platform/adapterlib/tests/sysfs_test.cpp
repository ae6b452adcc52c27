// The sysfs source: the library reads a host from a sysfs/procfs tree. The
// tree tests/fixtures/sysfs-host holds a dual-port FC HBA (two FC hosts with
// targets and LUNs, a VPD stream), a dual-port NIC without VPD (addresses, a
// transceiver module on one port) and what is no adapter (loopback, a
// bridge, a SATA controller with its disk). Tests that change the tree work
// on a copy of it.
#include <sys/stat.h>

#include <array>
#include <chrono>
#include <condition_variable>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <functional>
#include <map>
#include <mutex>
#include <set>
#include <sstream>
#include <thread>

#include "sim_fixture.h"
#include "zorap_chip_ids.h"

using namespace zorap_test;
namespace fs = std::filesystem;

#ifndef ZORAP_SYSFS_FIXTURE
#error "ZORAP_SYSFS_FIXTURE must name the fake sysfs tree"
#endif

namespace {

const char kHost3Port[] = "31:00:02:7e:5a:16:32:01";

std::string description(const std::string& root) { return "{\"source\": \"sysfs\", \"root\": \"" + root + "\"}"; }

std::string readAll(const fs::path& p) {
    std::ifstream in(p, std::ios::binary);
    std::ostringstream s;
    s << in.rdbuf();
    return s.str();
}

void writeAll(const fs::path& p, const std::string& text) {
    std::ofstream out(p, std::ios::binary | std::ios::trunc);
    out << text;
}

std::string wwnText(const uint8_t* w) {
    char t[24];
    std::snprintf(t, sizeof t, "%02x:%02x:%02x:%02x:%02x:%02x:%02x:%02x", w[0], w[1], w[2], w[3], w[4], w[5], w[6],
                  w[7]);
    return t;
}

std::string macText(const uint8_t* m) { return wwnText(std::array<uint8_t, 8>{m[0], m[1], m[2], m[3], m[4], m[5]}.data()).substr(0, 17); }

std::string ipText(const _zorap_ipaddr& a) {
    char t[16];
    std::string out;
    if (a.family == ZORAP_IP_FAMILY_IPV4) {
        std::snprintf(t, sizeof t, "%u.%u.%u.%u", a.address[0], a.address[1], a.address[2], a.address[3]);
        out = t + std::string("/") + std::to_string(a.prefixLength);
    } else if (a.family == ZORAP_IP_FAMILY_IPV6) {
        for (int i = 0; i < 16; i += 2) {
            std::snprintf(t, sizeof t, "%02x%02x", a.address[i], a.address[i + 1]);
            out += (i ? ":" : "") + std::string(t);
        }
    }
    return out;
}

_zorap_protocol_t* nicNamed(const char* name) {
    for (auto* a : adapters())
        for (auto* q : protocols(a))
            if (q->protocolType == ZORAP_PROTOCOL_NIC && std::strcmp(q->nicPortInfo.interfaceName, name) == 0)
                return q;
    return nullptr;
}

// A library started on a tree: the fixture itself, or a copy to change.
class SysfsTest : public ::testing::Test {
protected:
    void start(const std::string& root) {
        ZORAP_Uninitialize();
        zorap_sim_reset();
        ASSERT_EQ(0, zorap_sim_load_json(description(root).c_str()));
        ASSERT_EQ(ZORAP_OK, ZORAP_Initialize(0, 0));
    }
    // A private copy of the fixture (links copied as links).
    void startOnCopy() {
        char dir[] = "/tmp/zorap-sysfs-XXXXXX";
        ASSERT_NE(nullptr, mkdtemp(dir));
        copy_ = fs::path(dir) / "host";
        fs::copy(ZORAP_SYSFS_FIXTURE, copy_, fs::copy_options::recursive | fs::copy_options::copy_symlinks);
        start(copy_.string());
    }
    void TearDown() override {
        ZORAP_Uninitialize();
        zorap_sim_reset();
        if (!copy_.empty()) fs::remove_all(copy_.parent_path());
    }
    fs::path at(const std::string& relative) const { return copy_ / relative; }
    std::string fc3() const { return "sys/class/fc_host/host3/"; }

    fs::path copy_;
};

}  // namespace

// ---- What the tree shows -------------------------------------------------------

// The tree as kept in tests/fixtures/trees/sysfs-host.txt: one adapter per
// PCI slot (the loopback, the bridge and the SATA controller are none), one
// port per function that carries an FC host or an interface, each record's
// fields as the files give them. Then what the live calls read.
TEST_F(SysfsTest, TheTreeAndTheLiveCallsShowWhatTheFilesHold) {
    start(ZORAP_SYSFS_FIXTURE);
    expectTreeAsKept("sysfs-host");
    char os[ZORAP_OS_NAME_BUFFER_SIZE];
    uint32_t osSize = sizeof os;
    ASSERT_EQ(ZORAP_OK, ZORAP_GetOSName(os, &osSize));
    EXPECT_STREQ("Linux 6.1.0-77-amd64", os);

    _tagZORAPSDMDevice* d = device(0, 0);
    EXPECT_EQ(ZORAP_CHIP_CODE_UNKNOWN, zorap_chip_code_for_device_id(d->pciDeviceId));
    _zorap_port_property_t prop{};
    ASSERT_EQ(ZORAP_OK, ZORAP_GetHbaDevicePortProperty(d->deviceHandle, 0, &prop));
    EXPECT_EQ((1u << 4) | (1u << 8) | (1u << 16), prop.supportedSpeedMask);
    EXPECT_EQ(0x0A1B00u, prop.portFcId);
    EXPECT_EQ(kHost3Port, wwnText(prop.portWWN));
    // The VPD is the function's stream as it stands; there is no transceiver
    // page, I2C UUID or flash image version of an FC host.
    std::vector<uint8_t> vpd(ZORAP_VPD_BUFFER_SIZE);
    uint32_t size = ZORAP_VPD_BUFFER_SIZE;
    ASSERT_EQ(ZORAP_OK, ZORAP_GetVpd(device(0, 1)->deviceHandle, 0, vpd.data(), &size));
    EXPECT_EQ(readAll(std::string(ZORAP_SYSFS_FIXTURE) + "/sys/devices/pci0000:00/0000:00:02.0/0000:05:00.0/vpd"),
              text(vpd.data(), size));
    uint8_t sfp[512];
    EXPECT_EQ(ZORAP_ERR_NOT_PRESENT, ZORAP_GetSFPData(d, sfp));
    char* uuid = nullptr;
    EXPECT_EQ(ZORAP_ERR_NOT_PRESENT, ZORAP_GetUUIDFromI2CVPD(d, &uuid, nullptr));
    EXPECT_EQ(ZORAP_ERR_NOT_PRESENT, ZORAP_GetMBIVersionString(d, &uuid, nullptr));

    void* record = nullptr;
    ASSERT_EQ(ZORAP_OK, ZORAP_GetIPProperties("vxnic0", &record));
    auto* ip = static_cast<_zorap_ip_properties_t*>(record);
    EXPECT_EQ("192.0.2.21/24", ipText(ip->ipv4Address));
    EXPECT_EQ("255.255.255.0/0", ipText(ip->subnetMask));
    EXPECT_EQ("192.0.2.255/0", ipText(ip->broadcastAddress));
    EXPECT_EQ("192.0.2.1/0", ipText(ip->defaultGateway));
    ASSERT_EQ(2u, ip->ipv6AddressCount);
    EXPECT_EQ("2001:0db8:0006:0000:0000:0000:0000:0021", ipText(ip->ipv6Addresses[0]));
    EXPECT_EQ(64, ip->ipv6Addresses[0].prefixLength);
    ASSERT_EQ(1u, ip->ipv6GatewayCount);
    EXPECT_EQ("fe80:0000:0000:0000:0000:0000:0000:0001", ipText(ip->ipv6Gateways[0]));
    ZORAP_FreeMem(record);
    uint8_t pages[ZORAP_DMI_BUFFER_SIZE];
    uint32_t length = sizeof pages;
    ASSERT_EQ(ZORAP_OK, ZORAP_GetTransceiverDMIData("vxnic0", &length, pages));
    EXPECT_EQ(512u, length);
    EXPECT_EQ(readAll(std::string(ZORAP_SYSFS_FIXTURE) + "/syscalls/vxnic0/ethtool-module-eeprom"), text(pages, 512));

    // The second port: a smaller network, no gateway, no module, no linkage.
    ASSERT_EQ(ZORAP_OK, ZORAP_GetIPProperties("vxnic1", &record));
    ip = static_cast<_zorap_ip_properties_t*>(record);
    EXPECT_EQ("198.51.100.22/25", ipText(ip->ipv4Address));
    EXPECT_EQ("255.255.255.128/0", ipText(ip->subnetMask));
    EXPECT_EQ(0, ip->defaultGateway.family);
    EXPECT_EQ(1u, ip->ipv6AddressCount);
    ZORAP_FreeMem(record);
    length = sizeof pages;
    EXPECT_EQ(ZORAP_ERR_NOT_PRESENT, ZORAP_GetTransceiverDMIData("vxnic1", &length, pages));
    void* links = nullptr;
    uint32_t count = 9;
    EXPECT_EQ(ZORAP_OK, ZORAP_GetFCoELinkage("vxnic1", &links, &count));
    EXPECT_EQ(0u, count);
}

TEST_F(SysfsTest, FlashWritesAreRefusedAsNotSupported) {
    start(ZORAP_SYSFS_FIXTURE);
    const unsigned char image[] = "image";
    EXPECT_EQ(ZORAP_ERR_NOT_SUPPORTED, ZORAP_UpdateFlash(1, image, 0));
    EXPECT_EQ(ZORAP_ERR_NOT_SUPPORTED, ZORAP_doOptionROMUpdate(device(0, 0), image, 0));
    EXPECT_EQ(0, ZORAP_DidConfigChange());
}

// ---- A changing tree --------------------------------------------------------

// A change of the tree and whether it is a change of configuration: live
// state (link, port state, counters, speed) never is.
struct TreeChange {
    const char* what;
    std::vector<std::pair<const char*, const char*>> writes;  // file, new text ("" removes the path)
    bool configuration;
};

const TreeChange kChanges[] = {
    {"link down", {{"sys/class/net/vxnic0/operstate", "down\n"}, {"sys/class/net/vxnic0/carrier", "0\n"}}, false},
    {"FC port loop down", {{"sys/class/fc_host/host4/port_state", "Linkdown\n"}}, false},
    {"FC counters", {{"sys/class/fc_host/host3/statistics/invalid_crc_count", "0x63\n"}}, false},
    {"link speed", {{"sys/class/net/vxnic0/speed", "10000\n"}}, false},
    {"NIC counters", {{"sys/class/net/vxnic0/statistics/rx_bytes", "1\n"}}, false},
    {"LUN removed", {{"sys/class/scsi_device/3:0:0:1", ""}}, true},
    {"interface gone", {{"sys/class/net/vxnic1", ""}}, true},
    {"FC host gone", {{"sys/class/fc_host/host4", ""}}, true},
    {"NIC driver updated", {{"sys/module/vxlnic/version", "2.1.0\n"}}, true},
    {"address changed", {{"syscalls/vxnic1/getifaddrs", "198.51.100.23/25\n"}}, true},
    {"MTU changed", {{"sys/class/net/vxnic1/mtu", "9000\n"}}, true},
};

TEST_F(SysfsTest, ConfigurationChangesAreToldAndLiveStateIsNot) {
    for (const TreeChange& change : kChanges) {
        SCOPED_TRACE(change.what);
        startOnCopy();
        EXPECT_EQ(0, ZORAP_DidConfigChange());
        for (const auto& w : change.writes) {
            if (*w.second)
                writeAll(at(w.first), w.second);
            else
                fs::remove(at(w.first));
        }
        EXPECT_EQ(change.configuration ? 1 : 0, ZORAP_DidConfigChange());
        TearDown();
        copy_.clear();
    }
}

TEST_F(SysfsTest, LiveCallsReadTheTreeAfreshAndARebuildShowsTheNewConfiguration) {
    startOnCopy();
    writeAll(at("sys/class/net/vxnic1/operstate"), "up\n");
    writeAll(at("sys/class/net/vxnic1/carrier"), "1\n");
    writeAll(at("sys/class/net/vxnic1/speed"), "10000\n");
    _zorap_link_properties_t link{};
    ASSERT_EQ(ZORAP_OK, ZORAP_GetLinkProperties("vxnic1", &link));
    EXPECT_EQ(ZORAP_LINK_UP, link.linkState);
    EXPECT_EQ(10000u, link.linkSpeed);

    _tagZORAPSDMDevice* d = device(0, 0);
    writeAll(at(fc3() + "statistics/invalid_crc_count"), "0x63\n");
    writeAll(at(fc3() + "port_state"), "Offline\n");
    ASSERT_EQ(ZORAP_OK, ZORAP_RefreshDeviceStats(d));
    EXPECT_EQ(0x63u, d->statCrcErrors);
    _zorap_port_property_t prop{};
    ASSERT_EQ(ZORAP_OK, ZORAP_GetHbaDevicePortProperty(d->deviceHandle, 0, &prop));
    EXPECT_EQ(ZORAP_PORT_STATE_LOOPDOWN, prop.portStateCode);
    EXPECT_EQ(0, ZORAP_DidConfigChange());

    // The LUN goes: a change of configuration, which the next backup build
    // reads; the port keeps its device handle.
    const uint32_t handle = d->deviceHandle;
    fs::remove(at("sys/class/scsi_device/3:0:0:1"));
    EXPECT_EQ(1, ZORAP_DidConfigChange());
    ASSERT_EQ(ZORAP_OK, ZORAP_ResetConfigChange());
    ASSERT_EQ(ZORAP_OK, ZORAP_UpdateBackupAdapterList());
    ASSERT_EQ(ZORAP_OK, ZORAP_SwapBackupToMainAdapterList());
    d = device(0, 0);
    EXPECT_EQ(handle, d->deviceHandle);
    EXPECT_EQ(1u, d->targetList->lunCount);
    EXPECT_EQ(ZORAP_PORT_STATE_LOOPDOWN, d->portStateCode);
    EXPECT_EQ(0, ZORAP_DidConfigChange());

    // A port whose FC host is gone answers no more.
    fs::remove(at("sys/class/fc_host/host4"));
    EXPECT_EQ(ZORAP_ERR_NOT_FOUND, ZORAP_GetHbaDevicePortProperty(device(0, 1)->deviceHandle, 0, &prop));
    fs::remove(at("sys/class/net/vxnic1"));
    EXPECT_EQ(ZORAP_ERR_NOT_FOUND, ZORAP_GetLinkProperties("vxnic1", &link));
}

// ---- Files that can't be trusted --------------------------------------------

// A file of the tree made odd, and what the library makes of it.
struct OddFile {
    const char* what;
    std::string file;
    std::string content;  // for Content only
    enum Kind { Content, Fifo, DevZeroLink, Directory } kind;
    std::function<void(_tagZORAPSDMDevice*)> check;  // the first FC device
};

TEST_F(SysfsTest, MissingEmptyHugeOrOddFilesGiveDefaultsAndNeverHang) {
    using K = OddFile::Kind;
    const std::string fn0 = "sys/devices/pci0000:00/0000:00:02.0/0000:05:00.0/";
    auto vpdAbsent = [](_tagZORAPSDMDevice* d) {
        uint8_t vpd[ZORAP_VPD_BUFFER_SIZE];
        uint32_t size = sizeof vpd;
        EXPECT_EQ(ZORAP_ERR_NOT_PRESENT, ZORAP_GetVpd(d->deviceHandle, 0, vpd, &size));
        EXPECT_STREQ("VXA2503K0117", d->deviceSerial);  // the FC host's serial
    };
    const OddFile odd[] = {
        {"empty vendor", fn0 + "vendor", "", K::Content, [](auto* d) { EXPECT_EQ(0, d->pciVendorId); }},
        {"huge model", "sys/class/fc_host/host3/model", std::string(1 << 20, 'M'), K::Content,
         [](auto* d) { EXPECT_STREQ("VXF1632-2", d->modelName); }},  // the VPD's PN
        {"bad node name", "sys/class/fc_host/host3/node_name", "0xnot-a-wwn\n", K::Content,
         [](auto* d) { EXPECT_EQ(std::string(8, '\0'), text(d->nodeWWN, 8)); }},
        {"unknown port state", "sys/class/fc_host/host3/port_state", "Sleeping\n", K::Content,
         [](auto* d) { EXPECT_EQ(0, d->portStateCode); }},
        {"FIFO port type", "sys/class/fc_host/host3/port_type", "", K::Fifo,
         [](auto* d) { EXPECT_EQ(0, d->portTypeCode); }},
        {"/dev/zero link as port state", "sys/class/fc_host/host3/port_state", "", K::DevZeroLink,
         [](auto* d) { EXPECT_EQ(0, d->portStateCode); }},
        {"directory as speed", "sys/class/fc_host/host3/speed", "", K::Directory,
         [](auto* d) { EXPECT_EQ(0u, d->portSpeedCode); }},
        {"FIFO as VPD", fn0 + "vpd", "", K::Fifo, vpdAbsent},
        {"/dev/zero link as VPD", fn0 + "vpd", "", K::DevZeroLink, vpdAbsent},
        {"speed without code", "sys/class/fc_host/host3/speed", "128 Gbit\n", K::Content,
         [](auto* d) { EXPECT_EQ(0u, d->portSpeedCode); }},
        {"overflowing counter", "sys/class/fc_host/host3/statistics/lip_count", "0x1234567890abcdef0\n", K::Content,
         [](auto* d) { EXPECT_EQ(0u, d->statLipCount); }},
        {"negative MTU", "sys/class/net/vxnic0/mtu", "-5\n", K::Content,
         [](auto*) { EXPECT_EQ(1500u, nicNamed("vxnic0")->nicPortInfo.maxTransmissionUnit); }},
        {"octal-looking speed", "sys/class/net/vxnic0/speed", "010\n", K::Content,
         [](auto*) { EXPECT_EQ(10u, nicNamed("vxnic0")->nicPortInfo.linkProperties.linkSpeed); }},
        {"VPD without end tag", fn0 + "vpd", std::string("\x82\x03\x00" "ABC\x90\x05\x00" "SN\x02" "XY", 13),
         K::Content, vpdAbsent},
        {"VPD of erased flash", fn0 + "vpd", std::string(64, '\xff'), K::Content, vpdAbsent},
        {"MAC of another length", "sys/class/net/vxnic1/address", "80:00:02:08:fe:80:00:00:00:00:00:00\n", K::Content,
         [](auto*) {
             EXPECT_EQ(nullptr, nicNamed("vxnic1"));
             EXPECT_NE(nullptr, nicNamed("vxnic0"));
         }},
        {"NUL and control bytes in a text", "sys/class/fc_host/host3/serial_number", std::string("AB\x01" "C\0D\n", 6),
         K::Content, [&](auto*) {
             ZORAP_Uninitialize();
             fs::remove(fs::canonical(at(fn0 + "vpd")));  // else the VPD's serial is used
             ASSERT_EQ(ZORAP_OK, ZORAP_Initialize(0, 0));
             EXPECT_STREQ("AB?C", device(0, 0)->deviceSerial);
         }},
    };
    for (const OddFile& o : odd) {
        SCOPED_TRACE(o.what);
        startOnCopy();
        fs::path real = fs::canonical(at(o.file));
        fs::remove(real);
        // The alarm thread may look first (once a second): standard error
        // is taken from before the entry is planted.
        ::testing::internal::CaptureStderr();
        switch (o.kind) {
            case K::Fifo: ASSERT_EQ(0, mkfifo(real.c_str(), 0600)); break;
            case K::DevZeroLink: fs::create_symlink("/dev/zero", real); break;
            case K::Directory: fs::create_directory(real); break;
            case K::Content: writeAll(real, o.content); break;
        }
        // The backup build reads the tree as a poll does, at once; the build,
        // the live calls of the check or the alarm thread's look name an
        // entry that is no regular file on standard error.
        const auto start = std::chrono::steady_clock::now();
        const ZORAP_STATUS built = ZORAP_UpdateBackupAdapterList();
        EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(1));
        const ZORAP_STATUS swapped = ZORAP_SwapBackupToMainAdapterList();
        const size_t count = adapters().size();
        if (built == ZORAP_OK && swapped == ZORAP_OK && count == 2u) o.check(device(0, 0));
        const std::string err = ::testing::internal::GetCapturedStderr();
        ASSERT_EQ(ZORAP_OK, built);
        ASSERT_EQ(ZORAP_OK, swapped);
        ASSERT_EQ(2u, count);
        if (o.kind != K::Content) {
            // Named by the path the library read (through the tree's links).
            EXPECT_NE(std::string::npos, err.find("libzorap_cna_provider: sysfs file " + copy_.string())) << err;
            EXPECT_NE(std::string::npos, err.find(o.file + ": ")) << err;
            EXPECT_NE(std::string::npos, err.find("not a regular file; not read")) << err;
        }
        TearDown();
        copy_.clear();
    }
}

TEST_F(SysfsTest, LinksOutOfTheTreeAreNotFollowedAndAMissingRootHasNoAdapters) {
    startOnCopy();
    fs::remove(at("sys/class/net/vxnic1"));
    fs::create_directory_symlink("/sys/class/net/lo", at("sys/class/net/vxnic1"));
    fs::remove(at("sys/class/fc_host/host4"));
    fs::create_directory_symlink(fs::canonical(ZORAP_SYSFS_FIXTURE) / "sys/class/fc_host/host4",
                                 at("sys/class/fc_host/host4"));
    ASSERT_EQ(ZORAP_OK, ZORAP_UpdateBackupAdapterList());
    ASSERT_EQ(ZORAP_OK, ZORAP_SwapBackupToMainAdapterList());
    EXPECT_EQ(nullptr, nicNamed("vxnic1"));
    EXPECT_EQ(1u, protocols(adapters().at(0)).size());

    start("/nonexistent/zorap-sysfs-root");
    EXPECT_TRUE(adapters().empty());
    EXPECT_EQ(0, ZORAP_DidConfigChange());
    EXPECT_EQ(-1, zorap_sim_load_json("{\"source\": \"sysfs\", \"root\": \"relative/dir\"}"));
    EXPECT_EQ(-1, zorap_sim_load_json("{\"source\": \"disk\"}"));
    EXPECT_EQ(-1, zorap_sim_load_json("{\"source\": \"sysfs\", \"adapters\": []}"));
}

// ---- Alarms -----------------------------------------------------------------

namespace {

struct Alarms {
    std::mutex mu;
    std::condition_variable cv;
    std::vector<std::tuple<unsigned, int, std::string, std::thread::id>> seen;
};
Alarms* gAlarms = nullptr;

int recordAlarm(unsigned int device, int type, int length, unsigned char* text) {
    std::lock_guard<std::mutex> l(gAlarms->mu);
    gAlarms->seen.emplace_back(device, type, std::string(reinterpret_cast<char*>(text), static_cast<size_t>(length)),
                               std::this_thread::get_id());
    gAlarms->cv.notify_all();
    return 0;
}

class SysfsAlarmTest : public SysfsTest {
protected:
    void SetUp() override {
        gAlarms = &alarms_;
        startOnCopy();
        ASSERT_EQ(ZORAP_OK, ZORAP_RegisterAlarmNotificationCallback(recordAlarm));
    }
    void TearDown() override {
        ZORAP_UnRegisterAlarmNotificationCallback(recordAlarm);
        SysfsTest::TearDown();
        gAlarms = nullptr;
    }
    bool waitForAlarms(size_t n) {
        std::unique_lock<std::mutex> l(alarms_.mu);
        return alarms_.cv.wait_for(l, std::chrono::seconds(5), [&] { return alarms_.seen.size() >= n; });
    }
    size_t alarmCount() {
        zorap_sim_wait_alarms_idle(5000);
        std::lock_guard<std::mutex> l(alarms_.mu);
        return alarms_.seen.size();
    }
    Alarms alarms_;
};

}  // namespace

TEST_F(SysfsAlarmTest, AnFcPortThatChangesStateRaisesAlarmTypeZeroOnTheLibrarysThread) {
    writeAll(at(fc3() + "port_state"), "Linkdown\n");
    ASSERT_TRUE(waitForAlarms(1));  // the alarm thread's look, once a second
    {
        std::lock_guard<std::mutex> l(alarms_.mu);
        EXPECT_EQ(3u, std::get<0>(alarms_.seen[0]));
        EXPECT_EQ(0, std::get<1>(alarms_.seen[0]));
        EXPECT_EQ(std::string("FC port ") + kHost3Port + " state 1 to 3", std::get<2>(alarms_.seen[0]));
        EXPECT_NE(std::this_thread::get_id(), std::get<3>(alarms_.seen[0]));
    }
    // The provider reads the port again in its callback: no second alarm,
    // and no configuration change.
    _zorap_port_property_t prop{};
    ASSERT_EQ(ZORAP_OK, ZORAP_GetHbaDevicePortProperty(device(0, 0)->deviceHandle, 0, &prop));
    EXPECT_EQ(ZORAP_PORT_STATE_LOOPDOWN, prop.portStateCode);
    EXPECT_EQ(0, ZORAP_DidConfigChange());
    EXPECT_EQ(1u, alarmCount());
}

TEST_F(SysfsAlarmTest, AChangeSeenFirstByALiveCallOrABackupBuildStillRaisesOneAlarm) {
    writeAll(at("sys/class/fc_host/host4/port_state"), "Blocked\n");
    _zorap_port_property_t prop{};
    ASSERT_EQ(ZORAP_OK, ZORAP_GetHbaDevicePortProperty(device(0, 1)->deviceHandle, 0, &prop));
    ASSERT_TRUE(waitForAlarms(1));
    writeAll(at("sys/class/fc_host/host4/port_state"), "Online\n");
    ASSERT_EQ(ZORAP_OK, ZORAP_UpdateBackupAdapterList());
    ASSERT_TRUE(waitForAlarms(2));
    EXPECT_EQ(2u, alarmCount());
    std::lock_guard<std::mutex> l(alarms_.mu);
    EXPECT_EQ(4u, std::get<0>(alarms_.seen[1]));
    EXPECT_EQ("FC port 31:00:02:7e:5a:16:32:02 state 2 to 1", std::get<2>(alarms_.seen[1]));
}

// ---- The machine's own /sys -------------------------------------------------

namespace {

// Interfaces with a PCI device as `ip` lists them: name -> MAC. `ip -d`
// names the parent bus and device; a virtio device counts by the PCI
// function under it. Without parent names the device link decides.
bool pciInterfacesOfIpLink(std::map<std::string, std::string>& out, std::string& why) {
    FILE* p = ::popen("ip -d -o link show 2>/dev/null", "r");
    if (!p) return why = "ip can't be run", false;
    std::string all;
    char buffer[4096];
    while (size_t n = std::fread(buffer, 1, sizeof buffer, p)) all.append(buffer, n);
    if (::pclose(p) != 0 || all.empty()) return why = "ip link lists nothing (iproute2 missing?)", false;
    std::istringstream lines(all);
    for (std::string line; std::getline(lines, line);) {
        std::istringstream words(line);
        std::string index, name, word, mac, bus, parent;
        words >> index >> name;
        name = name.substr(0, name.find_first_of("@:"));
        while (words >> word) {
            if (word == "link/ether") words >> mac;
            if (word == "parentbus") words >> bus;
            if (word == "parentdev") words >> parent;
        }
        if (mac.empty()) continue;
        std::error_code ec;
        fs::path device = bus.empty() ? fs::canonical("/sys/class/net/" + name + "/device", ec)
                          : bus == "virtio" ? fs::canonical("/sys/bus/virtio/devices/" + parent, ec).parent_path()
                                            : fs::path(bus == "pci" ? parent : "");
        const std::string fn = device.filename().string();
        if (!ec && fn.size() >= 12 && fn[fn.size() - 2] == '.' && fn[fn.size() - 5] == ':') out[name] = mac;
    }
    return true;
}

}  // namespace

TEST_F(SysfsTest, TheRunningSystemShowsExactlyTheInterfacesWithAPciDeviceThatIpLinkLists) {
    std::error_code ec;
    if (!fs::is_directory("/sys/class/net", ec) || fs::is_empty("/sys/class/net", ec) || ec)
        GTEST_SKIP() << "/sys/class/net is not readable here: no running system's sysfs to compare with";
    std::map<std::string, std::string> expected;
    std::string why;
    if (!pciInterfacesOfIpLink(expected, why)) GTEST_SKIP() << why;

    ZORAP_Uninitialize();
    ASSERT_EQ(0, zorap_sim_load_json("{\"source\": \"sysfs\"}"));
    ASSERT_EQ(ZORAP_OK, ZORAP_Initialize(0, 0));
    std::map<std::string, std::string> found;
    for (auto* a : adapters())
        for (auto* q : protocols(a))
            if (q->protocolType == ZORAP_PROTOCOL_NIC)
                found[q->nicPortInfo.interfaceName] = macText(q->nicPortInfo.macAddress.octet);
    EXPECT_EQ(expected, found) << "no PCI interface at all is a valid answer when ip link agrees";
    EXPECT_EQ(0, ZORAP_DidConfigChange());
}

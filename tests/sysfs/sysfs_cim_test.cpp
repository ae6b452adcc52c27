// The provider, unchanged, over the adapter library's sysfs source: the fake
// sysfs/procfs tree of tests/fixtures/sysfs-host through the shipped provider
// library in a strict embedded CIM host, class by class, and a copy of the
// tree that changes under the running provider. Runs under tests/isolate.sh.
#include <gtest/gtest.h>

#include <stdlib.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <string>
#include <thread>
#include <vector>

#include "provider_env.h"
#include "zorap_cna.h"
#include "zorap_sim_control.h"

using namespace provtest;
using cimhost::Instance;
using cimhost::OpResult;
using cimhost::Type;
using std::chrono::seconds;
namespace fs = std::filesystem;

#ifndef VEXLAN_SYSFS_FIXTURE
#error "VEXLAN_SYSFS_FIXTURE must name the fake sysfs tree"
#endif

namespace {

using Names = std::vector<std::string>;

std::string sysfsDescription(const std::string& root)
{
    return "{\"source\": \"sysfs\", \"root\": \"" + root + "\"}";
}

Names texts(const OpResult& r, const std::string& name)
{
    Names out;
    for (const auto& inst : r.instances)
        out.push_back(propertyText(inst, name));
    return out;
}

// The one element of a one-element array property, as text.
std::string single(const Instance& inst, const std::string& name)
{
    const cimhost::Value* v = inst.property(name);
    if (v == nullptr || !v->array || v->elems.size() != 1)
        return "<not one element>";
    return v->elems[0].type == Type::String ? v->elems[0].s : std::to_string(v->elems[0].u);
}

std::uint64_t u64(const Instance& inst, const std::string& name)
{
    return scalar(inst, name, Type::UInt64).u;
}

}  // namespace

// ---- The fake tree as a client sees it ------------------------------------------

class SysfsFixtureHost : public ProviderSuite<SysfsFixtureHost> {
protected:
    static void SetUpTestSuite()
    {
        static const std::string description = sysfsDescription(VEXLAN_SYSFS_FIXTURE);
        startSuite(kLogsOn, description.c_str(), "Vexlan_FCHBA_FCPort");
    }
};

TEST_F(SysfsFixtureHost, FCPortsShowTheFcHostsOfAnHbaWhoseChipTheTableDoesNotKnow)
{
    OpResult ports = enumerate(host(), "Vexlan_FCHBA_FCPort");
    ASSERT_EQ(texts(ports, "DeviceID"), (Names{"VXA2503K0117_3000027E5A163201_3100027E5A163201",
                                               "VXA2503K0117_3000027E5A163201_3100027E5A163202"}));
    const Instance& p = ports.instances[0];
    EXPECT_EQ(single(p, "OperationalStatus"), "2");  // Online
    EXPECT_EQ(scalar(p, "PortType", Type::UInt16).u, 10u);  // N port
    EXPECT_EQ(u64(p, "Speed"), 17000000000u);  // 16 Gbit
    EXPECT_EQ(u64(p, "MaxSpeed"), 2125000000u);  // an unknown chip (code 100) is neither 4G nor 8G
    EXPECT_EQ(propertyText(p, "PermanentAddress"), "3100027E5A163201");
    EXPECT_EQ(propertyText(p, "VPDData"),
              "Product Identifier:Vexlan VXF1632 Dual Port 16Gb Fibre Channel HBA;Part Number:VXF1632-2;"
              "Serial Number:VXA2503K0117;Fru Number:VXF1632-FRU2;Miscellaneous Information:16Gb 2-port PCIe Gen3 "
              "x8;Manufacturing Id:7E5A;EFI Driver Version:7.10;Firmware Version:12.4.270.8");
    EXPECT_EQ(propertyText(p, "OptionROMVersions"),
              "OptionROM BIOS Version:14.0.499.0;OptionROM EFI Version:N/A;OptionROM FCode Version:N/A;"
              "OptionROM Firmware Version:N/A");
    EXPECT_EQ(propertyText(p, "SpeedDescription"), "See Speed");
    EXPECT_EQ(scalar(p, "DeviceNumber", Type::UInt16).u, 3u);  // host3
    EXPECT_EQ(scalar(p, "DeviceStatus", Type::SInt32).i, 0);
    EXPECT_EQ(propertyText(p, "Model"), "VXF1632");
    EXPECT_EQ(propertyText(p, "ENodeMACAddress"), "Not Available");
    EXPECT_EQ(scalar(ports.instances[1], "DeviceNumber", Type::UInt16).u, 4u);

    OpResult controllers = enumerate(host(), "Vexlan_FCHBA_PortController");
    EXPECT_EQ(texts(controllers, "DeviceID"), Names{"VXA2503K0117"});
    OpResult groups = enumerate(host(), "Vexlan_FCHBA_LogicalPortGroup");
    EXPECT_EQ(texts(groups, "Name"), Names{"3000027E5A163201"});
}

TEST_F(SysfsFixtureHost, StatisticsShowTheFcHostCountersAndExtentsTheLunsBehindItsTargets)
{
    OpResult stats = enumerate(host(), "Vexlan_FCHBA_FCPortStatistics");
    ASSERT_EQ(texts(stats, "InstanceID"),
              (Names{"3000027E5A163201_3100027E5A163201", "3000027E5A163201_3100027E5A163202"}));
    const Instance& s = stats.instances[0];
    const std::vector<std::pair<const char*, std::uint64_t>> counters = {
        {"LIPCount", 2},  {"LinkFailures", 1},
        {"LossOfSyncCounter", 3}, {"LossOfSignalCounter", 0},
        {"PrimitiveSeqProtocolErrCount", 0},  // a counter the driver does not keep
        {"CRCErrors", 7}, {"InvalidTransmissionWords", 5},
        {"IOCount", 820}, {"MegabyteCount", 96}};
    for (const auto& c : counters)
        EXPECT_EQ(u64(s, c.first), c.second) << c.first;

    OpResult extents = enumerate(host(), "Vexlan_FCHBA_StorageExtent");
    ASSERT_EQ(texts(extents, "DeviceID"),
              (Names{"3100027E5A163201_3A00027E5A0A0001_6027E5A0000A0001000000000000000A_0",
                     "3100027E5A163201_3A00027E5A0A0001_5027E5A0000A0002_1",
                     "3100027E5A163202_3A00027E5A0B0001_00000000000000000000000000000000_3"}));
    EXPECT_EQ(texts(extents, "Name"), (Names{"/dev/sdb", "/dev/sdc", ""}));
    EXPECT_EQ(texts(extents, "ProductID"), (Names{"Grid", "Grid", "Tape"}));
    EXPECT_EQ(u64(extents.instances[1], "BlockSize"), 4096u);
    EXPECT_EQ(scalar(extents.instances[2], "LunID", Type::UInt16).u, 3u);
    EXPECT_EQ(propertyText(extents.instances[0], "VendorID"), "NORDARR");
    EXPECT_EQ(propertyText(extents.instances[0], "Revision"), "0421");

    EXPECT_EQ(texts(enumerate(host(), "Vexlan_FCHBA_SCSIProtocolEndpointTarget"), "Name"),
              (Names{"3100027E5A163201_3A00027E5A0A0001", "3100027E5A163202_3A00027E5A0B0001"}));
}

TEST_F(SysfsFixtureHost, PhysicalClassesShowTheTwoBoardsTheirFunctionsAndTheOneModule)
{
    OpResult packages = enumerate(host(), "Vexlan_Adapter_PhysicalPackage");
    ASSERT_EQ(texts(packages, "Tag"), (Names{"VXA2503K0117", "0000:06:00"}));
    const Instance& hba = packages.instances[0];
    EXPECT_EQ(propertyText(hba, "Model"), "VXF1632");
    EXPECT_EQ(propertyText(hba, "PartNumber"), "VXF1632-2");  // VPD PN
    EXPECT_EQ(propertyText(hba, "SKU"), "VXF1632-FRU2");      // VPD FN
    EXPECT_EQ(scalar(hba, "AdapterType", Type::UInt32).u, 0u);
    const Instance& nic = packages.instances[1];
    EXPECT_EQ(propertyText(nic, "Model"), "vxlnic 7e5a:0e12");  // no VPD: driver and PCI IDs
    EXPECT_EQ(propertyText(nic, "PartNumber"), "<absent>");
    EXPECT_EQ(scalar(nic, "AdapterType", Type::UInt32).u, 2u);

    OpResult products = enumerate(host(), "Vexlan_Adapter_Product");
    EXPECT_EQ(texts(products, "Name"), (Names{"Vexlan VXF1632 Dual Port 16Gb Fibre Channel HBA", "vxlnic 7e5a:0e12"}));
    EXPECT_EQ(texts(products, "Version"), (Names{"A3", ""}));

    EXPECT_EQ(texts(enumerate(host(), "Vexlan_Adapter_PhysicalPort"), "Tag"),
              (Names{"VXA2503K0117_0", "VXA2503K0117_1", "0000:06:00_0", "0000:06:00_1"}));
    OpResult connectors = enumerate(host(), "Vexlan_Adapter_PhysicalConnector");
    ASSERT_EQ(texts(connectors, "Tag"), Names{"VXS25K0042_0000:06:00_0"});
    EXPECT_EQ(propertyText(connectors.instances[0], "Manufacturer"), "VEXLAN");
    EXPECT_EQ(propertyText(connectors.instances[0], "PartNumber"), "VXS-25G-SR");
    EXPECT_EQ(scalar(connectors.instances[0], "SFPStatus", Type::UInt16).u, 1u);
}

TEST_F(SysfsFixtureHost, NicClassesShowBothInterfacesWithLinkAndAddresses)
{
    OpResult ports = enumerate(host(), "Vexlan_NIC_EthernetPort2");
    ASSERT_EQ(texts(ports, "DeviceID"), (Names{"027E5A000600", "027E5A000601"}));
    EXPECT_EQ(single(ports.instances[0], "StatusDescriptions"), "Link Up");
    EXPECT_EQ(single(ports.instances[1], "StatusDescriptions"), "Link Down");
    EXPECT_EQ(u64(ports.instances[0], "ActiveMaximumTransmissionUnit"), 9000u);
    EXPECT_EQ(u64(ports.instances[0], "Speed"), 0u);  // 25000 Mbit/s is not the one mapped speed

    OpResult network = enumerate(host(), "Vexlan_NIC_NetworkPort");
    EXPECT_EQ(texts(network, "DeviceID"), (Names{"0000:06:00_0", "0000:06:00_1"}));
    EXPECT_EQ(u64(network.instances[0], "Speed"), 25000u);

    OpResult endpoints = enumerate(host(), "Vexlan_NIC_IPProtocolEndpoint");
    EXPECT_EQ(texts(endpoints, "IPv4Address"), (Names{"192.0.2.21", "198.51.100.22"}));
    EXPECT_EQ(texts(endpoints, "SubnetMask"), (Names{"255.255.255.0", "255.255.255.128"}));
    EXPECT_EQ(texts(endpoints, "IPv6Address"), (Names{"2001:db8:6::21", "fe80::7e:5aff:fe00:601"}));
    EXPECT_EQ(texts(enumerate(host(), "Vexlan_NIC_PortController"), "DeviceID"), Names{"0000:06:00_NIC"});
}

// ---- A tree that changes under the running provider -------------------------------

// The provider polls every round (interval 0) over a private copy of the tree.
class SysfsChangingHost : public ::testing::Test {
protected:
    static void SetUpTestSuite()
    {
        char dir[] = "/var/tmp/sysfs-host-XXXXXX";
        ASSERT_NE(mkdtemp(dir), nullptr);
        root_ = new fs::path(fs::path(dir) / "host");
        fs::copy(VEXLAN_SYSFS_FIXTURE, *root_, fs::copy_options::recursive | fs::copy_options::copy_symlinks);
        writeSettings(kLogsOn, "LinkStatusPollIntervalSeconds=0\n");
        removeLog();
        ASSERT_EQ(0, zorap_sim_load_json(sysfsDescription(root_->string()).c_str()));
        host_ = new cimhost::Host;
        prepareHost(*host_);
        ASSERT_TRUE(host_->enumerateInstanceNames(classPath("Vexlan_FCHBA_StorageExtent")).ok());
        ASSERT_TRUE(waitForLog("Exiting Initialize_CNA_List()", seconds(10)));
    }
    static void TearDownTestSuite()
    {
        delete host_;
        host_ = nullptr;
        fs::remove_all(root_->parent_path());
        delete root_;
        zorap_sim_reset();
    }
    static void write(const std::string& relative, const std::string& text)
    {
        std::ofstream(*root_ / relative, std::ios::trunc) << text;
    }
    // Waits until the provider has asked the library for a change `rounds` more times.
    static bool waitForPolls(unsigned long rounds)
    {
        const unsigned long until = zorap_sim_call_count(ZORAP_FN_DidConfigChange) + rounds;
        for (int i = 0; i < 100; ++i) {
            if (zorap_sim_call_count(ZORAP_FN_DidConfigChange) >= until)
                return true;
            std::this_thread::sleep_for(std::chrono::milliseconds(100));
        }
        return false;
    }
    static inline cimhost::Host* host_ = nullptr;
    static inline fs::path* root_ = nullptr;
};

TEST_F(SysfsChangingHost, ALinkGoingDownIsNoConfigurationChangeButSendsLinkDown)
{
    const int rebuilds = countLog("gNeedRefresh flag is ON");
    const unsigned long backups = zorap_sim_call_count(ZORAP_FN_UpdateBackupAdapterList);
    int filter = 0;
    ASSERT_TRUE(host_->activateFilter("SELECT * FROM Vexlan_NIC_IndicationEthernetPortLinkDown", "root/vexlan_cmpi",
                                      filter)
                    .ok());
    write("sys/class/net/vxnic0/operstate", "down\n");
    write("sys/class/net/vxnic0/carrier", "0\n");
    write("sys/class/fc_host/host3/port_state", "Linkdown\n");

    // The link watch reads the interface afresh and tells the subscriber.
    bool linkDown = false;
    cimhost::Indication ind;
    while (!linkDown && host_->waitIndication(ind, seconds(10)))
        linkDown = ind.instance.className() == "Vexlan_NIC_IndicationEthernetPortLinkDown";
    EXPECT_TRUE(linkDown) << "no LinkDown indication within 10 s";
    EXPECT_TRUE(host_->deactivateFilter(filter).ok());

    ASSERT_TRUE(waitForPolls(3));
    EXPECT_EQ(countLog("gNeedRefresh flag is ON"), rebuilds);
    EXPECT_EQ(zorap_sim_call_count(ZORAP_FN_UpdateBackupAdapterList), backups);

    // What the link watch read for the interface the provider's NIC list
    // holds, and the FC port's live state: both down.
    _zorap_link_properties_t link{};
    ASSERT_EQ(ZORAP_GetLinkProperties("vxnic0", &link), ZORAP_OK);
    EXPECT_EQ(link.linkState, ZORAP_LINK_DOWN);
    _zorap_port_property_t port{};
    _zorap_adapter_list_t* tree = ZORAP_GetAdapterList();
    ASSERT_NE(tree, nullptr);
    const _tagZORAPSDMDevice& host3 = tree->firstAdapter->phyPortList->firstPhyPort->protocolList->firstProtocol->fcDevice;
    ASSERT_EQ(ZORAP_GetHbaDevicePortProperty(host3.deviceHandle, 0, &port), ZORAP_OK);
    EXPECT_EQ(port.portStateCode, ZORAP_PORT_STATE_LOOPDOWN);
    EXPECT_EQ(texts(enumerate(*host_, "Vexlan_FCHBA_StorageExtent"), "Name"), (Names{"/dev/sdb", "/dev/sdc", ""}));
}

TEST_F(SysfsChangingHost, ALunRemovedIsAConfigurationChangeAtTheNextPoll)
{
    const int rebuilds = countLog("After the call to buildFCPortList()");
    write("sys/class/fc_host/host3/port_state", "Linkdown\n");
    fs::remove(*root_ / "sys/class/scsi_device/3:0:0:1");
    ASSERT_TRUE(waitForLog("After the call to buildFCPortList()", seconds(10), rebuilds + 1));
    EXPECT_EQ(texts(enumerate(*host_, "Vexlan_FCHBA_StorageExtent"), "Name"), (Names{"/dev/sdb", ""}));
    // The rebuild read the host again, the port's loop down state with it.
    OpResult ports = enumerate(*host_, "Vexlan_FCHBA_FCPort");
    ASSERT_FALSE(ports.instances.empty());
    EXPECT_EQ(single(ports.instances[0], "OperationalStatus"), "6");
}

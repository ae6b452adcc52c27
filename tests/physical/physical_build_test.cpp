// The builds of the SCSI and physical class lists over adapter descriptions
// written here, the NIC-side look-ups, and the tag texts; linked with the
// adapter library in the same process. No log or fixed path is written.
#include <cstring>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "CmpiProviderBase.h"
#include "classes/Vexlan_Adapter_PhysicalConnector_CMPI.h"
#include "classes/Vexlan_Adapter_PhysicalPackage_CMPI.h"
#include "classes/Vexlan_Adapter_PhysicalPort_CMPI.h"
#include "classes/Vexlan_Adapter_Product_CMPI.h"
#include "classes/Vexlan_FC_SCSIProtocolController_CMPI.h"
#include "classes/Vexlan_FC_SCSIProtocolEndpointHBA_CMPI.h"
#include "classes/Vexlan_FC_SCSIProtocolEndpointTarget_CMPI.h"
#include "classes/Vexlan_FC_StorageExtent_CMPI.h"
#include "fake_broker.h"
#include "inventory/AdapterFunc.h"
#include "inventory/AdapterFunc_VPD.h"
#include "physical_test_support.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "zorap_cna.h"
#include "zorap_sim_control.h"

using fctest::fcAdapter;
using fctest::fcFunction;
using fctest::host;
using fctest::json;
using phystest::nicFunction;
using phystest::port;
using phystest::transceiver;

namespace {

void removeAll()
{
    removeSCSIProtocolControllerList();
    removeSCSIProtocolEndpointHBAList();
    removeSCSIProtocolEndpointTargetList();
    removeStorageExtentList();
    removePhysicalPackageList();
    removeProductList();
    removePhysicalConnectorList();
    removePhysicalPortList();
}

class PhysicalBuild : public ::testing::Test {
protected:
    void SetUp() override
    {
        g_EnableDebugPrint = false;
        g_EnableLogError = false;
        clearVpdBuffers();
    }

    void TearDown() override
    {
        removeAll();
        Clear_CNA_List();
        zorap_sim_reset();
        ZORAP_Uninitialize();
    }

    // Loads the description, starts the library and, as the polling thread
    // does at its first build, fills the NIC adapter list first.
    static void use(const json& description, bool withNicList = true)
    {
        ZORAP_Uninitialize();
        Clear_CNA_List();
        ASSERT_EQ(0, zorap_sim_load_json(description.dump().c_str()));
        ASSERT_EQ(ZORAP_OK, ZORAP_Initialize(0, 0));
        if (withNicList)
            Initialize_CNA_List();
    }

    // The process-wide VPD lines carry over from one build to the next, as
    // they do in the provider; each test starts from empty ones.
    static void clearVpdBuffers()
    {
        for (char* b : {g_productId, g_partNumber, g_serialNumber, g_fruNumberVersion, g_UUID, g_I2CUUID})
            std::memset(b, 0, kVpdLineSize);
    }

    static json adapterWithPorts(const std::string& serial, const std::string& chip, json ports)
    {
        json a = fcAdapter(1, chip, 0, serial);
        a["ports"] = ports;
        return a;
    }
};

// ---- Empty hosts -----------------------------------------------------------------

TEST_F(PhysicalBuild, NoAdaptersLeaveEveryListEmpty)
{
    use(host(json::array()));
    buildSCSIProtocolControllerList();
    buildSCSIProtocolEndpointHBAList();
    buildSCSIProtocolEndpointTargetList();
    buildStorageExtentList();
    buildPhysicalPackageList();
    buildProductList();
    buildPhysicalConnectorList();
    buildPhysicalPortList();
    for (int count : {g_SCSIProtocolControllerList.count, g_SCSIProtocolEndpointHBAList.count,
                      g_SCSIProtocolEndpointTargetList.count, g_StorageExtentList.count, g_PhysicalPackageList.count,
                      g_ProductList.count, g_PhysicalConnectorList.count, g_PhysicalPortList.count})
        EXPECT_EQ(0, count);
    // Without any adapter list: provider.Faults (every library call failing).
}

// ---- PhysicalPackage and Product -----------------------------------------------------

TEST_F(PhysicalBuild, PackageTagSkuAndPartNumberComeFromTheVpdOfTheFirstFunction)
{
    json hba = fcAdapter(1, "RSX-1620", 2, "HBA1");
    hba["vpd"]["YU"] = "uuid-of-hba";
    json cna = fcAdapter(2, "RSX-AB0", 0, "CNA2");
    cna["kind"] = "cna";
    cna["i2cUuid"] = "i2c-uuid-of-cna";
    cna["ports"] = json::array({port(0, json::array({fcFunction(2, 0), nicFunction(1, "eth1")}))});
    use(host(json::array({hba, cna})));

    buildPhysicalPackageList();
    ASSERT_EQ(2, g_PhysicalPackageList.count);
    const PhysicalPackageEntry& a = g_PhysicalPackageList.entries[0];
    EXPECT_STREQ("uuid-of-hba", a.tag);
    EXPECT_STREQ("HBA1", a.serialNumber);
    EXPECT_STREQ("VXT1", a.model);
    EXPECT_STREQ("FRU-1", a.sku);
    EXPECT_STREQ("VXT-1", a.partNumber);
    EXPECT_EQ(0u, a.adapterType);
    EXPECT_EQ(0, a.isCNA);

    // The I2C UUID comes before the VPD's; kind 4 is a CNA of type 3. The NIC
    // function of the same board adds nothing.
    const PhysicalPackageEntry& b = g_PhysicalPackageList.entries[1];
    EXPECT_STREQ("i2c-uuid-of-cna", b.tag);
    EXPECT_STREQ("CNA2", b.serialNumber);
    EXPECT_EQ(3u, b.adapterType);
    EXPECT_EQ(1, b.isCNA);
}

TEST_F(PhysicalBuild, ThreeAdaptersWithOneSerialMakeOnePackageAndThreeProducts)
{
    json adapters = json::array();
    const char* kinds[] = {"fc-hba", "fc-mezzanine", "nic"};
    for (int a = 0; a < 3; ++a) {
        json ad = fcAdapter(a, "RSX-1620", 1, "SAME");
        ad["kind"] = kinds[a];
        ad["productName"] = "Product " + std::to_string(a);
        ad["productVersion"] = "V" + std::to_string(a);
        adapters.push_back(ad);
    }
    use(host(adapters));
    buildPhysicalPackageList();
    buildProductList();
    EXPECT_EQ(1, g_PhysicalPackageList.count);
    ASSERT_EQ(3, g_ProductList.count);
    for (int a = 0; a < 3; ++a) {
        const ProductEntry& p = g_ProductList.entries[a];
        EXPECT_STREQ("SAME", p.identifyingNumber);
        EXPECT_EQ("Product " + std::to_string(a), p.name);
        EXPECT_EQ("V" + std::to_string(a), p.version);
        EXPECT_EQ(static_cast<unsigned>(a), p.adapterType);   // kinds 1, 2, 3 give types 0, 1, 2
    }
}

TEST_F(PhysicalBuild, PackageOfAnOldChipUsesTheLibrarySerialAndLeftoverVpdLines)
{
    json newer = fcAdapter(1, "RSX-1620", 1, "NEW1");
    newer["vpd"]["YU"] = "uuid-new";
    json old = fcAdapter(2, "RSX-250", 1, "OLD2");   // code 6: no VPD
    old["deviceSerial"] = "OLDLIB2";
    use(host(json::array({newer, old})));
    buildPhysicalPackageList();
    ASSERT_EQ(2, g_PhysicalPackageList.count);
    const PhysicalPackageEntry& e = g_PhysicalPackageList.entries[1];
    EXPECT_STREQ("OLDLIB2", e.serialNumber);
    // g_UUID and g_partNumber are not cleared for a device: the newer
    // adapter's lines stand for the old one; its FRU line was cleared.
    EXPECT_STREQ("uuid-new", e.tag);
    EXPECT_STREQ("VXT-1", e.partNumber);
    EXPECT_STREQ("", e.sku);
}

TEST_F(PhysicalBuild, AFailedVpdReadReusesTheSerialBeforeAndTheBuildGoesOn)
{
    // The old chip reads no VPD, so the first VPD read is the second board's.
    json old = fcAdapter(1, "RSX-250", 1, "OLD");
    old["deviceSerial"] = "OLDSER";
    json failing = fcAdapter(2, "RSX-1620", 1, "NEWA");
    json whole = fcAdapter(3, "RSX-1620", 1, "NEWB");
    use(host(json::array({old, failing, whole})));
    ASSERT_EQ(0, zorap_sim_fail(ZORAP_FN_GetVpd, ZORAP_ERR_FAILED, 1));
    buildPhysicalPackageList();
    // The failed board takes the serial before it and so joins that package.
    ASSERT_EQ(2, g_PhysicalPackageList.count);
    EXPECT_STREQ("OLDSER", g_PhysicalPackageList.entries[0].serialNumber);
    EXPECT_STREQ("NEWB", g_PhysicalPackageList.entries[1].serialNumber);
    EXPECT_STREQ("VXT-1", g_PhysicalPackageList.entries[1].partNumber);
    EXPECT_EQ(2u, zorap_sim_call_count(ZORAP_FN_GetVpd));
}

TEST_F(PhysicalBuild, NicOnlyBoardNeedsTheNicAdapterList)
{
    json nic = fcAdapter(5, "RSX-AB0", 0, "NICONLY");
    nic["kind"] = "nic";
    nic["partNumber"] = "NIC-PN";
    nic["vpd"] = {{"PN", "NIC-VPD-PN"}, {"FN", "NIC-FRU"}, {"YU", "nic-uuid"}};
    nic["ports"] = json::array({port(0, json::array({nicFunction(9, "eth9")}))});
    use(host(json::array({nic})));
    buildPhysicalPackageList();
    ASSERT_EQ(1, g_PhysicalPackageList.count);
    const PhysicalPackageEntry& e = g_PhysicalPackageList.entries[0];
    EXPECT_STREQ("nic-uuid", e.tag);
    EXPECT_STREQ("NICONLY", e.serialNumber);
    EXPECT_STREQ("NIC-FRU", e.sku);
    EXPECT_STREQ("NIC-VPD-PN", e.partNumber);
    EXPECT_EQ(2u, e.adapterType);
    EXPECT_EQ(0, findSlot_Nic_PhysicalPackage(m_CNAList));

    // On a refresh the NIC list is empty while the lists are built: the board
    // is missing.
    removePhysicalPackageList();
    Clear_CNA_List();
    buildPhysicalPackageList();
    EXPECT_EQ(0, g_PhysicalPackageList.count);
}

TEST_F(PhysicalBuild, CalcFunctionsTakeTheLastMatchingKeywordOfTheFirstPort)
{
    _CNAStruc cna{};
    std::strcpy(cna.serialNumber, "SER");
    std::strcpy(cna.partNumber, "PN0");
    char out[kPhysicalPackageTextSize];

    // No port: the defaults.
    EXPECT_STREQ("SER", calcTag_PhysicalPackage(&cna, out));
    EXPECT_STREQ("PN0", calcSKU_PhysicalPackage(&cna, out));
    EXPECT_STREQ("PN0", calcPartNumber_PhysicalPackage(&cna, out));

    _CNAPortStruc first{};
    _CNAPortStruc second{};
    first.next = &second;
    cna.portList = &first;
    auto add = [](_CNAPortStruc& p, const char* kw, const char* value) {
        _zorap_vpd_entry_t& e = p.portExtra.vpd[p.portExtra.vpdCount++];
        std::strcpy(e.keyword, kw);
        std::strcpy(e.value, value);
    };
    add(first, "PN", "PN1");
    add(first, "PNX", "not an exact keyword");
    add(first, "YU", "uuid-1");
    add(first, "PN", "PN2");
    add(second, "FN", "second port is not read");
    EXPECT_STREQ("uuid-1", calcTag_PhysicalPackage(&cna, out));
    EXPECT_STREQ("PN0", calcSKU_PhysicalPackage(&cna, out));
    EXPECT_STREQ("PN2", calcPartNumber_PhysicalPackage(&cna, out));

    // A count beyond the record's entries is read no further than the record.
    first.portExtra.vpdCount = 100000;
    EXPECT_STREQ("PN2", calcPartNumber_PhysicalPackage(&cna, out));

    // A value that fills its field without a terminator is cut, not overrun.
    std::memset(first.portExtra.vpd[1].value, 'V', sizeof(first.portExtra.vpd[1].value));
    std::strcpy(first.portExtra.vpd[1].keyword, "FN");
    first.portExtra.vpdCount = 2;
    EXPECT_EQ(std::string(kPhysicalPackageTextSize - 1, 'V'), calcSKU_PhysicalPackage(&cna, out));

    EXPECT_STREQ("", calcTag_PhysicalPackage(nullptr, out));
    EXPECT_EQ(nullptr, calcTag_PhysicalPackage(&cna, nullptr));
    EXPECT_EQ(-1, findSlot_Nic_PhysicalPackage(nullptr));
}

// ---- PhysicalConnector and PhysicalPort ---------------------------------------------

TEST_F(PhysicalBuild, ConnectorsComeFromTransceiversWithASerial)
{
    json a = adapterWithPorts(
        "BOARD", "RSX-1620",
        json::array({port(0, json::array({fcFunction(1, 0)}), transceiver("SFPA", "MAKER", "PART-A")),
                     port(1, json::array({fcFunction(1, 1)})),                               // empty cage
                     port(2, json::array({fcFunction(1, 2)}), transceiver("")),              // blank serial
                     port(3, json::array({fcFunction(1, 3, {{"transceiverState", 2}})}), transceiver("SFPD"))}));
    use(host(json::array({a})));
    buildPhysicalConnectorList();
    buildPhysicalPortList();

    ASSERT_EQ(2, g_PhysicalConnectorList.count);
    const PhysicalConnectorEntry& c = g_PhysicalConnectorList.entries[0];
    EXPECT_STREQ("SFPA_BOARD_0", c.tag);
    EXPECT_STREQ("MAKER", c.sfp.Manufacturer);
    EXPECT_STREQ("PART-A", c.sfp.PartNumber);
    EXPECT_STREQ("SFPA", c.sfp.SerialNumber);
    EXPECT_EQ(1, c.sfp.SFPStatus);
    // The raw pages are the library's 512 bytes: the vendor name at 20..35.
    EXPECT_EQ(0, std::memcmp(c.sfp.RawData + 20, "MAKER", 5));
    // A module state other than 6 on an ordinary board gives status 0.
    EXPECT_STREQ("SFPD_BOARD_3", g_PhysicalConnectorList.entries[1].tag);
    EXPECT_EQ(0, g_PhysicalConnectorList.entries[1].sfp.SFPStatus);

    // Every port is a PhysicalPort, with or without a module.
    ASSERT_EQ(4, g_PhysicalPortList.count);
    for (int i = 0; i < 4; ++i) {
        EXPECT_EQ("BOARD_" + std::to_string(i), g_PhysicalPortList.entries[i].tag);
        EXPECT_EQ(i, g_PhysicalPortList.entries[i].portNumber);
        EXPECT_STREQ("BOARD", g_PhysicalPortList.entries[i].serialNumber);
    }
}

TEST_F(PhysicalBuild, MezzanineBoardsShowAGoodModuleAndCagelessBoardsNone)
{
    json mezz = adapterWithPorts("MEZZ", "RSX-1620",
                                 json::array({port(0, json::array({fcFunction(1, 0, {{"transceiverState", 0}})}),
                                                   transceiver("SFPM"))}));
    mezz["subsystemVendorId"] = "0x7E5A";
    mezz["subsystemDeviceId"] = "0x6101";
    json cageless = adapterWithPorts("NOCAGE", "RSX-1620",
                                     json::array({port(0, json::array({fcFunction(2, 0)}), transceiver("SFPN"))}));
    cageless["transceiverSupport"] = false;
    use(host(json::array({mezz, cageless})));
    buildPhysicalConnectorList();
    ASSERT_EQ(1, g_PhysicalConnectorList.count);
    EXPECT_STREQ("SFPM_MEZZ_0", g_PhysicalConnectorList.entries[0].tag);
    EXPECT_EQ(1, g_PhysicalConnectorList.entries[0].sfp.SFPStatus);
    // Without a cage the module is never asked for.
    EXPECT_EQ(1u, zorap_sim_call_count(ZORAP_FN_GetSFPData));
}

TEST_F(PhysicalBuild, OneModuleSharedByFcAndNicFunctionsIsOneConnector)
{
    json cna = adapterWithPorts(
        "CNA", "RSX-AB0",
        json::array({port(0, json::array({fcFunction(1, 0, {{"type", "fcoe"}}), nicFunction(1, "eth1")}),
                          transceiver("SFPC", "NICMAKER", "NIC-PART")),
                     port(1, json::array({nicFunction(2, "eth2")}), transceiver("SFPN")),
                     port(2, json::array({nicFunction(3, "eth3")}))}));
    cna["kind"] = "cna";
    use(host(json::array({cna})));
    buildPhysicalConnectorList();
    ASSERT_EQ(2, g_PhysicalConnectorList.count);
    EXPECT_STREQ("SFPC_CNA_0", g_PhysicalConnectorList.entries[0].tag);

    // The NIC-only port's connector: texts from the NIC adapter list, no raw
    // data, status 1.
    const PhysicalConnectorEntry& n = g_PhysicalConnectorList.entries[1];
    EXPECT_STREQ("SFPN_CNA_1", n.tag);
    EXPECT_STREQ("VEXLAN", n.sfp.Manufacturer);
    EXPECT_STREQ("SFPN", n.sfp.SerialNumber);
    EXPECT_EQ(1, n.sfp.SFPStatus);
    for (unsigned char byte : n.sfp.RawData)
        ASSERT_EQ(0, byte);

    // The NIC side finds the connectors and ports of its own records.
    ASSERT_NE(nullptr, m_CNAList);
    buildPhysicalPortList();
    _CNAPortStruc* p0 = m_CNAList->portList;
    ASSERT_NE(nullptr, p0);
    _CNAPortStruc* p1 = p0->next;
    ASSERT_NE(nullptr, p1);
    _CNAPortStruc* p2 = p1->next;
    ASSERT_NE(nullptr, p2);
    char tag[kPhysicalTagSize];
    EXPECT_EQ(1, calcTag_PhysicalConnector(m_CNAList, p1, tag));
    EXPECT_STREQ("SFPN_CNA_1", tag);
    EXPECT_EQ(1, findSlot_Nic_PhysicalConnector(m_CNAList, p1));
    EXPECT_EQ(0, findSlot_Nic_PhysicalConnector(m_CNAList, p0));
    EXPECT_EQ(-1, findSlot_Nic_PhysicalConnector(m_CNAList, p2));   // no module
    EXPECT_EQ(1, calcTag_PhysicalPort(m_CNAList, p1, tag));
    EXPECT_STREQ("CNA_1", tag);
    EXPECT_EQ(2, findSlot_Nic_PhysicalPort(m_CNAList, p2));

    // A port the library does not know gives no tag and no slot.
    _CNAPortStruc stranger{};
    stranger.macAddress.octet[0] = 0xEE;
    std::strcpy(tag, "stale");
    EXPECT_EQ(0, calcTag_PhysicalPort(m_CNAList, &stranger, tag));
    EXPECT_STREQ("", tag);
    EXPECT_EQ(-1, findSlot_Nic_PhysicalPort(m_CNAList, &stranger));
    _zorap_adapter_t* adapter = nullptr;
    EXPECT_EQ(0, getZORAPStructs(m_CNAList, &stranger, &adapter, nullptr, nullptr));
    EXPECT_EQ(nullptr, adapter);
    EXPECT_EQ(0, getZORAPStructs(m_CNAList, nullptr, &adapter, nullptr, nullptr));
}

TEST_F(PhysicalBuild, NicOperationsMakeThePortsSlotOrANullHandle)
{
    fake::reset();
    CmpiProviderBase::setBroker(fake::broker());
    json cna = adapterWithPorts(
        "CNA", "RSX-AB0",
        json::array({port(0, json::array({nicFunction(1, "eth1")}), transceiver("SFPN")),
                     port(1, json::array({nicFunction(2, "eth2")}))}));
    cna["kind"] = "cna";
    use(host(json::array({cna})));
    buildPhysicalPackageList();
    buildPhysicalConnectorList();
    buildPhysicalPortList();
    ASSERT_NE(nullptr, m_CNAList);
    _CNAPortStruc* p0 = m_CNAList->portList;
    ASSERT_NE(nullptr, p0);
    _CNAPortStruc* p1 = p0->next;
    ASSERT_NE(nullptr, p1);
    const char* ns = "root/vexlan_cmpi";

    CmpiObjectPath portPath = makePath_Nic_PhysicalPort("Vexlan_Adapter_PhysicalPort", ns, m_CNAList, p1);
    ASSERT_FALSE(portPath.isNull());
    EXPECT_STREQ("CNA_1", static_cast<const char*>(portPath.getKey("Tag")));
    EXPECT_STREQ("Vexlan_Adapter_PhysicalPort", static_cast<const char*>(portPath.getKey("CreationClassName")));

    CmpiInstance connector =
        makeInstance_Nic_PhysicalConnector("Vexlan_Adapter_PhysicalConnector", ns, nullptr, m_CNAList, p0);
    ASSERT_FALSE(connector.isNull());
    EXPECT_STREQ("SFPN_CNA_0", static_cast<const char*>(connector.getProperty("Tag")));
    EXPECT_EQ(1, static_cast<unsigned short>(connector.getProperty("SFPStatus")));

    CmpiInstance package = makeInstance_Nic_PhysicalPackage("Vexlan_Adapter_PhysicalPackage", ns, nullptr, m_CNAList);
    ASSERT_FALSE(package.isNull());
    EXPECT_STREQ("CNA", static_cast<const char*>(package.getProperty("SerialNumber")));
    EXPECT_STREQ("Vexlan CNA Adapter CNA", static_cast<const char*>(package.getProperty("Name")));

    // No slot for the port without a module, nor for no adapter: nothing is built.
    EXPECT_TRUE(makePath_Nic_PhysicalConnector("Vexlan_Adapter_PhysicalConnector", ns, m_CNAList, p1).isNull());
    EXPECT_TRUE(makeInstance_Nic_PhysicalPort("Vexlan_Adapter_PhysicalPort", ns, nullptr, m_CNAList, nullptr).isNull());
    EXPECT_TRUE(makePath_Nic_PhysicalPackage("Vexlan_Adapter_PhysicalPackage", ns, nullptr).isNull());
    fake::reset();
}

// ---- Tag texts ---------------------------------------------------------------------------

// The tags of the recorded connectors and ports, and the getInstance hits of
// physical_cim_test, show both forms made and read back; here the tags that
// are no such form.
TEST(PhysicalTags, ShortTagsAreRefusedAndLongOnesCut)
{
    char tag[kPhysicalTagSize];
    char a[kPhysicalTagPartSize], b[kPhysicalTagPartSize];
    int n = -1;
    // Too few parts.
    char two[] = "A_B";
    char one[] = "A";
    char none[] = "";
    EXPECT_EQ(0, ParsePhysicalConnectorTag(two, a, b, &n));
    EXPECT_EQ(0, ParsePhysicalPortTag(one, a, &n));
    EXPECT_EQ(0, ParsePhysicalPortTag(none, a, &n));
    // A serial with "_" is split wrongly, as tags of this form only are meant.
    char underscored[] = "AB_CD_7";
    EXPECT_EQ(1, ParsePhysicalPortTag(underscored, a, &n));
    EXPECT_STREQ("AB", a);
    EXPECT_EQ(0, n);

    // Long texts are cut to the buffers, never written past them.
    std::string longSerial(400, 'S');
    CreatePhysicalPortTag(tag, &longSerial[0], 1);
    EXPECT_EQ(kPhysicalTagSize - 1, std::strlen(tag));
    std::string longTag = std::string(300, 'X') + "_" + std::string(300, 'Y') + "_5";
    EXPECT_EQ(0, ParsePhysicalConnectorTag(&longTag[0], a, b, &n));   // the 255 characters read hold one part
    EXPECT_EQ(255u, std::strlen(a));
}

}  // namespace

// The private NIC adapter list m_CNAList, built from the adapter library's
// tree with its IP data, FCoE linkage and transceiver fields.
#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "inventory/AdapterFunc.h"
#include "provider_env.h"
#include "zorap_sim_control.h"

namespace {

// One FC-only adapter, then a CNA (instance 5) whose two physical ports carry
// one NIC function each: the first with transceiver, IPv4, IPv6, DNS and FCoE
// linkage; the second without transceiver and with a one-letter interface.
const char kDescription[] = R"({
  "osName": "TestOS 1.0",
  "adapters": [
    {"model": "VXF1622", "serialNumber": "VXA0000001", "chip": "RSX-1620",
     "ports": [{"protocols": [{"type": "fc", "nodeWWN": "30:00:02:7e:5a:16:00:01",
                               "portWWN": "31:00:02:7e:5a:16:00:01"}]}]},
    {"model": "VXC2402", "serialNumber": "VXC0000005", "chip": "RSX-AB0", "instance": 5,
     "partNumber": "VXC2402-01", "versionString": "4.2.1",
     "ports": [
       {"portNumber": 0,
        "transceiver": {"vendor": "VEXLAN", "partNumber": "VXS-10G-SR", "serialNumber": "VXS0001"},
        "protocols": [{"type": "nic", "mac": "02:7e:5a:00:05:00", "interface": "eth10", "portNumber": 0,
                       "ipv4": "192.168.5.10", "netmask": "255.255.255.0",
                       "ipv6": ["fe80::7e:5aff:fe00:500/64", "2001:db8:5::10/64"],
                       "dnsServers": ["192.168.5.1"],
                       "fcoe": [{"portWWN": "31:00:02:7e:5a:24:05:00", "nodeWWN": "30:00:02:7e:5a:24:05:00"}]}]},
       {"portNumber": 1,
        "protocols": [{"type": "nic", "mac": "02:7e:5a:00:05:01", "interface": "e", "portNumber": 1}]}
     ]}
  ]})";

int portCount(const _CNAStruc* cna)
{
    int n = 0;
    for (const _CNAPortStruc* p = cna->portList; p != nullptr; p = p->next)
        ++n;
    return n;
}

class AdapterList : public ::testing::Test {
protected:
    void SetUp() override
    {
        provtest::writeSettings("", "");
        ASSERT_EQ(zorap_sim_load_json(kDescription), 0);
        ASSERT_EQ(ZORAP_Initialize(0, 0), 0u);
        zorap_sim_reset();
    }
    void TearDown() override
    {
        Clear_CNA_List();
        ZORAP_Uninitialize();
        zorap_sim_reset();
    }
};

}  // namespace

TEST_F(AdapterList, HoldsTheNicAdaptersAndPortsWithIpDataLinkageAndTransceiver)
{
    Initialize_CNA_List();
    ASSERT_NE(m_CNAList, nullptr);
    ASSERT_EQ(m_CNAList->next, nullptr) << "the FC-only adapter has no entry";
    const _CNAStruc* cna = m_CNAList;
    EXPECT_EQ(cna->adapterInstance, 5u);
    EXPECT_STREQ(cna->serialNumber, "VXC0000005");
    EXPECT_STREQ(cna->modelName, "VXC2402");
    EXPECT_STREQ(cna->partNumber, "VXC2402-01");
    EXPECT_STREQ(cna->versionString, "4.2.1");
    ASSERT_EQ(portCount(cna), 2);

    const _CNAPortStruc* first = cna->portList;
    EXPECT_STREQ(first->interfaceName, "eth10");
    EXPECT_EQ(first->macAddress.octet[5], 0x00);
    EXPECT_EQ(first->portNumber, 0u);
    EXPECT_TRUE(first->hasTransceiver);
    EXPECT_STREQ(first->sfpFields.Manufacturer, "VEXLAN");
    EXPECT_STREQ(first->sfpFields.PartNumber, "VXS-10G-SR");
    EXPECT_STREQ(first->sfpFields.SerialNumber, "VXS0001");
    const unsigned char ipv4[4] = {192, 168, 5, 10};
    EXPECT_EQ(std::memcmp(first->ipProperties.ipv4Address.address, ipv4, 4), 0);
    ASSERT_EQ(first->ipProperties.ipv6AddressCount, 2u);
    ASSERT_NE(first->ipProperties.ipv6Addresses, nullptr);
    EXPECT_EQ(first->ipProperties.ipv6Addresses[1].family, ZORAP_IP_FAMILY_IPV6);
    EXPECT_EQ(first->ipProperties.ipv6Addresses[1].address[0], 0x20);
    ASSERT_EQ(first->ipProperties.dnsServerCount, 1u);
    ASSERT_NE(first->ipProperties.dnsServers, nullptr);
    EXPECT_EQ(first->ipProperties.dnsServers[0].address[3], 1);
    EXPECT_EQ(first->ipProperties.ipv6Gateways, nullptr);
    ASSERT_EQ(first->fcoeLinkageCount, 1u);
    ASSERT_NE(first->fcoeLinkage, nullptr);
    EXPECT_EQ(first->fcoeLinkage[0].portWWN[7], 0x00);
    EXPECT_EQ(first->fcoeLinkage[0].portWWN[0], 0x31);

    const _CNAPortStruc* second = first->next;
    EXPECT_STREQ(second->interfaceName, "e");
    EXPECT_FALSE(second->hasTransceiver);
    EXPECT_EQ(second->fcoeLinkage, nullptr);
    EXPECT_EQ(second->ipProperties.ipv6Addresses, nullptr);
    // A one-letter interface name is not asked for IP properties.
    EXPECT_EQ(zorap_sim_call_count(ZORAP_FN_GetIPProperties), 1u);
    // Everything the library handed out was given back.
    EXPECT_EQ(zorap_sim_outstanding_allocations(), 0u);
}

TEST_F(AdapterList, ASecondBuildWithoutClearingAppendsEveryPortAgain)
{
    Initialize_CNA_List();
    Initialize_CNA_List();
    ASSERT_NE(m_CNAList, nullptr);
    EXPECT_EQ(m_CNAList->next, nullptr);
    EXPECT_EQ(portCount(m_CNAList), 4);
    Clear_CNA_List();
    EXPECT_EQ(m_CNAList, nullptr);
}

TEST_F(AdapterList, FailingLibraryCallsLeavePortsWithLessData)
{
    zorap_sim_fail(ZORAP_FN_GetIPProperties, ZORAP_ERR_FAILED, -1);
    zorap_sim_fail(ZORAP_FN_GetFCoELinkage, ZORAP_ERR_FAILED, -1);
    zorap_sim_fail(ZORAP_FN_GetTransceiverDMIData, ZORAP_ERR_NOT_PRESENT, -1);
    Initialize_CNA_List();
    ASSERT_NE(m_CNAList, nullptr);
    ASSERT_EQ(portCount(m_CNAList), 2);
    for (const _CNAPortStruc* p = m_CNAList->portList; p != nullptr; p = p->next) {
        EXPECT_FALSE(p->hasTransceiver);
        EXPECT_EQ(p->fcoeLinkage, nullptr);
        EXPECT_EQ(p->ipProperties.ipv6Addresses, nullptr);
        EXPECT_EQ(p->ipProperties.ipv4Address.family, 0);
    }
}

TEST_F(AdapterList, NoAdapterListGivesAnEmptyList)
{
    zorap_sim_fail(ZORAP_FN_GetAdapterList, ZORAP_ERR_FAILED, 1);
    Initialize_CNA_List();
    EXPECT_EQ(m_CNAList, nullptr);
}

TEST_F(AdapterList, NicFlashWritesRefuseEmptyImagesAndReportFailures)
{
    Initialize_CNA_List();
    ASSERT_NE(m_CNAList, nullptr);
    // The library reads the image argument as a terminated file name.
    const unsigned char image[] = "/nonexistent/flash.img";
    EXPECT_EQ(UpdateCNAFlashImage(m_CNAList, image, 0), 2);
    EXPECT_EQ(UpdateCNAFlashImage(nullptr, image, 4), 2);
    EXPECT_EQ(UpdateCNAFlashImage(m_CNAList, nullptr, 4), 2);
    EXPECT_EQ(zorap_sim_call_count(ZORAP_FN_UpdateFlash), 0u);
    // The whole 64-bit size counts: low 32 bits of zero are still an image.
    zorap_sim_set_next_flash(0, 0);
    EXPECT_EQ(UpdateCNAFlashImage(m_CNAList, image, 1ull << 32), 0);
    zorap_sim_set_next_flash(ZORAP_ERR_FLASH_FAILED, 0);
    EXPECT_EQ(UpdateCNAFlashImage(m_CNAList, image, sizeof(image)), 2);
    EXPECT_FALSE(gbFlashUpdateInProgress);
    EXPECT_EQ(ValidateCNAFlashImage(m_CNAList, image, sizeof(image)), 0);
}

TEST_F(AdapterList, AdaptersAreFoundBySerialOrNicControllerIdWithoutRegardToCase)
{
    Initialize_CNA_List();
    ASSERT_NE(m_CNAList, nullptr);
    EXPECT_EQ(FindCNAFromSerialNumber("VXC0000005"), m_CNAList);
    EXPECT_EQ(FindCNAFromSerialNumber("vxc0000005"), m_CNAList);
    EXPECT_EQ(FindCNAFromSerialNumber("vxc0000005_nic"), m_CNAList);
    EXPECT_EQ(FindCNAFromSerialNumber("VXA0000001"), nullptr) << "an FC-only adapter is not in the list";
    EXPECT_EQ(FindCNAFromSerialNumber("VXC0000005_FC"), nullptr);
    Clear_CNA_List();
    EXPECT_EQ(FindCNAFromSerialNumber("VXC0000005"), nullptr);
}

// The provider, unchanged, over the adapter library's sysfs source: a copy of
// the fake sysfs/procfs tree of tests/fixtures/sysfs-host that changes under
// the running provider, in a strict embedded CIM host. Runs under
// tests/isolate.sh.
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

}  // namespace

// What each class shows of the unchanged tree is compared whole in
// tests/provider/recorded_hosts_test.cpp.

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

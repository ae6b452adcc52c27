// What the NIC class modules do when the request's path fails them: a name
// space, class name or key that can't be read, a key of another type. Paths
// here are fake handles whose functions fail on demand, so no broker is
// needed; the log goes to the private /opt of tests/isolate.sh.
#include <gtest/gtest.h>

#include <string>

#include "classes/Vexlan_NIC_EthernetPort.h"
#include "classes/Vexlan_NIC_IPProtocolEndPoint.h"
#include "classes/Vexlan_NIC_IPProtocolEndPointCapabilities.h"
#include "classes/Vexlan_NIC_LANEndPoint.h"
#include "classes/Vexlan_NIC_NetworkPort.h"
#include "classes/Vexlan_NIC_PortController.h"
#include "classes/Vexlan_NIC_RegisteredProfile.h"
#include "classes/Vexlan_NIC_RemoteServiceAccessPoint.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "test_files.h"

namespace {

// A path whose reads fail as the test says, and which counts them.
struct FakePath {
    CMPIObjectPath path;
    CMPIrc nameSpaceRc = CMPI_RC_OK;
    CMPIrc classNameRc = CMPI_RC_OK;
    CMPIrc keyRc = CMPI_RC_OK;
    CMPIType keyType = CMPI_string;
    int classNameReads = 0;
    int keyReads = 0;
};

FakePath* self(const CMPIObjectPath* op)
{
    return reinterpret_cast<FakePath*>(const_cast<CMPIObjectPath*>(op));
}

CMPIString* getNameSpace(const CMPIObjectPath* op, CMPIStatus* rc)
{
    rc->rc = self(op)->nameSpaceRc;
    rc->msg = nullptr;
    return nullptr;
}

CMPIString* getClassName(const CMPIObjectPath* op, CMPIStatus* rc)
{
    ++self(op)->classNameReads;
    rc->rc = self(op)->classNameRc;
    rc->msg = nullptr;
    return nullptr;
}

CMPIData getKey(const CMPIObjectPath* op, const char*, CMPIStatus* rc)
{
    ++self(op)->keyReads;
    rc->rc = self(op)->keyRc;
    rc->msg = nullptr;
    CMPIData d{};
    d.type = self(op)->keyType;
    d.state = CMPI_goodValue;
    d.value.uint32 = 6;
    return d;
}

CMPIObjectPathFT makeTable()
{
    CMPIObjectPathFT ft{};
    ft.getNameSpace = getNameSpace;
    ft.getClassName = getClassName;
    ft.getKey = getKey;
    return ft;
}
CMPIObjectPathFT gTable = makeTable();

using Enum = CmpiStatus (*)(const CmpiContext&, CmpiResult&, const CmpiObjectPath&, const char**);
using Names = CmpiStatus (*)(const CmpiContext&, CmpiResult&, const CmpiObjectPath&);
using Get = CmpiStatus (*)(const CmpiContext&, CmpiResult&, const CmpiObjectPath&, const char**, bool);

struct Module {
    const char* name;
    Enum enumInstances;
    Names enumInstanceNames;
    Get getInstance;
};

#define MODULE(X) Module{#X, enumInstances_##X, enumInstanceNames_##X, getInstance_##X}
const Module kModules[] = {
    MODULE(EthernetPort),        MODULE(NetworkPort),
    MODULE(Nic_PortController),  MODULE(LANEndPoint),
    MODULE(IPProtocolEndPoint),  MODULE(IPProtocolEndPointCapabilities),
    MODULE(RemoteServiceAccessPoint), MODULE(Nic_RegisteredProfile),
};

using support_test::kLogPath;

std::string logText()
{
    return support_test::readFile(kLogPath);
}

int count(const std::string& text, const std::string& what)
{
    int n = 0;
    for (auto at = text.find(what); at != std::string::npos; at = text.find(what, at + 1))
        ++n;
    return n;
}

class NicPathFailures : public ::testing::Test {
protected:
    void SetUp() override
    {
        support_test::makeDirs(support_test::kLogDir);
        std::remove(kLogPath);
        Vexlan_FC_Utils_CMPI::InitializeLogFile();
        g_EnableLogError = true;
        g_EnableDebugPrint = true;
        fake.path.hdl = nullptr;
        fake.path.ft = &gTable;
    }
    CmpiObjectPath path() { return CmpiObjectPath(&fake.path); }

    FakePath fake;
    CmpiContext ctx;
    CmpiResult result{static_cast<CMPIResult*>(nullptr)};
};

}  // namespace

TEST_F(NicPathFailures, NameSpaceIsReadFirstAndItsFailureReturned)
{
    fake.nameSpaceRc = CMPI_RC_ERR_INVALID_NAMESPACE;
    for (const Module& m : kModules) {
        EXPECT_EQ(m.enumInstances(ctx, result, path(), nullptr).rc(), CMPI_RC_ERR_INVALID_NAMESPACE) << m.name;
        EXPECT_EQ(m.enumInstanceNames(ctx, result, path()).rc(), CMPI_RC_ERR_INVALID_NAMESPACE) << m.name;
        EXPECT_EQ(m.getInstance(ctx, result, path(), nullptr, true).rc(), CMPI_RC_ERR_INVALID_NAMESPACE) << m.name;
    }
    EXPECT_EQ(fake.classNameReads, 0);
    EXPECT_EQ(fake.keyReads, 0);
    const std::string log = logText();
    EXPECT_EQ(count(log, "Vexlan_NIC_EthernetPort: Error getting namespace in enumIntances\n"), 1);
    EXPECT_EQ(count(log, "Vexlan_NIC_EthernetPort: Error getting namespace in enumInstanceNames\n"), 1);
    EXPECT_EQ(count(log, "Vexlan_NIC_EthernetPort: Error getting namespace in getIntances\n"), 1);
    EXPECT_EQ(count(log, "Vexlan_NIC_NetworkPort: Error getting namespace\n"), 3);
    EXPECT_EQ(count(log, "Vexlan_NIC_RemoteServiceAccessPoint: Error getting namespace\n"), 3);
    EXPECT_EQ(count(log, "Vexlan_NIC_RegisteredProfile: Error getting namespace\n"), 2);
    EXPECT_EQ(count(log, "Vexlan_RegisteredProfile: Error getting namespace\n"), 1);
    EXPECT_EQ(count(log, "Vexlan_NIC_IPProtocolEndPoint: Error getting namespace in getInstances\n"), 1);
    EXPECT_EQ(count(log, "Vexlan_NIC_LANEndPoint enumInstances_LANEndPoint was called\n"), 1);
    EXPECT_EQ(count(log, "Vexlan_NIC_IPProtocolEndPoint enumInstanceNames\n"), 1);
}

TEST_F(NicPathFailures, ClassNameFailureReturnedAfterTheNameSpace)
{
    fake.classNameRc = CMPI_RC_ERR_INVALID_CLASS;
    for (const Module& m : kModules) {
        EXPECT_EQ(m.enumInstances(ctx, result, path(), nullptr).rc(), CMPI_RC_ERR_INVALID_CLASS) << m.name;
        EXPECT_EQ(m.getInstance(ctx, result, path(), nullptr, false).rc(), CMPI_RC_ERR_INVALID_CLASS) << m.name;
    }
    EXPECT_EQ(fake.keyReads, 0);
    const std::string log = logText();
    EXPECT_EQ(count(log, "Vexlan_NIC_EthernetPort: Error getting classname in enumIntances\n"), 1);
    EXPECT_EQ(count(log, "Vexlan_NIC_PortController: Error getting classname in getInstances\n"), 1);
    EXPECT_EQ(count(log, "Vexlan_NIC_IPProtocolEndPointCapabilities: Error getting ClassName in enumInstances\n"), 1);
}

TEST_F(NicPathFailures, KeyThatCantBeReadOrIsNoTextEndsTheRequestWithoutAnAnswer)
{
    fake.keyRc = CMPI_RC_ERR_NO_SUCH_PROPERTY;
    for (const Module& m : kModules)
        EXPECT_EQ(m.getInstance(ctx, result, path(), nullptr, true).rc(), CMPI_RC_ERR_NO_SUCH_PROPERTY) << m.name;
    fake.keyRc = CMPI_RC_OK;
    fake.keyType = CMPI_uint32;
    for (const Module& m : kModules)
        EXPECT_EQ(m.getInstance(ctx, result, path(), nullptr, true).rc(), CMPI_RC_OK) << m.name;
    const std::string log = logText();
    EXPECT_EQ(count(log, "Vexlan_NIC_NetworkPort: Error getting DeviceID key in findMatchedRole1\n"), 2);
    EXPECT_EQ(count(log, "Vexlan_NIC_LANEndPoint: Error getting DeviceID key in getInstances\n"), 1);
    EXPECT_EQ(count(log, "Vexlan_NIC_LANEndPoint: Error invalid key data type(160)"), 1);
    EXPECT_EQ(count(log, "Vexlan_NIC_RemoteServiceAccessPoint: Error getting Name key in getInstance\n"), 2);
    EXPECT_EQ(count(log, "Vexlan_NIC_RegisteredProfile: Error getting Name key in getInstance\n"), 2);

    // The profile's key lines are debug output: with it off they vanish, the
    // other modules' error lines stay.
    g_EnableDebugPrint = false;
    std::remove(kLogPath);
    getInstance_Nic_RegisteredProfile(ctx, result, path(), nullptr, true);
    getInstance_EthernetPort(ctx, result, path(), nullptr, true);
    EXPECT_EQ(count(logText(), "Error getting Name key"), 0);
    EXPECT_EQ(count(logText(), "Vexlan_NIC_EthernetPort: Error getting DeviceID key in findMatchedRole1\n"), 1);
}

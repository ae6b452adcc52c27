// Every instance class as a client's ein and ei show it, against the text kept
// in tests/fixtures/instances-<host>, for four hosts: the adapter library's
// default description, the sysfs tree of tests/fixtures/sysfs-host, and the
// NIC and update test adapters of tests/fixtures/descriptions. The
// paths with their keys in order, then each instance with its properties in
// order and their values (the strict host checks each value's CIM type
// against the class). What depends on the machine (the host's name and its
// form, the OS name) stands there as @HOST@, @HOSTFORMAT@ and @OS@.
//
// VEXLAN_RECORD_INSTANCES=<dir> writes the texts into <dir>/instances-<host>
// instead of comparing; a changed file is read and checked before it is kept.
#include <gtest/gtest.h>

#include <cstdlib>
#include <sstream>
#include <string>
#include <vector>

#include "cimhost/text.h"
#include "provider_env.h"
#include "zorap_cna.h"
#include "zorap_sim_control.h"

using namespace provtest;
using cimhost::OpResult;

namespace {

// ein then ei of the class, as text, with the machine's values replaced.
std::string render(cimhost::Host& host, const std::string& cls)
{
    const OpResult names = host.enumerateInstanceNames(classPath(cls));
    const OpResult full = enumerate(host, cls);
    EXPECT_TRUE(names.ok() && names.strictErrors.empty()) << cls << ": " << names.message;
    std::string text;
    for (const cimhost::ObjectPath& p : names.paths)
        text += cimhost::formatPath(p) + "\n";
    for (const cimhost::Instance& inst : full.instances)
        text += cimhost::formatInstanceMof(inst);
    const ExpectedHost machine = expectedHost();
    char os[ZORAP_OS_NAME_BUFFER_SIZE] = {};
    uint32_t size = sizeof(os);
    if (ZORAP_GetOSName(os, &size) == 0)
        replaceAll(text, std::string("\"") + os + "\"", "\"@OS@\"");
    replaceAll(text, "NameFormat = \"" + machine.nameFormat + "\";", "NameFormat = \"@HOSTFORMAT@\";");
    replaceAll(text, machine.name, "@HOST@");
    return text;
}

TEST(RecordedInstances, EveryClassShowsItsRecordedPathsAndInstancesOnEachHost)
{
    const std::string fixtures = VEXLAN_FIXTURES;
    const std::string sysfs = "{\"source\": \"sysfs\", \"root\": \"" + fixtures + "/sysfs-host\"}";
    const std::string nic = fileText(fixtures + "/descriptions/nic-adapters.json");
    const std::string update = fileText(fixtures + "/descriptions/update-adapters.json");
    const struct {
        const char* name;
        const char* description;  // null: the default one
    } hosts[] = {{"default", nullptr}, {"sysfs", sysfs.c_str()}, {"nic-adapters", nic.c_str()},
                 {"update-adapters", update.c_str()}};
    const char* record = std::getenv("VEXLAN_RECORD_INSTANCES");
    for (const auto& h : hosts) {
        const std::string dir = "/instances-" + std::string(h.name);
        const std::string recordDir = record != nullptr ? record + dir : std::string();
        cimhost::Host host;
        startProvider(host, kLogsOn, h.description, "Vexlan_Adapter_ComputerSystem");
        const std::vector<std::string> classes = providerClasses(host).instances;
        ASSERT_EQ(classes.size(), 33u);
        for (const std::string& cls : classes)
            expectAsKept(render(host, cls), fixtures + dir + "/" + cls + ".mof",
                         record != nullptr ? recordDir.c_str() : nullptr);
        ASSERT_TRUE(host.unload(true).ok());
        zorap_sim_reset();
    }
}

}  // namespace

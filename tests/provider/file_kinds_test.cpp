// Files that are not what they seem: the adapter description, both settings
// files and the job file replaced by a FIFO, a link to /dev/zero, a directory
// or a file over its bound, when the provider loads and while it polls. The
// provider answers at once, says which path it refused and why, and goes on
// as if the file were absent.
#include <gtest/gtest.h>

#include <unistd.h>

#include <chrono>
#include <cstdlib>
#include <string>
#include <thread>

#include "provider_env.h"
#include "zorap_sim_control.h"

using namespace provtest;
using cimhost::Host;
using cimhost::OpResult;
using std::chrono::seconds;

namespace {

const char kOptSettings[] = "/opt/Vexlan_Corporation/CNAProviders/vexlancna.properties";
const char kCwdSettings[] = "vexlancna.properties";
const char kJobFile[] = "/var/tmp/vxln_cna_provider.config";
constexpr std::size_t kDescriptionBound = 16u << 20;
constexpr std::size_t kSettingsBound = 1u << 20;
constexpr std::size_t kJobFileBound = 32u << 20;

// One FC adapter with one port.
const char kOneAdapter[] = R"({"adapters": [{"model": "VXF1600", "serialNumber": "VXKIND0001", "chip": "RSX-1620",
  "ports": [{"protocols": [{"type": "fc", "portIndex": 0, "nodeWWN": "30:00:02:7e:5a:10:00:01",
                            "portWWN": "31:00:02:7e:5a:10:00:01", "state": "online"}]}]}]})";

std::string descriptionPath()
{
    char cwd[4096] = {};
    return std::string(getcwd(cwd, sizeof cwd) != nullptr ? cwd : ".") + "/adapters.json";
}

// An enumeration and how long it took.
struct Timed {
    OpResult result;
    std::chrono::steady_clock::duration took;
};

Timed enumerateTimed(Host& host, const char* className)
{
    const auto start = std::chrono::steady_clock::now();
    OpResult r = host.enumerateInstances(classPath(className));
    return {r, std::chrono::steady_clock::now() - start};
}

// The description the adapter library reads, given by ZORAP_SIM_ADAPTERS.
void useDescriptionFile(const std::string& path)
{
    setenv("ZORAP_SIM_ADAPTERS", path.c_str(), 1);
}

// The files a test may plant, with where their refusal shows.
enum class Target { Description, OptSettings, CwdSettings, JobFile };

struct TargetRow {
    Target target;
    const char* name;
    std::size_t bound;
};

const TargetRow kTargets[] = {
    {Target::Description, "adapter description", kDescriptionBound},
    {Target::OptSettings, "settings under /opt", kSettingsBound},
    {Target::CwdSettings, "settings in the working directory", kSettingsBound},
    {Target::JobFile, "job file", kJobFileBound},
};

std::string pathOf(Target t)
{
    switch (t) {
    case Target::Description:
        return descriptionPath();
    case Target::OptSettings:
        return kOptSettings;
    case Target::CwdSettings:
        return kCwdSettings;
    case Target::JobFile:
        return kJobFile;
    }
    return "";
}

// The line that names the refused path. The adapter library writes to
// standard error; the provider to its error log, or to standard error while
// the log is off (the refused settings under /opt would have switched it on).
std::string refusalLine(Target t, Planted kind, std::size_t bound)
{
    // The job file is opened without following a link.
    const std::string reason = t == Target::JobFile && kind == Planted::DevZeroLink
                                   ? "a symbolic link, not a regular file"
                                   : plantedReason(kind, bound);
    switch (t) {
    case Target::Description:
        return "adapter description " + descriptionPath() + ": " + reason + "; no adapters";
    case Target::OptSettings:
        return "Vexlan_CNA_Provider: Refusing settings file (" + std::string(kOptSettings) + "): " + reason + ".";
    case Target::CwdSettings:
        return "Refusing settings file (" + std::string(kCwdSettings) + "): " + reason + ".";
    case Target::JobFile:
        return "Refusing preference file (" + std::string(kJobFile) + "): " + reason + ".";
    }
    return "";
}

bool inLog(Target t)
{
    return t == Target::CwdSettings || t == Target::JobFile;
}

class FileKinds : public ::testing::TestWithParam<Planted> {
protected:
    void SetUp() override
    {
        unsetenv("ZORAP_SIM_ADAPTERS");
        std::remove(kJobFile);
    }
    void TearDown() override
    {
        unsetenv("ZORAP_SIM_ADAPTERS");
        std::remove(kJobFile);
        writeSettings("", "");
        std::remove(descriptionPath().c_str());
        rmdir(descriptionPath().c_str());
        rmdir(kJobFile);
        zorap_sim_load_default();
        zorap_sim_reset();
    }
};

}  // namespace

// A provider life per file: the first request answers within a second with
// what the provider has without that file, and the refusal names the path.
TEST_P(FileKinds, AtLoadTheFirstRequestAnswersAtOnceAndTheRefusalNamesThePath)
{
    const Planted kind = GetParam();
    for (const TargetRow& row : kTargets) {
        SCOPED_TRACE(std::string(row.name) + " as " + plantedName(kind));
        writeSettings(row.target == Target::OptSettings ? "" : kLogsOn, "");
        removeLog();
        writeFile(descriptionPath(), kOneAdapter);
        useDescriptionFile(descriptionPath());
        plant(kind, pathOf(row.target), row.bound + 1);
        StderrCapture err;
        zorap_sim_load_default();  // -1 when the description is refused
        zorap_sim_reset();
        {
            Host host;
            prepareHost(host);
            // The first request starts the provider, whose start pauses 2
            // seconds for the polling thread to take its lock; later requests
            // answer at once.
            const Timed first = enumerateTimed(host, "Vexlan_FCHBA_PortController");
            EXPECT_TRUE(first.result.ok()) << first.result.message;
            EXPECT_LT(first.took, seconds(3));
            // Without a description no adapters; without the others the one adapter.
            EXPECT_EQ(first.result.instances.size(), row.target == Target::Description ? 0u : 1u);
            const Timed jobs = enumerateTimed(host, "Vexlan_Adapter_ConcreteJob");
            EXPECT_TRUE(jobs.result.ok());
            EXPECT_LT(jobs.took, seconds(1));
            EXPECT_TRUE(jobs.result.instances.empty());

            const std::string line = refusalLine(row.target, kind, row.bound);
            if (inLog(row.target)) {
                EXPECT_TRUE(waitForLog(line, seconds(5))) << line;
            } else {
                EXPECT_NE(err.text().find(line), std::string::npos) << line;
            }
            if (row.target == Target::OptSettings) {
                EXPECT_EQ(countLog("AdapterPollingLoop() starting"), 0) << "the settings' defaults: both logs off";
            }
            ASSERT_TRUE(host.unload(true).ok());
        }
        std::remove(pathOf(row.target).c_str());
        rmdir(pathOf(row.target).c_str());
    }
}

// The description and the job file are replaced while the provider polls
// every round: the rebuild that follows finds no adapters and no jobs, every
// request answers within a second, and each refusal names its path once.
TEST_P(FileKinds, DuringAPollTheRebuildGoesOnWithoutTheFile)
{
    const Planted kind = GetParam();
    writeSettings(kLogsOn, "LinkStatusPollIntervalSeconds=0\n");
    removeLog();
    writeFile(descriptionPath(), kOneAdapter);
    useDescriptionFile(descriptionPath());
    ASSERT_EQ(zorap_sim_load_default(), 0);
    zorap_sim_reset();
    StderrCapture err;
    Host host;
    prepareHost(host);
    ASSERT_EQ(enumerateTimed(host, "Vexlan_FCHBA_PortController").result.instances.size(), 1u);
    // The first polls settle (the load counts as a change).
    std::this_thread::sleep_for(seconds(3));
    const int rebuilds = countLog("After the call to buildFCPortList()");

    plant(kind, kJobFile, kJobFileBound + 1);
    plant(kind, descriptionPath(), kDescriptionBound + 1);
    const auto until = std::chrono::steady_clock::now() + seconds(15);
    while (countLog("After the call to buildFCPortList()") <= rebuilds && std::chrono::steady_clock::now() < until) {
        const Timed t = enumerateTimed(host, "Vexlan_Adapter_ComputerSystem");
        EXPECT_TRUE(t.result.ok());
        EXPECT_LT(t.took, seconds(1));
        std::this_thread::sleep_for(std::chrono::milliseconds(200));
    }
    ASSERT_GT(countLog("After the call to buildFCPortList()"), rebuilds) << "no rebuild";
    // Two more polls pass with the planted entries in place.
    std::this_thread::sleep_for(seconds(3));
    const Timed after = enumerateTimed(host, "Vexlan_FCHBA_PortController");
    EXPECT_TRUE(after.result.ok());
    EXPECT_LT(after.took, seconds(1));
    EXPECT_TRUE(after.result.instances.empty());

    const std::string description = refusalLine(Target::Description, kind, kDescriptionBound);
    const std::string stderrText = err.text();
    const auto first = stderrText.find(description);
    EXPECT_NE(first, std::string::npos) << description;
    EXPECT_EQ(stderrText.find(description, first + 1), std::string::npos) << "said once";
    EXPECT_GE(countLog(refusalLine(Target::JobFile, kind, kJobFileBound)), 1);
    ASSERT_TRUE(host.unload(true).ok());
}

std::string kindName(const ::testing::TestParamInfo<Planted>& param)
{
    static const char* const names[] = {"Fifo", "DevZeroLink", "Directory", "Oversize"};
    return names[static_cast<int>(param.param)];
}

INSTANTIATE_TEST_SUITE_P(Kinds, FileKinds, ::testing::ValuesIn(kPlantedKinds), kindName);

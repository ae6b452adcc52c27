// Main and backup trees, configuration changes, and where the description
// comes from.
#include <dlfcn.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <fstream>

#include "sim_fixture.h"

using namespace zorap_test;

namespace {

std::string tempFile(const std::string& content) {
    char name[] = "/tmp/zorap_sim_test_XXXXXX";
    int fd = mkstemp(name);
    EXPECT_GE(fd, 0);
    close(fd);
    std::ofstream(name) << content;
    return name;
}

std::string oneAdapter(const std::string& serial) {
    return R"({"adapters":[{"model":"M","serialNumber":")" + serial +
           R"(","chip":"RSX-1610","ports":[{"protocols":[{"type":"fc","nodeWWN":"3000000000000001","portWWN":"3100000000000001"}]}]}]})";
}

std::string firstSerial() {
    auto list = adapters();
    return list.empty() ? std::string("<none>") : std::string(list[0]->serialNumber);
}

}  // namespace

TEST_F(SimTest, BackupIsBuiltAsideAndSwapMakesItMain) {
    _zorap_adapter_list_t* before = ZORAP_GetAdapterList();
    _zorap_adapter_t* oldFirst = before->firstAdapter;
    EXPECT_EQ(0, ZORAP_DidConfigChange());

    ASSERT_EQ(0, zorap_sim_load_json(oneAdapter("NEW-1").c_str()));
    EXPECT_EQ(1, ZORAP_DidConfigChange());
    ASSERT_EQ(ZORAP_OK, ZORAP_UpdateBackupAdapterList());
    // The main tree is untouched by the backup build.
    EXPECT_EQ(before, ZORAP_GetAdapterList());
    EXPECT_EQ("SERIAL-A", firstSerial());
    ASSERT_EQ(ZORAP_OK, ZORAP_SwapBackupToMainAdapterList());
    EXPECT_NE(before, ZORAP_GetAdapterList());
    EXPECT_EQ("NEW-1", firstSerial());
    // The replaced tree stays readable for a straggling reader.
    EXPECT_STREQ("SERIAL-A", oldFirst->serialNumber);

    EXPECT_EQ(ZORAP_OK, ZORAP_ResetConfigChange());
    EXPECT_EQ(0, ZORAP_DidConfigChange());
    // No second backup: nothing to swap.
    EXPECT_EQ(ZORAP_ERR_NOT_PRESENT, ZORAP_SwapBackupToMainAdapterList());
    EXPECT_EQ("NEW-1", firstSerial());
}

TEST_F(SimTest, DeviceHandlesStayWithTheirPortAcrossReloads) {
    uint32_t first = device(0, 0)->deviceHandle;
    uint32_t second = device(0, 1)->deviceHandle;
    // The second port now comes first, beside a port never seen before.
    ASSERT_EQ(0, zorap_sim_load_json(R"({"adapters":[{"model":"M","serialNumber":"S","chip":"RSX-1620",
        "ports":[{"protocols":[
          {"type":"fc","nodeWWN":"30:00:00:00:00:00:00:01","portWWN":"31:00:00:00:00:00:00:02"},
          {"type":"fc","nodeWWN":"30:00:00:00:00:00:00:01","portWWN":"31:00:00:00:00:00:00:77"}]}]}]})"));
    ASSERT_EQ(ZORAP_OK, ZORAP_UpdateBackupAdapterList());
    ASSERT_EQ(ZORAP_OK, ZORAP_SwapBackupToMainAdapterList());
    EXPECT_EQ(second, device(0, 0)->deviceHandle);
    uint32_t fresh = device(0, 1)->deviceHandle;
    EXPECT_NE(first, fresh);
    EXPECT_NE(second, fresh);
    _zorap_port_property_t prop{};
    EXPECT_EQ(ZORAP_ERR_NOT_FOUND, ZORAP_GetHbaDevicePortProperty(first, 0, &prop));
}

TEST_F(SimTest, ChangedFileIsSeenAndReadByTheNextBackup) {
    std::string path = tempFile(oneAdapter("FILE-1"));
    ASSERT_EQ(0, zorap_sim_load_file(path.c_str()));
    EXPECT_EQ(path, zorap_sim_description_path());
    ASSERT_EQ(ZORAP_OK, ZORAP_UpdateBackupAdapterList());
    ASSERT_EQ(ZORAP_OK, ZORAP_SwapBackupToMainAdapterList());
    ZORAP_ResetConfigChange();
    EXPECT_EQ(0, ZORAP_DidConfigChange());
    EXPECT_EQ("FILE-1", firstSerial());

    // Rewrite with another length so the change shows whatever the clock.
    std::ofstream(path) << oneAdapter("FILE-22");
    EXPECT_EQ(1, ZORAP_DidConfigChange());
    ZORAP_ResetConfigChange();
    EXPECT_EQ(0, ZORAP_DidConfigChange());
    EXPECT_EQ("FILE-1", firstSerial());
    ASSERT_EQ(ZORAP_OK, ZORAP_UpdateBackupAdapterList());
    ASSERT_EQ(ZORAP_OK, ZORAP_SwapBackupToMainAdapterList());
    EXPECT_EQ("FILE-22", firstSerial());
    EXPECT_EQ(0, ZORAP_DidConfigChange());

    // A file that turns bad leaves no adapters after the next swap.
    std::ofstream(path) << "{ not json";
    testing::internal::CaptureStderr();
    ASSERT_EQ(ZORAP_OK, ZORAP_UpdateBackupAdapterList());
    std::string err = testing::internal::GetCapturedStderr();
    EXPECT_NE(std::string::npos, err.find(path)) << err;
    ASSERT_EQ(ZORAP_OK, ZORAP_SwapBackupToMainAdapterList());
    ASSERT_NE(nullptr, ZORAP_GetAdapterList());
    EXPECT_EQ(nullptr, ZORAP_GetAdapterList()->firstAdapter);
    std::remove(path.c_str());
}

TEST(SimSource, EnvironmentVariableOverridesTheFileBesideTheLibrary) {
    ZORAP_Uninitialize();
    std::string path = tempFile(oneAdapter("FROM-ENV"));
    setenv(ZORAP_SIM_ENV, path.c_str(), 1);
    ASSERT_EQ(0, zorap_sim_load_default());
    ASSERT_EQ(ZORAP_OK, ZORAP_Initialize(0, 0));
    EXPECT_EQ("FROM-ENV", firstSerial());
    ZORAP_Uninitialize();

    // Without the variable: the default description installed beside the
    // library, a host of three adapters.
    unsetenv(ZORAP_SIM_ENV);
    ASSERT_EQ(0, zorap_sim_load_default());
    std::string used = zorap_sim_description_path();
    EXPECT_NE(std::string::npos, used.find(std::string("/") + ZORAP_SIM_DEFAULT_FILE)) << used;
    Dl_info info{};
    ASSERT_NE(0, dladdr(reinterpret_cast<void*>(&ZORAP_Initialize), &info));
    std::string libDir(info.dli_fname);
    EXPECT_EQ(libDir.substr(0, libDir.rfind('/')), used.substr(0, used.rfind('/')));
    ASSERT_EQ(ZORAP_OK, ZORAP_Initialize(0, 0));
    EXPECT_EQ(3u, adapters().size());
    ZORAP_Uninitialize();
    std::remove(path.c_str());
}


// Flash writes, injected failures, call counts and bad descriptions.
#include <chrono>

#include "sim_fixture.h"

using namespace zorap_test;

TEST_F(SimTest, FlashWriteBlocksReturnsTheSetResultAndChangesVersions) {
    _tagZORAPSDMDevice* d = device(0, 0);
    const unsigned char image[] = "/tmp/image.bin";
    ZORAP_ResetConfigChange();
    zorap_sim_set_next_flash(ZORAP_ERR_FLASH_FAILED, 50);
    auto t0 = std::chrono::steady_clock::now();
    EXPECT_EQ(ZORAP_ERR_FLASH_FAILED, ZORAP_doOptionROMUpdate(d, image, 0));
    EXPECT_GE(std::chrono::steady_clock::now() - t0, std::chrono::milliseconds(45));
    EXPECT_EQ(0, ZORAP_DidConfigChange());  // a failed write changes nothing

    zorap_sim_set_next_flash(ZORAP_OK, 10);
    EXPECT_EQ(ZORAP_OK, ZORAP_doOptionROMUpdate(d, image, 0));
    EXPECT_EQ(1, ZORAP_DidConfigChange());
    // The live calls see the new versions at once, the tree after a rebuild.
    char* mbi = nullptr;
    uint32_t len = 0;
    ASSERT_EQ(ZORAP_OK, ZORAP_GetMBIVersionString(d, &mbi, &len));
    EXPECT_STREQ("V:3.65.00,D:12242025,A:Y,T:M", mbi);
    ZORAP_FreeMem(mbi);
    EXPECT_STREQ("8.08.204", d->firmwareVersionText);
    ASSERT_EQ(ZORAP_OK, ZORAP_UpdateBackupAdapterList());
    ASSERT_EQ(ZORAP_OK, ZORAP_SwapBackupToMainAdapterList());
    EXPECT_STREQ("8.09.001", device(0, 0)->firmwareVersionText);

    // Later writes use the description's values (0 ms, success); NIC writes
    // find the adapter by its instance number.
    EXPECT_EQ(ZORAP_OK, ZORAP_UpdateFlash(1, image, 0));
    EXPECT_EQ(ZORAP_ERR_NOT_FOUND, ZORAP_UpdateFlash(42, image, 0));
    EXPECT_EQ(ZORAP_ERR_INVALID_PARAMETER, ZORAP_UpdateFlash(1, nullptr, 0));
}

TEST_F(SimTest, InjectedFailuresAndCallCounts) {
    EXPECT_EQ(ZORAP_FN_GetVpd, zorap_sim_function_from_name("ZORAP_GetVpd"));
    EXPECT_EQ(ZORAP_FN_FreeMem, zorap_sim_function_from_name("FreeMem"));
    EXPECT_EQ(-1, zorap_sim_function_from_name("GetNothing"));
    EXPECT_STREQ("ZORAP_doOptionROMUpdate", zorap_sim_function_name(ZORAP_FN_doOptionROMUpdate));
    EXPECT_EQ(nullptr, zorap_sim_function_name(ZORAP_FN_COUNT));

    zorap_sim_reset();
    _zorap_link_properties_t link{};
    ASSERT_EQ(0, zorap_sim_fail(ZORAP_FN_GetLinkProperties, 0x4711, 2));
    EXPECT_EQ(0x4711u, ZORAP_GetLinkProperties("eth0", &link));
    EXPECT_EQ(0x4711u, ZORAP_GetLinkProperties("eth0", &link));
    EXPECT_EQ(ZORAP_OK, ZORAP_GetLinkProperties("eth0", &link));
    EXPECT_EQ(3u, zorap_sim_call_count(ZORAP_FN_GetLinkProperties));

    // Every call until cleared; pointer and flag results show the failure
    // their own way.
    ASSERT_EQ(0, zorap_sim_fail(ZORAP_FN_GetAdapterList, 1, -1));
    for (int i = 0; i < 3; ++i) EXPECT_EQ(nullptr, ZORAP_GetAdapterList());
    ASSERT_EQ(0, zorap_sim_fail(ZORAP_FN_GetAdapterList, 0, 0));
    EXPECT_NE(nullptr, ZORAP_GetAdapterList());
    ASSERT_EQ(0, zorap_sim_fail(ZORAP_FN_DidConfigChange, 9, 1));
    EXPECT_EQ(9, ZORAP_DidConfigChange());
    EXPECT_EQ(0, ZORAP_DidConfigChange());

    // A failed out-parameter call hands out nothing.
    ASSERT_EQ(0, zorap_sim_fail(ZORAP_FN_GetIPProperties, 5, 1));
    void* rec = nullptr;
    EXPECT_EQ(5u, ZORAP_GetIPProperties("eth0", &rec));
    EXPECT_EQ(nullptr, rec);
    EXPECT_EQ(0u, zorap_sim_outstanding_allocations());

    // A failed swap leaves the main tree.
    _zorap_adapter_list_t* main = ZORAP_GetAdapterList();
    ASSERT_EQ(ZORAP_OK, ZORAP_UpdateBackupAdapterList());
    ASSERT_EQ(0, zorap_sim_fail(ZORAP_FN_SwapBackupToMainAdapterList, 2, 1));
    EXPECT_EQ(2u, ZORAP_SwapBackupToMainAdapterList());
    EXPECT_EQ(main, ZORAP_GetAdapterList());

    // A failure that starts at a later call: the calls before it pass.
    ASSERT_EQ(0, zorap_sim_fail_call(ZORAP_FN_GetLinkProperties, 0x4712, 3, 1));
    EXPECT_EQ(ZORAP_OK, ZORAP_GetLinkProperties("eth0", &link));
    EXPECT_EQ(ZORAP_OK, ZORAP_GetLinkProperties("eth0", &link));
    EXPECT_EQ(0x4712u, ZORAP_GetLinkProperties("eth0", &link));
    EXPECT_EQ(ZORAP_OK, ZORAP_GetLinkProperties("eth0", &link));
    EXPECT_EQ(-1, zorap_sim_fail_call(ZORAP_FN_GetLinkProperties, 1, 0, 1));

    EXPECT_EQ(-1, zorap_sim_fail(ZORAP_FN_COUNT, 1, 1));
    EXPECT_EQ(-1, zorap_sim_fail_call(ZORAP_FN_COUNT, 1, 1, 1));
    zorap_sim_reset();
    EXPECT_EQ(0u, zorap_sim_call_count(ZORAP_FN_GetLinkProperties));
    EXPECT_EQ(ZORAP_OK, ZORAP_SwapBackupToMainAdapterList());
}

TEST_F(SimTest, ForeignPointerToFreeMemIsRefusedWithAMessage) {
    int local = 0;
    testing::internal::CaptureStderr();
    ZORAP_FreeMem(&local);
    std::string err = testing::internal::GetCapturedStderr();
    EXPECT_NE(std::string::npos, err.find("was not handed out")) << err;
}

// Bad descriptions: a clear message naming the fault, and no adapters.
TEST(SimBadDescription, EachFaultIsNamedAndLeavesAnEmptyList) {
    struct Case {
        const char* json;
        const char* expect;
    };
    const Case cases[] = {
        {"{ \"adapters\": [", "not valid JSON"},
        {"[]", "$: expected an object"},
        {R"({"adaptors": []})", "$.adaptors: unknown key"},
        {R"({"adapters": [{"serialNumber": "S", "chip": "RSX-1620"}]})", "$.adapters[0].model: missing"},
        {R"({"adapters": [{"model": "M", "serialNumber": "S", "chip": "RSX-9"}]})", "unknown chip"},
        {R"({"adapters": [{"model": "M", "serialNumber": "S"}]})", "$.adapters[0].chip: missing"},
        {R"({"adapters": [{"model": "M", "serialNumber": "S", "pciDeviceId": 70000}]})", "larger than 65535"},
        {R"({"adapters": [{"model": "M", "serialNumber": "S", "chip": "RSX-1620", "ports": [{"protocols":
            [{"type": "nic", "mac": "02:00:00:00:00", "interface": "e"}]}]}]})",
         "$.adapters[0].ports[0].protocols[0].mac: expected a MAC address"},
        {R"({"adapters": [{"model": "M", "serialNumber": "S", "chip": "RSX-1620", "ports": [{"protocols":
            [{"type": "nic", "mac": "020000000001", "interface": "e", "ipv4": "300.1.1.1"}]}]}]})",
         "expected an IPv4 or IPv6 address"},
        {R"({"adapters": [{"model": "M", "serialNumber": "S", "chip": "RSX-1620",
            "optionRom": {"firmware": "8.x.1"}}]})", "optionRom.firmware: expected a version"},
        {R"({"adapters": [{"model": "M", "serialNumber": "S", "chip": "RSX-1620", "vpd": {"PNX": "1"}}]})",
         "two letters or digits"},
        {R"({"adapters": [{"model": "M", "serialNumber": "S", "chip": "RSX-1620", "mbiVersion": "1.2.3"}]})",
         "mbiVersion and mbiDate go together"},
        {R"({"adapters": [{"model": "M", "serialNumber": "S", "chip": "RSX-1620", "ports": [{"protocols":
            [{"type": "nic", "mac": "020000000001", "interface": "e"},
             {"type": "nic", "mac": "020000000002", "interface": "e"}]}]}]})", "is given twice"},
        {R"({"adapters": [{"model": "M", "serialNumber": "S", "chip": "RSX-1620", "ports": [{"protocols":
            [{"type": "fc", "portWWN": "3100000000000001"}]}]}]})", "nodeWWN: missing"},
    };
    for (const Case& c : cases) {
        ZORAP_Uninitialize();
        testing::internal::CaptureStderr();
        EXPECT_EQ(-1, zorap_sim_load_json(c.json)) << c.json;
        std::string err = testing::internal::GetCapturedStderr();
        EXPECT_NE(std::string::npos, err.find(c.expect)) << "expected \"" << c.expect << "\" in: " << err;
        EXPECT_NE(std::string::npos, err.find("no adapters")) << err;
        ASSERT_EQ(ZORAP_OK, ZORAP_Initialize(0, 0));
        ASSERT_NE(nullptr, ZORAP_GetAdapterList());
        EXPECT_EQ(nullptr, ZORAP_GetAdapterList()->firstAdapter);
    }
    ZORAP_Uninitialize();

    testing::internal::CaptureStderr();
    EXPECT_EQ(-1, zorap_sim_load_file("/nonexistent/adapters.json"));
    std::string err = testing::internal::GetCapturedStderr();
    EXPECT_NE(std::string::npos, err.find("/nonexistent/adapters.json: cannot be read")) << err;
    ASSERT_EQ(ZORAP_OK, ZORAP_Initialize(0, 0));
    EXPECT_EQ(nullptr, ZORAP_GetAdapterList()->firstAdapter);
    ZORAP_Uninitialize();
}

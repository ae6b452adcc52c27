// Work on the library's own threads and beside callers' threads: alarm
// delivery, backup builds beside a reader, flash writes ended by shutdown.
#include <unistd.h>

#include <atomic>
#include <chrono>
#include <cstdio>
#include <fstream>
#include <condition_variable>
#include <mutex>
#include <thread>

#include "sim_fixture.h"

using namespace zorap_test;

namespace {

// What the alarm callback saw.
struct AlarmLog {
    std::mutex mu;
    std::condition_variable cv;
    std::vector<std::thread::id> threads;
    std::vector<unsigned> devices;
    std::vector<int> types;
    std::vector<std::string> texts;
    std::vector<int> lengths;
    bool listSeen = true;
};
AlarmLog* gLog = nullptr;

int recordAlarm(unsigned int device, int type, int length, unsigned char* text) {
    std::lock_guard<std::mutex> l(gLog->mu);
    gLog->threads.push_back(std::this_thread::get_id());
    gLog->devices.push_back(device);
    gLog->types.push_back(type);
    gLog->lengths.push_back(length);
    gLog->texts.push_back(reinterpret_cast<char*>(text));
    // The callback may call back into the library, as the provider's does.
    gLog->listSeen = gLog->listSeen && ZORAP_GetAdapterList() != nullptr;
    gLog->cv.notify_all();
    return 0;
}

class AlarmTest : public SimTest {
protected:
    void SetUp() override {
        SimTest::SetUp();
        gLog = &log;
    }
    void TearDown() override {
        SimTest::TearDown();  // ends the alarm thread before the log goes
        gLog = nullptr;
    }
    AlarmLog log;
};

}  // namespace

TEST_F(AlarmTest, CallbackRunsOnTheLibrarysOwnThreadWithTheGivenArguments) {
    EXPECT_EQ(-1, zorap_sim_raise_alarm(1, 0, "dropped"));  // nobody registered
    ASSERT_EQ(ZORAP_OK, ZORAP_RegisterAlarmNotificationCallback(recordAlarm));
    ASSERT_EQ(0, zorap_sim_raise_alarm(7, 0, "port 7 changed"));
    ASSERT_EQ(0, zorap_sim_raise_alarm(8, 3, nullptr));
    ASSERT_EQ(0, zorap_sim_wait_alarms_idle(5000));
    std::lock_guard<std::mutex> l(log.mu);
    ASSERT_EQ(2u, log.devices.size());
    EXPECT_NE(std::this_thread::get_id(), log.threads[0]);
    EXPECT_EQ(log.threads[0], log.threads[1]);
    EXPECT_EQ((std::vector<unsigned>{7, 8}), log.devices);
    EXPECT_EQ((std::vector<int>{0, 3}), log.types);
    EXPECT_EQ("port 7 changed", log.texts[0]);
    EXPECT_EQ(14, log.lengths[0]);
    EXPECT_EQ("", log.texts[1]);
    EXPECT_TRUE(log.listSeen);
    EXPECT_EQ(2u, zorap_sim_alarms_delivered());
}

TEST_F(AlarmTest, UnregisterAndUninitializeStopDelivery) {
    ASSERT_EQ(ZORAP_OK, ZORAP_RegisterAlarmNotificationCallback(recordAlarm));
    EXPECT_EQ(ZORAP_ERR_NOT_FOUND, ZORAP_UnRegisterAlarmNotificationCallback(nullptr));
    ASSERT_EQ(ZORAP_OK, ZORAP_UnRegisterAlarmNotificationCallback(recordAlarm));
    EXPECT_EQ(-1, zorap_sim_raise_alarm(1, 0, "late"));
    ASSERT_EQ(ZORAP_OK, ZORAP_RegisterAlarmNotificationCallback(recordAlarm));
    ASSERT_EQ(ZORAP_OK, ZORAP_Uninitialize());
    EXPECT_EQ(-1, zorap_sim_raise_alarm(1, 0, "after uninitialize"));
    std::lock_guard<std::mutex> l(log.mu);
    EXPECT_TRUE(log.devices.empty());
    EXPECT_EQ(ZORAP_ERR_NOT_INITIALIZED, ZORAP_RegisterAlarmNotificationCallback(recordAlarm));
}

// A rewritten description file that differs only in live state changes what
// the live calls answer without a configuration change, and an FC port whose
// state changed raises alarm type 0 for its port index, by itself too.
namespace {
std::string replaced(std::string text, const std::string& from, const std::string& to) {
    size_t at = text.find(from);
    EXPECT_NE(std::string::npos, at) << from;
    if (at != std::string::npos) text.replace(at, from.size(), to);
    return text;
}
}  // namespace

TEST_F(AlarmTest, ARewrittenDescriptionChangesLiveStateAndRaisesThePortsAlarm) {
    char name[] = "/tmp/zorap_live_XXXXXX";
    int fd = mkstemp(name);
    ASSERT_GE(fd, 0);
    close(fd);
    const std::string path = name;
    std::ofstream(path) << kHost;
    ASSERT_EQ(0, zorap_sim_load_file(path.c_str()));
    ASSERT_EQ(ZORAP_OK, ZORAP_RegisterAlarmNotificationCallback(recordAlarm));
    ZORAP_ResetConfigChange();
    EXPECT_EQ(0, zorap_sim_check_description());
    const uint32_t handle = device(0, 0)->deviceHandle;

    std::string live = replaced(kHost, R"("state": "online")", R"("state": "loopdown")");
    live = replaced(live, R"("linkState": "up")", R"("linkState": "down")");
    live = replaced(live, R"("ioCount": 100)", R"("ioCount": 555)");
    std::ofstream(path) << live;
    EXPECT_EQ(1, zorap_sim_check_description());
    EXPECT_EQ(0, ZORAP_DidConfigChange());
    _zorap_port_property_t prop{};
    ASSERT_EQ(ZORAP_OK, ZORAP_GetHbaDevicePortProperty(handle, 0, &prop));
    EXPECT_EQ(ZORAP_PORT_STATE_LOOPDOWN, prop.portStateCode);
    _zorap_link_properties_t link{};
    ASSERT_EQ(ZORAP_OK, ZORAP_GetLinkProperties("eth0", &link));
    EXPECT_EQ(ZORAP_LINK_DOWN, link.linkState);
    _tagZORAPSDMDevice stats = *device(0, 0);
    ASSERT_EQ(ZORAP_OK, ZORAP_RefreshDeviceStats(&stats));
    EXPECT_EQ(555u, stats.statIoCount);
    EXPECT_EQ(ZORAP_PORT_STATE_ONLINE, device(0, 0)->portStateCode) << "the tree is a snapshot";
    ASSERT_EQ(0, zorap_sim_wait_alarms_idle(5000));
    {
        std::lock_guard<std::mutex> l(log.mu);
        EXPECT_EQ((std::vector<unsigned>{0}), log.devices);
        EXPECT_EQ((std::vector<int>{0}), log.types);
        ASSERT_EQ(1u, log.texts.size());
        EXPECT_EQ("FC port 31:00:00:00:00:00:00:01 state 1 to 3", log.texts[0]);
    }

    // Back online, unasked: the alarm thread notices the file by itself.
    std::ofstream(path) << replaced(live, R"("state": "loopdown", "portType")", R"("state": 1, "portType")");
    {
        std::unique_lock<std::mutex> l(log.mu);
        EXPECT_TRUE(log.cv.wait_for(l, std::chrono::seconds(5), [&] { return log.devices.size() == 2; }));
    }
    EXPECT_EQ(0, ZORAP_DidConfigChange());
    ASSERT_EQ(ZORAP_OK, ZORAP_GetHbaDevicePortProperty(handle, 0, &prop));
    EXPECT_EQ(ZORAP_PORT_STATE_ONLINE, prop.portStateCode);

    // Anything else is a configuration change, for the next backup build.
    std::ofstream(path) << replaced(kHost, "SERIAL-A", "SERIAL-Z");
    EXPECT_EQ(2, zorap_sim_check_description());
    EXPECT_EQ(1, ZORAP_DidConfigChange());
    EXPECT_EQ(0, zorap_sim_check_description());
    std::lock_guard<std::mutex> l(log.mu);
    EXPECT_EQ(2u, log.devices.size());
    std::remove(path.c_str());
}

// A reader walks the main tree under its own lock, as the provider does,
// while another thread builds backups without that lock and swaps under it.
// A caller that holds its own lock across shutdown while its callback waits
// for that lock is not blocked for ever.
namespace {
std::mutex gCallerLock;
std::atomic<int> gBlockedCalls{0};
int blockOnCallerLock(unsigned int, int, int, unsigned char*) {
    std::lock_guard<std::mutex> l(gCallerLock);
    ++gBlockedCalls;
    return 0;
}
}  // namespace

TEST_F(SimTest, ShutdownDoesNotWaitForEverOnACallbackThatWaitsForTheCaller) {
    ASSERT_EQ(ZORAP_OK, ZORAP_RegisterAlarmNotificationCallback(blockOnCallerLock));
    {
        std::lock_guard<std::mutex> l(gCallerLock);
        ASSERT_EQ(0, zorap_sim_raise_alarm(1, 0, "x"));
        ASSERT_EQ(-1, zorap_sim_wait_alarms_idle(100));  // the callback is stuck on our lock
        testing::internal::CaptureStderr();
        EXPECT_EQ(ZORAP_OK, ZORAP_UnRegisterAlarmNotificationCallback(blockOnCallerLock));
        EXPECT_EQ(ZORAP_OK, ZORAP_Uninitialize());
        EXPECT_NE(std::string::npos, testing::internal::GetCapturedStderr().find("let go"));
    }
    ASSERT_EQ(0, zorap_sim_wait_alarms_idle(5000));  // it finishes once the lock is free
    EXPECT_EQ(1, gBlockedCalls.load());
    // A new start gets a new alarm thread.
    ASSERT_EQ(ZORAP_OK, ZORAP_Initialize(0, 0));
    ASSERT_EQ(ZORAP_OK, ZORAP_RegisterAlarmNotificationCallback(blockOnCallerLock));
    ASSERT_EQ(0, zorap_sim_raise_alarm(2, 0, "y"));
    ASSERT_EQ(0, zorap_sim_wait_alarms_idle(5000));
    EXPECT_EQ(2, gBlockedCalls.load());
}

TEST_F(SimTest, BackupBuildsRunBesideAReaderOfTheMainTree) {
    std::mutex providerLock;
    std::atomic<bool> stop{false};
    std::atomic<unsigned long> walks{0};
    std::atomic<bool> consistent{true};
    std::thread reader([&] {
        do {
            std::lock_guard<std::mutex> l(providerLock);
            unsigned n = 0;
            for (auto* a : adapters()) {
                for (auto* q : protocols(a))
                    if (q->protocolType < 2 && q->fcDevice.deviceHandle == 0) consistent = false;
                ++n;
            }
            if (n != 4) consistent = false;
            ++walks;
        } while (!stop.load());
    });
    for (int i = 0; i < 200; ++i) {
        ASSERT_EQ(ZORAP_OK, ZORAP_UpdateBackupAdapterList());
        std::lock_guard<std::mutex> l(providerLock);
        ASSERT_EQ(ZORAP_OK, ZORAP_SwapBackupToMainAdapterList());
    }
    stop = true;
    reader.join();
    EXPECT_GT(walks.load(), 0u);
    EXPECT_TRUE(consistent.load());
}

TEST_F(SimTest, UninitializeEndsAFlashWriteInProgress) {
    zorap_sim_set_next_flash(ZORAP_OK, 60000);
    const unsigned char image[] = "x";
    ZORAP_STATUS result = ZORAP_OK;
    std::thread writer([&] { result = ZORAP_UpdateFlash(1, image, 0); });
    ASSERT_EQ(0, zorap_sim_wait_flash_writes(1, 5000));
    auto t0 = std::chrono::steady_clock::now();
    ZORAP_Uninitialize();
    writer.join();
    EXPECT_LT(std::chrono::steady_clock::now() - t0, std::chrono::seconds(5));
    EXPECT_EQ(ZORAP_ERR_FAILED, result);
}


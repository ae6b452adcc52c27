// Loading and unloading the library by dlopen/dlclose while its alarm thread
// runs and blocks are handed out, after a flash write: the unload ends the
// thread and releases the trees and the noted image name (the ASan build
// checks for leaks at exit), and a second load starts afresh.  Not linked
// with the library.
#include <dlfcn.h>
#include <gtest/gtest.h>

#include <atomic>
#include <string>

#include "zorap_cna.h"
#include "zorap_sim_control.h"

#ifndef ZORAP_LIBRARY_PATH
#error "ZORAP_LIBRARY_PATH must name the built library"
#endif

namespace {

std::atomic<int> gAlarms{0};
int countAlarm(unsigned int, int, int, unsigned char*) { return ++gAlarms, 0; }

template <typename F>
F fn(void* lib, const char* name) {
    void* sym = dlsym(lib, name);
    EXPECT_NE(nullptr, sym) << name;
    return reinterpret_cast<F>(sym);
}

}  // namespace

TEST(SimUnload, DlcloseWithARunningAlarmThreadAndReloadStartAfresh) {
    for (int round = 0; round < 2; ++round) {
        void* lib = dlopen(ZORAP_LIBRARY_PATH, RTLD_NOW | RTLD_LOCAL);
        ASSERT_NE(nullptr, lib) << dlerror();
        auto loadJson = fn<int (*)(const char*)>(lib, "zorap_sim_load_json");
        auto init = fn<ZORAP_STATUS (*)(int, int)>(lib, "ZORAP_Initialize");
        auto list = fn<_zorap_adapter_list_t* (*)(void)>(lib, "ZORAP_GetAdapterList");
        auto reg = fn<ZORAP_STATUS (*)(ZORAP_ALARM_CALLBACK)>(lib, "ZORAP_RegisterAlarmNotificationCallback");
        auto raise = fn<int (*)(unsigned, int, const char*)>(lib, "zorap_sim_raise_alarm");
        auto idle = fn<int (*)(uint32_t)>(lib, "zorap_sim_wait_alarms_idle");
        auto link = fn<ZORAP_STATUS (*)(const char*, void**, uint32_t*)>(lib, "ZORAP_GetFCoELinkage");
        auto freeMem = fn<void (*)(void*)>(lib, "ZORAP_FreeMem");
        auto nextFlash = fn<void (*)(uint32_t, uint32_t)>(lib, "zorap_sim_set_next_flash");
        auto flash = fn<ZORAP_STATUS (*)(uint32_t, const unsigned char*, uint32_t)>(lib, "ZORAP_UpdateFlash");
        auto lastImage = fn<int (*)(char*, size_t, long long*)>(lib, "zorap_sim_last_flash_image");

        ASSERT_EQ(0, loadJson(R"({"adapters":[{"model":"M","serialNumber":"S","chip":"RSX-AB0","ports":[
            {"protocols":[{"type":"nic","mac":"020000000001","interface":"eth9",
                           "fcoe":[{"portWWN":"3100000000000009"}]}]}]}]})"));
        // A fresh load knows nothing of the last one.
        EXPECT_EQ(nullptr, list());
        ASSERT_EQ(ZORAP_OK, init(0, 0));
        ASSERT_NE(nullptr, list()->firstAdapter);
        ASSERT_EQ(ZORAP_OK, reg(countAlarm));
        ASSERT_EQ(0, raise(1, 0, "before unload"));
        ASSERT_EQ(0, idle(5000));
        void* array = nullptr;
        uint32_t count = 0;
        ASSERT_EQ(ZORAP_OK, link("eth9", &array, &count));
        freeMem(array);
        // The library keeps the last image name (longer than any in-place
        // string) until the unload releases it; LeakSanitizer checks.
        const std::string image = "/var/tmp/an-image-name-that-needs-a-heap-block-" + std::to_string(round) + ".bin";
        nextFlash(0, 1);
        ASSERT_EQ(ZORAP_OK, flash(0, reinterpret_cast<const unsigned char*>(image.c_str()), 0));
        char name[128] = {};
        ASSERT_EQ(0, lastImage(name, sizeof name, nullptr));
        EXPECT_EQ(image, name);
        // No ZORAP_Uninitialize: the unload itself must end the alarm thread.
        ASSERT_EQ(0, dlclose(lib));
        EXPECT_EQ(nullptr, dlopen(ZORAP_LIBRARY_PATH, RTLD_NOW | RTLD_NOLOAD)) << "still loaded";
        EXPECT_EQ(round + 1, gAlarms.load());
    }
}

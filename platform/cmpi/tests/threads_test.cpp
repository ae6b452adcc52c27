// Cleanups of the four MIs arriving on four threads at once: exactly one
// of them runs the provider's cleanup and deletes it.
#include "fake_broker.h"
#include "test_provider.h"

#include <gtest/gtest.h>

#include <thread>
#include <vector>

TEST(DriverThreads, ConcurrentCleanupsDeleteOnce)
{
    fake::reset();
    CMPIContext* ctx = fake::newContext();
    for (int round = 0; round < 200; ++round) {
        TestProvider::cleanups = 0;
        CMPIInstanceMI inst{};
        CMPIAssociationMI assoc{};
        CMPIMethodMI meth{};
        CMPIIndicationMI ind{};
        testFactory(inst, &testInstFT, fake::broker(), ctx);
        testFactory(assoc, &testAssocFT, fake::broker(), ctx);
        testFactory(meth, &testMethFT, fake::broker(), ctx);
        testFactory(ind, &testIndFT, fake::broker(), ctx);
        ASSERT_EQ(testProviderBase.getUseCount(), 4);

        std::vector<std::thread> threads;

        threads.emplace_back([&] { inst.ft->cleanup(&inst, ctx, 0); });
        threads.emplace_back([&] { assoc.ft->cleanup(&assoc, ctx, 0); });
        threads.emplace_back([&] { meth.ft->cleanup(&meth, ctx, 0); });
        threads.emplace_back([&] { ind.ft->cleanup(&ind, ctx, 0); });
        for (auto& t : threads)
            t.join();
        ASSERT_EQ(TestProvider::cleanups, 1);
        ASSERT_EQ(TestProvider::live, 0);
        ASSERT_EQ(testProviderBase.getBaseMI(), nullptr);
    }
}

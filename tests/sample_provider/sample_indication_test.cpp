// Indications from the sample provider's own thread, through the embedded
// host, in both server flavours: delivery while a filter is active, quiet
// after the last deactivation, and a clean unload with the thread joined
// whether or not the server called disableIndications first.
#include "sample_host.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <string>

using cimhost::Flavour;
using cimhost::Host;
using cimhost::Indication;
using sample_test::flavourTestName;
using sample_test::kNs;

namespace {

using namespace std::chrono_literals;

const char* const kQuery = "SELECT * FROM Sample_Alert";

class SampleIndications : public sample_test::SampleHostTest {
protected:

    // Takes what has arrived until nothing comes for `quiet` (at most 100).
    int drain(std::chrono::milliseconds quiet)
    {
        int n = 0;
        Indication ind;
        while (n < 100 && host.waitIndication(ind, quiet))
            ++n;
        return n;
    }

    bool sawEvent(const std::string& prefix)
    {
        const cimhost::Counters c = host.counters();
        return std::any_of(c.events.begin(), c.events.end(),
                           [&](const std::string& e) { return e.rfind(prefix, 0) == 0; });
    }
};

TEST_P(SampleIndications, DeliveredFromTheProviderThreadWhileAFilterIsActive)
{
    int id = 0;
    cimhost::Status st = host.activateFilter(kQuery, kNs, id);
    ASSERT_TRUE(st.ok()) << cimhost::statusLine(st);
    EXPECT_TRUE(sawEvent("enableIndications"));

    Indication first;
    ASSERT_TRUE(host.waitIndication(first, 5s));
    EXPECT_TRUE(first.error.empty()) << first.error;
    EXPECT_EQ(first.instance.className(), "Sample_Alert");
    ASSERT_NE(first.instance.property("Message"), nullptr);
    EXPECT_EQ(first.instance.property("Message")->s, "tick");
    EXPECT_GE(first.instance.property("Sequence")->u, 1u);
    EXPECT_EQ(first.instance.property("Source")->ref->key("Name")->s, "w1");
    Indication second;
    ASSERT_TRUE(host.waitIndication(second, 5s));
    EXPECT_GT(second.instance.property("Sequence")->u, first.instance.property("Sequence")->u);

    ASSERT_TRUE(host.deactivateFilter(id).ok());
    drain(300ms);  // what was already under way
    EXPECT_EQ(drain(400ms), 0);
}

TEST_P(SampleIndications, OneOfTwoFiltersKeepsThemComing)
{
    int a = 0;
    int b = 0;
    ASSERT_TRUE(host.activateFilter(kQuery, kNs, a).ok());
    ASSERT_TRUE(host.activateFilter(kQuery, kNs, b).ok());
    ASSERT_TRUE(host.deactivateFilter(a).ok());
    Indication ind;
    ASSERT_TRUE(host.waitIndication(ind, 5s));
    const auto seq = ind.instance.property("Sequence")->u;
    ASSERT_TRUE(host.waitIndication(ind, 5s));
    EXPECT_GT(ind.instance.property("Sequence")->u, seq);  // still ticking
    ASSERT_TRUE(host.deactivateFilter(b).ok());
    drain(300ms);
    EXPECT_EQ(drain(400ms), 0);
}

TEST_P(SampleIndications, UnloadWithActiveFilterJoinsTheThread)
{
    int id = 0;
    ASSERT_TRUE(host.activateFilter(kQuery, kNs, id).ok());
    Indication ind;
    ASSERT_TRUE(host.waitIndication(ind, 5s));
    // No deactivation, no disableIndications: cleanup alone stops the
    // thread before the library goes.
    ASSERT_TRUE(host.unload(true).ok());
    EXPECT_FALSE(host.loaded());
    drain(100ms);
    EXPECT_EQ(drain(300ms), 0);
}

INSTANTIATE_TEST_SUITE_P(Flavours, SampleIndications, ::testing::Values(Flavour::Pegasus, Flavour::Sfcb),
                         flavourTestName);

} // namespace

// The log and the settings object used from several threads at once.
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/Vexlan_NIC_Properties.h"
#include "test_files.h"

#include <gtest/gtest.h>

#include <future>
#include <regex>
#include <set>
#include <thread>

using namespace support_test;

namespace {

TEST(ThreadedLog, ConcurrentWritersRotateOnceAndLoseNoLine) {
    REQUIRE_ISOLATION();
    makeDirs(kLogDir);
    std::remove(kPrevLogPath);
    g_EnableDebugPrint = true;
    g_EnableLogError = true;
    Vexlan_FC_Utils_CMPI::InitializeLogFile();

    // At the limit: every writer that starts finds the log due for rotation,
    // and exactly one of them may move it aside.
    std::string filler(kVexlanLogSizeLimit - 1, 'f');
    writeFile(kLogPath, filler + "\n");

    constexpr int kThreads = 8;
    constexpr int kLines = 100;
    std::promise<void> start;
    std::shared_future<void> started = start.get_future().share();
    std::vector<std::thread> writers;
    for (int t = 0; t < kThreads; ++t) {
        writers.emplace_back([t, started] {
            started.wait();
            for (int i = 0; i < kLines; ++i) {
                if (i % 2 == 0)
                    Vexlan_FC_Utils_CMPI::DebugPrint("writer %d line %d of the polling round", t, i);
                else
                    Vexlan_FC_Utils_CMPI::LogError("writer %d line %d of the polling round", t, i);
            }
        });
    }
    start.set_value();
    for (std::thread& writer : writers) writer.join();

    // The previous log is the filled one, untouched.
    std::vector<std::string> previous = readLines(kPrevLogPath);
    ASSERT_FALSE(previous.empty());
    EXPECT_EQ(previous[0], filler);
    std::size_t previousSize = readFile(kPrevLogPath).size();
    EXPECT_EQ(previousSize, static_cast<std::size_t>(kVexlanLogSizeLimit));

    // Every line is whole, and every line is in one of the two files.
    std::regex shape(R"(^.{24} writer ([0-9]) line ([0-9]+) of the polling round$)");
    std::set<std::pair<int, int>> seen;
    std::vector<std::string> lines(previous.begin() + 1, previous.end());
    for (std::string const& line : readLines(kLogPath)) lines.push_back(line);
    for (std::string const& line : lines) {
        std::smatch match;
        ASSERT_TRUE(std::regex_match(line, match, shape)) << line;
        EXPECT_TRUE(seen.insert({std::stoi(match[1]), std::stoi(match[2])}).second) << line;
    }
    EXPECT_EQ(seen.size(), static_cast<std::size_t>(kThreads * kLines));
}

TEST(ThreadedSettings, FirstCallsFromManyThreadsShareOneObject) {
    REQUIRE_ISOLATION();
    writeFile("vexlancna.properties", "LinkStatusPollIntervalSeconds=7\n");
    ::testing::internal::CaptureStderr();
    std::vector<Vexlan_NIC_Properties*> seen(8, nullptr);
    std::vector<std::thread> callers;
    for (std::size_t i = 0; i < seen.size(); ++i)
        callers.emplace_back([&seen, i] { seen[i] = Vexlan_NIC_Properties::instance(); });
    for (std::thread& caller : callers) caller.join();
    std::string said = ::testing::internal::GetCapturedStderr();

    for (Vexlan_NIC_Properties* p : seen) EXPECT_EQ(p, seen[0]);
    EXPECT_EQ(seen[0]->linkStatusPollIntervalSeconds, 7);
    EXPECT_EQ(said, "Vexlan_NIC_Properties::reload, properties file name: vexlancna.properties\n");
}

}  // namespace

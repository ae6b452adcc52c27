// Diagnostic log: line format, rotation, a missing directory; message log.
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/logmessage.h"
#include "test_files.h"

#include <gtest/gtest.h>

#include <ctime>
#include <filesystem>
#include <regex>
#include <string>

using namespace support_test;

namespace {

class LogTest : public ::testing::Test {
protected:
    void SetUp() override {
        REQUIRE_ISOLATION();
        std::filesystem::remove_all(kLogDir);
        makeDirs(kLogDir);
        g_EnableDebugPrint = true;
        g_EnableLogError = true;
        Vexlan_FC_Utils_CMPI::InitializeLogFile();
    }
};

TEST_F(LogTest, LineIsCtimeStampBlankAndMessage) {
    // Initialising only composes the paths.
    EXPECT_STREQ(LogFile, kLogPath);
    EXPECT_STREQ(OldLogFile, kPrevLogPath);
    EXPECT_FALSE(exists(kLogPath));

    std::time_t before = std::time(nullptr);
    Vexlan_FC_Utils_CMPI::DebugPrint("Entering %s, index = %d", "createFCPort", 3);
    std::time_t after = std::time(nullptr);

    std::string content = readFile(kLogPath);
    std::regex shape(R"(^([A-Z][a-z]{2} [A-Z][a-z]{2} [ 0-9][0-9] [0-9]{2}:[0-9]{2}:[0-9]{2} [0-9]{4}) Entering createFCPort, index = 3\n$)");
    std::smatch match;
    ASSERT_TRUE(std::regex_match(content, match, shape)) << content;

    // The stamp is local time as ctime writes it, within the call.
    std::tm stamp{};
    ASSERT_NE(strptime(match[1].str().c_str(), "%a %b %d %H:%M:%S %Y", &stamp), nullptr);
    stamp.tm_isdst = -1;
    std::time_t written = std::mktime(&stamp);
    EXPECT_GE(written, before - 1);
    EXPECT_LE(written, after + 1);
}

TEST_F(LogTest, BothOperationsAppendToOneFileInCallOrder) {
    Vexlan_FC_Utils_CMPI::DebugPrint("first");
    Vexlan_FC_Utils_CMPI::LogError("getInstance: Error ..., status.rc=%d!", 6);
    Vexlan_FC_Utils_CMPI::DebugPrint("Exiting  Vexlan_CNA_Provider getInstance\n");
    Vexlan_FC_Utils_CMPI::DebugPrint("last");

    // A message that ends in a newline leaves an empty line behind it.
    std::vector<std::string> expected = {"first", "getInstance: Error ..., status.rc=6!",
                                         "Exiting  Vexlan_CNA_Provider getInstance", "", "last"};
    EXPECT_EQ(logMessages(), expected);
}

TEST_F(LogTest, LongMessageIsCutTo511Characters) {
    std::string huge(100000, 'k');
    Vexlan_FC_Utils_CMPI::LogError("%s", huge.c_str());
    std::vector<std::string> messages = logMessages();
    ASSERT_EQ(messages.size(), 1u);
    EXPECT_EQ(messages[0], std::string(511, 'k'));
}

TEST_F(LogTest, FileOneByteBelowLimitIsAppendedTo) {
    writeFile(kLogPath, std::string(kVexlanLogSizeLimit - 1, 'a'));
    Vexlan_FC_Utils_CMPI::DebugPrint("next");
    EXPECT_FALSE(exists(kPrevLogPath));
    std::string content = readFile(kLogPath);
    EXPECT_GT(content.size(), static_cast<std::size_t>(kVexlanLogSizeLimit));
    EXPECT_EQ(messageOf(content.substr(kVexlanLogSizeLimit - 1)), "next\n");
}

TEST_F(LogTest, FileAtLimitMovesToPreviousReplacingIt) {
    // No previous log yet.
    std::string over(kVexlanLogSizeLimit + 10, 'c');
    writeFile(kLogPath, over);
    Vexlan_FC_Utils_CMPI::DebugPrint("fresh");
    EXPECT_EQ(readFile(kPrevLogPath), over);
    EXPECT_EQ(logMessages(), std::vector<std::string>{"fresh"});

    // An earlier previous log is replaced.
    std::string full(kVexlanLogSizeLimit, 'b');
    writeFile(kLogPath, full);
    Vexlan_FC_Utils_CMPI::LogError("after rotation");
    EXPECT_EQ(readFile(kPrevLogPath), full);
    EXPECT_EQ(logMessages(), std::vector<std::string>{"after rotation"});
}

TEST_F(LogTest, FailedRotationIsReportedOnceInTheCurrentLog) {
    // A non-empty directory in the previous log's place can be neither removed
    // nor replaced by a file.
    makeDirs(std::string(kPrevLogPath) + "/blocker");
    writeFile(kLogPath, std::string(kVexlanLogSizeLimit, 'd') + "\n");

    Vexlan_FC_Utils_CMPI::DebugPrint("still written");
    g_EnableLogError = false;  // the report is an error line
    Vexlan_FC_Utils_CMPI::DebugPrint("no report");

    std::vector<std::string> lines = readLines(kLogPath);
    ASSERT_EQ(lines.size(), 4u);
    EXPECT_EQ(messageOf(lines[1]), "Vexlan_FC_Utils Error renaming log file, result=-1, errno=21");
    EXPECT_EQ(messageOf(lines[2]), "still written");
    EXPECT_EQ(messageOf(lines[3]), "no report");
}

TEST_F(LogTest, MissingDirectoryDropsEveryLine) {
    std::filesystem::remove_all(kLogDir);
    ASSERT_FALSE(exists(kLogDir));
    Vexlan_FC_Utils_CMPI::DebugPrint("lost");
    Vexlan_FC_Utils_CMPI::LogError("lost too");
    Vexlan_FC_Utils_CMPI::RenameOversizedLogFile();
    EXPECT_FALSE(exists(kLogDir));
}

TEST_F(LogTest, SizeTestCountsUnreadableFilesAsEmpty) {
    EXPECT_TRUE(Vexlan_FC_Utils_CMPI::IsFileSizeWithinLimit(nullptr, 0));
    char missing[] = "/opt/Vexlan_Corporation/CNAProviders/log/none";
    EXPECT_TRUE(Vexlan_FC_Utils_CMPI::IsFileSizeWithinLimit(missing, 1));
    EXPECT_FALSE(Vexlan_FC_Utils_CMPI::IsFileSizeWithinLimit(missing, 0));

    writeFile(kLogPath, "12345");
    EXPECT_TRUE(Vexlan_FC_Utils_CMPI::IsFileSizeWithinLimit(LogFile, 6));
    EXPECT_FALSE(Vexlan_FC_Utils_CMPI::IsFileSizeWithinLimit(LogFile, 5));
    // The free twin gives the same answers.
    EXPECT_TRUE(IsFileSizeWithinLimit(static_cast<char const*>(nullptr), 0));
    EXPECT_TRUE(IsFileSizeWithinLimit(kLogPath, 6));
    EXPECT_FALSE(IsFileSizeWithinLimit(kLogPath, 5));
    EXPECT_TRUE(IsFileSizeWithinLimit(missing, 1));
}

// The message log lies in the working directory, a fresh one under isolate.sh.
class MessageLogTest : public ::testing::Test {
protected:
    void SetUp() override { REQUIRE_ISOLATION(); }
};

TEST_F(MessageLogTest, TypeWords) {
    EXPECT_STREQ(TranslateMessageTypeToString(1), "Info");
    EXPECT_STREQ(TranslateMessageTypeToString(2), "Warning");
    EXPECT_STREQ(TranslateMessageTypeToString(3), "Error");
    EXPECT_STREQ(TranslateMessageTypeToString(100), "Debug");
    EXPECT_STREQ(TranslateMessageTypeToString(0), "Unknown");
    EXPECT_STREQ(TranslateMessageTypeToString(4), "Unknown");
    EXPECT_STREQ(TranslateMessageTypeToString(-1), "Unknown");
}

TEST_F(MessageLogTest, WritesOnlyAfterInitialisationWhichEmptiesTheFile) {
    // Not yet initialised: the name is empty and nothing is written.
    EXPECT_STREQ(messagesfile, "");
    EXPECT_EQ(OSSLogMessage(1, "dropped"), 1);
    EXPECT_FALSE(exists(VEXLAN_CORE_MESSAGES_FILE_NAME));

    writeFile(VEXLAN_CORE_MESSAGES_FILE_NAME, "left over\n");
    InitializeCoreMessagesFile();
    EXPECT_STREQ(messagesfile, "Vexlan_CNA_CoreMessages.log");
    EXPECT_EQ(readFile(VEXLAN_CORE_MESSAGES_FILE_NAME), "");

    EXPECT_EQ(OSSLogMessage(2, "link flapping"), 1);
    EXPECT_EQ(LogMessage(3, "adapter %u failed, code %d", 7u, -5), 1);
    EXPECT_EQ(LogMessage(42, "%s", std::string(600, 'm').c_str()), 1);
    EXPECT_EQ(readFile(VEXLAN_CORE_MESSAGES_FILE_NAME),
              "Warning: link flapping\nError: adapter 7 failed, code -5\nUnknown: " + std::string(511, 'm') + "\n");
}

TEST_F(MessageLogTest, RenameLogFile) {
    writeFile("from.log", "current");
    writeFile("to.log", "old");
    EXPECT_EQ(RenameLogFile("from.log", "to.log"), 0);
    EXPECT_FALSE(exists("from.log"));
    EXPECT_EQ(readFile("to.log"), "current");

    // A missing source is not an error, but the target is gone.
    EXPECT_EQ(RenameLogFile("from.log", "to.log"), 0);
    EXPECT_FALSE(exists("to.log"));

    // A target that can't be replaced is.
    mkdir("busy", 0755);
    mkdir("busy/inside", 0755);
    writeFile("from.log", "current");
    EXPECT_EQ(RenameLogFile("from.log", "busy"), -1);
    EXPECT_TRUE(exists("from.log"));
}

}  // namespace

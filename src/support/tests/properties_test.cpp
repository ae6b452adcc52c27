// The two readers of vexlancna.properties and their differences.
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/Vexlan_NIC_Properties.h"
#include "test_files.h"

#include <gtest/gtest.h>

#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

#include <string>
#include <vector>

using namespace support_test;

namespace {

std::string const kOptProperties = "/opt/Vexlan_Corporation/CNAProviders/vexlancna.properties";
std::string const kCwdProperties = "vexlancna.properties";

class SettingsTest : public ::testing::Test {
protected:
    void SetUp() override {
        REQUIRE_ISOLATION();
        makeDirs(kLogDir);
        std::remove(kOptProperties.c_str());
        std::remove(kCwdProperties.c_str());
        std::remove(kLogPath);
        g_EnableZORAPLog = false;
        Vexlan_FC_Utils_CMPI::InitializeLogFile();
    }

    // The provider constructor's reading of a file with this content.
    static void providerReads(std::string const& content) {
        writeFile(kOptProperties, content);
        LoadProviderProperties();
    }

    // A fresh object of the settings class reading a working-directory file.
    static void nicReads(std::string const& content, Vexlan_NIC_Properties*& out) {
        writeFile(kCwdProperties, content);
        ::testing::internal::CaptureStderr();
        out = new Vexlan_NIC_Properties();
        ::testing::internal::GetCapturedStderr();
    }
};

// ---- The provider constructor's reader --------------------------------------

TEST_F(SettingsTest, ProviderWithoutFileKeepsDefaultsAndLogsNothing) {
    g_EnableDebugPrint = true;
    g_EnableLogError = true;
    LoadProviderProperties();
    EXPECT_FALSE(g_EnableDebugPrint);
    EXPECT_FALSE(g_EnableLogError);
    EXPECT_FALSE(g_EnableZORAPLog);
    EXPECT_STREQ(g_InteropNamespace, "root/PG_InterOp");
    EXPECT_STREQ(g_CIMOMNameVersion, "Pegasus CIM Server");
    EXPECT_STREQ(g_CIMSchemaVersion, "Unknown Version");
    EXPECT_FALSE(exists(kLogPath));
}

// Each row is one file the provider constructor reads: which of the three
// log switches it leaves on. A switch is on for a value above zero (strtol's
// reading), the last line of a key wins, the key may stand anywhere in a
// line, case matters, and a line without "=" changes nothing.
TEST_F(SettingsTest, ProviderSwitchesAndLineForms) {
    struct Row {
        char const* content;
        bool debug, error, zorap;
    } const rows[] = {
        {"DebugLog=0\nErrorLog=5\n", false, true, false},
        {"DebugLog=true\nErrorLog=-1\nZORAPLog=2\n", false, false, true},
        {"ErrorLog=1\nErrorLog=0\n", false, false, false},
        {"#ErrorLog=1\n", false, false, false},
        {"   ErrorLog=1  \t\n", false, true, false},
        {"ErrorLog = 1\n", false, true, false},
        {"MyDebugLogSetting=1\n", true, false, false},
        {"errorlog=1\n", false, false, false},
        {"ErrorLog 1\n", false, false, false},
        {"DebugLog=0=1\n", true, false, false},  // the value follows the last "="
        {"ErrorLog=1", false, true, false},       // no end of line after the last line
    };
    for (Row const& row : rows) {
        g_EnableDebugPrint = g_EnableLogError = g_EnableZORAPLog = true;  // each read sets all three
        providerReads(row.content);
        EXPECT_EQ(g_EnableDebugPrint, row.debug) << row.content;
        EXPECT_EQ(g_EnableLogError, row.error) << row.content;
        EXPECT_EQ(g_EnableZORAPLog, row.zorap) << row.content;
    }
}

TEST_F(SettingsTest, ProviderTexts) {
    providerReads("InteropNamespace =  root/interop \nCIMOMNameVersion= sfcb 1.4\nCIMSchemaVersion=2.44.1\n");
    EXPECT_STREQ(g_InteropNamespace, "root/interop");  // trimmed
    EXPECT_STREQ(g_CIMOMNameVersion, " sfcb 1.4");       // not trimmed
    EXPECT_STREQ(g_CIMSchemaVersion, "2.44.1");

    // The keys are tried in a fixed order: a line naming a log key is taken
    // as that key whatever else it holds.
    providerReads("InteropNamespace=root/ErrorLog\n");
    EXPECT_STREQ(g_InteropNamespace, "root/PG_InterOp");
    EXPECT_FALSE(g_EnableLogError);
}

TEST_F(SettingsTest, ProviderStopsAtAnOverlongLine) {
    // The first 255 characters of the long line still count; nothing after it.
    std::string longLine = "DebugLog=1" + std::string(400, ' ') + "x";
    providerReads("ErrorLog=1\n" + longLine + "\nZORAPLog=1\n");
    EXPECT_TRUE(g_EnableLogError);
    EXPECT_TRUE(g_EnableDebugPrint);
    EXPECT_FALSE(g_EnableZORAPLog);

    providerReads(std::string(300, 'y') + "\nErrorLog=1\n");
    EXPECT_FALSE(g_EnableLogError);
}

TEST_F(SettingsTest, ProviderLogsItsConfigurationWhenDebugIsOn) {
    providerReads("DebugLog=1\nZORAPLog=1\nCIMSchemaVersion=2.44.1\n");
    std::vector<std::string> expected = {
        "***** Vexlan_CNA_Provider constructor was called *****",
        "PropertiesFileName=/opt/Vexlan_Corporation/CNAProviders/vexlancna.properties",
        "Config: DebugLog=1",
        "Config: ErrorLog=0",
        "Config: ZORAPLog=1",
        "Config: InteropNamespace=root/PG_InterOp",
        "Config: CIMOMNameVersion=Pegasus CIM Server",
        "Config: CIMSchemaVersion=2.44.1",
    };
    EXPECT_EQ(logMessages(), expected);

    std::remove(kLogPath);
    providerReads("ErrorLog=1\n");
    EXPECT_FALSE(exists(kLogPath));
}

// ---- The settings object's reader -------------------------------------------

// The two readers never read each other's file.
TEST_F(SettingsTest, EachReaderReadsOnlyItsOwnFile) {
    writeFile(kOptProperties, "LinkStatusPollIntervalSeconds=30\nErrorLog=1\nInteropNamespace=root/x\n");
    Vexlan_NIC_Properties fromOpt;  // no file of its own: the defaults
    EXPECT_FALSE(fromOpt.debugLog);
    EXPECT_FALSE(fromOpt.errorLog);
    EXPECT_EQ(fromOpt.linkStatusPollIntervalSeconds, 180);
    EXPECT_STREQ(fromOpt.interopNamespace, "root/PG_InterOp");
    EXPECT_STREQ(fromOpt.implementationNamespace, "root/vexlan_cmpi");
    std::remove(kOptProperties.c_str());

    Vexlan_NIC_Properties* fromCwd = nullptr;
    nicReads("LinkStatusPollIntervalSeconds=30\nErrorLog=1\n", fromCwd);
    EXPECT_EQ(fromCwd->linkStatusPollIntervalSeconds, 30);
    delete fromCwd;
    LoadProviderProperties();
    EXPECT_FALSE(g_EnableLogError);
}

TEST_F(SettingsTest, NicSwitchesAndWords) {
    struct Case {
        char const* content;
        bool errorLog;
    } const cases[] = {
        {"ErrorLog=true", true},        {"ErrorLog=TRUE", true},      {"ErrorLog=5", true},
        {"ErrorLog=0", false},          {"ErrorLog=no", false},       {"errorlog=1", true},
        {"#ErrorLog=1", false},         {"# ErrorLog=1", true},       // only the "#" word is skipped
        {"ErrorLog = 1", false},        {"  \tErrorLog=1  ", true},   {"MyErrorLogSetting=1", false},
        {"ErrorLog=1 ErrorLog=0", false}, {"ErrorLog==1", true},
    };
    for (Case const& c : cases) {
        Vexlan_NIC_Properties* properties = nullptr;
        nicReads(c.content, properties);
        EXPECT_EQ(properties->errorLog, c.errorLog) << c.content;
        EXPECT_FALSE(properties->debugLog) << c.content;
        delete properties;
    }
}

TEST_F(SettingsTest, NicValues) {
    Vexlan_NIC_Properties* properties = nullptr;
    nicReads("debuglog=1\nlinkstatuspollintervalseconds=0\nInteropNamespace=root/other\n"
             "implementationNamespace=root/ignored\n",
             properties);
    EXPECT_TRUE(properties->debugLog);
    EXPECT_EQ(properties->linkStatusPollIntervalSeconds, 0);
    EXPECT_STREQ(properties->interopNamespace, "root/other");
    EXPECT_STREQ(properties->implementationNamespace, "root/vexlan_cmpi");
    delete properties;

    nicReads("LinkStatusPollIntervalSeconds=soon\nInteropNamespace=" + std::string(300, 'n'), properties);
    EXPECT_EQ(properties->linkStatusPollIntervalSeconds, 0);
    EXPECT_EQ(std::string(properties->interopNamespace), std::string(255 - 17, 'n'));
    delete properties;
}

TEST_F(SettingsTest, NicReloadReadsOverCurrentValuesAndNamesTheFile) {
    Vexlan_NIC_Properties* properties = nullptr;
    nicReads("LinkStatusPollIntervalSeconds=45\n", properties);
    writeFile(kCwdProperties, "ErrorLog=1\n");

    ::testing::internal::CaptureStderr();
    properties->reload();
    EXPECT_EQ(::testing::internal::GetCapturedStderr(),
              "Vexlan_NIC_Properties::reload, properties file name: vexlancna.properties\n");
    EXPECT_TRUE(properties->errorLog);
    EXPECT_EQ(properties->linkStatusPollIntervalSeconds, 45);

    std::remove(kCwdProperties.c_str());
    ::testing::internal::CaptureStderr();
    properties->reload();
    ::testing::internal::GetCapturedStderr();
    EXPECT_TRUE(properties->errorLog);
    delete properties;
}

// An interval the loop can't use as a period keeps what strtol and the int
// field make of it, and the reading says so once, in the error log when it
// is on, else on standard error.
TEST_F(SettingsTest, NicPollIntervalsOutsideAPeriodAreKeptAndSaidOncePerRead) {
    struct Row {
        char const* value;
        int interval;
        char const* line;  // "" for a usable interval
    };
    Row const rows[] = {
        {"30", 30, ""},
        {"-5", -5, "LinkStatusPollIntervalSeconds=-5 is negative, read as -5: a poll every second."},
        {"0", 0, "LinkStatusPollIntervalSeconds=0 is zero, read as 0: a poll about every 2 seconds."},
        {"2147483648", -2147483647 - 1,
         "LinkStatusPollIntervalSeconds=2147483648 is beyond the range of an int, read as -2147483648: a poll every "
         "second."},
        {"4294967301", 5,
         "LinkStatusPollIntervalSeconds=4294967301 is beyond the range of an int, read as 5: a poll about every 7 "
         "seconds."},
        {"soon", 0, "LinkStatusPollIntervalSeconds=soon is no number, read as 0: a poll about every 2 seconds."},
    };
    for (Row const& row : rows) {
        SCOPED_TRACE(row.value);
        writeFile(kCwdProperties, std::string("LinkStatusPollIntervalSeconds=") + row.value + "\n");
        for (bool errorLog : {false, true}) {
            g_EnableLogError = errorLog;
            std::remove(kLogPath);
            ::testing::internal::CaptureStderr();
            Vexlan_NIC_Properties properties;
            std::string const err = ::testing::internal::GetCapturedStderr();
            EXPECT_EQ(properties.linkStatusPollIntervalSeconds, row.interval);
            std::string const expected = *row.line ? std::string("Config: ") + row.line : "";
            std::vector<std::string> const log = logMessages();
            if (errorLog) {
                EXPECT_EQ(log.size(), *row.line ? 1u : 0u);
                if (!log.empty()) {
                    EXPECT_EQ(log[0], expected);
                }
            } else {
                EXPECT_TRUE(log.empty());
                std::string const name = "Vexlan_NIC_Properties::reload, properties file name: vexlancna.properties\n";
                EXPECT_EQ(err, name + (*row.line ? "Vexlan_CNA_Provider: " + expected + "\n" : ""));
            }
        }
    }
    g_EnableLogError = false;
}

// A settings file that is no regular file or is over its bound is refused
// with one line and the defaults stand, in both readers.
TEST_F(SettingsTest, ASettingsFileThatIsNoRegularFileLeavesTheDefaults) {
    std::string const huge = std::string(1024 * 1024, '#') + "\nErrorLog=1\nLinkStatusPollIntervalSeconds=5\n";
    struct Row {
        char const* what;
        void (*make)(std::string const& path, std::string const& big);
        char const* reason;
    };
    Row const rows[] = {
        {"FIFO", [](std::string const& p, std::string const&) { mkfifo(p.c_str(), 0600); },
         "a FIFO, not a regular file"},
        {"/dev/null link", [](std::string const& p, std::string const&) { (void)!symlink("/dev/null", p.c_str()); },
         "a character device, not a regular file"},
        {"directory", [](std::string const& p, std::string const&) { mkdir(p.c_str(), 0700); },
         "a directory, not a regular file"},
        {"over 1 MiB", [](std::string const& p, std::string const& big) { writeFile(p, big); },
         "larger than 1048576 bytes"},
        {"socket",  // open() fails (ENXIO): the entry's kind is still named
         [](std::string const& p, std::string const&) {
             sockaddr_un address{};
             address.sun_family = AF_UNIX;
             std::snprintf(address.sun_path, sizeof address.sun_path, "%s", p.c_str());
             int const fd = socket(AF_UNIX, SOCK_STREAM, 0);
             (void)!bind(fd, reinterpret_cast<sockaddr const*>(&address), sizeof address);
             close(fd);
         },
         "a socket, not a regular file"},
    };
    for (Row const& row : rows) {
        SCOPED_TRACE(row.what);
        for (std::string const& path : {kOptProperties, kCwdProperties}) {
            row.make(path, huge);
            g_EnableLogError = false;
            ::testing::internal::CaptureStderr();
            if (path == kOptProperties) {
                LoadProviderProperties();
                EXPECT_FALSE(g_EnableLogError);
            } else {
                Vexlan_NIC_Properties properties;
                EXPECT_EQ(properties.linkStatusPollIntervalSeconds, 180);
                EXPECT_FALSE(properties.errorLog);
            }
            std::string const err = ::testing::internal::GetCapturedStderr();
            std::string const line = "Vexlan_CNA_Provider: Refusing settings file (" + path + "): " + row.reason + ".\n";
            EXPECT_NE(err.find(line), std::string::npos) << err;
            std::remove(path.c_str());
            rmdir(path.c_str());
        }
    }
}

TEST_F(SettingsTest, InstanceIsCreatedOnceAndNeverReread) {
    writeFile(kCwdProperties, "LinkStatusPollIntervalSeconds=12\n");
    ::testing::internal::CaptureStderr();
    Vexlan_NIC_Properties* first = Vexlan_NIC_Properties::instance();
    ::testing::internal::GetCapturedStderr();
    EXPECT_EQ(first, Vexlan_NIC_Properties::singleton);
    EXPECT_EQ(first->linkStatusPollIntervalSeconds, 12);

    writeFile(kCwdProperties, "LinkStatusPollIntervalSeconds=99\n");
    EXPECT_EQ(Vexlan_NIC_Properties::instance(), first);
    EXPECT_EQ(first->linkStatusPollIntervalSeconds, 12);
}

TEST_F(SettingsTest, PropertyFilePath) {
    char buffer[64] = "unchanged";
    EXPECT_EQ(getPropertyFilePath(buffer, 20), 0);
    EXPECT_EQ(getPropertyFilePath(nullptr, 64), 0);
    EXPECT_EQ(getPropertyFilePath(buffer, 21), 1);
    EXPECT_STREQ(buffer, "vexlancna.properties");
}

}  // namespace

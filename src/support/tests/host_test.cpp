// Host services: host names, login check, distribution, critical section,
// signal mask.
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/ossimpl-CIM.h"
#include "support/ossimpl.h"
#include "test_files.h"

#include <gtest/gtest.h>

#include <arpa/inet.h>
#include <crypt.h>
#include <netdb.h>
#include <shadow.h>
#include <sys/mount.h>
#include <unistd.h>

#include <csignal>
#include <cstring>
#include <memory>
#include <regex>
#include <thread>

using namespace support_test;

namespace {

class HostTest : public ::testing::Test {
protected:
    void SetUp() override {
        REQUIRE_ISOLATION();
        makeDirs(kLogDir);
        std::remove(kLogPath);
        g_EnableDebugPrint = true;
        g_EnableLogError = true;
        Vexlan_FC_Utils_CMPI::InitializeLogFile();
    }
};

// ---- Host names --------------------------------------------------------------

std::string systemHostName() {
    char name[256] = "";
    gethostname(name, sizeof name - 1);
    return name;
}

// Every IPv4 address the resolver knows for `name`, as dotted text.
std::vector<std::string> ipv4AddressesOf(std::string const& name) {
    std::vector<std::string> addresses;
    addrinfo hints{};
    hints.ai_family = AF_INET;
    addrinfo* result = nullptr;
    if (getaddrinfo(name.c_str(), nullptr, &hints, &result) != 0) return addresses;
    for (addrinfo* a = result; a != nullptr; a = a->ai_next) {
        char text[INET_ADDRSTRLEN];
        inet_ntop(AF_INET, &reinterpret_cast<sockaddr_in*>(a->ai_addr)->sin_addr, text, sizeof text);
        addresses.push_back(text);
    }
    freeaddrinfo(result);
    return addresses;
}

TEST_F(HostTest, HostName2IsTheSystemName) {
    char buffer[kHostNameBufferSize];
    std::memset(buffer, 'z', sizeof buffer);
    GetHostName2(buffer);
    EXPECT_EQ(std::string(buffer), systemHostName());
}

TEST_F(HostTest, HostNameIsTheFirstAddressWhenTheNameResolves) {
    char buffer[kHostNameBufferSize] = "";
    int kind = -1;
    GetHostName(buffer, &kind);

    std::vector<std::string> addresses = ipv4AddressesOf(systemHostName());
    if (addresses.empty()) {
        EXPECT_EQ(kind, HOST_NAME_KIND_NAME);
        EXPECT_EQ(std::string(buffer), systemHostName());
    } else {
        EXPECT_EQ(kind, HOST_NAME_KIND_IPV4);
        EXPECT_TRUE(std::regex_match(buffer, std::regex(R"([0-9]{1,3}(\.[0-9]{1,3}){3})"))) << buffer;
        EXPECT_NE(std::find(addresses.begin(), addresses.end(), buffer), addresses.end()) << buffer;
    }

    char small[5];
    GetHostName(small, &kind, sizeof small);
    EXPECT_EQ(std::string(small), std::string(buffer).substr(0, 4));
}

// ---- Login check -------------------------------------------------------------

std::string hashOf(char const* password) {
    auto data = std::make_unique<crypt_data>();
    std::memset(data.get(), 0, sizeof(crypt_data));
    return crypt_r(password, "$6$vexlantest$", data.get());
}

spwd entryOf(char const* name, char const* hash) {
    spwd entry{};
    entry.sp_namp = const_cast<char*>(name);
    entry.sp_pwdp = const_cast<char*>(hash);
    return entry;
}

TEST_F(HostTest, PasswordIsComparedWithTheStoredHash) {
    std::string hash = hashOf("s3cret");
    spwd entry = entryOf("alice", hash.c_str());
    EXPECT_EQ(ValidateSystemUserPassword(&entry, "s3cret"), 0);
    EXPECT_EQ(ValidateSystemUserPassword(&entry, "s3cret "), -1);
    EXPECT_EQ(ValidateSystemUserPassword(&entry, ""), -1);
    EXPECT_EQ(ValidateSystemUserPassword(nullptr, "s3cret"), -1);

    // An empty hash is hashed against with the fixed salt and never matches.
    spwd empty = entryOf("alice", "");
    EXPECT_EQ(ValidateSystemUserPassword(&empty, ""), -1);
    EXPECT_EQ(ValidateSystemUserPassword(&empty, "anything"), -1);

    spwd locked = entryOf("alice", "!");
    EXPECT_EQ(ValidateSystemUserPassword(&locked, "s3cret"), -1);
}

TEST_F(HostTest, UnknownUserIsRefused) {
    EXPECT_EQ(OSSValidateSystemUser("vexlan-no-such-user", "pw"), -1);
    EXPECT_EQ(logMessages(), std::vector<std::string>{"Invalid User Login"});
}

// Users and groups of our own: files bound over /etc/group and /etc/shadow in
// the private mount namespace of tests/isolate.sh.
class HostAccountsTest : public HostTest {
protected:
    void SetUp() override {
        HostTest::SetUp();
        if (IsSkipped()) return;
        hash_ = hashOf("pw");
        writeFile("/var/tmp/group", "root:x:0:bob\nadm:x:4:alice,dave\nusers:x:100:carol\n");
        writeFile("/var/tmp/shadow", "alice:" + hash_ + ":19000:0:99999:7:::\nbob:" + hash_ +
                                         ":19000:0:99999:7:::\ncarol:" + hash_ + ":19000:0:99999:7:::\n");
        if (!bind("/var/tmp/group", "/etc/group") || !bind("/var/tmp/shadow", "/etc/shadow"))
            GTEST_SKIP() << "can't bind test accounts over /etc";
    }
    void TearDown() override {
        for (char const* target : mounted_) umount2(target, MNT_DETACH);
    }

    bool bind(char const* source, char const* target) {
        if (mount(source, target, nullptr, MS_BIND, nullptr) != 0) return false;
        mounted_.push_back(target);
        return true;
    }

    std::string hash_;
    std::vector<char const*> mounted_;
};

// Each row one login, with the log lines it adds: a member of adm, or of
// root's member list, passes; the primary group doesn't count.
TEST_F(HostAccountsTest, OnlyMembersOfAdmOrRootWithTheirPasswordPass) {
    struct Row {
        char const* user;
        char const* password;
        int rc;
        std::vector<std::string> log;
    } const rows[] = {
        {"alice", "pw", 0, {}},
        {"bob", "pw", 0, {"ERROR - User is not of the adm group"}},
        {"alice", "wrong", -1, {"Invalid User Password"}},
        {"carol", "pw", -1,
         {"ERROR - User is not of the adm group", "ERROR - User is not of the root group",
          "Invalid User not in adm or root groups"}},
    };
    for (Row const& row : rows) {
        std::vector<std::string> const before = logMessages();
        EXPECT_EQ(OSSValidateSystemUser(row.user, row.password), row.rc) << row.user;
        std::vector<std::string> const after = logMessages();
        EXPECT_EQ(std::vector<std::string>(after.begin() + static_cast<long>(before.size()), after.end()), row.log)
            << row.user << " " << row.password;
    }
}

TEST_F(HostAccountsTest, MissingGroup) {
    spwd entry = entryOf("alice", hash_.c_str());
    EXPECT_EQ(ValidateSystemUserGroupType(&entry, "vexlan-nogroup"), -1);
    EXPECT_EQ(ValidateSystemUserGroupType(&entry, "adm"), 0);
    EXPECT_EQ(logMessages(), std::vector<std::string>{"ERROR - vexlan-nogroup group  does not exist"});
}

TEST_F(HostAccountsTest, MessagesFollowTheDebugSwitch) {
    g_EnableDebugPrint = false;
    EXPECT_EQ(OSSValidateSystemUser("carol", "pw"), -1);
    EXPECT_EQ(OSSValidateSystemUser("nobody-here", "pw"), -1);
    EXPECT_FALSE(exists(kLogPath));
}

// ---- Distribution ------------------------------------------------------------

// A writable /etc: an overlay over the real one, private to this process.
class HostDistributionTest : public HostTest {
protected:
    void SetUp() override {
        HostTest::SetUp();
        if (IsSkipped()) return;
        makeDirs("/var/tmp/etc-upper");
        makeDirs("/var/tmp/etc-work");
        if (mount("overlay", "/etc", "overlay", 0,
                  "lowerdir=/etc,upperdir=/var/tmp/etc-upper,workdir=/var/tmp/etc-work") != 0)
            GTEST_SKIP() << "no overlay mount";
        mounted_ = true;
        std::remove("/etc/SuSE-release");
        std::remove("/etc/redhat-release");
        std::strcpy(g_hostSystemType, "before");
    }
    void TearDown() override {
        if (mounted_) umount2("/etc", MNT_DETACH);
    }
    bool mounted_ = false;
};

TEST_F(HostDistributionTest, FirstLineOfTheReleaseFile) {
    GetLinuxDistributionType();  // neither file
    EXPECT_STREQ(g_hostSystemType, "before");

    writeFile("/etc/redhat-release", "Example Enterprise Linux release 9.1 (Plow)\nsecond line\n");
    GetLinuxDistributionType();
    EXPECT_STREQ(g_hostSystemType, "Linux - Example Enterprise Linux release 9.1 ");

    writeFile("/etc/redhat-release", "Example Linux 8");
    GetLinuxDistributionType();
    EXPECT_STREQ(g_hostSystemType, "Linux - Example Linux 8");

    // The other file comes first; a line is read up to 126 characters.
    writeFile("/etc/redhat-release", "not this one\n");
    writeFile("/etc/SuSE-release", std::string(200, 's') + "\n");
    GetLinuxDistributionType();
    EXPECT_EQ(std::string(g_hostSystemType), "Linux - " + std::string(126, 's'));
}

// ---- Critical section --------------------------------------------------------

TEST_F(HostTest, CriticalSectionLifecycleAndMisuse) {
    EXPECT_EQ(OSSEnterCriticalSection(), -1);  // not set up yet
    EXPECT_EQ(OSSLeaveCriticalSection(), -1);
    EXPECT_EQ(OSSDeleteCriticalSection(), -1);

    ASSERT_EQ(OSSInitCriticalSection(), 0);
    ASSERT_NE(g_ossCriticalSection, nullptr);
    EXPECT_EQ(OSSEnterCriticalSection(), 0);
    EXPECT_EQ(OSSEnterCriticalSection(), -1);  // relocking is reported, not a hang

    int fromOtherThread = 0;
    std::thread([&] { fromOtherThread = OSSLeaveCriticalSection(); }).join();
    EXPECT_EQ(fromOtherThread, -1);

    EXPECT_EQ(OSSDeleteCriticalSection(), -1);  // still locked
    EXPECT_NE(g_ossCriticalSection, nullptr);
    EXPECT_EQ(OSSLeaveCriticalSection(), 0);
    EXPECT_EQ(OSSLeaveCriticalSection(), -1);
    EXPECT_EQ(OSSDeleteCriticalSection(), 0);
    EXPECT_EQ(g_ossCriticalSection, nullptr);

    std::vector<std::string> expected = {
        "OSSEnterCriticalSection: The mutex has not been properly initialized!",
        "OSSLeaveCriticalSection: The mutex has not been properly initialized!",
        "OSSEnterCriticalSection: The mutex is already locked by the caller!",
        "OSSLeaveCriticalSection: The caller does not own the mutex!",
        "OSSDeleteCriticalSection: The mutex is currently locked!",
        "OSSLeaveCriticalSection: The caller does not own the mutex!",
    };
    EXPECT_EQ(logMessages(), expected);
}

// ---- Small services ----------------------------------------------------------

TEST_F(HostTest, PreInitializeBlocksTheFourSignalsOfTheCallingThread) {
    sigset_t blocked;
    sigemptyset(&blocked);
    int result = -2;
    std::thread([&] {
        result = OSSPreInitializeDevices();
        pthread_sigmask(SIG_BLOCK, nullptr, &blocked);
    }).join();
    EXPECT_EQ(result, 0);
    for (int signal : {SIGINT, SIGHUP, SIGTERM, SIGPIPE}) EXPECT_EQ(sigismember(&blocked, signal), 1) << signal;
    EXPECT_EQ(sigismember(&blocked, SIGUSR1), 0);

    sigset_t own;
    pthread_sigmask(SIG_BLOCK, nullptr, &own);
    EXPECT_EQ(sigismember(&own, SIGTERM), 0);  // other threads keep their mask
}

TEST_F(HostTest, CoreAllocationsStartZeroed) {
    auto* block = static_cast<unsigned char*>(CoreZMalloc(64));
    ASSERT_NE(block, nullptr);
    for (int i = 0; i < 64; ++i) EXPECT_EQ(block[i], 0) << i;
    CoreFree(block);
}

}  // namespace

// Helpers of the provider's integration tests. Every test program runs under
// tests/isolate.sh: /opt and /var/tmp are private and empty, the working
// directory is fresh, so the settings files and the log are the test's own.
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "cimhost/host.h"
#include "zorap_sim_control.h"

namespace provtest {

constexpr const char* kNamespace = "root/vexlan_cmpi";
constexpr const char* kProviderName = "Vexlan_CNA_Provider";
extern const char* const kLogPath;
// Settings that switch the debug and the error log on.
constexpr const char* kLogsOn = "DebugLog=1\nErrorLog=1\n";

// Creates the log directory and writes the two settings files: the one the
// provider's constructor reads under /opt (log switches) and the one in the
// working directory (poll interval). An empty text leaves a file out.
void writeSettings(const std::string& optSettings, const std::string& cwdSettings);
void writeFile(const std::string& path, const std::string& text);
// A file's text ("" when it can't be read).
std::string fileText(const std::string& path);
// Compares `text` with the file kept at `path`; with `recordDir` set (from an
// environment variable) writes it to recordDir/<the file's name> instead.
void expectAsKept(const std::string& text, const std::string& path, const char* recordDir);
// Replaces every occurrence of `from` in `text`.
void replaceAll(std::string& text, const std::string& from, const std::string& to);
void removeLog();

// What a careless or hostile administrator may leave where the provider
// expects a regular file.
enum class Planted { Fifo, DevZeroLink, Directory, Oversize };
extern const Planted kPlantedKinds[4];
// Replaces whatever stands at `path` by such an entry; Oversize is a sparse
// regular file of `oversizeBytes`.
void plant(Planted kind, const std::string& path, std::size_t oversizeBytes);
// The reason the provider gives for refusing it ("a FIFO, not a regular file").
std::string plantedReason(Planted kind, std::size_t bound);
const char* plantedName(Planted kind);

// Standard error of the process, collected into a file while the object lives.
class StderrCapture {
public:
    StderrCapture();
    ~StderrCapture();
    // What was written so far.
    std::string text() const;

private:
    int saved_;
    std::string path_;
};

// The provider's log, line by line (time stamp included).
std::vector<std::string> logLines();
// Lines that contain `text`.
int countLog(const std::string& text);
// Waits until a line contains `text` (true) or the time is up (false).
bool waitForLog(const std::string& text, std::chrono::seconds limit, int occurrences = 1);

// A strict host in the provider's namespace with the class definitions of
// the build, the provider loaded (its factories run at the first request).
void prepareHost(cimhost::Host& host, cimhost::Flavour flavour = cimhost::Flavour::Pegasus);

cimhost::ObjectPath classPath(const std::string& className);

// The Vexlan classes of the loaded class definitions that the provider
// serves (indications aside): instance classes and associations.
struct Classes {
    std::vector<std::string> instances;
    std::vector<std::string> associations;
};
Classes providerClasses(cimhost::Host& host);
// The path of the host's computer system with the given Name key value.
cimhost::ObjectPath hostPath(const cimhost::Value& name);

// The installation service of the FC HBAs or of the NIC functions.
cimhost::ObjectPath servicePath(bool nic);
// The JobState of the update job at `job`, 0 when it can't be read; and the
// wait until it is `wanted` (5 s at most), which gives the last state read.
std::uint64_t jobState(cimhost::Host& host, const cimhost::ObjectPath& job);
std::uint64_t waitJobState(cimhost::Host& host, const cimhost::ObjectPath& job, std::uint64_t wanted);

// What the provider should report for the host: the first address of the
// host's name when the resolver knows it (NameFormat "IP"), else the plain
// name ("DNSName").
struct ExpectedHost {
    std::string name;
    std::string nameFormat;
};
ExpectedHost expectedHost();

// Threads of this process (sanitizer helper threads included from the start).
int threadCount();

std::string propertyText(const cimhost::Instance& inst, const std::string& name);
std::vector<std::string> propertyNames(const cimhost::Instance& inst);

std::vector<std::string> keyNames(const cimhost::ObjectPath& path);

// A scalar property, checked for its CIM type (a missing one fails the test
// and gives an empty value).
const cimhost::Value& scalar(const cimhost::Instance& inst, const std::string& name, cimhost::Type type);

// enumerateInstances, expected to succeed with nothing for strict mode to
// object to.
cimhost::OpResult enumerate(cimhost::Host& host, const std::string& className);

// Starts the provider with `optSettings` as the settings under /opt, no log
// yet and the adapter description `description` (JSON; null: the default
// host). With `firstClass` a first enumerateInstanceNames of that class makes
// the provider build its lists before the test goes on.
void startProvider(cimhost::Host& host, const std::string& optSettings, const char* description,
                   const char* firstClass);

// A suite that shares one provider load: its SetUpTestSuite calls
// startSuite(); the host goes at the suite's end, and the adapter library's
// injected faults are cleared after every test.
template <class Suite>
class ProviderSuite : public ::testing::Test {
protected:
    static void startSuite(const std::string& optSettings, const char* description, const char* firstClass)
    {
        host_ = new cimhost::Host;
        startProvider(*host_, optSettings, description, firstClass);
    }
    static void TearDownTestSuite()
    {
        delete host_;
        host_ = nullptr;
        zorap_sim_reset();
    }
    void TearDown() override { zorap_sim_reset(); }
    static cimhost::Host& host() { return *host_; }
    static inline cimhost::Host* host_ = nullptr;
};

}  // namespace provtest

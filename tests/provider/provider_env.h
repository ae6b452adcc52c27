// Helpers of the provider's integration tests. Every test program runs under
// tests/isolate.sh: /opt and /var/tmp are private and empty, the working
// directory is fresh, so the settings files and the log are the test's own.
#pragma once

#include <chrono>
#include <functional>
#include <string>
#include <vector>

#include "cimhost/host.h"

namespace provtest {

constexpr const char* kNamespace = "root/vexlan_cmpi";
constexpr const char* kProviderName = "Vexlan_CNA_Provider";
extern const char* const kLogPath;

// Creates the log directory and writes the two settings files: the one the
// provider's constructor reads under /opt (log switches) and the one in the
// working directory (poll interval). An empty text leaves a file out.
void writeSettings(const std::string& optSettings, const std::string& cwdSettings);
void writeFile(const std::string& path, const std::string& text);
void removeLog();

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
// The path of the host's computer system with the given Name key value.
cimhost::ObjectPath hostPath(const cimhost::Value& name);

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

}  // namespace provtest

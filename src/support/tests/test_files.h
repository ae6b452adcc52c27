// File helpers of the support tests. Tests that use the fixed paths run under
// tests/isolate.sh, where /opt and /var/tmp are private and empty.
#ifndef VEXLAN_SUPPORT_TESTS_TEST_FILES_H
#define VEXLAN_SUPPORT_TESTS_TEST_FILES_H

#include <sys/stat.h>
#include <unistd.h>

#include <cstdio>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

namespace support_test {

inline char const* const kProviderDir = "/opt/Vexlan_Corporation/CNAProviders";
inline char const* const kLogDir = "/opt/Vexlan_Corporation/CNAProviders/log";
inline char const* const kLogPath = "/opt/Vexlan_Corporation/CNAProviders/log/Vexlan_CNA_Provider.log";
inline char const* const kPrevLogPath = "/opt/Vexlan_Corporation/CNAProviders/log/Vexlan_CNA_Provider_prev.log";

// True when the private /opt of tests/isolate.sh is in place; tests that
// write fixed paths refuse to run elsewhere.
inline bool isolated() {
    std::ifstream mounts("/proc/self/mounts");
    std::string line;
    while (std::getline(mounts, line)) {
        if (line.rfind("vexlan-opt /opt ", 0) == 0) return true;
    }
    return false;
}

inline void makeDirs(std::string const& path) {
    std::string partial;
    std::stringstream parts(path);
    std::string part;
    while (std::getline(parts, part, '/')) {
        if (part.empty()) continue;
        partial += "/" + part;
        mkdir(partial.c_str(), 0755);
    }
}

inline bool exists(std::string const& path) {
    struct stat info;
    return stat(path.c_str(), &info) == 0;
}

inline std::string readFile(std::string const& path) {
    std::ifstream in(path, std::ios::binary);
    std::stringstream content;
    content << in.rdbuf();
    return content.str();
}

inline void writeFile(std::string const& path, std::string const& content) {
    std::ofstream out(path, std::ios::binary | std::ios::trunc);
    out << content;
}

inline std::vector<std::string> readLines(std::string const& path) {
    std::vector<std::string> lines;
    std::ifstream in(path);
    std::string line;
    while (std::getline(in, line)) lines.push_back(line);
    return lines;
}

// The message part of a log line: what follows the 24-character time stamp
// and its blank.
inline std::string messageOf(std::string const& line) { return line.size() >= 25 ? line.substr(25) : std::string(); }

inline std::vector<std::string> logMessages(std::string const& path = kLogPath) {
    std::vector<std::string> messages;
    for (std::string const& line : readLines(path)) messages.push_back(messageOf(line));
    return messages;
}

}  // namespace support_test

#define REQUIRE_ISOLATION()                                                        \
    do {                                                                           \
        if (!support_test::isolated()) GTEST_SKIP() << "needs tests/isolate.sh";   \
    } while (0)

#endif

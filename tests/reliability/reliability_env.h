// Helpers of the reliability tests: the stress run, the table of adapter
// library faults and the unload and reload cycles. Every program runs under
// tests/isolate.sh (private /opt and /var/tmp, fresh working directory).
#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include "cimhost/host.h"
#include "provider_env.h"

namespace reltest {

// The long form of the runs (30 s of stress, 100 reload cycles, every fault
// in every phase): on in the ThreadSanitizer build, or with
// VEXLAN_RELIABILITY_FULL=1 in the environment; VEXLAN_RELIABILITY_FULL=0
// forces the short form that `make test` runs.
bool fullRun();

// The FC HBA and the CNA of the default host: their serials name the flash
// targets.
extern const char kFcSerial[];
extern const char kNicSerial[];
// The first FC port and the first NIC interface of the default host.
extern const char kFcPort[];
extern const char kInterface[];

// The default description's text, and variants of it.
std::string defaultDescription();
// Live state only: the first FC port's state and the first NIC link.
std::string withLiveState(const std::string& text, bool portOnline, bool linkUp);
// A configuration change: the last adapter (the single-port FC HBA) removed.
std::string withoutLastAdapter(const std::string& text);
// Writes a description file whole (a temporary file renamed into place), so
// that the library never reads half of it.
void replaceFile(const std::string& path, const std::string& text);

// Waits until two polls have started after now: the first one has seen any
// change of the description written before, and the second starts only when
// the first (and its rebuild) is over. False when that takes over 60 s.
bool pollsSettled();

using provtest::Classes;
using provtest::providerClasses;

// Instance names of every class, by class; the job classes, which follow the
// flash jobs and not the adapters, are left out.
using Counts = std::map<std::string, std::size_t>;
Counts countAll(cimhost::Host& host, const Classes& classes);
// "<class>: <got> instead of <wanted>" for each class that differs.
std::vector<std::string> countDifferences(const Counts& got, const Counts& wanted);

// Every request kind on one class: enumerateInstanceNames, enumerateInstances
// and getInstance of the first name; for an association also associatorNames,
// associators, referenceNames and references from the first pair's first end.
// Problems (a status other than success, NOT_FOUND of a getInstance, a strict
// check the host failed) are added to `problems`. The number of requests made.
int requestEveryKind(cimhost::Host& host, const std::string& cls, bool association,
                     std::vector<std::string>& problems);

// A flash job of the FC HBA (or the CNA's NIC functions) from an image file
// under /var/tmp; the library's write takes `durationMs` and returns
// `result` (a successful write changes the adapter's versions, which counts
// as a configuration change). The method's return value (4096: the job
// started) and the job's path.
struct Job {
    std::uint64_t value = 0;
    cimhost::ObjectPath path;
};
Job startFlashJob(cimhost::Host& host, bool nic, std::uint32_t durationMs, std::uint32_t result = 0);
// The job's JobState (7 completed, 10 exception), 0 when it can't be read.
std::uint64_t jobState(cimhost::Host& host, const Job& job);
// Waits until the job has ended (a state other than 4, running); its state.
std::uint64_t waitJobEnd(cimhost::Host& host, const Job& job);

// Resources of this process.
int openFileCount();
// Bytes of heap in use (the sanitizer's allocator in sanitizer builds).
std::size_t heapInUse();

}  // namespace reltest

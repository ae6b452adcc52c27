#include "reliability_env.h"

#include <dirent.h>
#include <malloc.h>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <sstream>
#include <thread>

#include "cmpidt.h"
#include "zorap_sim_control.h"

#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
// The sanitizer's allocator replaces malloc; its runtime tells the heap in use.
extern "C" std::size_t __sanitizer_get_current_allocated_bytes(void);
#define RELTEST_SANITIZER_HEAP 1
#endif

namespace reltest {

using cimhost::Host;
using cimhost::ObjectPath;
using cimhost::OpResult;
using cimhost::Value;

const char kFcSerial[] = "VXA1631K0042";
const char kNicSerial[] = "VXC2447M0193";
const char kFcPort[] = "31:00:02:7e:5a:16:00:42";
const char kInterface[] = "enp5s0f0";

bool fullRun()
{
    const char* forced = std::getenv("VEXLAN_RELIABILITY_FULL");
    if (forced != nullptr && *forced != '\0')
        return *forced != '0';
#ifdef VEXLAN_RELIABILITY_FULL_DEFAULT
    return true;
#else
    return false;
#endif
}

std::string defaultDescription()
{
    if (zorap_sim_load_default() != 0)
        return std::string();
    return provtest::fileText(zorap_sim_description_path());
}

namespace {

// The text with the first occurrence of `from` replaced (unchanged if none).
std::string replaceFirst(std::string text, const std::string& from, const std::string& to)
{
    const std::size_t at = text.find(from);
    if (at != std::string::npos)
        text.replace(at, from.size(), to);
    return text;
}

}  // namespace

std::string withLiveState(const std::string& text, bool portOnline, bool linkUp)
{
    std::string out = replaceFirst(text, "\"state\": \"online\"",
                                   std::string("\"state\": \"") + (portOnline ? "online" : "loopdown") + "\"");
    return replaceFirst(out, "\"linkState\": \"up\"",
                        std::string("\"linkState\": \"") + (linkUp ? "up" : "down") + "\"");
}

std::string withoutLastAdapter(const std::string& text)
{
    // The adapters are objects of the "adapters" array, one per "model".
    const std::size_t last = text.rfind("\"model\"");
    const std::size_t open = last == std::string::npos ? last : text.rfind('{', last);
    const std::size_t comma = open == std::string::npos ? open : text.rfind(',', open);
    if (comma == std::string::npos)
        return text;
    return text.substr(0, comma) + "\n  ]\n}\n";
}

void replaceFile(const std::string& path, const std::string& text)
{
    const std::string temporary = path + ".new";
    {
        std::ofstream out(temporary, std::ios::trunc);
        out << text;
    }
    std::rename(temporary.c_str(), path.c_str());
}

bool pollsSettled()
{
    const unsigned long start = zorap_sim_call_count(ZORAP_FN_DidConfigChange);
    const auto until = std::chrono::steady_clock::now() + std::chrono::seconds(60);
    while (zorap_sim_call_count(ZORAP_FN_DidConfigChange) < start + 2) {
        if (std::chrono::steady_clock::now() > until)
            return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(50));
    }
    return true;
}

Counts countAll(Host& host, const Classes& classes)
{
    Counts counts;
    for (const auto* list : {&classes.instances, &classes.associations})
        for (const std::string& cls : *list)
            if (cls.find("Job") == std::string::npos)
                counts[cls] = host.enumerateInstanceNames(provtest::classPath(cls)).paths.size();
    return counts;
}

std::vector<std::string> countDifferences(const Counts& got, const Counts& wanted)
{
    std::vector<std::string> out;
    for (const auto& w : wanted) {
        auto g = got.find(w.first);
        const std::size_t n = g == got.end() ? 0 : g->second;
        if (n != w.second)
            out.push_back(w.first + ": " + std::to_string(n) + " instead of " + std::to_string(w.second));
    }
    return out;
}

namespace {

void check(const OpResult& r, const std::string& what, std::vector<std::string>& problems, bool missOk = false)
{
    if (!r.ok() && !(missOk && r.rc == CMPI_RC_ERR_NOT_FOUND))
        problems.push_back(what + ": " + cimhost::statusLine(r));
    if (!r.strictErrors.empty())
        problems.push_back(what + ": " + r.strictErrors[0]);
}

}  // namespace

int requestEveryKind(Host& host, const std::string& cls, bool association, std::vector<std::string>& problems)
{
    const ObjectPath path = provtest::classPath(cls);
    const OpResult names = host.enumerateInstanceNames(path);
    check(names, cls + " enumerateInstanceNames", problems);
    check(host.enumerateInstances(path), cls + " enumerateInstances", problems);
    int requests = 2;
    if (names.paths.empty())
        return requests;
    // A rebuild between the two requests may take the instance away.
    check(host.getInstance(names.paths.front()), cls + " getInstance", problems, true);
    ++requests;
    if (!association)
        return requests;
    const ObjectPath& pair = names.paths.front();
    if (pair.keys.empty() || !pair.keys[0].second.ref)
        return requests;
    const ObjectPath& end = *pair.keys[0].second.ref;
    cimhost::AssocParams params;
    params.assocClass = cls;
    check(host.associatorNames(end, params), cls + " associatorNames", problems);
    check(host.associators(end, params), cls + " associators", problems);
    cimhost::AssocParams refs;
    refs.resultClass = cls;
    check(host.referenceNames(end, refs), cls + " referenceNames", problems);
    check(host.references(end, refs), cls + " references", problems);
    return requests + 4;
}

Job startFlashJob(Host& host, bool nic, std::uint32_t durationMs, std::uint32_t result)
{
    const std::string image = "/var/tmp/reliability-image.bin";
    {
        std::ofstream out(image, std::ios::binary | std::ios::trunc);
        out << std::string(1024, '\x5a');
    }
    ObjectPath target = provtest::classPath(nic ? "Vexlan_NIC_PortController" : "Vexlan_FCHBA_PortController");
    target.setKey("DeviceID", Value::fromString(nic ? std::string(kNicSerial) + "_NIC" : std::string(kFcSerial)));
    // 32768: run as a job.
    std::vector<Value> options{Value::fromUnsigned(cimhost::Type::UInt16, 32768)};
    std::vector<cimhost::NamedValue> in = {{"URI", Value::fromString(image)},
                                           {"Target", Value::fromRef(target)},
                                           {"InstallOptions", Value::arrayOf(cimhost::Type::UInt16, options)}};
    zorap_sim_set_next_flash(result, durationMs);
    const OpResult r = host.invokeMethod(provtest::servicePath(nic), "InstallFromURI", in);
    Job job;
    job.value = r.data.empty() ? 0xDEAD : r.data[0].u;
    for (const cimhost::NamedValue& a : r.outArgs)
        if (a.first == "Job" && a.second.ref)
            job.path = *a.second.ref;
    return job;
}

std::uint64_t jobState(Host& host, const Job& job)
{
    return provtest::jobState(host, job.path);
}

std::uint64_t waitJobEnd(Host& host, const Job& job)
{
    // A write takes at most its duration; 60 s is room for a loaded machine.
    const auto until = std::chrono::steady_clock::now() + std::chrono::seconds(60);
    std::uint64_t state = jobState(host, job);
    while (state == 4 && std::chrono::steady_clock::now() < until) {
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
        state = jobState(host, job);
    }
    return state;
}

int openFileCount()
{
    int n = 0;
    if (DIR* d = opendir("/proc/self/fd")) {
        while (dirent* e = readdir(d))
            if (e->d_name[0] != '.')
                ++n;
        closedir(d);
    }
    return n - 1;  // the listing's own descriptor
}

std::size_t heapInUse()
{
#ifdef RELTEST_SANITIZER_HEAP
    return __sanitizer_get_current_allocated_bytes();
#else
    return mallinfo2().uordblks;
#endif
}

}  // namespace reltest

// The benchmark driver: loads the provider into the embedded CIM host and runs
// the requests of one benchmark host in a fixed order, printing one JSON line
// per request (label, instance count, median wall time). Under callgrind each
// request is counted on its own: the counters are zeroed before it and dumped
// after it under the request's label. bench/run_bench.py drives it.
//
//   vexlan_bench --provider LIB --mof DIR [--repeat N] [--walks-only] CLASS...
//
// --walks-only runs the start, GetInstance of the computer system (the fixed
// cost of a request) and the associations from the system, the first FC port
// and the first storage extent, and nothing else.
//
// The requests: the first one (the provider's start and its first build);
// EnumerateInstanceNames, EnumerateInstances and GetInstance of the first and
// last entry of every class given; associators and references (and their
// names) from the computer system, from the first FC port (or Ethernet
// port) and from the first storage extent; then the process's resident memory.
#include <sys/resource.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <functional>
#include <string>
#include <vector>

#include "cimhost/host.h"
#include "cimhost/text.h"

#if __has_include(<valgrind/callgrind.h>)
#include <valgrind/callgrind.h>
#define BENCH_ZERO() CALLGRIND_ZERO_STATS
#define BENCH_DUMP(label) CALLGRIND_DUMP_STATS_AT(label)
#define BENCH_UNDER_VALGRIND() (RUNNING_ON_VALGRIND != 0)
#else
#define BENCH_ZERO() ((void)0)
#define BENCH_DUMP(label) ((void)(label))
#define BENCH_UNDER_VALGRIND() false
#endif

namespace {

constexpr const char* kNamespace = "root/vexlan_cmpi";
constexpr const char* kProviderName = "Vexlan_CNA_Provider";

struct Options {
    std::string provider;
    std::string mof;
    int repeat = 3;
    bool walksOnly = false;
    std::vector<std::string> classes;
};

std::string jsonText(const std::string& s)
{
    std::string out = "\"";
    for (char c : s) {
        if (c == '"' || c == '\\') {
            out += '\\';
            out += c;
        } else if (static_cast<unsigned char>(c) < 0x20) {
            char esc[8];
            std::snprintf(esc, sizeof esc, "\\u%04x", c);
            out += esc;
        } else {
            out += c;
        }
    }
    return out + "\"";
}

cimhost::ObjectPath classPath(const std::string& className)
{
    cimhost::ObjectPath p;
    p.nameSpace = kNamespace;
    p.className = className;
    return p;
}

// Runs one request `repeat` times (once under valgrind, where the first run is
// the counted one) and prints its line. Returns the result of the first run.
cimhost::OpResult measure(const Options& opt, const std::string& label, const std::string& kind,
                          const std::string& className, const std::function<cimhost::OpResult()>& op)
{
    const int runs = BENCH_UNDER_VALGRIND() ? 1 : std::max(1, opt.repeat);
    std::vector<double> micros;
    cimhost::OpResult first;
    for (int i = 0; i < runs; ++i) {
        BENCH_ZERO();
        const auto t0 = std::chrono::steady_clock::now();
        cimhost::OpResult r = op();
        const auto t1 = std::chrono::steady_clock::now();
        BENCH_DUMP(label.c_str());
        micros.push_back(std::chrono::duration<double, std::micro>(t1 - t0).count());
        if (i == 0) first = std::move(r);
    }
    std::sort(micros.begin(), micros.end());
    const std::size_t results = first.instances.size() + first.paths.size();
    // The classes of the results, each once, in the order they came.
    std::vector<std::string> classes;
    auto note = [&](const std::string& c) {
        if (std::find(classes.begin(), classes.end(), c) == classes.end())
            classes.push_back(c);
    };
    for (const auto& i : first.instances)
        note(i.className());
    for (const auto& p : first.paths)
        note(p.className);
    std::string classList;
    for (const auto& c : classes)
        classList += (classList.empty() ? "" : ", ") + jsonText(c);
    std::printf("{\"label\": %s, \"kind\": %s, \"class\": %s, \"rc\": %d, \"results\": %zu, "
                "\"classes\": [%s], \"wall_us\": %.1f, \"runs\": %d}\n",
                jsonText(label).c_str(), jsonText(kind).c_str(), jsonText(className).c_str(), first.rc, results,
                classList.c_str(), micros[micros.size() / 2], runs);
    std::fflush(stdout);
    return first;
}

long statusKib(const char* field)
{
    std::ifstream in("/proc/self/status");
    const std::size_t n = std::strlen(field);
    for (std::string line; std::getline(in, line);)
        if (line.compare(0, n, field) == 0 && line.size() > n && line[n] == ':')
            return std::strtol(line.c_str() + n + 1, nullptr, 10);
    return -1;
}

void printMemory(const char* label)
{
    std::printf("{\"label\": %s, \"kind\": \"memory\", \"rss_kib\": %ld, \"hwm_kib\": %ld}\n", jsonText(label).c_str(),
                statusKib("VmRSS"), statusKib("VmHWM"));
    std::fflush(stdout);
}

void associationsFrom(const Options& opt, cimhost::Host& host, const std::string& end, const cimhost::ObjectPath& path)
{
    const std::string cls = path.className;
    measure(opt, "ai " + end, "ai", cls, [&] { return host.associators(path); });
    measure(opt, "ain " + end, "ain", cls, [&] { return host.associatorNames(path); });
    measure(opt, "ri " + end, "ri", cls, [&] { return host.references(path); });
    measure(opt, "rin " + end, "rin", cls, [&] { return host.referenceNames(path); });
}

int usage()
{
    std::fprintf(stderr, "usage: vexlan_bench --provider LIB --mof DIR [--repeat N] [--walks-only] CLASS...\n");
    return 2;
}

}  // namespace

int main(int argc, char** argv)
{
    Options opt;
    for (int i = 1; i < argc; ++i) {
        const std::string a = argv[i];
        if ((a == "--provider" || a == "--mof" || a == "--repeat") && i + 1 < argc) {
            const std::string v = argv[++i];
            if (a == "--provider")
                opt.provider = v;
            else if (a == "--mof")
                opt.mof = v;
            else
                opt.repeat = std::atoi(v.c_str());
        } else if (a == "--walks-only") {
            opt.walksOnly = true;
        } else if (!a.empty() && a[0] == '-') {
            return usage();
        } else {
            opt.classes.push_back(a);
        }
    }
    if (opt.provider.empty() || opt.mof.empty())
        return usage();

    cimhost::Host host;
    host.setDefaultNamespace(kNamespace);
    if (cimhost::Status st = host.loadMof(opt.mof); !st.ok()) {
        std::fprintf(stderr, "vexlan_bench: class definitions: %s\n", st.message.c_str());
        return 1;
    }
    if (cimhost::Status st = host.load(opt.provider, kProviderName); !st.ok()) {
        std::fprintf(stderr, "vexlan_bench: provider: %s\n", st.message.c_str());
        return 1;
    }

    // The first request loads the provider's MIs; its initialize starts the
    // polling thread, whose first build the request waits for.
    const std::string system = "Vexlan_Adapter_ComputerSystem";
    BENCH_ZERO();
    cimhost::OpResult systems = host.enumerateInstanceNames(classPath(system));
    BENCH_DUMP("start");
    std::printf("{\"label\": \"start\", \"kind\": \"start\", \"class\": %s, \"rc\": %d, \"results\": %zu}\n",
                jsonText(system).c_str(), systems.rc, systems.paths.size());
    printMemory("memory after start");

    cimhost::ObjectPath port;
    cimhost::ObjectPath extent;
    if (opt.walksOnly) {
        if (!systems.paths.empty()) {
            const cimhost::ObjectPath cs = systems.paths.front();
            measure(opt, "gi first " + system, "gi first", system, [&] { return host.getInstance(cs); });
        }
        for (const char* cls : {"Vexlan_FCHBA_FCPort", "Vexlan_FCHBA_StorageExtent"}) {
            const cimhost::OpResult names = host.enumerateInstanceNames(classPath(cls));
            if (names.ok() && !names.paths.empty())
                (std::strcmp(cls, "Vexlan_FCHBA_FCPort") == 0 ? port : extent) = names.paths.front();
        }
    }
    for (const auto& cls : opt.walksOnly ? std::vector<std::string>{} : opt.classes) {
        const cimhost::ObjectPath cp = classPath(cls);
        cimhost::OpResult names = measure(opt, "ein " + cls, "ein", cls, [&] { return host.enumerateInstanceNames(cp); });
        measure(opt, "ei " + cls, "ei", cls, [&] { return host.enumerateInstances(cp); });
        if (!names.ok() || names.paths.empty())
            continue;
        const cimhost::ObjectPath firstPath = names.paths.front();
        const cimhost::ObjectPath lastPath = names.paths.back();
        measure(opt, "gi first " + cls, "gi first", cls, [&] { return host.getInstance(firstPath); });
        measure(opt, "gi last " + cls, "gi last", cls, [&] { return host.getInstance(lastPath); });
        if (port.className.empty() && (cls == "Vexlan_FCHBA_FCPort" || cls == "Vexlan_NIC_EthernetPort2"))
            port = firstPath;
        if (cls == "Vexlan_FCHBA_StorageExtent")
            extent = firstPath;
    }

    if (!systems.paths.empty())
        associationsFrom(opt, host, "system", systems.paths.front());
    if (!port.className.empty())
        associationsFrom(opt, host, "port", port);
    if (!extent.className.empty())
        associationsFrom(opt, host, "extent", extent);

    printMemory("memory at end");
    return 0;
}

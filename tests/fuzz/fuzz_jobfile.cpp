// Any bytes as the job file "vxln_cna_provider.config" in /var/tmp: the jobs
// are read back from it, a key is looked up and set through the preference
// file store (by name and through an open file), and the jobs read are saved
// again. The input's head chooses the log switches, the present time, the
// key and the value; the rest is the file. Runs only under tests/isolate.sh.
#include <cstdint>
#include <cstring>
#include <string>

#include "fuzz_input.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/Vexlan_NIC_PrefFile.h"
#include "update/JobPersistence.h"

namespace {

const unsigned char* bytesOf(const std::string& s) { return reinterpret_cast<const unsigned char*>(s.c_str()); }

// A value found lies within the store's line buffer, terminated.
void checkFound(const char* value) {
    if (value != nullptr && strnlen(value, kPrefLineSize) == kPrefLineSize) __builtin_trap();
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    fuzzin::startIsolated("fuzz_jobfile");
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    fuzzin::Reader in(data, size);
    const std::uint8_t switches = in.byte();
    const unsigned long long now = in.number(8);
    const std::string key = in.text(1024);
    const std::string value = in.text(1024);
    char path[kPrefPathSize];
    GetPrefFileFullPath(kPrefFileName, path);
    if (!fuzzin::writeWhole(path, in.rest()) || chmod(path, 0600) != 0) return 0;
    g_EnableDebugPrint = (switches & 1) != 0;
    g_EnableLogError = (switches & 2) != 0;

    ConcreteJobMap jobs;
    DeserializeJobsFromPrefFile(jobs, now);
    checkFound(PrefGetProperty(nullptr, bytesOf(key)));
    PrefSetProperty(nullptr, bytesOf(key), bytesOf(value));
    if (FILE* file = PrefOpenPreferenceFile(kPrefFileName)) {
        checkFound(PrefGetProperty(file, bytesOf(value)));
        PrefSetProperty(file, bytesOf(value), bytesOf(key));
        PrefClosePreferenceFile(file);
    }
    SerializeJobsToPrefFile(jobs);
    ConcreteJobMap again;
    DeserializeJobsFromPrefFile(again, now);

    g_EnableDebugPrint = false;
    g_EnableLogError = false;
    return 0;
}

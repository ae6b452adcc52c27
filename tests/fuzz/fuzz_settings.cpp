// Any bytes as "vexlancna.properties": the provider constructor's reader
// takes them from /opt/Vexlan_Corporation/CNAProviders, the NIC settings
// object from the working directory. With the debug log switched on the
// configuration lines go to the log. Runs only under tests/isolate.sh.
#include <cstdint>
#include <cstring>
#include <string>

#include "fuzz_input.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/Vexlan_NIC_Properties.h"

namespace {

const char kOptSettings[] = "/opt/Vexlan_Corporation/CNAProviders/" VEXLAN_PROPERTIES_FILE_NAME;


}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    fuzzin::startIsolated("fuzz_settings");
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    std::string bytes(reinterpret_cast<const char*>(data), size);
    if (!fuzzin::writeWhole(kOptSettings, bytes) || !fuzzin::writeWhole(VEXLAN_PROPERTIES_FILE_NAME, bytes))
        return 0;
    LoadProviderProperties();
    fuzzin::requireTerminated(g_InteropNamespace);
    fuzzin::requireTerminated(g_CIMOMNameVersion);
    fuzzin::requireTerminated(g_CIMSchemaVersion);
    Vexlan_NIC_Properties settings;
    fuzzin::requireTerminated(settings.interopNamespace);
    fuzzin::requireTerminated(settings.implementationNamespace);
    // The log stays off between inputs, as the next reading starts.
    g_EnableDebugPrint = false;
    g_EnableLogError = false;
    return 0;
}

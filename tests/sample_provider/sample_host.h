// What the sample provider's tests share: the flavour in a test's name and
// a fixture whose host, in strict mode, has the sample MOF and the sample
// provider loaded.
#ifndef SAMPLE_PROVIDER_SAMPLE_HOST_H
#define SAMPLE_PROVIDER_SAMPLE_HOST_H

#include "cimhost/host.h"

#include <gtest/gtest.h>

#include <string>

namespace sample_test {

inline constexpr const char* kNs = "root/sample";

inline std::string flavourTestName(const ::testing::TestParamInfo<cimhost::Flavour>& param)
{
    return cimhost::flavourName(param.param);
}

class SampleHostTest : public ::testing::TestWithParam<cimhost::Flavour> {
protected:
    cimhost::Host host;

    void SetUp() override
    {
        host.setFlavour(GetParam());
        host.setStrict(true);
        host.setDefaultNamespace(kNs);
        ASSERT_TRUE(host.loadMof(SAMPLE_MOF).ok());
        cimhost::Status st = host.load(SAMPLE_PROVIDER_LIB, "Sample_Provider");
        ASSERT_TRUE(st.ok()) << cimhost::statusLine(st);
    }
};

} // namespace sample_test

#endif

// The sample provider loaded by the embedded host in strict mode, as each of
// the two server flavours calls it: creating, modifying and deleting through
// the wrapper (the shipped provider refuses them), and what its library
// exports. Every other operation kind over this provider is driven verb by
// verb by host/tests/cimhost_cli_test.sh; the wrapper's drivers and values
// have their own tests in platform/cmpi/tests, the host's in host/tests.
#include "cimhost/host.h"
#include "sample_host.h"
#include "cmpidt.h"

#include <gtest/gtest.h>

#include <dlfcn.h>

#include <string>
#include <vector>

using cimhost::Flavour;
using cimhost::Host;
using cimhost::Instance;
using cimhost::ObjectPath;
using cimhost::OpResult;
using cimhost::Type;
using cimhost::Value;
using sample_test::flavourTestName;
using sample_test::kNs;

namespace {

ObjectPath path(const char* cls, const char* key = nullptr, const char* value = nullptr)
{
    ObjectPath p;
    p.nameSpace = kNs;
    p.className = cls;
    if (key != nullptr)
        p.setKey(key, Value::fromString(value));
    return p;
}

class SampleProvider : public sample_test::SampleHostTest {
protected:
    // Fails the test when the host's strict check found anything.
    static void expectClean(const OpResult& r)
    {
        EXPECT_TRUE(r.ok()) << cimhost::statusLine(r);
        EXPECT_TRUE(r.done);
        for (const std::string& e : r.strictErrors)
            ADD_FAILURE() << "strict: " << e;
    }
};

TEST_P(SampleProvider, CreateModifyDelete)
{
    Instance w3;
    w3.path = path("Sample_Widget", "Name", "w3");
    w3.setProperty("Name", Value::fromString("w3"));
    w3.setProperty("Port", Value::fromUnsigned(Type::UInt16, 99));
    w3.setProperty("Tags", Value::arrayOf(Type::String, {Value::fromString("new")}));
    OpResult created = host.createInstance(w3.path, w3);
    expectClean(created);
    ASSERT_EQ(created.paths.size(), 1u);
    EXPECT_EQ(created.paths[0].key("Name")->s, "w3");
    EXPECT_EQ(host.createInstance(w3.path, w3).rc, CMPI_RC_ERR_ALREADY_EXISTS);

    Instance change;
    change.path = w3.path;
    change.setProperty("Port", Value::fromUnsigned(Type::UInt16, 100));
    change.setProperty("Level", Value::fromUnsigned(Type::UInt8, 9));
    expectClean(host.modifyInstance(w3.path, change, std::vector<std::string>{"Port"}));
    OpResult got = host.getInstance(w3.path);
    ASSERT_EQ(got.instances.size(), 1u);
    EXPECT_EQ(got.instances[0].property("Port")->u, 100u);
    EXPECT_EQ(got.instances[0].property("Level")->u, 0u);  // not in the list
    EXPECT_EQ(got.instances[0].property("Tags")->elems.at(0).s, "new");

    expectClean(host.deleteInstance(w3.path));
    EXPECT_EQ(host.getInstance(w3.path).rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(host.deleteInstance(w3.path).rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(host.deleteInstance(path("Sample_Gadget", "Id", "g1")).rc, CMPI_RC_ERR_NOT_SUPPORTED);
}

INSTANTIATE_TEST_SUITE_P(Flavours, SampleProvider, ::testing::Values(Flavour::Pegasus, Flavour::Sfcb),
                         flavourTestName);

// The library exports its four factories and nothing of the wrapper: a
// server process that holds another wrapper library can't bind to ours,
// nor ours to its.
TEST(SampleProviderLibrary, ExportsOnlyTheFactories)
{
    void* lib = dlopen(SAMPLE_PROVIDER_LIB, RTLD_NOW | RTLD_LOCAL);
    ASSERT_NE(lib, nullptr) << dlerror();
    for (const char* t : {"Instance", "Association", "Method", "Indication"}) {
        std::string name = std::string("Sample_Provider_Create_") + t + "MI";
        EXPECT_NE(dlsym(lib, name.c_str()), nullptr) << name;
        std::string generic = std::string("_Generic_Create_") + t + "MI";
        EXPECT_EQ(dlsym(lib, generic.c_str()), nullptr) << generic;
    }
    EXPECT_EQ(dlsym(lib, "_ZN10CmpiStatusC1E6_CMPIrc"), nullptr);
    EXPECT_EQ(dlsym(lib, "_ZN10CmpiBaseMI16driveBaseCleanupEP15_CMPIInstanceMIPK12_CMPIContexth"), nullptr);
    dlclose(lib);
}

} // namespace

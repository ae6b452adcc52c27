// The sample provider loaded by the embedded host in strict mode, as each
// of the two server flavours calls it: every operation kind, the CMPI
// types that cross the interface, a thrown status, the property filter,
// the provider's lifecycle and what its library exports. The cimhost command
// over this provider, verb by verb, is host/tests/cimhost_cli_test.sh.
#include "cimhost/host.h"
#include "sample_host.h"
#include "cmpidt.h"

#include <gtest/gtest.h>

#include <dlfcn.h>

#include <algorithm>
#include <string>
#include <vector>

using cimhost::AssocParams;
using cimhost::Flavour;
using cimhost::Host;
using cimhost::Instance;
using cimhost::NamedValue;
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

std::vector<std::string> keyValues(const std::vector<ObjectPath>& paths, const char* key)
{
    std::vector<std::string> out;
    for (const ObjectPath& p : paths)
        out.push_back(p.key(key) != nullptr ? p.key(key)->s : "<none>");
    std::sort(out.begin(), out.end());
    return out;
}

std::vector<std::string> propertyNames(const Instance& inst)
{
    std::vector<std::string> out;
    for (const NamedValue& p : inst.properties)
        out.push_back(p.first);
    return out;
}

const Value* outArg(const OpResult& r, const char* name)
{
    for (const NamedValue& a : r.outArgs)
        if (cimhost::namesEqual(a.first, name))
            return &a.second;
    return nullptr;
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

TEST_P(SampleProvider, EnumeratesWithEveryPropertyType)
{
    OpResult names = host.enumerateInstanceNames(path("Sample_Widget"));
    expectClean(names);
    EXPECT_EQ(keyValues(names.paths, "Name"), (std::vector<std::string>{"w1", "w2"}));

    OpResult r = host.enumerateInstances(path("Sample_Widget"));
    expectClean(r);
    ASSERT_EQ(r.instances.size(), 2u);
    const Instance& w1 = r.instances[0];
    struct Row {
        const char* name;
        Type type;
        bool array;
    } rows[] = {
        {"Name", Type::String, false},      {"Enabled", Type::Boolean, false},
        {"Level", Type::UInt8, false},      {"Port", Type::UInt16, false},
        {"Count", Type::UInt32, false},     {"Bytes", Type::UInt64, false},
        {"Offset", Type::SInt32, false},    {"Installed", Type::DateTime, false},
        {"Uptime", Type::DateTime, false},  {"Tags", Type::String, true},
        {"Codes", Type::UInt16, true},
    };
    for (const Row& row : rows) {
        const Value* v = w1.property(row.name);
        ASSERT_NE(v, nullptr) << row.name;
        EXPECT_EQ(v->type, row.type) << row.name;
        EXPECT_EQ(v->array, row.array) << row.name;
        EXPECT_FALSE(v->null) << row.name;
    }
    EXPECT_TRUE(w1.property("Enabled")->b);
    EXPECT_EQ(w1.property("Level")->u, 3u);
    EXPECT_EQ(w1.property("Port")->u, 8080u);
    EXPECT_EQ(w1.property("Bytes")->u, 1ull << 40);
    EXPECT_EQ(w1.property("Offset")->i, -12);
    EXPECT_EQ(w1.property("Installed")->dt.usec, 1700000000000000ull);
    EXPECT_FALSE(w1.property("Installed")->dt.interval);
    EXPECT_TRUE(w1.property("Uptime")->dt.interval);
    EXPECT_EQ(w1.property("Uptime")->dt.usec, 90000000ull);
    ASSERT_EQ(w1.property("Tags")->elems.size(), 2u);
    EXPECT_EQ(w1.property("Tags")->elems[1].s, "blue");
    ASSERT_EQ(w1.property("Codes")->elems.size(), 3u);
    EXPECT_EQ(w1.property("Codes")->elems[2].u, 3u);
    // An empty array stays an array, not a null.
    EXPECT_TRUE(r.instances[1].property("Tags")->elems.empty());
}

TEST_P(SampleProvider, GetInstanceAndAThrownNotFound)
{
    OpResult r = host.getInstance(path("Sample_Widget", "Name", "W1"));  // keys ignore case
    expectClean(r);
    ASSERT_EQ(r.instances.size(), 1u);
    EXPECT_EQ(r.instances[0].property("Name")->s, "w1");

    OpResult missing = host.getInstance(path("Sample_Widget", "Name", "nope"));
    EXPECT_EQ(missing.rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(missing.message, "nope");
    EXPECT_TRUE(missing.instances.empty());

    // A path without its key: the wrapper's getKey throws, the driver
    // returns that status with the key's name.
    OpResult nokey = host.getInstance(path("Sample_Widget"));
    EXPECT_EQ(nokey.rc, CMPI_RC_ERR_NOT_FOUND);
    EXPECT_EQ(nokey.message, "Name");
}

TEST_P(SampleProvider, PropertyFilterKeepsKeysAndListedProperties)
{
    OpResult r = host.getInstance(path("Sample_Widget", "Name", "w1"), std::vector<std::string>{"Port"});
    expectClean(r);
    ASSERT_EQ(r.instances.size(), 1u);
    EXPECT_EQ(propertyNames(r.instances[0]), (std::vector<std::string>{"Name", "Port"}));

    OpResult none = host.enumerateInstances(path("Sample_Gadget"), std::vector<std::string>{});
    expectClean(none);
    ASSERT_EQ(none.instances.size(), 3u);
    EXPECT_EQ(propertyNames(none.instances[0]), (std::vector<std::string>{"Id"}));
}

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

TEST_P(SampleProvider, AssociationTraversals)
{
    const ObjectPath w1 = path("Sample_Widget", "Name", "w1");
    const ObjectPath g3 = path("Sample_Gadget", "Id", "g3");

    OpResult names = host.associatorNames(w1);
    expectClean(names);
    EXPECT_EQ(keyValues(names.paths, "Id"), (std::vector<std::string>{"g1", "g2"}));

    OpResult owners = host.associators(g3, AssocParams{"Sample_WidgetGadget", "", "Part", "Owner"});
    expectClean(owners);
    ASSERT_EQ(owners.instances.size(), 1u);
    EXPECT_EQ(owners.instances[0].property("Name")->s, "w2");

    // Filters that admit nothing give success with no rows.
    EXPECT_TRUE(host.associatorNames(w1, AssocParams{"", "", "Part", ""}).paths.empty());
    EXPECT_TRUE(host.associatorNames(w1, AssocParams{"Other_Assoc", "", "", ""}).paths.empty());
    EXPECT_TRUE(host.associatorNames(w1, AssocParams{"", "Sample_Service", "", ""}).paths.empty());
    EXPECT_EQ(host.associatorNames(w1, AssocParams{"", "Sample_ManagedElement", "", ""}).paths.size(), 2u);

    OpResult refs = host.references(w1);
    expectClean(refs);
    ASSERT_EQ(refs.instances.size(), 2u);
    const Value* owner = refs.instances[0].property("Owner");
    ASSERT_NE(owner, nullptr);
    EXPECT_EQ(owner->type, Type::Reference);
    EXPECT_EQ(owner->ref->key("Name")->s, "w1");

    OpResult refNames = host.referenceNames(g3);
    expectClean(refNames);
    ASSERT_EQ(refNames.paths.size(), 1u);
    EXPECT_EQ(refNames.paths[0].className, "Sample_WidgetGadget");

    // No association references the service: OpenPegasus doesn't ask the
    // provider, sfcb does and gets its refusal.
    OpResult unsupported = host.referenceNames(path("Sample_Service", "Name", "svc"));
    if (GetParam() == Flavour::Sfcb) {
        EXPECT_EQ(unsupported.rc, CMPI_RC_ERR_NOT_SUPPORTED);
        EXPECT_EQ(unsupported.message, "Sample_Service");
    } else {
        expectClean(unsupported);
        EXPECT_TRUE(unsupported.paths.empty());
    }
}

TEST_P(SampleProvider, MethodWithTypedArguments)
{
    const ObjectPath svc = path("Sample_Service", "Name", "svc");
    std::vector<NamedValue> in = {
        {"Value", Value::fromUnsigned(Type::UInt32, 3)},
        {"Factors", Value::arrayOf(Type::UInt16, {Value::fromUnsigned(Type::UInt16, 1),
                                                  Value::fromUnsigned(Type::UInt16, 2)})},
        {"Label", Value::fromString("hi")},
        {"Verbose", Value::fromBool(true)},
        {"Target", Value::fromRef(path("Sample_Widget", "Name", "w1"))},
    };
    OpResult r = host.invokeMethod(svc, "Scale", in);
    expectClean(r);
    ASSERT_FALSE(r.data.empty());
    EXPECT_EQ(r.data[0].type, Type::UInt32);
    EXPECT_EQ(r.data[0].u, 0u);
    ASSERT_NE(outArg(r, "Result"), nullptr);
    EXPECT_EQ(outArg(r, "Result")->type, Type::UInt64);
    EXPECT_EQ(outArg(r, "Result")->u, 9u);
    EXPECT_EQ(outArg(r, "Echo")->s, "hi@w1 (verbose)");
    EXPECT_EQ(outArg(r, "Level")->type, Type::UInt8);
    EXPECT_EQ(outArg(r, "Level")->u, 3u);
    ASSERT_EQ(outArg(r, "Offsets")->elems.size(), 2u);
    EXPECT_EQ(outArg(r, "Offsets")->type, Type::SInt32);
    EXPECT_EQ(outArg(r, "Offsets")->elems[1].i, -12);
    EXPECT_TRUE(outArg(r, "Delay")->dt.interval);
    EXPECT_EQ(outArg(r, "Delay")->dt.usec, 30ull * 60 * 1000000);
    EXPECT_EQ(outArg(r, "Job")->ref->key("Name")->s, "w1");

    // Absent arguments read as null: no Factors scales by 1, no Target
    // gives return value 2.
    OpResult noFactors = host.invokeMethod(svc, "Scale", {in[0], in[4]});
    expectClean(noFactors);
    EXPECT_EQ(outArg(noFactors, "Result")->u, 3u);
    OpResult noTarget = host.invokeMethod(svc, "Scale", {in[0]});
    expectClean(noTarget);
    EXPECT_EQ(noTarget.data.at(0).u, 2u);

    OpResult fail = host.invokeMethod(svc, "Fail", {});
    EXPECT_EQ(fail.rc, CMPI_RC_ERR_INVALID_PARAMETER);
    EXPECT_EQ(fail.message, "Fail was asked for");
    EXPECT_EQ(host.invokeMethod(svc, "Nothing", {}).rc, CMPI_RC_ERR_METHOD_NOT_FOUND);
}

TEST_P(SampleProvider, UnloadCleansUpEveryMiAndReloadStartsAfresh)
{
    ASSERT_TRUE(host.deleteInstance(path("Sample_Widget", "Name", "w2")).ok());
    host.associatorNames(path("Sample_Widget", "Name", "w1"));
    host.invokeMethod(path("Sample_Service", "Name", "svc"), "Fail", {});
    ASSERT_TRUE(host.unload(false).ok());
    cimhost::Counters c = host.counters();
    int made = c.factoryCalls[0] + c.factoryCalls[1] + c.factoryCalls[2] + c.factoryCalls[3];
    EXPECT_GT(made, 0);
    EXPECT_EQ(c.cleanupCalls, made);
    EXPECT_EQ(c.unloads, 1);

    // Second life: the object made anew has its starting widgets again.
    ASSERT_TRUE(host.load(SAMPLE_PROVIDER_LIB, "Sample_Provider").ok());
    OpResult names = host.enumerateInstanceNames(path("Sample_Widget"));
    expectClean(names);
    EXPECT_EQ(keyValues(names.paths, "Name"), (std::vector<std::string>{"w1", "w2"}));
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

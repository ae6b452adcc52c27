// Strict checks of instances and paths against MOF declarations.
#include <gtest/gtest.h>

#include "cimhost/check.h"

using namespace cimhost;

namespace {

ClassRepository repo() {
    ClassRepository r;
    std::string err;
    EXPECT_TRUE(r.loadText(R"MOF(
class C_Base { [Key] string Name; };
class C_Dev : C_Base { [Key] uint16 Slot; uint32 Speed; string Tags[]; [EmbeddedInstance("C_Base")] string Inner; };
class C_Partial : CIM_Outside { [Key] string Id; string DeviceID; };
)MOF", "c.mof", err)) << err;
    return r;
}

Instance dev() {
    Instance i;
    i.path.className = "C_Dev";
    i.setProperty("Name", Value::fromString("n"));
    i.setProperty("Slot", Value::fromUnsigned(Type::UInt16, 1));
    return i;
}

TEST(StrictInstance, AcceptsWhatTheClassDeclares) {
    const ClassRepository r = repo();
    Instance i = dev();
    i.setProperty("Speed", Value::nullOf(Type::UInt32));
    i.setProperty("Tags", Value::arrayOf(Type::String, {Value::fromString("a")}));
    i.setProperty("Inner", Value::fromInstance(Instance()));   // embedded instance in a string
    i.setProperty("speed", Value::nullOf(Type::Null));         // a null of no type passes
    EXPECT_EQ(checkInstance(r, i), "");
}

TEST(StrictInstance, NamesClassAndPropertyOfEachFault) {
    const ClassRepository r = repo();
    struct Case {
        const char* prop;
        Value value;
        const char* message;
    };
    const Case cases[] = {
        {"Speed", Value::fromUnsigned(Type::UInt64, 1), "property C_Dev.Speed is uint32 in the MOF but the provider gave uint64"},
        {"Tags", Value::fromString("a"), "property C_Dev.Tags is string[] in the MOF but the provider gave string"},
        {"Speed", Value::arrayOf(Type::UInt32, {}), "property C_Dev.Speed is uint32 in the MOF but the provider gave uint32[]"},
        {"Extra", Value::fromBool(true), "class C_Dev has no property Extra"},
        {"Slot", Value::nullOf(Type::UInt16), "instance of C_Dev lacks its key property Slot"},
    };
    for (const auto& c : cases) {
        Instance i = dev();
        i.setProperty(c.prop, c.value);
        EXPECT_EQ(checkInstance(r, i), c.message);
    }
    Instance u;
    u.path.className = "C_Unknown";
    EXPECT_EQ(checkInstance(r, u), "class C_Unknown is not declared in the MOF");
}

TEST(StrictInstance, UnknownSuperclassLeavesUndeclaredPropertiesUnjudged) {
    const ClassRepository r = repo();
    Instance i;
    i.path.className = "C_Partial";
    i.setProperty("Id", Value::fromString("x"));
    i.setProperty("ElementName", Value::fromString("from CIM_Outside, perhaps"));
    EXPECT_EQ(checkInstance(r, i), "");
    i.setProperty("DeviceID", Value::fromUnsigned(Type::UInt8, 1));   // declared here: still typed
    EXPECT_EQ(checkInstance(r, i), "property C_Partial.DeviceID is string in the MOF but the provider gave uint8");
}

TEST(StrictPath, KeysExactlyAsDeclared) {
    const ClassRepository r = repo();
    ObjectPath p;
    p.className = "C_Dev";
    p.setKey("Name", Value::fromString("n"));
    EXPECT_EQ(checkPath(r, p), "object path of C_Dev lacks its key Slot");
    p.setKey("Slot", Value::fromUnsigned(Type::UInt64, 1));
    EXPECT_EQ(checkPath(r, p), "key C_Dev.Slot is uint16 in the MOF but the provider gave uint64");
    p.setKey("Slot", Value::fromUnsigned(Type::UInt16, 1));
    EXPECT_EQ(checkPath(r, p), "");
    p.setKey("Speed", Value::fromUnsigned(Type::UInt32, 1));
    EXPECT_EQ(checkPath(r, p), "object path of C_Dev has key Speed, which is not a Key property");
    p.keys.pop_back();
    p.setKey("Other", Value::fromString("o"));
    EXPECT_EQ(checkPath(r, p), "object path of C_Dev has key Other, which the class does not declare");

    // Keys of a superclass outside the MOF cannot be judged.
    ObjectPath q;
    q.className = "C_Partial";
    q.setKey("Id", Value::fromString("x"));
    q.setKey("DeviceID", Value::fromString("d"));
    q.setKey("CreationClassName", Value::fromString("C_Partial"));
    EXPECT_EQ(checkPath(r, q), "");
}

}  // namespace

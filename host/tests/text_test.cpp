// Object path text form, value literals, datetimes and MOF output.
#include <gtest/gtest.h>

#include "cimhost/text.h"

using namespace cimhost;

namespace {

const char kMof[] = R"MOF(
class T_Port { [Key] string Name; [Key] uint16 Num; [Key] boolean On; sint32 S; uint8 Small; datetime When; };
[Association] class T_Link { [Key] T_Port REF A; [Key] T_Port REF B; };
)MOF";

ClassRepository repo() {
    ClassRepository r;
    std::string err;
    EXPECT_TRUE(r.loadText(kMof, "t.mof", err)) << err;
    return r;
}

TEST(PathText, ParsesNamespaceClassAndTypedKeys) {
    const ClassRepository r = repo();
    ObjectPath p;
    std::string err;
    ASSERT_TRUE(parsePath("root/a:T_Port.Name=\"e\\\"x\\\\y,z\",Num=42,On=true", p, err, &r)) << err;
    EXPECT_EQ(p.nameSpace, "root/a");
    EXPECT_EQ(p.className, "T_Port");
    ASSERT_EQ(p.keys.size(), 3u);
    EXPECT_EQ(*p.key("name"), Value::fromString("e\"x\\y,z"));
    EXPECT_EQ(*p.key("Num"), Value::fromUnsigned(Type::UInt16, 42));
    EXPECT_EQ(*p.key("On"), Value::fromBool(true));
    EXPECT_EQ(formatPath(p), "root/a:T_Port.Name=\"e\\\"x\\\\y,z\",Num=42,On=TRUE");
}

TEST(PathText, UntypedKeysWithoutADeclaration) {
    ObjectPath p;
    std::string err;
    ASSERT_TRUE(parsePath("X_Y.A=\"1\",B=7,C=-3,D=FALSE,E=2.5", p, err, nullptr, "root/dflt")) << err;
    EXPECT_EQ(p.nameSpace, "root/dflt");
    EXPECT_EQ(*p.key("A"), Value::fromString("1"));
    EXPECT_EQ(*p.key("B"), Value::fromUnsigned(Type::UInt64, 7));
    EXPECT_EQ(*p.key("C"), Value::fromSigned(Type::SInt64, -3));
    EXPECT_EQ(*p.key("D"), Value::fromBool(false));
    EXPECT_EQ(*p.key("E"), Value::fromReal(Type::Real64, 2.5));
}

TEST(PathText, ReferenceKeysNestAndRoundTrip) {
    const ClassRepository r = repo();
    const std::string text =
        "//host1/root/a:T_Link.A=\"root/a:T_Port.Name=\\\"p\\\\\\\"1\\\",Num=1,On=FALSE\","
        "B=\"root/b:T_Port.Name=\\\"q\\\",Num=2,On=TRUE\"";
    ObjectPath p;
    std::string err;
    ASSERT_TRUE(parsePath(text, p, err, &r)) << err;
    EXPECT_EQ(p.host, "host1");
    const Value* a = p.key("A");
    ASSERT_NE(a, nullptr);
    ASSERT_EQ(a->type, Type::Reference);
    EXPECT_EQ(a->ref->className, "T_Port");
    EXPECT_EQ(*a->ref->key("Name"), Value::fromString("p\"1"));
    EXPECT_EQ(p.key("B")->ref->nameSpace, "root/b");
    EXPECT_EQ(formatPath(p), text);
    ObjectPath again;
    ASSERT_TRUE(parsePath(formatPath(p), again, err, &r)) << err;
    EXPECT_EQ(again, p);
}

TEST(PathText, ClassPathsAndSingletons) {
    ObjectPath p;
    std::string err;
    ASSERT_TRUE(parsePath("root/x:Only", p, err));
    EXPECT_TRUE(p.keys.empty());
    ASSERT_TRUE(parsePath("Only=@", p, err));
    EXPECT_EQ(p.className, "Only");
    EXPECT_TRUE(p.keys.empty());
    EXPECT_EQ(formatPath(p), "Only");
}

// A batch line's word splitting turns Name="" into Name=, as a shell does:
// both stand for the empty text.
TEST(PathText, AnEmptyKeyValueIsTheEmptyText) {
    const ClassRepository r = repo();
    for (const char* text : {"root/a:T_Port.Name=", "root/a:T_Port.Name=\"\"", "root/a:T_Port.Name=,Num=3"}) {
        ObjectPath p;
        std::string err;
        ASSERT_TRUE(parsePath(text, p, err, &r)) << text << ": " << err;
        EXPECT_EQ(*p.key("Name"), Value::fromString("")) << text;
    }
}

TEST(PathText, BadInputIsRefusedWithAReason) {
    const ClassRepository r = repo();
    const char* const bad[] = {
        "",
        "root/a:",
        ":T_Port",
        "root a:T_Port",
        "root/a:T_Port.",
        "root/a:T_Port.Name",
        "root/a:T_Port.Num=",
        "root/a:T_Port.Name=\"open",
        "root/a:T_Port.Name=\"a\"Num=1",
        "root/a:T_Port.Num=70000",
        "root/a:T_Port.Num=-1",
        "root/a:T_Port.Num=abc",
        "root/a:T_Port.On=maybe",
        "root/a:T_Port.Name=\"a\",Name=\"b\"",
        "root/a:T_Link.A=\"not a path!\"",
        "root/a:1Class",
        "root/a:T_Port#x",
        "//hostonly",
        "///root/a:T_Port",   // an empty host
    };
    for (const char* text : bad) {
        ObjectPath p;
        std::string err;
        EXPECT_FALSE(parsePath(text, p, err, &r)) << "accepted: " << text;
        EXPECT_FALSE(err.empty()) << text;
    }
    // A number followed by a NUL inside the text is not a number.
    const std::string withNul[] = {std::string("root/a:T_Port.Num=5\0", 20), std::string("root/a:X.N=-0.\0\0", 16)};
    for (const std::string& text : withNul) {
        ObjectPath p;
        std::string err;
        EXPECT_FALSE(parsePath(text, p, err, &r)) << "accepted: " << text;
    }
}

TEST(ValueText, TypedScalarsArraysAndNull) {
    const ClassRepository r = repo();
    Value v;
    std::string err;
    ASSERT_TRUE(parseValueText("255", Type::UInt8, false, v, err));
    EXPECT_EQ(v, Value::fromUnsigned(Type::UInt8, 255));
    EXPECT_FALSE(parseValueText("256", Type::UInt8, false, v, err));
    ASSERT_TRUE(parseValueText("0x10", Type::UInt32, false, v, err));
    EXPECT_EQ(v.u, 16u);
    ASSERT_TRUE(parseValueText("-2147483648", Type::SInt32, false, v, err));
    EXPECT_FALSE(parseValueText("2147483648", Type::SInt32, false, v, err));
    ASSERT_TRUE(parseValueText("\"quoted \\\" text\"", Type::String, false, v, err));
    EXPECT_EQ(v.s, "quoted \" text");
    ASSERT_TRUE(parseValueText("bare text", Type::String, false, v, err));
    EXPECT_EQ(v.s, "bare text");
    ASSERT_TRUE(parseValueText("NULL", Type::UInt16, true, v, err));
    EXPECT_TRUE(v.null);
    EXPECT_TRUE(v.array);
    ASSERT_TRUE(parseValueText("{1, 2,3}", Type::UInt16, true, v, err));
    ASSERT_EQ(v.elems.size(), 3u);
    EXPECT_EQ(v.elems[2], Value::fromUnsigned(Type::UInt16, 3));
    ASSERT_TRUE(parseValueText("{\"a,b\", c}", Type::String, true, v, err));
    EXPECT_EQ(v.elems[0].s, "a,b");
    EXPECT_EQ(v.elems[1].s, "c");
    ASSERT_TRUE(parseValueText("{}", Type::String, true, v, err));
    EXPECT_TRUE(v.elems.empty());
    EXPECT_FALSE(parseValueText("1,2", Type::UInt16, true, v, err));
    EXPECT_FALSE(parseValueText("{1,x}", Type::UInt16, true, v, err));
    ASSERT_TRUE(parseValueText("root/a:T_Port.Name=\"n\",Num=1,On=TRUE", Type::Reference, false, v, err, &r));
    EXPECT_EQ(v.ref->key("Num")->type, Type::UInt16);
    EXPECT_FALSE(parseValueText("20241301000000.000000+000", Type::DateTime, false, v, err));
}

TEST(DateTimeText, AbsoluteAndIntervalRoundTrip) {
    const auto epoch = DateTime::fromText("19700101000000.000000+000");
    ASSERT_TRUE(epoch);
    EXPECT_EQ(epoch->usec, 0u);
    const auto t = DateTime::fromText("20240229235959.123456+060");
    ASSERT_TRUE(t);
    EXPECT_FALSE(t->interval);
    // 23:59:59 at +60 minutes is 22:59:59 UTC.
    EXPECT_EQ(t->usec, 1709247599123456ULL);
    EXPECT_EQ(t->toText(), "20240229235959.123456+060");
    const auto iv = DateTime::fromText("00000001020304.000005:000");
    ASSERT_TRUE(iv);
    EXPECT_TRUE(iv->interval);
    EXPECT_EQ(iv->usec, ((86400ULL + 2 * 3600 + 3 * 60 + 4) * 1000000ULL) + 5);
    EXPECT_EQ(iv->toText(), "00000001020304.000005:000");
    DateTime b;
    b.usec = 3000000000ULL;
    b.interval = true;
    EXPECT_EQ(b.toText(), "00000000005000.000000:000");
    for (const char* badText : {"", "2024", "20240101000000.000000*000", "20240101250000.000000+000",
                                "0000000102030x.000000:000", "00000001020304.000000:001"})
        EXPECT_FALSE(DateTime::fromText(badText)) << badText;
}

TEST(MofOutput, InstanceSyntaxWithEscapesArraysAndNulls) {
    Instance i;
    i.path.className = "T_Port";
    i.setProperty("Name", Value::fromString("a\"b\\c\nd"));
    i.setProperty("Num", Value::fromUnsigned(Type::UInt16, 5));
    i.setProperty("S", Value::fromSigned(Type::SInt32, -4));
    i.setProperty("On", Value::fromBool(true));
    i.setProperty("Codes", Value::arrayOf(Type::UInt8, {Value::fromUnsigned(Type::UInt8, 1),
                                                         Value::fromUnsigned(Type::UInt8, 2)}));
    i.setProperty("Note", Value::nullOf(Type::String));
    i.setProperty("num", Value::fromUnsigned(Type::UInt16, 6));   // same name: replaced in place
    EXPECT_EQ(formatInstanceMof(i),
              "instance of T_Port {\n"
              "    Name = \"a\\\"b\\\\c\\nd\";\n"
              "    Num = 6;\n"
              "    S = -4;\n"
              "    On = TRUE;\n"
              "    Codes = {1, 2};\n"
              "    Note = NULL;\n"
              "};\n");
}

}  // namespace

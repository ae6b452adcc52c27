// MOF reader and class repository.
#include <gtest/gtest.h>

#include <cstdio>
#include <fstream>
#include <unistd.h>

#include "cimhost/repository.h"

using namespace cimhost;

namespace {

const char kMof[] = R"MOF(
// line comment
/* block
   comment */
#pragma locale ("en_US")
qualifier Key : boolean = false, Scope(property, reference), Flavor(DisableOverride);

[Abstract, Description ("A base; with ] and ; inside \"quotes\"" "joined")]
class CIM_Base {
    [Key, MaxLen (256)] string InstanceID;
    string Caption = "x";
};

class Ex_Port : CIM_Base {
    [Key] uint16 Number;
    uint64 Speed;
    sint8 Offset = -1;
    real64 Ratio;
    datetime Since;
    string Names[];
    uint16 Codes[4] = {1, 2};
    [EmbeddedInstance ("Ex_Port")] string Nested;
    string Caption;   // override keeps one entry

    [ValueMap {"0", "1"}, Values {"Ok", "Bad"}]
    uint32 Reset([In] boolean Force, [In (false), Out] string Log, [Out] Ex_Port REF Job, uint8 Mask[]);
};

[Association, Aggregation]
class Ex_PortLink {
    [Key, Aggregate] Ex_Port REF Group;
    [Key] Ex_Port REF Member;
};

[Indication] class Ex_Alert : Ex_Missing { uint32 Seq; };

instance of Ex_Port as $p { InstanceID = "a;b}"; Number = 1; };
)MOF";

class RepoTest : public ::testing::Test {
protected:
    void SetUp() override {
        std::string err;
        ASSERT_TRUE(repo.loadText(kMof, "ex.mof", err)) << err;
    }
    ClassRepository repo;
};

TEST_F(RepoTest, ReadsClassesSuperclassesAndQualifiers) {
    EXPECT_EQ(repo.classNames().size(), 4u);
    const ClassDecl* base = repo.find("cim_base");   // names ignore case
    ASSERT_NE(base, nullptr);
    EXPECT_TRUE(base->abstract);
    EXPECT_EQ(repo.find("Ex_Port")->superClass, "CIM_Base");
    EXPECT_TRUE(repo.find("Ex_PortLink")->association);
    EXPECT_TRUE(repo.find("Ex_Alert")->indication);
    EXPECT_FALSE(repo.find("Ex_Port")->association);
}

TEST_F(RepoTest, PropertyTypesArraysReferencesAndKeys) {
    const PropertyDecl* p = repo.findProperty("Ex_Port", "Speed");
    ASSERT_NE(p, nullptr);
    EXPECT_EQ(p->type, Type::UInt64);
    EXPECT_EQ(repo.findProperty("Ex_Port", "Offset")->type, Type::SInt8);
    EXPECT_EQ(repo.findProperty("Ex_Port", "Ratio")->type, Type::Real64);
    EXPECT_EQ(repo.findProperty("Ex_Port", "Since")->type, Type::DateTime);
    EXPECT_TRUE(repo.findProperty("Ex_Port", "Names")->array);
    EXPECT_TRUE(repo.findProperty("Ex_Port", "Codes")->array);
    EXPECT_TRUE(repo.findProperty("Ex_Port", "Nested")->embedded);
    const PropertyDecl* ref = repo.findProperty("Ex_PortLink", "member");
    ASSERT_NE(ref, nullptr);
    EXPECT_EQ(ref->type, Type::Reference);
    EXPECT_EQ(ref->refClass, "Ex_Port");
    // Inherited key first, then the subclass's own.
    EXPECT_EQ(repo.keyNames("Ex_Port"), (std::vector<std::string>{"InstanceID", "Number"}));
    EXPECT_EQ(repo.keyNames("Ex_PortLink"), (std::vector<std::string>{"Group", "Member"}));
    // An overridden property appears once, at its first place.
    int captions = 0;
    for (const auto& q : repo.allProperties("Ex_Port")) captions += q.name == "Caption";
    EXPECT_EQ(captions, 1);
    EXPECT_EQ(repo.findProperty("Ex_Port", "NoSuch"), nullptr);
}

// The shared key names follow classes read later: a subclass read before
// its superclass gains the inherited key once the superclass arrives, and a
// copy of the repository answers from its own classes.
TEST(RepoKeyNames, SharedNamesFollowClassesAddedLater) {
    ClassRepository repo;
    std::string err;
    ASSERT_TRUE(repo.loadText("class Ex_Sub : Ex_Top { [Key] string Tag; };", "sub.mof", err)) << err;
    EXPECT_EQ(*repo.sharedKeyNames("Ex_Sub"), (std::vector<std::string>{"Tag"}));
    const ClassRepository before = repo;
    ASSERT_TRUE(repo.loadText("class Ex_Top { [Key] string Id; };", "top.mof", err)) << err;
    EXPECT_EQ(*repo.sharedKeyNames("Ex_Sub"), (std::vector<std::string>{"Id", "Tag"}));
    EXPECT_EQ(*before.sharedKeyNames("Ex_Sub"), (std::vector<std::string>{"Tag"}));
    EXPECT_EQ(repo.sharedKeyNames("Ex_Sub"), repo.sharedKeyNames("Ex_Sub"));   // computed once
    EXPECT_TRUE(repo.sharedKeyNames("Ex_None")->empty());
}

TEST_F(RepoTest, MethodsWithDirectionsAndTypes) {
    const MethodDecl* m = repo.findMethod("Ex_Port", "reset");
    ASSERT_NE(m, nullptr);
    EXPECT_EQ(m->returnType, Type::UInt32);
    ASSERT_EQ(m->params.size(), 4u);
    EXPECT_TRUE(m->param("Force")->in);
    EXPECT_FALSE(m->param("Force")->out);
    EXPECT_FALSE(m->param("Log")->in);
    EXPECT_TRUE(m->param("Log")->out);
    EXPECT_EQ(m->param("Job")->type, Type::Reference);
    EXPECT_TRUE(m->param("Mask")->array);
    EXPECT_TRUE(m->param("Mask")->in);   // no qualifier: input
}

TEST_F(RepoTest, IsAFollowsTheChainAndTellsWhetherItIsComplete) {
    EXPECT_TRUE(repo.isA("Ex_Port", "CIM_Base"));
    EXPECT_TRUE(repo.isA("ex_port", "EX_PORT"));
    EXPECT_FALSE(repo.isA("CIM_Base", "Ex_Port"));
    EXPECT_TRUE(repo.isA("Ex_Alert", "Ex_Missing"));   // one step known
    EXPECT_FALSE(repo.isA("Unknown_X", "CIM_Base"));
    EXPECT_TRUE(repo.isA("Unknown_X", "unknown_x"));
    EXPECT_TRUE(repo.chainComplete("Ex_Port"));
    EXPECT_FALSE(repo.chainComplete("Ex_Alert"));
    EXPECT_FALSE(repo.chainComplete("Unknown_X"));
}

TEST(RepoErrors, SyntaxErrorsNameFileAndLine) {
    struct Case {
        const char* text;
        const char* where;
    };
    const Case cases[] = {
        {"class A {\n  uint16 X\n};", "bad.mof:3:"},
        {"class A {\n  strung X;\n};", "bad.mof:2:"},
        {"class A : {\n};", "bad.mof:1:"},
        {"class A { string S = \"open;\n};", "bad.mof:1:"},
        {"class A {\n string X;\n", "bad.mof:3:"},
        {"widget A {};", "bad.mof:1:"},
        {"[Key class A {};", "bad.mof:1:"},
    };
    for (const auto& c : cases) {
        ClassRepository repo;
        std::string err;
        EXPECT_FALSE(repo.loadText(c.text, "bad.mof", err)) << c.text;
        EXPECT_EQ(err.rfind(c.where, 0), 0u) << c.text << " -> " << err;
    }
}

TEST(RepoFiles, DirectoriesIncludesAndMissingFiles) {
    char dirTemplate[] = "/tmp/cimhost-mof-XXXXXX";
    const std::string dir = mkdtemp(dirTemplate);
    std::ofstream(dir + "/b.mof") << "#pragma include (\"sub.inc\")\nclass B : A { uint8 X; };\n";
    std::ofstream(dir + "/a.mof") << "class A { [Key] string K; };\n";
    std::ofstream(dir + "/sub.inc") << "class FromInclude { string S; };\n";
    std::ofstream(dir + "/notes.txt") << "not MOF at all {";
    ClassRepository repo;
    std::string err;
    ASSERT_TRUE(repo.loadPath(dir, err)) << err;
    EXPECT_NE(repo.find("A"), nullptr);
    EXPECT_NE(repo.find("FromInclude"), nullptr);
    EXPECT_TRUE(repo.isA("B", "A"));

    EXPECT_FALSE(repo.loadPath(dir + "/none.mof", err));
    EXPECT_NE(err.find("none.mof"), std::string::npos);

    // An include that includes itself stops instead of recursing forever.
    std::ofstream(dir + "/loop.inc") << "#pragma include (\"loop.inc\")\n";
    EXPECT_FALSE(repo.loadPath(dir + "/loop.inc", err));
    EXPECT_NE(err.find("nested too deep"), std::string::npos) << err;
    for (const char* f : {"a.mof", "b.mof", "sub.inc", "notes.txt", "loop.inc"}) std::remove((dir + "/" + f).c_str());
    rmdir(dir.c_str());
}

}  // namespace

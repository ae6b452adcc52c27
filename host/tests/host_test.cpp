// The host driving libTiny_Provider.so: operations, property filters, strict
// checking, loading and unloading, and indications from the provider's thread.
#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <thread>

#include "cimhost/host.h"
#include "cimhost/text.h"

using namespace cimhost;
using namespace std::chrono_literals;

namespace {

ObjectPath path(const std::string& text, const Host& h) {
    ObjectPath p;
    std::string err;
    EXPECT_TRUE(parsePath(text, p, err, &h.classes(), "root/tiny")) << text << ": " << err;
    return p;
}

std::vector<std::string> names(const Instance& i) {
    std::vector<std::string> out;
    for (const auto& p : i.properties) out.push_back(p.first);
    return out;
}

bool hasEvent(const Counters& c, const std::string& prefix) {
    return std::any_of(c.events.begin(), c.events.end(),
                       [&](const std::string& e) { return e.rfind(prefix, 0) == 0; });
}

// Events starting with one of the indication MI calls, in order.
std::vector<std::string> indicationCalls(const Counters& c) {
    std::vector<std::string> out;
    for (const auto& e : c.events)
        for (const char* call : {"authorizeFilter", "mustPoll", "activateFilter", "deActivateFilter",
                                 "enableIndications", "disableIndications"})
            if (e.rfind(call, 0) == 0) out.push_back(e.substr(0, e.find(" rc=")));
    return out;
}

class HostTest : public ::testing::Test {
protected:
    void SetUp() override {
        h.setStrict(true);
        h.setDefaultNamespace("root/tiny");
        ASSERT_TRUE(h.loadMof(TINY_MOF).ok());
        const Status s = h.load(TINY_PROVIDER, "Tiny");
        ASSERT_TRUE(s.ok()) << statusLine(s);
    }
    ObjectPath p(const std::string& text) const { return path(text, h); }
    Host h;
};

// ---------------------------------------------------------------- operations

TEST_F(HostTest, EnumerationsReturnTypedPathsAndInstancesInSetOrder) {
    const OpResult names1 = h.enumerateInstanceNames(p("Tiny_Thing"));
    ASSERT_TRUE(names1.ok()) << statusLine(names1);
    ASSERT_EQ(names1.paths.size(), 2u);
    EXPECT_EQ(formatPath(names1.paths[0]), "root/tiny:Tiny_Thing.Name=\"alpha\",Id=1");
    EXPECT_TRUE(names1.done);

    const OpResult r = h.enumerateInstances(p("Tiny_Thing"));
    ASSERT_TRUE(r.ok()) << statusLine(r);
    ASSERT_EQ(r.instances.size(), 2u);
    const Instance& a = r.instances[0];
    EXPECT_EQ(names(a), (std::vector<std::string>{"Name", "Id", "Count", "Flag", "Big", "Neg", "When", "Tags",
                                                  "Note"}));
    EXPECT_EQ(formatPath(a.path), "root/tiny:Tiny_Thing.Name=\"alpha\",Id=1");
    EXPECT_EQ(*a.property("Big"), Value::fromUnsigned(Type::UInt64, 18446744073709551615ULL));
    EXPECT_EQ(*a.property("Neg"), Value::fromSigned(Type::SInt32, -5));
    EXPECT_EQ(a.property("When")->dt.toText(), "00000001020304.000005:000");
    EXPECT_EQ(*a.property("Tags"), Value::arrayOf(Type::String, {Value::fromString("x"), Value::fromString("y\"q")}));
    EXPECT_TRUE(a.property("Note")->null);
    EXPECT_EQ(a.property("Note")->type, Type::String);
    // The Pegasus flavour calls each factory once, lazily.
    const Counters c = h.counters();
    EXPECT_EQ(c.factoryCalls[0], 1);
    EXPECT_EQ(c.factoryCalls[1], 0);
}

TEST_F(HostTest, GetInstanceFindsByKeyOrFailsWithTheProvidersStatus) {
    const OpResult r = h.getInstance(p("Tiny_Thing.Name=\"beta\",Id=2"));
    ASSERT_TRUE(r.ok()) << statusLine(r);
    ASSERT_EQ(r.instances.size(), 1u);
    EXPECT_EQ(*r.instances[0].property("Count"), Value::fromUnsigned(Type::UInt32, 20));

    const OpResult missing = h.getInstance(p("Tiny_Thing.Name=\"gamma\",Id=3"));
    EXPECT_EQ(missing.rc, 6);
    EXPECT_EQ(statusLine(missing), "CMPI_RC_ERR_NOT_FOUND: no such Tiny_Thing");
}

TEST_F(HostTest, PropertyFilterKeepsListedPropertiesAndKeys) {
    OpResult r = h.enumerateInstances(p("Tiny_Thing"), PropertyList({"count", "Tags"}));
    ASSERT_TRUE(r.ok()) << statusLine(r);
    EXPECT_EQ(names(r.instances[0]), (std::vector<std::string>{"Name", "Id", "Count", "Tags"}));
    r = h.getInstance(p("Tiny_Thing.Name=\"alpha\",Id=1"), PropertyList(std::vector<std::string>{}));
    ASSERT_TRUE(r.ok()) << statusLine(r);
    EXPECT_EQ(names(r.instances[0]), (std::vector<std::string>{"Name", "Id"}));
    r = h.references(p("Tiny_Thing.Name=\"alpha\",Id=1"), {}, PropertyList({"Kind"}));
    ASSERT_TRUE(r.ok()) << statusLine(r);
    EXPECT_EQ(names(r.instances[0]), (std::vector<std::string>{"Left", "Right", "Kind"}));
    r = h.references(p("Tiny_Thing.Name=\"alpha\",Id=1"), {}, PropertyList({"Nothing"}));
    EXPECT_EQ(names(r.instances[0]), (std::vector<std::string>{"Left", "Right"}));
}

TEST_F(HostTest, CreateModifyDeletePassInstancesAndPaths) {
    Instance inst;
    inst.setProperty("Name", Value::fromString("new"));
    inst.setProperty("Id", Value::fromUnsigned(Type::UInt16, 9));
    inst.setProperty("Count", Value::fromUnsigned(Type::UInt32, 1));
    const ObjectPath np = p("Tiny_Thing.Name=\"new\",Id=9");
    OpResult r = h.createInstance(np, inst);
    ASSERT_TRUE(r.ok()) << statusLine(r);
    ASSERT_EQ(r.paths.size(), 1u);
    EXPECT_EQ(r.paths[0], np);
    inst.setProperty("Count", Value::fromString("1"));
    EXPECT_EQ(h.createInstance(np, inst).rc, 4);

    EXPECT_TRUE(h.modifyInstance(p("Tiny_Thing.Name=\"alpha\",Id=1"), inst, PropertyList({"Count"})).ok());
    EXPECT_EQ(h.modifyInstance(p("Tiny_Thing.Name=\"alpha\",Id=1"), inst).rc, 4);
    EXPECT_TRUE(h.deleteInstance(p("Tiny_Thing.Name=\"alpha\",Id=1")).ok());
    EXPECT_EQ(h.deleteInstance(p("Tiny_Thing.Name=\"zeta\",Id=1")).rc, 6);
}

TEST_F(HostTest, AssociationOperationsPassTheirFilters) {
    const ObjectPath alpha = p("Tiny_Thing.Name=\"alpha\",Id=1");
    OpResult r = h.associators(alpha);
    ASSERT_TRUE(r.ok()) << statusLine(r);
    ASSERT_EQ(r.instances.size(), 1u);
    EXPECT_EQ(r.instances[0].property("Name")->s, "beta");

    AssocParams ap;
    ap.resultClass = "Tiny_Base";   // the provider asks the broker's classPathIsA
    EXPECT_EQ(h.associators(alpha, ap).instances.size(), 1u);
    ap.resultClass = "Tiny_Link";
    EXPECT_EQ(h.associators(alpha, ap).instances.size(), 0u);
    ap = AssocParams();
    ap.assocClass = "Other_Assoc";
    EXPECT_EQ(h.associatorNames(alpha, ap).paths.size(), 0u);
    ap = AssocParams();
    ap.role = "Right";
    EXPECT_EQ(h.referenceNames(alpha, ap).paths.size(), 0u);
    ap.role = "left";
    r = h.referenceNames(alpha, ap);
    ASSERT_EQ(r.paths.size(), 1u);
    // The path comes from the instance's key properties, as the class declares them.
    EXPECT_EQ(formatPath(r.paths[0]),
              "root/tiny:Tiny_Link.Left=\"root/tiny:Tiny_Thing.Name=\\\"alpha\\\",Id=1\","
              "Right=\"root/tiny:Tiny_Thing.Name=\\\"beta\\\",Id=2\"");
    r = h.associatorNames(alpha);
    ASSERT_EQ(r.paths.size(), 1u);
    EXPECT_EQ(r.paths[0].key("Name")->s, "beta");
}

// The tiny provider answers only when it is handed no association class or
// its own, Tiny_Link. OpenPegasus hands it Tiny_Link for a request that names
// the parent Tiny_Relation or nothing, and never calls it for a class it does
// not serve; sfcb hands over the client's class as it stands.
TEST_F(HostTest, AssociationRequestsReachTheProviderAsEachServerMakesThem) {
    const ObjectPath alpha = p("Tiny_Thing.Name=\"alpha\",Id=1");
    struct Case {
        const char* named;
        std::size_t pegasus, sfcb;
    } cases[] = {{"", 1, 1}, {"Tiny_Link", 1, 1}, {"Tiny_Relation", 1, 0}, {"Tiny_Thing", 0, 0}, {"No_Such", 0, 0}};
    for (const Case& c : cases) {
        for (Flavour f : {Flavour::Pegasus, Flavour::Sfcb}) {
            h.setFlavour(f);
            const std::size_t want = f == Flavour::Pegasus ? c.pegasus : c.sfcb;
            const std::string what = std::string(flavourName(f)) + " " + c.named;
            AssocParams ap;
            ap.assocClass = c.named;
            OpResult r = h.associatorNames(alpha, ap);
            EXPECT_TRUE(r.ok()) << what << ": " << statusLine(r);
            EXPECT_TRUE(r.done) << what;
            EXPECT_EQ(r.paths.size(), want) << what;
            EXPECT_EQ(h.associators(alpha, ap).instances.size(), want) << what;
            ap = AssocParams();
            ap.resultClass = c.named;
            EXPECT_EQ(h.referenceNames(alpha, ap).paths.size(), want) << what;
            EXPECT_EQ(h.references(alpha, ap).instances.size(), want) << what;
        }
    }
    // The provider's association classes are its registration's when there is one.
    h.setFlavour(Flavour::Pegasus);
    h.setRegistrations({Registration{"Tiny_Thing", {MiType::Instance}}});
    EXPECT_TRUE(h.associatorNames(alpha).paths.empty());
    h.setRegistrations({Registration{"Tiny_Link", {MiType::Instance, MiType::Association}}});
    EXPECT_EQ(h.associatorNames(alpha).paths.size(), 1u);
    // The calls as made, whatever the flavour.
    AssocParams parent;
    parent.assocClass = "Tiny_Relation";
    EXPECT_TRUE(h.associatorNamesAsCalled(alpha, parent).paths.empty());
}

TEST_F(HostTest, InvokeMethodPassesTypedArgumentsBothWays) {
    const ObjectPath alpha = p("Tiny_Thing.Name=\"alpha\",Id=1");
    OpResult r = h.invokeMethod(alpha, "Echo",
                                {{"Text", Value::fromString("ab")}, {"Times", Value::fromUnsigned(Type::UInt16, 2)}});
    ASSERT_TRUE(r.ok()) << statusLine(r);
    ASSERT_FALSE(r.data.empty());
    EXPECT_EQ(r.data[0], Value::fromUnsigned(Type::UInt32, 4));
    ASSERT_EQ(r.outArgs.size(), 2u);
    EXPECT_EQ(r.outArgs[0].first, "Reply");
    EXPECT_EQ(r.outArgs[0].second.s, "abab");
    EXPECT_EQ(r.outArgs[1].second,
              Value::arrayOf(Type::UInt8, {Value::fromUnsigned(Type::UInt8, 1), Value::fromUnsigned(Type::UInt8, 2),
                                           Value::fromUnsigned(Type::UInt8, 3)}));
    r = h.invokeMethod(alpha, "Fail", {});
    EXPECT_EQ(statusLine(r), "CMPI_RC_ERR_FAILED: Fail was asked to fail");
    EXPECT_EQ(h.invokeMethod(alpha, "Nope", {}).rc, 17);
    EXPECT_EQ(h.invokeMethod(alpha, "Echo", {}).rc, 4);
}

TEST_F(HostTest, BrokerServesAProviderWrittenInC) {
    // The provider checks strings, datetimes, arrays, paths, instances with
    // filters, memory, threads and the up-calls against the broker.
    const OpResult r = h.invokeMethod(p("Tiny_Thing.Name=\"alpha\",Id=1"), "Probe", {});
    ASSERT_TRUE(r.ok()) << statusLine(r);
    ASSERT_EQ(r.outArgs.size(), 1u);
    EXPECT_EQ(r.data[0].u, 0u) << "first failed check: " << r.outArgs[0].second.s;
    const auto log = h.logLines();
    EXPECT_NE(std::find(log.begin(), log.end(), "log[1] tiny: probe done"), log.end());
}

// ---------------------------------------------------------------- strict mode

TEST_F(HostTest, StrictModeRejectsWhatDisagreesWithTheMof) {
    struct Case {
        const char* cls;
        bool names;
        const char* expected;
    };
    const Case cases[] = {
        {"Tiny_BadType", false, "property Tiny_BadType.Count is uint32 in the MOF but the provider gave string"},
        {"Tiny_BadProp", false, "class Tiny_BadProp has no property Bogus"},
        {"Tiny_NoKey", false, "instance of Tiny_NoKey lacks its key property Id"},
        {"Tiny_NoKey", true, "object path of Tiny_NoKey lacks its key Id"},
    };
    for (const auto& c : cases) {
        const OpResult r = c.names ? h.enumerateInstanceNames(p(c.cls)) : h.enumerateInstances(p(c.cls));
        EXPECT_EQ(r.rc, 1) << c.cls;
        EXPECT_NE(r.message.find(c.expected), std::string::npos) << r.message;
        EXPECT_EQ(r.message.find("strict check: "), 0u) << r.message;
    }
    const OpResult m = h.invokeMethod(p("Tiny_Thing.Name=\"alpha\",Id=1"), "BadOut", {});
    EXPECT_NE(m.message.find("output Tiny_Thing.BadOut.Reply is string in the MOF but the provider gave uint32"),
              std::string::npos)
        << m.message;

    h.setStrict(false);
    for (const auto& c : cases) EXPECT_TRUE(h.enumerateInstances(p(c.cls)).ok()) << c.cls;
    EXPECT_TRUE(h.invokeMethod(p("Tiny_Thing.Name=\"alpha\",Id=1"), "BadOut", {}).ok());
}

TEST(HostStrict, ClassesMissingFromTheMofFail) {
    Host h;
    h.setStrict(true);
    ASSERT_TRUE(h.load(TINY_PROVIDER, "Tiny").ok());
    const OpResult r = h.enumerateInstances(path("root/tiny:Tiny_Thing", h));
    EXPECT_EQ(statusLine(r), "CMPI_RC_ERR_FAILED: strict check: class Tiny_Thing is not declared in the MOF (and 1 more)");
    EXPECT_EQ(r.instances.size(), 2u);   // what arrived is still there to look at
}

// ---------------------------------------------------------------- loading

// A missing library and a wrong name: cimhost_cli_test.sh.
TEST(HostLoad, RefusesWhatAServerWouldRefuse) {
    Host h;
    const Status s = h.load(TINY_GENERIC_PROVIDER, "Tiny");
    EXPECT_EQ(s.rc, 1);
    EXPECT_NE(s.message.find("_Generic_Create_InstanceMI beside Tiny_Create_*MI"), std::string::npos) << s.message;
    EXPECT_FALSE(h.loaded());
    const OpResult r = h.enumerateInstances(path("Tiny_Thing", h));
    EXPECT_EQ(statusLine(r), "CMPI_RC_ERR_FAILED: no provider is loaded");
}

TEST(HostLoad, ProviderCannotReachHostFunctionsOutsideTheBroker) {
    Host h;
    EXPECT_EQ(rcName(0), std::string("CMPI_RC_OK"));   // the function is linked here...
    const Status s = h.load(TINY_LEAKY_PROVIDER, "Tiny");   // ...but not exported
    EXPECT_EQ(s.rc, 1);
    EXPECT_NE(s.message.find("undefined symbol: _ZN7cimhost6rcNameEi"), std::string::npos) << s.message;
}

TEST(HostLoad, MissingFactoryIsNotSupported) {
    Host h;
    ASSERT_TRUE(h.loadMof(TINY_MOF).ok());   // the association class the request goes to
    ASSERT_TRUE(h.load(TINY_NOASSOC_PROVIDER, "Tiny").ok());
    const OpResult r = h.associators(path("Tiny_Thing.Name=\"alpha\",Id=1", h));
    EXPECT_EQ(statusLine(r), "CMPI_RC_ERR_NOT_SUPPORTED: provider Tiny has no Tiny_Create_AssociationMI");
    EXPECT_TRUE(h.enumerateInstanceNames(path("Tiny_Thing", h)).ok());
}

TEST_F(HostTest, UnloadCleansUpEveryMiAndReloadStartsAFreshLibrary) {
    const ObjectPath alpha = p("Tiny_Thing.Name=\"alpha\",Id=1");
    ASSERT_TRUE(h.enumerateInstanceNames(p("Tiny_Thing")).ok());
    OpResult gen = h.invokeMethod(alpha, "Generation", {});
    ASSERT_TRUE(gen.ok());
    EXPECT_EQ(gen.data[0].u, 1u);
    ASSERT_TRUE(h.associatorNames(alpha).ok());

    ASSERT_TRUE(h.unload(true).ok());
    Counters c = h.counters();
    EXPECT_EQ(c.cleanupCalls, 3);   // instance, method, association
    EXPECT_EQ(c.unloads, 1);
    EXPECT_TRUE(hasEvent(c, "cleanup Instance terminating"));
    EXPECT_FALSE(h.loaded());
    EXPECT_TRUE(h.unload(true).ok());   // again: nothing to do

    ASSERT_TRUE(h.load(TINY_PROVIDER, "Tiny").ok());
    gen = h.invokeMethod(alpha, "Generation", {});
    ASSERT_TRUE(gen.ok());
    EXPECT_EQ(gen.data[0].u, 1u);   // static data of a new load, not 2
    c = h.counters();
    EXPECT_EQ(c.loads, 2);
    EXPECT_EQ(c.factoryCalls[2], 2);
}

TEST_F(HostTest, ProviderMayVetoAnIdleUnloadButNotShutdown) {
    const ObjectPath alpha = p("Tiny_Thing.Name=\"alpha\",Id=1");
    ASSERT_TRUE(h.invokeMethod(alpha, "SetVeto", {{"On", Value::fromBool(true)}}).ok());
    const Status s = h.unload(false);
    EXPECT_EQ(s.rc, 50);
    EXPECT_TRUE(h.loaded());
    EXPECT_TRUE(h.invokeMethod(alpha, "Generation", {}).ok());
    EXPECT_TRUE(h.unload(true).ok());
    EXPECT_FALSE(h.loaded());
}

TEST(HostFlavour, SfcbCallsFactoriesPerRegisteredClass) {
    for (Flavour f : {Flavour::Pegasus, Flavour::Sfcb}) {
        Host h;
        h.setFlavour(f);
        ASSERT_TRUE(h.loadMof(TINY_MOF).ok());
        ASSERT_TRUE(h.load(TINY_PROVIDER, "Tiny").ok());
        for (const char* cls : {"Tiny_Thing", "Tiny_BadType", "Tiny_Thing", "Tiny_NoKey"})
            ASSERT_TRUE(h.enumerateInstanceNames(path(cls, h)).ok());
        EXPECT_EQ(h.counters().factoryCalls[0], f == Flavour::Sfcb ? 3 : 1) << flavourName(f);
        ASSERT_TRUE(h.unload().ok());
        EXPECT_EQ(h.counters().cleanupCalls, 1) << flavourName(f);  // sfcb: once per MI type
    }
    // Explicit sections: subclasses fall to the nearest registered class.
    Host h;
    h.setFlavour(Flavour::Sfcb);
    ASSERT_TRUE(h.loadMof(TINY_MOF).ok());
    h.setRegistrations({{"Tiny_Base", {MiType::Instance}}});
    ASSERT_TRUE(h.load(TINY_PROVIDER, "Tiny").ok());
    for (const char* cls : {"Tiny_Thing", "Tiny_BadType"}) ASSERT_TRUE(h.enumerateInstanceNames(path(cls, h)).ok());
    EXPECT_EQ(h.counters().factoryCalls[0], 1);
}

// ---------------------------------------------------------------- indications

TEST_F(HostTest, PegasusDeliversFromTheProviderThreadByThePathsNamespace) {
    std::atomic<int> onOtherThread{0};
    const auto testThread = std::this_thread::get_id();
    h.setIndicationListener([&](const Indication&) {
        if (std::this_thread::get_id() != testThread) ++onOtherThread;
    });
    int id = 0;
    const Status s = h.activateFilter("SELECT * FROM Tiny_Event", "root/tiny", id);
    ASSERT_TRUE(s.ok()) << statusLine(s);
    for (unsigned seq = 1; seq <= 3; ++seq) {
        Indication ind;
        ASSERT_TRUE(h.waitIndication(ind, 5s)) << seq;
        EXPECT_EQ(ind.nameSpace, "root/tiny");
        EXPECT_EQ(ind.deliveredTo, "root/tiny");
        EXPECT_EQ(ind.instance.className(), "Tiny_Event");
        EXPECT_EQ(*ind.instance.property("Seq"), Value::fromUnsigned(Type::UInt32, seq));
        EXPECT_TRUE(ind.error.empty()) << ind.error;
    }
    // The fourth names root/other in its path: dropped, as OpenPegasus does.
    for (int k = 0; k < 500 && h.counters().indicationsDropped == 0; ++k) std::this_thread::sleep_for(10ms);
    Indication extra;
    EXPECT_FALSE(h.waitIndication(extra, 50ms));
    EXPECT_EQ(h.counters().indicationsDropped, 1);
    EXPECT_EQ(onOtherThread.load(), 3);

    int second = 0;
    ASSERT_TRUE(h.activateFilter("SELECT * FROM Tiny_Event WHERE Seq > 1", "root/tiny", second).ok());
    ASSERT_TRUE(h.deactivateFilter(second).ok());
    ASSERT_TRUE(h.deactivateFilter(id).ok());
    EXPECT_EQ(h.deactivateFilter(id).rc, 6);
    EXPECT_EQ(indicationCalls(h.counters()),
              (std::vector<std::string>{"activateFilter Tiny_Event first=1", "enableIndications",
                                        "activateFilter Tiny_Event first=0", "deActivateFilter Tiny_Event last=0",
                                        "deActivateFilter Tiny_Event last=1", "disableIndications"}));
}

TEST_F(HostTest, ADeliveryFromAThreadThatNeverAttachedIsFlagged) {
    int id = 0;
    ASSERT_TRUE(h.activateFilter("SELECT * FROM Tiny_Event WHERE Seq = 7", "root/tiny", id).ok());
    // Events 1..3 come from the provider's attached thread.
    Indication ind;
    for (int k = 0; k < 3; ++k) {
        ASSERT_TRUE(h.waitIndication(ind, 5s));
        EXPECT_TRUE(ind.error.empty()) << ind.error;
    }
    EXPECT_EQ(h.counters().indicationsFromUnattachedThreads, 0);
    ASSERT_TRUE(h.invokeMethod(p("Tiny_Thing.Name=\"alpha\",Id=1"), "DeliverStray", {}).ok());
    while (h.waitIndication(ind, 1s) && ind.instance.property("Seq")->u != 7) {
    }
    EXPECT_EQ(ind.instance.property("Seq")->u, 7u);
    EXPECT_NE(ind.error.find("neither a request thread nor attached"), std::string::npos) << ind.error;
    EXPECT_EQ(h.counters().indicationsFromUnattachedThreads, 1);
    const auto lines = h.logLines();
    EXPECT_NE(std::find_if(lines.begin(), lines.end(),
                           [](const std::string& l) { return l.find("neither a request thread") != std::string::npos; }),
              lines.end());
    ASSERT_TRUE(h.deactivateFilter(id).ok());
}

TEST(HostIndications, SfcbAuthorizesPollsAndTakesTheNamespaceArgument) {
    Host h;
    h.setFlavour(Flavour::Sfcb);
    h.setStrict(true);
    ASSERT_TRUE(h.loadMof(TINY_MOF).ok());
    ASSERT_TRUE(h.load(TINY_PROVIDER, "Tiny").ok());
    int id = 0;
    EXPECT_EQ(h.activateFilter("SELECT * FROM Tiny_Thing", "root/tiny", id).rc, 2);   // authorizeFilter refuses
    ASSERT_TRUE(h.activateFilter("select * from Tiny_Event", "root/tiny", id).ok());
    std::vector<std::uint64_t> seqs;
    Indication ind;
    while (seqs.size() < 4 && h.waitIndication(ind, 5s)) seqs.push_back(ind.instance.property("Seq")->u);
    EXPECT_EQ(seqs, (std::vector<std::uint64_t>{1, 2, 3, 99}));
    ASSERT_TRUE(h.deactivateFilter(id).ok());
    EXPECT_EQ(indicationCalls(h.counters()),
              (std::vector<std::string>{"authorizeFilter Tiny_Thing", "authorizeFilter Tiny_Event",
                                        "mustPoll Tiny_Event", "activateFilter Tiny_Event first=1",
                                        "enableIndications", "deActivateFilter Tiny_Event last=1"}));
    // Unload with the thread still running: cleanup must stop it first.
    EXPECT_TRUE(h.unload().ok());
}

TEST_F(HostTest, BadFiltersAreRefused) {
    int id = 0;
    EXPECT_EQ(h.activateFilter("DELETE FROM Tiny_Event", "", id).rc, 15);
    EXPECT_EQ(h.activateFilter("SELECT * FROM", "", id).rc, 15);
    EXPECT_EQ(id, 0);
}

TEST_F(HostTest, ConcurrentRequestsEachGetTheirOwnResults) {
    std::vector<std::thread> threads;
    std::atomic<int> good{0};
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([&] {
            for (int k = 0; k < 25; ++k) {
                const OpResult r = h.enumerateInstances(p("Tiny_Thing"));
                if (r.ok() && r.instances.size() == 2) ++good;
            }
        });
    }
    for (auto& t : threads) t.join();
    EXPECT_EQ(good.load(), 100);
    EXPECT_EQ(h.counters().factoryCalls[0], 1);
}

}  // namespace

// Associations through the shipped provider in a strict embedded CIM host:
// every association class walked both ways from each of its enumerated
// pairs, the dispatcher's choice of modules (CIM parent names, the gate, the
// misspelled parent of referenceNames), the filters of the filtering form,
// the third properties, getInstance of an association, and profile
// conformance. Runs under tests/isolate.sh: /opt and /var/tmp are private.
#include <gtest/gtest.h>
#include <strings.h>

#include <algorithm>
#include <functional>
#include <map>
#include <set>
#include <string>
#include <vector>

#include "cmpidt.h"
#include "cimhost/text.h"
#include "provider_env.h"

using namespace provtest;

using cimhost::AssocParams;
using cimhost::Instance;
using cimhost::ObjectPath;
using cimhost::OpResult;
using cimhost::Value;
using cimhost::formatValue;

namespace {

// An object by class and keys; namespace and host don't count.
std::string identity(const ObjectPath& p)
{
    std::string text = p.className + "|";
    std::transform(text.begin(), text.end(), text.begin(), ::tolower);
    for (const auto& k : p.keys)
        text += k.first + "=" + (k.second.ref ? identity(*k.second.ref) : formatValue(k.second)) + ";";
    return text;
}

bool hasEmptyKey(const ObjectPath& p)
{
    for (const auto& k : p.keys)
        if (k.second.ref ? hasEmptyKey(*k.second.ref)
                         : k.second.type == cimhost::Type::String && k.second.s.empty())
            return true;
    return false;
}

std::set<std::string> identities(const std::vector<ObjectPath>& paths)
{
    std::set<std::string> out;
    for (const auto& p : paths)
        out.insert(identity(p));
    return out;
}

std::vector<std::string> classesOf(const std::vector<ObjectPath>& paths)
{
    std::set<std::string> names;
    for (const auto& p : paths)
        names.insert(p.className);
    return {names.begin(), names.end()};
}

AssocParams assoc(const std::string& cls)
{
    AssocParams p;
    p.assocClass = cls;
    return p;
}

AssocParams result(const std::string& cls)
{
    AssocParams p;
    p.resultClass = cls;
    return p;
}

ObjectPath firstOf(cimhost::Host& host, const std::string& cls)
{
    OpResult r = host.enumerateInstanceNames(classPath(cls));
    EXPECT_EQ(r.rc, CMPI_RC_OK) << cls;
    EXPECT_FALSE(r.paths.empty()) << cls;
    return r.paths.empty() ? classPath(cls) : r.paths.front();
}

void expectClean(const OpResult& r, const std::string& what)
{
    EXPECT_EQ(r.rc, CMPI_RC_OK) << what << ": " << r.message;
    EXPECT_TRUE(r.strictErrors.empty()) << what << ": " << (r.strictErrors.empty() ? "" : r.strictErrors[0]);
}

class Associations : public ProviderSuite<Associations> {
protected:
    static void SetUpTestSuite() { startSuite(kLogsOn, nullptr, "Vexlan_Adapter_ComputerSystem"); }
};

// Every pair that an association class enumerates is found again from
// either end: by associatorNames and by referenceNames, with the
// association's own name. Pairs with an empty key (a list slot that the
// build left empty) are the only ones a search can't reach.
TEST_F(Associations, EveryEnumeratedPairIsFoundFromBothEnds)
{
    const std::vector<std::string> classes = providerClasses(host()).associations;
    ASSERT_EQ(classes.size(), 55u);
    // From the computer system the join compares each port's MAC with the
    // system's Name, so only the way back finds these pairs.
    const std::set<std::string> onlyFromSecondEnd = {"Vexlan_NIC_ComputerSystemRemoteServiceAccessPoint"};
    // getInstance proves the access point through the computer system's
    // class, which knows no access point.
    const std::set<std::string> refusedByGetInstance = {"Vexlan_NIC_RemoteServiceAccessPointIPProtocolEndpoint"};
    // The Server profile names the computer system's host, the object
    // manager its own host name: where they differ there is no pair.
    const std::set<std::string> hostDependent = {"Vexlan_FCHBA_RegisteredProfileObjectManager"};
    int walked = 0;
    for (const std::string& cls : classes) {
        OpResult pairs = host().enumerateInstanceNames(classPath(cls));
        expectClean(pairs, cls);
        EXPECT_TRUE(hostDependent.count(cls) || !pairs.paths.empty()) << cls << " has no pairs on the default host";
        OpResult full = host().enumerateInstances(classPath(cls));
        expectClean(full, cls);
        EXPECT_EQ(full.instances.size(), pairs.paths.size()) << cls;
        // The NIC package search compares the Tag that the NIC port's VPD
        // gives; the package itself takes its Tag from the FC function's VPD,
        // which on the default host holds a UUID keyword the NIC port lacks.
        if (cls == "Vexlan_NIC_PhysicalPackagePortController")
            continue;
        int checked = 0;
        for (const ObjectPath& pair : pairs.paths) {
            if (checked == 3 || hasEmptyKey(pair))
                continue;
            ++checked;
            ASSERT_EQ(pair.keys.size(), 2u) << cls;
            const ObjectPath& end1 = *pair.keys[0].second.ref;
            const ObjectPath& end2 = *pair.keys[1].second.ref;
            const OpResult from1 = host().associatorNames(end1, assoc(cls));
            const OpResult from2 = host().associatorNames(end2, assoc(cls));
            expectClean(from1, cls + " from " + end1.className);
            expectClean(from2, cls + " from " + end2.className);
            EXPECT_TRUE(onlyFromSecondEnd.count(cls) || identities(from1.paths).count(identity(end2)))
                << cls << ": " << identity(end1);
            EXPECT_TRUE(identities(from2.paths).count(identity(end1))) << cls << ": " << identity(end2);
            const OpResult refs = host().referenceNames(onlyFromSecondEnd.count(cls) ? end2 : end1, result(cls));
            expectClean(refs, cls);
            EXPECT_TRUE(identities(refs.paths).count(identity(pair))) << cls;
            const OpResult got = host().getInstance(pair);
            if (refusedByGetInstance.count(cls)) {
                EXPECT_EQ(got.rc, CMPI_RC_ERR_NOT_FOUND) << cls;
            } else {
                expectClean(got, cls);
                EXPECT_EQ(got.instances.size(), 1u) << cls;
            }
            ++walked;
        }
    }
    EXPECT_GT(walked, 100);
}

// The recipe walks of the FC HBA and NIC profiles name CIM parent classes.
// OpenPegasus asks the provider once for each of its classes derived from the
// parent (the host's pegasus flavour); sfcb hands the parent over as it is
// (the call as made): both must give the same answers.
TEST_F(Associations, ParentClassWalksAnswerAlikeInBothServers)
{
    enum Op { Names, Refs };
    struct Walk {
        const char* source;
        Op op;
        const char* parent;
        const char* resultClass;
        std::vector<std::string> classes;   // association classes of the references, when known
    } walks[] = {
        {"Vexlan_Adapter_ComputerSystem", Names, "CIM_SystemDevice", "CIM_FCPort", {}},
        {"Vexlan_Adapter_ComputerSystem", Refs, "CIM_SystemDevice", "",
         {"Vexlan_FCHBA_ComputerSystemFCPort", "Vexlan_FCHBA_ComputerSystemPortController",
          "Vexlan_FCHBA_ComputerSystemSCSIProtocolController", "Vexlan_FCHBA_ComputerSystemStorageExtent",
          "Vexlan_NIC_ComputerSystemEthernetPort", "Vexlan_NIC_ComputerSystemNetworkPort",
          "Vexlan_NIC_ComputerSystemPortController"}},
        {"Vexlan_Adapter_ComputerSystem", Refs, "CIM_HostedAccessPoint", "", {}},
        {"Vexlan_Adapter_ComputerSystem", Names, "CIM_HostedService", "", {}},
        {"Vexlan_Adapter_ComputerSystem", Refs, "CIM_HostedService", "", {}},
        {"Vexlan_Adapter_ComputerSystem", Names, "CIM_InstalledSoftwareIdentity", "", {}},
        {"Vexlan_Adapter_ComputerSystem", Refs, "CIM_InstalledSoftwareIdentity", "",
         {"Vexlan_FCHBA_ComputerSystemSoftwareIdentity", "Vexlan_NIC_ComputerSystemSoftwareIdentity"}},
        {"Vexlan_FCHBA_FCPort", Names, "CIM_ControlledBy", "", {}},
        {"Vexlan_FCHBA_FCPort", Names, "CIM_ElementStatisticalData", "", {}},
        {"Vexlan_FCHBA_FCPort", Names, "CIM_DeviceSAPImplementation", "", {}},
        {"Vexlan_FCHBA_FCPort", Refs, "CIM_Realizes", "",
         {"Vexlan_FCHBA_PhysicalConnectorFCPort", "Vexlan_FCHBA_PhysicalPortFCPort"}},
        {"Vexlan_FCHBA_SoftwareInstallationService", Names, "CIM_ElementCapabilities", "", {}},
        {"Vexlan_NIC_SoftwareInstallationService", Refs, "CIM_ElementCapabilities", "", {}},
        {"Vexlan_NIC_EthernetPort2", Refs, "CIM_SystemDevice", "", {"Vexlan_NIC_ComputerSystemEthernetPort"}},
        {"Vexlan_NIC_EthernetPort2", Refs, "CIM_Realizes", "",
         {"Vexlan_NIC_PhysicalConnectorEthernetPort", "Vexlan_NIC_PhysicalPortEthernetPort"}},
        {"Vexlan_NIC_EthernetPort2", Names, "CIM_PortImplementsEndpoint", "", {}},
        {"Vexlan_NIC_EthernetPort2", Refs, "CIM_PortImplementsEndpoint", "", {"Vexlan_NIC_EthernetPortLANEndpoint"}},
        {"Vexlan_NIC_EthernetPort2", Refs, "CIM_ControlledBy", "", {"Vexlan_NIC_PortControllerEthernetPort"}},
        {"Vexlan_NIC_LANEndpoint", Names, "CIM_BindsToLANEndpoint", "", {}},
        {"Vexlan_NIC_LANEndpoint", Refs, "CIM_BindsToLANEndpoint", "", {"Vexlan_NIC_LANEndpointIPProtocolEndpoint"}},
    };
    for (const Walk& w : walks) {
        const ObjectPath source = firstOf(host(), w.source);
        const std::string what = std::string(w.source) + (w.op == Names ? " associatorNames " : " referenceNames ") +
                                 w.parent;
        AssocParams p;
        (w.op == Names ? p.assocClass : p.resultClass) = w.parent;
        if (w.op == Names)
            p.resultClass = w.resultClass;
        const OpResult pegasus = w.op == Names ? host().associatorNames(source, p) : host().referenceNames(source, p);
        const OpResult sfcb =
            w.op == Names ? host().associatorNamesAsCalled(source, p) : host().referenceNamesAsCalled(source, p);
        expectClean(pegasus, what + " (OpenPegasus)");
        expectClean(sfcb, what + " (sfcb)");
        EXPECT_FALSE(sfcb.paths.empty()) << what;
        EXPECT_EQ(identities(sfcb.paths), identities(pegasus.paths)) << what;
        EXPECT_EQ(sfcb.paths.size(), pegasus.paths.size()) << what;
        if (!w.classes.empty()) {
            EXPECT_EQ(classesOf(sfcb.paths), w.classes) << what;
        }
    }
    // The ports a client wants from the system: the FC ports are all there.
    AssocParams ports = assoc("CIM_SystemDevice");
    ports.resultClass = "CIM_FCPort";
    const OpResult found = host().associatorNamesAsCalled(firstOf(host(), "Vexlan_Adapter_ComputerSystem"), ports);
    std::set<std::string> got = identities(found.paths);
    for (const ObjectPath& port : host().enumerateInstanceNames(classPath("Vexlan_FCHBA_FCPort")).paths)
        EXPECT_TRUE(got.count(identity(port))) << identity(port);
}

// What a server hands over that names no class keeps the dispatch table's
// meaning: the misspelled parent of the FC port's realizations in
// referenceNames, and an association class that doesn't stand at the source.
TEST_F(Associations, TextsThatNameNoDerivedClassKeepTheirDispatch)
{
    const ObjectPath port = firstOf(host(), "Vexlan_FCHBA_FCPort");
    const OpResult old = host().referenceNamesAsCalled(port, result("CIM_Reailizes"));
    expectClean(old, "referenceNames CIM_Reailizes");
    EXPECT_EQ(classesOf(old.paths), (std::vector<std::string>{"Vexlan_FCHBA_PhysicalConnectorFCPort",
                                                              "Vexlan_FCHBA_PhysicalPortFCPort"}));
    // OpenPegasus knows no such class and never asks the provider.
    EXPECT_TRUE(host().referenceNames(port, result("CIM_Reailizes")).paths.empty());

    const OpResult gated = host().associatorNamesAsCalled(firstOf(host(), "Vexlan_Adapter_Product"),
                                                          assoc("Vexlan_FCHBA_ComputerSystemFCPort"));
    expectClean(gated, "gate");
    EXPECT_TRUE(gated.paths.empty());
    const OpResult unrelated = host().associatorNamesAsCalled(port, assoc("CIM_MemberOfCollection"));
    expectClean(unrelated, "CIM_MemberOfCollection from a port");
    EXPECT_EQ(classesOf(unrelated.paths), (std::vector<std::string>{"Vexlan_FCHBA_LogicalPortGroup"}));
}

TEST_F(Associations, WithoutAnAssociationClassEveryRowOfTheSourceRuns)
{
    // A product stands in one row: only its package answers.
    const OpResult product = host().associatorNames(firstOf(host(), "Vexlan_Adapter_Product"));
    expectClean(product, "product");
    EXPECT_EQ(classesOf(product.paths), (std::vector<std::string>{"Vexlan_Adapter_PhysicalPackage"}));

    // The computer system reaches both sides.
    const OpResult cs = host().referenceNames(firstOf(host(), "Vexlan_Adapter_ComputerSystem"));
    expectClean(cs, "computer system");
    const std::vector<std::string> classes = classesOf(cs.paths);
    EXPECT_TRUE(std::count(classes.begin(), classes.end(), "Vexlan_FCHBA_ComputerSystemFCPort"));
    EXPECT_TRUE(std::count(classes.begin(), classes.end(), "Vexlan_NIC_ComputerSystemEthernetPort"));
    EXPECT_TRUE(std::count(classes.begin(), classes.end(), "Vexlan_NIC_ComputerSystemSoftwareInstallationService"));
    EXPECT_GT(countLog("m_assocLookupTableSize = 112"), 0);
}

TEST_F(Associations, AClassOutsideTheTableHasNoAssociatorsAndNothingFails)
{
    // OpenPegasus asks for each association class that can reference the
    // job: the three conformance classes, whose managed element is any
    // CIM_ManagedElement; the gate closes each time. sfcb asks once, with no
    // association class.
    const ObjectPath job = classPath("Vexlan_Adapter_ConcreteJob");
    removeLog();
    OpResult r = host().associators(job);
    expectClean(r, "associators of a job");
    EXPECT_TRUE(r.instances.empty());
    EXPECT_EQ(countLog("Class Vexlan_Adapter_ConcreteJob has no associators"), 3);
    removeLog();
    r = host().associatorsAsCalled(job, {});
    expectClean(r, "associators of a job");
    EXPECT_TRUE(r.instances.empty());
    EXPECT_EQ(countLog("Class Vexlan_Adapter_ConcreteJob has no associators"), 1);
    r = host().associatorNamesAsCalled(job, {});
    EXPECT_EQ(countLog("Class Vexlan_Adapter_ConcreteJob has no associatorNames"), 1);
    r = host().referenceNamesAsCalled(job, {});
    expectClean(r, "referenceNames of a job");
    EXPECT_TRUE(r.paths.empty());
}

TEST_F(Associations, TheFilteringFormTestsRoleAndResultClassThePlainFormDoesNot)
{
    const ObjectPath cs = firstOf(host(), "Vexlan_Adapter_ComputerSystem");
    AssocParams p = assoc("Vexlan_NIC_ComputerSystemEthernetPort");
    p.role = "PartComponent";   // the wrong end
    OpResult r = host().associatorNames(cs, p);
    expectClean(r, "wrong role");
    EXPECT_TRUE(r.paths.empty());
    p.role = "groupcomponent";
    r = host().associatorNames(cs, p);
    EXPECT_EQ(r.paths.size(), 2u);
    p.role.clear();
    p.resultClass = "Vexlan_NIC_LANEndpoint";   // outside the partner's hierarchy
    r = host().associatorNames(cs, p);
    EXPECT_TRUE(r.paths.empty());
    p.resultClass = "CIM_EthernetPort";
    r = host().associatorNames(cs, p);
    EXPECT_EQ(r.paths.size(), 2u);

    // The plain form answers whatever role is asked for.
    AssocParams plain = assoc("Vexlan_FCHBA_ComputerSystemFCPort");
    plain.role = "PartComponent";
    plain.resultClass = "Vexlan_NIC_LANEndpoint";
    r = host().associatorNames(cs, plain);
    expectClean(r, "plain");
    EXPECT_EQ(r.paths.size(), enumerate(host(), "Vexlan_FCHBA_FCPort").instances.size());
}

TEST_F(Associations, ComputerSystemSearchesTrustTheSourceOneWayOnly)
{
    // From another host's computer system the FC ports still answer...
    const OpResult all = host().associatorNames(hostPath(Value::fromString("elsewhere")),
                                                assoc("Vexlan_FCHBA_ComputerSystemFCPort"));
    expectClean(all, "another host");
    EXPECT_EQ(all.paths.size(), enumerate(host(), "Vexlan_FCHBA_FCPort").instances.size());
    // ...and the NIC side tests the host first.
    const OpResult nic = host().associatorNames(hostPath(Value::fromString("elsewhere")),
                                                assoc("Vexlan_NIC_ComputerSystemEthernetPort"));
    EXPECT_TRUE(nic.paths.empty());

    // The way back tests the host's name, not the port: a made-up port leads
    // to the computer system, a port of another host doesn't.
    ObjectPath port = firstOf(host(), "Vexlan_FCHBA_FCPort");
    port.setKey("DeviceID", Value::fromString("no such port"));
    OpResult back = host().associatorNames(port, assoc("Vexlan_FCHBA_ComputerSystemFCPort"));
    EXPECT_EQ(back.paths.size(), 1u);
    port.setKey("SystemName", Value::fromString("elsewhere"));
    back = host().associatorNames(port, assoc("Vexlan_FCHBA_ComputerSystemFCPort"));
    EXPECT_TRUE(back.paths.empty());
}

TEST_F(Associations, AccessModeAndUpgradeConditionStandWhereTheyBelong)
{
    auto hasProperty = [](const std::vector<Instance>& list, const std::string& name) {
        return !list.empty() && std::all_of(list.begin(), list.end(), [&](const Instance& i) {
                   return i.property(name) != nullptr;
               });
    };
    const ObjectPath port = firstOf(host(), "Vexlan_FCHBA_FCPort");
    const OpResult scsiRefs = host().references(port, result("Vexlan_FCHBA_SCSIProtocolControllerFCPort"));
    expectClean(scsiRefs, "SCSI controller references");
    EXPECT_TRUE(hasProperty(scsiRefs.instances, "AccessMode"));
    EXPECT_EQ(scsiRefs.instances.front().property("AccessMode")->u, 2u);
    const OpResult scsiAll = enumerate(host(), "Vexlan_FCHBA_SCSIProtocolControllerFCPort");
    EXPECT_FALSE(scsiAll.instances.empty());
    EXPECT_EQ(scsiAll.instances.front().property("AccessMode"), nullptr);

    EXPECT_TRUE(hasProperty(host().references(port, result("Vexlan_FCHBA_PortControllerFCPort")).instances,
                            "AccessMode"));
    EXPECT_TRUE(hasProperty(enumerate(host(), "Vexlan_FCHBA_PortControllerFCPort").instances, "AccessMode"));
    const OpResult software = enumerate(host(), "Vexlan_FCHBA_SoftwareIdentityPortController");
    EXPECT_TRUE(hasProperty(software.instances, "UpgradeCondition"));
    EXPECT_EQ(software.instances.front().property("UpgradeCondition")->u, 3u);
    // Reference paths carry the two roles only.
    const OpResult names = host().referenceNames(port, result("Vexlan_FCHBA_PortControllerFCPort"));
    ASSERT_FALSE(names.paths.empty());
    EXPECT_EQ(keyNames(names.paths.front()), (std::vector<std::string>{"Antecedent", "Dependent"}));
}

TEST_F(Associations, GetInstanceProvesBothEndsButNotThatTheyBelongTogether)
{
    OpResult pairs = host().enumerateInstanceNames(classPath("Vexlan_FCHBA_PortControllerFCPort"));
    ASSERT_GE(pairs.paths.size(), 2u);
    // The controller of one pair with the port of another of another adapter.
    ObjectPath mixed = pairs.paths.front();
    mixed.keys[1] = pairs.paths.back().keys[1];
    OpResult got = host().getInstance(mixed);
    expectClean(got, "mixed pair");
    EXPECT_EQ(got.instances.size(), 1u);

    ObjectPath missing = pairs.paths.front();
    ObjectPath port = *missing.keys[1].second.ref;
    port.setKey("DeviceID", Value::fromString("no such port"));
    missing.keys[1].second = Value::fromRef(port);
    got = host().getInstance(missing);
    EXPECT_EQ(got.rc, CMPI_RC_ERR_NOT_FOUND);
}

TEST_F(Associations, ProfilesLeadToTheirPortsAndPortsBackToTheirProfile)
{
    ObjectPath profile = classPath("Vexlan_NIC_RegisteredProfile");
    profile.setKey("InstanceID", Value::fromString("1"));
    OpResult ports = host().associatorNames(profile, assoc("Vexlan_NIC_ElementConformsToRegisteredProfile"));
    expectClean(ports, "profile 1");
    EXPECT_EQ(classesOf(ports.paths), (std::vector<std::string>{"Vexlan_NIC_EthernetPort2"}));
    EXPECT_EQ(ports.paths.size(), enumerate(host(), "Vexlan_NIC_EthernetPort2").instances.size());

    for (const char* id : {"4", "eight", ""}) {
        profile.setKey("InstanceID", Value::fromString(id));
        ports = host().associatorNames(profile, assoc("Vexlan_NIC_ElementConformsToRegisteredProfile"));
        expectClean(ports, std::string("profile ") + id);
        EXPECT_TRUE(ports.paths.empty()) << id;
    }

    const OpResult back = host().associatorNames(firstOf(host(), "Vexlan_NIC_IPProtocolEndpoint"),
                                                 assoc("Vexlan_NIC_ElementConformsToRegisteredProfile"));
    expectClean(back, "IP endpoint");
    ASSERT_EQ(back.paths.size(), 1u);
    EXPECT_EQ(back.paths[0].key("InstanceID")->s, "3");
}

TEST_F(Associations, NicSoftwareIdentitiesOfOtherKindsHaveNoPartners)
{
    const std::string serial = firstOf(host(), "Vexlan_NIC_PortController").key("DeviceID")->s;
    const std::string adapter = serial.substr(0, serial.find('_'));
    ObjectPath identity = classPath("Vexlan_NIC_SoftwareIdentity");
    for (const char* kind : {"2", "3", "1", "4", "258"}) {
        identity.setKey("InstanceID", Value::fromString(std::string(kind) + "_" + adapter));
        const OpResult r = host().associatorNames(identity, assoc("Vexlan_NIC_SoftwareIdentityPortController"));
        expectClean(r, kind);
        // 258 keeps its low 8 bits: 2.
        const bool admitted = std::string(kind) == "2" || std::string(kind) == "3" || std::string(kind) == "258";
        EXPECT_EQ(r.paths.size(), admitted ? 1u : 0u) << kind;
    }
}

// The first steps of a management client: the profiles in the interop
// namespace, then each profile's central instances through the CIM parent
// of conformance, with ResultRole ManagedElement; in both servers. Every
// path the provider returns names the namespace where its object is served.
TEST_F(Associations, ProfilesInTheInteropNamespaceLeadToTheirCentralInstances)
{
    const std::string interop = "root/interop";
    auto inInterop = [&](ObjectPath p) {
        p.nameSpace = interop;
        return p;
    };
    AssocParams conformance = assoc("CIM_ElementConformsToProfile");
    conformance.resultRole = "ManagedElement";
    struct Central {
        const char* profileClass;
        const char* registeredName;
        const char* centralClass;
    } centrals[] = {
        {"Vexlan_FCHBA_RegisteredProfile", "FC HBA", "Vexlan_Adapter_ComputerSystem"},
        {"Vexlan_NIC_RegisteredProfile", "Ethernet Port", "Vexlan_NIC_EthernetPort2"},
        {"Vexlan_NIC_RegisteredProfile", "Host LAN Network Port", "Vexlan_NIC_NetworkPort"},
        {"Vexlan_NIC_RegisteredProfile", "IP Interface", "Vexlan_NIC_IPProtocolEndpoint"},
    };
    for (const Central& c : centrals) {
        OpResult profiles = host().enumerateInstances(inInterop(classPath(c.profileClass)));
        expectClean(profiles, c.profileClass);
        const Instance* profile = nullptr;
        for (const Instance& i : profiles.instances)
            if (propertyText(i, "RegisteredName") == c.registeredName)
                profile = &i;
        ASSERT_NE(profile, nullptr) << c.registeredName;
        EXPECT_EQ(profile->path.nameSpace, interop);
        const OpResult pegasus = host().associatorNames(profile->path, conformance);
        const OpResult sfcb = host().associatorNamesAsCalled(profile->path, conformance);
        expectClean(sfcb, c.registeredName);
        const size_t have = enumerate(host(), c.centralClass).instances.size();
        ASSERT_GT(have, 0u) << c.centralClass;
        EXPECT_EQ(classesOf(sfcb.paths), std::vector<std::string>{c.centralClass}) << c.registeredName;
        EXPECT_EQ(sfcb.paths.size(), have) << c.registeredName;
        EXPECT_EQ(identities(pegasus.paths), identities(sfcb.paths)) << c.registeredName;
        for (const ObjectPath& central : sfcb.paths) {
            EXPECT_EQ(central.nameSpace, kNamespace) << identity(central);
            EXPECT_EQ(host().getInstance(central).instances.size(), 1u) << identity(central);
        }
    }

    // The issue a client met: the conformance pairs enumerated in the interop
    // namespace name the ports where they are served.
    const OpResult pairs =
        host().enumerateInstanceNames(inInterop(classPath("Vexlan_NIC_ElementConformsToRegisteredProfile")));
    expectClean(pairs, "conformance in the interop namespace");
    ASSERT_FALSE(pairs.paths.empty());
    for (const ObjectPath& pair : pairs.paths) {
        EXPECT_EQ(pair.nameSpace, interop);
        EXPECT_EQ(pair.key("ManagedElement")->ref->nameSpace, kNamespace);
        EXPECT_EQ(pair.key("ConformantStandard")->ref->nameSpace, kNamespace);
    }
    // A request without an association class in the interop namespace is
    // answered for the profile associations served there only.
    ObjectPath fcHba = inInterop(classPath("Vexlan_FCHBA_RegisteredProfile"));
    for (const Instance& i : enumerate(host(), "Vexlan_FCHBA_RegisteredProfile").instances)
        if (propertyText(i, "RegisteredName") == "FC HBA")
            fcHba.keys = i.path.keys;
    const OpResult inInteropRefs = host().referenceNamesAsCalled(fcHba, {});
    expectClean(inInteropRefs, "references of the FC HBA profile in the interop namespace");
    EXPECT_EQ(classesOf(inInteropRefs.paths),
              (std::vector<std::string>{"Vexlan_FCHBA_RegisteredProfileComputerSystem",
                                        "Vexlan_FCHBA_RegisteredProfileRegisteredSubProfile"}));
    fcHba.nameSpace = kNamespace;
    const std::vector<std::string> everywhere = classesOf(host().referenceNamesAsCalled(fcHba, {}).paths);
    EXPECT_TRUE(std::count(everywhere.begin(), everywhere.end(), "Vexlan_FCHBA_SoftwareIdentityRegisteredProfile"));

    // From a port back to its profile: the profile where every server serves it.
    const OpResult back = host().associatorNames(firstOf(host(), "Vexlan_NIC_EthernetPort2"),
                                                 assoc("CIM_ElementConformsToProfile"));
    expectClean(back, "port to profile");
    ASSERT_EQ(back.paths.size(), 1u);
    EXPECT_EQ(back.paths[0].nameSpace, kNamespace);
    EXPECT_EQ(back.paths[0].key("InstanceID")->s, "1");
}

// The FC profiles and the joins of their associations: the FC HBA profile's
// central instance is the computer system; every FC profile of the host
// reaches it, and the way back knows the FC HBA profile alone.
TEST_F(Associations, TheFcProfilesAreServedWithTheirJoins)
{
    const OpResult profiles = enumerate(host(), "Vexlan_FCHBA_RegisteredProfile");
    ASSERT_EQ(profiles.instances.size(), 4u);
    ASSERT_EQ(enumerate(host(), "Vexlan_FCHBA_RegisteredSubProfile").instances.size(), 2u);
    ObjectPath fcHba, server;
    for (const Instance& i : profiles.instances) {
        if (propertyText(i, "RegisteredName") == "FC HBA")
            fcHba = i.path;
        if (propertyText(i, "RegisteredName") == "Server")
            server = i.path;
        const OpResult got = host().getInstance(i.path);
        expectClean(got, "profile");
        EXPECT_EQ(got.instances.size(), 1u);
        const OpResult system = host().associatorNames(i.path, assoc("Vexlan_FCHBA_RegisteredProfileComputerSystem"));
        expectClean(system, propertyText(i, "RegisteredName"));
        EXPECT_EQ(classesOf(system.paths), std::vector<std::string>{"Vexlan_Adapter_ComputerSystem"});
    }
    const ObjectPath cs = firstOf(host(), "Vexlan_Adapter_ComputerSystem");
    const OpResult claimed = host().associatorNames(cs, assoc("Vexlan_FCHBA_RegisteredProfileComputerSystem"));
    ASSERT_EQ(claimed.paths.size(), 1u);
    EXPECT_EQ(identity(claimed.paths[0]), identity(fcHba));

    const OpResult subs = host().associatorNames(fcHba, assoc("CIM_ReferencedProfile"));
    expectClean(subs, "sub-profiles");
    EXPECT_EQ(subs.paths.size(), 2u);
    EXPECT_EQ(classesOf(subs.paths), std::vector<std::string>{"Vexlan_FCHBA_RegisteredSubProfile"});
    for (const ObjectPath& sub : subs.paths) {
        const OpResult up = host().associatorNames(sub, assoc("Vexlan_FCHBA_RegisteredProfileRegisteredSubProfile"));
        ASSERT_EQ(up.paths.size(), 1u);
        EXPECT_EQ(identity(up.paths[0]), identity(fcHba));
    }
    EXPECT_TRUE(host().associatorNames(server, assoc("Vexlan_FCHBA_RegisteredProfileRegisteredSubProfile")).paths.empty());

    // An identity belongs to the profiles of its host; a profile of another
    // host has none.
    const ObjectPath identityPath = firstOf(host(), "Vexlan_FCHBA_SoftwareIdentity");
    EXPECT_EQ(host().associatorNames(identityPath, assoc("Vexlan_FCHBA_SoftwareIdentityRegisteredProfile")).paths.size(), 4u);
    EXPECT_EQ(host().associatorNames(identityPath, assoc("Vexlan_FCHBA_SoftwareIdentityRegisteredSubProfile")).paths.size(),
              2u);
    ObjectPath elsewhere = fcHba;
    elsewhere.setKey("InstanceID", Value::fromString("Vexlan_FCHBAProfile_elsewhere"));
    EXPECT_TRUE(host().associatorNames(elsewhere, assoc("Vexlan_FCHBA_SoftwareIdentityRegisteredProfile")).paths.empty());
    EXPECT_TRUE(host().associatorNames(elsewhere, assoc("Vexlan_FCHBA_RegisteredProfileComputerSystem")).paths.empty());
}

// The software identities of a multi-port adapter share their InstanceID;
// each leads to its installation service once.
TEST_F(Associations, AnIdentityHasOneInstallationService)
{
    const OpResult identitiesOfHost = host().enumerateInstanceNames(classPath("Vexlan_FCHBA_SoftwareIdentity"));
    ASSERT_FALSE(identitiesOfHost.paths.empty());
    std::map<std::string, int> shared;
    for (const ObjectPath& p : identitiesOfHost.paths)
        ++shared[p.key("InstanceID")->s];
    EXPECT_GT(std::max_element(shared.begin(), shared.end(),
                               [](const auto& a, const auto& b) { return a.second < b.second; })
                  ->second,
              1)
        << "the default host should hold a shared InstanceID";
    for (const ObjectPath& p : identitiesOfHost.paths) {
        const OpResult service =
            host().associatorNames(p, assoc("Vexlan_FCHBA_SoftwareIdentitySoftwareInstallationService"));
        expectClean(service, identity(p));
        EXPECT_EQ(service.paths.size(), 1u) << identity(p);
        EXPECT_EQ(host().referenceNames(p, result("CIM_ServiceAffectsElement")).paths.size(), 1u) << identity(p);
    }
}

// The remote service access point's two associations, with their joins as
// they are: from the system the port MACs are compared with its Name (no
// partner), from an access point every port's IP endpoint answers.
TEST_F(Associations, RemoteServiceAccessPointsJoinAsDescribed)
{
    const OpResult points = enumerate(host(), "Vexlan_NIC_RemoteServiceAccessPoint");
    const size_t ports = enumerate(host(), "Vexlan_NIC_IPProtocolEndpoint").instances.size();
    ASSERT_EQ(points.instances.size(), ports);
    const ObjectPath point = points.instances.front().path;
    const ObjectPath cs = firstOf(host(), "Vexlan_Adapter_ComputerSystem");
    EXPECT_TRUE(host().associatorNames(cs, assoc("Vexlan_NIC_ComputerSystemRemoteServiceAccessPoint")).paths.empty());
    const OpResult system = host().associatorNames(point, assoc("Vexlan_NIC_ComputerSystemRemoteServiceAccessPoint"));
    ASSERT_EQ(system.paths.size(), 1u);
    EXPECT_EQ(identity(system.paths[0]), identity(cs));
    const std::string mac = propertyText(points.instances.front(), "Name");
    EXPECT_EQ(host().associatorNames(point, assoc("CIM_SAPSAPDependency")).paths.size(), ports);
    ObjectPath endpoint = classPath("Vexlan_NIC_IPProtocolEndpoint");
    endpoint.setKey("Name", Value::fromString(mac));
    const OpResult own = host().associatorNames(endpoint, assoc("Vexlan_NIC_RemoteServiceAccessPointIPProtocolEndpoint"));
    ASSERT_EQ(own.paths.size(), 1u);
    EXPECT_EQ(own.paths[0].key("Name")->s, mac);
}

// Once the provider has seen a class, its dispatch class tests (routes, gate,
// chain, rounds, the modules' role tests, a parent class asked for) need no
// broker call: a repeated request makes no classPathIsA call.
TEST_F(Associations, ARequestSeenBeforeAsksTheBrokerNoClassTest)
{
    const ObjectPath cs = firstOf(host(), "Vexlan_Adapter_ComputerSystem");
    const ObjectPath port = firstOf(host(), "Vexlan_FCHBA_FCPort");
    AssocParams parent;
    parent.resultClass = "CIM_SystemDevice";
    const std::vector<std::pair<std::string, std::function<OpResult()>>> requests = {
        {"getInstance of the system", [&] { return host().getInstance(cs); }},
        {"associatorNames of a port", [&] { return host().associatorNames(port); }},
        {"references of the system", [&] { return host().references(cs); }},
        {"one call without a class", [&] { return host().associatorNamesAsCalled(port, {}); }},
        {"one call with a parent class", [&] { return host().referenceNamesAsCalled(port, parent); }},
        {"a method", [&] { return host().invokeMethod(classPath("Vexlan_FCHBA_FCPort"), "NoSuchMethod", {}); }},
    };
    for (const auto& [what, request] : requests) {
        const OpResult first = request();
        const int before = host().counters().classPathIsACalls;
        const OpResult again = request();
        EXPECT_EQ(host().counters().classPathIsACalls, before) << what;
        EXPECT_EQ(identities(again.paths), identities(first.paths)) << what;
        EXPECT_EQ(again.instances.size(), first.instances.size()) << what;
    }
}

// One request rebuilds each list at most once, however many of its rounds
// and modules ask for the rebuild: the FC port list is built once (one port
// property read per FC function) for a call that runs every row of a port.
TEST_F(Associations, OneRequestRebuildsAListOnce)
{
    const size_t ports = host().enumerateInstanceNames(classPath("Vexlan_FCHBA_FCPort")).paths.size();
    ASSERT_GT(ports, 1u);
    const ObjectPath port = firstOf(host(), "Vexlan_FCHBA_FCPort");
    zorap_sim_reset();
    const OpResult all = host().associatorNamesAsCalled(port, {});
    expectClean(all, "every row of a port");
    EXPECT_EQ(zorap_sim_call_count(ZORAP_FN_GetHbaDevicePortProperty), ports);
    EXPECT_TRUE(std::count_if(all.paths.begin(), all.paths.end(),
                              [](const ObjectPath& p) { return p.className == "Vexlan_FCHBA_FCPortStatistics"; }));
    // The next request builds it again: it sees data no older than itself.
    zorap_sim_reset();
    expectClean(host().associatorNamesAsCalled(port, {}), "again");
    EXPECT_EQ(zorap_sim_call_count(ZORAP_FN_GetHbaDevicePortProperty), ports);
}

}  // namespace

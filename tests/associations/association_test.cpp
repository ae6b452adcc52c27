// Associations through the shipped provider in a strict embedded CIM host:
// every association class walked both ways from each of its enumerated
// pairs, the dispatcher's choice of modules (CIM parent names, the gate, the
// misspelled parent of referenceNames), the filters of the filtering form,
// the third properties, getInstance of an association, and profile
// conformance. Runs under tests/isolate.sh: /opt and /var/tmp are private.
#include <gtest/gtest.h>
#include <strings.h>

#include <algorithm>
#include <fstream>
#include <set>
#include <sstream>
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

// The association classes that the provider registers, from the class table.
std::vector<std::string> associationClasses()
{
    std::ifstream in(VEXLAN_CLASS_TABLE);
    std::vector<std::string> classes;
    std::string line;
    while (std::getline(in, line)) {
        if (line.empty() || line[0] == '#')
            continue;
        std::vector<std::string> cols;
        std::stringstream s(line);
        std::string col;
        while (std::getline(s, col, '\t'))
            cols.push_back(col);
        if (cols.size() > 3 && cols[3].find("association") != std::string::npos)
            classes.push_back(cols[0]);
    }
    return classes;
}

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
    const std::vector<std::string> classes = associationClasses();
    ASSERT_EQ(classes.size(), 48u);
    int walked = 0;
    for (const std::string& cls : classes) {
        OpResult pairs = host().enumerateInstanceNames(classPath(cls));
        expectClean(pairs, cls);
        EXPECT_FALSE(pairs.paths.empty()) << cls << " has no pairs on the default host";
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
            EXPECT_TRUE(identities(from1.paths).count(identity(end2))) << cls << ": " << identity(end1);
            EXPECT_TRUE(identities(from2.paths).count(identity(end1))) << cls << ": " << identity(end2);
            const OpResult refs = host().referenceNames(end1, result(cls));
            expectClean(refs, cls);
            EXPECT_TRUE(identities(refs.paths).count(identity(pair))) << cls;
            const OpResult got = host().getInstance(pair);
            expectClean(got, cls);
            EXPECT_EQ(got.instances.size(), 1u) << cls;
            ++walked;
        }
    }
    EXPECT_GT(walked, 100);
}

TEST_F(Associations, ACimParentNameRunsEveryModuleOfItForTheSource)
{
    const ObjectPath cs = firstOf(host(), "Vexlan_Adapter_ComputerSystem");
    const OpResult r = host().referenceNames(cs, result("CIM_SystemDevice"));
    expectClean(r, "CIM_SystemDevice");
    EXPECT_EQ(classesOf(r.paths),
              (std::vector<std::string>{"Vexlan_FCHBA_ComputerSystemFCPort", "Vexlan_FCHBA_ComputerSystemPortController",
                                        "Vexlan_FCHBA_ComputerSystemSCSIProtocolController",
                                        "Vexlan_FCHBA_ComputerSystemStorageExtent"}));

    // The associator operations' gate knows the association classes by
    // their own names only: a CIM parent name closes it.
    const OpResult gated = host().associatorNames(cs, assoc("CIM_SystemDevice"));
    expectClean(gated, "associatorNames CIM_SystemDevice");
    EXPECT_TRUE(gated.paths.empty());

    // The NIC associations answer to their own name only.
    const OpResult nic = host().references(firstOf(host(), "Vexlan_NIC_EthernetPort2"), result("CIM_Realizes"));
    expectClean(nic, "CIM_Realizes from a NIC port");
    EXPECT_TRUE(nic.instances.empty());
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
    EXPECT_GT(countLog("m_assocLookupTableSize = 102"), 0);
}

TEST_F(Associations, FromAnFCPortReferenceNamesKnowsRealizesOnlyByItsOldSpelling)
{
    const ObjectPath port = firstOf(host(), "Vexlan_FCHBA_FCPort");
    const OpResult right = host().referenceNames(port, result("CIM_Realizes"));
    expectClean(right, "referenceNames CIM_Realizes");
    EXPECT_TRUE(right.paths.empty());

    const OpResult old = host().referenceNames(port, result("CIM_Reailizes"));
    expectClean(old, "referenceNames CIM_Reailizes");
    EXPECT_EQ(classesOf(old.paths), (std::vector<std::string>{"Vexlan_FCHBA_PhysicalConnectorFCPort",
                                                              "Vexlan_FCHBA_PhysicalPortFCPort"}));

    const OpResult refs = host().references(port, result("CIM_Realizes"));
    expectClean(refs, "references CIM_Realizes");
    EXPECT_EQ(refs.instances.size(), 2u);
    const OpResult names = host().associatorNames(port, assoc("Vexlan_FCHBA_PhysicalPortFCPort"));
    expectClean(names, "associatorNames of the physical port");
    EXPECT_EQ(classesOf(names.paths), (std::vector<std::string>{"Vexlan_Adapter_PhysicalPort"}));
}

TEST_F(Associations, AClassOutsideTheTableHasNoAssociatorsAndNothingFails)
{
    const ObjectPath job = classPath("Vexlan_Adapter_ConcreteJob");
    removeLog();
    OpResult r = host().associators(job);
    expectClean(r, "associators of a job");
    EXPECT_TRUE(r.instances.empty());
    EXPECT_EQ(countLog("Class Vexlan_Adapter_ConcreteJob has no associators"), 1);
    r = host().associatorNames(job);
    EXPECT_EQ(countLog("Class Vexlan_Adapter_ConcreteJob has no associatorNames"), 1);
    r = host().referenceNames(job);
    expectClean(r, "referenceNames of a job");
    EXPECT_TRUE(r.paths.empty());

    // The two classes of the lookup table that no test of the chain names:
    // the gate opens, nothing runs.
    r = host().associatorNames(firstOf(host(), "Vexlan_FCHBA_ObjectManager"),
                               assoc("Vexlan_FCHBA_RegisteredProfileObjectManager"));
    expectClean(r, "profile of the object manager");
    EXPECT_TRUE(r.paths.empty());
    EXPECT_GT(countLog("Class Vexlan_FCHBA_ObjectManager has associators"), 0);
    r = host().referenceNames(firstOf(host(), "Vexlan_Adapter_ComputerSystem"),
                              result("Vexlan_NIC_ComputerSystemRemoteServiceAccessPoint"));
    expectClean(r, "remote service access point");
    EXPECT_TRUE(r.paths.empty());

    // An association class that doesn't stand at the source closes the gate.
    r = host().associatorNames(firstOf(host(), "Vexlan_Adapter_Product"), assoc("Vexlan_FCHBA_ComputerSystemFCPort"));
    expectClean(r, "gate");
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

}  // namespace

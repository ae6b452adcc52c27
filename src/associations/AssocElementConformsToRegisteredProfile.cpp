// Vexlan_NIC_ElementConformsToRegisteredProfile: a NIC profile of
// m_RegisteredProfileList and the ports that conform to it. Its second end
// is one of three classes, chosen by the profile: so the module brings its
// own operations instead of the contract's.
#include <strings.h>

#include <cstdlib>
#include <cstring>

#include "associations/AssocEnds.h"
#include "associations/AssocRows.h"
#include "classes/NicClassModule.h"
#include "classes/Vexlan_NIC_EthernetPort.h"
#include "classes/Vexlan_NIC_IPProtocolEndPoint.h"
#include "classes/Vexlan_NIC_NetworkPort.h"
#include "classes/Vexlan_NIC_RegisteredProfile.h"
#include "inventory/AdapterFunc.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/Vexlan_NIC_Utils.h"

namespace {

#define PROFILE_DEBUG(...)                                 \
    do {                                                   \
        if (g_EnableDebugPrint)                            \
            Vexlan_FC_Utils_CMPI::DebugPrint(__VA_ARGS__); \
    } while (0)
#define PROFILE_ERROR(...)                               \
    do {                                                 \
        if (g_EnableLogError)                            \
            Vexlan_FC_Utils_CMPI::LogError(__VA_ARGS__); \
    } while (0)

constexpr const char* kFile = "Assoc_ElementConformsToRegisteredProfile";
constexpr const char* kAssocClass = "Vexlan_NIC_ElementConformsToRegisteredProfile";
constexpr const char* kProfileClass = "Vexlan_NIC_RegisteredProfile";
constexpr const char* kStandardRole = "ConformantStandard";
constexpr const char* kElementRole = "ManagedElement";

// The profiles that ports conform to, by id and name, and the class in which
// a port is the managed element of each.
struct Conformance {
    std::uint32_t id;
    const char* profileName;
    const char* className;
    const char* keyName;   // the key of the element's path that names its port
    CmpiObjectPath (*makePath)(const char*, const char*, _CNAStruc*, _CNAPortStruc*);
    CmpiInstance (*makeInstance)(const char*, const char*, const char**, _CNAStruc*, _CNAPortStruc*);
    std::string (*keyOf)(_CNAStruc*, _CNAPortStruc*);
    GetInstanceOp getInstance;
};

std::string ethernetKey(_CNAStruc* a, _CNAPortStruc* p)
{
    char out[kMacTextSize] = {};
    return calcDeviceID_EthernetPort(a, p, out);
}
std::string networkKey(_CNAStruc* a, _CNAPortStruc* p)
{
    char out[kNicKeyTextSize] = {};
    return calcDeviceID_NetworkPort(a, p, out);
}
std::string ipKey(_CNAStruc*, _CNAPortStruc* p)
{
    char out[kMacTextSize] = {};
    return calcName_IPProtocolEndPoint(p, out);
}

const Conformance kConformances[] = {
    {1, "EthernetPort Profile", "Vexlan_NIC_EthernetPort2", "DeviceID", makePath_EthernetPort, makeInstance_EthernetPort,
     ethernetKey, getInstance_EthernetPort},
    {2, "Host LAN Network Port Profile", "Vexlan_NIC_NetworkPort", "DeviceID", makePath_NetworkPort,
     makeInstance_NetworkPort, networkKey, getInstance_NetworkPort},
    {3, "IP Interface Profile", "Vexlan_NIC_IPProtocolEndpoint", "Name",
     [](const char* c, const char* ns, _CNAStruc*, _CNAPortStruc* p) { return makePath_IPProtocolEndPoint(c, ns, p); },
     [](const char* c, const char* ns, const char** props, _CNAStruc*, _CNAPortStruc* p) {
         return makeInstance_IPProtocolEndPoint(c, ns, props, p);
     },
     ipKey, getInstance_IPProtocolEndPoint},
};

const Conformance* conformanceOfId(std::uint32_t id)
{
    for (const Conformance& c : kConformances)
        if (c.id == id)
            return &c;
    return nullptr;
}

const Conformance* conformanceOfName(const char* profileName)
{
    for (const Conformance& c : kConformances)
        if (strcasecmp(c.profileName, profileName) == 0)
            return &c;
    return nullptr;
}

// The managed element's class, by its class name; the IP endpoint's for
// any class other than the two ports.
const Conformance* conformanceOfElementClass(const char* className)
{
    for (const Conformance& c : kConformances)
        if (strcasecmp(c.className, className) == 0)
            return &c;
    return nullptr;
}

const char* textOf(CMPIString* s)
{
    return s != nullptr && s->ft != nullptr ? s->ft->getCharPtr(s, nullptr) : nullptr;
}

std::string classNameOf(const CmpiObjectPath& path)
{
    const char* text = path.getClassName().charPtr();
    return text != nullptr ? text : "";
}

// One answer: the partner itself, its path, or a reference whose
// ConformantStandard is the profile's path and ManagedElement the port's.
void answer(CmpiResult& rslt, FuncType funcType, const char* ns, const CmpiObjectPath& profilePath,
            const CmpiObjectPath& elementPath, const std::function<CmpiInstance()>& partnerInstance,
            const CmpiObjectPath& partnerPath)
{
    switch (funcType) {
    case FUNC_ASSOC:
        rslt.returnData(partnerInstance());
        return;
    case FUNC_ASSOCNAME:
        rslt.returnData(partnerPath);
        return;
    case FUNC_REF: {
        CmpiInstance instance(CmpiObjectPath(ns, kAssocClass));
        instance.setProperty(kStandardRole, CmpiData(profilePath));
        instance.setProperty(kElementRole, CmpiData(elementPath));
        rslt.returnData(instance);
        return;
    }
    case FUNC_REFNAME: {
        CmpiObjectPath ref(ns, kAssocClass);
        ref.setKey(kStandardRole, CmpiData(profilePath));
        ref.setKey(kElementRole, CmpiData(elementPath));
        rslt.returnData(ref);
        return;
    }
    }
}

// Source a profile: the ports of its id, in the class of that id.
CmpiStatus findMatchedRole2InstancesOrReferences(CmpiResult& rslt, const CmpiObjectPath& path,
                                                 const char** properties, FuncType funcType)
{
    CMPIObjectPath* enc = path.getEnc();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    const char* nsText = textOf(enc->ft->getNameSpace(enc, nullptr));
    const std::string ns = nsText != nullptr ? nsText : "";
    CMPIData key = enc->ft->getKey(enc, "InstanceID", &rc);
    if (rc.rc != CMPI_RC_OK || key.type != CMPI_string) {
        PROFILE_ERROR("%s: status.rc = %d, keyData.type=%u", kFile, static_cast<int>(rc.rc),
                      static_cast<unsigned>(key.type));
        return CmpiStatus(rc);
    }
    const char* text = (key.state & CMPI_nullValue) ? nullptr : textOf(key.value.string);
    const std::uint32_t id = static_cast<std::uint32_t>(std::strtoul(text != nullptr ? text : "", nullptr, 10));
    for (_RegisteredProfile* node = m_RegisteredProfileList; node != nullptr; node = node->next) {
        if (node->id != id)
            continue;
        const Conformance* c = conformanceOfId(id);
        if (c == nullptr)
            continue;
        for (_CNAStruc* a = m_CNAList; a != nullptr; a = a->next) {
            for (_CNAPortStruc* p = a->portList; p != nullptr; p = p->next) {
                const CmpiObjectPath element = c->makePath(c->className, kModelNamespace, a, p);
                answer(rslt, funcType, ns.c_str(), path, element,
                       [&] { return c->makeInstance(c->className, kModelNamespace, properties, a, p); }, element);
            }
        }
    }
    return CmpiStatus(CMPI_RC_OK);
}

// Source a port in one of the three classes: the profiles of its class, when
// some port of the adapter list has the source's key.
CmpiStatus findMatchedRole1InstancesOrReferences(CmpiResult& rslt, const CmpiObjectPath& path,
                                                 const char** properties, FuncType funcType)
{
    const std::string className = classNameOf(path);
    const Conformance* c = conformanceOfElementClass(className.c_str());
    if (c == nullptr)
        c = &kConformances[2];
    const char* keyText = path.getKey(c->keyName);
    const std::string identifier = keyText != nullptr ? keyText : "";
    PROFILE_DEBUG("%s:findMatchedRole1InstancesOrReferences() identifier=%s", kFile, identifier.c_str());
    const std::string ns = path.getNameSpace().charPtr();
    // The profile is served in the provider's namespace in every server (the
    // interop namespace serves it only where the server lets providers
    // advertise there), so its path names that one.
    const char* profileNs = kModelNamespace;
    for (_CNAStruc* a = m_CNAList; a != nullptr; a = a->next) {
        for (_CNAPortStruc* p = a->portList; p != nullptr; p = p->next) {
            if (strcasecmp(c->keyOf(a, p).c_str(), identifier.c_str()) != 0)
                continue;
            for (_RegisteredProfile* node = m_RegisteredProfileList; node != nullptr; node = node->next) {
                if (node->id != c->id)
                    continue;
                const CmpiObjectPath profile = makePath_Nic_RegisteredProfile(kProfileClass, profileNs, node);
                answer(rslt, funcType, ns.c_str(), profile, path,
                       [&] { return makeInstance_Nic_RegisteredProfile(kProfileClass, profileNs, properties, node); },
                       profile);
            }
        }
    }
    return CmpiStatus(CMPI_RC_OK);
}

bool isProfile(const std::string& className)
{
    return strcasecmp(className.c_str(), kProfileClass) == 0;
}

[[noreturn]] void unsupported(const std::string& className)
{
    throw CmpiStatus(CMPI_RC_ERR_NOT_SUPPORTED, className.c_str());
}

CmpiStatus traverseReferences(const char* op, CmpiResult& rslt, const CmpiObjectPath& path, const char* resultClass,
                              const char* role, const char** properties, FuncType funcType)
{
    PROFILE_DEBUG("%s: %s was called\n", kFile, op);
    if (!MatchResultClass(resultClass, path.getNameSpace(), kAssocClass))
        return CmpiStatus(CMPI_RC_OK);
    const std::string className = classNameOf(path);
    if (isProfile(className))
        return MatchRole(role, kStandardRole) ? findMatchedRole2InstancesOrReferences(rslt, path, properties, funcType)
                                              : CmpiStatus(CMPI_RC_OK);
    if (conformanceOfElementClass(className.c_str()) != nullptr)
        return MatchRole(role, kElementRole) ? findMatchedRole1InstancesOrReferences(rslt, path, properties, funcType)
                                             : CmpiStatus(CMPI_RC_OK);
    unsupported(className);
}

CmpiStatus traverseAssociators(const char* op, CmpiResult& rslt, const CmpiObjectPath& path, const char* resultClass,
                               const char* role, const char* resultRole, const char** properties, FuncType funcType)
{
    PROFILE_DEBUG("%s: %s was called\n", kFile, op);
    const CmpiString ns = path.getNameSpace();
    const std::string className = classNameOf(path);
    if (isProfile(className)) {
        bool anyClass = false;
        for (const Conformance& c : kConformances)
            anyClass = anyClass || MatchResultClass(resultClass, ns, c.className);
        if (!anyClass || !MatchRole(role, kStandardRole) || !MatchRole(resultRole, kElementRole))
            return CmpiStatus(CMPI_RC_OK);
        return findMatchedRole2InstancesOrReferences(rslt, path, properties, funcType);
    }
    if (conformanceOfElementClass(className.c_str()) != nullptr) {
        if (!MatchResultClass(resultClass, ns, kProfileClass) || !MatchRole(role, kElementRole) ||
            !MatchRole(resultRole, kStandardRole))
            return CmpiStatus(CMPI_RC_OK);
        return findMatchedRole1InstancesOrReferences(rslt, path, properties, funcType);
    }
    unsupported(className);
}

CmpiStatus referenceNames(const AssocRow&, const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& path,
                          const char* resultClass, const char* role)
{
    return traverseReferences("referenceNames_AssocElementConformsToRegisteredProfile", rslt, path, resultClass, role,
                              nullptr, FUNC_REFNAME);
}

CmpiStatus references(const AssocRow&, const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& path,
                      const char* resultClass, const char* role, const char** properties)
{
    return traverseReferences("references_AssocElementConformsToRegisteredProfile", rslt, path, resultClass, role,
                              properties, FUNC_REF);
}

CmpiStatus associatorNames(const AssocRow&, const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& path,
                           const char*, const char* resultClass, const char* role, const char* resultRole)
{
    return traverseAssociators("associatorNames_AssocElementConformsToRegisteredProfile", rslt, path, resultClass,
                               role, resultRole, nullptr, FUNC_ASSOCNAME);
}

CmpiStatus associators(const AssocRow&, const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& path, const char*,
                       const char* resultClass, const char* role, const char* resultRole, const char** properties)
{
    return traverseAssociators("associators_AssocElementConformsToRegisteredProfile", rslt, path, resultClass, role,
                               resultRole, properties, FUNC_ASSOC);
}

// Every pair: each profile of a known name with every port in the class of
// that name, both named where they are served.
template <class Pair>
void eachPair(Pair&& pair)
{
    const char* ns = kModelNamespace;
    for (_RegisteredProfile* node = m_RegisteredProfileList; node != nullptr; node = node->next) {
        const Conformance* c = conformanceOfName(node->name);
        if (c == nullptr)
            continue;
        for (_CNAStruc* a = m_CNAList; a != nullptr; a = a->next)
            for (_CNAPortStruc* p = a->portList; p != nullptr; p = p->next)
                pair(makePath_Nic_RegisteredProfile(kProfileClass, ns, node), c->makePath(c->className, ns, a, p));
    }
}

bool readNamespace(const CmpiObjectPath& path, const char* where, std::string& ns, CmpiStatus& status)
{
    CMPIObjectPath* enc = path.getEnc();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    const char* text = textOf(enc->ft->getNameSpace(enc, &rc));
    if (rc.rc != CMPI_RC_OK) {
        PROFILE_ERROR("%s: Error getting namespace in %s\n", kFile, where);
        status = CmpiStatus(rc);
        return false;
    }
    ns = text != nullptr ? text : "";
    return true;
}

CmpiStatus enumInstances(const AssocRow&, const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& path,
                         const char**)
{
    PROFILE_DEBUG("%s: %s was called\n", kFile, "enumInstances_AssocElementConformsToRegisteredProfile");
    std::string ns;
    CmpiStatus status(CMPI_RC_OK);
    if (!readNamespace(path, "enumInstances", ns, status))
        return status;
    eachPair([&](const CmpiObjectPath& profile, const CmpiObjectPath& element) {
        CmpiInstance instance(path);
        instance.setProperty(kStandardRole, CmpiData(profile));
        instance.setProperty(kElementRole, CmpiData(element));
        rslt.returnData(instance);
    });
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus enumInstanceNames(const AssocRow&, const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& path)
{
    PROFILE_DEBUG("%s: %s was called\n", kFile, "enumInstanceNames_AssocElementConformsToRegisteredProfile");
    std::string ns;
    CmpiStatus status(CMPI_RC_OK);
    if (!readNamespace(path, "enumInstanceNames", ns, status))
        return status;
    eachPair([&](const CmpiObjectPath& profile, const CmpiObjectPath& element) {
        CmpiObjectPath ref(ns.c_str(), classNameOf(path).c_str());
        ref.setKey(kStandardRole, CmpiData(profile));
        ref.setKey(kElementRole, CmpiData(element));
        rslt.returnData(ref);
    });
    return CmpiStatus(CMPI_RC_OK);
}

// The contract's getInstance, with the managed element checked by the class
// module of its path's class.
CmpiStatus getInstance(const AssocRow&, const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& path,
                       const char**, bool sendInstance)
{
    constexpr const char* op = "getInstance_AssocElementConformsToRegisteredProfile";
    PROFILE_DEBUG("%s: %s was called\n", kFile, op);
    CMPIObjectPath* enc = path.getEnc();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    const char* cls = textOf(enc->ft->getClassName(enc, &rc));
    if (rc.rc != CMPI_RC_OK) {
        PROFILE_ERROR("%s: Error getting classname in getInstance\n", kFile);
        return CmpiStatus(rc);
    }
    if (cls == nullptr || strcasecmp(cls, kAssocClass) != 0)
        return CmpiStatus(CMPI_RC_OK);
    const char* roles[2] = {kStandardRole, kElementRole};
    CMPIObjectPath* refs[2] = {nullptr, nullptr};
    for (int k = 0; k < 2; ++k) {
        CMPIData data = enc->ft->getKey(enc, roles[k], &rc);
        if (rc.rc != CMPI_RC_OK) {
            PROFILE_ERROR("%s: Error getting keyData%d, status.rc=%d!", op, k + 1, static_cast<int>(rc.rc));
            return CmpiStatus(rc);
        }
        if (data.type != CMPI_ref) {
            PROFILE_ERROR("%s: Error invalid keyData%d type, keyData%d.type=%d!", op, k + 1, k + 1,
                          static_cast<int>(data.type));
            return CmpiStatus(rc);
        }
        // A reference key without a value names no object: answered as a
        // missing key instead of reading through a null path.
        if ((data.state & CMPI_nullValue) != 0 || data.value.ref == nullptr) {
            PROFILE_ERROR("%s: Error getting keyData%d, status.rc=%d!", op, k + 1, static_cast<int>(CMPI_RC_ERR_NOT_FOUND));
            return CmpiStatus(CMPI_RC_ERR_NOT_FOUND);
        }
        refs[k] = data.value.ref;
    }
    const CmpiObjectPath standard(refs[0]);
    const CmpiObjectPath element(refs[1]);
    getInstance_Nic_RegisteredProfile(ctx, rslt, standard, nullptr, false);
    const Conformance* c = conformanceOfElementClass(classNameOf(element).c_str());
    if (c != nullptr)
        c->getInstance(ctx, rslt, element, nullptr, false);
    CmpiInstance instance(path);
    instance.setProperty(kStandardRole, CmpiData(standard));
    instance.setProperty(kElementRole, CmpiData(element));
    if (sendInstance)
        rslt.returnData(instance);
    return CmpiStatus(CMPI_RC_OK);
}

const AssocOps kOps = {referenceNames, references, associatorNames, associators, enumInstances, enumInstanceNames,
                       getInstance};

}  // namespace

const AssocRow kAssocElementConformsToRegisteredProfile = {kAssocClass,
                                                           "AssocElementConformsToRegisteredProfile",
                                                           kFile,
                                                           AssocForm::Filtering,
                                                           {kStandardRole, &kNicRegisteredProfileEnd},
                                                           {kElementRole, &kEthernetPortEnd},
                                                           nullptr,
                                                           nullptr,
                                                           nullptr,
                                                           ExtraProperty{},
                                                           nullptr,
                                                           nullptr,
                                                           &kOps,
                                                           0};

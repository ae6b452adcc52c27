// Vexlan_NIC_SoftwareIdentity as a NIC class module: two records per
// adapter, the driver and the flash firmware, both with the adapter's flash
// image version.
#include "classes/Vexlan_NIC_SoftwareIdentity.h"

#include <strings.h>

#include <cerrno>
#include <climits>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

#include "classes/Vexlan_Adapter_PhysicalPackage_CMPI.h"
#include "classes/Vexlan_FC_FCPort_CMPI.h"
#include "inventory/AdapterFunc_Identity.h"
#include "support/Vexlan_FC_Utils_CMPI.h"

namespace {

// The texts of the two software types. The name is "<vendor word> CNA
// Adapter <serial>" and the type's tail.
struct SoftwareType {
    int type;
    CMPIUint16 classification;
    const char* nameTail;
    const char* description;
};
const SoftwareType kTypes[] = {
    {2, 2, " Driver", "The CNA Networking Driver"},
    {3, 10, " Flash Firmware", "CNA Flash includes boot code, ASIC and MPI Firmware"},
};

const SoftwareType* typeOf(const NicRecord& r)
{
    for (const SoftwareType& t : kTypes)
        if (t.type == r.softwareType)
            return &t;
    return nullptr;
}

// The 11S test trims the text it is given: it reads a copy of the serial.
bool ibmSerial(const NicRecord& r)
{
    char serial[sizeof(r.adapter->serialNumber) + 1];
    copyFieldText(serial, r.adapter->serialNumber);
    return IsIBM11SProductId(serial) != 0;
}

FCTextPart serialPart(const NicRecord& r)
{
    return FCTextPart(r.adapter->serialNumber, sizeof(r.adapter->serialNumber));
}

// "<type>_<serial>", the type as printf's "%d" writes it.
void instanceIdText(const NicRecord& r, char* out)
{
    const bool negative = r.softwareType < 0;
    const std::uint32_t magnitude = negative ? 0u - static_cast<std::uint32_t>(r.softwareType)
                                             : static_cast<std::uint32_t>(r.softwareType);
    char digits[11];
    JoinFCText(out, kNicKeyTextSize, {negative ? "-" : "", DecimalText(magnitude, digits), "_", serialPart(r)});
}

PropertyValue instanceId(const NicRecord& r)
{
    char text[kNicKeyTextSize];
    instanceIdText(r, text);
    return CmpiData(text);
}

PropertyValue name(const NicRecord& r)
{
    const SoftwareType* t = typeOf(r);
    if (t == nullptr)
        return std::nullopt;
    char text[sizeof(r.adapter->serialNumber) + 64];
    JoinFCText(text, sizeof(text), {ibmSerial(r) ? "IBM" : "Vexlan", " CNA Adapter ", serialPart(r), t->nameTail});
    return CmpiData(text);
}

const PropertyRow<NicRecord> kProperties[] = {
    {"InstanceID", CMPI_string, instanceId},
    {"Manufacturer", CMPI_string,
     CLASS_VALUE(NicRecord, entryText(ibmSerial(e) ? "IBM" : "Vexlan Corporation"))},
    {"VersionString", CMPI_string, CLASS_VALUE(NicRecord, fieldText(e.adapter->versionString))},
    {"Classifications", CMPI_uint16A,
     [](const NicRecord& r) -> PropertyValue {
         const SoftwareType* t = typeOf(r);
         if (t == nullptr)
             return std::nullopt;
         return uint16Array({t->classification});
     }},
    {"Name", CMPI_string, name},
    {"Description", CMPI_string,
     [](const NicRecord& r) -> PropertyValue {
         const SoftwareType* t = typeOf(r);
         if (t == nullptr)
             return std::nullopt;
         return entryText(t->description);
     }},
    {"IdentityInfoType", CMPI_stringA, CLASS_VALUE(NicRecord, stringArray({"SoftwareID", "SoftwareStatus"}))},
    {"IdentityInfoValue", CMPI_stringA,
     CLASS_VALUE(NicRecord, stringArray({nicFieldText(e.adapter->modelName).c_str(), "2"}))},
};

const char* const kKeys[] = {"InstanceID", nullptr};

const NicClassModule kModule =
    NicClassModule("Vexlan_NIC_SoftwareIdentity")
        .walk(NicWalk::AdapterSoftware)
        .key("InstanceID", instanceIdText)
        .properties(kProperties)
        .keys(kKeys)
        .enumInstancesTexts({"Vexlan_NIC_SoftwareIdentity enumInstances was called\n",
                             "Vexlan_NIC_SoftwareIdentity: Error getting namespace in enumInstances\n",
                             "Vexlan_NIC_SoftwareIdentity: Error getting classname in enumInstances\n"})
        .enumInstanceNamesTexts({"Vexlan_NIC_SoftwareIdentity enumInstanceNames was called\n",
                                 "Vexlan_NIC_SoftwareIdentity: Error getting namespace in enumInstanceNames\n",
                                 "Vexlan_NIC_SoftwareIdentity: Error getting ClassName in enumInstanceNames\n"})
        .getInstanceTexts({"Vexlan_NIC_SoftwareIdentity getInstance was called\n",
                           "Vexlan_NIC_SoftwareIdentity: Error getting namespace in getInstance\n",
                           "Vexlan_NIC_SoftwareIdentity: Error getting classname in getInstance\n"})
        .makeTexts("Vexlan_NIC_SoftwareIdentity makePath_SoftwareIdentity was called\n",
                   "Vexlan_NIC_SoftwareIdentity makeInstance_SoftwareIdentity was called\n")
        .keyErrors("Vexlan_NIC_SoftwareIdentity: Error getting InstanceID key in getInstance\n",
                   {"Vexlan_NIC_SoftwareIdentity: Error invalid key data type(", ")"});

const char* textOf(CMPIString* s)
{
    return s != nullptr && s->ft != nullptr ? s->ft->getCharPtr(s, nullptr) : nullptr;
}

}  // namespace

CmpiObjectPath makePath_Nic_SoftwareIdentity(const char* className, const char* nameSpace, _CNAStruc* adapter,
                                             int softwareType)
{
    return kModule.makePath(className, nameSpace, NicRecord{adapter, nullptr, nullptr, softwareType});
}

CmpiInstance makeInstance_Nic_SoftwareIdentity(const char* className, const char* nameSpace,
                                               const char** properties, _CNAStruc* adapter, int softwareType)
{
    return kModule.makeInstance(className, nameSpace, properties, NicRecord{adapter, nullptr, nullptr, softwareType});
}

CmpiStatus enumInstances_Nic_SoftwareIdentity(const CmpiContext& ctx, CmpiResult& rslt, const CmpiObjectPath& path,
                                              const char** properties)
{
    return kModule.enumInstances(ctx, rslt, path, properties);
}

CmpiStatus enumInstanceNames_Nic_SoftwareIdentity(const CmpiContext& ctx, CmpiResult& rslt,
                                                  const CmpiObjectPath& path)
{
    return kModule.enumInstanceNames(ctx, rslt, path);
}

// The key is "<type>_<serial>": the part before the first "_" is read as the
// type (any number; a type other than 2 or 3 gives an instance without the
// typed properties), the part behind it names the adapter by its serial,
// without regard to case. No adapter answers NOT_FOUND.
CmpiStatus getInstance_Nic_SoftwareIdentity(const CmpiContext&, CmpiResult& rslt, const CmpiObjectPath& path,
                                            const char** properties, bool sendInstance)
{
    CMPIObjectPath* enc = path.getEnc();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIData key = enc->ft->getKey(enc, "InstanceID", &rc);
    if (rc.rc != CMPI_RC_OK) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("Vexlan_NIC_SoftwareIdentity: Error getting InstanceID key in getInstance\n");
        return CmpiStatus(rc);
    }
    if (key.type != CMPI_string) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("Vexlan_NIC_SoftwareIdentity: Error invalid key data type(%d)",
                                           static_cast<int>(key.type));
        return CmpiStatus(rc);
    }
    const char* value = (key.state & CMPI_nullValue) ? nullptr : textOf(key.value.string);
    const std::string keyText = value != nullptr ? value : "";
    const std::size_t cut = keyText.find('_');
    const std::string serial = cut == std::string::npos ? std::string() : keyText.substr(cut + 1);
    const long type = std::strtol(keyText.substr(0, cut).c_str(), nullptr, 10);
    const int softwareType = type < INT_MIN ? INT_MIN : type > INT_MAX ? INT_MAX : static_cast<int>(type);

    for (_CNAStruc* adapter = m_CNAList; adapter != nullptr; adapter = adapter->next) {
        if (cut == std::string::npos || strcasecmp(nicFieldText(adapter->serialNumber).c_str(), serial.c_str()) != 0)
            continue;
        CMPIString* ns = enc->ft->getNameSpace(enc, &rc);
        CMPIString* cls = rc.rc == CMPI_RC_OK ? enc->ft->getClassName(enc, &rc) : nullptr;
        if (rc.rc != CMPI_RC_OK)
            return CmpiStatus(rc);
        if (sendInstance)
            rslt.returnData(kModule.makeInstance(textOf(cls), textOf(ns), properties,
                                                 NicRecord{adapter, nullptr, nullptr, softwareType}));
        return CmpiStatus(CMPI_RC_OK);
    }
    throw CmpiStatus(CMPI_RC_ERR_NOT_FOUND, keyText.c_str());
}

// The parts of the class module mechanism that do not depend on the entry
// type: reading names and keys through the raw path handle, the log texts,
// the type check of property rows and the array values.
#include "classes/ClassModule.h"

#include "support/Vexlan_FC_Utils_CMPI.h"

namespace classmodule {

namespace {

const char* textOf(CMPIString* s)
{
    if (s == nullptr || s->ft == nullptr)
        return nullptr;
    return s->ft->getCharPtr(s, nullptr);
}

CMPIType plainType(CMPIType t)
{
    if (t == CMPI_chars)
        return CMPI_string;
    if (t == CMPI_charsA)
        return CMPI_stringA;
    return t;
}

}  // namespace

CmpiStatus readPathNames(const CmpiObjectPath& path, const std::string& operation, PathNames& names)
{
    CMPIObjectPath* enc = path.getEnc();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIString* cls = enc->ft->getClassName(enc, &rc);
    if (rc.rc != CMPI_RC_OK) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("%s: Error getting classname, status.rc=%d!", operation.c_str(),
                                           static_cast<int>(rc.rc));
        return CmpiStatus(rc);
    }
    CMPIString* ns = enc->ft->getNameSpace(enc, &rc);
    if (rc.rc != CMPI_RC_OK) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("%s: Error getting namespace, status.rc=%d!", operation.c_str(),
                                           static_cast<int>(rc.rc));
        return CmpiStatus(rc);
    }
    names.className = textOf(cls);
    names.nameSpace = textOf(ns);
    return CmpiStatus(CMPI_RC_OK);
}

KeyRead readStringKey(const CmpiObjectPath& path, const char* keyName, const std::string& operation)
{
    KeyRead read;
    CMPIObjectPath* enc = path.getEnc();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIData data = enc->ft->getKey(enc, keyName, &rc);
    if (rc.rc != CMPI_RC_OK) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("%s: Error getting key data, status.rc=%d!", operation.c_str(),
                                           static_cast<int>(rc.rc));
        read.status = CmpiStatus(rc);
        return read;
    }
    if (data.type != CMPI_string) {
        if (g_EnableLogError)
            Vexlan_FC_Utils_CMPI::LogError("%s: Error invalid key data type, keyData.type=%d!", operation.c_str(),
                                           static_cast<int>(data.type));
        read.status = CmpiStatus(rc);
        return read;
    }
    // A null string value is taken as an empty key text.
    const char* text = (data.state & CMPI_nullValue) ? nullptr : textOf(data.value.string);
    read.text = text != nullptr ? text : "";
    read.found = true;
    return read;
}

void throwNotFound(const std::string& operation, const std::string& key, const char* matchingElement)
{
    if (g_EnableLogError) {
        if (matchingElement != nullptr)
            Vexlan_FC_Utils_CMPI::LogError("%s: Error no matching instance found, KeyValue=%s, MatchingElement=%s!",
                                           operation.c_str(), key.c_str(), matchingElement);
        else
            Vexlan_FC_Utils_CMPI::LogError("%s: Error no matching instance found, KeyValue=%s!", operation.c_str(),
                                           key.c_str());
    }
    throw CmpiStatus(CMPI_RC_ERR_NOT_FOUND, key.c_str());
}

void logInvalidSlot(const std::string& operation, const char* keyName)
{
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint(
            "%s: Found a device that has the same %s but the entry is invalid.  Move on...", operation.c_str(),
            keyName);
}

void debugLine(const char* prefix, const std::string& operation)
{
    if (g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("%s%s", prefix, operation.c_str());
}

void buildLine(bool entering, const char* stem, int index)
{
    if (!g_EnableDebugPrint)
        return;
    if (entering)
        Vexlan_FC_Utils_CMPI::DebugPrint("Entering create%s, index = %d", stem, index);
    else
        Vexlan_FC_Utils_CMPI::DebugPrint("Exiting  create%s\n", stem);
}

void checkTypeOtherwise(const char* name, CMPIType declared, const CmpiData& value)
{
    if (value.isNullValue() && value.getType() == CMPI_null)
        return;
    if (plainType(value.getType()) != plainType(declared)) {
        std::string what = std::string("property ") + name + " set with CMPI type " +
                           std::to_string(value.getType()) + " where its row declares " + std::to_string(declared);
        throw CmpiStatus(CMPI_RC_ERR_TYPE_MISMATCH, what.c_str());
    }
}

}  // namespace classmodule

CmpiData uint16Array(std::initializer_list<CMPIUint16> values)
{
    CmpiArray array(static_cast<CMPICount>(values.size()), CMPI_uint16);
    int i = 0;
    for (CMPIUint16 v : values)
        array[i++] = CmpiData(v);
    return CmpiData(array);
}

CmpiData stringArray(std::initializer_list<const char*> values)
{
    CmpiArray array(static_cast<CMPICount>(values.size()), CMPI_string);
    int i = 0;
    // The broker copies each element as it is set, so the texts are lent.
    for (const char* v : values)
        array[i++] = CmpiData::borrowedChars(v);
    return CmpiData(array);
}

CmpiData uint8Array(const unsigned char* bytes, std::size_t length)
{
    CmpiArray array(static_cast<CMPICount>(length), CMPI_uint8);
    array.setUint8Elements(bytes, static_cast<CMPICount>(length));
    return CmpiData(array);
}

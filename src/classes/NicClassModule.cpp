// The NIC flavour of the class module mechanism: the walk over m_CNAList and
// the profile chain, the reading of name space, class name and key with each
// class's log texts, and the instances and paths made from property rows.
#include "classes/NicClassModule.h"

#include <strings.h>

#include "classes/Vexlan_NIC_RegisteredProfile.h"
#include "support/Vexlan_FC_Utils_CMPI.h"
#include "support/Vexlan_NIC_Utils.h"

namespace {

const char* textOf(CMPIString* s)
{
    if (s == nullptr || s->ft == nullptr)
        return nullptr;
    return s->ft->getCharPtr(s, nullptr);
}

void errorLine(const char* text)
{
    if (text != nullptr && g_EnableLogError)
        Vexlan_FC_Utils_CMPI::LogError("%s", text);
}

void debugLine(const char* text)
{
    if (text != nullptr && g_EnableDebugPrint)
        Vexlan_FC_Utils_CMPI::DebugPrint("%s", text);
}

}  // namespace

char* nicMacText(const _CNAPortStruc* port, char* out)
{
    return macaddrToStr(&port->macAddress, out);
}

void nicMacKey(const NicRecord& record, char* out)
{
    nicMacText(record.port, out);
}

PropertyValue nicMacValue(const NicRecord& record)
{
    char text[kMacTextSize];
    return CmpiData(nicMacText(record.port, text));
}

NicLinkStatus nicLinkStatus(const _CNAPortStruc* port)
{
    static const struct {
        std::uint32_t linkState;
        NicLinkStatus status;
    } kStates[] = {
        {1, {2, "Link Up"}},
        {2, {3, "Link Down"}},
        {3, {1, "Testing"}},
    };
    for (const auto& row : kStates)
        if (port->linkProperties.linkState == row.linkState)
            return row.status;
    return {0, "Unknown"};
}

void NicClassModule::resolvePathKeys()
{
    pathKeyRows_ = classmodule::rowsOfKeys(keys_, rows_, rowCount_);
}

std::vector<std::string> NicClassModule::tableFaults() const
{
    std::vector<std::string> faults;
    const std::string who = name_;
    if (rows_ == nullptr || rowCount_ == 0)
        faults.push_back(who + ": no property rows");
    if (keyName_ == nullptr || keyText_ == nullptr)
        faults.push_back(who + ": no getInstance key");
    if (keys_ == nullptr)
        faults.push_back(who + ": no keys");
    for (std::size_t i = 0; keys_ != nullptr && keys_[i] != nullptr; ++i)
        if (i >= pathKeyRows_.size() || pathKeyRows_[i] == nullptr)
            faults.push_back(who + ": key " + keys_[i] + " has no property row");
    const NicRequestTexts* all[] = {&enumInstances_, &enumInstanceNames_, &getInstance_};
    for (const NicRequestTexts* t : all)
        if (t->entry == nullptr || t->nameSpaceError == nullptr || t->classNameError == nullptr)
            faults.push_back(who + ": a request operation lacks its log texts");
    if (makePathEntry_ == nullptr || makeInstanceEntry_ == nullptr)
        faults.push_back(who + ": makePath or makeInstance lacks its debug line");
    if (keyReadError_ == nullptr)
        faults.push_back(who + ": no key error line");
    return faults;
}

void NicClassModule::forEach(const std::function<bool(const NicRecord&)>& visit) const
{
    NicRecord record;
    switch (walk_) {
    case NicWalk::Ports:
        for (_CNAStruc* adapter = m_CNAList; adapter != nullptr; adapter = adapter->next)
            for (_CNAPortStruc* port = adapter->portList; port != nullptr; port = port->next) {
                record.adapter = adapter;
                record.port = port;
                if (!visit(record))
                    return;
            }
        return;
    case NicWalk::Adapters:
        for (_CNAStruc* adapter = m_CNAList; adapter != nullptr; adapter = adapter->next) {
            record.adapter = adapter;
            if (!visit(record))
                return;
        }
        return;
    case NicWalk::AdapterSoftware:
        for (_CNAStruc* adapter = m_CNAList; adapter != nullptr; adapter = adapter->next)
            for (int type : {2, 3}) {
                record.adapter = adapter;
                record.softwareType = type;
                if (!visit(record))
                    return;
            }
        return;
    case NicWalk::Profiles:
        for (_RegisteredProfile* node = m_RegisteredProfileList; node != nullptr; node = node->next) {
            record.profile = node;
            if (!visit(record))
                return;
        }
        return;
    }
}

CmpiObjectPath NicClassModule::makePath(const char* className, const char* nameSpace,
                                        const NicRecord& record) const
{
    debugLine(makePathEntry_);
    return classmodule::pathFromRows(className, nameSpace, pathKeyRows_, record);
}

CmpiInstance NicClassModule::makeInstance(const char* className, const char* nameSpace, const char** properties,
                                          const NicRecord& record) const
{
    debugLine(makeInstanceEntry_);
    return classmodule::instanceFromRows(className, nameSpace, properties, keys_, rows_, rowCount_, record);
}

// Name space first, then class name, each through the raw path handle with
// a status of its own; a failure is logged with the operation's text and
// returned as it came.
CmpiStatus NicClassModule::readNames(const CmpiObjectPath& path, const NicRequestTexts& texts, Names& names) const
{
    CMPIObjectPath* enc = path.getEnc();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIString* ns = enc->ft->getNameSpace(enc, &rc);
    if (rc.rc != CMPI_RC_OK) {
        errorLine(texts.nameSpaceError);
        return CmpiStatus(rc);
    }
    CMPIString* cls = enc->ft->getClassName(enc, &rc);
    if (rc.rc != CMPI_RC_OK) {
        errorLine(texts.classNameError);
        return CmpiStatus(rc);
    }
    names.nameSpace = textOf(ns);
    names.className = textOf(cls);
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus NicClassModule::enumInstances(const CmpiContext&, CmpiResult& result, const CmpiObjectPath& path,
                                         const char** properties) const
{
    debugLine(enumInstances_.entry);
    Names names;
    CmpiStatus st = readNames(path, enumInstances_, names);
    if (st.rc() != CMPI_RC_OK)
        return st;
    forEach([&](const NicRecord& record) {
        result.returnData(makeInstance(names.className, names.nameSpace, properties, record));
        return true;
    });
    return CmpiStatus(CMPI_RC_OK);
}

CmpiStatus NicClassModule::enumInstanceNames(const CmpiContext&, CmpiResult& result,
                                             const CmpiObjectPath& path) const
{
    debugLine(enumInstanceNames_.entry);
    Names names;
    CmpiStatus st = readNames(path, enumInstanceNames_, names);
    if (st.rc() != CMPI_RC_OK)
        return st;
    forEach([&](const NicRecord& record) {
        debugLine(perNameDebug_);
        result.returnData(makePath(names.className, names.nameSpace, record));
        return true;
    });
    return CmpiStatus(CMPI_RC_OK);
}

void NicClassModule::keyLine(const char* text) const
{
    if (keyErrorsDebug_)
        debugLine(text);
    else
        errorLine(text);
}

void NicClassModule::keyTypeLine(int type) const
{
    if (keyTypeError_.before == nullptr) {
        keyLine(keyReadError_);
        return;
    }
    const char* after = keyTypeError_.after != nullptr ? keyTypeError_.after : "";
    if (keyErrorsDebug_) {
        if (g_EnableDebugPrint)
            Vexlan_FC_Utils_CMPI::DebugPrint("%s%d%s", keyTypeError_.before, type, after);
    } else if (g_EnableLogError) {
        Vexlan_FC_Utils_CMPI::LogError("%s%d%s", keyTypeError_.before, type, after);
    }
}

CmpiStatus NicClassModule::getInstance(const CmpiContext&, CmpiResult& result, const CmpiObjectPath& path,
                                       const char** properties, bool sendInstance) const
{
    debugLine(getInstance_.entry);
    Names names;
    CmpiStatus st = readNames(path, getInstance_, names);
    if (st.rc() != CMPI_RC_OK)
        return st;

    CMPIObjectPath* enc = path.getEnc();
    CMPIStatus rc = {CMPI_RC_OK, nullptr};
    CMPIData key = enc->ft->getKey(enc, keyName_, &rc);
    if (rc.rc != CMPI_RC_OK) {
        keyLine(keyReadError_);
        return CmpiStatus(rc);
    }
    if (key.type != CMPI_string) {
        keyTypeLine(static_cast<int>(key.type));
        return CmpiStatus(rc);
    }
    // A null string value is taken as an empty key text.
    const char* wanted = (key.state & CMPI_nullValue) ? nullptr : textOf(key.value.string);
    const std::string keyText = wanted != nullptr ? wanted : "";

    bool found = false;
    forEach([&](const NicRecord& record) {
        char text[kNicKeyTextSize] = {};
        keyText_(record, text);
        text[sizeof(text) - 1] = '\0';
        if (strcasecmp(text, keyText.c_str()) != 0)
            return true;
        found = true;
        CmpiInstance instance = makeInstance(names.className, names.nameSpace, properties, record);
        if (sendInstance)
            result.returnData(instance);
        return false;
    });
    if (!found)
        throw CmpiStatus(CMPI_RC_ERR_NOT_FOUND, keyText.c_str());
    return CmpiStatus(CMPI_RC_OK);
}

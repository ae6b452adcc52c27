// Strict checking of what a provider returns against the classes read from
// MOF: unknown class or property, wrong CIM type, missing key.
#include <algorithm>

#include "cimhost/check.h"

namespace cimhost {

namespace {

std::string typeText(Type t, bool array) { return std::string(typeName(t)) + (array ? "[]" : ""); }

}  // namespace

std::string checkValueType(const std::string& what, Type declared, bool declArray, bool embedded, const Value& v) {
    if (v.type == Type::Null) return std::string();   // a null of no particular type
    const bool sameType = v.type == declared || (declared == Type::String && embedded && v.type == Type::Instance);
    if (sameType && v.array == declArray) return std::string();
    return what + " is " + typeText(declared, declArray) + " in the MOF but the provider gave " +
           typeText(v.type, v.array);
}

std::string checkInstance(const ClassRepository& repo, const Instance& inst) {
    const std::string& cls = inst.className();
    if (!repo.find(cls)) return "class " + cls + " is not declared in the MOF";
    const bool complete = repo.chainComplete(cls);
    for (const auto& p : inst.properties) {
        const PropertyDecl* decl = repo.findProperty(cls, p.first);
        if (!decl) {
            if (complete) return "class " + cls + " has no property " + p.first;
            continue;   // declared in a superclass that the MOF does not hold
        }
        std::string err = checkValueType("property " + cls + "." + p.first, decl->type, decl->array,
                                         decl->embedded, p.second);
        if (!err.empty()) return err;
    }
    for (const auto& k : *repo.sharedKeyNames(cls)) {
        const Value* v = inst.property(k);
        if (!v || v->null) return "instance of " + cls + " lacks its key property " + k;
    }
    return std::string();
}

std::string checkPath(const ClassRepository& repo, const ObjectPath& p) {
    const std::string& cls = p.className;
    if (!repo.find(cls)) return "class " + cls + " is not declared in the MOF";
    const bool complete = repo.chainComplete(cls);
    const auto sharedKeys = repo.sharedKeyNames(cls);
    const std::vector<std::string>& keys = *sharedKeys;
    for (const auto& k : p.keys) {
        const PropertyDecl* decl = repo.findProperty(cls, k.first);
        if (!decl) {
            if (complete) return "object path of " + cls + " has key " + k.first + ", which the class does not declare";
            continue;
        }
        const bool isKey = std::any_of(keys.begin(), keys.end(), [&](const std::string& n) { return namesEqual(n, k.first); });
        // A superclass outside the MOF may declare it Key.
        if (!isKey && complete)
            return "object path of " + cls + " has key " + k.first + ", which is not a Key property";
        std::string err = checkValueType("key " + cls + "." + k.first, decl->type, decl->array, false, k.second);
        if (!err.empty()) return err;
    }
    for (const auto& k : keys) {
        const Value* v = p.key(k);
        if (!v || v->null) return "object path of " + cls + " lacks its key " + k;
    }
    return std::string();
}

}  // namespace cimhost

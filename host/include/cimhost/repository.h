// Class declarations read from MOF files: superclass, properties with their
// CIM types and Key qualifiers, methods with typed parameters, and the
// Association and Indication qualifiers. The host uses it for classPathIsA,
// for typing values given on the command line and for strict checking.
#pragma once

#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "cimhost/value.h"

namespace cimhost {

struct PropertyDecl {
    std::string name;
    Type type = Type::String;
    bool array = false;
    bool key = false;
    bool embedded = false;   // EmbeddedInstance / EmbeddedObject string
    std::string refClass;    // class of a reference
};

struct ParamDecl {
    std::string name;
    Type type = Type::String;
    bool array = false;
    bool in = true;
    bool out = false;
    bool embedded = false;
    std::string refClass;
};

struct MethodDecl {
    std::string name;
    Type returnType = Type::UInt32;
    std::vector<ParamDecl> params;
    const ParamDecl* param(const std::string& n) const;
};

struct ClassDecl {
    std::string name;
    std::string superClass;
    bool association = false;
    bool indication = false;
    bool abstract = false;
    std::string nameSpace;   // from #pragma namespace, if any
    std::vector<PropertyDecl> properties;
    std::vector<MethodDecl> methods;
};

class ClassRepository {
public:
    // Reads one MOF file, every *.mof file of a directory (sorted by name),
    // or MOF text. On error returns false and sets `error` to
    // "file:line: what"; classes read before the error stay.
    // `depth` counts nested #pragma include levels (bounded).
    bool loadPath(const std::string& path, std::string& error, int depth = 0);
    bool loadText(const std::string& text, const std::string& fileName, std::string& error);

    void add(ClassDecl decl);   // replaces a class of the same name
    bool empty() const { return classes_.empty(); }
    std::vector<std::string> classNames() const;

    const ClassDecl* find(const std::string& name) const;
    // True when `cls` is `ancestor` or derives from it (names compared
    // without regard to case). Unknown classes are only themselves.
    bool isA(const std::string& cls, const std::string& ancestor) const;
    // True when every class up the superclass chain is declared.
    bool chainComplete(const std::string& cls) const;
    // Properties of the class and its superclasses, the most derived
    // declaration of each name winning, superclass properties first.
    std::vector<PropertyDecl> allProperties(const std::string& cls) const;
    const PropertyDecl* findProperty(const std::string& cls, const std::string& prop) const;
    std::vector<std::string> keyNames(const std::string& cls) const;
    // The same names, computed once per class name (until a class is added)
    // and shared: the host asks for them with every instance handed over.
    std::shared_ptr<const std::vector<std::string>> sharedKeyNames(const std::string& cls) const;
    const MethodDecl* findMethod(const std::string& cls, const std::string& method) const;

private:
    bool parse(const std::string& text, const std::string& fileName, std::string& error, int depth);

    std::map<std::string, ClassDecl> classes_;   // key: lower-case name

    // Key names by class name as asked for; a copy of the repository starts
    // with an empty cache of its own.
    struct KeyNameCache {
        KeyNameCache() = default;
        KeyNameCache(const KeyNameCache&) {}
        KeyNameCache& operator=(const KeyNameCache&) {
            clear();
            return *this;
        }
        void clear() {
            std::lock_guard<std::mutex> g(m);
            byClass.clear();
        }
        std::mutex m;
        std::map<std::string, std::shared_ptr<const std::vector<std::string>>> byClass;
    };
    mutable KeyNameCache keyNameCache_;
};

}  // namespace cimhost

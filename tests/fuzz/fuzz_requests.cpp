// Requests of any shape against the provider: the shipped library is loaded
// once into the embedded host with the fixed adapter description
// requests_adapters.json, and each input becomes a sequence of up to 16
// operations. An input chooses the operation, the class (one of the
// provider's, one of the class definitions, or any text), the keys (from an
// instance the provider reported, possibly with one key changed, or any
// names with values of any type and length), the property list, the
// association parameters and the method with its arguments. Runs only under
// tests/isolate.sh.
#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

#include "cimhost/host.h"
#include "fuzz_input.h"
#include "zorap_sim_control.h"

namespace {

using cimhost::Type;
using cimhost::Value;

const char kNamespace[] = "root/vexlan_cmpi";

struct State {
    cimhost::Host host;
    std::vector<std::string> classes;          // the provider's classes
    std::vector<std::string> allClasses;       // every class definition
    std::vector<cimhost::ObjectPath> known;    // instance paths the provider reported
};

State* g_state = nullptr;

void fail(const std::string& what) {
    std::fprintf(stderr, "fuzz_requests: %s\n", what.c_str());
    std::exit(1);
}

std::string fileText(const char* path) {
    std::ifstream in(path, std::ios::binary);
    return std::string(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
}

void start() {
    // The error log on: the texts of refused keys reach its lines.
    if (!fuzzin::writeWhole("/opt/Vexlan_Corporation/CNAProviders/vexlancna.properties", "ErrorLog=1\n"))
        fail("cannot write the settings");
    if (zorap_sim_load_json(fileText(FUZZ_ADAPTERS).c_str()) != 0) fail("bad adapter description");

    g_state = new State;
    cimhost::Host& host = g_state->host;
    host.setStrict(true);
    host.setDefaultNamespace(kNamespace);
    cimhost::Status st = host.loadMof(VEXLAN_MOF_DIR);
    if (!st.ok()) fail("class definitions: " + st.message);
    st = host.load(PROVIDER_LIBRARY, "Vexlan_CNA_Provider");
    if (!st.ok()) fail("provider: " + st.message);

    g_state->allClasses = host.classes().classNames();
    for (const std::string& name : g_state->allClasses) {
        if (name.compare(0, 6, "Vexlan") != 0 && name.compare(0, 6, "vexlan") != 0) continue;
        g_state->classes.push_back(name);
        cimhost::ObjectPath cls;
        cls.nameSpace = kNamespace;
        cls.className = name;
        cimhost::OpResult r = host.enumerateInstanceNames(cls);
        for (const auto& p : r.paths) g_state->known.push_back(p);
    }
    if (g_state->classes.empty()) fail("no provider classes");
    std::fprintf(stderr, "fuzz_requests: %zu classes, %zu instance paths\n", g_state->classes.size(),
                 g_state->known.size());
}

// Builds requests from the reader's bytes.
class Builder {
public:
    explicit Builder(fuzzin::Reader& in) : in_(in) {}

    std::string className() {
        switch (in_.pick(4)) {
            case 0:
            case 1: return pickOf(g_state->classes);
            case 2: return pickOf(g_state->allClasses);
            default: return in_.text(300);
        }
    }

    std::string nameSpace() {
        switch (in_.byte() % 16) {
            case 0: return "root/PG_InterOp";
            case 1: return "root/interop";
            case 2: return in_.text(100);
            default: return kNamespace;
        }
    }

    // A name: one of the class's properties or any text.
    std::string propertyName(const std::string& cls) {
        std::vector<cimhost::PropertyDecl> props = g_state->host.classes().allProperties(cls);
        if (props.empty() || in_.pick(4) == 0) return in_.text(300);
        return props[in_.pick(props.size())].name;
    }

    cimhost::ObjectPath path() {
        const std::size_t how = in_.pick(4);
        if (how < 2 && !g_state->known.empty()) {
            cimhost::ObjectPath p = g_state->known[static_cast<std::size_t>(in_.number(2)) % g_state->known.size()];
            if (how == 1) changeKey(p);
            return p;
        }
        cimhost::ObjectPath p;
        p.className = className();
        p.nameSpace = nameSpace();
        const std::size_t keys = in_.pick(5);
        for (std::size_t k = 0; k < keys; ++k) {
            std::vector<std::string> names = g_state->host.classes().keyNames(p.className);
            std::string name = !names.empty() && in_.pick(3) != 0 ? names[in_.pick(names.size())]
                                                                  : propertyName(p.className);
            p.keys.emplace_back(name, value(0));
        }
        return p;
    }

    // One key replaced by a value of any type, removed, or one added.
    void changeKey(cimhost::ObjectPath& p) {
        const std::size_t k = p.keys.empty() ? 0 : in_.pick(p.keys.size());
        switch (in_.pick(4)) {
            case 0:
                if (!p.keys.empty()) p.keys.erase(p.keys.begin() + static_cast<long>(k));
                break;
            case 1: p.keys.emplace_back(propertyName(p.className), value(0)); break;
            case 2:
                if (!p.keys.empty()) p.keys[k].second = Value::fromString(in_.text());
                break;
            default:
                if (!p.keys.empty()) p.keys[k].second = value(0);
                break;
        }
    }

    Value scalar(Type t, int depth) {
        switch (t) {
            case Type::Boolean: return Value::fromBool(in_.byte() & 1);
            case Type::Char16: return Value::fromUnsigned(t, in_.number(2));
            case Type::Real32:
            case Type::Real64: {
                std::uint64_t bits = in_.number(8);
                double d;
                std::memcpy(&d, &bits, sizeof d);
                return Value::fromReal(t, d);
            }
            case Type::UInt8: return Value::fromUnsigned(t, in_.number(1));
            case Type::UInt16: return Value::fromUnsigned(t, in_.number(2));
            case Type::UInt32: return Value::fromUnsigned(t, in_.number(4));
            case Type::UInt64: return Value::fromUnsigned(t, in_.number(8));
            case Type::SInt8: return Value::fromSigned(t, static_cast<std::int8_t>(in_.number(1)));
            case Type::SInt16: return Value::fromSigned(t, static_cast<std::int16_t>(in_.number(2)));
            case Type::SInt32: return Value::fromSigned(t, static_cast<std::int32_t>(in_.number(4)));
            case Type::SInt64: return Value::fromSigned(t, static_cast<std::int64_t>(in_.number(8)));
            case Type::DateTime: {
                cimhost::DateTime dt;
                dt.usec = in_.number(8);
                dt.interval = in_.byte() & 1;
                dt.utcOffsetMinutes = static_cast<std::int16_t>(in_.number(2));
                return Value::fromDateTime(dt);
            }
            case Type::Reference:
                if (depth < 2) return Value::fromRef(path());
                return Value::nullOf(t);
            case Type::Instance:
                if (depth < 2) return Value::fromInstance(instance(depth + 1));
                return Value::nullOf(t);
            default: return Value::fromString(in_.text());
        }
    }

    // A value of any type: scalar, null or array.
    Value value(int depth) {
        static const Type kTypes[] = {Type::String,  Type::String, Type::Boolean, Type::Char16,   Type::Real32,
                                      Type::Real64,  Type::UInt8,  Type::UInt16,  Type::UInt32,   Type::UInt64,
                                      Type::SInt8,   Type::SInt16, Type::SInt32,  Type::SInt64,   Type::DateTime,
                                      Type::Reference, Type::Instance};
        const std::uint8_t form = in_.byte();
        const Type t = kTypes[form % (sizeof kTypes / sizeof kTypes[0])];
        switch (form >> 5) {
            case 0: return Value::nullOf(t, (form & 0x10) != 0);
            case 1: {
                if (t == Type::UInt8) return Value::byteArray(bytes());
                std::vector<Value> elems(in_.pick(6));
                for (Value& e : elems) e = scalar(t, depth + 1);
                return Value::arrayOf(t, std::move(elems));
            }
            default: return scalar(t, depth);
        }
    }

    // A typed value of a declared parameter or property, or any value.
    Value valueFor(Type t, bool array, int depth) {
        if (in_.pick(4) == 0) return value(depth);
        if (!array) return scalar(t, depth);
        if (t == Type::UInt8) return Value::byteArray(bytes());
        std::vector<Value> elems(in_.pick(6));
        for (Value& e : elems) e = scalar(t, depth + 1);
        return Value::arrayOf(t, std::move(elems));
    }

    std::vector<std::uint8_t> bytes() {
        std::string s = in_.text();
        return std::vector<std::uint8_t>(s.begin(), s.end());
    }

    cimhost::Instance instance(int depth) {
        cimhost::Instance inst;
        inst.path = depth == 0 ? path() : cimhost::ObjectPath{};
        if (inst.path.className.empty()) inst.path.className = className();
        const std::size_t n = in_.pick(5);
        for (std::size_t k = 0; k < n; ++k) inst.setProperty(propertyName(inst.className()), value(depth + 1));
        return inst;
    }

    cimhost::PropertyList properties(const std::string& cls) {
        switch (in_.pick(3)) {
            case 0: return std::nullopt;
            case 1: return std::vector<std::string>{};
            default: {
                std::vector<std::string> names(1 + in_.pick(4));
                for (std::string& n : names) n = propertyName(cls);
                return names;
            }
        }
    }

    std::string assocText() {
        switch (in_.pick(5)) {
            case 0:
            case 1: return std::string();
            case 2: return pickOf(g_state->classes);
            case 3: return propertyName(pickOf(g_state->classes));
            default: return in_.text(300);
        }
    }

    cimhost::AssocParams assocParams() {
        cimhost::AssocParams p;
        p.assocClass = assocText();
        p.resultClass = assocText();
        p.role = assocText();
        p.resultRole = assocText();
        return p;
    }

    // A method of the class (its declared inputs filled with values of their
    // types or of any type) or any name with any arguments.
    void method(const std::string& cls, std::string& name, std::vector<cimhost::NamedValue>& args) {
        const cimhost::ClassDecl* decl = g_state->host.classes().find(cls);
        if (decl != nullptr && !decl->methods.empty() && in_.pick(4) != 0) {
            const cimhost::MethodDecl& m = decl->methods[in_.pick(decl->methods.size())];
            name = m.name;
            for (const cimhost::ParamDecl& p : m.params)
                if (p.in && in_.pick(4) != 0) args.emplace_back(p.name, valueFor(p.type, p.array, 0));
        } else {
            name = in_.text(300);
        }
        const std::size_t extra = in_.pick(8) == 0 ? in_.pick(4) : 0;
        for (std::size_t k = 0; k < extra; ++k) args.emplace_back(in_.text(300), value(0));
    }

private:
    const std::string& pickOf(const std::vector<std::string>& list) {
        return list[static_cast<std::size_t>(in_.number(2)) % list.size()];
    }

    fuzzin::Reader& in_;
};

void runOne(Builder& b, fuzzin::Reader& in) {
    cimhost::Host& host = g_state->host;
    const std::size_t op = in.pick(11);
    cimhost::OpResult r;
    switch (op) {
        case 0: {
            cimhost::ObjectPath p;
            p.className = b.className();
            p.nameSpace = b.nameSpace();
            r = host.enumerateInstanceNames(p);
            break;
        }
        case 1: {
            cimhost::ObjectPath p;
            p.className = b.className();
            p.nameSpace = b.nameSpace();
            r = host.enumerateInstances(p, b.properties(p.className));
            break;
        }
        case 2: {
            cimhost::ObjectPath p = b.path();
            r = host.getInstance(p, b.properties(p.className));
            break;
        }
        case 3: {
            cimhost::ObjectPath p = b.path();
            cimhost::Instance inst = b.instance(0);
            r = host.modifyInstance(p, inst, b.properties(p.className));
            break;
        }
        case 4: {
            cimhost::ObjectPath p = b.path();
            r = host.createInstance(p, b.instance(0));
            break;
        }
        case 5: r = host.deleteInstance(b.path()); break;
        case 6:
        case 8: {
            // Associators or references: the properties of the result class
            // or of the association class.
            cimhost::ObjectPath p = b.path();
            cimhost::AssocParams a = b.assocParams();
            if (op == 6) r = host.associators(p, a, b.properties(a.resultClass));
            else r = host.references(p, a, b.properties(a.assocClass));
            break;
        }
        case 7:
        case 9: {
            cimhost::ObjectPath p = b.path();
            cimhost::AssocParams a = b.assocParams();
            if (op == 7) r = host.associatorNames(p, a);
            else r = host.referenceNames(p, a);
            break;
        }
        default: {
            cimhost::ObjectPath p = b.path();
            std::string name;
            std::vector<cimhost::NamedValue> args;
            b.method(p.className, name, args);
            r = host.invokeMethod(p, name, args);
            break;
        }
    }
    // FUZZ_REQUESTS_STRICT=1: what the host's strict checks object to in
    // an answer (a type or property the class definitions don't have).
    static const bool showStrict = std::getenv("FUZZ_REQUESTS_STRICT") != nullptr;
    if (showStrict)
        for (const std::string& e : r.strictErrors) std::fprintf(stderr, "strict (operation %zu): %s\n", op, e.c_str());
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    fuzzin::startIsolated("fuzz_requests");
    start();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    fuzzin::Reader in(data, size);
    Builder b(in);
    for (int op = 0; op < 16 && !in.empty(); ++op) runOne(b, in);
    return 0;
}

// The cimhost command: options, verbs, batch files, MOF and JSON output.
#include "cimhost/cli.h"

#include <chrono>
#include <cstdlib>
#include <fstream>
#include <iostream>
#include <mutex>
#include <nlohmann/json.hpp>
#include <sstream>
#include <thread>

#include "cimhost/host.h"
#include "cimhost/text.h"

namespace cimhost {

namespace {

using Json = nlohmann::ordered_json;

constexpr int kExitOk = 0;
constexpr int kExitFailed = 1;
constexpr int kExitUsage = 2;
constexpr int kRcInvalidParameter = 4;
constexpr int kRcFailed = 1;

const char kUsage[] =
    "usage: cimhost [OPTIONS] VERB [ARGS...]\n"
    "\n"
    "Loads a CMPI 2.0 provider library into this process, acts as its CIM server\n"
    "(broker) and runs one operation, or many with `batch`.\n"
    "\n"
    "Options (anywhere before or after the verb):\n"
    "  -p, --provider FILE      provider library (e.g. build/lib/libTiny_Provider.so)\n"
    "  -n, --name NAME          provider name, the prefix of NAME_Create_InstanceMI ...;\n"
    "                           default: the library file name without lib and .so\n"
    "  -m, --mof PATH           MOF file, or directory of *.mof files; repeatable\n"
    "      --reg FILE           sfcb registration file ([Class] sections with type:\n"
    "                           lines): the sfcb flavour then creates one MI per\n"
    "                           section and provider type, as sfcb does; the pegasus\n"
    "                           flavour calls the provider for its association\n"
    "                           sections, as OpenPegasus does; repeatable\n"
    "  -N, --namespace NS       namespace of paths that name none (default root/cimv2)\n"
    "  -s, --strict             check every returned instance, path, return value and\n"
    "                           output argument against its MOF class (unknown\n"
    "                           property, wrong type, missing key fail the operation)\n"
    "      --no-strict          do not check (the default)\n"
    "  -f, --flavour NAME       server behaviour: pegasus (default) or sfcb; --server too\n"
    "  -P, --properties A,B,..  property list for ei, gi, ai, ri, mi (\"\" = none)\n"
    "      --assoc-class C      association class (ai, ain)\n"
    "      --result-class C     result class (ai, ain, ri, rin)\n"
    "      --role R             role (ai, ain, ri, rin)\n"
    "      --result-role R      result role (ai, ain)\n"
    "  -q, --query WQL          filter for listen (default SELECT * FROM CLASS)\n"
    "      --json               JSON output (shape in docs/cimhost.md)\n"
    "  -v, --verbose            copy the provider's log and trace lines to stderr\n"
    "      --installed          use the provider installed beside this cimhost (the\n"
    "                           default when no -p is given and one is found): its\n"
    "                           library, MOF, namespace and sfcb registration\n"
    "  -h, --help               this text\n"
    "\n"
    "Verbs (paths in CIM text form, e.g. 'root/ns:Class.Key=\"v\",Num=5'):\n"
    "  ei PATH                  EnumerateInstances of the class of PATH\n"
    "  ein PATH                 EnumerateInstanceNames\n"
    "  gi PATH                  GetInstance\n"
    "  ci PATH [P=V ...]        CreateInstance; keys come from PATH, properties from P=V\n"
    "  mi PATH [P=V ...]        ModifyInstance; the property list is the names given\n"
    "  di PATH                  DeleteInstance\n"
    "  ai PATH                  Associators\n"
    "  ain PATH                 AssociatorNames\n"
    "  ri PATH                  References\n"
    "  rin PATH                 ReferenceNames\n"
    "  cm PATH METHOD [A=V ...] InvokeMethod with input arguments\n"
    "  listen CLASSPATH SECS    activate a filter on the indication class (source\n"
    "                           namespace from CLASSPATH), print the indications that\n"
    "                           arrive within SECS seconds, deactivate\n"
    "  subscribe CLASSPATH      (in a batch) activate a filter as listen does for the\n"
    "                           rest of the batch; what arrives is printed after each\n"
    "                           later line and while sleep waits\n"
    "  batch [FILE|-]           one operation per line from FILE or standard input, in\n"
    "                           one process (the provider is loaded once); '#' starts a\n"
    "                           comment; words split as a shell does; per-line options:\n"
    "                           -N -P -q and the association options\n"
    "  sleep SECS               wait (useful in batch files)\n"
    "  reload                   unload the provider (cleanup, dlclose) and load it again\n"
    "\n"
    "Values (P=V, A=V): typed from the MOF declaration of the property or parameter,\n"
    "or explicitly as NAME:TYPE=V (TYPE e.g. uint16, string, boolean, datetime,\n"
    "reference; append [] for arrays). Without either they are strings. Forms:\n"
    "\"text\" or text, 42, -7, 0x1F, TRUE/FALSE, 20240101120000.000000+000, a path\n"
    "for references, {v1,v2} for arrays, NULL.\n"
    "\n"
    "Output: MOF instance syntax (each instance preceded by a // comment with its\n"
    "path), one path per line for name operations, ReturnValue and output\n"
    "arguments as NAME = VALUE; lines for cm. Errors: one line\n"
    "CMPI_RC_<NAME>: message on stderr. Exit status: 0 success, 1 a failed\n"
    "operation, load or MOF file, 2 a usage error (unknown verb or option, bad path).\n";

struct OpOptions {
    std::string nameSpace;   // -N (empty: host default)
    bool hasProps = false;
    std::vector<std::string> props;
    AssocParams assoc;
    std::string query;
};

struct Session {
    std::string provider, name;
    std::vector<std::string> mofs;
    std::vector<std::string> regs;
    bool strict = false;
    Flavour flavour = Flavour::Pegasus;
    bool json = false;
    bool verbose = false;
    std::string defaultNs;
    bool inBatch = false;
    std::vector<int> subscriptions;   // filters of `subscribe`, active until the batch ends
    Host host;
    std::ostream* out = nullptr;
    std::ostream* err = nullptr;
};

std::vector<std::string> splitComma(const std::string& s) {
    std::vector<std::string> out;
    if (s.empty()) return out;
    std::string cur;
    for (char c : s) {
        if (c == ',') {
            out.push_back(cur);
            cur.clear();
        } else if (c != ' ') {
            cur += c;
        }
    }
    out.push_back(cur);
    return out;
}

std::string defaultName(const std::string& lib) {
    std::string base = lib.substr(lib.rfind('/') == std::string::npos ? 0 : lib.rfind('/') + 1);
    if (base.compare(0, 3, "lib") == 0) base = base.substr(3);
    const size_t so = base.find(".so");
    if (so != std::string::npos) base = base.substr(0, so);
    return base;
}

// ---------------------------------------------------------------- JSON

Json valueJson(const Value& v);

Json instanceJson(const Instance& inst) {
    Json j;
    j["path"] = formatPath(inst.path);
    j["className"] = inst.className();
    j["namespace"] = inst.path.nameSpace;
    Json props = Json::object();
    Json types = Json::object();
    for (const auto& p : inst.properties) {
        props[p.first] = valueJson(p.second);
        types[p.first] = std::string(typeName(p.second.type)) + (p.second.array ? "[]" : "");
    }
    j["properties"] = props;
    j["types"] = types;
    return j;
}

Json valueJson(const Value& v) {
    if (v.null) return nullptr;
    if (v.array) {
        Json a = Json::array();
        for (std::size_t k = 0; k < v.arraySize(); ++k) a.push_back(valueJson(v.element(k)));
        return a;
    }
    switch (v.type) {
        case Type::Boolean: return v.b;
        case Type::Char16: return std::string(1, static_cast<char>(v.u));
        case Type::UInt8:
        case Type::UInt16:
        case Type::UInt32:
        case Type::UInt64: return v.u;
        case Type::SInt8:
        case Type::SInt16:
        case Type::SInt32:
        case Type::SInt64: return v.i;
        case Type::Real32:
        case Type::Real64: return v.d;
        case Type::String: return v.s;
        case Type::DateTime: return v.dt.toText();
        case Type::Reference: return v.ref ? formatPath(*v.ref) : std::string();
        case Type::Instance: return v.inst ? instanceJson(*v.inst) : Json(nullptr);
        case Type::Null: break;
    }
    return nullptr;
}

std::string typeText(const Value& v) { return std::string(typeName(v.type)) + (v.array ? "[]" : ""); }

void emitJson(Session& s, const Json& j) {
    *s.out << (s.inBatch ? j.dump() : j.dump(2)) << "\n";
}

// ---------------------------------------------------------------- results

int fail(Session& s, const Status& st, int code = kExitFailed) {
    *s.err << statusLine(st) << "\n";
    if (s.json) {
        Json j;
        j["rc"] = st.rc;
        j["status"] = rcName(st.rc);
        j["message"] = st.message;
        emitJson(s, j);
    }
    return code;
}

int usage(Session& s, const std::string& what) { return fail(s, Status{kRcInvalidParameter, what}, kExitUsage); }

// Reads the sections of an sfcb registration file: "[Class]" starts a
// section, its "type:" line names the provider types; the other keys
// (provider, location, namespace, unload, ...) do not change what the host
// does. Appends to `regs`; a fault is a status naming the file and line.
Status readRegistrations(const std::string& file, std::vector<Registration>& regs) {
    std::ifstream in(file);
    if (!in) return Status{kRcFailed, "cannot read registration file " + file};
    static const struct {
        const char* word;
        MiType type;
    } kTypes[] = {{"instance", MiType::Instance},
                  {"association", MiType::Association},
                  {"method", MiType::Method},
                  {"indication", MiType::Indication}};
    std::string line;
    int n = 0;
    bool inSection = false;
    while (std::getline(in, line)) {
        ++n;
        const std::string where = file + ":" + std::to_string(n) + ": ";
        const size_t b = line.find_first_not_of(" \t\r");
        if (b == std::string::npos || line[b] == '#') continue;
        const size_t e = line.find_last_not_of(" \t\r");
        const std::string t = line.substr(b, e - b + 1);
        if (t.front() == '[') {
            if (t.back() != ']' || t.size() < 3) return Status{kRcFailed, where + "bad section header"};
            regs.push_back(Registration{t.substr(1, t.size() - 2), {}});
            inSection = true;
            continue;
        }
        const size_t colon = t.find(':');
        if (colon == std::string::npos || !inSection)
            return Status{kRcFailed, where + "expected [Class] or key: value"};
        if (t.compare(0, colon, "type") != 0) continue;
        std::istringstream words(t.substr(colon + 1));
        std::string w;
        while (words >> w) {
            bool known = false;
            for (const auto& k : kTypes)
                if (w == k.word) {
                    regs.back().types.push_back(k.type);
                    known = true;
                }
            if (!known) return Status{kRcFailed, where + "unknown provider type '" + w + "'"};
        }
    }
    return Status{};
}

void printInstances(Session& s, const std::vector<Instance>& insts) {
    if (s.json) {
        Json j;
        j["rc"] = 0;
        j["instances"] = Json::array();
        for (const auto& i : insts) j["instances"].push_back(instanceJson(i));
        emitJson(s, j);
        return;
    }
    for (size_t k = 0; k < insts.size(); ++k) {
        if (k) *s.out << "\n";
        *s.out << "// " << formatPath(insts[k].path) << "\n" << formatInstanceMof(insts[k]);
    }
}

void printPaths(Session& s, const std::vector<ObjectPath>& paths) {
    if (s.json) {
        Json j;
        j["rc"] = 0;
        j["paths"] = Json::array();
        for (const auto& p : paths) j["paths"].push_back(formatPath(p));
        emitJson(s, j);
        return;
    }
    for (const auto& p : paths) *s.out << formatPath(p) << "\n";
}

void printOk(Session& s) {
    if (!s.json) return;
    Json j;
    j["rc"] = 0;
    j["status"] = "CMPI_RC_OK";
    emitJson(s, j);
}

// ---------------------------------------------------------------- arguments

// A uint8 array's bytes from a file (NAME=@FILE): at most 16 MiB, the most
// elements a CMPI array of the host may have.
constexpr std::size_t kMaxByteFile = 16u * 1024 * 1024;

bool readByteFile(const std::string& path, Value& out, std::string& error) {
    std::ifstream in(path, std::ios::binary);
    if (!in) {
        error = "cannot read " + path;
        return false;
    }
    std::vector<std::uint8_t> bytes;
    char chunk[65536];
    while (in.read(chunk, sizeof(chunk)) || in.gcount() > 0) {
        bytes.insert(bytes.end(), chunk, chunk + in.gcount());
        if (bytes.size() > kMaxByteFile) {
            error = path + " has more than 16 MiB";
            return false;
        }
    }
    out = Value::byteArray(std::move(bytes));
    return true;
}

// NAME[:TYPE]=VALUE, typed from the explicit TYPE, the declaration, or string.
bool parseAssignment(Session& s, const std::string& text, const PropertyDecl* prop, const ParamDecl* param,
                     const std::string& ns, NamedValue& out, std::string& error) {
    const size_t eq = text.find('=');
    if (eq == std::string::npos || eq == 0) {
        error = "expected NAME=VALUE, got '" + text + "'";
        return false;
    }
    std::string name = text.substr(0, eq);
    const std::string valueText = text.substr(eq + 1);
    Type type = Type::String;
    bool array = !valueText.empty() && valueText[0] == '{';
    const size_t colon = name.find(':');
    if (colon != std::string::npos) {
        std::string t = name.substr(colon + 1);
        name = name.substr(0, colon);
        array = t.size() > 2 && t.compare(t.size() - 2, 2, "[]") == 0;
        if (array) t = t.substr(0, t.size() - 2);
        if (namesEqual(t, "reference") || namesEqual(t, "ref")) type = Type::Reference;
        else if (!typeFromName(t, type)) {
            error = "unknown type '" + t + "' for " + name;
            return false;
        }
    } else if (prop) {
        type = prop->type;
        array = prop->array;
    } else if (param) {
        type = param->type;
        array = param->array;
    }
    Value v;
    if (array && type == Type::UInt8 && !valueText.empty() && valueText[0] == '@') {
        if (!readByteFile(valueText.substr(1), v, error)) {
            error = name + ": " + error;
            return false;
        }
        out = NamedValue(name, std::move(v));
        return true;
    }
    if (!parseValueText(valueText, type, array, v, error, &s.host.classes(), ns)) {
        error = name + ": " + error;
        return false;
    }
    out = NamedValue(name, std::move(v));
    return true;
}

std::string nameOf(const std::string& assignment) {
    std::string n = assignment.substr(0, assignment.find('='));
    return n.substr(0, n.find(':'));
}

// ---------------------------------------------------------------- verbs

bool needProvider(Session& s, int& code) {
    if (s.host.loaded()) return true;
    code = fail(s, Status{kRcFailed, s.provider.empty() ? "no provider library given (-p FILE)"
                                                         : "provider " + s.provider + " is not loaded"});
    return false;
}

// Prints one received indication; kExitFailed when it failed the strict check.
int printIndication(Session& s, const Indication& ind) {
    int result = kExitOk;
    if (!ind.error.empty()) {
        *s.err << statusLine(Status{kRcFailed, "strict check: " + ind.error}) << "\n";
        result = kExitFailed;
    }
    if (s.json) {
        Json j;
        j["namespace"] = ind.nameSpace;
        j["deliveredTo"] = ind.deliveredTo;
        j["indication"] = instanceJson(ind.instance);
        *s.out << j.dump() << "\n";
    } else {
        *s.out << "// indication for " << ind.nameSpace << "\n" << formatInstanceMof(ind.instance) << "\n";
    }
    s.out->flush();
    return result;
}

// Prints the indications that arrive until `deadline` (those already
// received when it has passed); the worst exit status.
int printIndicationsUntil(Session& s, std::chrono::steady_clock::time_point deadline) {
    int result = kExitOk;
    Indication ind;
    while (true) {
        const auto now = std::chrono::steady_clock::now();
        const auto wait = now >= deadline ? std::chrono::milliseconds(0)
                                          : std::chrono::duration_cast<std::chrono::milliseconds>(deadline - now) +
                                                std::chrono::milliseconds(1);
        if (s.host.waitIndication(ind, wait))
            result = std::max(result, printIndication(s, ind));
        else if (std::chrono::steady_clock::now() >= deadline)
            return result;
    }
}

// The filter of listen and subscribe: CLASSPATH's class (or -q) with its
// namespace as source namespace.
int activateFor(Session& s, const std::string& classPath, const OpOptions& o, int& id) {
    ObjectPath cp;
    std::string err;
    const std::string ns = o.nameSpace.empty() ? s.host.defaultNamespace() : o.nameSpace;
    if (!parsePath(classPath, cp, err, &s.host.classes(), ns)) return usage(s, "bad class path: " + err);
    int code = 0;
    if (!needProvider(s, code)) return code;
    const std::string query = o.query.empty() ? "SELECT * FROM " + cp.className : o.query;
    const Status st = s.host.activateFilter(query, cp.nameSpace, id);
    if (!st.ok()) return fail(s, st);
    return kExitOk;
}

int doListen(Session& s, const std::vector<std::string>& words, const OpOptions& o) {
    if (words.size() != 3) return usage(s, "listen takes CLASSPATH SECONDS");
    char* end = nullptr;
    const double secs = std::strtod(words[2].c_str(), &end);
    if (!end || *end != '\0' || secs < 0 || secs > 86400) return usage(s, "bad number of seconds: " + words[2]);
    int id = 0;
    const int code = activateFor(s, words[1], o, id);
    if (code != kExitOk) return code;
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::microseconds(static_cast<long long>(secs * 1e6));
    const int result = printIndicationsUntil(s, deadline);
    const Status st = s.host.deactivateFilter(id);
    if (!st.ok()) return fail(s, st);
    return result;
}

int doSubscribe(Session& s, const std::vector<std::string>& words, const OpOptions& o) {
    if (words.size() != 2) return usage(s, "subscribe takes CLASSPATH");
    if (!s.inBatch) return usage(s, "subscribe is for batch files (listen waits on its own)");
    int id = 0;
    const int code = activateFor(s, words[1], o, id);
    if (code == kExitOk) s.subscriptions.push_back(id);
    return code;
}

int runVerb(Session& s, const std::vector<std::string>& words, const OpOptions& o);

int doBatch(Session& s, const std::vector<std::string>& words);

// Per-operation options; `words` keeps the rest.
bool takeOpOptions(Session& s, std::vector<std::string>& words, OpOptions& o, std::string& error) {
    std::vector<std::string> rest;
    for (size_t k = 0; k < words.size(); ++k) {
        const std::string& w = words[k];
        auto value = [&](std::string& target) {
            if (k + 1 >= words.size()) {
                error = "option " + w + " needs a value";
                return false;
            }
            target = words[++k];
            return true;
        };
        std::string v;
        if (w == "-N" || w == "--namespace") {
            if (!value(o.nameSpace)) return false;
        } else if (w == "-P" || w == "--properties") {
            if (!value(v)) return false;
            o.hasProps = true;
            o.props = splitComma(v);
        } else if (w == "--assoc-class" || w == "-ac") {
            if (!value(o.assoc.assocClass)) return false;
        } else if (w == "--result-class" || w == "-rc") {
            if (!value(o.assoc.resultClass)) return false;
        } else if (w == "--role" || w == "-r") {
            if (!value(o.assoc.role)) return false;
        } else if (w == "--result-role" || w == "-rr") {
            if (!value(o.assoc.resultRole)) return false;
        } else if (w == "-q" || w == "--query") {
            if (!value(o.query)) return false;
        } else if (w.size() > 1 && w[0] == '-' && !(w.size() > 1 && std::isdigit(static_cast<unsigned char>(w[1])))) {
            error = "unknown option " + w;
            return false;
        } else {
            rest.push_back(w);
        }
    }
    (void)s;
    words.swap(rest);
    return true;
}

int runVerb(Session& s, const std::vector<std::string>& words, const OpOptions& o) {
    const std::string& verb = words[0];
    const std::string ns = o.nameSpace.empty() ? s.host.defaultNamespace() : o.nameSpace;
    const PropertyList props = o.hasProps ? PropertyList(o.props) : std::nullopt;
    if (verb == "batch") {
        if (s.inBatch) return usage(s, "batch cannot be nested");
        return doBatch(s, words);
    }
    if (verb == "sleep") {
        if (words.size() != 2) return usage(s, "sleep takes SECONDS");
        char* end = nullptr;
        const double secs = std::strtod(words[1].c_str(), &end);
        if (!end || *end != '\0' || secs < 0 || secs > 86400) return usage(s, "bad number of seconds: " + words[1]);
        const auto wait = std::chrono::microseconds(static_cast<long long>(secs * 1e6));
        if (!s.subscriptions.empty()) return printIndicationsUntil(s, std::chrono::steady_clock::now() + wait);
        std::this_thread::sleep_for(wait);
        return kExitOk;
    }
    if (verb == "reload") {
        if (words.size() != 1) return usage(s, "reload takes no arguments");
        int code = 0;
        if (!needProvider(s, code)) return code;
        Status st = s.host.unload(false);
        if (!st.ok()) return fail(s, st);
        st = s.host.load(s.provider, s.name);
        if (!st.ok()) return fail(s, st);
        printOk(s);
        return kExitOk;
    }
    if (verb == "listen") return doListen(s, words, o);
    if (verb == "subscribe") return doSubscribe(s, words, o);

    static const char* const kPathVerbs[] = {"ei", "ein", "gi", "ci", "mi", "di", "ai", "ain", "ri", "rin", "cm"};
    bool known = false;
    for (const char* v : kPathVerbs) known = known || verb == v;
    if (!known) return usage(s, "unknown verb '" + verb + "' (see --help)");
    if (words.size() < 2) return usage(s, verb + " needs an object path");
    const bool takesValues = verb == "ci" || verb == "mi" || verb == "cm";
    if (!takesValues && words.size() > 2) return usage(s, verb + " takes one object path");
    if (verb == "cm" && words.size() < 3) return usage(s, "cm needs PATH METHOD");

    ObjectPath path;
    std::string err;
    if (!parsePath(words[1], path, err, &s.host.classes(), ns)) return usage(s, "bad object path: " + err);
    int code = 0;
    if (!needProvider(s, code)) return code;

    OpResult r;
    if (verb == "ei") r = s.host.enumerateInstances(path, props);
    else if (verb == "ein") r = s.host.enumerateInstanceNames(path);
    else if (verb == "gi") r = s.host.getInstance(path, props);
    else if (verb == "di") r = s.host.deleteInstance(path);
    else if (verb == "ai") r = s.host.associators(path, o.assoc, props);
    else if (verb == "ain") r = s.host.associatorNames(path, o.assoc);
    else if (verb == "ri") r = s.host.references(path, o.assoc, props);
    else if (verb == "rin") r = s.host.referenceNames(path, o.assoc);
    else if (verb == "ci" || verb == "mi") {
        Instance inst;
        inst.path = path;
        if (inst.path.nameSpace.empty()) inst.path.nameSpace = ns;
        for (const auto& k : path.keys) inst.setProperty(k.first, k.second);
        std::vector<std::string> names;
        for (size_t k = 2; k < words.size(); ++k) {
            NamedValue nv;
            const PropertyDecl* decl = s.host.classes().findProperty(path.className, nameOf(words[k]));
            if (!parseAssignment(s, words[k], decl, nullptr, ns, nv, err)) return usage(s, err);
            names.push_back(nv.first);
            inst.setProperty(nv.first, std::move(nv.second));
        }
        if (verb == "ci") r = s.host.createInstance(path, inst);
        else r = s.host.modifyInstance(path, inst, o.hasProps ? props : PropertyList(names));
    } else {   // cm
        const std::string& method = words[2];
        const MethodDecl* m = s.host.classes().findMethod(path.className, method);
        std::vector<NamedValue> in;
        for (size_t k = 3; k < words.size(); ++k) {
            NamedValue nv;
            const ParamDecl* pd = m ? m->param(nameOf(words[k])) : nullptr;
            if (!parseAssignment(s, words[k], nullptr, pd, ns, nv, err)) return usage(s, err);
            in.push_back(std::move(nv));
        }
        r = s.host.invokeMethod(path, method, in);
    }
    if (!r.ok()) return fail(s, r);

    if (verb == "ei" || verb == "gi" || verb == "ai" || verb == "ri") printInstances(s, r.instances);
    else if (verb == "ein" || verb == "ain" || verb == "rin" || verb == "ci") printPaths(s, r.paths);
    else if (verb == "mi" || verb == "di") printOk(s);
    else {   // cm
        const Value* rv = r.data.empty() ? nullptr : &r.data.front();
        if (s.json) {
            Json j;
            j["rc"] = 0;
            j["returnValue"] = rv ? valueJson(*rv) : Json(nullptr);
            j["returnType"] = rv ? typeText(*rv) : std::string("null");
            Json outs = Json::object(), types = Json::object();
            for (const auto& a : r.outArgs) {
                outs[a.first] = valueJson(a.second);
                types[a.first] = typeText(a.second);
            }
            j["outArgs"] = outs;
            j["outArgTypes"] = types;
            emitJson(s, j);
        } else {
            *s.out << "ReturnValue = " << (rv ? formatValue(*rv) : std::string("NULL")) << ";\n";
            for (const auto& a : r.outArgs) *s.out << a.first << " = " << formatValue(a.second) << ";\n";
        }
    }
    return kExitOk;
}

int doBatch(Session& s, const std::vector<std::string>& words) {
    if (words.size() > 2) return usage(s, "batch takes one FILE or -");
    std::ifstream file;
    std::istream* in = &std::cin;
    if (words.size() == 2 && words[1] != "-") {
        file.open(words[1]);
        if (!file) return fail(s, Status{kRcFailed, "cannot open batch file " + words[1]});
        in = &file;
    }
    s.inBatch = true;
    int result = kExitOk;
    std::string line;
    int lineNo = 0;
    while (std::getline(*in, line)) {
        ++lineNo;
        std::vector<std::string> w;
        std::string err;
        if (!splitWords(line, w, err)) {
            result = std::max(result, usage(s, "line " + std::to_string(lineNo) + ": " + err));
            continue;
        }
        if (w.empty() || w[0][0] == '#') continue;
        OpOptions o;
        if (!takeOpOptions(s, w, o, err)) {
            result = std::max(result, usage(s, "line " + std::to_string(lineNo) + ": " + err));
            continue;
        }
        if (w.empty()) continue;
        const int code = runVerb(s, w, o);
        result = std::max(result, code);
        if (!s.subscriptions.empty()) result = std::max(result, printIndicationsUntil(s, std::chrono::steady_clock::now()));
        s.out->flush();
    }
    for (int id : s.subscriptions) {
        const Status st = s.host.deactivateFilter(id);
        if (!st.ok()) result = std::max(result, fail(s, st));
    }
    s.subscriptions.clear();
    s.inBatch = false;
    return result;
}

}  // namespace

const char* cliUsage() { return kUsage; }

bool splitWords(const std::string& line, std::vector<std::string>& words, std::string& error) {
    words.clear();
    std::string cur;
    bool inWord = false;
    for (size_t k = 0; k < line.size(); ++k) {
        const char c = line[k];
        if (c == '\'') {
            const size_t end = line.find('\'', k + 1);
            if (end == std::string::npos) {
                error = "unterminated single quote";
                return false;
            }
            cur += line.substr(k + 1, end - k - 1);
            k = end;
            inWord = true;
        } else if (c == '"') {
            ++k;
            bool closed = false;
            for (; k < line.size(); ++k) {
                if (line[k] == '"') {
                    closed = true;
                    break;
                }
                if (line[k] == '\\' && k + 1 < line.size() && (line[k + 1] == '"' || line[k + 1] == '\\')) ++k;
                cur += line[k];
            }
            if (!closed) {
                error = "unterminated double quote";
                return false;
            }
            inWord = true;
        } else if (c == '\\' && k + 1 < line.size()) {
            cur += line[++k];
            inWord = true;
        } else if (c == ' ' || c == '\t' || c == '\r') {
            if (inWord) words.push_back(cur);
            cur.clear();
            inWord = false;
        } else {
            cur += c;
            inWord = true;
        }
    }
    if (inWord) words.push_back(cur);
    return true;
}

int runCli(const std::vector<std::string>& args, std::ostream& out, std::ostream& err) {
    return runCli(args, out, err, nullptr);
}

int runCli(const std::vector<std::string>& args, std::ostream& out, std::ostream& err,
           const InstalledProvider* installed) {
    std::mutex errLock;   // log lines come from provider threads too; outlives the host
    Session s;
    s.out = &out;
    s.err = &err;
    std::vector<std::string> words;
    bool wantInstalled = false;
    // Process options first; per-operation ones are left for the verb.
    for (size_t k = 1; k < args.size(); ++k) {
        const std::string& a = args[k];
        auto value = [&](std::string& target) {
            if (k + 1 >= args.size()) return false;
            target = args[++k];
            return true;
        };
        std::string v;
        if (a == "-h" || a == "--help") {
            out << kUsage;
            return kExitOk;
        } else if (a == "-p" || a == "--provider") {
            if (!value(s.provider)) return usage(s, "option " + a + " needs a value");
        } else if (a == "-n" || a == "--name") {
            if (!value(s.name)) return usage(s, "option " + a + " needs a value");
        } else if (a == "-m" || a == "--mof") {
            if (!value(v)) return usage(s, "option " + a + " needs a value");
            s.mofs.push_back(v);
        } else if (a == "--reg") {
            if (!value(v)) return usage(s, "option " + a + " needs a value");
            s.regs.push_back(v);
        } else if (a == "-s" || a == "--strict") {
            s.strict = true;
        } else if (a == "--no-strict") {
            s.strict = false;
        } else if (a == "-f" || a == "--flavour" || a == "--flavor" || a == "--server") {
            if (!value(v)) return usage(s, "option " + a + " needs a value");
            if (!flavourFromName(v, s.flavour)) return usage(s, "unknown server flavour '" + v + "' (pegasus, sfcb)");
        } else if (a == "--json") {
            s.json = true;
        } else if (a == "-v" || a == "--verbose") {
            s.verbose = true;
        } else if (a == "--installed") {
            wantInstalled = true;
        } else if (a == "-N" || a == "--namespace") {
            if (!value(s.defaultNs)) return usage(s, "option " + a + " needs a value");
        } else {
            words.push_back(a);
        }
    }
    OpOptions o;
    std::string e;
    if (!takeOpOptions(s, words, o, e)) return usage(s, e);
    if (words.empty()) return usage(s, "no verb given (see --help)");
    if (wantInstalled && (installed == nullptr || installed->library.empty()))
        return fail(s, Status{kRcFailed, "no installed provider found beside this cimhost"});
    if (s.provider.empty() && installed != nullptr && !installed->library.empty()) {
        s.provider = installed->library;
        if (s.name.empty()) s.name = installed->name;
        if (s.mofs.empty()) s.mofs.push_back(installed->mofDir);
        if (s.defaultNs.empty()) s.defaultNs = installed->nameSpace;
        // sfcb makes its MIs by the sections; OpenPegasus calls the provider
        // for the association classes that the registration serves.
        if (s.regs.empty() && !installed->registration.empty())
            s.regs.push_back(installed->registration);
    }

    s.host.setStrict(s.strict);
    s.host.setFlavour(s.flavour);
    if (!s.defaultNs.empty()) s.host.setDefaultNamespace(s.defaultNs);
    if (s.verbose)
        s.host.setLogSink([&err, &errLock](const std::string& line) {
            std::lock_guard<std::mutex> g(errLock);
            err << line << "\n";
        });
    for (const auto& m : s.mofs) {
        const Status st = s.host.loadMof(m);
        if (!st.ok()) return fail(s, st);
    }
    if (!s.regs.empty()) {
        std::vector<Registration> regs;
        for (const auto& f : s.regs) {
            const Status st = readRegistrations(f, regs);
            if (!st.ok()) return fail(s, st);
        }
        s.host.setRegistrations(std::move(regs));
    }
    if (!s.provider.empty()) {
        if (s.name.empty()) s.name = defaultName(s.provider);
        const Status st = s.host.load(s.provider, s.name);
        if (!st.ok()) return fail(s, st);
    }
    const int code = runVerb(s, words, o);
    const Status st = s.host.unload(true);
    if (!st.ok()) return std::max(code, fail(s, st));
    return code;
}

}  // namespace cimhost

// Object path and value text forms, MOF instance output.
#include "cimhost/text.h"

#include <cctype>
#include <cerrno>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <limits>
#include <strings.h>

namespace cimhost {

namespace {

bool isIdentChar(char c) { return std::isalnum(static_cast<unsigned char>(c)) || c == '_'; }

// Reads a double-quoted literal starting at text[pos] == '"'.
bool readQuoted(const std::string& text, size_t& pos, std::string& out) {
    ++pos;
    while (pos < text.size()) {
        char c = text[pos++];
        if (c == '"') return true;
        if (c == '\\' && pos < text.size()) {
            const char e = text[pos++];
            switch (e) {
                case 'n': c = '\n'; break;
                case 't': c = '\t'; break;
                case 'r': c = '\r'; break;
                default: c = e; break;
            }
        }
        out += c;
    }
    return false;
}

std::uint64_t maxOf(Type t) {
    switch (t) {
        case Type::UInt8: return 0xFFu;
        case Type::UInt16:
        case Type::Char16: return 0xFFFFu;
        case Type::UInt32: return 0xFFFFFFFFu;
        default: return std::numeric_limits<std::uint64_t>::max();
    }
}

std::int64_t minOf(Type t) {
    switch (t) {
        case Type::SInt8: return -128;
        case Type::SInt16: return -32768;
        case Type::SInt32: return std::numeric_limits<std::int32_t>::min();
        default: return std::numeric_limits<std::int64_t>::min();
    }
}

std::int64_t maxSigned(Type t) {
    switch (t) {
        case Type::SInt8: return 127;
        case Type::SInt16: return 32767;
        case Type::SInt32: return std::numeric_limits<std::int32_t>::max();
        default: return std::numeric_limits<std::int64_t>::max();
    }
}

// All of s as a number read by parse (a strtoX): no leading space, nothing
// left over (a NUL inside the text is left over too), no range error.
template <class N, class F>
bool wholeNumber(const std::string& s, F parse, N& v) {
    if (s.empty() || std::isspace(static_cast<unsigned char>(s[0]))) return false;
    errno = 0;
    char* end = nullptr;
    v = parse(s.c_str(), &end);
    return errno == 0 && end == s.c_str() + s.size();
}

bool parseUnsigned(const std::string& s, Type t, Value& out) {
    if (!s.empty() && (s[0] == '-' || s[0] == '+')) return false;
    unsigned long long v = 0;
    if (!wholeNumber(s, [](const char* p, char** e) { return std::strtoull(p, e, 0); }, v) || v > maxOf(t))
        return false;
    out = Value::fromUnsigned(t, v);
    return true;
}

bool parseSigned(const std::string& s, Type t, Value& out) {
    long long v = 0;
    if (!wholeNumber(s, [](const char* p, char** e) { return std::strtoll(p, e, 0); }, v) || v < minOf(t) ||
        v > maxSigned(t))
        return false;
    out = Value::fromSigned(t, v);
    return true;
}

bool parseReal(const std::string& s, Type t, Value& out) {
    double v = 0;
    if (!wholeNumber(s, [](const char* p, char** e) { return std::strtod(p, e); }, v)) return false;
    out = Value::fromReal(t, v);
    return true;
}

bool parseBool(const std::string& s, Value& out) {
    if (strcasecmp(s.c_str(), "true") == 0) out = Value::fromBool(true);
    else if (strcasecmp(s.c_str(), "false") == 0) out = Value::fromBool(false);
    else return false;
    return true;
}

// One scalar of a declared type from its text (quotes already removed when
// `quoted`).
bool scalarFromText(const std::string& s, bool quoted, Type type, Value& out, std::string& error,
                    const ClassRepository* repo, const std::string& defaultNs) {
    bool ok = true;
    switch (type) {
        case Type::String: out = Value::fromString(s); break;
        case Type::Boolean: ok = parseBool(s, out); break;
        case Type::UInt8:
        case Type::UInt16:
        case Type::UInt32:
        case Type::UInt64: ok = parseUnsigned(s, type, out); break;
        case Type::SInt8:
        case Type::SInt16:
        case Type::SInt32:
        case Type::SInt64: ok = parseSigned(s, type, out); break;
        case Type::Real32:
        case Type::Real64: ok = parseReal(s, type, out); break;
        case Type::Char16:
            if (s.size() == 1) out = Value::fromUnsigned(Type::Char16, static_cast<unsigned char>(s[0]));
            else ok = false;
            break;
        case Type::DateTime: {
            auto dt = DateTime::fromText(s);
            if (dt) out = Value::fromDateTime(*dt);
            else ok = false;
            break;
        }
        case Type::Reference: {
            ObjectPath p;
            std::string err;
            if (!parsePath(s, p, err, repo, defaultNs)) {
                error = "bad reference '" + s + "': " + err;
                return false;
            }
            out = Value::fromRef(p);
            break;
        }
        case Type::Instance:
        case Type::Null:
            error = std::string("values of type ") + typeName(type) + " cannot be given as text";
            return false;
    }
    (void)quoted;
    if (!ok) error = "'" + s + "' is not a valid " + typeName(type);
    return ok;
}

// Untyped literal: quoted → string, else boolean, integer or real.
bool untypedFromText(const std::string& s, bool quoted, Value& out, std::string& error) {
    if (quoted) {
        out = Value::fromString(s);
        return true;
    }
    if (parseBool(s, out)) return true;
    if (!s.empty() && s[0] == '-' && parseSigned(s, Type::SInt64, out)) return true;
    if (parseUnsigned(s, Type::UInt64, out)) return true;
    if (parseReal(s, Type::Real64, out)) return true;
    error = "'" + s + "' is neither a quoted string, TRUE/FALSE nor a number";
    return false;
}

std::string formatReal(double d) {
    char buf[64];
    std::snprintf(buf, sizeof buf, "%.17g", d);
    return buf;
}

// Key value in path text.
std::string keyLiteral(const Value& v) {
    if (v.null) return "\"\"";
    switch (v.type) {
        case Type::Boolean: return v.b ? "TRUE" : "FALSE";
        case Type::UInt8:
        case Type::UInt16:
        case Type::UInt32:
        case Type::UInt64: return std::to_string(v.u);
        case Type::SInt8:
        case Type::SInt16:
        case Type::SInt32:
        case Type::SInt64: return std::to_string(v.i);
        case Type::Real32:
        case Type::Real64: return formatReal(v.d);
        case Type::Char16: return quote(std::string(1, static_cast<char>(v.u)));
        case Type::DateTime: return quote(v.dt.toText());
        case Type::Reference: return quote(v.ref ? formatPath(*v.ref) : std::string());
        case Type::String: return quote(v.s);
        case Type::Instance:
        case Type::Null: break;
    }
    return "\"\"";
}

}  // namespace

std::string quote(const std::string& s) {
    std::string out = "\"";
    for (char c : s) {
        if (c == '"' || c == '\\') out += '\\';
        out += c;
    }
    out += '"';
    return out;
}

bool parsePath(const std::string& textIn, ObjectPath& out, std::string& error, const ClassRepository* repo,
               const std::string& defaultNs) {
    out = ObjectPath();
    std::string text = textIn;
    while (!text.empty() && std::isspace(static_cast<unsigned char>(text.back()))) text.pop_back();
    size_t pos = 0;
    while (pos < text.size() && std::isspace(static_cast<unsigned char>(text[pos]))) ++pos;
    if (text.compare(pos, 2, "//") == 0) {
        const size_t slash = text.find('/', pos + 2);
        if (slash == std::string::npos) {
            error = "host given without namespace and class";
            return false;
        }
        out.host = text.substr(pos + 2, slash - pos - 2);
        // An empty host would be written without its "//", and the slashes
        // behind it would then read as the host's.
        if (out.host.empty()) {
            error = "empty host after '//'";
            return false;
        }
        pos = slash + 1;
    }
    const size_t stop = text.find_first_of(".=\"", pos);
    const size_t colon = text.find(':', pos);
    if (colon != std::string::npos && (stop == std::string::npos || colon < stop)) {
        out.nameSpace = text.substr(pos, colon - pos);
        if (out.nameSpace.empty()) {
            error = "empty namespace before ':'";
            return false;
        }
        for (char c : out.nameSpace) {
            if (!isIdentChar(c) && c != '/') {
                error = "bad character '" + std::string(1, c) + "' in namespace";
                return false;
            }
        }
        pos = colon + 1;
    } else {
        out.nameSpace = defaultNs;
    }
    const size_t cstart = pos;
    while (pos < text.size() && isIdentChar(text[pos])) ++pos;
    out.className = text.substr(cstart, pos - cstart);
    if (out.className.empty() || std::isdigit(static_cast<unsigned char>(out.className[0]))) {
        error = "missing or bad class name in '" + textIn + "'";
        return false;
    }
    if (pos == text.size()) return true;
    if (text.compare(pos, 2, "=@") == 0 && pos + 2 == text.size()) return true;
    if (text[pos] != '.') {
        error = "unexpected '" + std::string(1, text[pos]) + "' after class name " + out.className;
        return false;
    }
    ++pos;
    while (true) {
        const size_t kstart = pos;
        while (pos < text.size() && isIdentChar(text[pos])) ++pos;
        const std::string name = text.substr(kstart, pos - kstart);
        if (name.empty()) {
            error = "missing key name at offset " + std::to_string(kstart);
            return false;
        }
        if (pos >= text.size() || text[pos] != '=') {
            error = "missing '=' after key " + name;
            return false;
        }
        ++pos;
        std::string raw;
        bool quoted = false;
        if (pos < text.size() && text[pos] == '"') {
            quoted = true;
            if (!readQuoted(text, pos, raw)) {
                error = "unterminated string value of key " + name;
                return false;
            }
        } else {
            const size_t vstart = pos;
            while (pos < text.size() && text[pos] != ',') ++pos;
            raw = text.substr(vstart, pos - vstart);
            // `Key=` is the empty text: a batch line's word splitting turns
            // `Key=""` into it, as a shell does on the command line.
            quoted = raw.empty();
        }
        const PropertyDecl* decl = repo ? repo->findProperty(out.className, name) : nullptr;
        Value v;
        std::string err;
        const bool ok = decl ? scalarFromText(raw, quoted, decl->type, v, err, repo, out.nameSpace)
                             : untypedFromText(raw, quoted, v, err);
        if (!ok) {
            error = "key " + name + ": " + err;
            return false;
        }
        if (out.key(name)) {
            error = "key " + name + " given twice";
            return false;
        }
        out.keys.emplace_back(name, std::move(v));
        if (pos == text.size()) return true;
        if (text[pos] != ',') {
            error = "expected ',' after value of key " + name;
            return false;
        }
        ++pos;
    }
}

std::string formatPath(const ObjectPath& p) {
    std::string out;
    if (!p.host.empty()) out += "//" + p.host + "/";
    if (!p.nameSpace.empty()) out += p.nameSpace + ":";
    out += p.className;
    for (size_t k = 0; k < p.keys.size(); ++k) {
        out += k == 0 ? '.' : ',';
        out += p.keys[k].first + "=" + keyLiteral(p.keys[k].second);
    }
    return out;
}

bool parseValueText(const std::string& text, Type type, bool array, Value& out, std::string& error,
                    const ClassRepository* repo, const std::string& defaultNs) {
    if (text == "NULL") {
        out = Value::nullOf(type, array);
        return true;
    }
    if (!array) {
        if (!text.empty() && text[0] == '"') {
            size_t pos = 0;
            std::string s;
            if (!readQuoted(text, pos, s) || pos != text.size()) {
                error = "bad quoted text " + text;
                return false;
            }
            return scalarFromText(s, true, type, out, error, repo, defaultNs);
        }
        return scalarFromText(text, false, type, out, error, repo, defaultNs);
    }
    if (text.size() < 2 || text.front() != '{' || text.back() != '}') {
        error = "array value must be written {v1,v2,...}";
        return false;
    }
    std::vector<Value> elems;
    size_t pos = 1;
    const size_t end = text.size() - 1;
    while (pos < end) {
        while (pos < end && text[pos] == ' ') ++pos;
        if (pos >= end) break;
        std::string item;
        bool quoted = false;
        if (text[pos] == '"') {
            quoted = true;
            if (!readQuoted(text, pos, item) || pos > end) {
                error = "bad quoted element in " + text;
                return false;
            }
            while (pos < end && text[pos] == ' ') ++pos;
        } else {
            const size_t s = pos;
            while (pos < end && text[pos] != ',') ++pos;
            item = text.substr(s, pos - s);
            while (!item.empty() && item.back() == ' ') item.pop_back();
        }
        Value v;
        if (!scalarFromText(item, quoted, type, v, error, repo, defaultNs)) return false;
        elems.push_back(std::move(v));
        if (pos < end) {
            if (text[pos] != ',') {
                error = "expected ',' between array elements in " + text;
                return false;
            }
            ++pos;
        }
    }
    out = Value::arrayOf(type, std::move(elems));
    return true;
}

std::string formatValue(const Value& v) {
    if (v.null) return "NULL";
    if (v.array) {
        std::string out = "{";
        for (size_t k = 0; k < v.arraySize(); ++k) {
            if (k) out += ", ";
            out += formatValue(v.element(k));
        }
        return out + "}";
    }
    switch (v.type) {
        case Type::String: {
            std::string out = "\"";
            for (char c : v.s) {
                switch (c) {
                    case '"': out += "\\\""; break;
                    case '\\': out += "\\\\"; break;
                    case '\n': out += "\\n"; break;
                    case '\t': out += "\\t"; break;
                    case '\r': out += "\\r"; break;
                    default: out += c; break;
                }
            }
            return out + "\"";
        }
        case Type::Instance: return v.inst ? quote(formatInstanceMof(*v.inst)) : "NULL";
        default: return keyLiteral(v);
    }
}

std::string formatInstanceMof(const Instance& inst, int indent) {
    const std::string pad(static_cast<size_t>(indent), ' ');
    std::string out = pad + "instance of " + inst.className() + " {\n";
    for (const auto& p : inst.properties) out += pad + "    " + p.first + " = " + formatValue(p.second) + ";\n";
    out += pad + "};\n";
    return out;
}

}  // namespace cimhost

// Typed CIM values, datetimes, object paths and instances.
#include "cimhost/value.h"

#include <chrono>
#include <cstdio>
#include <strings.h>

namespace cimhost {

namespace {

struct TypeRow {
    Type type;
    const char* name;
};

const TypeRow kTypes[] = {
    {Type::Boolean, "boolean"},   {Type::Char16, "char16"},   {Type::Real32, "real32"},
    {Type::Real64, "real64"},     {Type::UInt8, "uint8"},     {Type::UInt16, "uint16"},
    {Type::UInt32, "uint32"},     {Type::UInt64, "uint64"},   {Type::SInt8, "sint8"},
    {Type::SInt16, "sint16"},     {Type::SInt32, "sint32"},   {Type::SInt64, "sint64"},
    {Type::Instance, "instance"}, {Type::Reference, "reference"}, {Type::String, "string"},
    {Type::DateTime, "datetime"},
};

// Days since 1970-01-01 of a proleptic Gregorian date, and back.
std::int64_t daysFromCivil(std::int64_t y, unsigned m, unsigned d) {
    y -= m <= 2;
    const std::int64_t era = (y >= 0 ? y : y - 399) / 400;
    const unsigned yoe = static_cast<unsigned>(y - era * 400);
    const unsigned doy = (153 * (m + (m > 2 ? -3 : 9)) + 2) / 5 + d - 1;
    const unsigned doe = yoe * 365 + yoe / 4 - yoe / 100 + doy;
    return era * 146097 + static_cast<std::int64_t>(doe) - 719468;
}

void civilFromDays(std::int64_t z, std::int64_t& y, unsigned& m, unsigned& d) {
    z += 719468;
    const std::int64_t era = (z >= 0 ? z : z - 146096) / 146097;
    const unsigned doe = static_cast<unsigned>(z - era * 146097);
    const unsigned yoe = (doe - doe / 1460 + doe / 36524 - doe / 146096) / 365;
    y = static_cast<std::int64_t>(yoe) + era * 400;
    const unsigned doy = doe - (365 * yoe + yoe / 4 - yoe / 100);
    const unsigned mp = (5 * doy + 2) / 153;
    d = doy - (153 * mp + 2) / 5 + 1;
    m = mp < 10 ? mp + 3 : mp - 9;
    y += m <= 2;
}

bool digits(const std::string& t, size_t pos, size_t n, std::uint64_t& out) {
    out = 0;
    for (size_t k = pos; k < pos + n; ++k) {
        if (k >= t.size() || t[k] < '0' || t[k] > '9') return false;
        out = out * 10 + static_cast<std::uint64_t>(t[k] - '0');
    }
    return true;
}

constexpr std::uint64_t kUsPerSec = 1000000ULL;
constexpr std::uint64_t kUsPerDay = 86400ULL * kUsPerSec;

}  // namespace

const char* typeName(Type t) {
    for (const auto& r : kTypes)
        if (r.type == t) return r.name;
    return "null";
}

bool typeFromName(const std::string& name, Type& out) {
    for (const auto& r : kTypes) {
        if (strcasecmp(r.name, name.c_str()) == 0 && r.type != Type::Instance && r.type != Type::Reference) {
            out = r.type;
            return true;
        }
    }
    return false;
}

bool isUnsigned(Type t) {
    return t == Type::UInt8 || t == Type::UInt16 || t == Type::UInt32 || t == Type::UInt64;
}

bool isSigned(Type t) {
    return t == Type::SInt8 || t == Type::SInt16 || t == Type::SInt32 || t == Type::SInt64;
}

std::string DateTime::toText() const {
    char buf[128];
    if (interval) {
        const std::uint64_t days = usec / kUsPerDay;
        std::uint64_t rest = usec % kUsPerDay;
        const unsigned h = static_cast<unsigned>(rest / (3600 * kUsPerSec));
        rest %= 3600 * kUsPerSec;
        const unsigned mi = static_cast<unsigned>(rest / (60 * kUsPerSec));
        rest %= 60 * kUsPerSec;
        const unsigned s = static_cast<unsigned>(rest / kUsPerSec);
        const unsigned us = static_cast<unsigned>(rest % kUsPerSec);
        std::snprintf(buf, sizeof buf, "%08llu%02u%02u%02u.%06u:000",
                      static_cast<unsigned long long>(days % 100000000ULL), h, mi, s, us);
        return buf;
    }
    const std::int64_t local = static_cast<std::int64_t>(usec) + static_cast<std::int64_t>(utcOffsetMinutes) * 60 *
                                                                      static_cast<std::int64_t>(kUsPerSec);
    std::int64_t days = local / static_cast<std::int64_t>(kUsPerDay);
    std::int64_t rest = local % static_cast<std::int64_t>(kUsPerDay);
    if (rest < 0) {
        rest += static_cast<std::int64_t>(kUsPerDay);
        --days;
    }
    std::int64_t y;
    unsigned m, d;
    civilFromDays(days, y, m, d);
    const auto r = static_cast<std::uint64_t>(rest);
    const unsigned h = static_cast<unsigned>(r / (3600 * kUsPerSec));
    const unsigned mi = static_cast<unsigned>(r % (3600 * kUsPerSec) / (60 * kUsPerSec));
    const unsigned s = static_cast<unsigned>(r % (60 * kUsPerSec) / kUsPerSec);
    const unsigned us = static_cast<unsigned>(r % kUsPerSec);
    const int off = utcOffsetMinutes < 0 ? -utcOffsetMinutes : utcOffsetMinutes;
    std::snprintf(buf, sizeof buf, "%04lld%02u%02u%02u%02u%02u.%06u%c%03d",
                  static_cast<long long>(y % 10000), m, d, h, mi, s, us, utcOffsetMinutes < 0 ? '-' : '+',
                  off % 1000);
    return buf;
}

std::optional<DateTime> DateTime::fromText(const std::string& t) {
    if (t.size() != 25 || t[14] != '.') return std::nullopt;
    std::uint64_t us, tail;
    if (!digits(t, 15, 6, us) || !digits(t, 22, 3, tail)) return std::nullopt;
    DateTime dt;
    if (t[21] == ':') {
        std::uint64_t days, h, mi, s;
        if (!digits(t, 0, 8, days) || !digits(t, 8, 2, h) || !digits(t, 10, 2, mi) || !digits(t, 12, 2, s))
            return std::nullopt;
        if (tail != 0 || h > 23 || mi > 59 || s > 59) return std::nullopt;
        dt.interval = true;
        dt.usec = days * kUsPerDay + ((h * 60 + mi) * 60 + s) * kUsPerSec + us;
        return dt;
    }
    if (t[21] != '+' && t[21] != '-') return std::nullopt;
    std::uint64_t y, mo, d, h, mi, s;
    if (!digits(t, 0, 4, y) || !digits(t, 4, 2, mo) || !digits(t, 6, 2, d) || !digits(t, 8, 2, h) ||
        !digits(t, 10, 2, mi) || !digits(t, 12, 2, s))
        return std::nullopt;
    if (mo < 1 || mo > 12 || d < 1 || d > 31 || h > 23 || mi > 59 || s > 60) return std::nullopt;
    dt.utcOffsetMinutes = static_cast<int>(tail) * (t[21] == '-' ? -1 : 1);
    const std::int64_t days = daysFromCivil(static_cast<std::int64_t>(y), static_cast<unsigned>(mo),
                                            static_cast<unsigned>(d));
    const std::int64_t local = days * static_cast<std::int64_t>(kUsPerDay) +
                               static_cast<std::int64_t>(((h * 60 + mi) * 60 + s) * kUsPerSec + us);
    const std::int64_t utc = local - static_cast<std::int64_t>(dt.utcOffsetMinutes) * 60 *
                                         static_cast<std::int64_t>(kUsPerSec);
    if (utc < 0) return std::nullopt;
    dt.usec = static_cast<std::uint64_t>(utc);
    return dt;
}

DateTime DateTime::now() {
    DateTime dt;
    dt.usec = static_cast<std::uint64_t>(
        std::chrono::duration_cast<std::chrono::microseconds>(std::chrono::system_clock::now().time_since_epoch())
            .count());
    return dt;
}

Value Value::nullOf(Type t, bool isArray) {
    Value v;
    v.type = t;
    v.array = isArray;
    v.null = true;
    return v;
}

namespace {

// A non-null scalar of type t whose member `field` holds x.
template <class M, class X>
Value scalarValue(Type t, M Value::*field, X&& x) {
    Value v;
    v.type = t;
    v.null = false;
    v.*field = std::forward<X>(x);
    return v;
}

}  // namespace

Value Value::fromString(std::string s) { return scalarValue(Type::String, &Value::s, std::move(s)); }
Value Value::fromBool(bool b) { return scalarValue(Type::Boolean, &Value::b, b); }
Value Value::fromUnsigned(Type t, std::uint64_t u) { return scalarValue(t, &Value::u, u); }
Value Value::fromSigned(Type t, std::int64_t i) { return scalarValue(t, &Value::i, i); }
Value Value::fromReal(Type t, double d) { return scalarValue(t, &Value::d, d); }
Value Value::fromDateTime(const DateTime& dt) { return scalarValue(Type::DateTime, &Value::dt, dt); }

Value Value::fromRef(const ObjectPath& p) {
    return scalarValue(Type::Reference, &Value::ref, std::make_shared<ObjectPath>(p));
}

Value Value::fromInstance(const Instance& i) {
    return scalarValue(Type::Instance, &Value::inst, std::make_shared<Instance>(i));
}

Value Value::arrayOf(Type t, std::vector<Value> elems) {
    Value v;
    v.type = t;
    v.array = true;
    v.null = false;
    v.elems = std::move(elems);
    return v;
}

Value Value::byteArray(std::vector<std::uint8_t> data) {
    Value v;
    v.type = Type::UInt8;
    v.array = true;
    v.null = false;
    v.bytes = std::make_shared<const std::vector<std::uint8_t>>(std::move(data));
    return v;
}

Value Value::element(std::size_t k) const {
    if (bytes) return fromUnsigned(Type::UInt8, (*bytes)[k]);
    return elems[k];
}

bool Value::operator==(const Value& o) const {
    if (type != o.type || array != o.array || null != o.null) return false;
    if (null) return true;
    if (array) {
        if (!bytes && !o.bytes) return elems == o.elems;
        if (arraySize() != o.arraySize()) return false;
        for (std::size_t k = 0; k < arraySize(); ++k)
            if (!(element(k) == o.element(k))) return false;
        return true;
    }
    switch (type) {
        case Type::Boolean: return b == o.b;
        case Type::Char16:
        case Type::UInt8:
        case Type::UInt16:
        case Type::UInt32:
        case Type::UInt64: return u == o.u;
        case Type::SInt8:
        case Type::SInt16:
        case Type::SInt32:
        case Type::SInt64: return i == o.i;
        case Type::Real32:
        case Type::Real64: return d == o.d;
        case Type::String: return s == o.s;
        case Type::DateTime: return dt == o.dt;
        case Type::Reference: return ref && o.ref && *ref == *o.ref;
        case Type::Instance:
            return inst && o.inst && inst->path == o.inst->path && inst->properties == o.inst->properties;
        case Type::Null: return true;
    }
    return false;
}

bool namesEqual(const std::string& a, const std::string& b) { return strcasecmp(a.c_str(), b.c_str()) == 0; }

const Value* findNamed(const std::vector<NamedValue>& list, const std::string& name) {
    for (const auto& nv : list)
        if (namesEqual(nv.first, name)) return &nv.second;
    return nullptr;
}

void setNamed(std::vector<NamedValue>& list, const std::string& name, Value v) {
    for (auto& nv : list) {
        if (namesEqual(nv.first, name)) {
            nv.second = std::move(v);
            return;
        }
    }
    list.emplace_back(name, std::move(v));
}

const Value* ObjectPath::key(const std::string& name) const { return findNamed(keys, name); }

void ObjectPath::setKey(const std::string& name, Value v) { setNamed(keys, name, std::move(v)); }

bool ObjectPath::operator==(const ObjectPath& o) const {
    if (!namesEqual(className, o.className) || nameSpace != o.nameSpace || host != o.host ||
        keys.size() != o.keys.size())
        return false;
    for (const auto& k : keys) {
        const Value* other = o.key(k.first);
        if (!other || *other != k.second) return false;
    }
    return true;
}

const Value* Instance::property(const std::string& name) const { return findNamed(properties, name); }

void Instance::setProperty(const std::string& name, Value v) { setNamed(properties, name, std::move(v)); }

}  // namespace cimhost
